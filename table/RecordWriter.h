// One record into the table, as told for a key that is there already.

#ifndef VORN_TABLE_RECORD_WRITER_H
#define VORN_TABLE_RECORD_WRITER_H

#include <string>

#include "RecordValues.h"
#include "TableParts.h"

namespace vornjsondb {

// Runs the statements that it takes, two at most, and fills defaults where the record is new. All
// modes but kStop need a key, and values for it. Not whole or nothing by itself: where there can be
// two statements, callers see to that.
Status WriteRecord(Table::Parts& Into, RecordValues& Values, OnDuplicate eOnDuplicate,
                   const Doing& What, Written& eWritten);

// " WHERE "task"."id" = ?": parameters in the key's order.
std::string WhereKey(const Members& Of);

}  // namespace vornjsondb

#endif  // VORN_TABLE_RECORD_WRITER_H
