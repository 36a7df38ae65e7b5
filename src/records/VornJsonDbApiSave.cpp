// Insert or replace one record and read it back.

#include <VornJsonDbApi.h>

#include "../base/JsonText.h"
#include "../base/SqlText.h"
#include "../core/LogLine.h"
#include "../core/VornJsonDbApiRows.h"
#include "SaveRecord.h"

// Beside the class, so that a create can store the caller's record without changing or copying it.
// The condition texts are those of recSave, which log readers know.
int vornjsondb::SaveRecord(VornJsonDbApi& Handle, const TableParts& Table, const Json::Value& jType,
                           Json::Value& jRec, Json::Value& jStored, bool blCreate) {
    std::string strSql;
    const auto Save = [&]() -> int {
        Json::Value jArrayTmp(Json::arrayValue);
        strSql.reserve(kUsualStatement);
        strSql.append(blCreate ? "INSERT INTO " : "REPLACE INTO ");
        strSql.append(Table.strName).append(" (");
        VORN_FAIL_IF_TEXT(0 > Handle.SqlExpandMemberName(strSql, &jRec),  // GCOVR_EXCL_BR_LINE
                          "0 > SqlExpandMemberName(strSql, &jRecInOut)");
        strSql.append(") VALUES (");
        VORN_FAIL_IF_TEXT(0 > Handle.SqlExpandMemberSymbol(strSql, jRec),
                          "0 > SqlExpandMemberSymbol(strSql, jRecInOut)");
        strSql.append(";select * from ").append(Table.strName);
        strSql.append(" where rowid == last_insert_rowid();");
        VORN_FAIL_IF(strSql.empty());  // GCOVR_EXCL_BR_LINE: never is; kept as a guard
        VORN_FAIL_IF_TEXT(0 > RunSql(Table, strSql, DbCallBackFillList, &jArrayTmp),
                          "0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)");
        // GCOVR_EXCL_START: a run that succeeds leaves no error text; the guard stays all the same.
        if (!Table.strSqlError.empty()) {
            VORN_LOG_LOCATED("sql error, sql=%s", strSql.c_str());
            return -1;
        }
        // GCOVR_EXCL_STOP
        VORN_FAIL_IF(0 == jArrayTmp.size());
        jStored.swap(jArrayTmp[0]);
        return 0;
    };
    if (0 <= Save()) {
        return 0;
    }
    VORN_LOG_PLAIN("blCreate=%d, jRecInOut=%s", static_cast<int>(blCreate), ToString(jRec).c_str());
    VORN_LOG_PLAIN("jType=%s", ToString(jType).c_str());
    if (!Table.strSqlError.empty()) {
        VORN_LOG_PLAIN("sql error, err=%s, sql=%s", Table.strSqlError.c_str(), strSql.c_str());
    }
    return -1;
}

int VornJsonDbApi::recSave(Json::Value& jRecInOut, bool blCreate) {
    const Json::Value& jType = VORN_JSON_DB::recType(m_jTableDef, m_strName);
    return vornjsondb::SaveRecord(*this, {m_pDb, m_strName, m_strSqlError}, jType, jRecInOut,
                                  jRecInOut, blCreate);
}
