// The rows of a dump, which are lists.

#ifndef VORNJSONDB_CLI_INPUT_DUMP_ROW_H
#define VORNJSONDB_CLI_INPUT_DUMP_ROW_H

#include <string>

#include <sqlite3.h>

#include "LineBuffer.h"

namespace VORN_JSON_DB::Cli {

// Binds the values of the line to the parameters of a statement, and returns what is wrong with
// them, or nothing. The line is read in place: it is another one then, and the statement has to run
// before the next one comes.
std::string BindRow(LineBuffer& Lines, sqlite3_stmt* pInto);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_DUMP_ROW_H
