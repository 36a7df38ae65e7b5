// The command's own SQL. A failure is an Error.

#ifndef VORNJSONDB_CLI_SQL_H
#define VORNJSONDB_CLI_SQL_H

#include <memory>
#include <string>
#include <vector>

#include "Command.h"

namespace VORN_JSON_DB::Cli {

// What messages call the database from then on: as it was typed, where SQLite knows the whole path.
void NameDatabase(const std::string& strFile);

// The last failure of the connection.
[[noreturn]] void FailBySqlite(sqlite3* pDb, const std::string& strWhere);
[[noreturn]] void FailBySqlite(sqlite3* pDb);  // in the database that was named

struct FinalizeStatement {
    void operator()(sqlite3_stmt* pStatement) const { sqlite3_finalize(pStatement); }
};
using Statement = std::unique_ptr<sqlite3_stmt, FinalizeStatement>;
Statement Prepare(sqlite3* pDb, const std::string& strSql);
bool Step(sqlite3_stmt* pStatement);  // false after the last row; a failure is an Error
Statement Prepare(sqlite3* pDb, const std::string& strSql, const std::string& strText);  // as ?1
void Run(sqlite3* pDb, const std::string& strSql);
std::string ColumnText(sqlite3_stmt* pStatement, int nColumn);
// The first column of all rows. ?1 is strText.
std::vector<std::string> Texts(sqlite3* pDb, const std::string& strSql,
                               const std::string& strText = "");
std::string Quoted(const std::string& strName);  // as an SQL name

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_SQL_H
