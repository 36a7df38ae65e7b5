// The one rule by which every diagnostic is written.
//
// The macros stand at the call site because file, line and the failed condition's source text are
// the call site's. A message text has the form of a printf format and at least one argument; the
// three variants of a line differ in what stands before it.

#ifndef VORN_CORE_LOG_LINE_H
#define VORN_CORE_LOG_LINE_H

#include <VornJsonDbApi.h>

#include <syslog.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstring>

// The base name, so that a line is the same in whichever directory the library was built.
#ifdef __FILE_NAME__
#define VORN_LOG_FILE __FILE_NAME__
#else
#define VORN_LOG_FILE \
    (std::strrchr(__FILE__, '/') != nullptr ? std::strrchr(__FILE__, '/') + 1 : __FILE__)
#endif

// Plain line: the message as it stands.
// The printf is never run: there the compiler checks the message against its arguments, which it
// cannot where the format is put together. __extension__: %m is not ISO C++, and is meant.
#define VORN_LOG_AT(szFile, nLine, szMessage, ...)                                   \
    do {                                                                             \
        static_assert(sizeof(szMessage) <= vornjsondb::LineFormat::kMaxMessage, ""); \
        if (false) {                                                                 \
            __extension__ std::printf(szMessage, __VA_ARGS__);                       \
        }                                                                            \
        vornjsondb::WriteLine(szMessage, szFile, nLine, __VA_ARGS__);                \
    } while (false)
#define VORN_LOG_PLAIN(szText, ...) VORN_LOG_AT(VORN_LOG_FILE, __LINE__, szText, __VA_ARGS__)

// Located line: names file and line a second time, and ends in a newline of its own. Log readers
// in the field match on both, and on the "(%m)" that stays when errno is clear. Pinned by
// LogLineTest.LongCheckOnStdoutRepeatsThePlaceAndEndsInTwoNewlines.
#define VORN_LOG_LOCATED_AT(szFile, nLine, szText, ...) \
    VORN_LOG_AT(szFile, nLine, "(%s:%d)(%m)" szText "\n", szFile, nLine, __VA_ARGS__)
#define VORN_LOG_LOCATED(szText, ...) \
    VORN_LOG_LOCATED_AT(VORN_LOG_FILE, __LINE__, szText, __VA_ARGS__)

// Debug line: a plain line that the host has to ask for.
#define VORN_LOG_DEBUG(szText, ...)              \
    do {                                         \
        if (blDebugOutput) {                     \
            VORN_LOG_PLAIN(szText, __VA_ARGS__); \
        }                                        \
    } while (false)

namespace vornjsondb {

// A line's whole format, put together when the line is written, which is rare: so each message
// text is in the library once instead of once for each place where lines may go.
class LineFormat {
  public:
    explicit LineFormat(const char* szMessage);
    const char* Text() const { return m_szText; }
    bool IsForStdout() const { return m_blStdout; }

    // mutate(128 to 129): no message is so long.
    static constexpr size_t kMaxMessage = 128;  // with its NUL

  private:
    const bool m_blStdout;
    // mutate(32 to 33, 32 to 0): no message is so long that it would be cut.
    char m_szText[kMaxMessage + 32];
};

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"

// Out of line, one for each list of argument types: the call sites are many.
template <typename... Arguments>
__attribute__((noinline, cold)) void WriteLine(const char* szMessage, const char* szFile, int nLine,
                                               Arguments... args) {
    const LineFormat Format(szMessage);
    const auto nProcess = static_cast<unsigned>(getpid());
    if (Format.IsForStdout()) {
        std::printf(Format.Text(), nProcess, szFile, nLine, args...);
    } else {
        syslog(LOG_ERR, Format.Text(), szFile, nLine, nProcess, args...);
    }
}

#pragma GCC diagnostic pop

// The long condition check, the most frequent line.
__attribute__((cold)) void LogFailedCondition(const char* szFile, int nLine,
                                              const char* szCondition);

}  // namespace vornjsondb

// Condition check with a text of its own, for a condition that is spelled otherwise in the code.
#define VORN_LOG_CONDITION(szCondition) \
    vornjsondb::LogFailedCondition(VORN_LOG_FILE, __LINE__, szCondition)

#define VORN_FAIL_IF_TEXT(blFailed, szCondition) \
    do {                                         \
        if (blFailed) {                          \
            VORN_LOG_CONDITION(szCondition);     \
            return -1;                           \
        }                                        \
    } while (false)

// The usual guard: logs the condition's own source text and returns -1.
#define VORN_FAIL_IF(condition) VORN_FAIL_IF_TEXT(condition, #condition)

#endif  // VORN_CORE_LOG_LINE_H
