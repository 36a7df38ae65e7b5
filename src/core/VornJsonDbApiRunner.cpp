// Running SQL: the only caller of sqlite3_exec, and the retry while another connection holds the
// database.

#include "VornJsonDbApiRunner.h"

#include <VornJsonDbApi.h>

#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "../base/SqlText.h"
#include "LogLine.h"

std::string g_strCurTable;

namespace {

constexpr int kMaxAttempts = 500;
constexpr useconds_t kRetryPauseUs = 10000;
constexpr char kLockText[] = "database is locked";
// The spelling is part of the text: hosts compare with it. Pinned by
// RunnerTest.FailureWithoutATextIsAnUnknownError.
constexpr char kNoErrorText[] = "Unknow Error!!";

// SQLite reports a lock by its text; with some file systems only errno tells. A failure without a
// text is never a lock: it comes from a call that did not get as far as a file.
bool IsLocked(const char* szError, int nErrno) {
    return szError != nullptr && (std::strstr(szError, kLockText) != nullptr || nErrno == EAGAIN);
}

}  // namespace

int vornjsondb::RunSql(const HandleParts& Handle, std::string_view Sql,
                       int (*callback)(void*, int, char**, char**), void* pArg) {
    SqlText szError;
    int i = 0;
    const auto Failed = [&](int nResult) {
        Handle.strSqlError = szError ? szError.get() : kNoErrorText;
        VORN_LOG_PLAIN("i=%d,errno=%d, run sql failed, error=%s, sql=%s", i, errno,
                       Handle.strSqlError.c_str(), Sql.data());
        const char* szReason = szError.get();
        VORN_LOG_DEBUG("run sql fail, err=%s", szReason);
        return nResult;
    };

    if (Sql.empty()) {
        VORN_LOG_CONDITION("0 >= strSql.length()");
        return Failed(-1);
    }
    while (i < kMaxAttempts) {
        if (szError) {
            Handle.strSqlError = szError.get();
            szError.reset();
        } else {
            Handle.strSqlError.clear();
        }
        // Only now, so that nothing but the statement can leave an errno that decides.
        errno = 0;
        // mutate(true, sunk, hoisted): the same name again changes nothing.
        if (g_strCurTable != Handle.strName) {
            g_strCurTable = Handle.strName;
        }
        char* szText = nullptr;
        const int nStatus = sqlite3_exec(Handle.pDb, Sql.data(), callback, pArg, &szText);
        szError.reset(szText);
        if (nStatus == SQLITE_OK) {
            const int nChanged = callback == nullptr ? sqlite3_changes(Handle.pDb) : 0;
            // mutate(exchanged): a failure writes a text of its own.
            if (nChanged < 0) {
                return Failed(nChanged);
            }
            Handle.strSqlError.clear();
            return nChanged;
        }
        const char* szReason = szText;
        if (!IsLocked(szReason, errno)) {
            return Failed(-1);
        }
        VORN_LOG_DEBUG("retry, i=%d, errno=%d, run sql failed, error=%s, sql=%s", i, errno,
                       szReason, Sql.data());
        ++i;
        usleep(kRetryPauseUs);
    }
    return Failed(-1);
}

// NOLINTNEXTLINE(performance-unnecessary-value-param): by value in the ABI.
int VornJsonDbApi::runSqlEx(std::string strSql, int (*callback)(void*, int, char**, char**),
                            void* pArg) {
    return vornjsondb::RunSql({m_pDb, m_strName, m_jTableDef, m_strSqlError}, strSql, callback,
                              pArg);
}
