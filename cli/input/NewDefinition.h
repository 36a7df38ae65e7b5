// The definition of a table that is made or extended.

#ifndef VORNJSONDB_CLI_INPUT_NEW_DEFINITION_H
#define VORNJSONDB_CLI_INPUT_NEW_DEFINITION_H

#include <string>

#include "../Command.h"
#include "Inference.h"

namespace VORN_JSON_DB::Cli {

// Members with what --key, --type, --not-null, --unique and --default say of them. What is said of
// members that are not there is an Error.
Json::Value NewDefinition(const Context& Call, Json::Value jMembers);

// Takes what the records have beyond a definition into it. Returns whether there was any.
bool AddSeenMembers(const std::string& strTable, const Inference& Seen, Json::Value& jDefinition);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_NEW_DEFINITION_H
