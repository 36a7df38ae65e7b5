// The JSON notation of queries.

#ifndef VORN_TABLE_QUERY_PARSER_H
#define VORN_TABLE_QUERY_PARSER_H

#include <VornJsonDbTable.h>

#include <vector>

#include <json/json.h>

namespace vornjsondb {

// Both know no definition: names and operands are checked when a Table runs the query. What is
// wrong with the notation itself goes to the findings.
VORN_JSON_DB::Query ParseQuery(const Json::Value& jQuery, bool blValuesOnly);

// The conditions below "where", which must all hold.
std::vector<VORN_JSON_DB::Condition> ParseWhere(const Json::Value& jWhere, bool blValuesOnly,
                                                VORN_JSON_DB::FindingList& vecFindings);

}  // namespace vornjsondb

#endif  // VORN_TABLE_QUERY_PARSER_H
