// From the command line to a Context, and the help texts.

#ifndef VORNJSONDB_CLI_PARSE_H
#define VORNJSONDB_CLI_PARSE_H

#include <string>
#include <vector>

#include "Command.h"

namespace VORN_JSON_DB::Cli {

// False: help or version was asked for and is written. A wrong command line is an Error.
bool Parse(int nArguments, char** pszArguments, Context& Call);

// The options of one subcommand, the shared ones last.
std::vector<Option> OptionsOf(const Command& Of);
std::vector<std::string> Choices(const Option& Of);  // of "a|b|c"; empty for other values

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_PARSE_H
