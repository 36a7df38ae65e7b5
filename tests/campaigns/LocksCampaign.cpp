// Locks: a lock that is let go of at a known attempt, signals during the wait, a caller's own busy
// handler; then eight processes on one file.

#include <signal.h>
#include <sys/time.h>

#include <memory>

#include "locks/Load.h"

namespace campaign {

namespace {

const Database* g_pBlocker = nullptr;
int g_nFreeAt = 0;
bool g_blSleep = false;

bool FreeLock(int nPause) {
    if (nPause == g_nFreeAt) {
        g_pBlocker->Run("COMMIT");
    }
    return g_blSleep;
}

enum class Call { kCreate, kList, kUpdate, kDelete };

int Run(VornJsonDbApi& handle, Call eCall) {
    Json::Value jRecord = LoadRecord(7, 0, "new");
    Json::Value jQuery(Json::objectValue);
    Json::Value jRows;
    jQuery["id"] = 7;
    switch (eCall) {
        case Call::kCreate:
            return handle.recCreate(jRecord, jRecord);
        case Call::kList:
            return handle.recList(jQuery, jRows) == 0 ? static_cast<int>(jRows.size()) : -1;
        case Call::kUpdate:
            return handle.recUpdateByFilter(jQuery, jRecord);
        default:
            return handle.recDelete(jQuery);
    }
}

struct Known {
    const char* szName;
    int nFreeAt;
    int nPauses;
    bool blDone;
};

constexpr Known kKnown[] = {
    {"never locked", 0, 0, true},
    {"free at the first pause", 1, 1, true},
    {"free before the last attempt", kAttempts - 1, kAttempts - 1, true},
    {"free after the last attempt", kAttempts, kAttempts, false},
};

void RunKnown(const Database& db, const Database& blocker, VornJsonDbApi& handle,
              const Known& known, Call eCall, int nWanted) {
    const std::string strBefore = db.Rows("SELECT * FROM load");
    if (known.nFreeAt > 0) {
        blocker.Run("BEGIN EXCLUSIVE");
    }
    g_nFreeAt = known.nFreeAt;
    TakePauses();
    const int nResult = Run(handle, eCall);
    const int nPauses = TakePauses().nCount;
    Expect(nResult == (known.blDone ? nWanted : -1) && nPauses == known.nPauses, [&] {
        return std::string(known.szName) + ": result " + std::to_string(nResult) + " after " +
               std::to_string(nPauses) + " pauses";
    });
    Expect(known.blDone || db.Rows("SELECT * FROM load") == strBefore,
           [] { return std::string("a failure changed rows"); });
    ++Figure("cases of a known attempt");
}

void RunKnownAttempts(const std::string& strPath) {
    const Database db(strPath);
    const Database blocker(strPath);
    const std::unique_ptr<VornJsonDbApi> pHandle = LoadHandle(db);
    g_pBlocker = &blocker;
    g_blSleep = false;
    g_pfnOnPause = FreeLock;
    for (const Known& known : kKnown) {
        RunKnown(db, blocker, *pHandle, known, Call::kCreate, 0);
        const int nRows = known.blDone ? 1 : 0;
        RunKnown(db, blocker, *pHandle, known, Call::kList, nRows);
        RunKnown(db, blocker, *pHandle, known, Call::kUpdate, 0);
        RunKnown(db, blocker, *pHandle, known, Call::kDelete, nRows);
    }
}

void OnSignal(int) {}

// The pauses end early, and the attempts go on.
void RunSignalStorm(const std::string& strPath) {
    const Database db(strPath);
    const Database blocker(strPath);
    const std::unique_ptr<VornJsonDbApi> pHandle = LoadHandle(db);
    g_pBlocker = &blocker;
    g_blSleep = true;
    struct sigaction action = {};
    action.sa_handler = OnSignal;
    sigaction(SIGALRM, &action, nullptr);
    const itimerval storm = {{0, 500}, {0, 500}};
    const itimerval calm = {{0, 0}, {0, 0}};
    setitimer(ITIMER_REAL, &storm, nullptr);
    const Known known = {"free after 40 pauses among signals", 40, 40, true};
    RunKnown(db, blocker, *pHandle, known, Call::kCreate, 0);
    blocker.Run("BEGIN EXCLUSIVE");
    TakePauses();
    g_nFreeAt = 60;
    const int nDeleted = Run(*pHandle, Call::kDelete);
    const Pauses pauses = TakePauses();
    setitimer(ITIMER_REAL, &calm, nullptr);
    Expect(nDeleted == 1 && pauses.nCount == 60 && pauses.nInterrupted > 0, [&] {
        return "signal storm: result " + std::to_string(nDeleted) + ", " +
               std::to_string(pauses.nInterrupted) + " pauses interrupted";
    });
    Figure("pauses interrupted by signals") += static_cast<std::uint64_t>(pauses.nInterrupted);
}

int OnBusy(void* pCalls, int nBefore) {
    ++*static_cast<int*>(pCalls);
    return nBefore < 2 ? 1 : 0;
}

void RunBusyHandler(const std::string& strPath) {
    const Database db(strPath);
    const Database blocker(strPath);
    g_pBlocker = &blocker;
    g_blSleep = false;
    int nCalls = 0;
    sqlite3_busy_handler(db.Get(), OnBusy, &nCalls);
    const std::unique_ptr<VornJsonDbApi> pHandle = LoadHandle(db);
    const Known known = {"free at the third pause, own busy handler", 3, 3, true};
    for (const Call eCall : {Call::kCreate, Call::kUpdate, Call::kDelete}) {
        const int nBefore = nCalls;
        RunKnown(db, blocker, *pHandle, known, eCall, eCall == Call::kDelete ? 1 : 0);
        // Three attempts find the lock, and the handler asks for two more tries in each.
        Expect(nCalls - nBefore == 9, [&] {
            return "the caller's busy handler was called " + std::to_string(nCalls - nBefore) +
                   " times";
        });
    }
    Figure("calls of the caller's busy handler") += static_cast<std::uint64_t>(nCalls);
}

int RunLocksCampaign(const Options& options) {
    for (const char* szFigure :
         {"cases of a known attempt", "pauses interrupted by signals",
          "calls of the caller's busy handler", "operations under load", "retries",
          "most retries of one operation", "longest operation, microseconds",
          "given up after 500 attempts", "created, answer lost to a lock"}) {
        Figure(szFigure);
    }
    const std::string strPath = NewLoadFile("DELETE");
    RunKnownAttempts(strPath);
    RunSignalStorm(strPath);
    RunBusyHandler(strPath);
    // The count is in seconds, halved between the two modes.
    const int nMilliseconds = (options.nCount > 0 ? options.nCount : options.blLong ? 60 : 3) * 500;
    RunLoad("DELETE", options.nSeed, nMilliseconds / options.nScale);
    RunLoad("WAL", options.nSeed + 1, nMilliseconds / options.nScale);
    return Finish("locks");
}

}  // namespace

}  // namespace campaign

int main(int argc, char** argv) {
    return campaign::RunLocksCampaign(campaign::ParseOptions(argc, argv, "locks"));
}
