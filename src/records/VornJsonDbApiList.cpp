// Read records: all that match, or the first.

#include <VornJsonDbApi.h>

#include "../base/JsonText.h"
#include "../base/SqlText.h"
#include "../core/LogLine.h"
#include "../core/VornJsonDbApiRows.h"
#include "../core/VornJsonDbApiRunner.h"
#include "../sql/VornJsonDbApiValues.h"

namespace {

// recList with the row callback that fills jRecArrayOut.
int ListRows(VornJsonDbApi& Api, const vornjsondb::HandleParts& Handle, Json::Value& jRecParam,
             int (*callback)(void*, int, char**, char**), Json::Value& jRecArrayOut) {
    std::string strSqlRun;
    const auto List = [&]() -> int {
        std::string strSql;
        std::string strSqlLimit;
        VORN_FAIL_IF(jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue);
        VORN_FAIL_IF(jRecArrayOut.type() != Json::nullValue &&
                     jRecArrayOut.type() != Json::arrayValue);
        VORN_FAIL_IF_TEXT(0 > Api.SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND),
                          "0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)");
        VORN_FAIL_IF_TEXT(0 > Api.SqlFilterConditionFromJson(jRecParam, strSqlLimit),
                          "0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit)");
        // From here on the statement is a part of what is logged of a failure.
        strSqlRun.reserve(vornjsondb::kUsualStatement);
        strSqlRun.append("SELECT ");
        vornjsondb::AppendDeclaredNames(Handle.Declared(), strSqlRun);
        // The blank after the name makes two before WHERE: hosts compare statements as texts.
        // Pinned by List.ConditionStandsBehindTwoBlanks.
        strSqlRun.append(" FROM ").append(Handle.strName).append(" ");
        if (!strSql.empty()) {
            strSqlRun.append(" WHERE ").append(strSql);
        }
        strSqlRun.append(strSqlLimit).append(";");
        VORN_FAIL_IF_TEXT(0 > vornjsondb::RunSql(Handle, strSqlRun, callback, &jRecArrayOut),
                          "0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)");
        return 0;
    };
    if (0 <= List()) {
        return 0;
    }
    VORN_LOG_PLAIN("jRecParam=%s", vornjsondb::ToString(jRecParam).c_str());
    if (!Handle.strSqlError.empty()) {
        VORN_LOG_PLAIN("sql error, err=%s, sql=%s", Handle.strSqlError.c_str(), strSqlRun.c_str());
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
