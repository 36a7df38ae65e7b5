#ifndef VORN_TABLE_SELECT_SQL_H
#define VORN_TABLE_SELECT_SQL_H

#include <string>
#include <string_view>
#include <vector>

#include "Attempt.h"
#include "TableParts.h"

namespace vornjsondb {

// "SELECT <columns> FROM <table>". Never *: columns that appear later do not shift the others.
std::string SelectSql(const Members& Of, const std::vector<size_t>& vecColumns);

// The whole row of one rowid, or of one key.
std::string SelectOneSql(const Table::Parts& From, bool blByRowid);

// Lends the statement, binds, and makes the first step, which takes the lock: only here can a wait
// help. nResult is the step's.
Status FirstStep(Table::Parts& From, const Doing& What, std::string_view strShape,
                 Callable<std::string()> fnSql, Callable<int(sqlite3_stmt*)> fnBind,
                 Statement& Lent, int& nResult);

}  // namespace vornjsondb

#endif  // VORN_TABLE_SELECT_SQL_H
