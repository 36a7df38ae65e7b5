#include "TextBuffer.h"

#include <algorithm>
#include <utility>

namespace vornjsondb {

// Twice the room at least, so that the work of many pieces stays linear; and behind a long piece,
// which may be the last one, enough for what ends a statement.
void TextBuffer::Grow(size_t nMore) {
    const size_t nRoom = std::max(2 * m_nRoom, m_nLength + nMore + kUsual);
    std::unique_ptr<char[]> pGrown(new char[nRoom + 1]);
    std::memcpy(pGrown.get(), m_pText, m_nLength);
    m_pOwned = std::move(pGrown);
    m_pText = m_pOwned.get();
    m_nRoom = nRoom;
}

void TextBuffer::Take(TextBuffer& Other) {
    Cut(0);
    if (Other.m_pOwned) {
        m_pOwned = std::move(Other.m_pOwned);
        m_pText = m_pOwned.get();
        m_nRoom = Other.m_nRoom;
        m_nLength = Other.m_nLength;
        Other.m_pText = Other.m_szUsual;
        Other.m_nRoom = kUsual - 1;
    } else {
        Append(Other.View());
    }
    Other.Cut(0);
}

}  // namespace vornjsondb
