#ifndef VORN_SQL_VORN_JSON_DB_API_CONDITIONS_H
#define VORN_SQL_VORN_JSON_DB_API_CONDITIONS_H

#include <string>

#include <json/json.h>

#include "../schema/TableTypes.h"

namespace vornjsondb {

// What becomes of raw condition text ("vornSqlWhereFilter") among the members.
enum class RawFilter { kWritten, kLeftOut };

// SqlExpandMemberList with the table's types looked up.
int AppendMemberList(const TableTypes& Types, const Json::Value& jRecParam, std::string& strSqlOut,
                     int andType, RawFilter eFilter);

}  // namespace vornjsondb

#endif  // VORN_SQL_VORN_JSON_DB_API_CONDITIONS_H
