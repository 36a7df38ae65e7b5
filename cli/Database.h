// The database of a call, and the table that is open in it.

#ifndef VORNJSONDB_CLI_DATABASE_H
#define VORNJSONDB_CLI_DATABASE_H

#include <memory>
#include <string>

#include "Command.h"
#include "Definitions.h"

namespace VORN_JSON_DB::Cli {

enum class Access { kRead, kChange, kCreate };  // kCreate makes the file, if there is none

struct CloseDatabase {
    bool blMade = false;  // the file is this call's: left empty, it goes again

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

// The table of all tables bears two names, of which SQLite takes the newer one in some places only.
// Nobody may write to it.
std::string NameForSqlite(const std::string& strTable, Access eAccess);
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
