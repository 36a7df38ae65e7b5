// How a call ended: statuses from SQLite's results and from findings.

#ifndef VORN_TABLE_FAILURE_H
#define VORN_TABLE_FAILURE_H

#include <VornJsonDbTable.h>

#include <cstdint>
#include <string>
#include <string_view>

#include <sqlite3.h>

struct VORN_JSON_DB::Status::Details {
    StatusCode eCode = StatusCode::kOk;
    Retry eRetry = Retry::kNever;
    int nSqliteCode = SQLITE_OK;
    int nSystemError = 0;
    std::string strMessage;
    FindingList vecFindings;
};

namespace vornjsondb {

using VORN_JSON_DB::Finding;
using VORN_JSON_DB::FindingList;
using VORN_JSON_DB::Retry;
using VORN_JSON_DB::Severity;
using VORN_JSON_DB::Status;
using VORN_JSON_DB::StatusCode;

// What a call was about to do, for messages: "cannot list records of table \"task\": ...". Made
// into text only when something fails.
struct Doing {
    const char* szDo;              // "list records of"
    const std::string* pstrTable;  // nullptr: the words are enough
    std::int64_t nRecord = 0;      // if not 0: "load record" becomes "load record 7 into"

    std::string Text() const;
};

Status Fail(StatusCode eCode, const Doing& What, std::string_view strReason);

// nResult is what SQLite just returned; its words and details are the connection's last.
Status FailBySqlite(sqlite3* pDb, int nResult, const Doing& What);

// The same, or success for SQLITE_OK.
inline Status FromSqlite(sqlite3* pDb, int nResult, const Doing& What) {
    return nResult == SQLITE_OK ? Status() : FailBySqlite(pDb, nResult, What);
}

// Success, with the findings, when none of them is an error; else kRefused with the first one's
// message.
Status FromFindings(FindingList&& vecFindings, const Doing& What);

// What a call returns a reference to where it has nothing.
template <typename Kind>
const Kind& None() {
    static const Kind s_None{};
    return s_None;
}

bool HasError(const FindingList& vecFindings);

// Whether another connection is in the way, which a pause may end.
inline bool IsLock(const Status& Outcome) {
    return Outcome.Advice() != Retry::kNever;
}

// The failure of a step, or success, told as that of the call that it is a step of.
Status Within(const Doing& What, const Status& Step);

// The same failure with other advice and more words.
Status Amended(const Status& Outcome, Retry eRetry, std::string_view strMore);

}  // namespace vornjsondb

#endif  // VORN_TABLE_FAILURE_H
