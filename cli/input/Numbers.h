// Texts of numbers and the values that they stand for. SQLite's own conversion is never asked: it
// is wrong in the last digits.

#ifndef VORNJSONDB_CLI_INPUT_NUMBERS_H
#define VORNJSONDB_CLI_INPUT_NUMBERS_H

#include <cstdint>
#include <string_view>

#include "Sink.h"

namespace VORN_JSON_DB::Cli {

// From 2^53 on a double skips whole numbers.
constexpr std::int64_t kMostExact = std::int64_t{1} << 53;

// What a number of JSON is. Minus zero is real: no integer is.
Value JsonNumber(std::string_view strNumber);

// What a cell of CSV is, where it is written as a program writes numbers; else a text. So leading
// zeros, a plus, blanks and "405E10", which is a code more often than a number, stay as they are.
Value CellNumber(std::string_view strCell);

// For a column that is known to be real. 1e999 is infinite there, as it is to SQLite.
bool ToReal(std::string_view strNumber, double& dReal);

// Whether a text is a number as JSON writes it.
bool IsJsonNumber(std::string_view strText);

// Whether a double, read from digits, may be another whole number of 64 bits than they say.
bool MayBeRounded(double dReal);

// Whether it is a whole number of more than 64 bits.
bool IsTooWide(std::string_view strNumber);

// Whether SQLite stores a text as a number in a column of numbers.
bool IsNumberToSqlite(std::string_view strText);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_NUMBERS_H
