// The model's texts: types, checks, conditions, value lists.

#include <cstdio>
#include <map>

#include "Model.h"

namespace campaign {

namespace {

bool Has(const Json::Value& jValue, const std::string& strName) {
    return jValue.isObject() && jValue.isMember(strName);
}

bool IsOneOf(const std::string& strText, const std::vector<std::string>& vecTexts) {
    for (const std::string& strOne : vecTexts) {
        if (strOne == strText) {
            return true;
        }
    }
    return false;
}

// Takes ownership of a text of SQLite's.
std::string Taken(char* szText) {
    std::string strText = szText;
    sqlite3_free(szText);
    return strText;
}

std::string Escaped(const std::string& strText) {
    return Taken(sqlite3_mprintf("%q", strText.c_str()));
}

const std::vector<std::string> kJsonTypes = {"Json::Value", "Json::objectValue",
                                             "Json::arrayValue"};

}  // namespace

// ---- types --------------------------------------------------------------------------------------

Json::Value& ModelTypes(const Json::Value& jDefinition, const std::string& strName) {
    static std::map<std::string, Json::Value> s_types;
    if (s_types.count(strName) > 0) {
        return s_types[strName];
    }
    Json::Value& jEntry = s_types[strName];
    if (!Has(jDefinition, strName) || !Has(jDefinition[strName], "member") ||
        !jDefinition[strName]["member"].isObject() || strName.empty()) {
        return jEntry;
    }
    const Json::Value& jMembers = jDefinition[strName]["member"];
    for (const std::string& strMember : jMembers.getMemberNames()) {
        if (!Has(jMembers[strMember], "cpptype") || !jMembers[strMember]["cpptype"].isString()) {
            break;
        }
        jEntry[strMember]["cpptype"] = jMembers[strMember]["cpptype"];
        if (Has(jMembers[strMember], "cppDefaultValue")) {
            jEntry[strMember]["cppDefaultValue"] = jMembers[strMember]["cppDefaultValue"];
        }
    }
    return jEntry;
}

int ModelCopyMember(Json::Value& jIn, const Json::Value& jSubSet, bool blOverwrite) {
    if ((!jIn.isNull() && !jIn.isObject()) || !jSubSet.isObject()) {
        return -1;
    }
    for (const std::string& strName : jSubSet.getMemberNames()) {
        if (blOverwrite || !Has(jIn, strName)) {
            jIn[strName] = jSubSet[strName];
        }
    }
    return 0;
}

// ---- JSON text ----------------------------------------------------------------------------------

namespace {

std::string QuotedText(const std::string& strText) {
    std::string strOut = "\"";
    for (const char c : strText) {
        static const std::map<char, std::string> s_named = {
            {'"', "\\\""}, {'\\', "\\\\"}, {'\b', "\\b"}, {'\f', "\\f"},
            {'\n', "\\n"}, {'\r', "\\r"},  {'\t', "\\t"}};
        const auto named = s_named.find(c);
        if (named != s_named.end()) {
            strOut += named->second;
        } else if (static_cast<unsigned char>(c) < 0x20) {
            char szCode[8];
            std::snprintf(szCode, sizeof(szCode), "\\u%04x", static_cast<unsigned>(c));
            strOut += szCode;
        } else {
            strOut += c;
        }
    }
    return strOut + "\"";
}

}  // namespace

std::string ModelText(const Json::Value& jValue) {
    std::string strOut;
    if (jValue.isString()) {
        return QuotedText(jValue.asString());
    }
    if (jValue.isArray()) {
        for (const Json::Value& jElement : jValue) {
            strOut += (strOut.empty() ? "" : ",") + ModelText(jElement);
        }
        return "[" + strOut + "]";
    }
    if (jValue.isObject()) {
        for (const std::string& strName : jValue.getMemberNames()) {
            strOut += (strOut.empty() ? "" : ",") + QuotedText(strName) + ":" +
                      ModelText(jValue[strName]);
        }
        return "{" + strOut + "}";
    }
    return jValue.isNull() ? "null" : jValue.asString();
}

// ---- records ------------------------------------------------------------------------------------

int Model::Check(const Json::Value& jParam) const {
    const Json::Value& jTypes = Types();
    if (!jParam.isObject()) {
        return -1;
    }
    for (const std::string& strName : jParam.getMemberNames()) {
        if (!Has(jTypes, strName)) {
            continue;
        }
        const std::string strType = jTypes[strName]["cpptype"].asString();
        const Json::Value& jValue = jParam[strName];
        const bool blFits =
            (IsOneOf(strType, {"int", "long long", "uid_t", "time_t"}) && jValue.isIntegral()) ||
            (strType == "bool" && jValue.isBool()) || (strType == "string" && jValue.isString()) ||
            (strType == "Json::arrayValue" && jValue.isArray()) ||
            (strType == "Json::objectValue" && jValue.isObject());
        if (!blFits) {
            return -1;
        }
    }
    return 0;
}

int Model::Fill(Json::Value& jParam, bool blStrict) const {
    const Json::Value& jTypes = Types();
    if (!jTypes.isObject()) {
        return 0;
    }
    for (const std::string& strName : jTypes.getMemberNames()) {
        if (Has(jParam, strName)) {
            continue;
        }
        if (blStrict) {
            return -1;
        }
        if (jTypes[strName].isMember("cppDefaultValue") && (jParam.isNull() || jParam.isObject())) {
            jParam[strName] = jTypes[strName]["cppDefaultValue"];
        }
    }
    return 0;
}

// ---- value lists --------------------------------------------------------------------------------

std::vector<std::string> Model::Declared() const {
    if (!Has(m_jDefinition, m_strName) || !Has(m_jDefinition[m_strName], "member") ||
        !m_jDefinition[m_strName]["member"].isObject()) {
        return {};
    }
    return m_jDefinition[m_strName]["member"].getMemberNames();
}

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

// Whether the text would be formatted as it is meant: every percent sign before the last conversion
// is doubled.
bool IsSafeFormat(const std::string& strFormat, std::size_t nSpecifier) {
    for (std::size_t i = 0; i < nSpecifier; ++i) {
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

// The whole text is the format of the next value, as documented. Throws what JsonCpp throws.
std::string Formatted(const std::string& strFormat, const std::string& strType,
                      const Json::Value& jValue) {
    const char* szFormat = strFormat.c_str();
    if (strType == "string") {
        return Taken(sqlite3_mprintf(szFormat, jValue.asString().c_str()));
    }
    if (IsOneOf(strType, {"long long", "int", "long", "bool"})) {
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
    return Taken(sqlite3_mprintf(szFormat, ModelText(jValue).c_str()));
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
        if (!Has(jTypes, vecNames[i])) {
            return -1;
        }
        if (!Has(jRecord, vecNames[i])) {
            continue;
        }
        const std::string strType = jTypes[vecNames[i]]["cpptype"].asString();
        const auto specifier = s_specifiers.find(strType);
        if (specifier == s_specifiers.end() ||
            !IsSafeFormat(strText + specifier->second, strText.size())) {
            return -1;
        }
        try {
            strText = Formatted(strText + specifier->second, strType, jRecord[vecNames[i]]);
        } catch (const Json::Exception&) {
            return -1;
        }
        strText += i + 1 < vecNames.size() ? "," : ") ";
    }
    strSql = strText;
    return 0;
}

// ---- conditions ---------------------------------------------------------------------------------

namespace {

// One value after "=" or in a list. Throws what JsonCpp throws.
std::string Rendered(const std::string& strType, const Json::Value& jValue, bool blInList) {
    if (strType == "string") {
        return "'" + Escaped(jValue.asString()) + "'";
    }
    if (IsOneOf(strType, kJsonTypes)) {
        return "'" + Escaped(ModelText(jValue)) + "'";
    }
    if (strType == "bool" && !blInList) {
        return std::to_string(jValue.asInt());
    }
    return Escaped(jValue.asString());
}

}  // namespace

int Model::Match(const std::string& strField, const Json::Value& jValue,
                 std::string& strOut) const {
    const Json::Value& jTypes = Types();
    if (!Has(jTypes, strField)) {
        return -1;
    }
    try {
        strOut += strField + "=" + Rendered(jTypes[strField]["cpptype"].asString(), jValue, false);
    } catch (const Json::Exception&) {
        return -1;
    }
    return 0;
}

int Model::List(const char* szField, const Json::Value& jList, std::string& strOut) const {
    const Json::Value& jTypes = Types();
    if (szField == nullptr || szField[0] == '\0' || !Has(jTypes, szField) || !jList.isArray()) {
        return -1;
    }
    std::string strElements;
    try {
        for (const Json::Value& jElement : jList) {
            strElements += Rendered(jTypes[szField]["cpptype"].asString(), jElement, true);
        }
    } catch (const Json::Exception&) {
        return -1;
    }
    if (!jList.empty()) {
        strOut += std::string(szField) + " in (" + strElements + " )";
    }
    return 0;
}

int Model::Conditions(const Json::Value& jQuery, std::string& strOut, int nMode) const {
    const Json::Value& jTypes = Types();
    if ((!jQuery.isObject() && !jQuery.isNull()) || nMode < 0 || nMode > 2) {
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
            if (!jValue.isString()) {
                return -1;
            }
            strOut += " " + jValue.asString() + " ";
        } else if (0 > (jValue.isArray() ? List(strName.c_str(), jValue, strOut)
                                         : Match(strName, jValue, strOut))) {
            return -1;
        }
    }
    strOut += blWritten && nMode < 2 ? " )" : "";
    return blWritten ? 0 : 1;
}

int Model::Tail(const Json::Value& jQuery, std::string& strOut) {
    if (!jQuery.isObject() && !jQuery.isNull()) {
        return -1;
    }
    if (jQuery.isMember("sort_by")) {
        if (!jQuery["sort_by"].isString()) {
            return -1;
        }
        strOut += " order by '" + Escaped(jQuery["sort_by"].asString()) + "'";
        if (jQuery.isMember("sort_direction")) {
            strOut += jQuery["sort_direction"] == Json::Value("desc") ? " DESC" : " ASC";
        }
    }
    if (jQuery.isMember("limit")) {
        strOut += " LIMIT " + ModelText(jQuery["limit"]);
        strOut += jQuery.isMember("offset") ? " OFFSET " + ModelText(jQuery["offset"]) : "";
    }
    return 0;
}

}  // namespace campaign
