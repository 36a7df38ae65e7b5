// A definition beside the real table.

#ifndef VORN_TABLE_TABLE_COMPARE_H
#define VORN_TABLE_TABLE_COMPARE_H

#include <string>
#include <vector>

#include <sqlite3.h>

#include "Members.h"

namespace vornjsondb {

// Reads the real table and reports how the definition differs. With pvecStatements, what a
// statement can add to the table goes there and is no finding. blFound: whether there is a table.
// Returns SQLite's result.
int CompareTable(sqlite3* pDb, const Members& Of, bool& blFound,
                 std::vector<std::string>* pvecStatements, FindingList& vecFindings);

}  // namespace vornjsondb

#endif  // VORN_TABLE_TABLE_COMPARE_H
