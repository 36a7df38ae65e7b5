// Texts as JSON writes them.

#ifndef VORNJSONDB_CLI_INPUT_JSON_TEXT_H
#define VORNJSONDB_CLI_INPUT_JSON_TEXT_H

#include <string>
#include <string_view>

namespace VORN_JSON_DB::Cli {

// A text in UTF-8, in quotes.
void AppendQuoted(std::string_view strText, std::string& strInto);

// Whether a text is JSON: one value of any kind and depth, and nothing beside it but blanks.
bool IsJson(std::string_view strText);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_JSON_TEXT_H
