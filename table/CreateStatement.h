#ifndef VORN_TABLE_CREATE_STATEMENT_H
#define VORN_TABLE_CREATE_STATEMENT_H

#include <string>
#include <vector>

#include "Members.h"

namespace vornjsondb {

// The members of vecFirst, each once, are the first columns.
std::string CreateTableSql(const Members& Of, const std::vector<std::string>& vecFirst);

// One column as CREATE TABLE and ALTER TABLE declare it: name, type, NOT NULL, default. blStrict:
// for a STRICT table, where no type may be left out.
std::string ColumnClause(const Member& Declared, bool blNotNull, bool blStrict);

// " DEFAULT 'x'", or nothing where the definition has none, or one that is no literal.
std::string DefaultClause(const Member& Declared);

}  // namespace vornjsondb

#endif  // VORN_TABLE_CREATE_STATEMENT_H
