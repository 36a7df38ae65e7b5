#ifndef VORN_UTIL_PLAIN_JSON_H
#define VORN_UTIL_PLAIN_JSON_H

#include <json/json.h>

namespace vornjsondb {

// Reads the JSON text that this library itself stores most: no blanks, escapes, fractions or
// numbers beyond 18 digits, few levels. Several times as fast as the general reader, with the
// same value in jOut. Returns false, with jOut in any state, for every other text, well-formed or
// not: that is the general reader's.
bool ReadPlainJson(const char* szText, Json::Value& jOut);

}  // namespace vornjsondb

#endif  // VORN_UTIL_PLAIN_JSON_H
