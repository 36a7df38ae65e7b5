#ifndef VORN_TABLE_SQL_WORDS_H
#define VORN_TABLE_SQL_WORDS_H

#include <string>
#include <vector>

namespace vornjsondb {

struct SqlWord {
    std::string strText;  // without quotes
    bool blQuoted;
};

// The words, names and texts of an SQL text, and each sign between them, without comments. A
// doubled quote parts a name in two.
std::vector<SqlWord> WordsOf(const std::string& strSql);

// Whether the word stands in an SQL text in any letter case: outside of quotes,
// comments and other words.
bool HoldsWord(const std::string& strSql, const char* szWord);

// The names by which a plan of the SQL text may call a table of that database: its own, with the
// database's before it, and what may be its alias.
std::vector<std::string> NamesIn(const std::string& strSql, const std::string& strTable,
                                 const std::string& strDatabase);

}  // namespace vornjsondb

#endif  // VORN_TABLE_SQL_WORDS_H
