// Whole operation or nothing, and waiting for locks.

#ifndef VORN_TABLE_ATTEMPT_H
#define VORN_TABLE_ATTEMPT_H

#include <chrono>
#include <string>

#include <sqlite3.h>

#include "Callable.h"
#include "Failure.h"
#include "Statements.h"

namespace vornjsondb {

// The time that a call may wait for a lock, from before its first try on: SQLite's own busy
// handler, which is the caller's, may block at each try as well. So the clock decides and not the
// number of tries.
class Patience {
  public:
    explicit Patience(int nWaitMs);

    // Waits a little, longer each time. False when the time is over.
    bool Wait();

  private:
    std::chrono::steady_clock::time_point m_End;
    int m_nPauseMs = 1;
};

// " (waited 5000 ms)"
std::string WaitedText(int nWaitMs);

// The failure of a call in a transaction that was open before; says so when SQLite has undone all
// of it, as for a full disk.
Status InTransaction(sqlite3* pDb, const Status& Outcome);

// Calls fnOnce until it gives something else than a lock, or the time is over. In a transaction
// that is open already there is one try: the other side may be waiting for just this transaction.
Status Attempt(sqlite3* pDb, int nWaitMs, Callable<Status()> fnOnce);

// Runs a statement that gives no rows. Returns SQLite's result. Takes no memory of its own, so that
// a destructor may call it.
int RunOnce(sqlite3_stmt* pStatement);

// The same for what ends a transaction. A progress handler can interrupt a statement whose work is
// done; that is a success.
int RunEnd(sqlite3_stmt* pEnd);

// Runs pUndo, which undoes a transaction or a savepoint. An interrupt lasts as long as anything on
// the connection runs, a ForEach around the call perhaps, and would leave all as it is. Then
// pBegin, a BEGIN IMMEDIATE, is interrupted as well; and for what would have written SQLite undoes
// the whole transaction. Returns SQLite's result of pUndo.
int Undo(sqlite3_stmt* pUndo, sqlite3_stmt* pBegin);

// Several statements as one: a transaction, or a savepoint inside of one that is open. Undone at
// the end of its life unless Keep succeeded.
class Whole {
  public:
    Whole(sqlite3* pDb, Statements& Kept) : m_pDb(pDb), m_Kept(Kept) {}
    Whole(const Whole&) = delete;
    Whole& operator=(const Whole&) = delete;
    ~Whole();

    // SQLite's results.
    int Begin();
    int Keep();

  private:
    int Take(const char* szSql, Statement& Lent);

    sqlite3* m_pDb;
    Statements& m_Kept;
    Statement m_Undo, m_End;
    bool m_blOpen = false;
    bool m_blSavepoint = false;
};

// fnSteps as a whole or not at all, waiting for locks.
Status AttemptWhole(sqlite3* pDb, Statements& Kept, int nWaitMs, const Doing& What,
                    Callable<Status()> fnSteps);

}  // namespace vornjsondb

#endif  // VORN_TABLE_ATTEMPT_H
