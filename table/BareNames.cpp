#include "BareNames.h"

#include <algorithm>
#include <cctype>

#include "../src/base/JsonMemory.h"
#include "Statements.h"

namespace vornjsondb {

namespace {

bool IsOfName(char c) {
    const auto nByte = static_cast<unsigned char>(c);
    return std::isalnum(nByte) != 0 || c == '_' || nByte >= 0x80;
}

// One word for SQLite: nothing in it ends the name, so it can go into a statement.
bool IsWord(const std::string& strName) {
    return std::isdigit(static_cast<unsigned char>(strName[0])) == 0 &&
           std::all_of(strName.begin(), strName.end(), IsOfName);
}

}  // namespace

BareNames::BareNames() {
    sqlite3* pDb = nullptr;
    const int nResult = sqlite3_open(":memory:", &pDb);
    m_pDb.reset(pDb);
    if (nResult != SQLITE_OK) {
        ThrowBadAlloc();
    }
}

// A name that gives the column's value is no keyword, and no constant as NULL and CURRENT_TIME are.
bool BareNames::Has(const std::string& strName) const {
    if (!IsWord(strName)) {
        return false;
    }
    OwnStatement pStatement;
    const std::string strSql = "SELECT " + strName + " FROM (SELECT 7 AS \"" + strName + "\")";
    int nResult = Prepare(m_pDb.get(), strSql, pStatement);
    if (nResult == SQLITE_OK) {
        nResult = sqlite3_step(pStatement.get());
    }
    if (nResult == SQLITE_NOMEM) {
        ThrowBadAlloc();
    }
    return nResult == SQLITE_ROW && sqlite3_column_int(pStatement.get(), 0) == 7;
}

}  // namespace vornjsondb
