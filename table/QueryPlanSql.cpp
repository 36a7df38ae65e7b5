// A plan's SQL.

#include <algorithm>

#include "Concat.h"
#include "ConditionSql.h"
#include "DecimalPoint.h"
#include "QueryPlan.h"

namespace vornjsondb {

using VORN_JSON_DB::Query;

namespace {

constexpr size_t kUsualText = 256;
constexpr size_t kUsualValues = 4;  // an operand or two, and a page

}  // namespace

void QueryPlan::CheckPage(const Query& Which, QueryUse eUse, FindingList& vecFindings) {
    if (Which.nLimit < -1) {
        Report(vecFindings, FindingCode::kBadCount, "/limit", "the limit is less than 0");
    }
    if (Which.nOffset < 0) {
        Report(vecFindings, FindingCode::kBadCount, "/offset", "the offset is less than 0");
    }
    if (eUse == QueryUse::kChange && (IsPaged(Which) || !Which.vecSort.empty())) {
        Report(vecFindings, FindingCode::kPagedChange, "",
               "a change reaches all records that the conditions select, in no order");
    }
    if (eUse == QueryUse::kChange && Which.vecWhere.empty()) {
        Report(vecFindings, FindingCode::kNoCondition, "/where",
               "the query has no condition and would reach every record");
    }
}

void QueryPlan::WritePlain() {
    // mutate(> to >=): what is empty stays empty.
    if (m_nPlain > 0 && m_Sql.strSql.empty()) {
        FindingList vecNone;
        Write(*m_pWhich, m_eUse, vecNone);
    }
}

void QueryPlan::Write(const Query& Which, QueryUse eUse, FindingList& vecFindings) {
    m_Sql.strSql.reserve(kUsualText);
    m_Sql.vecValues.reserve(kUsualValues);
    AppendConditions(Which.vecWhere, m_Of, m_Codec, eUse == QueryUse::kChange, m_Sql, vecFindings);
    m_nConditionEnd = m_Sql.strSql.size();
    ResolveMembers(Which, vecFindings);
    if (eUse != QueryUse::kChange) {
        ResolveSort(Which, IsPaged(Which), vecFindings);
    }
    if (m_Sql.blReadsJson) {
        CheckFractions("/where", vecFindings);
    }
    // Names are looked at for all; what they say is for those who read.
    if (eUse != QueryUse::kRead) {
        m_vecColumns.clear();
        m_Sql.strSql.resize(m_nConditionEnd);
    }
    if (eUse != QueryUse::kChange && IsPaged(Which)) {
        AppendPage(Which);
    }
    m_nTailEnd = m_Sql.strSql.size();
    for (const size_t nMember : m_vecColumns) {
        // mutate(doubled): told twice, it tells the same columns apart.
        Append(m_Sql.strSql, {" ", DigitsOf(static_cast<std::int64_t>(nMember))});
    }
}

// Any number of names in any order, the same ones too: each member once, in the members' order.
void QueryPlan::ResolveMembers(const Query& Which, FindingList& vecFindings) {
    std::string strNamed(Which.vecMembers.empty() ? 0 : m_Of.Size(), '0');
    for (size_t i = 0; i < Which.vecMembers.size(); ++i) {
        Place Where;
        Problem Why;
        if (FindPlace(m_Of, Which.vecMembers[i], Where, Why) && !Where.strPath.empty()) {
            Why = {FindingCode::kBadMembers,
                   Concat({ShownText(Which.vecMembers[i]), " is a path"})};
        }
        if (!Why.strMessage.empty()) {
            Report(vecFindings, Why.eCode,
                   Below("/members", DigitsOf(static_cast<std::int64_t>(i))), Why.strMessage);
            continue;
        }
        strNamed[Where.nMember] = '1';
    }
    for (size_t i = 0; i < strNamed.size(); ++i) {
        if (strNamed[i] == '1') {
            m_vecColumns.push_back(i);
        }
    }
}

// The key comes last, so that pages follow each other without gaps, whatever sorting leaves open.
void QueryPlan::ResolveSort(const Query& Which, bool blPaged, FindingList& vecFindings) {
    std::vector<size_t> vecSorted;
    for (size_t i = 0; i < Which.vecSort.size(); ++i) {
        const std::string& strTerm = Which.vecSort[i];
        Place Where;
        Problem Why;
        bool blFound = FindPlace(m_Of, strTerm, Where, Why);
        const bool blDescending = !blFound && strTerm[0] == '-';
        if (blDescending) {
            blFound = FindPlace(m_Of, std::string_view(strTerm).substr(1), Where, Why);
        }
        if (!blFound) {
            Report(vecFindings, Why.eCode, Below("/sort", DigitsOf(static_cast<std::int64_t>(i))),
                   Why.strMessage);
            continue;
        }
        m_Sql.blReadsJson = m_Sql.blReadsJson || !Where.strPath.empty();
        // mutate(exchanged): in any order.
        AppendSort(Where.nMember, Where.strPath, blDescending);
        // mutate(doubled): it is only asked whether it is there.
        vecSorted.push_back(Where.strPath.empty() ? Where.nMember : Members::kNone);
    }
    for (const size_t nMember : m_Of.Key()) {
        const bool blSorted = std::count(vecSorted.begin(), vecSorted.end(), nMember) > 0;
        if (!blSorted && (blPaged || !vecSorted.empty())) {
            AppendSort(nMember, {}, false);
        }
    }
}

void QueryPlan::AppendSort(size_t nMember, const std::string& strPath, bool blDescending) {
    const Member& Of = m_Of.At(nMember);
    m_Sql.strSql += m_Sql.strSql.size() == m_nConditionEnd ? " ORDER BY " : ", ";
    if (!strPath.empty()) {
        m_Sql.strSql += ValueAt(Of.strColumn, strPath);
    } else {
        m_Sql.strSql += Of.strColumn;
        m_Sql.strSql += IsOrderedAsText(Of) ? " COLLATE BINARY" : "";
    }
    m_Sql.strSql += blDescending ? " DESC" : "";
}

void QueryPlan::AppendPage(const Query& Which) {
    BoundValue Limit, Offset;
    Limit.SetInteger(Which.nLimit);
    Offset.SetInteger(Which.nOffset);
    m_Sql.strSql += " LIMIT ";
    m_Sql.Add(Limit);
    m_Sql.strSql += " OFFSET ";
    m_Sql.Add(Offset);
}

std::string_view QueryPlan::Condition() {
    WritePlain();
    return std::string_view(m_Sql.strSql).substr(0, m_nConditionEnd);
}

void QueryPlan::AppendWhere(std::string& strSql) {
    const std::string_view strCondition = Condition();
    if (!strCondition.empty()) {
        Append(strSql, {" WHERE ", strCondition});
    }
}

void QueryPlan::AppendTail(std::string& strSql) {
    WritePlain();
    strSql += std::string_view(m_Sql.strSql).substr(m_nConditionEnd, m_nTailEnd - m_nConditionEnd);
}

}  // namespace vornjsondb
