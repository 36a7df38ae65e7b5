// Changing and removing what a query selects.

#include <utility>

#include "Attempt.h"
#include "FindingCodes.h"
#include "QueryPlan.h"
#include "RecordWriter.h"
#include "TableParts.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Callable;
using vornjsondb::Doing;
using vornjsondb::QueryPlan;
using vornjsondb::QueryUse;
using vornjsondb::Statement;
using Parts = Table::Parts;

// Runs one statement, which is whole by itself but in a table that fails halfway, and counts the
// rows that it changed.
Status Run(Parts& Into, const Doing& What, const std::string& strShape,
           Callable<std::string()> fnSql, Callable<int(sqlite3_stmt*)> fnBind,
           std::int64_t* pnRows) {
    int nRows = 0;
    const auto fnRun = [&]() -> Status {
        Statement Lent;
        int nResult = Into.Kept.Take(strShape, fnSql, Lent);
        if (nResult == SQLITE_OK) {
            nResult = fnBind(Lent.Get());
        }
        if (nResult == SQLITE_OK) {
            nResult = Lent.Finish();
        }
        nRows = sqlite3_changes(Into.pDb);
        return nResult == SQLITE_OK && nRows == 0 ? vornjsondb::CheckTable(Into, What)
                                                  : vornjsondb::FromSqlite(Into.pDb, nResult, What);
    };
    Status Outcome =
        Into.blFails ? vornjsondb::AttemptWhole(Into.pDb, Into.Kept, Into.How.nWaitMs, What, fnRun)
                     : vornjsondb::Attempt(Into.pDb, Into.How.nWaitMs, fnRun);
    if (Outcome.Ok() && pnRows != nullptr) {
        *pnRows = nRows;
    }
    return Outcome;
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

// Runs what a query with findings leads to; a success tells its warnings.
template <typename Change>
Status RunChecked(FindingList vecFindings, const Doing& What, Change&& fnChange) {
    Status Checked = vornjsondb::FromFindings(std::move(vecFindings), What);
    if (!Checked.Ok()) {
        return Checked;
    }
    Status Ran = fnChange();
    return Ran.Ok() ? Checked : Ran;
}

}  // namespace

Status Table::Update(const Query& Which, const Json::Value& jMembers, std::int64_t* pnRows) {
    const auto fnUpdate = [&](Parts& Into, const Doing& What) {
        FindingList vecFindings;
        QueryPlan Plan(Into.Of, Into.Codec);
        Plan.Resolve(Which, QueryUse::kChange, vecFindings);
        FindingList vecMembers;
        Into.Values.Take(jMembers, vecMembers);
        vornjsondb::CheckEmpty(Into.Values, vecMembers);
        vecFindings.insert(vecFindings.end(), vecMembers.begin(), vecMembers.end());
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
        return RunChecked(std::move(vecFindings), What, [&] {
            return Run(Into, What, "S" + Into.Values.Given() + Plan.Shape(), fnSql, fnBind, pnRows);
        });
    };
    return vornjsondb::Guarded(m_pParts.get(), "update records of", true, fnUpdate);
}

Status Table::Remove(const Query& Which, std::int64_t* pnRows) {
    const auto fnRemove = [&](Parts& Into, const Doing& What) {
        FindingList vecFindings;
        QueryPlan Plan(Into.Of, Into.Codec);
        Plan.Resolve(Which, QueryUse::kChange, vecFindings);
        const auto fnSql = [&] {
            std::string strSql = "DELETE FROM " + Into.Of.QuotedTable();
            Plan.AppendWhere(strSql);
            return strSql;
        };
        const auto fnBind = [&](sqlite3_stmt* pStatement) { return Plan.Bind(pStatement, 1); };
        return RunChecked(std::move(vecFindings), What, [&] {
            return Run(Into, What, "D" + Plan.Shape(), fnSql, fnBind, pnRows);
        });
    };
    return vornjsondb::Guarded(m_pParts.get(), "remove records from", true, fnRemove);
}

Status Table::RemoveAll(std::int64_t* pnRows) {
    const auto fnRemove = [&](Parts& Into, const Doing& What) {
        return Run(
            Into, What, "D", [&] { return "DELETE FROM " + Into.Of.QuotedTable(); },
            [](sqlite3_stmt*) { return SQLITE_OK; }, pnRows);
    };
    return vornjsondb::Guarded(m_pParts.get(), "remove all records from", true, fnRemove);
}

}  // namespace VORN_JSON_DB
