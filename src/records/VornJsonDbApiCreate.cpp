// Create one record: defaults, type check, insert, read-back.

#include <VornJsonDbApi.h>

#include "../base/JsonMemory.h"
#include "../base/JsonText.h"
#include "../core/LogLine.h"
#include "../schema/VornJsonDbApiDefaults.h"
#include "UniqueFailure.h"
#include "VornJsonDbApiSave.h"

int VornJsonDbApi::recCreate(Json::Value& jParamIn, Json::Value& jParamOut) try {
    Json::Value jCompleted;
    Json::Value* pjParam = &jParamIn;
    Json::Value jStored;
    const auto Create = [&]() -> int {
        // Log readers know the record by the name jRecIn.
        VORN_FAIL_IF_TEXT(jParamIn.empty(), "jRecIn.empty()");
        const vornjsondb::HandleParts Handle{m_pDb, m_strName, m_jTableDef, m_strSqlError};
        const vornjsondb::TableTypes& Types = Handle.LookUp().Types();
        // The caller's record is copied only where there is something to fill in. A value that is
        // no object is left for the type check to refuse.
        // mutate(hoisted): a copy that is not needed changes nothing.
        if (jParamIn.isObject() && vornjsondb::LacksDefaults(Types, jParamIn)) {
            jCompleted = jParamIn;
            vornjsondb::FillDefaults(Types, jCompleted);
            pjParam = &jCompleted;
        }
        VORN_FAIL_IF_TEXT(0 > checkJsonType(*pjParam), "0 > checkJsonType(jParam)");
        VORN_FAIL_IF_TEXT(0 > vornjsondb::SaveRecord(Handle, *pjParam, jStored, true),
                          "0 > recSave(jParam, true)");
        return 0;
    };
    if (0 <= Create()) {
        jParamOut.swap(jStored);
        return 0;
    }
    VORN_LOG_PLAIN("call create rec, rec=%s", vornjsondb::ToString(*pjParam).c_str());
    if (vornjsondb::IsUniqueFailure(m_strSqlError)) {
        m_strErrMsg = vornjsondb::kDuplicateKeyMessage;
    }
    return -1;
}
VORN_JSON_MEMORY_TO_BAD_ALLOC
