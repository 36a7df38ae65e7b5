#include "LockWait.h"

#include <poll.h>

#include <algorithm>
#include <chrono>

#include "../Command.h"
#include "Interrupt.h"

namespace VORN_JSON_DB::Cli {

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kLongestPauseMs = 50;

int g_nWaitMs = 0;
Clock::time_point g_Begun;

// Called by SQLite, with how often it was called for this lock before. 0: there is no more waiting.
int OnLock(void*, int nBefore) {
    const Clock::time_point Now = Clock::now();
    if (nBefore == 0) {
        g_Begun = Now;
    }
    const std::chrono::milliseconds Left =
        std::chrono::duration_cast<std::chrono::milliseconds>(g_Begun - Now) +
        std::chrono::milliseconds(g_nWaitMs);
    if (Left.count() <= 0 || Interrupt::Came()) {
        return 0;
    }
    const int nPauseMs = std::min(1 << std::min(nBefore, 6), kLongestPauseMs);
    pollfd Signal = {Interrupt::File(), POLLIN, 0};
    poll(&Signal, 1, static_cast<int>(std::min<long long>(nPauseMs, Left.count())));
    return 1;
}

}  // namespace

void WaitForLocks(sqlite3* pDb, int nMilliseconds) {
    g_nWaitMs = nMilliseconds;
    sqlite3_busy_handler(pDb, OnLock, nullptr);
}

std::string WithWait(std::string strMessage) {
    if (Interrupt::Came()) {
        FailInterrupted();
    }
    // Of those who did not wait.
    const std::string strNone = " (waited " + std::to_string(kWaitedBySqlite) + " ms)";
    const std::size_t nAt = strMessage.find(strNone);
    if (nAt != std::string::npos) {
        strMessage.erase(nAt, strNone.size());
    }
    return strMessage + " (waited " + std::to_string(g_nWaitMs) + " ms)";
}

}  // namespace VORN_JSON_DB::Cli
