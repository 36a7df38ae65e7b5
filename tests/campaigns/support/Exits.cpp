// The functions through which the library leaves the process; the shared library calls the ones
// that the executable defines.
//
// The fortified headers define some of the names inline: <syslog.h> stays out of this file.
#undef _FORTIFY_SOURCE

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <ctime>

#include "Campaign.h"

namespace campaign {

bool (*g_pfnOnPause)(int nPause) = nullptr;
bool g_blSkipSqliteSleeps = false;

namespace {

constexpr unsigned kLibraryPauseUs = 10000;
std::uint64_t g_nLogLines = 0;
Pauses g_pauses = {0, 0};

__attribute__((format(printf, 1, 0))) void Render(const char* szFormat, va_list args) {
    // Neither allocates nor changes errno, as little as the real one does.
    static char s_szLine[1U << 16U];
    const int nErrno = errno;
    std::vsnprintf(s_szLine, sizeof(s_szLine), szFormat, args);
    ++g_nLogLines;
    errno = nErrno;
}

int RealSleep(unsigned nMicroseconds) {
    const timespec wait = {static_cast<time_t>(nMicroseconds / 1000000),
                           static_cast<long>(nMicroseconds % 1000000) * 1000};
    return nanosleep(&wait, nullptr);
}

}  // namespace

std::uint64_t LogLines() {
    return g_nLogLines;
}

Pauses TakePauses() {
    const Pauses taken = g_pauses;
    g_pauses = {0, 0};
    return taken;
}

// SQLite sleeps by usleep, too, but never for this long; those sleeps are not the library's.
int Sleep(unsigned nMicroseconds) {
    if (nMicroseconds != kLibraryPauseUs) {
        return g_blSkipSqliteSleeps ? 0 : RealSleep(nMicroseconds);
    }
    ++g_pauses.nCount;
    if (g_pfnOnPause != nullptr && !g_pfnOnPause(g_pauses.nCount)) {
        return 0;
    }
    const int nResult = RealSleep(nMicroseconds);
    g_pauses.nInterrupted += nResult == 0 ? 0 : 1;
    return nResult;
}

}  // namespace campaign

#define VORN_CAMPAIGN_EXIT extern "C" __attribute__((visibility("default")))

VORN_CAMPAIGN_EXIT int usleep(unsigned nMicroseconds) {
    return campaign::Sleep(nMicroseconds);
}

VORN_CAMPAIGN_EXIT __attribute__((format(printf, 2, 3))) void syslog(int, const char* szFormat,
                                                                     ...) {
    va_list args;
    va_start(args, szFormat);
    campaign::Render(szFormat, args);
    va_end(args);
}

// The form that a library built with _FORTIFY_SOURCE calls.
VORN_CAMPAIGN_EXIT __attribute__((format(printf, 3, 4))) void __syslog_chk(int, int,
                                                                           const char* szFormat,
                                                                           ...) {
    va_list args;
    va_start(args, szFormat);
    campaign::Render(szFormat, args);
    va_end(args);
}
