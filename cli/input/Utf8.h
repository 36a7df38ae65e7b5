// Whether bytes are text.

#ifndef VORNJSONDB_CLI_INPUT_UTF8_H
#define VORNJSONDB_CLI_INPUT_UTF8_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace VORN_JSON_DB::Cli {

// The offset of the first byte that is no part of UTF-8; npos where all are.
size_t FindNoUtf8(std::string_view strBytes);

// Whether all is UTF-8, with none of the characters below a blank.
bool IsUtf8WithoutControls(std::string_view strBytes);

// The length of the character that the bytes begin with; 1, and a negative code, where it is none.
size_t ReadCharacter(std::string_view strBytes, std::int32_t& nCode);

// What steers a terminal: the controls, and the marks that turn the direction of what follows.
bool Steers(std::int32_t nCode);

// With U+FFFD for each byte that is no part of UTF-8.
std::string WithoutBadBytes(std::string_view strBytes);

// "byte 0xE9 is no UTF-8; ..."
std::string NoUtf8Text(std::string_view strBytes, size_t nOffset);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_UTF8_H
