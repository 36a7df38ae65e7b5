#include "RealTable.h"

#include <algorithm>
#include <utility>

#include "Concat.h"
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

// Binds the text, where one is given, and gives the first column of the first row as a number; no
// row and NULL give 0.
int ReadNumber(const OwnStatement& pStatement, const std::string* pstrText, int& nOut) {
    int nResult = SQLITE_OK;
    if (pstrText != nullptr) {
        nResult = sqlite3_bind_text(pStatement.get(), 1, pstrText->data(),
                                    static_cast<int>(pstrText->size()), SQLITE_STATIC);
    }
    if (nResult == SQLITE_OK) {
        nResult = sqlite3_step(pStatement.get());
    }
    if (nResult != SQLITE_ROW) {
        return nResult == SQLITE_DONE ? SQLITE_OK : nResult;
    }
    nOut = sqlite3_column_int(pStatement.get(), 0);
    return SQLITE_OK;
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
        const std::string strSql = Concat({"SELECT ", szName, " FROM ", Quoted(strTable)});
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

// A temporary one hides another of its name.
int IsView(sqlite3* pDb, const std::string& strTable, bool& blView) {
    static constexpr char kSql[] =
        "SELECT type = 'view' FROM (SELECT name, type FROM sqlite_temp_master UNION ALL"
        " SELECT name, type FROM sqlite_master)"
        " WHERE name = ?1 COLLATE NOCASE AND type IN ('table', 'view')";
    OwnStatement pStatement;
    int nView = 0;
    int nResult = Prepare(pDb, kSql, pStatement);
    if (nResult == SQLITE_OK) {
        nResult = ReadNumber(pStatement, &strTable, nView);
    }
    blView = nView != 0;
    return nResult;
}

int HaveOneValue(sqlite3* pDb, const std::string& strLeft, const std::string& strRight, bool blJson,
                 bool& blSame) {
    const std::string strJson =
        "json_valid(" + strRight + ") THEN json(" + strLeft + ") IS json(" + strRight + ") WHEN ";
    OwnStatement pStatement;
    int nSame = 0;
    int nResult = Prepare(pDb,
                          "SELECT CASE WHEN " + (blJson ? strJson : "") + "1 THEN (" + strLeft +
                              ") IS (" + strRight + ") END",
                          pStatement);
    if (nResult == SQLITE_OK) {
        nResult = ReadNumber(pStatement, nullptr, nSame);
    }
    const bool blUnknown = nResult == SQLITE_ERROR;
    blSame = blUnknown || nSame != 0;
    return blUnknown ? SQLITE_OK : nResult;
}

}  // namespace vornjsondb
