// Files of records into a table, which is made if there is none.

#ifndef VORNJSONDB_CLI_INPUT_INSERT_H
#define VORNJSONDB_CLI_INPUT_INSERT_H

#include "../Command.h"

namespace VORN_JSON_DB::Cli {

// The subcommand. Without a batch that was committed nothing is stored after an Error.
int RunInsert(Context& Call);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_INSERT_H
