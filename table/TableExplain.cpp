// How SQLite would run a query.

#include <cstring>
#include <utility>

#include "Attempt.h"
#include "IndexAdvice.h"
#include "LintCodes.h"
#include "PlanSteps.h"
#include "QueryPlan.h"
#include "RealTable.h"
#include "SelectSql.h"
#include "SqlWords.h"
#include "TableParts.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Doing;
using vornjsondb::LintCode;
using vornjsondb::OwnStatement;
using Parts = Table::Parts;

// Each needs an index of its own.
std::string Joined(const std::vector<std::string>& vecNames) {
    std::string strJoined;
    for (const std::string& strName : vecNames) {
        strJoined += (strJoined.empty() ? "" : ", and one on ") + vornjsondb::Quoted(strName);
    }
    return strJoined;
}

Status ReadPlan(Parts& From, const Doing& What, Plan& Found) {
    return vornjsondb::Attempt(From.pDb, From.How.nWaitMs, [&] {
        Found.vecSteps.clear();
        const int nResult = vornjsondb::ReadPlanSteps(From.pDb, Found.strSql, Found.vecSteps);
        return vornjsondb::FromSqlite(From.pDb, nResult, What);
    });
}

// What follows the first statement in the text; nullptr: there is no statement.
const char* BehindFirst(sqlite3* pDb, const char* szSql, int& nResult) {
    const char* szTail = nullptr;
    sqlite3_stmt* pStatement = nullptr;
    nResult = sqlite3_prepare_v2(pDb, szSql, -1, &pStatement, &szTail);
    const OwnStatement pOwn(pStatement);
    return pStatement == nullptr ? nullptr : szTail;
}

// A comment or blanks may follow the one statement.
Status CheckOne(Parts& From, const Doing& What, const std::string& strSql) {
    int nResult = SQLITE_OK;
    const char* szTail = BehindFirst(From.pDb, strSql.c_str(), nResult);
    if (nResult != SQLITE_OK) {
        return vornjsondb::FailBySqlite(From.pDb, nResult, What);
    }
    bool blMore = std::strlen(strSql.c_str()) != strSql.size();
    if (szTail != nullptr && !blMore) {
        blMore = BehindFirst(From.pDb, szTail, nResult) != nullptr || nResult != SQLITE_OK;
    }
    if (nResult == SQLITE_NOMEM) {
        return vornjsondb::FailBySqlite(From.pDb, nResult, What);
    }
    FindingList vecFindings;
    if (szTail == nullptr || blMore) {
        vornjsondb::Report(
            vecFindings, LintCode::kNotOneStatement, "",
            szTail == nullptr ? "the text holds no statement" : "more follows the first statement");
    }
    return vornjsondb::FromFindings(std::move(vecFindings), What);
}

}  // namespace

Status Table::Explain(const Query& Which, Plan& Found) {
    const auto fnExplain = [&](Parts& From, const Doing& What) {
        Plan Made;
        vornjsondb::QueryPlan Resolved(From.Of, From.Codec);
        Resolved.Resolve(Which, vornjsondb::QueryUse::kRead, Made.vecFindings);
        Status Checked = vornjsondb::FromFindings(FindingList(Made.vecFindings), What);
        // mutate(exchanged): a statement for nobody only takes time.
        if (!Checked.Ok()) {
            return Checked;
        }
        Made.strSql = vornjsondb::SelectSql(From.Of, Resolved.Columns(From.WholeRow.Columns()));
        Resolved.AppendWhere(Made.strSql);
        Resolved.AppendTail(Made.strSql);
        Status Outcome = ReadPlan(From, What, Made);
        // mutate(exchanged): an advice for nobody only takes time.
        if (!Outcome.Ok()) {
            return Outcome;
        }
        const std::vector<std::string> vecAdvice =
            vornjsondb::IndexAdvice(Which, From.Of, From.Codec);
        const std::vector<std::string> vecNames{Name()};
        if (!vecAdvice.empty() && vornjsondb::HasScan(Made.vecSteps, vecNames)) {
            vornjsondb::Report(
                Made.vecFindings, LintCode::kFullScan, "/where",
                "all records are looked at, which an index spares on " + Joined(vecAdvice));
        }
        Found = std::move(Made);
        return Checked;
    };
    return vornjsondb::Guarded(m_pParts.get(), "explain a query of", false, fnExplain);
}

Status Table::ExplainSql(const std::string& strSql, Plan& Found) {
    const auto fnExplain = [&](Parts& From, const Doing& What) {
        Plan Made;
        // mutate(exchanged): in any order.
        Made.strSql = strSql;
        Status Outcome = vornjsondb::Attempt(From.pDb, From.How.nWaitMs,
                                             [&] { return CheckOne(From, What, strSql); });
        std::string strDatabase = "main";
        if (Outcome.Ok()) {
            const int nResult = vornjsondb::FindDatabase(From.pDb, Name(), strDatabase);
            Outcome = vornjsondb::FromSqlite(From.pDb, nResult, What);
        }
        if (Outcome.Ok()) {
            Outcome = ReadPlan(From, What, Made);
        }
        // mutate(exchanged): it only looks.
        if (!Outcome.Ok()) {
            return Outcome;
        }
        const std::vector<std::string> vecNames = vornjsondb::NamesIn(strSql, Name(), strDatabase);
        const bool blSearched =
            vornjsondb::HoldsWord(strSql, "WHERE") && vornjsondb::HasScan(Made.vecSteps, vecNames);
        if (blSearched || vornjsondb::HasOwnIndex(Made.vecSteps, vecNames)) {
            vornjsondb::Report(
                Made.vecFindings, LintCode::kFullScan, "",
                "all records are looked at; an index on what is compared may spare it");
        }
        Found = std::move(Made);
        return Outcome;
    };
    return vornjsondb::Guarded(m_pParts.get(), "explain a statement on", false, fnExplain);
}

}  // namespace VORN_JSON_DB
