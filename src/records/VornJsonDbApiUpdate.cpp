// Change stored records.

#include <VornJsonDbApi.h>

#include "../base/JsonText.h"
#include "../base/TextBuffer.h"
#include "../core/LogLine.h"
#include "../core/VornJsonDbApiRunner.h"
#include "../sql/VornJsonDbApiConditions.h"
#include "UniqueFailure.h"

namespace {

using vornjsondb::TextBuffer;

int UpdateWhere(const vornjsondb::HandleParts& Handle, const Json::Value& jRecIn,
                std::string_view SqlWhere) {
    TextBuffer Sql;
    const auto Update = [&]() -> int {
        // An empty condition would change the whole table.
        VORN_FAIL_IF_TEXT(SqlWhere.empty(), "strSqlWhere.empty()");
        VORN_FAIL_IF(jRecIn.empty());
        Sql.Append("UPDATE ").Append(Handle.strName).Append(" SET ");
        const size_t nHead = Sql.Length();
        // Raw condition text in a record must not become an assignment.
        if (0 > vornjsondb::AppendMemberList(Handle.LookUp().Types(), jRecIn, Sql,
                                             VORN_SQL_WHERE_TYPE_COMMA,
                                             vornjsondb::ListUse::kAssignments)) {
            Sql.Cut(nHead);  // what is logged of a failed statement is the head alone
            VORN_LOG_CONDITION(
                "0 > SqlExpandMemberList(jColumnList, strSql2, VORN_SQL_WHERE_TYPE_COMMA)");
            return -1;
        }
        Sql.Append(" WHERE ").Append(SqlWhere).Append(';');
        VORN_FAIL_IF_TEXT(Sql.IsEmpty(), "strSql.empty()");  // GCOVR_EXCL_BR_LINE: kept as a guard
        VORN_FAIL_IF_TEXT(0 > vornjsondb::RunSql(Handle, Sql.Terminated(), nullptr, nullptr),
                          "0 > runSqlEx(strSql, NULL, NULL)");
        // GCOVR_EXCL_START: a run that succeeds leaves no error text; the guard stays all the same.
        if (!Handle.strSqlError.empty()) {
            VORN_LOG_LOCATED("sql error msg=%s, sql=%s", Handle.strSqlError.c_str(), Sql.CStr());
            return -1;
        }
        // GCOVR_EXCL_STOP
        return 0;
    };
    if (0 <= Update()) {
        return 0;
    }
    VORN_LOG_PLAIN("jRecIn=%s", vornjsondb::ToString(jRecIn).c_str());
    if (!Handle.strSqlError.empty()) {
        VORN_LOG_PLAIN("sql error, err=%s, sql=%s", Handle.strSqlError.c_str(), Sql.CStr());
    }
    return -1;
}

}  // namespace

int VornJsonDbApi::recUpdateByWhere(Json::Value& jRecIn, std::string& strSqlWhere) {
    return UpdateWhere({m_pDb, m_strName, m_jTableDef, m_strSqlError}, jRecIn, strSqlWhere);
}

int VornJsonDbApi::recUpdateByFilter(Json::Value& jFilterIn, Json::Value& jParamIn) {
    const auto Update = [&]() -> int {
        const vornjsondb::HandleParts Handle{m_pDb, m_strName, m_jTableDef, m_strSqlError};
        TextBuffer Where;
        VORN_FAIL_IF(jFilterIn.empty());
        VORN_FAIL_IF(jFilterIn.type() != Json::objectValue);
        VORN_FAIL_IF(jParamIn.type() != Json::objectValue);
        VORN_FAIL_IF_TEXT(0 > vornjsondb::AppendConditions(Handle, jFilterIn, Where),
                          "0 > SqlExpandMemberList(jFilterIn, strSql, VORN_SQL_WHERE_TYPE_AND)");
        // A filter of unknown members must not change the whole table.
        VORN_FAIL_IF_TEXT(Where.IsEmpty(), "strSql.empty()");
        VORN_FAIL_IF(0 > checkJsonType(jParamIn));
        VORN_FAIL_IF_TEXT(0 > UpdateWhere(Handle, jParamIn, Where.View()),
                          "0 > recUpdateByWhere(jParamIn, strSql)");
        return 0;
    };
    if (0 <= Update()) {
        return 0;
    }
    VORN_LOG_PLAIN("recUpdateByFilter failed, jParamIn=%s", vornjsondb::ToString(jParamIn).c_str());
    if (vornjsondb::IsUniqueFailure(m_strSqlError)) {
        m_strErrMsg = vornjsondb::kDuplicateKeyMessage;
    }
    return -1;
}
