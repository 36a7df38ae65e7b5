// A definition made from a real table.

#include <VornJsonDbTable.h>

#include <utility>

#include "../src/base/JsonMemory.h"
#include "Affinity.h"
#include "Failure.h"
#include "RealTable.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::AffinityOf;
using vornjsondb::RealColumn;
using vornjsondb::RealTable;

// SQLite has no rule for the first two. Columns of types without one hold values of any kind.
const char* TypeFor(const std::string& strDeclared) {
    static constexpr const char* kTypes[] = {"any", "string", "any", "long long", "double"};
    if (sqlite3_strlike("%BOOL%", strDeclared.c_str(), 0) == 0) {
        return "bool";
    }
    if (sqlite3_strlike("%JSON%", strDeclared.c_str(), 0) == 0) {
        return "Json::Value";
    }
    return kTypes[static_cast<size_t>(AffinityOf(strDeclared))];
}

Json::Value Describe(const RealTable& Real) {
    Json::Value jTable(Json::objectValue);
    for (const RealColumn& Column : Real.vecColumns) {
        Json::Value& jMember = jTable["member"][Column.strName];
        // mutate(exchanged): in any order.
        jMember["cpptype"] = TypeFor(Column.strType);
        if (Column.blNotNull) {
            jMember["notNull"] = true;
        }
    }
    for (const std::string& strColumn : Real.vecKey) {
        jTable["key"].append(strColumn.c_str());
    }
    return jTable;
}

}  // namespace

Status DefinitionOf(sqlite3* pDb, const std::string& strTable, Json::Value& jDefinition) try {
    const vornjsondb::Doing What{"describe", &strTable};
    if (pDb == nullptr) {
        return vornjsondb::Fail(StatusCode::kMisuse, What, "there is no connection");
    }
    RealTable Real;
    const int nResult = vornjsondb::ReadRealTable(pDb, strTable, Real);
    if (nResult != SQLITE_OK) {
        return vornjsondb::FailBySqlite(pDb, nResult, What);
    }
    // SQLite takes what stands before a NUL byte for the name.
    if (Real.vecColumns.empty() || strTable.find('\0') != std::string::npos) {
        return vornjsondb::Fail(StatusCode::kNotFound, What, "there is no such table");
    }
    Json::Value jMade;
    jMade[strTable] = Describe(Real);
    jDefinition = std::move(jMade);
    return {};
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

}  // namespace VORN_JSON_DB
