#ifndef VORN_RECORDS_SAVE_RECORD_H
#define VORN_RECORDS_SAVE_RECORD_H

#include "../core/TableParts.h"

namespace vornjsondb {

// Stores jRec and sets jStored, which may be the same value, to the row as read back. Returns 0;
// -1, with jStored as it was, after logging what recSave logs.
int SaveRecord(VornJsonDbApi& Handle, const TableParts& Table, const Json::Value& jType,
               Json::Value& jRec, Json::Value& jStored, bool blCreate);

}  // namespace vornjsondb

#endif  // VORN_RECORDS_SAVE_RECORD_H
