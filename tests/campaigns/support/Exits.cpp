// The functions through which the library leaves the process; the shared library calls the ones
// that the executable defines.
//
// The fortified headers define some of the names inline: <syslog.h> stays out of this file.
#undef _FORTIFY_SOURCE

#include <sys/syscall.h>
#include <unistd.h>

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

constexpr long long kSecond = 1000000000;
constexpr long long kMillisecond = 1000000;
long long g_nPaused = 0;  // nanoseconds, of all pauses while there was a function for them

timespec TimeOf(long long nNanoseconds) {
    return {static_cast<time_t>(nNanoseconds / kSecond), static_cast<long>(nNanoseconds % kSecond)};
}

// Returns what is left when a signal ends it.
long long RealSleep(long long nNanoseconds) {
    const timespec wait = TimeOf(nNanoseconds);
    timespec left = {0, 0};
    const int nResult = clock_nanosleep(CLOCK_MONOTONIC, 0, &wait, &left);
    return nResult == 0 ? 0 : static_cast<long long>(left.tv_sec) * kSecond + left.tv_nsec;
}

// A pause of the library; returns what is left of it.
long long Pause(long long nNanoseconds) {
    ++g_pauses.nCount;
    const bool blSleep = g_pfnOnPause == nullptr || g_pfnOnPause(g_pauses.nCount);
    const long long nLeft = blSleep ? RealSleep(nNanoseconds) : 0;
    g_pauses.nInterrupted += nLeft == 0 ? 0 : 1;
    g_nPaused += nNanoseconds - nLeft;
    return nLeft;
}

long long SleepOfSqlite(long long nNanoseconds) {
    return g_blSkipSqliteSleeps ? 0 : RealSleep(nNanoseconds);
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

// The old handle pauses by usleep. SQLite sleeps by it, too, but never for this long; those sleeps
// are not the library's.
int Sleep(unsigned nMicroseconds) {
    const long long nNanoseconds = nMicroseconds * 1000LL;
    const bool blOwn = nMicroseconds == kLibraryPauseUs;
    return (blOwn ? Pause(nNanoseconds) : SleepOfSqlite(nNanoseconds)) == 0 ? 0 : -1;
}

// The second handle pauses by nanosleep, for whole milliseconds; so does newer SQLite, for others.
int Sleep(const timespec& wanted, timespec* pLeft) {
    const long long nNanoseconds = static_cast<long long>(wanted.tv_sec) * kSecond + wanted.tv_nsec;
    const bool blOwn = nNanoseconds % kMillisecond == 0;
    const long long nLeft = blOwn ? Pause(nNanoseconds) : SleepOfSqlite(nNanoseconds);
    if (pLeft != nullptr) {
        *pLeft = TimeOf(nLeft);
    }
    errno = nLeft == 0 ? errno : EINTR;
    return nLeft == 0 ? 0 : -1;
}

// While pauses are told to a function, only they take time: the waits of the second handle, which
// end by the clock, then have a known number of pauses.
int Clock(clockid_t nClock, timespec* pTime) {
    if (g_pfnOnPause == nullptr || nClock != CLOCK_MONOTONIC) {
        return static_cast<int>(syscall(SYS_clock_gettime, nClock, pTime));
    }
    *pTime = TimeOf(g_nPaused);
    return 0;
}

}  // namespace campaign

#define VORN_CAMPAIGN_EXIT extern "C" __attribute__((visibility("default")))

VORN_CAMPAIGN_EXIT int usleep(unsigned nMicroseconds) {
    return campaign::Sleep(nMicroseconds);
}

VORN_CAMPAIGN_EXIT int nanosleep(const timespec* pWanted, timespec* pLeft) {
    return campaign::Sleep(*pWanted, pLeft);
}

VORN_CAMPAIGN_EXIT int clock_gettime(clockid_t nClock, timespec* pTime) noexcept {
    return campaign::Clock(nClock, pTime);
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
