// Indexes on members and on places in JSON members.

#include <algorithm>
#include <utility>

#include "Attempt.h"
#include "Concat.h"
#include "DecimalPoint.h"
#include "FindingCodes.h"
#include "IndexSql.h"
#include "SelectSql.h"
#include "TableParts.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Doing;
using vornjsondb::FindingCode;
using vornjsondb::IndexPlan;
using vornjsondb::IndexTerm;
using Parts = Table::Parts;

bool HasTerm(const std::vector<IndexTerm>& vecTerms, const vornjsondb::Place& Where) {
    return std::any_of(vecTerms.begin(), vecTerms.end(), [&Where](const IndexTerm& Term) {
        return Term.Where.nMember == Where.nMember && Term.Where.strPath == Where.strPath;
    });
}

std::vector<IndexTerm> TermsOf(const vornjsondb::Members& Of,
                               const std::vector<std::string>& vecMembers,
                               FindingList& vecFindings) {
    if (vecMembers.empty()) {
        vornjsondb::Report(vecFindings, FindingCode::kBadMembers, "", "the list names no member");
    }
    std::vector<IndexTerm> vecTerms;
    for (size_t i = 0; i < vecMembers.size(); ++i) {
        IndexTerm Term{vecMembers[i], {}};
        vornjsondb::Problem Why;
        if (!vornjsondb::FindPlace(Of, Term.strName, Term.Where, Why)) {
            vornjsondb::Report(vecFindings, Why.eCode, vornjsondb::Below("", std::to_string(i)),
                               Why.strMessage);
        } else if (HasTerm(vecTerms, Term.Where)) {
            vornjsondb::Report(
                vecFindings, FindingCode::kNamedTwice, vornjsondb::Below("", std::to_string(i)),
                vornjsondb::Concat({vornjsondb::ShownText(Term.strName), " is named twice"}));
        } else if (!Term.Where.strPath.empty()) {
            vornjsondb::CheckFractions(vornjsondb::Below("", std::to_string(i)), vecFindings);
        }
        vecTerms.push_back(std::move(Term));
    }
    return vecTerms;
}

int RunPlan(Parts& Into, const std::vector<IndexTerm>& vecTerms, bool blUnique, IndexPlan& Plan) {
    vornjsondb::RealIndexes There;
    std::vector<std::string> vecPlanned;
    std::vector<size_t> vecColumns;
    vecColumns.reserve(vecTerms.size());
    for (const IndexTerm& Term : vecTerms) {
        vecColumns.push_back(Term.Where.nMember);
    }
    // In CREATE INDEX the name of a column that is not there would be a text, the same in all rows.
    vornjsondb::OwnStatement pColumns;
    int nResult =
        vornjsondb::Prepare(Into.pDb, vornjsondb::SelectSql(Into.Of, vecColumns), pColumns);
    if (nResult == SQLITE_OK) {
        nResult = vornjsondb::ReadRealIndexes(Into.pDb, Into.Of.Table(), There);
    }
    if (nResult == SQLITE_OK) {
        nResult =
            vornjsondb::PlanIndex(Into.pDb, Into.Of, There, vecTerms, blUnique, vecPlanned, Plan);
    }
    return nResult == SQLITE_OK && !Plan.blThere
               ? sqlite3_exec(Into.pDb, Plan.strSql.c_str(), nullptr, nullptr, nullptr)
               : nResult;
}

}  // namespace

Status Table::CreateIndex(const std::vector<std::string>& vecMembers, bool blUnique,
                          std::string* pstrSql) {
    const auto fnCreate = [&](Parts& Into, const Doing& What) -> Status {
        FindingList vecFindings;
        const std::vector<IndexTerm> vecTerms = TermsOf(Into.Of, vecMembers, vecFindings);
        Status Outcome = vornjsondb::FromFindings(std::move(vecFindings), What);
        IndexPlan Plan;
        if (Outcome.Ok()) {
            Outcome = vornjsondb::AttemptWhole(Into.pDb, Into.Kept, Into.How.nWaitMs, What, [&] {
                const int nResult = RunPlan(Into, vecTerms, blUnique, Plan);
                return vornjsondb::FromSqlite(Into.pDb, nResult, What);
            });
        }
        if (Outcome.Ok() && pstrSql != nullptr) {
            *pstrSql = Plan.strSql;
        }
        return Outcome;
    };
    return vornjsondb::Guarded(m_pParts.get(), "create an index on", true, fnCreate);
}

}  // namespace VORN_JSON_DB
