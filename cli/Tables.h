// What tables and columns a database has.

#ifndef VORNJSONDB_CLI_TABLES_H
#define VORNJSONDB_CLI_TABLES_H

#include <string>
#include <string_view>
#include <vector>

#include "Command.h"

namespace VORN_JSON_DB::Cli {

// Names of all that records can be read from.
constexpr char kTablesAndViews[] = "SELECT name FROM sqlite_master WHERE type IN ('table', 'view')";

// As SQLite compares names: in any letter case.
bool SameName(const std::string& strLeft, const std::string& strRight);
bool HasName(const std::vector<std::string>& vecNames, const std::string& strName);

std::vector<std::string> TableNames(sqlite3* pDb);  // without SQLite's own and the kept definitions
bool TableExists(sqlite3* pDb, const std::string& strTable);
[[noreturn]] void FailNoTable(const Context& Call, sqlite3* pDb);
// Whether a new table may bear the name: a variable of a shell that is not set gives an empty one.
void CheckNewName(const std::string& strTable);
// Whether it is taken; szRemedy is for a table that has it.
void CheckFree(const Context& Call, sqlite3* pDb, const std::string& strTable,
               const char* szRemedy);

// Columns that turn a text into a number if it looks like one. Such a text is refused.
std::vector<std::string> NumberColumns(sqlite3* pDb, const std::string& strTable);
std::string NumberColumnText(const std::string& strColumn, std::string_view strText);
std::string RoundedText(const std::string& strColumn);  // of a column of whole numbers

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_TABLES_H
