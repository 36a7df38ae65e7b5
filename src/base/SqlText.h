#ifndef VORN_BASE_SQL_TEXT_H
#define VORN_BASE_SQL_TEXT_H

#include <cstddef>
#include <memory>
#include <string>

#include <sqlite3.h>

namespace vornjsondb {

struct SqliteFree {
    void operator()(char* szText) const { sqlite3_free(szText); }
};

// Owner of a text that SQLite allocated (sqlite3_mprintf, sqlite3_exec's error text).
using SqlText = std::unique_ptr<char, SqliteFree>;

// Appends the text in single quotes, each quote in it doubled, as SQLite's formatter writes "%Q".
void AppendQuoted(const char* szText, std::string& strOut);

// Room for most statements: spares a text that grows piece by piece its first allocations.
constexpr size_t kUsualStatement = 256;

}  // namespace vornjsondb

#endif  // VORN_BASE_SQL_TEXT_H
