// What either handle can do with the values of a type.

#ifndef VORN_TABLE_ABILITIES_H
#define VORN_TABLE_ABILITIES_H

#include <VornJsonDbTable.h>

#include <string>

#include "../src/schema/MemberType.h"

namespace vornjsondb {

// By the type alone: names are another matter.
VORN_JSON_DB::Abilities OldAbilities(const MemberType& Type);

// "create, update"; what of it is missing.
std::string Lacking(const VORN_JSON_DB::Abilities& Some);

}  // namespace vornjsondb

#endif  // VORN_TABLE_ABILITIES_H
