// The CREATE TABLE statement that a definition asks for.

#include "CreateStatement.h"

#include <VornJsonDbTable.h>

#include <cmath>
#include <string_view>
#include <vector>

#include "../src/base/JsonText.h"
#include "Concat.h"
#include "FindingCodes.h"
#include "Fit.h"

namespace vornjsondb {

namespace {

// By which SQLite keeps values as they are bound.
const char* DeclaredType(BoundKind eKind, bool blStrict) {
    switch (eKind) {
        case BoundKind::kBoolean:
        case BoundKind::kInteger:
            return " INTEGER";
        case BoundKind::kReal:
            return " REAL";
        case BoundKind::kAny:
            return blStrict ? " ANY" : "";
        default:
            return " TEXT";
    }
}

std::vector<size_t> ColumnOrder(const Members& Of, const std::vector<std::string>& vecFirst) {
    std::vector<size_t> vecOrder;
    std::vector<bool> vecTaken(Of.Size());
    const auto fnTake = [&](size_t nMember) {
        if (nMember < vecTaken.size() && !vecTaken[nMember]) {
            vecTaken[nMember] = true;
            vecOrder.push_back(nMember);
        }
    };
    for (const std::string& strName : vecFirst) {
        fnTake(Of.Find(strName));
    }
    for (size_t nMember = 0; nMember < Of.Size(); ++nMember) {
        fnTake(nMember);
    }
    return vecOrder;
}

}  // namespace

std::string DefaultClause(const Member& Declared) {
    if (Declared.pjDefault == nullptr) {
        return {};
    }
    JsonCodec Codec;
    std::string strJson;
    BoundValue Value;
    const Misfit eMisfit =
        FitJson(*Declared.pType, *Declared.pjDefault, false, Codec, strJson, Value);
    // What does not fit is refused when a record needs it, and no literal can hold a NUL byte.
    const bool blText = Value.eKind == BoundValue::Kind::kText;
    if (eMisfit != Misfit::kNone ||
        (blText && Value.strBytes.find('\0') != std::string_view::npos)) {
        return {};
    }
    char szReal[32];
    switch (Value.eKind) {
        case BoundValue::Kind::kInteger:
            return Concat({" DEFAULT ", DigitsOf(Value.nValue)});
        case BoundValue::Kind::kReal:
            if (std::isinf(Value.dValue)) {
                return Value.dValue < 0 ? " DEFAULT -9e999" : " DEFAULT 9e999";
            }
            sqlite3_snprintf(sizeof szReal, szReal, "%!.17g", Value.dValue);
            return Concat({" DEFAULT ", szReal});
        case BoundValue::Kind::kText:
            return Concat({" DEFAULT ", Enclosed(Value.strBytes, '\'')});
        default:
            return {};
    }
}

std::string ColumnClause(const Member& Declared, bool blNotNull, bool blStrict) {
    return Concat({Declared.strQuoted, DeclaredType(Declared.Kind(), blStrict),
                   blNotNull ? " NOT NULL" : "", DefaultClause(Declared)});
}

std::string CreateTableSql(const Members& Of, const std::vector<std::string>& vecFirst) {
    std::string strSql = Concat({"CREATE TABLE IF NOT EXISTS ", Of.QuotedTable(), " ("});
    const char* szBefore = "";
    for (const size_t nMember : ColumnOrder(Of, vecFirst)) {
        const Member& Declared = Of.At(nMember);
        const bool blRowid = Declared.blKey && Of.HasRowidKey();
        // SQLite lets other keys be NULL, any number of times.
        Append(strSql,
               {szBefore,
                blRowid ? Concat({Declared.strQuoted, " INTEGER PRIMARY KEY"})
                        : ColumnClause(Declared, Declared.blNotNull || Declared.blKey, false),
                Declared.blUnique && !blRowid ? " UNIQUE" : ""});
        szBefore = ", ";
    }
    if (!Of.Key().empty() && !Of.HasRowidKey()) {
        strSql += ", PRIMARY KEY";
        szBefore = " (";
        for (const size_t nMember : Of.Key()) {
            Append(strSql, {szBefore, Of.At(nMember).strQuoted});
            szBefore = ", ";
        }
        strSql += ")";
    }
    strSql += ")";
    return strSql;
}

}  // namespace vornjsondb

namespace VORN_JSON_DB {

Status CreateStatement(const std::string& strTable, const Json::Value& jDefinition,
                       std::string& strSql, const std::vector<std::string>& vecFirst) {
    FindingList vecFindings;
    const vornjsondb::Members Of(strTable, jDefinition, vecFindings);
    if (!vornjsondb::HasError(vecFindings)) {
        strSql = vornjsondb::CreateTableSql(Of, vecFirst);
    }
    return vornjsondb::FromFindings(std::move(vecFindings), {"make a statement for", &strTable});
}

}  // namespace VORN_JSON_DB
