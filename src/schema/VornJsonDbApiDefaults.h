#ifndef VORN_SCHEMA_VORN_JSON_DB_API_DEFAULTS_H
#define VORN_SCHEMA_VORN_JSON_DB_API_DEFAULTS_H

#include <json/json.h>

#include "TableTypes.h"

namespace vornjsondb {

// Whether the record lacks a member that has a default.
bool LacksDefaults(const TableTypes& Types, const Json::Value& jRec);

// Gives the record, object or null, the defaults of the members that it lacks.
void FillDefaults(const TableTypes& Types, Json::Value& jRec);

}  // namespace vornjsondb

#endif  // VORN_SCHEMA_VORN_JSON_DB_API_DEFAULTS_H
