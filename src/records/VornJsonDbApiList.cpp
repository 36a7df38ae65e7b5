// Read records: all that match, or the first.

#include <VornJsonDbApi.h>

#include "../base/JsonText.h"
#include "../base/SqlText.h"
#include "../core/LogLine.h"
#include "../core/VornJsonDbApiRows.h"
#include "../core/VornJsonDbApiRunner.h"

int VornJsonDbApi::recList(Json::Value& jRecParam, Json::Value& jRecArrayOut) {
    const vornjsondb::HandleParts Handle{m_pDb, m_strName, m_jTableDef, m_strSqlError};
    std::string strSqlRun;
    const auto List = [&]() -> int {
        std::string strSql;
        std::string strSqlLimit;
        VORN_FAIL_IF(jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue);
        VORN_FAIL_IF(jRecArrayOut.type() != Json::nullValue &&
                     jRecArrayOut.type() != Json::arrayValue);
        VORN_FAIL_IF(0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND));
        VORN_FAIL_IF(0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit));
        // From here on the statement is a part of what is logged of a failure.
        strSqlRun.reserve(vornjsondb::kUsualStatement);
        strSqlRun.append("SELECT ");
        VORN_FAIL_IF_TEXT(0 > SqlExpandMemberName(strSqlRun),  // GCOVR_EXCL_BR_LINE: cannot fail
                          "0 > SqlExpandMemberName(strSqlPrefix)");
        // The blank after the name makes two before WHERE: hosts compare statements as texts.
        // Pinned by List.ConditionStandsBehindTwoBlanks.
        strSqlRun.append(" FROM ").append(m_strName).append(" ");
        if (!strSql.empty()) {
            strSqlRun.append(" WHERE ").append(strSql);
        }
        strSqlRun.append(strSqlLimit).append(";");
        VORN_FAIL_IF_TEXT(
            0 > vornjsondb::RunSql(Handle, strSqlRun, DbCallBackFillList, &jRecArrayOut),
            "0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)");
        return 0;
    };
    if (0 <= List()) {
        return 0;
    }
    VORN_LOG_PLAIN("jRecParam=%s", vornjsondb::ToString(jRecParam).c_str());
    if (!m_strSqlError.empty()) {
        VORN_LOG_PLAIN("sql error, err=%s, sql=%s", m_strSqlError.c_str(), strSqlRun.c_str());
    }
    return -1;
}

int VornJsonDbApi::recGetOne(Json::Value& jRecParam, Json::Value& jRecOut) {
    Json::Value jRecArray(Json::arrayValue);
    VORN_FAIL_IF(0 > recList(jRecParam, jRecArray));
    if (jRecArray.empty()) {
        return 0;
    }
    Json::Value& jFound = *jRecArray.begin();
    // mutate(false, exchanged): a copy into nothing gives the same.
    if (jRecOut.isNull() && !jFound.empty()) {
        jRecOut.swapPayload(jFound);
        return 1;
    }
    VORN_FAIL_IF_TEXT(0 > VORN_JSON_DB::jsonCopyMember(jRecOut, jFound, true),
                      "0 > jsonCopyMember(jRecOut, jRecArray[0], true)");
    return 1;
}
