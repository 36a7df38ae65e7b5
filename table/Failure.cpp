#include "Failure.h"

#include <cerrno>
#include <utility>

#include "Concat.h"
#include "FindingCodes.h"

namespace vornjsondb {

namespace {

struct CodeRow {
    int nSqlite;
    StatusCode eCode;
};

// Extended codes come before the primary ones, which also stand for extended codes that are not
// listed: later releases add some.
constexpr CodeRow kCodes[] = {
    {SQLITE_CONSTRAINT_PRIMARYKEY, StatusCode::kDuplicate},
    {SQLITE_CONSTRAINT_UNIQUE, StatusCode::kDuplicate},
    {SQLITE_CONSTRAINT_ROWID, StatusCode::kDuplicate},
    {SQLITE_IOERR_NOMEM, StatusCode::kNoMemory},
    {SQLITE_IOERR_DATA, StatusCode::kCorrupt},
    {SQLITE_IOERR_CORRUPTFS, StatusCode::kCorrupt},
    {SQLITE_CONSTRAINT, StatusCode::kConstraint},
    {SQLITE_MISMATCH, StatusCode::kConstraint},
    {SQLITE_BUSY, StatusCode::kLocked},
    {SQLITE_LOCKED, StatusCode::kLocked},
    {SQLITE_PROTOCOL, StatusCode::kLocked},
    {SQLITE_SCHEMA, StatusCode::kLocked},
    {SQLITE_READONLY, StatusCode::kReadOnly},
    {SQLITE_FULL, StatusCode::kDiskFull},
    {SQLITE_IOERR, StatusCode::kIoError},
    {SQLITE_CANTOPEN, StatusCode::kIoError},
    {SQLITE_PERM, StatusCode::kIoError},
    {SQLITE_NOLFS, StatusCode::kIoError},
    {SQLITE_CORRUPT, StatusCode::kCorrupt},
    {SQLITE_NOTADB, StatusCode::kNotADatabase},
    {SQLITE_INTERRUPT, StatusCode::kInterrupted},
    {SQLITE_ABORT, StatusCode::kInterrupted},
    {SQLITE_NOMEM, StatusCode::kNoMemory},
    {SQLITE_MISUSE, StatusCode::kMisuse},
    {SQLITE_RANGE, StatusCode::kMisuse},
    {SQLITE_INTERNAL, StatusCode::kMisuse},
};

constexpr int Primary(int nSqlite) {
    return nSqlite & 0xff;
}

// Everything else is a statement that SQLite refuses: no such column, too big, not authorised.
StatusCode CodeOf(int nSqlite, int nSystemError) {
    // Of a quota that is used up SQLite does not say that the disk is full.
    if (nSqlite == SQLITE_IOERR_WRITE && nSystemError == EDQUOT) {
        return StatusCode::kDiskFull;
    }
    for (const CodeRow& Row : kCodes) {
        if (Row.nSqlite == nSqlite || Row.nSqlite == Primary(nSqlite)) {
            return Row.eCode;
        }
    }
    return StatusCode::kRefused;
}

// A lock by this connection itself stays until the caller finishes a statement.
Retry RetryOf(int nSqlite, bool blInTransaction) {
    if (nSqlite == SQLITE_LOCKED_SHAREDCACHE || nSqlite == SQLITE_PROTOCOL) {
        return Retry::kCall;
    }
    if (Primary(nSqlite) != SQLITE_BUSY) {
        return Retry::kNever;
    }
    return blInTransaction ? Retry::kTransaction : Retry::kCall;
}

}  // namespace

std::string Doing::Text() const {
    std::string strText = Concat({"cannot ", szDo});
    if (nRecord != 0) {
        Append(strText, {" ", DigitsOf(nRecord), " into"});
    }
    if (pstrTable != nullptr) {
        Append(strText, {" table ", Quoted(*pstrTable)});
    }
    return strText;
}

Status Fail(StatusCode eCode, const Doing& What, std::string_view strReason) {
    auto pDetails = std::make_shared<Status::Details>();
    pDetails->eCode = eCode;
    pDetails->strMessage = Concat({What.Text(), ": ", strReason});
    return Status(std::move(pDetails));
}

Status FailBySqlite(sqlite3* pDb, int nResult, const Doing& What) {
    auto pDetails = std::make_shared<Status::Details>();
    const int nExtended = sqlite3_extended_errcode(pDb);
    const bool blLast = Primary(nExtended) == Primary(nResult);
    pDetails->nSqliteCode = blLast ? nExtended : nResult;
    pDetails->nSystemError = sqlite3_system_errno(pDb);
    pDetails->eCode = CodeOf(pDetails->nSqliteCode, pDetails->nSystemError);
    pDetails->eRetry = RetryOf(pDetails->nSqliteCode, sqlite3_get_autocommit(pDb) == 0);
    pDetails->strMessage =
        Concat({What.Text(), ": ", blLast ? sqlite3_errmsg(pDb) : sqlite3_errstr(nResult)});
    ReportRefusal(pDetails->strMessage, pDetails->vecFindings);
    return Status(std::move(pDetails));
}

Status FromFindings(FindingList&& vecFindings, const Doing& What) {
    if (vecFindings.empty()) {
        return {};
    }
    auto pDetails = std::make_shared<Status::Details>();
    for (const Finding& Found : vecFindings) {
        if (Found.eSeverity == Severity::kError) {
            pDetails->eCode = StatusCode::kRefused;
            pDetails->strMessage = Concat({What.Text(), ": ", Found.strMessage});
            break;
        }
    }
    pDetails->vecFindings = std::move(vecFindings);
    return Status(std::move(pDetails));
}

bool HasError(const FindingList& vecFindings) {
    bool blError = false;
    for (const Finding& Found : vecFindings) {
        blError |= Found.eSeverity == Severity::kError;
    }
    return blError;
}

namespace {

Status Retold(const Status& Outcome, Retry eRetry, std::string strMessage) {
    auto pDetails = std::make_shared<Status::Details>();
    pDetails->eCode = Outcome.Code();
    pDetails->eRetry = eRetry;
    pDetails->nSqliteCode = Outcome.SqliteCode();
    pDetails->nSystemError = Outcome.SystemError();
    pDetails->strMessage = std::move(strMessage);
    ReportAll(Outcome.Findings(), pDetails->vecFindings);
    return Status(std::move(pDetails));
}

}  // namespace

Status Within(const Doing& What, const Status& Step) {
    if (Step.Ok()) {
        return Step;
    }
    return Retold(Step, Step.Advice(), Concat({What.Text(), ": ", Step.Message()}));
}

Status Amended(const Status& Outcome, Retry eRetry, std::string_view strMore) {
    return Retold(Outcome, eRetry, Concat({Outcome.Message(), strMore}));
}

}  // namespace vornjsondb
