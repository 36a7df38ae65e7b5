// Read records: all that match, or the first.

#include <VornJsonDbApi.h>

#include "../base/JsonText.h"
#include "../base/TextBuffer.h"
#include "../core/LogLine.h"
#include "../core/VornJsonDbApiRows.h"
#include "../core/VornJsonDbApiRunner.h"
#include "../sql/VornJsonDbApiConditions.h"
#include "../sql/VornJsonDbApiValues.h"

namespace {

using vornjsondb::TextBuffer;

// recList with the row callback that fills jRecArrayOut.
int ListRows(VornJsonDbApi& Api, const vornjsondb::HandleParts& Handle, Json::Value& jRecParam,
             int (*callback)(void*, int, char**, char**), Json::Value& jRecArrayOut) {
    TextBuffer SqlRun;
    const auto List = [&]() -> int {
        TextBuffer Where;
        std::string strSqlLimit;
        VORN_FAIL_IF(jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue);
        VORN_FAIL_IF(jRecArrayOut.type() != Json::nullValue &&
                     jRecArrayOut.type() != Json::arrayValue);
        VORN_FAIL_IF_TEXT(0 > vornjsondb::AppendConditions(Handle, jRecParam, Where),
                          "0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)");
        VORN_FAIL_IF_TEXT(0 > Api.SqlFilterConditionFromJson(jRecParam, strSqlLimit),
                          "0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit)");
        // From here on the statement is a part of what is logged of a failure.
        SqlRun.Append("SELECT ");
        vornjsondb::AppendDeclaredNames(Handle.Declared(), SqlRun);
        // The blank after the name makes two before WHERE: hosts compare statements as texts.
        // Pinned by List.ConditionStandsBehindTwoBlanks.
        SqlRun.Append(" FROM ").Append(Handle.strName).Append(' ');
        if (!Where.IsEmpty()) {
            SqlRun.Append(" WHERE ").Append(Where.View());
        }
        SqlRun.Append(strSqlLimit).Append(';');
        VORN_FAIL_IF_TEXT(
            0 > vornjsondb::RunSql(Handle, SqlRun.Terminated(), callback, &jRecArrayOut),
            "0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)");
        return 0;
    };
    if (0 <= List()) {
        return 0;
    }
    VORN_LOG_PLAIN("jRecParam=%s", vornjsondb::ToString(jRecParam).c_str());
    if (!Handle.strSqlError.empty()) {
        VORN_LOG_PLAIN("sql error, err=%s, sql=%s", Handle.strSqlError.c_str(), SqlRun.CStr());
    }
    return -1;
}

}  // namespace

int VornJsonDbApi::recList(Json::Value& jRecParam, Json::Value& jRecArrayOut) {
    return ListRows(*this, {m_pDb, m_strName, m_jTableDef, m_strSqlError}, jRecParam,
                    DbCallBackFillList, jRecArrayOut);
}

int VornJsonDbApi::recGetOne(Json::Value& jRecParam, Json::Value& jRecOut) {
    Json::Value jFound;
    VORN_FAIL_IF_TEXT(0 > ListRows(*this, {m_pDb, m_strName, m_jTableDef, m_strSqlError}, jRecParam,
                                   DbCallBackFillFirst, jFound),
                      "0 > recList(jRecParam, jRecArray)");
    // mutate(exchanged): what is null is empty, too.
    if (jFound.isNull()) {
        return 0;
    }
    // mutate(false, exchanged): a copy into nothing gives the same.
    if (jRecOut.isNull() && !jFound.empty()) {
        jRecOut.swapPayload(jFound);
        return 1;
    }
    VORN_FAIL_IF_TEXT(0 > VORN_JSON_DB::jsonCopyMember(jRecOut, jFound, true),
                      "0 > jsonCopyMember(jRecOut, jRecArray[0], true)");
    return 1;
}
