// The bytes of a file or of standard input.

#ifndef VORNJSONDB_CLI_INPUT_BYTE_SOURCE_H
#define VORNJSONDB_CLI_INPUT_BYTE_SOURCE_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace VORN_JSON_DB::Cli {

// Reads in blocks. After a failure, or a signal that asks to end, there are no more bytes, and
// Error() is the errno.
class ByteSource {
  public:
    static constexpr size_t kBlock = 65536;

    ByteSource() = default;
    ~ByteSource();
    ByteSource(const ByteSource&) = delete;
    ByteSource& operator=(const ByteSource&) = delete;

    // "-" is standard input.
    bool Open(const std::string& strPath);

    const std::string& Name() const { return m_strName; }
    int Error() const { return m_nError; }
    std::int64_t Size() const { return m_nSize; }    // -1: unknown
    std::int64_t Taken() const { return m_nTaken; }  // how far reading got

    // The first bytes, without taking them: a block, or what a pipe gives up to its first line.
    std::string_view Look();

    // Up to nMost bytes; 0 at the end.
    size_t Read(char* pInto, size_t nMost);

    // Makes it possible to begin again: a pipe is copied into a temporary file that has no name.
    bool Spool();
    bool Rewind();

  private:
    bool Wait();
    size_t ReadFile(char* pInto, size_t nMost);
    bool Fail();

    std::string m_strName;
    int m_nFile = -1;
    int m_nError = 0;
    bool m_blOwn = false;
    std::int64_t m_nSize = -1;
    std::int64_t m_nBegin = 0;  // standard input may have been read in part before
    std::int64_t m_nTaken = 0;
    std::string m_strLooked;  // what Look read
    size_t m_nLookedTaken = 0;
};

// All of it, or false with errno.
bool WriteAll(int nFile, const char* pBytes, size_t nBytes);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_BYTE_SOURCE_H
