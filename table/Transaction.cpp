// Several calls as one.

#include <VornJsonDbTable.h>

#include "Attempt.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Doing;
using vornjsondb::RunOnce;

Status NotOpen(const Doing& What) {
    return vornjsondb::Fail(StatusCode::kMisuse, What, "none was begun");
}

}  // namespace

Transaction::~Transaction() {
    if (IsOpen()) {
        Undo();
        Close();
    }
}

// How it ends is prepared before it begins: undoing must not need memory.
Status Transaction::Begin(sqlite3* pDb, Mode eMode, int nWaitMs) {
    const Doing What{"begin a transaction", nullptr};
    if (IsOpen() || pDb == nullptr) {
        return vornjsondb::Fail(StatusCode::kMisuse, What,
                                IsOpen() ? "it is open already" : "there is no connection");
    }
    m_nWaitMs = nWaitMs;
    m_blSavepoint = sqlite3_get_autocommit(pDb) == 0;
    vornjsondb::OwnStatement pUndo, pEnd, pBegin, pFirst;
    const char* szBegin = eMode == Mode::kImmediate ? "BEGIN IMMEDIATE" : "BEGIN";
    int nPrepared =
        vornjsondb::Prepare(pDb, m_blSavepoint ? "ROLLBACK TO vornjsondb" : "ROLLBACK", pUndo);
    // mutate(exchanged): in any order.
    if (nPrepared == SQLITE_OK) {
        nPrepared = vornjsondb::Prepare(pDb, m_blSavepoint ? "RELEASE vornjsondb" : "COMMIT", pEnd);
    }
    // mutate(exchanged): in any order.
    if (nPrepared == SQLITE_OK) {
        nPrepared = vornjsondb::Prepare(pDb, "BEGIN IMMEDIATE", pBegin);
    }
    if (nPrepared == SQLITE_OK) {
        // mutate(doubled): the first one is finalized.
        nPrepared =
            vornjsondb::Prepare(pDb, m_blSavepoint ? "SAVEPOINT vornjsondb" : szBegin, pFirst);
    }
    if (nPrepared != SQLITE_OK) {
        return vornjsondb::FailBySqlite(pDb, nPrepared, What);
    }
    const auto fnBegin = [&]() -> Status {
        const int nResult = RunOnce(pFirst.get());
        if (nResult != SQLITE_OK) {
            // mutate(exchanged): an interrupt is told in the same words behind it.
            Status Failed = vornjsondb::FailBySqlite(pDb, nResult, What);
            // A BEGIN may be interrupted when its work is done.
            if (!m_blSavepoint && sqlite3_get_autocommit(pDb) == 0) {
                // mutate(doubled): what is undone is not there to be undone again.
                vornjsondb::Undo(pUndo.get(), pBegin.get());
            }
            return Failed;
        }
        m_pDb = pDb;
        m_pUndo = pUndo.release();
        m_pEnd = pEnd.release();
        m_pBegin = pBegin.release();
        return {};
    };
    return vornjsondb::Attempt(pDb, nWaitMs, fnBegin);
}

int Transaction::Undo() {
    if (sqlite3_get_autocommit(m_pDb) != 0) {
        return SQLITE_OK;  // a failure has undone it already, which is what was asked for
    }
    const int nResult = vornjsondb::Undo(m_pUndo, m_pBegin);
    return nResult == SQLITE_OK && m_blSavepoint ? RunOnce(m_pEnd) : nResult;
}

void Transaction::Close() {
    sqlite3_finalize(m_pUndo);  // mutate(exchanged): in any order.
    sqlite3_finalize(m_pEnd);   // mutate(exchanged): in any order.
    sqlite3_finalize(m_pBegin);
    m_pDb = nullptr;
}

// A reader that stands in the way of a COMMIT goes away by itself, so waiting helps although a
// transaction is open.
Status Transaction::Commit() {
    const Doing What{"commit a transaction", nullptr};
    if (!IsOpen()) {
        return NotOpen(What);
    }
    if (sqlite3_get_autocommit(m_pDb) != 0) {
        // mutate(exchanged): the failure asks nothing of the transaction.
        Close();
        const Status Gone = vornjsondb::Fail(
            StatusCode::kMisuse, What, "a failure has undone it, or a statement has ended it");
        return vornjsondb::Amended(Gone, Retry::kTransaction, "");
    }
    vornjsondb::Patience Left(m_nWaitMs);
    int nResult = vornjsondb::RunEnd(m_pEnd);
    while (nResult == SQLITE_BUSY && Left.Wait()) {
        nResult = vornjsondb::RunEnd(m_pEnd);
    }
    if (nResult == SQLITE_OK) {
        Close();
        return {};
    }
    Status Failed = vornjsondb::FailBySqlite(m_pDb, nResult, What);
    if (nResult != SQLITE_BUSY) {
        return vornjsondb::InTransaction(m_pDb, Failed);
    }
    return vornjsondb::Amended(Failed, Retry::kCall, vornjsondb::WaitedText(m_nWaitMs));
}

Status Transaction::Rollback() {
    const Doing What{"roll a transaction back", nullptr};
    if (!IsOpen()) {
        return NotOpen(What);
    }
    const int nResult = Undo();
    Status Outcome = vornjsondb::InTransaction(m_pDb, vornjsondb::FromSqlite(m_pDb, nResult, What));
    Close();
    return Outcome;
}

}  // namespace VORN_JSON_DB
