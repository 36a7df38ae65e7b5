#include "QueryParser.h"

#include <string>
#include <utility>
#include <vector>

#include "../src/base/JsonMember.h"
#include "Concat.h"
#include "FindingCodes.h"
#include "Nearest.h"

namespace vornjsondb {

namespace {

using VORN_JSON_DB::Query;

void ReadNames(const Json::Value& jNames, const char* szPath, FindingCode eCode,
               std::vector<std::string>& vecNames, FindingList& vecFindings) {
    if (!jNames.isArray()) {
        Report(vecFindings, eCode, szPath,
               Concat({"a list of names belongs here, not ", Shown(jNames)}));
        return;
    }
    for (Json::ArrayIndex i = 0; i < jNames.size(); ++i) {
        if (jNames[i].isString()) {
            AddText(vecNames, BytesOf(jNames[i]));
        } else {
            Report(vecFindings, eCode, Below(szPath, DigitsOf(i)),
                   Concat({"a name belongs here, not ", Shown(jNames[i])}));
        }
    }
}

void ReadCount(const Json::Value& jCount, const char* szPath, std::int64_t& nCount,
               FindingList& vecFindings) {
    if (jCount.isInt64() && jCount.asInt64() >= 0) {
        nCount = jCount.asInt64();
    } else {
        Report(vecFindings, FindingCode::kBadCount, szPath,
               Concat({"a whole number from 0 belongs here, not ", Shown(jCount)}));
    }
}

void ReadWhere(const Json::Value& jWhere, bool blValuesOnly, Query& Out) {
    Out.vecWhere = ParseWhere(jWhere, blValuesOnly, Out.vecFindings);
}

void ReadSort(const Json::Value& jSort, bool, Query& Out) {
    ReadNames(jSort, "/sort", FindingCode::kBadSort, Out.vecSort, Out.vecFindings);
}

void ReadLimit(const Json::Value& jLimit, bool, Query& Out) {
    ReadCount(jLimit, "/limit", Out.nLimit, Out.vecFindings);
}

void ReadOffset(const Json::Value& jOffset, bool, Query& Out) {
    ReadCount(jOffset, "/offset", Out.nOffset, Out.vecFindings);
}

void ReadMembers(const Json::Value& jMembers, bool, Query& Out) {
    // mutate(exchanged): an empty list has no names.
    ReadNames(jMembers, "/members", FindingCode::kBadMembers, Out.vecMembers, Out.vecFindings);
    // To a Query no names are all names.
    if (jMembers.isArray() && jMembers.empty()) {
        Report(Out.vecFindings, FindingCode::kBadMembers, "/members", "the list names no member");
    }
}

struct QueryKey {
    const char* szKey;
    void (*pfnRead)(const Json::Value& jValue, bool blValuesOnly, Query& Out);
};
constexpr QueryKey kKeys[] = {{"where", ReadWhere},
                              {"sort", ReadSort},
                              {"limit", ReadLimit},
                              {"offset", ReadOffset},
                              {"members", ReadMembers}};

void ReadKey(const MemberName& Name, const Json::Value& jValue, bool blValuesOnly, Query& Out) {
    for (const QueryKey& Key : kKeys) {
        if (Name.Is(Key.szKey)) {
            Key.pfnRead(jValue, blValuesOnly, Out);
            return;
        }
    }
    std::vector<std::string> vecKeys;
    for (const QueryKey& Key : kKeys) {
        // mutate(doubled): the same name once more.
        AddText(vecKeys, Key.szKey);
    }
    const std::string strKey(Name.View());
    Report(Out.vecFindings, FindingCode::kUnknownQueryKey, Below("", strKey),
           Concat({"a query has no key ", ShownText(strKey), Suggestion(strKey, vecKeys)}));
}

}  // namespace

Query ParseQuery(const Json::Value& jQuery, bool blValuesOnly) {
    Query Parsed;
    // mutate(exchanged): what has no members has an end, too.
    if (!jQuery.isObject()) {
        Report(Parsed.vecFindings, FindingCode::kNotAQuery, "",
               Concat({"a query is an object, not ", Shown(jQuery)}));
        return Parsed;
    }
    const Json::Value::const_iterator itEnd = jQuery.end();
    for (Json::Value::const_iterator it = jQuery.begin(); it != itEnd; ++it) {
        ReadKey(NameOf(it), *it, blValuesOnly, Parsed);
    }
    return Parsed;
}

}  // namespace vornjsondb
