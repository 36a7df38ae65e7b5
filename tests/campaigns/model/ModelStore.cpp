// The model's record operations.

#include "Model.h"

namespace campaign {

// The message slot tells a refused duplicate, also one that an earlier statement met.
void Model::NoteDuplicate() {
    if (m_strSqlError.find("UNIQUE constraint failed") != std::string::npos) {
        strErrMsg = "DUPLICATE_PRIMARY_KEY";
    }
}

// ---- save, create -------------------------------------------------------------------------------

bool Model::Save(Json::Value& jRecord, bool blCreate, std::string& strSql) {
    strSql = (blCreate ? "INSERT INTO " : "REPLACE INTO ") + m_strName + " (";
    if (Host().Fails(0 > Names(strSql, &jRecord), "0 > SqlExpandMemberName(strSql, &jRecInOut)")) {
        return false;
    }
    strSql += ") VALUES (";
    if (Host().Fails(0 > Values(strSql, jRecord), "0 > SqlExpandMemberSymbol(strSql, jRecInOut)")) {
        return false;
    }
    strSql += ";select * from " + m_strName + " where rowid == last_insert_rowid();";
    Json::Value jRows(Json::arrayValue);
    if (Host().Fails(0 > RunSql(strSql, ModelRow, &jRows),
                     "0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)") ||
        Host().Fails(jRows.empty(), "0 == jArrayTmp.size()")) {
        return false;
    }
    const Json::Value jStored = jRows[0];
    jRecord = jStored;
    return true;
}

int Model::RecSave(Json::Value& jRecord, bool blCreate) {
    const Json::Value& jTypes = Types();
    std::string strSql;
    if (Save(jRecord, blCreate, strSql)) {
        return 0;
    }
    Host().Plain("blCreate=%d, jRecInOut=%s", {blCreate ? 1 : 0, jRecord});
    Host().Plain("jType=%s", {jTypes});
    TellSqlError(strSql);
    return -1;
}

int Model::RecCreate(const Json::Value& jIn, Json::Value& jOut) {
    Json::Value jRecord = jIn;
    if (Host().Fails(jIn.empty(), "jRecIn.empty()") ||
        Host().Fails(0 > Fill(jRecord, false), "0 > fillDefaultValue(jParam, false)") ||
        Host().Fails(0 > Check(jRecord), "0 > checkJsonType(jParam)") ||
        Host().Fails(0 > RecSave(jRecord, true), "0 > recSave(jParam, true)")) {
        Host().Plain("call create rec, rec=%s", {jRecord});
        NoteDuplicate();
        return -1;
    }
    jOut = jRecord;
    return 0;
}

// ---- list, get one ------------------------------------------------------------------------------

bool Model::Select(const Json::Value& jQuery, Json::Value& jOut, std::string& strSql) {
    std::string strWhere;
    std::string strTail;
    std::string strHead = "SELECT ";
    if (Host().Fails(
            !IsObjectOrNull(jQuery),
            "jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue") ||
        Host().Fails(
            !jOut.isNull() && !jOut.isArray(),
            "jRecArrayOut.type() != Json::nullValue && jRecArrayOut.type() != Json::arrayValue") ||
        Host().Fails(0 > Conditions(jQuery, strWhere, 1),
                     "0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)") ||
        Host().Fails(0 > Tail(jQuery, strTail),
                     "0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit)") ||
        Host().Fails(0 > Names(strHead, nullptr), "0 > SqlExpandMemberName(strSqlPrefix)")) {
        return false;
    }
    strSql = strHead + " FROM " + m_strName + " ";
    strSql += strWhere.empty() ? "" : " WHERE " + strWhere;
    strSql += strTail + ";";
    return !Host().Fails(0 > RunSql(strSql, ModelRow, &jOut),
                         "0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)");
}

int Model::RecList(const Json::Value& jQuery, Json::Value& jOut) {
    std::string strSql;
    if (Select(jQuery, jOut, strSql)) {
        return 0;
    }
    Host().Plain("jRecParam=%s", {jQuery});
    TellSqlError(strSql);
    return -1;
}

int Model::RecGetOne(const Json::Value& jQuery, Json::Value& jOut) {
    Json::Value jRows(Json::arrayValue);
    if (Host().Fails(0 > RecList(jQuery, jRows), "0 > recList(jRecParam, jRecArray)")) {
        return -1;
    }
    if (jRows.empty()) {
        return 0;
    }
    return Host().Fails(0 > ModelCopyMember(jOut, jRows[0], true),
                        "0 > jsonCopyMember(jRecOut, jRecArray[0], true)")
               ? -1
               : 1;
}

// ---- update -------------------------------------------------------------------------------------

bool Model::UpdateByWhere(const Json::Value& jNew, const std::string& strWhere,
                          std::string& strSql) {
    if (Host().Fails(strWhere.empty(), "strSqlWhere.empty()") ||
        Host().Fails(jNew.empty(), "jRecIn.empty()")) {
        return false;
    }
    strSql = "UPDATE " + m_strName + " SET ";
    Json::Value jColumns = jNew;
    if (jColumns.isObject()) {
        jColumns.removeMember("vornSqlWhereFilter");
    }
    std::string strSet;
    if (Host().Fails(0 > Conditions(jColumns, strSet, 2),
                     "0 > SqlExpandMemberList(jColumnList, strSql2, VORN_SQL_WHERE_TYPE_COMMA)")) {
        return false;
    }
    strSql += strSet + " WHERE " + strWhere + ";";
    return !Host().Fails(0 > RunSql(strSql), "0 > runSqlEx(strSql, NULL, NULL)");
}

int Model::RecUpdateByWhere(const Json::Value& jNew, const std::string& strWhere) {
    std::string strSql;
    if (UpdateByWhere(jNew, strWhere, strSql)) {
        return 0;
    }
    Host().Plain("jRecIn=%s", {jNew});
    TellSqlError(strSql);
    return -1;
}

bool Model::UpdateByFilter(const Json::Value& jQuery, const Json::Value& jNew) {
    std::string strWhere;
    return !Host().Fails(jQuery.empty(), "jFilterIn.empty()") &&
           !Host().Fails(jQuery.type() != Json::objectValue,
                         "jFilterIn.type() != Json::objectValue") &&
           !Host().Fails(jNew.type() != Json::objectValue,
                         "jParamIn.type() != Json::objectValue") &&
           !Host().Fails(0 > Conditions(jQuery, strWhere, 1),
                         "0 > SqlExpandMemberList(jFilterIn, strSql, VORN_SQL_WHERE_TYPE_AND)") &&
           !Host().Fails(strWhere.empty(), "strSql.empty()") &&
           !Host().Fails(0 > Check(jNew), "0 > checkJsonType(jParamIn)") &&
           !Host().Fails(0 > RecUpdateByWhere(jNew, strWhere),
                         "0 > recUpdateByWhere(jParamIn, strSql)");
}

int Model::RecUpdateByFilter(const Json::Value& jQuery, const Json::Value& jNew) {
    if (UpdateByFilter(jQuery, jNew)) {
        return 0;
    }
    Host().Plain("recUpdateByFilter failed, jParamIn=%s", {jNew});
    NoteDuplicate();
    return -1;
}

// ---- delete -------------------------------------------------------------------------------------

int Model::Delete(const Json::Value& jQuery, bool blAllowAll, std::string& strSql) {
    std::string strWhere;
    if (Host().Fails(jQuery.type() != Json::objectValue, "jRecParam.type() != Json::objectValue") ||
        Host().Fails(0 > Conditions(jQuery, strWhere, 1),
                     "0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)") ||
        Host().Fails(strWhere.empty() && !blAllowAll, "strSql.empty()")) {
        return -1;
    }
    strSql = "DELETE FROM " + m_strName + " ";
    strSql += strWhere.empty() ? ";" : " WHERE " + strWhere + ";";
    const int nDeleted = RunSql(strSql);
    if (Host().Fails(0 > nDeleted, "0 > (err = runSqlEx(strSqlRun))")) {
        return -1;
    }
    Host().Debug("delete rec number=%d", {nDeleted});
    return nDeleted;
}

int Model::RecDelete(const Json::Value& jQuery, bool blAllowAll) {
    std::string strSql;
    const int nDeleted = Delete(jQuery, blAllowAll, strSql);
    TellSqlError(strSql);
    return nDeleted;
}

int Model::ToList(const std::vector<std::string>& vecValues, const char* szKey,
                  Json::Value& jOut) const {
    if (Host().Fails(
            !IsObjectOrNull(jOut),
            "jParamOut.type() != Json::objectValue && jParamOut.type() != Json::nullValue") ||
        Host().Fails(szKey == nullptr || szKey[0] == '\0', "!szKey || !szKey[0]")) {
        return -1;
    }
    Json::Value jList(Json::arrayValue);
    for (const std::string& strValue : vecValues) {
        jList.append(strValue);
    }
    jOut[szKey] = jList;
    return 0;
}

int Model::DeleteByArray(const std::vector<std::string>& vecValues, const char* szKey) {
    const Json::Value& jTypes = Types();
    Json::Value jQuery(Json::objectValue);
    if (Host().Fails(vecValues.empty(), "0 >= strVector.size()") ||
        Host().Fails(szKey == nullptr || szKey[0] == '\0', "!szKey || !szKey[0]") ||
        Host().Fails(!Has(jTypes, szKey), "!jType.isMember(szKey)") ||
        Host().Fails(jTypes[szKey]["cpptype"].asString() != "string",
                     R"(jType[szKey]["cpptype"].asString() != "string")") ||
        Host().Fails(0 > ToList(vecValues, szKey, jQuery),
                     "0 > VectorParamToJson(strVector, szKey, jParam)")) {
        return -1;
    }
    const int nDeleted = RecDelete(jQuery, false);
    return Host().Fails(0 > nDeleted, "0 > (err = recDelete(jParam))") ? -1 : nDeleted;
}

int Model::RecDeleteByArray(const std::vector<std::string>& vecValues, const char* szKey) {
    const int nDeleted = DeleteByArray(vecValues, szKey);
    if (nDeleted < 0) {
        std::string strValues;
        for (const std::string& strValue : vecValues) {
            strValues += (&strValue == vecValues.data() ? "" : ",") + strValue;
        }
        Host().Plain("recDeleteByArray failed, name=%s, strVector=%s", {szKey, strValues});
    }
    return nDeleted;
}

int Model::DeleteByName(const std::string& strValue, const char* szKey) {
    const Json::Value& jTypes = Types();
    if (Host().Fails(strValue.empty(), "strValue.empty()") ||
        Host().Fails(szKey == nullptr || szKey[0] == '\0', "!szKey || !szKey[0]") ||
        Host().Fails(!Has(jTypes, szKey), "!jType.isMember(szKey)")) {
        return -1;
    }
    const int nDeleted = RecDeleteByArray({strValue}, szKey);
    return Host().Fails(0 > nDeleted, "0 > (err = recDeleteByArray(strVector, szKey))") ? -1
                                                                                        : nDeleted;
}

int Model::RecDeleteByName(const std::string& strValue, const char* szKey) {
    const int nDeleted = DeleteByName(strValue, szKey);
    if (nDeleted < 0) {
        Host().Plain("recDeleteByName failed, name=%s, strValue=%s", {szKey, strValue});
    }
    return nDeleted;
}

}  // namespace campaign
