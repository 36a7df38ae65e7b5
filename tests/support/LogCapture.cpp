// Keeps what the library hands to syslog or prints.
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <utility>

#include "CanonicalLine.h"
#include "HostExits.h"
#include "Recorder.h"

namespace testhost {
namespace {

Lines g_vecLog;
std::vector<SyslogCall> g_vecSyslog;
std::function<void()> g_fnOnNextLine;

// State of the one StdoutCapture; nFd is the copy of the real standard output.
struct Capture {
    int nFd = -1;
    std::FILE* pFile = nullptr;
    size_t nTaken = 0;   // read by StdoutCapture::Take
    size_t nParsed = 0;  // read as log lines
};
Capture g_capture;

// The C library renders %m from errno, which has moved on when a test reads the line: keep it as
// text.
std::string KeepErrnoConversions(const char* szFormat) {
    std::string strFormat;
    for (const char* sz = szFormat; *sz != '\0'; ++sz) {
        if (sz[0] == '%' && sz[1] == '%') {
            strFormat += "%%";
            ++sz;
        } else if (sz[0] == '%' && sz[1] == 'm') {
            strFormat += "%%m";
            ++sz;
        } else {
            strFormat += *sz;
        }
    }
    return strFormat;
}

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"
std::string Render(const char* szFormat, va_list args) {
    const std::string strFormat = KeepErrnoConversions(szFormat);
    va_list argsAgain;
    va_copy(argsAgain, args);
    const int nLength = std::vsnprintf(nullptr, 0, strFormat.c_str(), args);
    std::string strText(nLength < 0 ? 0 : static_cast<size_t>(nLength) + 1, '\0');
    std::vsnprintf(strText.data(), strText.size(), strFormat.c_str(), argsAgain);
    va_end(argsAgain);
    if (!strText.empty()) {
        strText.pop_back();
    }
    return strText;
}
#pragma GCC diagnostic pop

// Printed text from nOffset on; nOffset moves to its end.
std::string ReadPrinted(size_t& nOffset) {
    std::fflush(stdout);
    std::string strText;
    char szBuffer[4096];
    ssize_t nRead = 0;
    while ((nRead = ::pread(::fileno(g_capture.pFile), szBuffer, sizeof(szBuffer),
                            static_cast<off_t>(nOffset))) > 0) {
        strText.append(szBuffer, static_cast<size_t>(nRead));
        nOffset += static_cast<size_t>(nRead);
    }
    return strText;
}

void ParsePrinted() {
    if (g_capture.pFile == nullptr) {
        return;
    }
    for (const std::string& strLine : SplitPrinted(ReadPrinted(g_capture.nParsed))) {
        g_vecLog.push_back(CanonicalPrinted(strLine));
    }
}

std::string FailedText(const std::string& strCondition) {
    return "Failed [" + strCondition + "]";
}

}  // namespace

void RecordSyslog(int nPriority, const char* szFormat, va_list args) {
    const int nErrno = errno;
    ParsePrinted();
    g_vecSyslog.push_back({nPriority, nErrno, szFormat, Render(szFormat, args)});
    g_vecLog.push_back(CanonicalSyslog(g_vecSyslog.back()));
    if (const std::function<void()> fn = std::exchange(g_fnOnNextLine, nullptr)) {
        fn();
    }
    errno = nErrno;
}

void OnNextLine(std::function<void()> fn) {
    g_fnOnNextLine = std::move(fn);
}

void ResetLog() {
    ParsePrinted();
    OnNextLine(nullptr);
    g_vecLog.clear();
    g_vecSyslog.clear();
}

std::string Located(const std::string& strText) {
    return "class located: " + strText;
}

std::string Plain(const std::string& strText) {
    return "class plain: " + strText;
}

std::string Check(const std::string& strCondition) {
    return Located(FailedText(strCondition) + ", err=%m");
}

std::string ShortCheck(const std::string& strCondition) {
    return Plain(FailedText(strCondition));
}

std::string UtilLocated(const std::string& strText) {
    return "util located: " + strText;
}

std::string UtilPlain(const std::string& strText) {
    return "util plain: " + strText;
}

std::string UtilCheck(const std::string& strCondition) {
    return UtilLocated(FailedText(strCondition) + ", err=%m");
}

Lines TakeLog() {
    ParsePrinted();
    return std::exchange(g_vecLog, {});
}

std::vector<SyslogCall> TakeSyslogCalls() {
    return std::exchange(g_vecSyslog, {});
}

StdoutCapture::StdoutCapture() {
    std::fflush(stdout);
    g_capture = Capture();
    g_capture.pFile = std::tmpfile();
    g_capture.nFd = ::dup(STDOUT_FILENO);
    if (g_capture.pFile == nullptr || g_capture.nFd < 0 ||
        ::dup2(::fileno(g_capture.pFile), STDOUT_FILENO) < 0) {
        std::perror("cannot redirect standard output");
        std::abort();
    }
}

StdoutCapture::~StdoutCapture() {
    ParsePrinted();
    size_t nStart = 0;
    const std::string strAll = ReadPrinted(nStart);
    ::dup2(g_capture.nFd, STDOUT_FILENO);
    ::close(g_capture.nFd);
    std::fclose(g_capture.pFile);
    g_capture = Capture();
    if (IsCapturedTextShown()) {
        std::fwrite(strAll.data(), 1, strAll.size(), stdout);
    }
}

std::string StdoutCapture::Take() {
    return ReadPrinted(g_capture.nTaken);
}

}  // namespace testhost
