#include "NewDefinition.h"

#include <utility>

#include "../../src/schema/MemberType.h"
#include "../JsonFile.h"

namespace VORN_JSON_DB::Cli {

namespace {

Json::Value& Find(Json::Value& jMembers, const char* szOption, const std::string& strName) {
    if (!jMembers.isMember(strName)) {
        Fail(kExitUsage,
             std::string(szOption) + ": there is no member \"" + strName + "\"" +
                 NearestHint(strName, jMembers.getMemberNames(), "; name one of the new table's"));
    }
    return jMembers[strName];
}

// Calls fnEach with the member and the value of each "member=value".
template <typename Each>
void ForPairs(const Context& Call, const char* szOption, Json::Value& jMembers,
              const Each& fnEach) {
    for (const std::string& strPair : Call.List(szOption)) {
        const std::size_t nEqual = strPair.find('=');
        if (nEqual == std::string::npos) {
            Fail(kExitUsage,
                 std::string(szOption) + ": \"" + strPair + "\" is not of the form member=value");
        }
        fnEach(Find(jMembers, szOption, strPair.substr(0, nEqual)), strPair.substr(nEqual + 1));
    }
}

void TakeType(Json::Value& jMember, const std::string& strType) {
    jMember["cpptype"] = strType;
    if (vornjsondb::TypeOfMember(jMember).Bound.eKind == vornjsondb::BoundKind::kNone) {
        Fail(kExitUsage, "--type: there is no type \"" + strType +
                             "\"; string, bool, int, long long, double, Json::Value and any are "
                             "some");
    }
}

// A text where the member is one; else JSON.
void TakeDefault(Json::Value& jMember, const std::string& strValue) {
    jMember["cppDefaultValue"] =
        jMember["cpptype"] == "string"
            ? Json::Value(strValue)
            : ParseJson(strValue, "--default \"" + strValue + "\"", kExitUsage);
}

}  // namespace

Json::Value NewDefinition(const Context& Call, Json::Value jMembers) {
    Json::Value jTable(Json::objectValue);
    ForPairs(Call, "--type", jMembers, TakeType);
    ForPairs(Call, "--default", jMembers, TakeDefault);
    for (const std::string& strName : Call.Names("--not-null")) {
        Find(jMembers, "--not-null", strName)["notNull"] = true;
    }
    for (const std::string& strName : Call.Names("--unique")) {
        Find(jMembers, "--unique", strName)["unique"] = true;
    }
    const std::vector<std::string> vecKey = Call.Names("--key");
    for (const std::string& strName : vecKey) {
        Find(jMembers, "--key", strName);
        jTable["key"].append(strName);
    }
    if (vecKey.size() == 1) {
        jTable["key"] = vecKey[0];
    }
    jTable["member"] = std::move(jMembers);
    Json::Value jDefinition;
    jDefinition[Call.TableName()] = std::move(jTable);
    return jDefinition;
}

bool AddSeenMembers(const std::string& strTable, const Inference& Seen, Json::Value& jDefinition) {
    Json::Value& jMembers = jDefinition[strTable]["member"];
    const Json::Value jSeen = Seen.Members();
    bool blAdded = false;
    for (const std::string& strName : jSeen.getMemberNames()) {
        if (!jMembers.isMember(strName)) {
            jMembers[strName] = jSeen[strName];
            blAdded = true;
        }
    }
    return blAdded;
}

}  // namespace VORN_JSON_DB::Cli
