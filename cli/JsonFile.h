// JSON that people write: files, and words of the command line.

#ifndef VORNJSONDB_CLI_JSON_FILE_H
#define VORNJSONDB_CLI_JSON_FILE_H

#include <string>

#include "Command.h"

namespace VORN_JSON_DB::Cli {

// Reads a whole file, "-" being standard input.
std::string ReadFile(const std::string& strFile);
// Strict JSON; strWhere begins the Error. What stands on the command line is its fault: kExitUsage.
Json::Value ParseJson(const std::string& strText, const std::string& strWhere,
                      int nExit = kExitBadData);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_JSON_FILE_H
