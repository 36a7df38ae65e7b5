// The functions of the table of subcommands.

#ifndef VORNJSONDB_CLI_COMMANDS_H
#define VORNJSONDB_CLI_COMMANDS_H

#include "Command.h"

namespace VORN_JSON_DB::Cli {

int RunList(Context& Call);
int RunGet(Context& Call);
int RunCount(Context& Call);
int RunTables(Context& Call);
int RunSchema(Context& Call);
int RunUpdate(Context& Call);
int RunDelete(Context& Call);
int RunInit(Context& Call);
int RunUpsert(Context& Call);
int RunIndex(Context& Call);
int RunExplain(Context& Call);
int RunLint(Context& Call);
int RunSync(Context& Call);
int RunDoctor(Context& Call);
int RunDump(Context& Call);
int RunLoad(Context& Call);
int RunCompletion(Context& Call);

void PutManual();  // as mdoc, to standard output

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_COMMANDS_H
