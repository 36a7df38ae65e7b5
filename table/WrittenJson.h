// JSON text that needs no reading, because writing it again would give the same text.

#ifndef VORN_TABLE_WRITTEN_JSON_H
#define VORN_TABLE_WRITTEN_JSON_H

#include <cstddef>

namespace vornjsondb {

// Whether the text, which a NUL follows, is a list or an object just as JsonCodec writes it: no
// blanks, members in byte order and each once, and nothing but what PlainJson.h calls plain. False
// says nothing about the text.
bool IsWrittenJson(const char* szText, size_t nLength);

}  // namespace vornjsondb

#endif  // VORN_TABLE_WRITTEN_JSON_H
