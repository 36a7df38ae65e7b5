// The model's statements and record operations, and its time texts.

#include <cstdio>
#include <cstdlib>
#include <memory>

#include "Model.h"

namespace campaign {

Model::Model(sqlite3* pDb, std::string strName, Json::Value jDefinition, std::string strCreate)
    : m_pDb(pDb),
      m_strName(std::move(strName)),
      m_jDefinition(std::move(jDefinition)),
      m_strCreate(std::move(strCreate)) {
    TableCreate();
}

// ---- statements ---------------------------------------------------------------------------------

bool Model::ReadRow(sqlite3_stmt* pStatement, Json::Value& jRows) const {
    const Json::Value jNoDefinition;
    const Json::Value& jTypes = ModelTypes(jNoDefinition, m_strName);
    Json::Value jRecord(Json::objectValue);
    for (int i = 0; i < sqlite3_column_count(pStatement); ++i) {
        const std::string strName = sqlite3_column_name(pStatement, i);
        if (!jTypes.isObject() || !jTypes.isMember(strName)) {
            return false;
        }
        const std::string strType = jTypes[strName]["cpptype"].asString();
        const char* szText = reinterpret_cast<const char*>(sqlite3_column_text(pStatement, i));
        if (szText == nullptr) {
            continue;
        }
        const std::string strText = szText;
        if (strType == "string") {
            jRecord[strName] = strText;
        } else if (strType == "int" || strType == "unsigned int") {
            jRecord[strName] = static_cast<Json::Int>(std::strtol(szText, nullptr, 10));
        } else if (strType == "long long" || strType == "unsigned long long") {
            jRecord[strName] = static_cast<Json::Int64>(std::strtoll(szText, nullptr, 10));
        } else if (strType == "bool") {
            jRecord[strName] = std::strtol(szText, nullptr, 10) == 1;
        } else if (strType.compare(0, 6, "Json::") == 0 &&
                   (strType == "Json::Value" || strType == "Json::objectValue" ||
                    strType == "Json::arrayValue")) {
            const std::unique_ptr<Json::CharReader> pReader(
                Json::CharReaderBuilder().newCharReader());
            pReader->parse(szText, szText + strText.size(), &jRecord[strName], nullptr);
        } else {
            return false;
        }
    }
    jRows.append(jRecord);
    return true;
}

bool Model::RunOne(sqlite3_stmt* pStatement, Json::Value* pjRows) {
    int nStatus = SQLITE_ROW;
    bool blRead = true;
    while (nStatus == SQLITE_ROW) {
        nStatus = sqlite3_step(pStatement);
        if (nStatus == SQLITE_ROW && pjRows != nullptr && !ReadRow(pStatement, *pjRows)) {
            blRead = false;
            break;
        }
    }
    sqlite3_finalize(pStatement);
    if (!blRead) {
        m_strSqlError = "query aborted";
        return false;
    }
    m_strSqlError = nStatus == SQLITE_DONE ? "" : sqlite3_errmsg(m_pDb);
    return nStatus == SQLITE_DONE;
}

int Model::RunSql(const std::string& strSql, Json::Value* pjRows) {
    if (strSql.empty()) {
        m_strSqlError = "Unknow Error!!";
        return -1;
    }
    m_strSqlError.clear();
    const char* szRest = strSql.c_str();
    while (*szRest != '\0') {
        sqlite3_stmt* pStatement = nullptr;
        if (sqlite3_prepare_v2(m_pDb, szRest, -1, &pStatement, &szRest) != SQLITE_OK) {
            m_strSqlError = sqlite3_errmsg(m_pDb);
            return -1;
        }
        if (pStatement != nullptr && !RunOne(pStatement, pjRows)) {
            return -1;
        }
    }
    return pjRows == nullptr ? sqlite3_changes(m_pDb) : 0;
}

int Model::Refused() {
    if (m_strSqlError.find("UNIQUE constraint failed") != std::string::npos) {
        strErrMsg = "DUPLICATE_PRIMARY_KEY";
    }
    return -1;
}

// ---- records ------------------------------------------------------------------------------------

int Model::RecSave(Json::Value& jRecord, bool blCreate) {
    Types();
    std::string strSql = (blCreate ? "INSERT INTO " : "REPLACE INTO ") + m_strName + " (";
    Names(strSql, &jRecord);
    strSql += ") VALUES (";
    if (0 > Values(strSql, jRecord)) {
        return -1;
    }
    strSql += ";select * from " + m_strName + " where rowid == last_insert_rowid();";
    Json::Value jRows(Json::arrayValue);
    if (0 > RunSql(strSql, &jRows) || jRows.empty()) {
        return -1;
    }
    const Json::Value jStored = jRows[0];
    jRecord = jStored;
    return 0;
}

int Model::RecCreate(const Json::Value& jIn, Json::Value& jOut) {
    Json::Value jRecord = jIn;
    if (jIn.empty() || 0 > Fill(jRecord, false) || 0 > Check(jRecord) ||
        0 > RecSave(jRecord, true)) {
        return Refused();
    }
    jOut = jRecord;
    return 0;
}

int Model::RecList(const Json::Value& jQuery, Json::Value& jOut) {
    std::string strWhere;
    std::string strTail;
    if ((!jQuery.isObject() && !jQuery.isNull()) || (!jOut.isNull() && !jOut.isArray()) ||
        0 > Conditions(jQuery, strWhere, 1) || 0 > Tail(jQuery, strTail)) {
        return -1;
    }
    std::string strSql = "SELECT ";
    Names(strSql, nullptr);
    strSql += " FROM " + m_strName + " " + (strWhere.empty() ? "" : " WHERE " + strWhere);
    return RunSql(strSql + strTail + ";", &jOut) < 0 ? -1 : 0;
}

int Model::RecGetOne(const Json::Value& jQuery, Json::Value& jOut) {
    Json::Value jRows(Json::arrayValue);
    if (0 > RecList(jQuery, jRows)) {
        return -1;
    }
    if (jRows.empty()) {
        return 0;
    }
    return ModelCopyMember(jOut, jRows[0], true) < 0 ? -1 : 1;
}

int Model::RecUpdateByWhere(const Json::Value& jNew, const std::string& strWhere) {
    if (strWhere.empty() || jNew.empty()) {
        return -1;
    }
    Json::Value jColumns = jNew;
    if (jColumns.isObject()) {
        jColumns.removeMember("vornSqlWhereFilter");
    }
    std::string strSet;
    if (0 > Conditions(jColumns, strSet, 2)) {
        return -1;
    }
    const std::string strSql =
        "UPDATE " + m_strName + " SET " + strSet + " WHERE " + strWhere + ";";
    return RunSql(strSql, nullptr) < 0 ? -1 : 0;
}

int Model::RecUpdateByFilter(const Json::Value& jQuery, const Json::Value& jNew) {
    std::string strWhere;
    if (jQuery.empty() || !jQuery.isObject() || !jNew.isObject() ||
        0 > Conditions(jQuery, strWhere, 1) || strWhere.empty() || 0 > Check(jNew) ||
        0 > RecUpdateByWhere(jNew, strWhere)) {
        return Refused();
    }
    return 0;
}

int Model::RecDelete(const Json::Value& jQuery, bool blAllowAll) {
    std::string strWhere;
    if (!jQuery.isObject() || 0 > Conditions(jQuery, strWhere, 1) ||
        (strWhere.empty() && !blAllowAll)) {
        return -1;
    }
    const std::string strSql =
        "DELETE FROM " + m_strName + " " + (strWhere.empty() ? "" : " WHERE " + strWhere) + ";";
    return RunSql(strSql, nullptr);
}

int Model::ToList(const std::vector<std::string>& vecValues, const char* szKey, Json::Value& jOut) {
    if ((!jOut.isObject() && !jOut.isNull()) || szKey == nullptr || szKey[0] == '\0') {
        return -1;
    }
    jOut[szKey] = Json::Value(Json::arrayValue);
    for (const std::string& strValue : vecValues) {
        jOut[szKey].append(strValue);
    }
    return 0;
}

int Model::RecDeleteByArray(const std::vector<std::string>& vecValues, const char* szKey) {
    const Json::Value& jTypes = Types();
    if (vecValues.empty() || szKey == nullptr || szKey[0] == '\0' || !jTypes.isObject() ||
        !jTypes.isMember(szKey) || jTypes[szKey]["cpptype"].asString() != "string") {
        return -1;
    }
    Json::Value jQuery;
    ToList(vecValues, szKey, jQuery);
    return RecDelete(jQuery, false);
}

int Model::RecDeleteByName(const std::string& strValue, const char* szKey) {
    Types();
    return strValue.empty() ? -1 : RecDeleteByArray({strValue}, szKey);
}

// ---- time texts ---------------------------------------------------------------------------------

int ModelTimeText(long nStamp, std::string& strOut, int nType) {
    if ((nType & 6) == 0) {
        return -1;
    }
    const long long nLocal = static_cast<long long>(nStamp) + ((nType & 1) != 0 ? 0 : 3600);
    long long nDay = nLocal / 86400;
    const int nSecond = static_cast<int>(nLocal % 86400);
    const int nWeekDay = static_cast<int>((nDay + 4) % 7);
    int nYear = 1970;
    const auto IsLeap = [](int n) { return (n % 4 == 0 && n % 100 != 0) || n % 400 == 0; };
    while (nDay >= (IsLeap(nYear) ? 366 : 365)) {
        nDay -= IsLeap(nYear++) ? 366 : 365;
    }
    const int anDays[] = {31, IsLeap(nYear) ? 29 : 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    int nMonth = 0;
    while (nDay >= anDays[nMonth]) {
        nDay -= anDays[nMonth++];
    }
    char szClock[32];
    char szOut[96];
    std::snprintf(szClock, sizeof(szClock), "%02d:%02d:%02d", nSecond / 3600, nSecond / 60 % 60,
                  nSecond % 60);
    if ((nType & 2) != 0) {
        const std::string strDays = "SunMonTueWedThuFriSat";
        const std::string strMonths = "JanFebMarAprMayJunJulAugSepOctNovDec";
        std::snprintf(szOut, sizeof(szOut), "%s, %02d %s %d %s GMT",
                      strDays.substr(static_cast<std::size_t>(nWeekDay) * 3, 3).c_str(),
                      static_cast<int>(nDay) + 1,
                      strMonths.substr(static_cast<std::size_t>(nMonth) * 3, 3).c_str(), nYear,
                      szClock);
    } else {
        std::snprintf(szOut, sizeof(szOut), "%d-%02d-%02d %s", nYear, nMonth + 1,
                      static_cast<int>(nDay) + 1, szClock);
    }
    strOut = szOut;
    return 0;
}

}  // namespace campaign
