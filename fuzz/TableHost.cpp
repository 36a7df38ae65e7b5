#include "TableHost.h"

#include <algorithm>
#include <cstring>
#include <iterator>

#include "JsonValues.h"

namespace fuzzhost {

namespace {

using VORN_JSON_DB::Finding;
using VORN_JSON_DB::Status;
using VORN_JSON_DB::StatusCode;

// What a call may answer when nobody holds a lock, no file fails, and memory lasts. A condition may
// take more time than the host gives it.
constexpr StatusCode kAnswers[] = {StatusCode::kOk,        StatusCode::kNotFound,
                                   StatusCode::kDuplicate, StatusCode::kConstraint,
                                   StatusCode::kRefused,   StatusCode::kInterrupted};

void CheckFindings(const Status& Outcome) {
    bool blError = false;
    for (const Finding& Found : Outcome.Findings()) {
        Require(Found.szCode != nullptr && !Found.strMessage.empty() && !Found.strRemedy.empty(),
                "a finding has code, message and remedy");
        Require(Found.strPath.empty() || Found.strPath[0] == '/', "a path is a JSON pointer");
        blError = blError || Found.eSeverity == VORN_JSON_DB::Severity::kError;
    }
    Require(blError == (Outcome.Code() == StatusCode::kRefused), "errors come with a refusal");
}

void CheckStatus(const Status& Outcome) {
    if (std::count(std::begin(kAnswers), std::end(kAnswers), Outcome.Code()) == 0) {
        Require(false, (std::string("an answer is as documented, not ") + Outcome.CodeName() +
                        ": " + Outcome.Message())
                           .c_str());
    }
    Require(Outcome.Ok() == Outcome.Message().empty(), "a failure, and no success, has a message");
    CheckFindings(Outcome);
}

bool IsRunning(sqlite3* pDb) {
    for (sqlite3_stmt* p = sqlite3_next_stmt(pDb, nullptr); p != nullptr;
         p = sqlite3_next_stmt(pDb, p)) {
        if (sqlite3_stmt_busy(p) != 0) {
            return true;
        }
    }
    return false;
}

bool IsOneOf(const char* szName, std::initializer_list<const char*> listNames) {
    return szName != nullptr && std::any_of(listNames.begin(), listNames.end(), [&](auto szOther) {
               return std::strcmp(szName, szOther) == 0;
           });
}

}  // namespace

TableHost::TableHost(const char* szMembers, const char* szKey, const char* szValues,
                     const VORN_JSON_DB::Options& How)
    : m_Db("SELECT 1"), m_strFill(szValues) {
    sqlite3_set_authorizer(m_Db.Get(), Authorize, this);
    Json::Value jDefinition = Definition("t", szMembers);
    jDefinition["t"]["key"] = szKey;
    VORN_JSON_DB::Options HowToOpen = How;
    HowToOpen.blCreateTable = true;
    m_Db.Run("SELECT count(*) FROM json_each('[]')");  // makes that table known
    Require(m_Table.Open(m_Db.Get(), "t", jDefinition, HowToOpen).Ok(), "a table opens");
    sqlite3_trace_v2(m_Db.Get(), SQLITE_TRACE_STMT, Trace, this);
    m_nFilled = -1;
}

VORN_JSON_DB::Table& TableHost::Begin() {
    if (sqlite3_total_changes(m_Db.Get()) != m_nFilled) {
        m_Db.Run("DELETE FROM t");
        if (!m_strFill.empty()) {
            m_Db.Run("INSERT INTO t VALUES " + m_strFill);
        }
        m_nFilled = sqlite3_total_changes(m_Db.Get());
    }
    fuzzhost::Begin(m_Db);
    return m_Table;
}

Status TableHost::Call(Use eUse, const std::function<Status()>& fn) {
    const int nChanges = sqlite3_total_changes(m_Db.Get());
    m_Db.Rearm();
    m_eUse = eUse;
    m_blFenced = true;
    m_nStatements = 0;
    Status Outcome = fn();
    m_blFenced = false;
    CheckStatus(Outcome);
    Require(!IsRunning(m_Db.Get()), "no statement is left running");
    Require(sqlite3_get_autocommit(m_Db.Get()) != 0, "no transaction stays open");
    Require(eUse == Use::kChange || m_nStatements <= 1, "reading is one statement");
    Require(eUse == Use::kChange || sqlite3_total_changes(m_Db.Get()) == nChanges,
            "reading changes nothing");
    return Outcome;
}

// Statements that stay prepared were looked at when they were made, by a call of the same kind.
int TableHost::Authorize(void* pSelf, int nAction, const char* szFirst, const char* szSecond,
                         const char*, const char*) {
    const TableHost& Self = *static_cast<TableHost*>(pSelf);
    if (!Self.m_blFenced) {
        return SQLITE_OK;
    }
    bool blMeant = false;
    switch (nAction) {
        case SQLITE_SELECT:
        case SQLITE_RECURSIVE:
            blMeant = true;
            break;
        case SQLITE_READ:
            blMeant = IsOneOf(szFirst, {"t", "json_each"});
            break;
        case SQLITE_FUNCTION:
            blMeant = IsOneOf(
                szSecond, {"like", "count", "typeof", "json_valid", "json_extract", "json_type"});
            break;
        case SQLITE_INSERT:
        case SQLITE_UPDATE:
        case SQLITE_DELETE:
            blMeant = Self.m_eUse == Use::kChange && IsOneOf(szFirst, {"t"});
            break;
        case SQLITE_TRANSACTION:
        case SQLITE_SAVEPOINT:
            blMeant = Self.m_eUse == Use::kChange;
            break;
        default:
            break;
    }
    Require(blMeant, (std::string("only the intended statement is made, not one with action ") +
                      std::to_string(nAction) + " on " + (szFirst == nullptr ? "" : szFirst) + " " +
                      (szSecond == nullptr ? "" : szSecond))
                         .c_str());
    return SQLITE_OK;
}

int TableHost::Trace(unsigned, void* pSelf, void*, void*) {
    ++static_cast<TableHost*>(pSelf)->m_nStatements;
    return 0;
}

}  // namespace fuzzhost
