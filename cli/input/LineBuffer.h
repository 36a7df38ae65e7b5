// An input line by line.

#ifndef VORNJSONDB_CLI_INPUT_LINE_BUFFER_H
#define VORNJSONDB_CLI_INPUT_LINE_BUFFER_H

#include <cstdint>
#include <vector>

#include "ByteSource.h"

namespace VORN_JSON_DB::Cli {

class LineBuffer {
  public:
    // Lines longer than nMost are skipped and reported as such.
    LineBuffer(ByteSource& From, size_t nMost) : m_From(From), m_nMost(nMost) {}

    // Who looks for the NUL behind a line eight bytes at a time may read so far beyond it.
    static constexpr size_t kPad = 8;

    // False at the end. The line is without its line feed, and a NUL follows it.
    bool Next();

    char* Begin() { return m_vecBytes.data() + m_nBegin; }
    size_t Size() const { return m_nSize; }
    bool IsTooLong() const { return m_blTooLong; }
    std::int64_t Number() const { return m_nNumber; }

  private:
    bool Fill();

    ByteSource& m_From;
    const size_t m_nMost;
    std::vector<char> m_vecBytes;
    size_t m_nBegin = 0;  // of the line
    size_t m_nSize = 0;
    size_t m_nNext = 0;  // where the line after it begins
    size_t m_nEnd = 0;   // of what was read
    std::int64_t m_nNumber = 0;
    bool m_blTooLong = false;
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_LINE_BUFFER_H
