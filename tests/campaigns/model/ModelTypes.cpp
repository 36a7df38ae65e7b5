// The model's table definitions, record check, defaults, and functions on JSON values alone.

#include <map>

#include "Model.h"

namespace campaign {

// ---- JSON ---------------------------------------------------------------------------------------

bool Has(const Json::Value& jValue, const std::string& strName) {
    return jValue.isObject() && jValue.isMember(strName);
}

bool IsObjectOrNull(const Json::Value& jValue) {
    return jValue.type() == Json::objectValue || jValue.type() == Json::nullValue;
}

int ModelCopyMember(Json::Value& jIn, const Json::Value& jSubSet, bool blOverwrite) {
    if (Host().UtilFails(!IsObjectOrNull(jIn),
                         "jIn.type() != Json::nullValue && jIn.type() != Json::objectValue") ||
        Host().UtilFails(jSubSet.type() != Json::objectValue,
                         "jSubSet.type() != Json::objectValue")) {
        return -1;
    }
    // The source may lie inside the destination.
    const Json::Value jSource = jSubSet;
    for (const std::string& strName : jSource.getMemberNames()) {
        if (blOverwrite || !Has(jIn, strName)) {
            jIn[strName] = jSource[strName];
        }
    }
    return 0;
}

// ---- the types of a table -----------------------------------------------------------------------

namespace {

bool CopyTypes(Json::Value& jCache, const Json::Value& jMembers, const std::string& strName) {
    for (const std::string& strKey : jMembers.getMemberNames()) {
        const Json::Value& jMember = jMembers[strKey];
        if (Host().UtilFails(!Has(jMember, "cpptype"),
                             R"(!jTableDef[strJsonName]["member"][strKey].isMember("cpptype"))") ||
            Host().UtilFails(
                !jMember["cpptype"].isString(),
                R"(!jTableDef[strJsonName]["member"][strKey]["cpptype"].isString())")) {
            return false;
        }
        Json::Value& jEntry = jCache[strName][strKey] = Json::Value(Json::objectValue);
        jEntry["cpptype"] = jMember["cpptype"];
        if (Has(jMember, "cppDefaultValue")) {
            jEntry["cppDefaultValue"] = jMember["cppDefaultValue"];
        }
    }
    return !Host().UtilFails(!Has(jCache, strName),
                             "jType == Json::nullValue || !jType.isMember(strJsonName)");
}

bool Learn(Json::Value& jCache, const Json::Value& jDefinition, const std::string& strName) {
    if (Host().UtilFails(jDefinition.empty(), "jTableDef.empty()") ||
        Host().UtilFails(!Has(jDefinition, strName), "!jTableDef.isMember(strJsonName)")) {
        return false;
    }
    const Json::Value& jTable = jDefinition[strName];
    if (Host().UtilFails(!jTable.isObject(), "!jTableDef[strJsonName].isObject()") ||
        Host().UtilFails(!Has(jTable, "member"), R"(!jTableDef[strJsonName].isMember("member"))") ||
        Host().UtilFails(!jTable["member"].isObject(),
                         R"(!jTableDef[strJsonName]["member"].isObject())") ||
        Host().UtilFails(strName.empty(), "strJsonName.empty()")) {
        return false;
    }
    return CopyTypes(jCache, jTable["member"], strName);
}

}  // namespace

const Json::Value& ModelTypes(const Json::Value& jDefinition, const std::string& strName) {
    static Json::Value s_jCache;
    const bool blFound = Has(s_jCache, strName)
                             ? !Host().UtilFails(!s_jCache[strName].isObject(),
                                                 "jType[strJsonName].type() != Json::objectValue")
                             : Learn(s_jCache, jDefinition, strName);
    if (!blFound) {
        Host().UtilPlain("strJsonName=%s", {strName});
        Host().UtilPlain("jTableDef=%s", {jDefinition});
        Host().UtilPlain("jType=%s", {s_jCache});
    }
    return s_jCache[strName];
}

std::vector<std::string> Model::Declared() const {
    if (!Has(m_jDefinition, m_strName) || !Has(m_jDefinition[m_strName], "member") ||
        !m_jDefinition[m_strName]["member"].isObject()) {
        return {};
    }
    return m_jDefinition[m_strName]["member"].getMemberNames();
}

// ---- records ------------------------------------------------------------------------------------

int Model::Check(const Json::Value& jRecord) const {
    using Test = bool (Json::Value::*)() const;
    static const std::map<std::string, Test> s_tests = {
        {"int", &Json::Value::isIntegral},
        {"long long", &Json::Value::isIntegral},
        {"uid_t", &Json::Value::isIntegral},
        {"time_t", &Json::Value::isIntegral},
        {"bool", &Json::Value::isBool},
        {"string", &Json::Value::isString},
        {"Json::arrayValue", &Json::Value::isArray},
        {"Json::objectValue", &Json::Value::isObject}};
    const Json::Value& jTypes = Types();
    if (Host().Fails(!jRecord.isObject(), "!jRecParam.isObject()")) {
        return -1;
    }
    for (const std::string& strKey : jRecord.getMemberNames()) {
        if (!Has(jTypes, strKey)) {
            continue;
        }
        const auto test = s_tests.find(jTypes[strKey]["cpptype"].asString());
        if (test == s_tests.end()) {
            Host().Located("type not found!!, key=%s", {strKey});
            return -1;
        }
        if (!(jRecord[strKey].*test->second)()) {
            Host().Located("type failed, strKey=%s, jRecParam=%s", {strKey, jRecord});
            return -1;
        }
    }
    return 0;
}

int Model::Fill(Json::Value& jRecord, bool blStrict) const {
    const Json::Value& jTypes = Types();
    if (!jTypes.isObject()) {
        return 0;
    }
    for (const std::string& strKey : jTypes.getMemberNames()) {
        if (Has(jRecord, strKey)) {
            continue;
        }
        if (blStrict) {
            Host().Located("lost data member=%s", {strKey});
            Host().Debug("jParam=%s", {jRecord});
            return -1;
        }
        if (Has(jTypes[strKey], "cppDefaultValue") && IsObjectOrNull(jRecord)) {
            jRecord[strKey] = jTypes[strKey]["cppDefaultValue"];
        }
    }
    return 0;
}

}  // namespace campaign
