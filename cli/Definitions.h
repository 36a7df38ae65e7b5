// Where the definition of a table comes from, and where it is kept.

#ifndef VORNJSONDB_CLI_DEFINITIONS_H
#define VORNJSONDB_CLI_DEFINITIONS_H

#include <string>
#include <vector>

#include "Command.h"

namespace VORN_JSON_DB::Cli {

// The definition of a table: from --def, else what the database keeps, else null.
Json::Value KnownDefinition(const Context& Call, sqlite3* pDb, const std::string& strTable);
// The same, but what the database keeps goes by the columns: another program may have added,
// renamed or dropped some since.
Json::Value CurrentDefinition(const Context& Call, sqlite3* pDb, const std::string& strTable);
// The tables that are gone, and whose definitions the database still keeps.
std::vector<std::string> LeftOverDefinitions(sqlite3* pDb);
// Keeps it in the database, in the table vornjsondb_definition. For a transaction of the caller's.
void KeepDefinition(sqlite3* pDb, const std::string& strTable, const Json::Value& jDefinition);

// A default that its member's type cannot hold would be left out of a new table without a word.
void CheckDefaults(const std::string& strTable, const Json::Value& jDefinition);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_DEFINITIONS_H
