#ifndef VORN_SCHEMA_TABLE_DEFINITION_H
#define VORN_SCHEMA_TABLE_DEFINITION_H

#include <string>

#include <json/json.h>

namespace vornjsondb {

// The "member" object of the table's entry in the definition; an empty value when the definition
// has none. Its members in key order are the columns of every statement.
const Json::Value& DeclaredMembers(const Json::Value& jTableDef, const std::string& strName);

}  // namespace vornjsondb

#endif  // VORN_SCHEMA_TABLE_DEFINITION_H
