#include "SqlCapture.h"

#include <utility>

namespace bench {

SqlCapture::SqlCapture(sqlite3* pDb) : m_pDb(pDb) {
    sqlite3_trace_v2(m_pDb, SQLITE_TRACE_STMT, OnStatement, this);
}

SqlCapture::~SqlCapture() {
    sqlite3_trace_v2(m_pDb, 0, nullptr, nullptr);
}

int SqlCapture::OnStatement(unsigned, void* pContext, void* pStatement, void*) {
    static_cast<SqlCapture*>(pContext)->m_vecSql.emplace_back(
        sqlite3_sql(static_cast<sqlite3_stmt*>(pStatement)));
    return 0;
}

std::string SqlCapture::Take() {
    std::string strAll;
    for (const std::string& strSql : TakeEach()) {
        strAll += strSql;
    }
    return strAll;
}

std::vector<std::string> SqlCapture::TakeEach() {
    return std::exchange(m_vecSql, {});
}

}  // namespace bench
