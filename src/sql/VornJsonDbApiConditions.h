#ifndef VORN_SQL_VORN_JSON_DB_API_CONDITIONS_H
#define VORN_SQL_VORN_JSON_DB_API_CONDITIONS_H

#include <string>

#include <json/json.h>

#include "../schema/TableTypes.h"

namespace vornjsondb {

// What a list of members is for. Among assignments raw condition text ("vornSqlWhereFilter") is
// left out, and whole numbers, booleans and texts are written without SQLite's formatter.
enum class ListUse { kConditions, kAssignments };

// SqlExpandMemberList with the table's types looked up.
int AppendMemberList(const TableTypes& Types, const Json::Value& jRecParam, std::string& strSqlOut,
                     int andType, ListUse eUse);

}  // namespace vornjsondb

#endif  // VORN_SQL_VORN_JSON_DB_API_CONDITIONS_H
