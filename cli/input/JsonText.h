// Whether a text is JSON.

#ifndef VORNJSONDB_CLI_INPUT_JSON_TEXT_H
#define VORNJSONDB_CLI_INPUT_JSON_TEXT_H

#include <string_view>

namespace VORN_JSON_DB::Cli {

// One value of any kind and depth, and nothing beside it but blanks.
bool IsJson(std::string_view strText);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_JSON_TEXT_H
