#ifndef VORN_TABLE_SQL_WORDS_H
#define VORN_TABLE_SQL_WORDS_H

#include <string>
#include <string_view>

namespace vornjsondb {

// Whether the word stands in an SQL text in any letter case: outside of quotes,
// comments and other words.
bool HoldsWord(const std::string& strSql, std::string_view strWord);

}  // namespace vornjsondb

#endif  // VORN_TABLE_SQL_WORDS_H
