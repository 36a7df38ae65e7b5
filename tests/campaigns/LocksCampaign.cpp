// Locks: a lock that is let go of at a known attempt, signals during the wait, a caller's own busy
// handler; then eight processes on one file.

#include <signal.h>
#include <sys/time.h>

#include <memory>

#include "locks/Load.h"
#include "support/Store.h"

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

// What is a whole by itself.
bool IsStep(const ActRow& row) {
    return row.eAct != Act::kBegin && row.eAct != Act::kCommit && row.eAct != Act::kRollback;
}

// The connections, and what the one under test has stored.
class Scene {
  public:
    explicit Scene(const std::string& strPath)
        : m_db(strPath),
          m_blocker(strPath),
          m_pStore(NewStore(m_db)),
          m_stream(1, Owner{0, 1, 40}, ReadState(m_db, 0)) {
        g_pBlocker = &m_blocker;
        m_db.Run(kFast);
        m_blocker.Run(kFast);
    }
    Scene(const Scene&) = delete;
    Scene& operator=(const Scene&) = delete;
    ~Scene() { g_pfnOnPause = nullptr; }

    const Database& Db() const { return m_db; }

    // The step that tries this act, after others that make it possible.
    Step Prepare(const ActRow& row) {
        const Step step = m_stream.Make(row, 6);
        for (const ActRow& other : kActs) {
            if (!m_stream.IsPossible(row.eWhen, step.nKey) && IsStep(other) &&
                m_stream.IsPossible(other.eWhen, step.nKey)) {
                Expect(Run(m_stream.Make(other, 6)), [&] { return m_pStore->Failure(); });
            }
        }
        Expect(m_stream.IsPossible(row.eWhen, step.nKey),
               [&] { return std::string("no way to try ") + row.szName; });
        return step;
    }

    bool Run(const Step& step) {
        const bool blDone = m_pStore->Run(step) >= 0;
        if (blDone) {
            m_stream.Apply(step);
        }
        return blDone;
    }

    // Returns the pauses.
    template <typename Call>
    Pauses RunLocked(const Hold& hold, int nFreeAt, bool blSleep, const Call& fnCall) {
        if (nFreeAt > 0) {
            m_blocker.Run(hold.szSql);
        }
        g_nFreeAt = nFreeAt;
        g_blSleep = blSleep;
        g_pfnOnPause = FreeLock;
        TakePauses();
        fnCall();
        const Pauses pauses = TakePauses();
        g_pfnOnPause = nullptr;
        if (sqlite3_get_autocommit(m_blocker.Get()) == 0) {
            m_blocker.Run("COMMIT");
        }
        return pauses;
    }

    // A step whose lock is let go of as known, and all that must be so afterwards.
    void RunKnown(const Step& step, const Hold& hold, const Known& known) {
        bool blDone = false;
        const Pauses pauses = RunLocked(hold, known.nFreeAt, false, [&] { blDone = Run(step); });
        const std::string strFailure = m_pStore->Failure();
        // What is taken back is not committed.
        const bool blInTheWay = !hold.blAtCommit || step.pRow->eAct != Act::kTakenBack;
        CheckAnswer(step.pRow->szName, hold, known, blInTheWay, blDone, pauses, strFailure);
        Expect(blDone || m_pStore->IsGivenUp(pauses.nCount, false),
               [&] { return std::string(step.pRow->szName) + " failed: " + strFailure; });
        CheckRows(step.pRow->szName);
    }

    void RunKnownList(const Hold& hold, const Known& known) {
        bool blDone = false;
        std::map<int, std::string> rows;
        const Pauses pauses =
            RunLocked(hold, known.nFreeAt, false, [&] { blDone = m_pStore->List(0, rows); });
        CheckAnswer("list", hold, known, hold.blReading, blDone, pauses, m_pStore->Failure());
        Expect(!blDone || rows == m_stream.Now().rows, [] { return std::string("listed others"); });
    }

    // Whole or not at all.
    void CheckRows(const char* szName) {
        const State now = ReadState(m_db, 0);
        Expect(now == m_stream.Now(), [&] {
            return std::string(szName) + ": " + now.Text() + " instead of " + m_stream.Now().Text();
        });
    }

  private:
    static void CheckAnswer(const char* szName, const Hold& hold, const Known& known,
                            bool blInTheWay, bool blDone, const Pauses& pauses,
                            const std::string& strFailure) {
        const int nPauses = blInTheWay ? known.nPauses : 0;
        const bool blWanted = known.blDone || !blInTheWay;
        Expect(blDone == blWanted && pauses.nCount == nPauses, [&] {
            return std::string(szName) + ", " + hold.szSql + ", " + known.szName +
                   (blDone ? ": done" : ": failed") + " after " + std::to_string(pauses.nCount) +
                   " pauses: " + strFailure;
        });
        ++Figure("cases of a known attempt");
    }

    Database m_db;
    Database m_blocker;
    std::unique_ptr<Store> m_pStore;
    Stream m_stream;
};

void RunKnownAttempts(const std::string& strPath) {
    Scene scene(strPath);
    for (const Hold& hold : kHolds) {
        for (const Known& known : kKnown) {
            for (const ActRow& row : kActs) {
                if (IsStep(row)) {
                    scene.RunKnown(scene.Prepare(row), hold, known);
                }
            }
            scene.RunKnownList(hold, known);
        }
    }
}

void OnSignal(int) {}

// The pauses end early, and the attempts go on.
void RunSignalStorm(const std::string& strPath) {
    Scene scene(strPath);
    struct sigaction action = {};
    action.sa_handler = OnSignal;
    sigaction(SIGALRM, &action, nullptr);
    const itimerval storm = {{0, 500}, {0, 500}};
    const itimerval calm = {{0, 0}, {0, 0}};
    constexpr int kFreeAt = 60;
    for (const ActRow& row : kActs) {
        if (row.eAct != Act::kCreate && row.eAct != Act::kRemove) {
            continue;
        }
        const Step step = scene.Prepare(row);
        bool blDone = false;
        setitimer(ITIMER_REAL, &storm, nullptr);
        const Pauses pauses =
            scene.RunLocked(kHolds[0], kFreeAt, true, [&] { blDone = scene.Run(step); });
        setitimer(ITIMER_REAL, &calm, nullptr);
        Expect(blDone && pauses.nCount >= kFreeAt && pauses.nInterrupted > 0, [&] {
            return std::string("signal storm: ") + row.szName + (blDone ? " done" : " failed") +
                   " after " + std::to_string(pauses.nCount) + " pauses, of which " +
                   std::to_string(pauses.nInterrupted) + " were interrupted";
        });
        scene.CheckRows(row.szName);
        Figure("pauses interrupted by signals") += static_cast<std::uint64_t>(pauses.nInterrupted);
    }
}

int OnBusy(void* pCalls, int nBefore) {
    ++*static_cast<int*>(pCalls);
    return nBefore < 2 ? 1 : 0;
}

void RunBusyHandler(const std::string& strPath) {
    Scene scene(strPath);
    int nCalls = 0;
    sqlite3_busy_handler(scene.Db().Get(), OnBusy, &nCalls);
    const Known known = {"free at the third pause, own busy handler", 3, 3, true};
    for (const ActRow& row : kActs) {
        if (!IsStep(row)) {
            continue;
        }
        const Step step = scene.Prepare(row);
        const int nBefore = nCalls;
        scene.RunKnown(step, kHolds[0], known);
        // Three attempts find the lock, and the handler asks for two more tries in each.
        Expect(nCalls - nBefore == 9, [&] {
            return std::string(row.szName) + ": the caller's busy handler was called " +
                   std::to_string(nCalls - nBefore) + " times";
        });
    }
    Figure("calls of the caller's busy handler") += static_cast<std::uint64_t>(nCalls);
}

int RunLocksCampaign(const Options& options) {
    for (const char* szFigure :
         {"cases of a known attempt", "pauses interrupted by signals",
          "calls of the caller's busy handler", "operations under load", "pauses",
          "most pauses of one operation", "longest operation, microseconds", "given up for a lock",
          "done, answer lost to a lock"}) {
        Figure(szFigure);
    }
    const std::string strPath = TempFolder() + "/locks.db";
    NewFile(strPath, "DELETE");
    RunKnownAttempts(strPath);
    RunSignalStorm(strPath);
    RunBusyHandler(strPath);
    // The count is in seconds, halved between the two modes.
    const int nMilliseconds = (options.nCount > 0 ? options.nCount : options.blLong ? 60 : 3) * 500;
    RunLoad(strPath, "DELETE", options.nSeed, nMilliseconds / options.nScale);
    RunLoad(strPath, "WAL", options.nSeed + 1, nMilliseconds / options.nScale);
    return Finish("locks");
}

}  // namespace

}  // namespace campaign

int main(int argc, char** argv) {
    return campaign::RunLocksCampaign(campaign::ParseOptions(argc, argv, "locks"));
}
