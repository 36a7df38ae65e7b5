#include "Sql.h"

#include <utility>

#include "../table/Failure.h"
#include "input/LockWait.h"

namespace VORN_JSON_DB::Cli {

namespace {

// As it was typed: SQLite itself knows the whole path.
std::string g_strOpened = "database";

}  // namespace

void NameDatabase(const std::string& strFile) {
    g_strOpened = strFile;
}

void FailBySqlite(sqlite3* pDb, const std::string& strWhere) {
    std::string strLine = strWhere + ": " + sqlite3_errmsg(pDb);
    const StatusCode eCode =
        vornjsondb::FailBySqlite(pDb, sqlite3_extended_errcode(pDb), {"", nullptr}).Code();
    if (eCode == StatusCode::kLocked) {
        strLine = WithWait(std::move(strLine));
    }
    const bool blTaken = strLine.find(" already exists") != std::string::npos;
    Fail(ExitOf(eCode, blTaken ? kExitDuplicate : kExitUnexpected),
         strLine + HintFor(eCode, strLine));
}

void FailBySqlite(sqlite3* pDb) {
    FailBySqlite(pDb, g_strOpened);
}

Statement Prepare(sqlite3* pDb, const std::string& strSql) {
    sqlite3_stmt* pStatement = nullptr;
    if (sqlite3_prepare_v2(pDb, strSql.c_str(), static_cast<int>(strSql.size()) + 1, &pStatement,
                           nullptr) != SQLITE_OK) {
        FailBySqlite(pDb);
    }
    return Statement(pStatement);
}

Statement Prepare(sqlite3* pDb, const std::string& strSql, const std::string& strText) {
    Statement pStatement = Prepare(pDb, strSql);
    sqlite3_bind_text(pStatement.get(), 1, strText.c_str(), -1, SQLITE_TRANSIENT);
    return pStatement;
}

std::vector<std::string> Texts(sqlite3* pDb, const std::string& strSql,
                               const std::string& strText) {
    const Statement pLook = Prepare(pDb, strSql, strText);
    std::vector<std::string> vecTexts;
    while (Step(pLook.get())) {
        vecTexts.push_back(ColumnText(pLook.get(), 0));
    }
    return vecTexts;
}

bool Step(sqlite3_stmt* pStatement) {
    const int nResult = sqlite3_step(pStatement);
    if (nResult != SQLITE_ROW && nResult != SQLITE_DONE) {
        FailBySqlite(sqlite3_db_handle(pStatement));
    }
    return nResult == SQLITE_ROW;
}

void Run(sqlite3* pDb, const std::string& strSql) {
    const Statement pStatement = Prepare(pDb, strSql);
    while (Step(pStatement.get())) {
    }
}

std::string ColumnText(sqlite3_stmt* pStatement, int nColumn) {
    // As UTF-8, whatever the database has.
    const void* const pBytes = sqlite3_column_text(pStatement, nColumn);
    const auto nBytes = static_cast<std::size_t>(sqlite3_column_bytes(pStatement, nColumn));
    return pBytes == nullptr ? "" : std::string(static_cast<const char*>(pBytes), nBytes);
}

std::string Quoted(const std::string& strName) {
    std::string strQuoted = "\"";
    for (const char c : strName) {
        strQuoted += c == '"' ? "\"\"" : std::string(1, c);
    }
    return strQuoted + "\"";
}

}  // namespace VORN_JSON_DB::Cli
