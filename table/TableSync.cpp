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
    for (const std::string& strSql : vecStatements) {
        const int nResult = sqlite3_exec(Into.pDb, strSql.c_str(), nullptr, nullptr, nullptr);
        if (nResult != SQLITE_OK) {
            return FailBySqlite(Into.pDb, nResult, What);
        }
    }
    return {};
}

}  // namespace

Status Table::Lint(FindingList& vecFindings) {
    constexpr char kDo[] = "compare the definition with";
    Status State = vornjsondb::CheckState(m_pParts.get(), kDo, false);
    if (!State.Ok()) {
        return State;
    }
    FindingList vecFound;
    Status Outcome = vornjsondb::Attempt(m_pParts->pDb, m_pParts->How.nWaitMs, [&] {
        vecFound.clear();
        return Compare(*m_pParts, m_pParts->Do(kDo), nullptr, vecFound);
    });
    if (Outcome.Ok()) {
        vecFindings = std::move(vecFound);
    }
    return Outcome;
}

// The table is read inside of the transaction that changes it: another process may be doing the
// same.
Status Table::Sync(SyncMode eMode, SyncReport& Report) {
    constexpr char kDo[] = "bring the definition into";
    const bool blChange = eMode == SyncMode::kChange;
    Status State = vornjsondb::CheckState(m_pParts.get(), kDo, blChange);
    if (!State.Ok()) {
        return State;
    }
    Parts& Into = *m_pParts;
    const Doing What = Into.Do(kDo);
    SyncReport Found;
    const auto fnSteps = [&]() -> Status {
        Found = SyncReport();
        const Status Outcome = Compare(Into, What, &Found.vecStatements, Found.vecFindings);
        return Outcome.Ok() && blChange ? RunAll(Into, What, Found.vecStatements) : Outcome;
    };
    Status Outcome =
        blChange ? vornjsondb::AttemptWhole(Into.pDb, Into.Kept, Into.How.nWaitMs, What, fnSteps)
                 : vornjsondb::Attempt(Into.pDb, Into.How.nWaitMs, fnSteps);
    if (Outcome.Ok()) {
        Report = std::move(Found);
    }
    return Outcome;
}

}  // namespace VORN_JSON_DB
