#ifndef VORNJSONDB_CLI_INPUT_JSON_QUOTE_H
#define VORNJSONDB_CLI_INPUT_JSON_QUOTE_H

#include <string>
#include <string_view>

namespace VORN_JSON_DB::Cli {

// A text in UTF-8 as JSON writes it, in quotes.
void AppendQuoted(std::string_view strText, std::string& strInto);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_JSON_QUOTE_H
