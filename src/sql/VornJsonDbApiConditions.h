#ifndef VORN_SQL_VORN_JSON_DB_API_CONDITIONS_H
#define VORN_SQL_VORN_JSON_DB_API_CONDITIONS_H

#include <json/json.h>

#include "../base/TextBuffer.h"
#include "../schema/HandleParts.h"
#include "../schema/TableTypes.h"

namespace vornjsondb {

// What a list of members is for. Among assignments raw condition text ("vornSqlWhereFilter") is
// left out, and whole numbers, booleans and texts are written without SQLite's formatter.
enum class ListUse { kConditions, kAssignments };

// SqlExpandMemberList of conditions that all have to hold.
int AppendConditions(const HandleParts& Handle, const Json::Value& jRecParam, TextBuffer& Sql);

// SqlExpandMemberList with the table's types looked up.
int AppendMemberList(const TableTypes& Types, const Json::Value& jRecParam, TextBuffer& Sql,
                     int andType, ListUse eUse);

}  // namespace vornjsondb

#endif  // VORN_SQL_VORN_JSON_DB_API_CONDITIONS_H
