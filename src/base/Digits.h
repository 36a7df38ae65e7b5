#ifndef VORN_BASE_DIGITS_H
#define VORN_BASE_DIGITS_H

#include <string>

#include <json/json.h>

namespace vornjsondb {

// Appends the number in decimal digits, as SQLite's formatter and JsonCpp's writer write it.
void AppendDigits(Json::UInt64 nValue, std::string& strOut);
void AppendDigits(Json::Int64 nValue, std::string& strOut);

}  // namespace vornjsondb

#endif  // VORN_BASE_DIGITS_H
