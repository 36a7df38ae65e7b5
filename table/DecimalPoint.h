// What the program's locale does to fractions inside of JSON.

#ifndef VORN_TABLE_DECIMAL_POINT_H
#define VORN_TABLE_DECIMAL_POINT_H

#include <string_view>

#include "Failure.h"

namespace vornjsondb {

// Whether SQLite takes 1.5 inside of JSON for another number. Some versions, 3.40 among them, read
// it by the C library, which looks for the decimal point of the program's locale (setlocale).
bool MisreadsFractions();

// A finding where it does: what is found by such a number would be wrong, and so would an index.
void CheckFractions(std::string_view strPath, FindingList& vecFindings);

}  // namespace vornjsondb

#endif  // VORN_TABLE_DECIMAL_POINT_H
