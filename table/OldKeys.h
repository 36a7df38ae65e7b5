// The keys of a query object that are not a member's, for a VornJsonDbApi.

#ifndef VORN_TABLE_OLD_KEYS_H
#define VORN_TABLE_OLD_KEYS_H

#include <algorithm>
#include <iterator>
#include <string>

namespace vornjsondb {

constexpr char kOldFilter[] = "vornSqlWhereFilter";
constexpr char kOldSort[] = "sort_by";
constexpr char kOldDirection[] = "sort_direction";
constexpr char kOldLimit[] = "limit";
constexpr char kOldOffset[] = "offset";

constexpr const char* kOldKeys[] = {kOldLimit, kOldOffset, kOldSort, kOldDirection, kOldFilter};

inline bool IsOldKey(const std::string& strName) {
    return std::count(std::begin(kOldKeys), std::end(kOldKeys), strName) > 0;
}

}  // namespace vornjsondb

#endif  // VORN_TABLE_OLD_KEYS_H
