// JSON text as JsonCodec writes it.

#ifndef VORN_TABLE_WRITTEN_JSON_H
#define VORN_TABLE_WRITTEN_JSON_H

#include <cstddef>
#include <string>

#include <json/json.h>

namespace vornjsondb {

// Whether the text, which a NUL follows, is a list or an object just as JsonCodec writes it: no
// blanks, members in byte order and each once, and nothing but what PlainJson.h calls plain: such a
// text needs no reading, because writing it again would give the same. False
// says nothing about the text.
bool IsWrittenJson(const char* szText, size_t nLength);

// WritePlainJson into a text that stays; strOut is as it was where the value is not plain.
bool WritePlainText(const Json::Value& jValue, std::string& strOut);

}  // namespace vornjsondb

#endif  // VORN_TABLE_WRITTEN_JSON_H
