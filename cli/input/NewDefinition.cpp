#include "NewDefinition.h"

#include "../../src/schema/MemberType.h"
#include "../Database.h"

namespace VORN_JSON_DB::Cli {

namespace {

Json::Value& Find(Json::Value& jMembers, const std::string& strName, const char* szOption) {
    if (!jMembers.isMember(strName)) {
        Fail(kExitUsage, std::string(szOption) + ": no record has a member \"" + strName + "\"" +
                             NearestHint(strName, jMembers.getMemberNames()));
    }
    return jMembers[strName];
}

// A text where the member is one; else JSON.
Json::Value DefaultFor(const Json::Value& jMember, const std::string& strName,
                       const std::string& strValue) {
    if (jMember["cpptype"] == "string") {
        return strValue;
    }
    return ParseJson(strValue, "--default " + strName + "=" + strValue);
}

void TakeTypes(Json::Value& jMembers, const InsertOptions& How) {
    for (const auto& Each : How.vecTypes) {
        Json::Value& jMember = Find(jMembers, Each.first, "--type");
        jMember["cpptype"] = Each.second;
        if (vornjsondb::TypeOfMember(jMember).Bound.eKind == vornjsondb::BoundKind::kNone) {
            Fail(kExitUsage, "--type: there is no type \"" + Each.second +
                                 "\"; string, bool, int, long long, double, Json::Value and any "
                                 "are some");
        }
    }
}

}  // namespace

Json::Value NewDefinition(const std::string& strTable, const Inference& Seen,
                          const InsertOptions& How) {
    Json::Value jMembers = Seen.Members();
    TakeTypes(jMembers, How);
    for (const std::string& strName : How.vecNotNull) {
        Find(jMembers, strName, "--not-null")["notNull"] = true;
    }
    for (const auto& Each : How.vecDefaults) {
        Json::Value& jMember = Find(jMembers, Each.first, "--default");
        jMember["cppDefaultValue"] = DefaultFor(jMember, Each.first, Each.second);
    }
    Json::Value jDefinition;
    Json::Value& jTable = jDefinition[strTable];
    for (const std::string& strName : How.vecKey) {
        Find(jMembers, strName, "--key");
        jTable["key"].append(strName);
    }
    if (How.vecKey.size() == 1) {
        jTable["key"] = How.vecKey[0];
    }
    jTable["member"] = jMembers;
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
