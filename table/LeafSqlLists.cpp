// "$in", "$nin" and "$contains".

#include <utility>

#include "Affinity.h"
#include "Concat.h"
#include "LeafSql.h"

namespace vornjsondb {

namespace {

// What a column makes texts of it does not compare with the numbers of a list inside of JSON.
bool HoldsNumbersAsTexts(const Member& Of) {
    return Of.eAffinity == Affinity::kText && !Keeps(Affinity::kText, Of.Kind());
}

}  // namespace

bool LeafSql::WriteIn(const Operator& Row, const Json::Value& jList, Problem& Why) {
    ListOperand List;
    const bool blOneByOne =
        m_Out.pfnLiteral != nullptr || (!m_blPath && HoldsNumbersAsTexts(*m_pMember));
    if (!ReadList(m_Where, jList, blOneByOne, m_Reader, List, Why)) {
        return false;
    }
    const char* szBefore = "(";
    const auto Begin = [&] { m_strSql += std::exchange(szBefore, " OR "); };
    const auto BeginList = [&](ValueKind eKind, const char* szList) {
        Begin();
        OpenJson();
        AddLeft(eKind);
        m_strSql += szList;
    };
    // mutate(exchanged): of an empty list the loop writes nothing.
    for (size_t i = 0; i < kValueKinds; ++i) {
        const auto eKind = static_cast<ValueKind>(i);
        ListOperand::OneKind& Kind = List.Kinds[i];
        // mutate(exchanged): no kind has both.
        if (Kind.blBare) {
            Begin();
            AddJsonEqual(Operand{eKind, BoundValue()});
        }
        if (!Kind.strJson.empty()) {
            BeginList(eKind, " IN (SELECT value FROM json_each(");
            m_Out.Add(m_Reader.Keep(std::move(Kind.strJson)));
            m_strSql += "))";
            CloseJson(eKind);
        }
        if (!Kind.vecValues.empty()) {
            const char* szBeforeValue = "";
            BeginList(eKind, " IN (");
            for (const BoundValue& Value : Kind.vecValues) {
                m_strSql += std::exchange(szBeforeValue, ",");
                AddValue(eKind, Value);
            }
            m_strSql += ')';
            CloseJson(eKind);
        }
    }
    if (jList.empty()) {
        BeginList(ValueKind::kNumber, " IN ()");  // true for nothing, NULL included
        CloseJson(ValueKind::kNumber);
    }
    m_strSql += Row.eOp == VORN_JSON_DB::Op::kNotIn ? ") IS NOT TRUE" : ")";
    return true;
}

bool LeafSql::WriteContains(const Json::Value& jElement, Problem& Why) {
    Operand What;
    if (!m_Reader.ReadJson(jElement, What, Why)) {
        return false;
    }
    // A name that no table of the statement has.
    const std::string strElement = Quoted(Concat({m_Of.Table(), "[]"}));
    Append(m_strSql,
           {"EXISTS (SELECT 1 FROM json_each(", ElementsAt(m_pMember->strColumn, m_Where.strPath),
            ") AS ", strElement, " WHERE "});
    if (What.Value.eKind != BoundValue::Kind::kNull) {
        Append(m_strSql, {strElement, ".value IS "});
        AddValue(What.eKind, What.Value);
        m_strSql += " AND ";
    }
    Append(m_strSql, {strElement, ".type", JsonTypeTest(What.eKind), ")"});
    return true;
}

}  // namespace vornjsondb
