// A definition and the real table, brought together.

#include <utility>

#include "Attempt.h"
#include "TableCompare.h"
#include "TableParts.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Doing;
using vornjsondb::FailBySqlite;
using Parts = Table::Parts;

Status Compare(Parts& With, const Doing& What, std::vector<std::string>* pvecStatements,
               FindingList& vecFindings) {
    bool blFound = false;
    const int nResult =
        vornjsondb::CompareTable(With.pDb, With.Of, blFound, pvecStatements, vecFindings);
    if (nResult != SQLITE_OK) {
        return FailBySqlite(With.pDb, nResult, What);
    }
    return blFound ? Status()
                   : vornjsondb::Fail(StatusCode::kNotFound, What, "there is no such table");
}

Status RunAll(Parts& Into, const Doing& What, const std::vector<std::string>& vecStatements) {
    std::string strAll;
    for (const std::string& strSql : vecStatements) {
        strAll += strSql + ";";
    }
    const int nResult = sqlite3_exec(Into.pDb, strAll.c_str(), nullptr, nullptr, nullptr);
    return vornjsondb::FromSqlite(Into.pDb, nResult, What);
}

}  // namespace

Status Table::Lint(FindingList& vecFindings) {
    const auto fnLint = [&](Parts& With, const Doing& What) {
        FindingList vecFound;
        Status Outcome = vornjsondb::Attempt(With.pDb, With.How.nWaitMs, [&] {
            vecFound.clear();
            return Compare(With, What, nullptr, vecFound);
        });
        if (Outcome.Ok()) {
            vecFindings = std::move(vecFound);
        }
        return Outcome;
    };
    return vornjsondb::Guarded(m_pParts.get(), "compare the definition with", false, fnLint);
}

// The table is read inside of the transaction that changes it: another process may be doing the
// same.
Status Table::Sync(SyncMode eMode, SyncReport& Report) {
    const bool blChange = eMode == SyncMode::kChange;
    const auto fnSync = [&](Parts& Into, const Doing& What) {
        SyncReport Found;
        const auto fnSteps = [&]() -> Status {
            Found = SyncReport();
            Status Outcome = Compare(Into, What, &Found.vecStatements, Found.vecFindings);
            return Outcome.Ok() && blChange ? RunAll(Into, What, Found.vecStatements) : Outcome;
        };
        const int nWaitMs = Into.How.nWaitMs;
        Status Outcome = blChange
                             ? vornjsondb::AttemptWhole(Into.pDb, Into.Kept, nWaitMs, What, fnSteps)
                             : vornjsondb::Attempt(Into.pDb, nWaitMs, fnSteps);
        if (Outcome.Ok()) {
            Report = std::move(Found);
        }
        return Outcome;
    };
    return vornjsondb::Guarded(m_pParts.get(), "bring the definition into", blChange, fnSync);
}

}  // namespace VORN_JSON_DB
