#ifndef VORN_TABLE_AFFINITY_H
#define VORN_TABLE_AFFINITY_H

#include <string>

#include "../src/schema/MemberType.h"

namespace vornjsondb {

// How SQLite converts what is stored in a column.
enum class Affinity { kNone, kText, kNumeric, kInteger, kReal };

// By a column's declared type.
Affinity AffinityOf(const std::string& strDeclared);

// Whether a column keeps all values of a type as they are bound.
bool Keeps(Affinity eAffinity, BoundKind eKind);

const char* NameOf(Affinity eAffinity);

}  // namespace vornjsondb

#endif  // VORN_TABLE_AFFINITY_H
