#include "RealIndexes.h"

#include "Statements.h"

namespace vornjsondb {

namespace {

constexpr char kIndexesSql[] =
    "SELECT Listed.seq, Listed.\"unique\" AND NOT Listed.partial, Part.name,"
    " (SELECT sql FROM sqlite_schema WHERE type = 'index' AND name = Listed.name)"
    " FROM pragma_index_list(?1) AS Listed, pragma_index_info(Listed.name) AS Part"
    " ORDER BY Listed.seq, Part.seqno";

constexpr char kNameSql[] =
    "SELECT 1 FROM (SELECT name FROM sqlite_schema UNION ALL SELECT name FROM sqlite_temp_schema)"
    " WHERE name = ?1 COLLATE NOCASE";

}  // namespace

int ReadRealIndexes(sqlite3* pDb, const std::string& strTable, std::vector<RealIndex>& vecIndexes) {
    OwnStatement pStatement;
    int nResult = PrepareFor(pDb, kIndexesSql, strTable, pStatement);
    if (nResult != SQLITE_OK) {
        return nResult;
    }
    int nLast = -1;
    while ((nResult = sqlite3_step(pStatement.get())) == SQLITE_ROW) {
        const int nIndex = sqlite3_column_int(pStatement.get(), 0);
        if (nIndex != nLast) {
            vecIndexes.push_back(RealIndex{
                TextColumn(pStatement, 3), sqlite3_column_int(pStatement.get(), 1) != 0, {}});
            nLast = nIndex;
        }
        vecIndexes.back().vecColumns.push_back(TextColumn(pStatement, 2));
    }
    return nResult == SQLITE_DONE ? SQLITE_OK : nResult;
}

int IsNameTaken(sqlite3* pDb, const std::string& strName, bool& blTaken) {
    OwnStatement pStatement;
    int nResult = PrepareFor(pDb, kNameSql, strName, pStatement);
    if (nResult != SQLITE_OK) {
        return nResult;
    }
    nResult = sqlite3_step(pStatement.get());
    blTaken = nResult == SQLITE_ROW;
    return blTaken || nResult == SQLITE_DONE ? SQLITE_OK : nResult;
}

}  // namespace vornjsondb
