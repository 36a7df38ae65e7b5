#include "FuzzHost.h"

#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <new>
#include <sstream>
#include <stdexcept>

// scripts/fuzz.sh makes the function's static visible under this name.
extern Json::Value* g_pjTypeCache __asm__("vornjsondb_fuzz_type_cache");

// The log would drown everything else and cost most of the time.
extern "C" {
void syslog(int, const char*, ...) {}
void vsyslog(int, const char*, va_list) {}
void __syslog_chk(int, int, const char*, ...) {}
}

namespace fuzzhost {

void Require(bool blKept, const char* szPromise) {
    if (!blKept) {
        std::fprintf(stderr, "broken promise: %s\n", szPromise);
        std::abort();
    }
}

void ForgetTypes() {
    // A first lookup constructs the static.
    static const bool s_blMade = [] {
        Json::Value jNone;
        std::string strNone = "none";
        VORN_JSON_DB::recType(jNone, strNone);
        return true;
    }();
    Require(s_blMade, "the type cache exists");
    // Kept, because the library relies on the entries' addresses for as long as the process runs.
    static std::deque<Json::Value> s_vecOld;
    s_vecOld.emplace_back();
    s_vecOld.back().swap(*g_pjTypeCache);
}

Database::Database(const char* szCreate) {
    Require(sqlite3_open(":memory:", &m_pDb) == SQLITE_OK, "a database opens");
    sqlite3_limit(m_pDb, SQLITE_LIMIT_LENGTH, 1 << 20);
    sqlite3_limit(m_pDb, SQLITE_LIMIT_SQL_LENGTH, 1 << 18);
    Require(sqlite3_exec(m_pDb, szCreate, nullptr, nullptr, nullptr) == SQLITE_OK, szCreate);
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

int Call(Database& Db, const std::function<int()>& fn) {
    Db.Rearm();
    int nResult = -1;
    try {
        nResult = fn();
    } catch (const std::bad_alloc&) {
        nResult = -1;
    } catch (const std::logic_error&) {
        nResult = -1;
    }
    Require(sqlite3_next_stmt(Db.Get(), nullptr) == nullptr, "no statement stays open");
    Require(sqlite3_get_autocommit(Db.Get()) != 0, "no transaction stays open");
    return nResult;
}

bool Parse(const std::string& strText, Json::Value& jOut) {
    Json::CharReaderBuilder Builder;
    Json::CharReaderBuilder::strictMode(&Builder.settings_);
    Builder["strictRoot"] = false;
    // Twin keys stop the reader in strict mode, and are worth a try here.
    Builder["rejectDupKeys"] = false;
    const std::unique_ptr<Json::CharReader> pReader(Builder.newCharReader());
    try {
        return pReader->parse(strText.data(), strText.data() + strText.size(), &jOut, nullptr);
    } catch (const Json::Exception&) {
        return false;
    }
}

Json::Value ReadLeniently(const char* szText) {
    Json::CharReaderBuilder Builder;
    Builder["collectComments"] = false;
    const std::unique_ptr<Json::CharReader> pReader(Builder.newCharReader());
    Json::Value jResult;
    try {
        pReader->parse(szText, szText + std::strlen(szText), &jResult, nullptr);
    } catch (const Json::Exception&) {
        Require(false, "JSON that is nested too deep is refused");
    }
    return jResult;
}

std::string Compact(const Json::Value& jValue) {
    Json::StreamWriterBuilder Builder;
    Builder["indentation"] = "";
    Builder["emitUTF8"] = true;
    return Json::writeString(Builder, jValue);
}

Json::Value Definition(const std::string& strTable, const std::string& strMembers) {
    Json::Value jDefinition;
    std::istringstream Stream(strMembers);
    for (std::string strOne; std::getline(Stream, strOne, ',');) {
        // The type may hold colons, a name does not.
        const size_t nColon = strOne.find(':');
        jDefinition[strTable]["member"][strOne.substr(0, nColon)]["cpptype"] =
            strOne.substr(nColon + 1);
    }
    return jDefinition;
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
