// Several calls as one.

#include <VornJsonDbTable.h>

#include "Attempt.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Doing;

int Run(sqlite3* pDb, const char* szSql) {
    return sqlite3_exec(pDb, szSql, nullptr, nullptr, nullptr);
}

// Takes no memory of its own, so that a destructor may call it.
int Undo(sqlite3* pDb, bool blSavepoint) {
    if (sqlite3_get_autocommit(pDb) != 0) {
        return SQLITE_OK;  // a failure has undone it already, which is what was asked for
    }
    return Run(pDb, blSavepoint ? "ROLLBACK TO vornjsondb; RELEASE vornjsondb" : "ROLLBACK");
}

Status NotOpen(const Doing& What) {
    return vornjsondb::Fail(StatusCode::kMisuse, What, "none was begun");
}

}  // namespace

Transaction::~Transaction() {
    if (IsOpen()) {
        Undo(m_pDb, m_blSavepoint);
    }
}

Status Transaction::Begin(sqlite3* pDb, Mode eMode, int nWaitMs) {
    const Doing What{"begin a transaction", nullptr};
    if (IsOpen() || pDb == nullptr) {
        return vornjsondb::Fail(StatusCode::kMisuse, What,
                                IsOpen() ? "it is open already" : "there is no connection");
    }
    m_nWaitMs = nWaitMs;
    m_blSavepoint = sqlite3_get_autocommit(pDb) == 0;
    const char* szBegin = eMode == Mode::kImmediate ? "BEGIN IMMEDIATE" : "BEGIN";
    const char* szSql = m_blSavepoint ? "SAVEPOINT vornjsondb" : szBegin;
    return vornjsondb::Attempt(pDb, nWaitMs, [&]() -> Status {
        const int nResult = Run(pDb, szSql);
        if (nResult != SQLITE_OK) {
            return vornjsondb::FailBySqlite(pDb, nResult, What);
        }
        m_pDb = pDb;
        return {};
    });
}

// A reader that stands in the way of a COMMIT goes away by itself, so waiting helps although a
// transaction is open.
Status Transaction::Commit() {
    const Doing What{"commit a transaction", nullptr};
    if (!IsOpen()) {
        return NotOpen(What);
    }
    if (sqlite3_get_autocommit(m_pDb) != 0) {
        m_pDb = nullptr;
        const Status Gone =
            vornjsondb::Fail(StatusCode::kMisuse, What, "an earlier failure has undone it");
        return vornjsondb::Amended(Gone, Retry::kTransaction, "");
    }
    const char* szSql = m_blSavepoint ? "RELEASE vornjsondb" : "COMMIT";
    int nResult = Run(m_pDb, szSql);
    vornjsondb::Patience Left(m_nWaitMs);
    while (nResult == SQLITE_BUSY && !m_blSavepoint && Left.Wait()) {
        nResult = Run(m_pDb, szSql);
    }
    if (nResult == SQLITE_OK) {
        m_pDb = nullptr;
        return {};
    }
    const Status Failed = vornjsondb::FailBySqlite(m_pDb, nResult, What);
    return nResult == SQLITE_BUSY
               ? vornjsondb::Amended(Failed, Retry::kCall, vornjsondb::WaitedText(m_nWaitMs))
               : Failed;
}

Status Transaction::Rollback() {
    const Doing What{"roll a transaction back", nullptr};
    if (!IsOpen()) {
        return NotOpen(What);
    }
    sqlite3* pDb = m_pDb;
    m_pDb = nullptr;
    const int nResult = Undo(pDb, m_blSavepoint);
    return nResult == SQLITE_OK ? Status() : vornjsondb::FailBySqlite(pDb, nResult, What);
}

}  // namespace VORN_JSON_DB
