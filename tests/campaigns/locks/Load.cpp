// The load: workers that know what their rows are.

#include "Load.h"

#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <memory>
#include <thread>

#include "../support/Store.h"

namespace campaign {

namespace {

using Clock = std::chrono::steady_clock;

constexpr int kProcesses = 8;

Json::Value AsJson(const State& state) {
    Json::Value jState;
    jState["counted"] = state.nCounted;
    jState["columns"] = state.nSideColumns;
    jState["indexes"] = state.nSideIndexes;
    for (const auto& row : state.rows) {
        jState["rows"][std::to_string(row.first)] = row.second;
    }
    return jState;
}

class Worker {
  public:
    Worker(const Database& db, int nOwner, std::uint64_t nSeed)
        : m_db(db),
          m_pStore(NewStore(db)),
          m_nOwner(nOwner),
          m_stream(nSeed, Owner{nOwner, kProcesses, 40}, State()) {}

    void Step() {
        if (m_stream.Dice().OneIn(7)) {
            List();
            return;
        }
        const campaign::Step step = m_stream.Choose();
        if (Do(step.pRow->szName, [&] { return m_pStore->Run(step) >= 0; }) || IsDone(step)) {
            m_stream.Apply(step);
        } else if (step.pRow->eAct == Act::kCommit) {
            RollBack();
        }
    }

    void End() {
        if (m_stream.IsOpen()) {
            RollBack();
        }
    }

    Json::Value Known() const { return AsJson(m_stream.Now()); }

  private:
    // One call; returns whether it succeeded.
    bool Do(const char* szName, const std::function<bool()>& fn) {
        TakePauses();
        const Clock::time_point start = Clock::now();
        const bool blDone = fn();
        const auto nWait =
            std::chrono::duration_cast<std::chrono::microseconds>(Clock::now() - start).count();
        m_nPauses = TakePauses().nCount;
        AddTo(Figure("operations under load"), 1);
        AddTo(Figure("pauses"), static_cast<std::uint64_t>(m_nPauses));
        RaiseTo(Figure("most pauses of one operation"), static_cast<std::uint64_t>(m_nPauses));
        RaiseTo(Figure("longest operation, microseconds"), static_cast<std::uint64_t>(nWait));
        if (!blDone && m_pStore->IsAnswerLost(m_nPauses)) {
            AddTo(Figure("done, answer lost to a lock"), 1);
        } else if (!blDone && Expect(m_pStore->IsGivenUp(m_nPauses, m_stream.IsOpen()), [&] {
                       return std::string(szName) + " failed after " + std::to_string(m_nPauses) +
                              " pauses: " + m_pStore->Failure();
                   })) {
            AddTo(Figure("given up for a lock"), 1);
        }
        return blDone;
    }

    // Whether a step that failed was done all the same.
    bool IsDone(const campaign::Step& step) const {
        const bool blLost = m_pStore->IsAnswerLost(m_nPauses);
        const bool blOfRow =
            step.pRow->eWhen == When::kPresent || step.pRow->eWhen == When::kAbsent;
        if (!blLost && !(m_pStore->MayBeDone() && blOfRow)) {
            return false;
        }
        const std::string strQuery =
            "SELECT text FROM shared WHERE id=" + std::to_string(step.nKey);
        std::string strNow = "error";
        for (int i = 0; i < 10000 && strNow.compare(0, 5, "error") == 0; ++i) {
            // The others hold the file most of the time, and their writes may take long.
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
            strNow = m_db.Rows(strQuery);
        }
        Expect(strNow.compare(0, 5, "error") != 0,
               [&] { return "the row could not be looked at: " + strNow; });
        const bool blThere = strNow == "'" + step.strText + "'\n";
        Expect(blThere || !blLost, [] { return std::string("a lost answer, and a lost row"); });
        return blThere;
    }

    void List() {
        std::map<int, std::string> rows;
        if (Do("list", [&] { return m_pStore->List(m_nOwner, rows); })) {
            Expect(rows == m_stream.Now().rows,
                   [] { return std::string("listed other rows than were stored"); });
        }
    }

    void RollBack() {
        for (const ActRow& row : kActs) {
            if (row.eAct == Act::kRollback) {
                const campaign::Step step = m_stream.Make(row, 0);
                Expect(m_pStore->Run(step) >= 0, [&] { return m_pStore->Failure(); });
                m_stream.Apply(step);
            }
        }
    }

    const Database& m_db;
    std::unique_ptr<Store> m_pStore;
    int m_nOwner;
    Stream m_stream;
    int m_nPauses = 0;
};

std::string ResultPath(const std::string& strPath, int nOwner) {
    return strPath + "." + std::to_string(nOwner);
}

void RunWorker(const std::string& strPath, int nOwner, std::uint64_t nSeed, int nMilliseconds) {
    const Clock::time_point end = Clock::now() + std::chrono::milliseconds(nMilliseconds);
    const Database db(strPath);
    db.Run(kFast);
    Worker worker(db, nOwner, nSeed);
    while (Clock::now() < end) {
        worker.Step();
    }
    worker.End();
    WriteFile(ResultPath(strPath, nOwner), ToText(worker.Known()));
}

void CheckFile(const std::string& strPath) {
    const Database db(strPath);
    int nCounted = 0;
    int nInFile = 0;
    for (int i = 0; i < kProcesses; ++i) {
        const Json::Value jKnown = FromText(ReadFile(ResultPath(strPath, i)));
        State found = ReadState(db, i);
        nInFile = found.nCounted;
        nCounted += jKnown["counted"].asInt();
        found.nCounted = jKnown["counted"].asInt();
        Expect(AsJson(found) == jKnown, [&] {
            return "under load: process " + std::to_string(i) +
                   " does not find what it stored, but " + found.Text();
        });
    }
    Expect(nInFile == nCounted, [&] {
        return "counted to " + std::to_string(nInFile) + " instead of " + std::to_string(nCounted);
    });
    Expect(db.Rows("PRAGMA integrity_check") == "'ok'\n",
           [] { return std::string("the database is damaged"); });
}

}  // namespace

void RunLoad(const std::string& strPath, const char* szMode, std::uint64_t nSeed,
             int nMilliseconds) {
    NewFile(strPath, szMode);
    g_pfnOnPause = nullptr;
    pid_t aChildren[kProcesses] = {};
    for (int i = 0; i < kProcesses; ++i) {
        aChildren[i] = fork();
        if (aChildren[i] == 0) {
            RunWorker(strPath, i, nSeed * kProcesses + static_cast<std::uint64_t>(i),
                      nMilliseconds);
            _exit(0);
        }
    }
    for (const pid_t nChild : aChildren) {
        int nStatus = 0;
        waitpid(nChild, &nStatus, 0);
        Expect(nStatus == 0, [&] { return "a process ended with " + std::to_string(nStatus); });
    }
    CheckFile(strPath);
}

}  // namespace campaign
