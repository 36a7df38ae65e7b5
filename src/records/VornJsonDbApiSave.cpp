// Insert or replace one record and read it back.

#include "VornJsonDbApiSave.h"

#include <VornJsonDbApi.h>

#include <vector>

#include "../base/JsonText.h"
#include "../core/LogLine.h"
#include "../core/VornJsonDbApiRows.h"
#include "../core/VornJsonDbApiRunner.h"
#include "../sql/VornJsonDbApiValues.h"

// Beside the class, so that a create can store the caller's record without changing or copying it.
// The condition texts are those of recSave, which log readers know.
int vornjsondb::SaveRecord(const HandleParts& Handle, const Json::Value& jRec, Json::Value& jStored,
                           bool blCreate) {
    const KnownTable& Table = Handle.LookUp();
    TextBuffer Sql;
    const auto Save = [&]() -> int {
        const std::vector<DeclaredValue> vecValues = DeclaredValues(Handle.Declared(), jRec);
        Json::Value jRow;
        Sql.Append(blCreate ? "INSERT INTO " : "REPLACE INTO ").Append(Handle.strName).Append(" (");
        AppendMemberNames(vecValues, Sql);
        Sql.Append(") VALUES (");
        VORN_FAIL_IF_TEXT(0 > AppendMemberValues(Handle, vecValues, jRec, Sql),
                          "0 > SqlExpandMemberSymbol(strSql, jRecInOut)");
        Sql.Append(";select * from ").Append(Handle.strName);
        Sql.Append(" where rowid == last_insert_rowid();");
        VORN_FAIL_IF_TEXT(Sql.IsEmpty(), "strSql.empty()");  // GCOVR_EXCL_BR_LINE: kept as a guard
        VORN_FAIL_IF_TEXT(0 > RunSql(Handle, Sql.Terminated(), DbCallBackFillFirst, &jRow),
                          "0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)");
        // GCOVR_EXCL_START: a run that succeeds leaves no error text; the guard stays all the same.
        if (!Handle.strSqlError.empty()) {
            VORN_LOG_LOCATED("sql error, sql=%s", Sql.CStr());
            return -1;
        }
        // GCOVR_EXCL_STOP
        VORN_FAIL_IF_TEXT(jRow.isNull(), "0 == jArrayTmp.size()");
        jStored.swap(jRow);
        return 0;
    };
    if (0 <= Save()) {
        return 0;
    }
    VORN_LOG_PLAIN("blCreate=%d, jRecInOut=%s", static_cast<int>(blCreate), ToString(jRec).c_str());
    VORN_LOG_PLAIN("jType=%s", ToString(Table.jTypes).c_str());
    if (!Handle.strSqlError.empty()) {
        VORN_LOG_PLAIN("sql error, err=%s, sql=%s", Handle.strSqlError.c_str(), Sql.CStr());
    }
    return -1;
}

int VornJsonDbApi::recSave(Json::Value& jRecInOut, bool blCreate) {
    return vornjsondb::SaveRecord({m_pDb, m_strName, m_jTableDef, m_strSqlError}, jRecInOut,
                                  jRecInOut, blCreate);
}
