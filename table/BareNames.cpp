#include "BareNames.h"

#include <algorithm>
#include <new>

#include "Statements.h"

namespace vornjsondb {

namespace {

bool IsLetter(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' ||
           static_cast<unsigned char>(c) >= 0x80;
}

// One word for SQLite: nothing in it ends the name, so it can go into a statement.
bool IsWord(const std::string& strName) {
    return !strName.empty() && IsLetter(strName[0]) &&
           std::all_of(strName.begin(), strName.end(),
                       [](char c) { return IsLetter(c) || (c >= '0' && c <= '9'); });
}

}  // namespace

BareNames::BareNames() {
    sqlite3* pDb = nullptr;
    const int nResult = sqlite3_open(":memory:", &pDb);
    m_pDb.reset(pDb);
    if (nResult != SQLITE_OK) {
        throw std::bad_alloc();
    }
}

// A name that gives the column's value is no keyword, and no constant as NULL and CURRENT_TIME are.
bool BareNames::Has(const std::string& strName) const {
    OwnStatement pStatement;
    const std::string strSql = "SELECT " + strName + " FROM (SELECT 7 AS \"" + strName + "\")";
    return IsWord(strName) && Prepare(m_pDb.get(), strSql, pStatement) == SQLITE_OK &&
           sqlite3_step(pStatement.get()) == SQLITE_ROW &&
           sqlite3_column_int(pStatement.get(), 0) == 7;
}

}  // namespace vornjsondb
