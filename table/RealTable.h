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

}  // namespace vornjsondb

#endif  // VORN_TABLE_REAL_TABLE_H
