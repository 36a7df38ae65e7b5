#include "TextBuffer.h"

#include <algorithm>
#include <utility>

namespace vornjsondb {

// Twice the room at least, so that the work of many pieces stays linear; and behind a long piece,
// which may be the last one, enough for what ends a statement.
void TextBuffer::Grow(size_t nMore) {
    const size_t nRoom = std::max(2 * m_nRoom, m_nLength + nMore + kUsual);
    std::unique_ptr<char[]> pGrown(new char[nRoom + 1]);
    // mutate(doubled): the second time it is there already.
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
        // mutate(exchanged): the one is no part of the other.
        m_nLength = Other.m_nLength;
        // mutate(exchanged): the one is no part of the other.
        Other.m_pText = Other.m_szUsual;
        Other.m_nRoom = kUsual - 1;
    } else {
        Append(Other.View());
    }
    Other.Cut(0);
}

}  // namespace vornjsondb
