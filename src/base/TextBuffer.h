// A text that is written piece by piece: a statement, JSON.
//
// A short one lies where the buffer lies and needs no memory of its own, and a piece that there is
// room for is copied without a call. Of what a call of the library adds to the statement that it
// runs, asking for memory and appending to a std::string were the largest parts.

#ifndef VORN_BASE_TEXT_BUFFER_H
#define VORN_BASE_TEXT_BUFFER_H

#include <cstddef>
#include <cstring>
#include <memory>
#include <string_view>

namespace vornjsondb {

class TextBuffer {
  public:
    TextBuffer() = default;
    TextBuffer(const TextBuffer&) = delete;
    TextBuffer& operator=(const TextBuffer&) = delete;
    ~TextBuffer() = default;

    // Throws std::bad_alloc, with the text as it was.
    TextBuffer& Append(std::string_view Piece) {
        if (Piece.size() > m_nRoom - m_nLength) {
            // mutate(doubled): how much room there is shows nowhere.
            Grow(Piece.size());
        }
        // mutate(doubled): the second time it is there already.
        std::memcpy(m_pText + m_nLength, Piece.data(), Piece.size());
        m_nLength += Piece.size();
        return *this;
    }

    TextBuffer& Append(char c) {
        if (m_nLength == m_nRoom) {
            // mutate(doubled): how much room there is shows nowhere.
            Grow(1);
        }
        m_pText[m_nLength++] = c;
        return *this;
    }

    // Takes the other's text, which is empty then.
    void Take(TextBuffer& Other);

    // Leaves the first nLength bytes, of which there are no fewer.
    void Cut(size_t nLength) { m_nLength = nLength; }

    bool IsEmpty() const { return m_nLength == 0; }
    size_t Length() const { return m_nLength; }
    std::string_view View() const { return {m_pText, m_nLength}; }

    // The same with a NUL behind it; all until the next change.
    std::string_view Terminated() const {
        m_pText[m_nLength] = '\0';
        return View();
    }
    const char* CStr() const { return Terminated().data(); }

  private:
    void Grow(size_t nMore);

    // mutate(512 to 513): any size will do.
    static constexpr size_t kUsual = 512;  // most statements and lists are no longer

    std::unique_ptr<char[]> m_pOwned;  // where m_szUsual is too small
    char* m_pText = m_szUsual;
    size_t m_nLength = 0;
    size_t m_nRoom = kUsual - 1;  // without the NUL
    char m_szUsual[kUsual];
};

}  // namespace vornjsondb

#endif  // VORN_BASE_TEXT_BUFFER_H
