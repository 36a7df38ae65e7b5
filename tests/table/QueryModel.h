// The meaning of queries once more, over records in memory, as plainly as it can be said.

#ifndef VORN_TESTS_TABLE_QUERY_MODEL_H
#define VORN_TESTS_TABLE_QUERY_MODEL_H

#include <map>
#include <string>
#include <vector>

#include <json/json.h>

namespace VORN_JSON_DB {

struct QueryModel {
    std::map<std::string, std::string> mapTypes;  // of the members, "id" being the key
    std::vector<Json::Value> vecRecords;          // an absent member is null

    // The ids of what the query selects, in its order.
    std::vector<int> Select(const Json::Value& jQuery) const;

    bool Holds(const Json::Value& jWhere, const Json::Value& jRecord) const;
};

}  // namespace VORN_JSON_DB

#endif  // VORN_TESTS_TABLE_QUERY_MODEL_H
