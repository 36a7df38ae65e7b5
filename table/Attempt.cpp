#include "Attempt.h"

#include <algorithm>
#include <thread>

#include "Concat.h"

namespace vornjsondb {

namespace {

constexpr int kLongestPauseMs = 50;

}  // namespace

Patience::Patience(int nWaitMs)
    : m_End(std::chrono::steady_clock::now() + std::chrono::milliseconds(nWaitMs)) {}

bool Patience::Wait() {
    const auto Left = m_End - std::chrono::steady_clock::now();
    if (Left <= std::chrono::steady_clock::duration::zero()) {
        return false;
    }
    const std::chrono::steady_clock::duration Pause = std::chrono::milliseconds(m_nPauseMs);
    std::this_thread::sleep_for(std::min(Pause, Left));
    m_nPauseMs = std::min(2 * m_nPauseMs, kLongestPauseMs);
    return true;
}

std::string WaitedText(int nWaitMs) {
    return Concat({" (waited ", DigitsOf(nWaitMs), " ms)"});
}

Status InTransaction(sqlite3* pDb, const Status& Outcome) {
    const bool blGone = !Outcome.Ok() && sqlite3_get_autocommit(pDb) != 0;
    return blGone ? Amended(Outcome, Retry::kTransaction, "; the transaction is undone") : Outcome;
}

namespace {

// Whether a pause may help. It does not where a statement of this connection is reading from a
// state before another one's change: a ForEach around the call, whose state stays.
bool MayPass(const Status& Outcome) {
    return IsLock(Outcome) && Outcome.SqliteCode() != SQLITE_BUSY_SNAPSHOT;
}

}  // namespace

Status Attempt(sqlite3* pDb, int nWaitMs, Callable<Status()> fnOnce) {
    if (sqlite3_get_autocommit(pDb) == 0) {
        return InTransaction(pDb, fnOnce());
    }
    Patience Left(nWaitMs);
    Status Outcome = fnOnce();
    while (MayPass(Outcome) && Left.Wait()) {
        Outcome = fnOnce();
    }
    if (MayPass(Outcome)) {
        return Amended(Outcome, Retry::kCall, WaitedText(nWaitMs));
    }
    return Outcome;
}

int RunOnce(sqlite3_stmt* pStatement) {
    sqlite3_step(pStatement);
    return sqlite3_reset(pStatement);
}

int RunEnd(sqlite3_stmt* pEnd) {
    const int nResult = RunOnce(pEnd);
    const bool blDone =
        nResult == SQLITE_INTERRUPT && sqlite3_get_autocommit(sqlite3_db_handle(pEnd)) != 0;
    return blDone ? SQLITE_OK : nResult;
}

int Undo(sqlite3_stmt* pUndo, sqlite3_stmt* pBegin) {
    sqlite3* const pDb = sqlite3_db_handle(pBegin);
    int nResult = RunEnd(pUndo);
    if (nResult == SQLITE_INTERRUPT) {
        nResult = RunEnd(pUndo);  // a progress handler may be satisfied
    }
    if (nResult == SQLITE_INTERRUPT) {
        // mutate(doubled): what is undone is not there to be undone again.
        RunOnce(pBegin);
        // A changed schema has all statements prepared anew, and SQLite's parser looks for
        // interrupts at blanks and at the end of a text without a semicolon. This one gets through
        // to be interrupted when it runs, and would do next to nothing otherwise.
        if (sqlite3_get_autocommit(pDb) == 0) {
            // mutate(doubled): what is undone is not there to be undone again.
            sqlite3_exec(pDb, "PRAGMA\"incremental_vacuum\"(1);", nullptr, nullptr, nullptr);
        }
    }
    return nResult;
}

// How it ends is prepared before it begins: undoing must not need memory.
int Whole::Begin() {
    m_blSavepoint = sqlite3_get_autocommit(m_pDb) == 0;
    int nResult = m_Kept.KeepBegin();
    // mutate(exchanged): in any order.
    if (nResult == SQLITE_OK) {
        nResult = Take(m_blSavepoint ? "ROLLBACK TO vornjsondb" : "ROLLBACK", m_Undo);
    }
    if (nResult == SQLITE_OK) {
        nResult = Take(m_blSavepoint ? "RELEASE vornjsondb" : "COMMIT", m_End);
    }
    Statement First;
    if (nResult == SQLITE_OK && m_blSavepoint) {
        nResult = Take("SAVEPOINT vornjsondb", First);
    }
    if (nResult == SQLITE_OK) {
        nResult = m_blSavepoint ? First.Finish() : RunOnce(m_Kept.Begin());
    }
    // Also of a BEGIN that was interrupted when its work was done.
    const bool blBegun = !m_blSavepoint && sqlite3_get_autocommit(m_pDb) == 0;
    m_blOpen = nResult == SQLITE_OK || blBegun;
    return nResult;
}

int Whole::Keep() {
    const int nResult = RunEnd(m_End.Get());
    m_blOpen = nResult != SQLITE_OK;
    return nResult;
}

// A full disk and an interrupt may have undone the whole transaction already; a ROLLBACK would then
// fail and hide the reason.
Whole::~Whole() {
    if (m_blOpen && sqlite3_get_autocommit(m_pDb) == 0) {
        const int nResult = Undo(m_Undo.Get(), m_Kept.Begin());
        // mutate(hoisted, sunk): after a ROLLBACK there is nothing to COMMIT, which is ignored.
        if (m_blSavepoint && nResult == SQLITE_OK) {
            m_End.Finish();
        }
    }
}

int Whole::Take(const char* szSql, Statement& Lent) {
    return m_Kept.Take(
        szSql, [szSql] { return Concat({szSql}); }, Lent);
}

Status AttemptWhole(sqlite3* pDb, Statements& Kept, int nWaitMs, const Doing& What,
                    Callable<Status()> fnSteps) {
    return Attempt(pDb, nWaitMs, [&]() -> Status {
        Whole All(pDb, Kept);
        const int nResult = All.Begin();
        if (nResult != SQLITE_OK) {
            return FailBySqlite(pDb, nResult, What);
        }
        Status Outcome = fnSteps();
        if (Outcome.Ok()) {
            Outcome = FromSqlite(pDb, All.Keep(), What);
        }
        return Outcome;
    });
}

}  // namespace vornjsondb
