// A text as JSON writes it.

#ifndef VORNJSONDB_CLI_INPUT_JSON_QUOTE_H
#define VORNJSONDB_CLI_INPUT_JSON_QUOTE_H

#include <cstdio>
#include <string>
#include <string_view>

namespace VORN_JSON_DB::Cli {

inline void AppendQuoted(std::string_view strText, std::string& strInto) {
    strInto += '"';
    for (const char c : strText) {
        if (c == '"' || c == '\\') {
            strInto += '\\';
            strInto += c;
        } else if (static_cast<unsigned char>(c) < 0x20) {
            char szEscape[8];
            static_cast<void>(
                std::snprintf(szEscape, sizeof szEscape, "\\u%04x", static_cast<unsigned>(c)));
            strInto += szEscape;
        } else {
            strInto += c;
        }
    }
    strInto += '"';
}

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_JSON_QUOTE_H
