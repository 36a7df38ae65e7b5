// JSON values as text and back.

#ifndef VORN_BASE_JSON_TEXT_H
#define VORN_BASE_JSON_TEXT_H

#include <cstddef>
#include <memory>
#include <string>

#include <json/json.h>

namespace vornjsondb {

// A writer and a reader that are made when they are first needed and then used again: making one
// takes longer than most texts. For one thread at a time.
class JsonCodec {
  public:
    // The value as JSON text on one line: UTF-8 as it is, no blanks, no newline, no comments.
    std::string Write(const Json::Value& jValue);

    // Parses the text, which a NUL follows, into jOut. Returns whether it is JSON; what is not
    // leaves jOut as the reader left it. JSON that is nested beyond the reader's limit counts as
    // none.
    bool Read(const char* szText, size_t nLength, Json::Value& jOut);

  private:
    std::unique_ptr<Json::StreamWriter> m_pWriter;
    std::unique_ptr<Json::CharReader> m_pReader;
};

// The same by a codec of the process, which is used by one thread at a time as all of it is.
std::string ToString(const Json::Value& jValue);
void FromString(const char* szText, Json::Value& jOut);

}  // namespace vornjsondb

#endif  // VORN_BASE_JSON_TEXT_H
