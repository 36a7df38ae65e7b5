#include "LineBuffer.h"

#include <algorithm>
#include <cstring>

namespace VORN_JSON_DB::Cli {

// Reads more behind what is there of the line. False: there is no more.
bool LineBuffer::Fill() {
    if (m_nBegin > 0) {
        std::memmove(m_vecBytes.data(), Begin(), m_nEnd - m_nBegin);
        m_nEnd -= m_nBegin;
        m_nBegin = 0;
    }
    if (m_vecBytes.size() < m_nEnd + ByteSource::kBlock + kPad) {
        m_vecBytes.resize(std::max(2 * m_nEnd, m_nEnd + ByteSource::kBlock) + kPad);
    }
    const size_t nRead = m_From.Read(m_vecBytes.data() + m_nEnd, ByteSource::kBlock);
    m_nEnd += nRead;
    return nRead > 0;
}

bool LineBuffer::Next() {
    m_nBegin = m_nNext;
    m_blTooLong = false;
    size_t nSearched = 0;
    while (true) {
        const void* const pFound =
            m_nEnd - m_nBegin > nSearched
                ? std::memchr(Begin() + nSearched, '\n', m_nEnd - m_nBegin - nSearched)
                : nullptr;
        if (pFound != nullptr) {
            m_nSize = static_cast<size_t>(static_cast<const char*>(pFound) - Begin());
            m_nNext = m_nBegin + m_nSize + 1;
            break;
        }
        nSearched = m_nEnd - m_nBegin;
        if (nSearched > m_nMost) {
            m_blTooLong = true;
            m_nEnd = m_nBegin;
            nSearched = 0;
        }
        if (!Fill()) {
            m_nSize = m_nEnd - m_nBegin;
            m_nNext = m_nEnd;
            if (m_nSize == 0 && !m_blTooLong) {
                return false;
            }
            break;
        }
    }
    Begin()[m_nSize] = '\0';
    ++m_nNumber;
    return true;
}

}  // namespace VORN_JSON_DB::Cli
