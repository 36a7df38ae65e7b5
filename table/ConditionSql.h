// Conditions as SQL.
//
// Each is true or not true, never unknown to what stands around it: what negates writes IS NOT
// TRUE, so that NULL is no match below it and a match above it.

#ifndef VORN_TABLE_CONDITION_SQL_H
#define VORN_TABLE_CONDITION_SQL_H

#include <vector>

#include "LeafSql.h"

namespace vornjsondb {

// Appends that all of vecWhere hold, or nothing for none. What makes no sense goes to vecFindings;
// then the text is of no use. blChange: for a statement that changes what it finds.
void AppendConditions(const std::vector<VORN_JSON_DB::Condition>& vecWhere, const Members& Of,
                      JsonCodec& Codec, bool blChange, BoundSql& Out, FindingList& vecFindings);

}  // namespace vornjsondb

#endif  // VORN_TABLE_CONDITION_SQL_H
