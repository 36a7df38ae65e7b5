#ifndef VORN_RECORDS_VORN_JSON_DB_API_SAVE_H
#define VORN_RECORDS_VORN_JSON_DB_API_SAVE_H

#include <json/json.h>

#include "../schema/HandleParts.h"

namespace vornjsondb {

// Stores jRec and sets jStored, which may be the same value, to the row as read back. Returns 0;
// -1, with jStored as it was, after logging what recSave logs.
int SaveRecord(const HandleParts& Handle, const Json::Value& jRec, Json::Value& jStored,
               bool blCreate);

}  // namespace vornjsondb

#endif  // VORN_RECORDS_VORN_JSON_DB_API_SAVE_H
