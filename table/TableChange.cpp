// Changing and removing what a query selects.

#include <utility>

#include "Attempt.h"
#include "FindingCodes.h"
#include "QueryPlan.h"
#include "TableParts.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Callable;
using vornjsondb::Doing;
using vornjsondb::FailBySqlite;
using vornjsondb::QueryPlan;
using vornjsondb::QueryUse;
using vornjsondb::Statement;
using Parts = Table::Parts;

// Runs one statement, which is whole by itself, and counts the rows that it changed.
Status Run(Parts& Into, const Doing& What, const std::string& strShape,
           Callable<std::string()> fnSql, Callable<int(sqlite3_stmt*)> fnBind,
           std::int64_t* pnRows) {
    return vornjsondb::Attempt(Into.pDb, Into.How.nWaitMs, [&]() -> Status {
        Statement Lent;
        int nResult = Into.Kept.Take(strShape, fnSql, Lent);
        if (nResult == SQLITE_OK) {
            nResult = fnBind(Lent.Get());
        }
        if (nResult == SQLITE_OK) {
            nResult = Lent.Finish();
        }
        if (nResult != SQLITE_OK) {
            return FailBySqlite(Into.pDb, nResult, What);
        }
        if (pnRows != nullptr) {
            *pnRows = sqlite3_changes(Into.pDb);
        }
        return {};
    });
}

std::string SetSql(const vornjsondb::Members& Of, const vornjsondb::RecordValues& Values) {
    std::string strSet;
    for (size_t i = 0; i < Of.Size(); ++i) {
        if (Values.Has(i)) {
            strSet += (strSet.empty() ? " SET " : ", ") + Of.At(i).strQuoted + "=?";
        }
    }
    return strSet;
}

// The outcome of the statement, with the query's warnings where it succeeded.
Status Join(const Status& Warned, const Status& Ran) {
    return Ran.Ok() ? Warned : Ran;
}

}  // namespace

Status Table::Update(const Query& Which, const Json::Value& jMembers, std::int64_t* pnRows) {
    constexpr char kDo[] = "update records of";
    Status State = vornjsondb::CheckState(m_pParts.get(), kDo, true);
    if (!State.Ok()) {
        return State;
    }
    Parts& Into = *m_pParts;
    const Doing What = Into.Do(kDo);
    FindingList vecFindings;
    QueryPlan Plan(Into.Of, Into.Codec);
    Plan.Resolve(Which, QueryUse::kChange, vecFindings);
    FindingList vecMembers;
    Into.Values.Take(jMembers, vecMembers);
    vecFindings.insert(vecFindings.end(), vecMembers.begin(), vecMembers.end());
    Status Checked = vornjsondb::FromFindings(std::move(vecFindings), What);
    if (!Checked.Ok()) {
        return Checked;
    }
    const auto fnSql = [&] {
        std::string strSql = "UPDATE " + Into.Of.QuotedTable() + SetSql(Into.Of, Into.Values);
        Plan.AppendWhere(strSql);
        return strSql;
    };
    const auto fnBind = [&](sqlite3_stmt* pStatement) {
        int nNext = 1;
        const int nResult = Into.Values.BindGiven(pStatement, nNext, true);
        return nResult == SQLITE_OK ? Plan.Bind(pStatement, nNext) : nResult;
    };
    return Join(Checked,
                Run(Into, What, "S" + Into.Values.Given() + Plan.Shape(), fnSql, fnBind, pnRows));
}

Status Table::Remove(const Query& Which, std::int64_t* pnRows) {
    constexpr char kDo[] = "remove records from";
    Status State = vornjsondb::CheckState(m_pParts.get(), kDo, true);
    if (!State.Ok()) {
        return State;
    }
    Parts& Into = *m_pParts;
    const Doing What = Into.Do(kDo);
    FindingList vecFindings;
    QueryPlan Plan(Into.Of, Into.Codec);
    Plan.Resolve(Which, QueryUse::kChange, vecFindings);
    Status Checked = vornjsondb::FromFindings(std::move(vecFindings), What);
    if (!Checked.Ok()) {
        return Checked;
    }
    const auto fnSql = [&] {
        std::string strSql = "DELETE FROM " + Into.Of.QuotedTable();
        Plan.AppendWhere(strSql);
        return strSql;
    };
    const auto fnBind = [&](sqlite3_stmt* pStatement) { return Plan.Bind(pStatement, 1); };
    return Join(Checked, Run(Into, What, "D" + Plan.Shape(), fnSql, fnBind, pnRows));
}

Status Table::RemoveAll(std::int64_t* pnRows) {
    constexpr char kDo[] = "remove all records from";
    Status State = vornjsondb::CheckState(m_pParts.get(), kDo, true);
    if (!State.Ok()) {
        return State;
    }
    return Run(
        *m_pParts, m_pParts->Do(kDo), "D",
        [&] { return "DELETE FROM " + m_pParts->Of.QuotedTable(); },
        [](sqlite3_stmt*) { return SQLITE_OK; }, pnRows);
}

}  // namespace VORN_JSON_DB
