// The database of a call, and where the definition of a table comes from.

#ifndef VORNJSONDB_CLI_DATABASE_H
#define VORNJSONDB_CLI_DATABASE_H

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "Command.h"

namespace VORN_JSON_DB::Cli {

enum class Access { kRead, kChange, kCreate };  // kCreate makes the file, if there is none

struct CloseDatabase {
    std::string strMade;  // the file, if this call has made it: left empty, it goes again

    void operator()(sqlite3* pDb) const;
};
using Database = std::unique_ptr<sqlite3, CloseDatabase>;

// Opens Call.Db(). A file that is missing, no database or not readable is an Error at once.
Database OpenDatabase(const Context& Call, Access eAccess);

// Another program, even another call that has made it in vain, may have removed the file while it
// was open: what is stored then is nowhere, which is an Error.
void CheckInPlace(const Context& Call, sqlite3* pDb);

// Records are read and written in UTF-8 alone: another encoding is an Error.
void CheckEncoding(const Context& Call, sqlite3* pDb);

// Begins what changes the database, which lives until All ends.
void BeginChange(const Context& Call, sqlite3* pDb, Transaction& All);

// Reads a whole file, "-" being standard input.
std::string ReadFile(const std::string& strFile);
// Strict JSON; strWhere begins the Error. What stands on the command line is its fault: kExitUsage.
Json::Value ParseJson(const std::string& strText, const std::string& strWhere,
                      int nExit = kExitBadData);

// The definition of a table: from --def, else what the database keeps, else null.
Json::Value KnownDefinition(const Context& Call, sqlite3* pDb, const std::string& strTable);
// The same, but what the database keeps goes by the columns: another program may have added,
// renamed or dropped some since.
Json::Value CurrentDefinition(const Context& Call, sqlite3* pDb, const std::string& strTable);
// The tables that are gone, and whose definitions the database still keeps.
std::vector<std::string> LeftOverDefinitions(sqlite3* pDb);
// Keeps it in the database, in the table vornjsondb_definition. For a transaction of the caller's.
void KeepDefinition(sqlite3* pDb, const std::string& strTable, const Json::Value& jDefinition);

std::vector<std::string> TableNames(sqlite3* pDb);  // without SQLite's own and the kept definitions
bool TableExists(sqlite3* pDb, const std::string& strTable);
[[noreturn]] void FailNoTable(const Context& Call, sqlite3* pDb);
// The table of all tables bears two names, of which SQLite takes the newer one in some places only.
// Nobody may write to it.
std::string NameForSqlite(const std::string& strTable, Access eAccess);
// Whether a new table may bear the name: a variable of a shell that is not set gives an empty one.
void CheckNewName(const std::string& strTable);

// A default that its member's type cannot hold would be left out of a new table without a word.
void CheckDefaults(const std::string& strTable, const Json::Value& jDefinition);

// Columns that keep each value as it is although their type has a name: ANY in a STRICT table.
std::vector<std::string> AnyColumns(sqlite3* pDb, const std::string& strTable);
// Columns that turn a text into a number if it looks like one. Such a text is refused.
std::vector<std::string> NumberColumns(sqlite3* pDb, const std::string& strTable);
std::string NumberColumnText(const std::string& strColumn, std::string_view strText);
bool HasName(const std::vector<std::string>& vecNames, const std::string& strName);

// A statement of the command's own.
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

// Of a table that by its own ON CONFLICT REPLACE removes records to make room for others, which
// SQLite counts nowhere. Made within the transaction that changes it.
class Replacements {
  public:
    Replacements(sqlite3* pDb, const std::string& strTable);
    // How many went away, where so many came.
    std::int64_t Gone(std::int64_t nInserted) const;

  private:
    std::int64_t Count() const;

    Statement m_pCount;  // null for all other tables
    std::int64_t m_nBefore = 0;
};
// "; 1 other record is gone, ..."; nothing for none.
std::string GoneText(std::int64_t nGone);

Options HowToOpen();

// A database with one table open, which is what most subcommands work on.
struct OpenTable {
    using Definition = Json::Value (*)(const Context& Call, sqlite3* pDb,
                                       const std::string& strTable);
    OpenTable(const Context& Call, Access eAccess, Definition pfnDefinition = CurrentDefinition);

    Database pDb;
    Table Records;
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_DATABASE_H
