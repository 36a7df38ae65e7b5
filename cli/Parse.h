// From the command line to a Context, and the help texts.

#ifndef VORNJSONDB_CLI_PARSE_H
#define VORNJSONDB_CLI_PARSE_H

#include <string>
#include <vector>

#include "Command.h"

namespace VORN_JSON_DB::Cli {

// False: help or version was asked for and is written. A wrong command line is an Error.
bool Parse(int nArguments, char** pszArguments, Context& Call);

// Writes what the last word may become, which is being typed. In bash words come with the quotes
// that were typed, and go so that they can stand in the line.
void PutCandidates(std::vector<std::string> vecWords, bool blBash);

const Command* FindCommand(const std::string& strName);  // null: there is none
const Option* FindOption(const std::vector<Option>& vecOptions, const std::string& strName);
// The options of one subcommand, the shared ones last.
std::vector<Option> OptionsOf(const Command& Of);
std::vector<std::string> Choices(const char* szValue);  // of "a|b|c"; empty for other values

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_PARSE_H
