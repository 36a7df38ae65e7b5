// The handle itself: construction, the table's creation, the caller's message slot.

#include <VornJsonDbApi.h>

#include <utility>

#include "../base/JsonMemory.h"
#include "LogLine.h"

// The only short condition checks: a constructor cannot return -1, so it continues.
#define VORN_WARN_IF(condition)                        \
    do {                                               \
        if (condition) {                               \
            VORN_LOG_PLAIN("Failed [%s]", #condition); \
        }                                              \
    } while (false)

VornJsonDbApi::VornJsonDbApi(sqlite3* pDb, std::string& strName, Json::Value& jTableDef,
                             std::string& strSqlCreate) try
    : m_pDb(pDb), m_strName(strName), m_jTableDef(jTableDef), m_strSqlCreate(strSqlCreate) {
    VORN_WARN_IF(!pDb);
    VORN_WARN_IF(strName.empty());
    VORN_WARN_IF(jTableDef.empty());
    VORN_WARN_IF(strSqlCreate.empty());

    if (0 > tableCreate()) {
        VORN_LOG_CONDITION("0 > tableCreate()");
    }
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

VornJsonDbApi::~VornJsonDbApi() {
    m_pDb = nullptr;  // mutate(dropped): nobody may look into a handle that is gone.
}

void VornJsonDbApi::setErrMsg(std::string strMsg) {
    m_strErrMsg = std::move(strMsg);
}

std::string VornJsonDbApi::getErrMsg() {
    return m_strErrMsg;
}

int VornJsonDbApi::tableCreate() {
    if (0 <= runSqlEx(m_strSqlCreate)) {
        return 0;
    }
    VORN_LOG_LOCATED("create table failed, sql=%s", m_strSqlCreate.c_str());
    if (!m_strSqlError.empty()) {
        VORN_LOG_PLAIN("sql error, err=%s, sql=%s", m_strSqlError.c_str(), m_strSqlCreate.c_str());
    }
    return -1;
}
