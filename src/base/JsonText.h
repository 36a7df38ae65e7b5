// JSON values as text and back.

#ifndef VORN_BASE_JSON_TEXT_H
#define VORN_BASE_JSON_TEXT_H

#include <string>

#include <json/json.h>

namespace vornjsondb {

// The value as JSON text on one line: UTF-8 as it is, no blanks, no newline, no comments.
std::string ToString(const Json::Value& jValue);

// Parses the text into jOut. What does not parse leaves jOut as the reader left it; nesting beyond
// the reader's limit throws Json::Exception.
void FromString(const char* szText, Json::Value& jOut);

}  // namespace vornjsondb

#endif  // VORN_BASE_JSON_TEXT_H
