#ifndef VORN_SCHEMA_HANDLE_PARTS_H
#define VORN_SCHEMA_HANDLE_PARTS_H

#include <string>

#include <json/json.h>
#include <sqlite3.h>

#include "KnownTables.h"
#include "TableDefinition.h"

namespace vornjsondb {

// What of a handle the functions beside the class work on.
struct HandleParts {
    sqlite3* pDb;
    std::string& strName;
    Json::Value& jTableDef;
    std::string& strSqlError;

    KnownTable& LookUp() const { return LookUpTable(jTableDef, strName); }
    const Json::Value& Declared() const { return DeclaredMembers(jTableDef, strName); }
};

}  // namespace vornjsondb

#endif  // VORN_SCHEMA_HANDLE_PARTS_H
