// The first byte selects what is done, the rest is the query, as JSON text or as a hostile value:
// explained, read, turned around, used for a change, or given to an old handle.

#include <vector>

#include "JsonValues.h"
#include "TableHost.h"

using namespace fuzzhost;
using VORN_JSON_DB::Condition;
using VORN_JSON_DB::Query;
using VORN_JSON_DB::Status;
using VORN_JSON_DB::StatusCode;
using VORN_JSON_DB::Table;
using Use = TableHost::Use;

namespace {

constexpr char kMembers[] =
    "a:string,b:int,c:bool,d:Json::objectValue,e:double,f:Json::arrayValue,limit:string,"
    "t:Json::Value,x:any,z:int";
constexpr char kRows[] =
    R"(('x', 1, 1, '{}', 0.5, '[]', '', NULL, 'x', 1),
       ('it''s', 2, 0, '{"a":{"b":[1,"x"]}}', NULL, '[1,"x",null]', NULL, '"x"', 1, 2),
       (NULL, NULL, NULL, '{', NULL, NULL, 'X', NULL, NULL, 3),
       ('100%', -1, 1, '{"a":1,"b":true}', 1e300, '[[1],{"a":1}]', '%', '[1,true]', x'00', 4))";

// What an old handle can read.
constexpr char kOldMembers[] =
    "a:string,b:int,c:bool,d:Json::objectValue,f:Json::arrayValue,member:string,z:int";
constexpr char kOldRows[] =
    R"(('x', 1, 1, '{}', '[]', '', 1), ('it''s', 2, 0, '{"a":{"b":[1,"x"]}}', '[1,"x",null]', NULL, 2),
       (NULL, NULL, NULL, NULL, NULL, 'X', 3), ('100%', -1, 1, '{"a":1,"b":true}', '[[1]]', '%', 4))";
constexpr std::int64_t kAllRows = 4;

VORN_JSON_DB::Options NewHandleOnly() {
    VORN_JSON_DB::Options How;
    How.blCompatible = false;
    return How;
}

std::int64_t CountOf(TableHost& Host, Table& Of, const Query& Which, bool& blOk) {
    std::int64_t nRecords = -1;
    blOk = Host.Call(Use::kRead, [&] { return Of.Count(Which, nRecords); }).Ok();
    return nRecords;
}

// All ways of reading agree, and the opposite of a query selects the rest.
void Read(TableHost& Host, Table& Of, const Query& Which) {
    Json::Value jRecords = "before";
    const Status Listed = Host.Call(Use::kRead, [&] { return Of.List(Which, jRecords); });
    VORN_JSON_DB::Plan Plan;
    const Status Explained = Host.Call(Use::kRead, [&] { return Of.Explain(Which, Plan); });
    if (!Listed.Ok()) {
        Require(jRecords == "before", "a failure leaves the output");
        Require(Listed.Code() != StatusCode::kRefused || Explained.Code() == StatusCode::kRefused,
                "what cannot be read cannot be explained");
        return;
    }
    Require(Explained.Ok() && !Plan.vecSteps.empty(), "what can be read can be explained");
    bool blCounted = false;
    const std::int64_t nCount = CountOf(Host, Of, Which, blCounted);
    Require(!blCounted || nCount == static_cast<std::int64_t>(jRecords.size()),
            "as many are counted as listed");
    if (Which.nLimit < 0 && Which.nOffset == 0 && !Which.vecWhere.empty()) {
        Query Opposite;
        Opposite.Where(Condition::Not(Condition::All(Which.vecWhere)));
        const std::int64_t nRest = CountOf(Host, Of, Opposite, blCounted);
        Require(!blCounted || nRest == kAllRows - nCount, "a condition is true or false");
    }
}

// A change reaches what the query selects.
void Change(TableHost& Host, Table& Of, const Query& Which, bool blRemove) {
    bool blCounted = false;
    const std::int64_t nCount = CountOf(Host, Of, Which, blCounted);
    std::int64_t nRows = -1;
    Json::Value jMembers;
    jMembers["a"] = "'); DROP TABLE t; --";
    const Status Changed = Host.Call(Use::kChange, [&] {
        return blRemove ? Of.Remove(Which, &nRows) : Of.Update(Which, jMembers, &nRows);
    });
    if (Changed.Ok()) {
        Require(blCounted && nRows == nCount, "a change reaches what is counted");
    } else {
        Require(nRows == -1, "a failure leaves the output");
    }
    const std::int64_t nLeft = kAllRows - (Changed.Ok() && blRemove ? nCount : 0);
    Require(Host.Ask("SELECT count(*) FROM t") == std::to_string(nLeft), "no other row is touched");
}

std::vector<int> KeysOf(const Json::Value& jRecords) {
    std::vector<int> vecKeys;
    for (const Json::Value& jRecord : jRecords) {
        vecKeys.push_back(jRecord["z"].asInt());
    }
    return vecKeys;
}

// An old handle finds the same.
void ReadByOldHandle(TableHost& Host, Table& Of, Query Which) {
    Which.vecMembers.clear();
    Json::Value jOld;
    const Status Made = Host.Call(
        Use::kRead, [&] { return Of.ToOldQuery(Which, VORN_JSON_DB::OldCall::kRead, jOld); });
    Json::Value jRecords;
    const Status Listed = Host.Call(Use::kRead, [&] { return Of.List(Which, jRecords); });
    if (!Made.Ok() || !Listed.Ok()) {
        return;
    }
    std::string strTable = "t";
    std::string strCreate = "SELECT 1";
    Json::Value jDefinition = Of.Definition();
    VornJsonDbApi Old(Host.Db().Get(), strTable, jDefinition, strCreate);
    Json::Value jFound(Json::arrayValue);
    Require(Old.recList(jOld, jFound) == 0, "an old handle takes the query");
    Require(KeysOf(jFound) == KeysOf(jRecords), "an old handle finds the same rows");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    Json::Value jQuery;
    if (nSize < 2 || nSize > kMaxInput || !TakeValue(pData + 1, nSize - 1, jQuery)) {
        return 0;
    }
    constexpr unsigned kConditionsAlone = 0x80;
    constexpr unsigned kValuesOnly = 0x40;
    if ((pData[0] & kConditionsAlone) != 0) {
        Json::Value jConditions;
        jConditions["where"].swap(jQuery);
        jQuery.swap(jConditions);
    }
    static TableHost s_Host(kMembers, "z", kRows, NewHandleOnly());
    static TableHost s_OldHost(kOldMembers, "z", kOldRows, VORN_JSON_DB::Options());
    const Query Which = (pData[0] & kValuesOnly) != 0 ? Query::ValuesOnly(jQuery) : Query(jQuery);
    switch (pData[0] % 4) {
        case 0:
            Read(s_Host, s_Host.Begin(), Which);
            break;
        case 1:
            Change(s_Host, s_Host.Begin(), Which, false);
            break;
        case 2:
            Change(s_Host, s_Host.Begin(), Which, true);
            break;
        default:
            ReadByOldHandle(s_OldHost, s_OldHost.Begin(), Which);
    }
    return 0;
}
