// The definition of a table that is made or extended for records.

#ifndef VORNJSONDB_CLI_INPUT_NEW_DEFINITION_H
#define VORNJSONDB_CLI_INPUT_NEW_DEFINITION_H

#include <string>

#include <json/json.h>

#include "Inference.h"
#include "Insert.h"

namespace VORN_JSON_DB::Cli {

// For a table that is to be made, from what was seen and what the caller wants.
Json::Value NewDefinition(const std::string& strTable, const Inference& Seen,
                          const InsertOptions& How);

// Adds to a definition the members that were seen and that it lacks. Returns whether there are any.
bool AddSeenMembers(const std::string& strTable, const Inference& Seen, Json::Value& jDefinition);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_NEW_DEFINITION_H
