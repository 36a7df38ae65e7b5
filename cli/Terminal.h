// What is known about the terminal, if there is one.

#ifndef VORNJSONDB_CLI_TERMINAL_H
#define VORNJSONDB_CLI_TERMINAL_H

#include <cstdio>

namespace VORN_JSON_DB::Cli {

bool IsTerminal(std::FILE* pStream);
// Only on a terminal that can, and not where NO_COLOR is set.
bool HasColour(std::FILE* pStream);
// Of standard output: what the terminal says, else COLUMNS, else 80.
int TerminalWidth();

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_TERMINAL_H
