#ifndef VORN_SQL_VORN_JSON_DB_API_VALUES_H
#define VORN_SQL_VORN_JSON_DB_API_VALUES_H

#include <string>

#include <json/json.h>

#include "../schema/HandleParts.h"

namespace vornjsondb {

// SqlExpandMemberName.
int AppendMemberNames(const HandleParts& Handle, const Json::Value* pjRec, std::string& strSql);

// SqlExpandMemberSymbol.
int AppendMemberValues(const HandleParts& Handle, const Json::Value& jRec, std::string& strSql);

}  // namespace vornjsondb

#endif  // VORN_SQL_VORN_JSON_DB_API_VALUES_H
