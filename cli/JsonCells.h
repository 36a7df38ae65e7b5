// Single values as JSON text, exact to the last bit.

#ifndef VORNJSONDB_CLI_JSON_CELLS_H
#define VORNJSONDB_CLI_JSON_CELLS_H

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include <json/json.h>

namespace VORN_JSON_DB::Cli {

void AppendInteger(std::string& strOut, std::int64_t nValue);
// The shortest text that is read back as the same number, always with a point or an exponent; an
// infinite one as 1e999, which readers of JSON take for it.
void AppendReal(std::string& strOut, double dValue);
// In quotes. Bytes that are not UTF-8 become U+FFFD.
void AppendJsonString(std::string& strOut, std::string_view strText);
// Stored JSON text, on one line whatever white space it has.
void AppendJson(std::string& strOut, std::string_view strJson);
void AppendBase64(std::string& strOut, std::string_view strBytes);
std::string FromBase64(const std::string& strText, bool& blRight);
// {"$base64": true, "encoded": "..."}, as other tools write bytes, too.
void AppendBlob(std::string& strOut, std::string_view strBytes);
// {"$text": true, "encoded": "..."} for a text that is no UTF-8, {"$real": "inf"} for a number
// without an end: nothing is lost.
void AppendExactText(std::string& strOut, std::string_view strText);
void AppendExactReal(std::string& strOut, double dValue);
bool IsUtf8(std::string_view strText);

Json::Value Strings(const std::vector<std::string>& vecTexts);  // as a list

// On one line, in the order of JsonCpp, texts as UTF-8.
std::string CompactJson(const Json::Value& jValue);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_JSON_CELLS_H
