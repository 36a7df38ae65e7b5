#ifndef VORN_SQL_VORN_JSON_DB_API_VALUES_H
#define VORN_SQL_VORN_JSON_DB_API_VALUES_H

#include <string>

#include <json/json.h>

#include "../schema/HandleParts.h"

namespace vornjsondb {

// SqlExpandMemberName of the declared members.
int AppendMemberNames(const Json::Value& jMember, const Json::Value* pjRec, std::string& strSql);

// SqlExpandMemberSymbol of the declared members.
int AppendMemberValues(const HandleParts& Handle, const Json::Value& jMember,
                       const Json::Value& jRec, std::string& strSql);

}  // namespace vornjsondb

#endif  // VORN_SQL_VORN_JSON_DB_API_VALUES_H
