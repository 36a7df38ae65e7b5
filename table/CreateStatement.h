#ifndef VORN_TABLE_CREATE_STATEMENT_H
#define VORN_TABLE_CREATE_STATEMENT_H

#include <string>

#include "Members.h"

namespace vornjsondb {

std::string CreateTableSql(const Members& Of);

// One column as CREATE TABLE and ALTER TABLE declare it: name, type, NOT NULL, default.
std::string ColumnClause(const Member& Declared, bool blNotNull);

// " DEFAULT 'x'", or nothing where the definition has none, or one that is no literal.
std::string DefaultClause(const Member& Declared);

}  // namespace vornjsondb

#endif  // VORN_TABLE_CREATE_STATEMENT_H
