// How a call ended: statuses from SQLite's results and from findings.

#ifndef VORN_TABLE_FAILURE_H
#define VORN_TABLE_FAILURE_H

#include <VornJsonDbTable.h>

#include <cstdint>
#include <string>

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
    std::int64_t nRecord = 0;      // stands for # in szDo, if not 0: "load record # into"

    std::string Text() const;
};

Status Fail(StatusCode eCode, const Doing& What, const std::string& strReason);

// nResult is what SQLite just returned; its words and details are the connection's last.
Status FailBySqlite(sqlite3* pDb, int nResult, const Doing& What);

// Success, with the findings, when none of them is an error; else kRefused with the first one's
// message.
Status FromFindings(FindingList vecFindings, const Doing& What);

bool HasError(const FindingList& vecFindings);

// Whether another connection is in the way, which a pause may end.
inline bool IsLock(const Status& Outcome) {
    return Outcome.Advice() != Retry::kNever;
}

// The failure of a step, or success, told as that of the call that it is a step of.
Status Within(const Doing& What, const Status& Step);

// The same failure with other advice and more words.
Status Amended(const Status& Outcome, Retry eRetry, const std::string& strMore);

}  // namespace vornjsondb

#endif  // VORN_TABLE_FAILURE_H
