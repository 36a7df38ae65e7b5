// A definition made from a real table.

#include <VornJsonDbTable.h>

#include <utility>

#include "../src/base/JsonMemory.h"
#include "Failure.h"
#include "RealTable.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::RealColumn;
using vornjsondb::RealTable;

struct TypeRow {
    const char* szPart;
    const char* szType;
};

// A part of a declared type, in the order in which SQLite looks for it, and in front what it has
// no rule for. Columns of other types hold values of any kind.
constexpr TypeRow kTypes[] = {
    {"BOOL", "bool"},   {"JSON", "Json::Value"}, {"INT", "long long"}, {"CHAR", "string"},
    {"CLOB", "string"}, {"TEXT", "string"},      {"BLOB", "any"},      {"REAL", "double"},
    {"FLOA", "double"}, {"DOUB", "double"},
};

const char* TypeFor(const std::string& strDeclared) {
    std::string strUpper = strDeclared;
    for (char& c : strUpper) {
        c = c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
    }
    for (const TypeRow& Row : kTypes) {
        if (strUpper.find(Row.szPart) != std::string::npos) {
            return Row.szType;
        }
    }
    return "any";
}

Json::Value Describe(const RealTable& Real) {
    Json::Value jTable(Json::objectValue);
    for (const RealColumn& Column : Real.vecColumns) {
        Json::Value& jMember = jTable["member"][Column.strName];
        jMember["cpptype"] = TypeFor(Column.strType);
        if (Column.blNotNull) {
            jMember["notNull"] = true;
        }
    }
    for (const std::string& strColumn : Real.vecKey) {
        jTable["key"].append(strColumn);
    }
    return jTable;
}

}  // namespace

Status DefinitionOf(sqlite3* pDb, const std::string& strTable, Json::Value& jDefinition) try {
    const vornjsondb::Doing What{"describe", &strTable};
    RealTable Real;
    const int nResult = vornjsondb::ReadRealTable(pDb, strTable, Real);
    if (nResult != SQLITE_OK) {
        return vornjsondb::FailBySqlite(pDb, nResult, What);
    }
    if (Real.vecColumns.empty()) {
        return vornjsondb::Fail(StatusCode::kNotFound, What, "there is no such table");
    }
    Json::Value jMade;
    jMade[strTable] = Describe(Real);
    jDefinition = std::move(jMade);
    return {};
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

}  // namespace VORN_JSON_DB
