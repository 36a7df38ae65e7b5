// What the database itself says of a table and its indexes.

#ifndef VORN_TABLE_REAL_TABLE_H
#define VORN_TABLE_REAL_TABLE_H

#include <string>
#include <vector>

#include <sqlite3.h>

#include "Members.h"

namespace vornjsondb {

struct RealColumn {
    std::string strName;
    std::string strType;     // as declared; empty, too, where a STRICT table says ANY
    std::string strDefault;  // as SQL; empty: none
    bool blNotNull;
    bool blGenerated;
};

struct RealTable {
    std::vector<RealColumn> vecColumns;  // none: there is no such table or view
    std::vector<std::string> vecKey;     // the primary key's columns, in its order
    std::string strRowid;                // a name of the rowid that no column hides; empty: none
    bool blView = false;  // mutate(false to true): it is set where there are columns.
};

struct RealIndex {
    std::string strSql;                   // its statement; empty: part of the table's own
    bool blUnique = false;                // among all rows
    bool blFiner = false;                 // tells values apart that its columns compare as equal
    std::vector<std::string> vecColumns;  // empty texts: expressions
};

struct RealIndexes {
    std::string strDatabase = "main";  // or "temp", or as it was attached
    std::vector<RealIndex> vecAll;
};

// All return SQLite's result. A table that is not there is no failure.
int ReadRealTable(sqlite3* pDb, const std::string& strTable, RealTable& Out);
int ReadRealIndexes(sqlite3* pDb, const std::string& strTable, RealIndexes& Out);

// The database that holds the table; strDatabase stays as it is where none does.
int FindDatabase(sqlite3* pDb, const std::string& strTable, std::string& strDatabase);

// Tells the members of the key how the unique index on it compares texts, which may be in another
// way than their columns do. Of several the one counts that does as they do.
int LearnCollations(sqlite3* pDb, Members& Of);

// Whether the table is a STRICT one, where each column has a type and ANY is one.
int IsStrict(sqlite3* pDb, const std::string& strTable, bool& blStrict);

// Whether the name is a view's.
int IsView(sqlite3* pDb, const std::string& strTable, bool& blView);

// Whether of a row of "Here", the schema of the table's database and that of temporary things, the
// SQL expression szWhat is true, in which ?1 is the table's name.
int IsInSchema(sqlite3* pDb, const std::string& strTable, const char* szWhat, bool& blThere);

// Whether the column is the rowid itself, which never holds NULL: SQLite hands out values.
bool IsRowid(const RealTable& Real, const RealColumn& Column);

// How the column compares texts, where a statement does not say it.
std::string CollationOf(sqlite3* pDb, const std::string& strTable, const std::string& strColumn);
bool IsBinary(const std::string& strCollation);

// Whether the columns are the same ones, in any order.
bool AreSameColumns(const std::vector<std::string>& vecLeft,
                    const std::vector<std::string>& vecRight);

// Whether a table, a view or an index has that name, in any letter case.
int IsNameTaken(sqlite3* pDb, const std::string& strName, bool& blTaken);

// Whether two SQL expressions without names have one value; as JSON, where both are JSON. What
// SQLite cannot compute, or the second computes with a function, counts as the same. Returns
// SQLite's result.
int HaveOneValue(sqlite3* pDb, const std::string& strLeft, const std::string& strRight, bool blJson,
                 bool& blSame);

}  // namespace vornjsondb

#endif  // VORN_TABLE_REAL_TABLE_H
