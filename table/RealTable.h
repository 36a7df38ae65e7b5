// What the database itself says of a table.

#ifndef VORN_TABLE_REAL_TABLE_H
#define VORN_TABLE_REAL_TABLE_H

#include <string>
#include <vector>

#include <sqlite3.h>

namespace vornjsondb {

struct RealColumn {
    std::string strName;
    std::string strType;     // as declared
    std::string strDefault;  // as SQL; empty: none
    int nKeyPlace;           // in the primary key, from 1; 0: not part of it
    bool blNotNull;
    bool blGenerated;
};

struct RealTable {
    std::vector<RealColumn> vecColumns;  // none: there is no such table or view
    std::vector<std::string> vecKey;     // the primary key's columns, in its order
    std::string strRowid;                // a name of the rowid that no column hides; empty: none
};

// Returns SQLite's result. A table that is not there is no failure.
int ReadRealTable(sqlite3* pDb, const std::string& strTable, RealTable& Out);

// Whether the name is that of a view. Returns SQLite's result.
int IsView(sqlite3* pDb, const std::string& strTable, bool& blView);

// Whether two SQL expressions without names have one value; as JSON, where both are JSON. What
// SQLite cannot compute counts as the same. Returns SQLite's result.
int HaveOneValue(sqlite3* pDb, const std::string& strLeft, const std::string& strRight, bool blJson,
                 bool& blSame);

}  // namespace vornjsondb

#endif  // VORN_TABLE_REAL_TABLE_H
