// What each query needs; what only a new statement or a query of many parts needs is in a file of
// its own.

#include "QueryPlan.h"

namespace vornjsondb {

using VORN_JSON_DB::Query;

void QueryPlan::Resolve(const Query& Which, QueryUse eUse, FindingList& vecFindings) {
    ReportAll(Which.vecFindings, vecFindings);
    if (HasError(vecFindings)) {
        return;
    }
    CheckPage(Which, eUse, vecFindings);
    m_pWhich = &Which;
    // mutate(exchanged): nobody asks for it before.
    m_eUse = eUse;
    // mutate(true, sunk): what is plain may be written early.
    if (!ResolvePlain(Which)) {
        Write(Which, eUse, vecFindings);
    }
}

// Most queries compare one member with one value. Their shape is told by the member's place, and
// their SQL is needed only for a statement that is not there yet.
bool QueryPlan::ResolvePlain(const Query& Which) {
    // mutate(true): the longer way gives the same.
    if (Which.vecWhere.size() != 1 || !Which.vecSort.empty() || !Which.vecMembers.empty() ||
        m_Sql.pfnLiteral != nullptr) {
        return false;
    }
    const VORN_JSON_DB::Condition::Node& Leaf = Which.vecWhere[0].Root();
    Place Where;
    Problem Why;
    Operand What;
    // mutate(== to !=): the longer way gives the same.
    const bool blPlain =
        Leaf.eKind == VORN_JSON_DB::Condition::Node::Kind::kLeaf && IsOperator(Leaf.eOp) &&
        RowOf(Leaf.eOp).eForm == OperandForm::kValue &&
        FindPlace(m_Of, Leaf.strMember, Where, Why) && Where.strPath.empty() &&
        m_Of.At(Where.nMember).Kind() != BoundKind::kAny &&
        OperandReader(m_Of, m_Codec, m_Sql.listTexts).Read(Where, Leaf.jOperand, What, Why);
    if (blPlain) {
        const bool blPaged = IsPaged(Which);
        // No SQL begins so.
        // mutate(doubled): told twice, it tells the same.
        m_strShape += blPaged ? '\2' : '\1';
        // mutate(doubled, exchanged): in any order, once or twice.
        m_strShape += static_cast<char>(Leaf.eOp);
        // mutate(doubled): told twice, it tells the same members apart.
        m_strShape.append(reinterpret_cast<const char*>(&Where.nMember), sizeof Where.nMember);
        // mutate(exchanged): in any order.
        m_aPlain[0] = What.Value;
        // mutate(exchanged): in any order.
        m_aPlain[1].SetInteger(Which.nLimit);
        m_aPlain[2].SetInteger(Which.nOffset);
        m_nPlain = blPaged ? 3 : 1;
    }
    return blPlain;
}

int QueryPlan::Bind(sqlite3_stmt* pStatement, int nFirst) const {
    const bool blPlain = m_nPlain > 0;
    const BoundValue* const pFirst = blPlain ? m_aPlain : m_Sql.vecValues.data();
    const size_t nValues = blPlain ? m_nPlain : m_Sql.vecValues.size();
    for (size_t i = 0; i < nValues; ++i) {
        const int nResult = pFirst[i].Bind(pStatement, nFirst++);
        if (nResult != SQLITE_OK) {
            return nResult;
        }
    }
    return SQLITE_OK;
}

}  // namespace vornjsondb
