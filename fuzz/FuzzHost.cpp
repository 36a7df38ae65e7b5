#include "FuzzHost.h"

#include <dlfcn.h>

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>
#include <stdexcept>

#include "../src/schema/KnownTables.h"

namespace {

using RowCallback = int (*)(void*, int, char**, char**);
using ExecFunction = int (*)(sqlite3*, const char*, RowCallback, void*, char**);

// The last statement that failed, and how often the library has paused since it first did.
struct Failure {
    std::string strSql;
    std::string strError;
    int nStatus = SQLITE_OK;
    int nErrno = 0;
    int nPauses = 0;
};
Failure g_Failure;

// What the library does in one operation at most.
constexpr int kMaxPauses = 500;
// The first retry runs. Nobody else holds these databases, so the others would bring what it
// brought, and the fuzzer is good at finding the text that stands for a lock.
constexpr int kRunRetries = 1;

}  // namespace

extern "C" {

// The line is made, so that every argument is read, and goes nowhere.
__attribute__((format(printf, 2, 3))) void syslog(int, const char* szFormat, ...) {
    char szLine[256];
    va_list args;
    va_start(args, szFormat);
    std::vsnprintf(szLine, sizeof(szLine), szFormat, args);
    va_end(args);
}

int usleep(useconds_t) {
    ++g_Failure.nPauses;
    fuzzhost::Require(g_Failure.nPauses <= kMaxPauses, "a retry ends");
    return 0;
}

int sqlite3_exec(sqlite3* pDb, const char* szSql, RowCallback callback, void* pArg,
                 char** ppszError) {
    static const auto s_pfnReal = reinterpret_cast<ExecFunction>(dlsym(RTLD_NEXT, "sqlite3_exec"));
    if (g_Failure.nPauses > kRunRetries) {
        fuzzhost::Require(g_Failure.strSql == szSql, "a retry runs the same statement");
        if (!g_Failure.strError.empty()) {
            *ppszError = sqlite3_mprintf("%s", g_Failure.strError.c_str());
        }
        errno = g_Failure.nErrno;
        return g_Failure.nStatus;
    }
    const int nStatus = s_pfnReal(pDb, szSql, callback, pArg, ppszError);
    if (nStatus == SQLITE_OK) {
        g_Failure.nPauses = 0;
    } else {
        g_Failure = Failure{szSql, *ppszError == nullptr ? "" : *ppszError, nStatus, errno,
                            g_Failure.nPauses};
    }
    return nStatus;
}

}  // extern "C"

namespace fuzzhost {

void Require(bool blKept, const char* szPromise) {
    if (!blKept) {
        std::fprintf(stderr, "broken promise: %s\n", szPromise);
        std::abort();
    }
}

Database::Database(const char* szCreate) {
    Require(sqlite3_open(":memory:", &m_pDb) == SQLITE_OK, "a database opens");
    sqlite3_limit(m_pDb, SQLITE_LIMIT_LENGTH, 1 << 20);
    sqlite3_limit(m_pDb, SQLITE_LIMIT_SQL_LENGTH, 1 << 18);
    char* szError = nullptr;
    Require(sqlite3_exec(m_pDb, szCreate, nullptr, nullptr, &szError) == SQLITE_OK, szCreate);
    sqlite3_set_authorizer(m_pDb, Authorize, this);
    sqlite3_progress_handler(m_pDb, 1000, Tick, this);
    m_blFenced = true;
}

Database::~Database() {
    Require(sqlite3_close(m_pDb) == SQLITE_OK, "the connection closes");
}

std::string Database::Run(const std::string& strSql, const std::string& strValue) {
    sqlite3_stmt* pStatement = nullptr;
    m_nTicks = 0;
    Require(sqlite3_prepare_v2(m_pDb, strSql.c_str(), -1, &pStatement, nullptr) == SQLITE_OK,
            strSql.c_str());
    sqlite3_bind_text(pStatement, 1, strValue.data(), static_cast<int>(strValue.size()),
                      SQLITE_STATIC);
    std::string strText;
    const int nStep = sqlite3_step(pStatement);
    Require(nStep == SQLITE_ROW || nStep == SQLITE_DONE, strSql.c_str());
    if (nStep == SQLITE_ROW && sqlite3_column_text(pStatement, 0) != nullptr) {
        strText.assign(reinterpret_cast<const char*>(sqlite3_column_text(pStatement, 0)),
                       static_cast<size_t>(sqlite3_column_bytes(pStatement, 0)));
    }
    sqlite3_finalize(pStatement);
    return strText;
}

int Database::Authorize(void* pSelf, int nAction, const char*, const char*, const char*,
                        const char*) {
    switch (nAction) {
        case SQLITE_SELECT:
        case SQLITE_READ:
        case SQLITE_INSERT:
        case SQLITE_UPDATE:
        case SQLITE_DELETE:
        case SQLITE_FUNCTION:
        case SQLITE_RECURSIVE:
            return SQLITE_OK;
        default:
            if (static_cast<Database*>(pSelf)->m_blFenced) {
                static_cast<Database*>(pSelf)->m_blRefused = true;
                return SQLITE_DENY;
            }
            return SQLITE_OK;
    }
}

int Database::Tick(void* pSelf) {
    return ++static_cast<Database*>(pSelf)->m_nTicks > 200 ? 1 : 0;
}

void ForgetTables() {
    vornjsondb::KnownTables::OfProcess().Forget();
}

void Begin(Database& Db) {
    ForgetTables();
    sqlite3_set_last_insert_rowid(Db.Get(), 0);
    errno = 0;
}

int Call(Database& Db, const std::function<int()>& fn) {
    Db.Rearm();
    g_Failure.nPauses = 0;
    int nResult = -1;
    try {
        nResult = fn();
    } catch (const std::bad_alloc&) {
        nResult = -1;
    } catch (const std::logic_error&) {
        nResult = -1;
    }
    g_Failure.nPauses = 0;
    Require(sqlite3_next_stmt(Db.Get(), nullptr) == nullptr, "no statement stays open");
    Require(sqlite3_get_autocommit(Db.Get()) != 0, "no transaction stays open");
    return nResult;
}

std::unique_ptr<VornJsonDbApi> NewHandle(Database& Db, std::string strTable, Json::Value jTableDef,
                                         std::string strCreate) {
    std::unique_ptr<VornJsonDbApi> pHandle;
    Call(Db, [&] {
        pHandle = std::make_unique<VornJsonDbApi>(Db.Get(), strTable, jTableDef, strCreate);
        return 0;
    });
    Require(pHandle != nullptr, "a handle is made");
    return pHandle;
}

}  // namespace fuzzhost
