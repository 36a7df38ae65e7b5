// The model's SQL texts: names, values, conditions, the tail of a SELECT.

#include <map>
#include <set>

#include "Model.h"

namespace campaign {

namespace {

// Takes ownership of a text of SQLite's.
std::string Taken(char* szText) {
    std::string strText = szText;
    sqlite3_free(szText);
    return strText;
}

std::string Escaped(const std::string& strText) {
    return Taken(sqlite3_mprintf("%q", strText.c_str()));
}

bool IsJsonType(const std::string& strType) {
    static const std::set<std::string> s_types = {"Json::Value", "Json::objectValue",
                                                  "Json::arrayValue"};
    return s_types.count(strType) > 0;
}

}  // namespace

// ---- value lists --------------------------------------------------------------------------------

int Model::Names(std::string& strSql, const Json::Value* pjRecord) const {
    const std::vector<std::string> vecNames = Declared();
    for (std::size_t i = 0; i < vecNames.size(); ++i) {
        if (pjRecord == nullptr || Has(*pjRecord, vecNames[i])) {
            strSql += vecNames[i] + (i + 1 < vecNames.size() ? "," : "");
        }
    }
    return 0;
}

namespace {

// The next value is formatted as strType asks. Throws what JsonCpp throws.
std::string Formatted(const std::string& strFormat, const std::string& strType,
                      const Json::Value& jValue) {
    static const std::set<std::string> s_signed = {"long long", "int", "long", "bool"};
    const char* szFormat = strFormat.c_str();
    if (strType == "string") {
        return Taken(sqlite3_mprintf(szFormat, jValue.asString().c_str()));
    }
    if (s_signed.count(strType) > 0) {
        return Taken(sqlite3_mprintf(szFormat, static_cast<sqlite3_int64>(jValue.asInt64())));
    }
    if (strType.compare(0, 8, "unsigned") == 0) {
        return Taken(sqlite3_mprintf(szFormat, static_cast<sqlite3_uint64>(jValue.asUInt64())));
    }
    if (strType == "float") {
        return Taken(sqlite3_mprintf(szFormat, static_cast<double>(jValue.asFloat())));
    }
    if (strType == "double") {
        return Taken(sqlite3_mprintf(szFormat, jValue.asDouble()));
    }
    return Taken(sqlite3_mprintf(szFormat, Compact(jValue).c_str()));
}

// Whether formatting the text so far, which a specifier follows, has a defined result: each percent
// sign is followed by another. A NUL byte ends the format.
bool IsDefined(const std::string& strText, const std::string& strSpecifier) {
    const std::string strFormat = (strText + strSpecifier).c_str();
    for (std::size_t i = 0; i < strText.size() && i < strFormat.size(); ++i) {
        if (strFormat[i] != '%') {
            continue;
        }
        if (strFormat[i + 1] != '%') {
            return false;
        }
        ++i;
    }
    return true;
}

}  // namespace

int Model::Values(std::string& strSql, const Json::Value& jRecord) const {
    static const std::map<std::string, std::string> s_specifiers = {
        {"string", "%Q"},          {"long long", "%lld"},     {"int", "%lld"},
        {"long", "%lld"},          {"bool", "%lld"},          {"unsigned long long", "%llu"},
        {"unsigned int", "%llu"},  {"unsigned long", "%llu"}, {"unsigned", "%llu"},
        {"float", "%f"},           {"double", "%lf"},         {"Json::objectValue", "%Q"},
        {"Json::arrayValue", "%Q"}};
    const Json::Value& jTypes = Types();
    const std::vector<std::string> vecNames = Declared();
    std::string strText = strSql;
    for (std::size_t i = 0; i < vecNames.size(); ++i) {
        const std::string& strKey = vecNames[i];
        if (Host().Fails(!Has(jTypes, strKey), "!jType.isMember(strKey)")) {
            return -1;
        }
        if (!Has(jRecord, strKey)) {
            continue;
        }
        const std::string strType = jTypes[strKey]["cpptype"].asString();
        const auto specifier = s_specifiers.find(strType);
        if (specifier == s_specifiers.end()) {
            Host().Located("cannot support this type=%s", {strType});
            return -1;
        }
        if (!IsDefined(strText, specifier->second)) {
            Host().FailsInOwnWords();
            return -1;
        }
        try {
            strText = Formatted(strText + specifier->second, strType, jRecord[strKey]);
        } catch (const Json::Exception&) {
            Host().Located("type failed, strKey=%s, jRecParam=%s", {strKey, jRecord});
            return -1;
        }
        strText += i + 1 < vecNames.size() ? "," : ") ";
    }
    strSql = strText;
    return 0;
}

// ---- conditions ---------------------------------------------------------------------------------

int Model::Match(const std::string& strField, const Json::Value& jValue,
                 std::string& strOut) const {
    const Json::Value& jTypes = Types();
    if (Host().Fails(!Has(jTypes, strField), "!jType.isMember(strField)")) {
        return -1;
    }
    const std::string strType = jTypes[strField]["cpptype"].asString();
    std::string strValue;
    try {
        if (strType == "string") {
            strValue = "'" + Escaped(jValue.asString()) + "'";
        } else if (IsJsonType(strType)) {
            strValue = "'" + Escaped(Compact(jValue)) + "'";
        } else if (strType == "bool") {
            strValue = std::to_string(jValue.asInt());
        } else {
            strValue = Escaped(jValue.asString());
        }
    } catch (const Json::Exception&) {
        Host().Fails(true, strType == "bool"
                               ? R"(NULL == (szSql = sqlite3_mprintf("%d", jParam.asInt())))"
                               : "NULL == (szSql = sqlite3_mprintf(\"%q\", "
                                 "jParam.asString().c_str()))");
        return -1;
    }
    strOut += std::string(strField).append("=").append(strValue);
    return 0;
}

int Model::List(const char* szField, const Json::Value& jList, std::string& strOut) const {
    const Json::Value& jTypes = Types();
    if (Host().Fails(szField == nullptr || szField[0] == '\0', "!szField || !szField[0]") ||
        Host().Fails(!Has(jTypes, szField), "!jType.isMember(szField)")) {
        return -1;
    }
    const std::string strType = jTypes[szField]["cpptype"].asString();
    if (Host().Fails(jList.type() != Json::arrayValue, "jList.type() != Json::arrayValue")) {
        return -1;
    }
    std::string strList;
    for (Json::ArrayIndex i = 0; i < jList.size(); ++i) {
        const Json::Value& jElement = jList[i];  // null where the array has a hole
        strList += i == 0 ? std::string(szField) + " in (" : "";
        try {
            if (strType == "string") {
                strList += "'" + Escaped(jElement.asString()) + "'";
            } else if (IsJsonType(strType)) {
                strList += "'" + Escaped(Compact(jElement)) + "'";
            } else {
                strList += Escaped(jElement.asString());
            }
        } catch (const Json::Exception&) {
            Host().Fails(true,
                         "NULL == (szSql = sqlite3_mprintf(\"%q\", jList[i].asString().c_str()))");
            return -1;
        }
    }
    strOut += strList.empty() ? "" : strList + " )";
    return 0;
}

int Model::Conditions(const Json::Value& jQuery, std::string& strOut, int nMode) const {
    const Json::Value& jTypes = Types();
    if (Host().Fails(
            !IsObjectOrNull(jQuery),
            "jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue")) {
        return -1;
    }
    if (nMode < 0 || nMode > 2) {
        Host().Located("error andType=%d", {nMode});
        return -1;
    }
    const char* const aszJoiners[] = {" or ", " and ", " , "};
    bool blWritten = false;
    for (const std::string& strName : jQuery.getMemberNames()) {
        const bool blFilter = strName == "vornSqlWhereFilter";
        if (!blFilter && !Has(jTypes, strName)) {
            continue;
        }
        const Json::Value& jValue = jQuery[strName];
        strOut += blWritten ? aszJoiners[nMode] : (nMode < 2 ? " (" : "");
        blWritten = true;
        if (blFilter) {
            if (Host().Fails(!jValue.isString(), "!jRecParam[jmFieldName[i]].isString()")) {
                return -1;
            }
            strOut += " " + jValue.asString() + " ";
        } else if (jValue.isArray()) {
            if (Host().Fails(
                    0 > List(strName.c_str(), jValue, strOut),
                    "0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)")) {
                return -1;
            }
        } else if (Host().Fails(0 > Match(strName, jValue, strOut),
                                "0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)")) {
            return -1;
        }
    }
    strOut += blWritten && nMode < 2 ? " )" : "";
    return blWritten ? 0 : 1;
}

// ---- the tail of a SELECT -----------------------------------------------------------------------

int Model::Tail(const Json::Value& jQuery, std::string& strOut) const {
    if (Host().Fails(!IsObjectOrNull(jQuery),
                     "jFilter.type() != Json::objectValue && jFilter.type() != Json::nullValue")) {
        return -1;
    }
    if (Has(jQuery, "sort_by")) {
        if (Host().Fails(!jQuery["sort_by"].isString(), "!szSql")) {
            return -1;
        }
        strOut += " order by '" + Escaped(jQuery["sort_by"].asString()) + "'";
        if (Has(jQuery, "sort_direction")) {
            strOut += jQuery["sort_direction"] == Json::Value("desc") ? " DESC" : " ASC";
        }
    }
    if (Has(jQuery, "limit")) {
        strOut += " LIMIT " + Compact(jQuery["limit"]);
        strOut += Has(jQuery, "offset") ? " OFFSET " + Compact(jQuery["offset"]) : "";
    }
    return 0;
}

}  // namespace campaign
