#include "FakeTime.h"

#include <sys/syscall.h>
#include <time.h>
#include <unistd.h>

#include <utility>

namespace {

FakeTime* g_pFake = nullptr;

constexpr long kSecond = 1000000000;

}  // namespace

FakeTime::FakeTime(std::function<void(int)> fnAtPause) : m_fnAtPause(std::move(fnAtPause)) {
    g_pFake = this;
}

FakeTime::~FakeTime() {
    g_pFake = nullptr;
}

void FakeTime::Sleep(long long nNanoseconds) {
    m_nPassed += nNanoseconds;
    m_vecPauses.push_back(static_cast<long>(nNanoseconds / 1000000));
    m_fnAtPause(static_cast<int>(m_vecPauses.size()));
}

// Found before the C library's own. While there is no FakeTime nobody sleeps here.
extern "C" int nanosleep(const timespec* pWanted, timespec*) {
    if (g_pFake != nullptr) {
        g_pFake->Sleep(static_cast<long long>(pWanted->tv_sec) * kSecond + pWanted->tv_nsec);
    }
    return 0;
}

// The clock stands still between pauses: what passes is what was slept.
extern "C" int clock_gettime(clockid_t nClock, timespec* pTime) noexcept {
    if (g_pFake == nullptr || nClock != CLOCK_MONOTONIC) {
        return static_cast<int>(syscall(SYS_clock_gettime, nClock, pTime));
    }
    pTime->tv_sec = static_cast<time_t>(1000 + g_pFake->Passed() / kSecond);
    pTime->tv_nsec = static_cast<long>(g_pFake->Passed() % kSecond);
    return 0;
}
