// Queries for the old handle, which takes its condition as SQL text.

#include <algorithm>
#include <cmath>
#include <cstdlib>

#include "../src/base/JsonMemory.h"
#include "Operand.h"
#include "QueryPlan.h"
#include "TableParts.h"

namespace vornjsondb {

namespace {

void AppendSqlText(std::string_view strText, std::string& strSql) {
    if (IsPlainText(strText)) {
        strSql += Enclosed(strText, '\'');
        return;
    }
    // The plus takes away the CAST's affinity: a bound value has none.
    static constexpr char kHex[] = "0123456789abcdef";
    strSql += "+CAST(x'";
    for (const char c : strText) {
        const auto nByte = static_cast<unsigned char>(c);
        strSql.append(1, kHex[nByte >> 4U]).append(1, kHex[nByte & 15U]);
    }
    strSql += "' AS TEXT)";
}

// A decimal fraction may be read as another number where SQLite computes with 64 bits. A whole
// number of 53 bits over powers of two is exact everywhere.
void AppendReal(double dValue, std::string& strSql) {
    if (std::isinf(dValue)) {
        strSql += dValue < 0 ? "-9e999" : "9e999";
        return;
    }
    int nExponent = 0;
    double dFraction = std::frexp(dValue, &nExponent);
    while (std::trunc(dFraction) != dFraction) {
        dFraction *= 2;
        --nExponent;
    }
    constexpr int kStep = 62;
    strSql.append("(CAST(")
        .append(std::to_string(static_cast<std::int64_t>(dFraction)))
        .append(" AS REAL)");
    const char cOperator = nExponent < 0 ? '/' : '*';
    for (int nLeft = std::abs(nExponent); nLeft > 0; nLeft -= kStep) {
        strSql.append(1, cOperator)
            .append(std::to_string(std::int64_t{1} << std::min(nLeft, kStep)));
    }
    strSql += nExponent == 0 ? "/1)" : ")";
}

void AppendLiteral(const BoundValue& Value, std::string& strSql) {
    switch (Value.eKind) {
        case BoundValue::Kind::kInteger:
            strSql += std::to_string(Value.nValue);
            break;
        case BoundValue::Kind::kReal:
            AppendReal(Value.dValue, strSql);
            break;
        case BoundValue::Kind::kText:
            AppendSqlText(Value.strBytes, strSql);
            break;
        case BoundValue::Kind::kBlob:
            strSql += "x''";  // the end of all texts
            break;
        default:
            strSql += "NULL";
    }
}

}  // namespace

// Whether SQLite takes the statement that the old handle will make. The parentheses are more than
// its own, for what its UPDATE leaves on the parser's stack.
static Status Try(const Table::Parts& From, const std::string& strCondition,
                  const std::string& strTail, const Doing& What) {
    const std::string strSql =
        "SELECT 1 FROM " + From.Of.QuotedTable() + " WHERE ((((" + strCondition + "))))" + strTail;
    OwnStatement pStatement;
    return FromSqlite(From.pDb, Prepare(From.pDb, strSql, pStatement), What);
}

}  // namespace vornjsondb

namespace VORN_JSON_DB {

Status Table::ToOldQuery(const Query& Which, OldCall eCall, Json::Value& jOldQuery) try {
    const auto fnWrite = [&](Parts& From, const vornjsondb::Doing& What) {
        FindingList vecFindings;
        vornjsondb::QueryPlan Plan(From.Of, From.Codec, vornjsondb::AppendLiteral);
        const auto eUse =
            eCall == OldCall::kRead ? vornjsondb::QueryUse::kRead : vornjsondb::QueryUse::kChange;
        Plan.Resolve(Which, eUse, vecFindings);
        Status Checked = vornjsondb::FromFindings(std::move(vecFindings), What);
        if (!Checked.Ok()) {
            return Checked;
        }
        std::string strCondition(Plan.Condition());
        std::string strTail;
        Plan.AppendTail(strTail);
        const bool blAll = strCondition.empty() && strTail.empty();
        // mutate(doubled): the second one adds nothing.
        strCondition.append(strCondition.empty() ? "1" : "");
        Status Tried = vornjsondb::Try(From, strCondition, strTail, What);
        if (!Tried.Ok()) {
            return Tried;
        }
        // The old handle writes the filter in parentheses and a semicolon behind; its own sorting
        // sorts nothing. So the filter closes the parenthesis by itself and makes a comment of the
        // rest.
        if (!strTail.empty()) {
            strCondition += ")" + strTail + " --";
        }
        Json::Value jMade(Json::objectValue);
        if (!blAll) {
            jMade["vornSqlWhereFilter"] = strCondition;
        }
        jOldQuery.swapPayload(jMade);
        return Checked;
    };
    return vornjsondb::Guarded(m_pParts.get(), "write an old query for", false, fnWrite);
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

}  // namespace VORN_JSON_DB
