// What the database itself says of a table's indexes.

#ifndef VORN_TABLE_REAL_INDEXES_H
#define VORN_TABLE_REAL_INDEXES_H

#include <string>
#include <vector>

#include <sqlite3.h>

namespace vornjsondb {

struct RealIndex {
    std::string strSql;                   // its statement; empty: part of the table's own
    bool blUnique;                        // among all rows
    std::vector<std::string> vecColumns;  // empty texts: expressions
};

// Returns SQLite's result.
int ReadRealIndexes(sqlite3* pDb, const std::string& strTable, std::vector<RealIndex>& vecIndexes);

// Whether a table, an index, a view or a trigger has that name, in any letter case.
int IsNameTaken(sqlite3* pDb, const std::string& strName, bool& blTaken);

}  // namespace vornjsondb

#endif  // VORN_TABLE_REAL_INDEXES_H
