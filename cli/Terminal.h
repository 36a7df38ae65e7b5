// What is known about the terminal, if there is one.

#ifndef VORNJSONDB_CLI_TERMINAL_H
#define VORNJSONDB_CLI_TERMINAL_H

#include <cstdio>

namespace VORN_JSON_DB::Cli {

bool IsTerminal(std::FILE* pStream);
bool IsAnimated(std::FILE* pStream);  // a terminal whose cursor can be moved
// Only on such a terminal, and not where NO_COLOR is set.
bool HasColour(std::FILE* pStream);
// What the terminal says, else COLUMNS, else 80.
int TerminalWidth(std::FILE* pStream);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_TERMINAL_H
