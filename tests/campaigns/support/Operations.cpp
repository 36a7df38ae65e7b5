#include "Operations.h"

#include <algorithm>
#include <cstdio>

namespace campaign {

namespace {

struct Kind {
    const char* szType;
    const char* szColumn;
    const char* szDefault;
};

// The types that can be created, checked, stored and read back.
constexpr Kind kKinds[] = {
    {"string", "TEXT", R"("none")"},     {"int", "INTEGER", "0"},
    {"Json::objectValue", "TEXT", "{}"}, {"long long", "INTEGER", "0"},
    {"Json::arrayValue", "TEXT", "[]"},  {"bool", "INTEGER", "false"},
};
constexpr int kKindCount = sizeof(kKinds) / sizeof(kKinds[0]);
constexpr int kRows = 5;

Json::Value ValueOf(int nKind, int nKey, int nMember) {
    const std::string strTag = std::to_string(nKey) + "-" + std::to_string(nMember);
    switch (nKind) {
        case 0:
            return "it's a text of more than a few characters, " + strTag;
        case 1:
            return nKey * 1000 + nMember;
        case 2:
            return FromText(R"({"tag":")" + strTag + R"(","list":[1,{"deep":null}]})");
        case 3:
            return static_cast<Json::Int64>(5000000000) * nKey + nMember;
        case 4:
            return FromText(R"(["O'Neil",)" + std::to_string(nKey) + "]");
        default:
            return nKey % 2 == 0;
    }
}

}  // namespace

// ---- the table ----------------------------------------------------------------------------------

Table::Table(std::string strTableName, int nMembers) : strName(std::move(strTableName)) {
    Json::Value& jMember = jDefinition[strName]["member"] = Json::Value(Json::objectValue);
    jMember["id"]["cpptype"] = "int";
    vecMembers.emplace_back("id");
    std::string strColumns = "id INTEGER PRIMARY KEY";
    for (int i = 1; i < nMembers; ++i) {
        char szName[16];
        std::snprintf(szName, sizeof(szName), "m%02d", i);
        const Kind& kind = kKinds[(i - 1) % kKindCount];
        jMember[szName]["cpptype"] = kind.szType;
        if (i == nMembers - 1 || i % 5 == 0) {
            jMember[szName]["cppDefaultValue"] = FromText(kind.szDefault);
        }
        vecMembers.emplace_back(szName);
        strColumns += std::string(", ") + szName + " " + kind.szColumn;
    }
    strCreate = "CREATE TABLE IF NOT EXISTS " + strName + " (" + strColumns + ", UNIQUE (m01))";
}

Json::Value Table::Record(int nKey) const {
    Json::Value jRecord(Json::objectValue);
    jRecord["id"] = nKey;
    for (std::size_t i = 1; i + 1 < vecMembers.size(); ++i) {
        const int nMember = static_cast<int>(i);
        jRecord[vecMembers[i]] = ValueOf((nMember - 1) % kKindCount, nKey, nMember);
    }
    return jRecord;
}

void Table::Fill(const Database& db) const {
    db.Run(strCreate);
    for (int nKey = 1; nKey <= kRows; ++nKey) {
        const Json::Value jRecord = Record(nKey);
        std::string strNames;
        std::string strValues;
        for (const std::string& strMember : jRecord.getMemberNames()) {
            const Json::Value& jValue = jRecord[strMember];
            const std::string strText = jValue.isString() ? jValue.asString() : ToText(jValue);
            char* szText = sqlite3_mprintf("%Q", strText.c_str());
            strNames += (strNames.empty() ? "" : ",") + strMember;
            strValues += strValues.empty() ? "" : ",";
            strValues += jValue.isBool()       ? (jValue.asBool() ? "1" : "0")
                         : jValue.isIntegral() ? strText
                                               : std::string(szText);
            sqlite3_free(szText);
        }
        db.Run("INSERT INTO " + strName + " (" + strNames + ") VALUES (" + strValues + ")");
    }
}

std::string Table::Content(const Database& db) const {
    return db.Rows("SELECT * FROM " + strName + " ORDER BY id");
}

// ---- arguments ----------------------------------------------------------------------------------

bool Arguments::operator==(const Arguments& other) const {
    return jFirst == other.jFirst && jSecond == other.jSecond && strFirst == other.strFirst &&
           strSecond == other.strSecond && vecValues == other.vecValues;
}

Json::Value Arguments::AsJson() const {
    Json::Value jAll;
    jAll["first"] = jFirst;
    jAll["second"] = jSecond;
    jAll["text"] = strFirst;
    jAll["out"] = strSecond;
    jAll["values"] = Json::Value(Json::arrayValue);
    for (const std::string& strValue : vecValues) {
        jAll["values"].append(strValue);
    }
    return jAll;
}

Arguments Arguments::OfJson(const Json::Value& jAll) {
    Arguments args;
    args.jFirst = jAll["first"];
    args.jSecond = jAll["second"];
    args.strFirst = jAll["text"].asString();
    args.strSecond = jAll["out"].asString();
    for (const Json::Value& jValue : jAll["values"]) {
        args.vecValues.push_back(jValue.asString());
    }
    return args;
}

namespace {

// Each member or element of jNow is that of jBefore or that of jResult, and none is lost.
bool IsPart(const Json::Value& jBefore, const Json::Value& jNow, const Json::Value& jResult) {
    if (jNow == jBefore || jNow == jResult) {
        return true;
    }
    if (jNow.type() != jResult.type() || (!jBefore.isNull() && jBefore.type() != jNow.type())) {
        return false;
    }
    if (jNow.isArray()) {
        bool blPart = jNow.size() >= jBefore.size() && jNow.size() <= jResult.size();
        for (Json::ArrayIndex i = 0; i < jNow.size(); ++i) {
            // When SQLite has no memory to write a number as text it hands on a NULL before it
            // fails: the last row may lack members.
            const bool blLast = i + 1 == jNow.size();
            blPart = blPart && (jNow[i] == jResult[i] ||
                                (blLast && IsPart(Json::objectValue, jNow[i], jResult[i])));
        }
        return blPart;
    }
    if (!jNow.isObject()) {
        return false;
    }
    for (const std::string& strName : jNow.getMemberNames()) {
        const bool blOld = jBefore.isMember(strName) && jNow[strName] == jBefore[strName];
        // A member whose value could not be copied any more is there, and null.
        const bool blNew = jResult.isMember(strName) &&
                           (jNow[strName] == jResult[strName] || jNow[strName].isNull());
        if (!blOld && !blNew) {
            return false;
        }
    }
    const std::vector<std::string> vecOld = jBefore.getMemberNames();
    return std::all_of(vecOld.begin(), vecOld.end(),
                       [&](const std::string& strName) { return jNow.isMember(strName); });
}

bool StartsWith(const std::string& strText, const std::string& strHead) {
    return strText.compare(0, strHead.size(), strHead) == 0;
}

}  // namespace

bool IsLeftAsDocumented(const Operation& operation, const Arguments& argsBefore,
                        const Arguments& argsNow, const Arguments& argsResult) {
    if (operation.eAfter == After::kUnchanged) {
        return argsNow == argsBefore;
    }
    return argsNow.strFirst == argsBefore.strFirst && argsNow.vecValues == argsBefore.vecValues &&
           IsPart(argsBefore.jFirst, argsNow.jFirst, argsResult.jFirst) &&
           IsPart(argsBefore.jSecond, argsNow.jSecond, argsResult.jSecond) &&
           StartsWith(argsNow.strSecond, argsBefore.strSecond) &&
           StartsWith(argsResult.strSecond, argsNow.strSecond);
}

}  // namespace campaign
