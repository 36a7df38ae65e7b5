#ifndef VORN_TABLE_SQL_WORDS_H
#define VORN_TABLE_SQL_WORDS_H

#include <string>

namespace vornjsondb {

// Whether the word, in capitals, stands in an SQL text in any letter case: outside of quotes,
// comments and other words.
bool HoldsWord(const std::string& strSql, const std::string& strWord);

}  // namespace vornjsondb

#endif  // VORN_TABLE_SQL_WORDS_H
