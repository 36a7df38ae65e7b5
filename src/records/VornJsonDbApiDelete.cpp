// Delete records: by query object, all of them, by values of a string member.

#include <VornJsonDbApi.h>

#include "../base/JsonMemory.h"
#include "../base/TextBuffer.h"
#include "../core/LogLine.h"
#include "../core/VornJsonDbApiRunner.h"
#include "../sql/VornJsonDbApiConditions.h"

namespace {

using vornjsondb::TableTypes;
using vornjsondb::TextBuffer;

// "a,b,c" for the failure line.
std::string Joined(const std::vector<std::string>& strVector) {
    std::string strText;
    for (const std::string& strValue : strVector) {
        if (&strValue != &strVector.front()) {
            strText += ',';
        }
        strText += strValue;
    }
    return strText;
}

}  // namespace

int VornJsonDbApi::recDelete(Json::Value& jRecParam, bool blAllowAll) {
    const vornjsondb::HandleParts Handle{m_pDb, m_strName, m_jTableDef, m_strSqlError};
    TextBuffer SqlRun;
    const auto Delete = [&]() -> int {
        TextBuffer Where;
        int err = -1;
        VORN_FAIL_IF(jRecParam.type() != Json::objectValue);
        VORN_FAIL_IF_TEXT(0 > vornjsondb::AppendConditions(Handle, jRecParam, Where),
                          "0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)");
        VORN_FAIL_IF_TEXT(Where.IsEmpty() && !blAllowAll, "strSql.empty()");
        // Two blanks before WHERE, as in a list.
        SqlRun.Append("DELETE FROM ").Append(m_strName).Append(' ');
        if (!Where.IsEmpty()) {
            SqlRun.Append(" WHERE ").Append(Where.View());
        }
        SqlRun.Append(';');
        VORN_FAIL_IF_TEXT(
            0 > (err = vornjsondb::RunSql(Handle, SqlRun.Terminated(), nullptr, nullptr)),
            "0 > (err = runSqlEx(strSqlRun))");
        // GCOVR_EXCL_START: a run that succeeds leaves no error text; the guard stays all the same.
        if (!m_strSqlError.empty()) {
            VORN_LOG_LOCATED("sql error, sql=%s", SqlRun.CStr());
            return -1;
        }
        // GCOVR_EXCL_STOP
        VORN_LOG_DEBUG("delete rec number=%d", err);
        return err;
    };
    const int nResult = Delete();
    // mutate(> to >=): where nothing failed, there is no error text.
    if (0 > nResult && !m_strSqlError.empty()) {
        VORN_LOG_PLAIN("sql error, err=%s, sql=%s", m_strSqlError.c_str(), SqlRun.CStr());
    }
    return nResult;
}

int VornJsonDbApi::recDeleteAll() {
    Json::Value jEverything(Json::objectValue);
    return recDelete(jEverything, true);
}

int VornJsonDbApi::recDeleteByArray(std::vector<std::string>& strVector, const char* szKey) {
    const TableTypes& Types = vornjsondb::LookUpTable(m_jTableDef, m_strName).Types();
    const auto Delete = [&]() -> int {
        Json::Value jParam(Json::objectValue);
        int err = -1;
        VORN_FAIL_IF(0 >= strVector.size());
        VORN_FAIL_IF(!szKey || !szKey[0]);
        const vornjsondb::TypedMember* pMember = Types.Find(vornjsondb::NameOf(szKey));
        VORN_FAIL_IF_TEXT(pMember == nullptr, "!jType.isMember(szKey)");
        VORN_FAIL_IF_TEXT(!pMember->pType->blDeleteByList,
                          "jType[szKey][\"cpptype\"].asString() != \"string\"");
        VORN_FAIL_IF(0 > VectorParamToJson(strVector, szKey, jParam));  // GCOVR_EXCL_BR_LINE
        VORN_FAIL_IF(0 > (err = recDelete(jParam)));
        return err;
    };
    const int nResult = Delete();
    if (0 > nResult) {
        VORN_LOG_PLAIN("recDeleteByArray failed, name=%s, strVector=%s", szKey,
                       Joined(strVector).c_str());
    }
    return nResult;
}

int VornJsonDbApi::recDeleteByName(std::string& strValue, const char* szKey) {
    const TableTypes& Types = vornjsondb::LookUpTable(m_jTableDef, m_strName).Types();
    const auto Delete = [&]() -> int {
        int err = -1;
        VORN_FAIL_IF(strValue.empty());
        VORN_FAIL_IF(!szKey || !szKey[0]);
        VORN_FAIL_IF_TEXT(Types.Find(vornjsondb::NameOf(szKey)) == nullptr,
                          "!jType.isMember(szKey)");
        std::vector<std::string> strVector(1);
        strVector.front() = strValue;
        VORN_FAIL_IF(0 > (err = recDeleteByArray(strVector, szKey)));
        return err;
    };
    const int nResult = Delete();
    if (0 > nResult) {
        VORN_LOG_PLAIN("recDeleteByName failed, name=%s, strValue=%s", szKey, strValue.c_str());
    }
    return nResult;
}

int VornJsonDbApi::VectorParamToJson(std::vector<std::string>& strVector, const char* szKey,
                                     Json::Value& jParamOut) try {
    VORN_FAIL_IF(jParamOut.type() != Json::objectValue && jParamOut.type() != Json::nullValue);
    VORN_FAIL_IF(!szKey || !szKey[0]);
    Json::Value jList(Json::arrayValue);
    for (const std::string& strValue : strVector) {
        jList.append(strValue);
    }
    jParamOut[szKey] = jList;
    return 0;
}
VORN_JSON_MEMORY_TO_BAD_ALLOC
