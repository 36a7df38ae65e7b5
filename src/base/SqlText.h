#ifndef VORN_BASE_SQL_TEXT_H
#define VORN_BASE_SQL_TEXT_H

#include <memory>

#include <sqlite3.h>

#include "TextBuffer.h"

namespace vornjsondb {

struct SqliteFree {
    void operator()(char* szText) const { sqlite3_free(szText); }
};

// Owner of a text that SQLite allocated (sqlite3_mprintf, sqlite3_exec's error text).
using SqlText = std::unique_ptr<char, SqliteFree>;

// Appends the text in single quotes, each quote in it doubled, as SQLite's formatter writes "%Q".
void AppendQuoted(const char* szText, TextBuffer& Out);

}  // namespace vornjsondb

#endif  // VORN_BASE_SQL_TEXT_H
