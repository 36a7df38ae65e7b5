// JSON text as this library itself stores most of it: no blanks, escapes or fractions, numbers of
// at most 18 digits, few levels. For such values and texts these two are several times as fast as
// JsonCpp's reader and writer and give the same result; all others are left to those.

#ifndef VORN_BASE_PLAIN_JSON_H
#define VORN_BASE_PLAIN_JSON_H

#include <cstddef>

#include <json/json.h>

#include "TextBuffer.h"

namespace vornjsondb {

// Reads the text, which a NUL follows, into jOut. Returns false, with jOut as it was, for a text
// that is not plain, well-formed or not.
bool ReadPlainJson(const char* szText, size_t nLength, Json::Value& jOut);

// Appends the value's text. Returns false, with Out in any state, for a value that is not plain.
// A list that does not store all of its elements is none: what is missing is a null.
bool WritePlainJson(const Json::Value& jValue, TextBuffer& Out);

}  // namespace vornjsondb

#endif  // VORN_BASE_PLAIN_JSON_H
