#include "RealTable.h"

#include <algorithm>
#include <utility>

#include "FindingCodes.h"
#include "Statements.h"

namespace vornjsondb {

namespace {

constexpr char kColumnsSql[] =
    "SELECT name, type, dflt_value, pk, \"notnull\", hidden FROM pragma_table_xinfo(?1)";

// Columns of pragma_table_xinfo: generated ones are hidden in their own ways.
constexpr int kVirtual = 2;
constexpr int kStored = 3;

int ReadColumns(sqlite3* pDb, const std::string& strTable, std::vector<RealColumn>& vecColumns) {
    OwnStatement pStatement;
    int nResult = PrepareFor(pDb, kColumnsSql, strTable, pStatement);
    if (nResult != SQLITE_OK) {
        return nResult;
    }
    while ((nResult = sqlite3_step(pStatement.get())) == SQLITE_ROW) {
        const int nHidden = sqlite3_column_int(pStatement.get(), 5);
        vecColumns.push_back(RealColumn{
            TextColumn(pStatement, 0), TextColumn(pStatement, 1), TextColumn(pStatement, 2),
            sqlite3_column_int(pStatement.get(), 3), sqlite3_column_int(pStatement.get(), 4) != 0,
            nHidden == kVirtual || nHidden == kStored});
    }
    return nResult == SQLITE_DONE ? SQLITE_OK : nResult;
}

bool IsColumn(const RealTable& Real, const char* szName) {
    return std::any_of(Real.vecColumns.begin(), Real.vecColumns.end(),
                       [szName](const RealColumn& Column) {
                           return sqlite3_stricmp(Column.strName.c_str(), szName) == 0;
                       });
}

// The rowid has three names; a WITHOUT ROWID table knows none of them.
std::string NameOfRowid(sqlite3* pDb, const std::string& strTable, const RealTable& Real) {
    for (const char* szName : {"rowid", "_rowid_", "oid"}) {
        OwnStatement pStatement;
        const std::string strSql = std::string("SELECT ") + szName + " FROM " + Quoted(strTable);
        if (!IsColumn(Real, szName) && Prepare(pDb, strSql, pStatement) == SQLITE_OK) {
            return szName;
        }
    }
    return {};
}

}  // namespace

int ReadRealTable(sqlite3* pDb, const std::string& strTable, RealTable& Out) {
    RealTable Real;
    const int nResult = ReadColumns(pDb, strTable, Real.vecColumns);
    if (nResult != SQLITE_OK || Real.vecColumns.empty()) {
        Out = std::move(Real);
        return nResult;
    }
    std::vector<const RealColumn*> vecKey;
    for (const RealColumn& Column : Real.vecColumns) {
        if (Column.nKeyPlace > 0) {
            vecKey.push_back(&Column);
        }
    }
    std::sort(vecKey.begin(), vecKey.end(), [](const RealColumn* pLeft, const RealColumn* pRight) {
        return pLeft->nKeyPlace < pRight->nKeyPlace;
    });
    for (const RealColumn* pColumn : vecKey) {
        Real.vecKey.push_back(pColumn->strName);
    }
    Real.strRowid = NameOfRowid(pDb, strTable, Real);
    Out = std::move(Real);
    return SQLITE_OK;
}

}  // namespace vornjsondb
