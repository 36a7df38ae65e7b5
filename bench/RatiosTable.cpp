// Calls of VORN_JSON_DB::Table and Loader on the table of eight members.

#include <VornJsonDbTable.h>

#include <string>
#include <vector>

#include "../table/QueryPlan.h"
#include "../table/TableParts.h"
#include "RatioRows.h"
#include "support/Bench.h"
#include "support/Interleave.h"
#include "support/Records.h"
#include "support/TableStore.h"

namespace bench {

namespace {

using VORN_JSON_DB::Loader;
using VORN_JSON_DB::Op;
using VORN_JSON_DB::Query;

constexpr int kRows = 20000;

// Every call has a key of its own.
constexpr int kRounds = 100;
constexpr int kCalls = 190;
static_assert((kRounds + kWarmUpRounds) * kCalls <= kRows, "more calls than keys");

Rounds HowOften(const Settings& Now) {
    return {Now.blShort ? 10 : kRounds, kCalls};
}

Figure FromTiming(const Timing& Found, int nUnits = 1) {
    return {"ns", Found.dOurs / nUnits, Found.dOther / nUnits, Found.dRatio};
}

// The results of a turn, made before it and destroyed after it: neither is measured.
class Results {
  public:
    Json::Value& operator[](int i) { return m_vecOfTurn[static_cast<size_t>(i) % kCalls]; }
    void Clear() { m_vecOfTurn.assign(kCalls, Json::Value()); }

  private:
    std::vector<Json::Value> m_vecOfTurn = std::vector<Json::Value>(kCalls);
};

// Writes the records 0, 1, 2 and so on into an empty table, in turns with the same by hand on
// another one. fnMakeInput makes a call's input before its turn.
template <class Make, class Ours, class Other>
Figure Writing(const Settings& Now, Make&& fnMakeInput, Ours&& fnOurs, Other&& fnOther) {
    std::vector<decltype(fnMakeInput(0))> vecInputs;
    Results Found;
    const auto fnInput = [&](int i) -> auto& {
        return vecInputs[static_cast<size_t>(i) % kCalls];
    };
    return FromTiming(Interleave(
        HowOften(Now), [&](int i) { fnOurs(fnInput(i), Found[i]); },
        [&](int i) { fnOther(fnInput(i), Found[i]); },
        [&](int nFirst) {
            Found.Clear();
            vecInputs.clear();
            for (int i = nFirst; i < nFirst + kCalls; ++i) {
                vecInputs.push_back(fnMakeInput(i));
            }
        }));
}

}  // namespace

Figure TableCreateRatio(const Settings& Now) {
    TableStore Ours(0);
    const TableStore Other(0);
    ByHand Hand(Other.Db);
    return Writing(
        Now, EightMemberRecord,
        [&](const Json::Value& jRecord, Json::Value& jStored) {
            RequireOk(Ours.Own.Create(jRecord, &jStored));
        },
        [&](const Json::Value& jRecord, Json::Value& jStored) { Hand.Create(jRecord, jStored); });
}

Figure TableToOldRatio(const Settings& Now) {
    TableStore Ours(0);
    const Database OtherDb;
    const auto pOld = EightMembers().Open(OtherDb.Get());
    OtherDb.Exec("BEGIN");
    return Writing(
        Now, EightMemberRecord,
        [&](const Json::Value& jRecord, Json::Value& jStored) {
            RequireOk(Ours.Own.Create(jRecord, &jStored));
        },
        [&](Json::Value& jRecord, Json::Value& jStored) {
            Require(pOld->recCreate(jRecord, jStored) == 0, "recCreate");
        });
}

Figure TableGetRatio(const Settings& Now) {
    TableStore Source(kRows);
    const ByHand Hand(Source.Db);
    const std::vector<int> vecIds = Shuffled(kRows);
    Results Found;
    return FromTiming(Interleave(
        HowOften(Now),
        [&](int i) { RequireOk(Source.Own.Get(vecIds[static_cast<size_t>(i)], Found[i])); },
        [&](int i) { Hand.Get(vecIds[static_cast<size_t>(i)], Found[i]); },
        [&](int) { Found.Clear(); }));
}

Figure TableListRatio(const Settings& Now) {
    TableStore Source(kRows);
    const ByHand Hand(Source.Db);
    Json::Value jOurs;
    Json::Value jOther;
    RequireOk(Source.Own.List({}, jOurs));
    Hand.List(jOther);
    Require(jOurs.size() == kRows && jOurs == jOther, "both lists are the same");
    return FromTiming(
        Interleave(
            {Now.blShort ? 10 : 14, 1}, [&](int) { RequireOk(Source.Own.List({}, jOurs)); },
            [&](int) { Hand.List(jOther); },
            [&](int) {
                jOurs = Json::Value();
                jOther = Json::Value();
            }),
        kRows);
}

Figure LoadBySettersRatio(const Settings& Now) {
    TableStore Ours(0);
    const TableStore Other(0);
    const ByHand Hand(Other.Db);
    Loader Into;
    RequireOk(Into.Start(Ours.Own));
    return Writing(
        Now, EightMemberPart, [&](const Part& One, Json::Value&) { Load(Into, One); },
        [&](const Part& One, Json::Value&) { Hand.Load(One); });
}

Figure LoadFromJsonRatio(const Settings& Now) {
    struct Input {
        Json::Value jRecord;
        Part Same;
    };
    TableStore Ours(0);
    const TableStore Other(0);
    const ByHand Hand(Other.Db);
    Loader Into;
    RequireOk(Into.Start(Ours.Own));
    return Writing(
        Now,
        [](int i) {
            return Input{EightMemberRecord(i), EightMemberPart(i)};
        },
        [&](const Input& One, Json::Value&) { RequireOk(Into.Add(One.jRecord)); },
        [&](const Input& One, Json::Value&) { Hand.Load(One.Same); });
}

Figure LoadSameJsonRatio(const Settings& Now) {
    TableStore Ours(0);
    const TableStore Other(0);
    ByHand Hand(Other.Db);
    Loader Into;
    RequireOk(Into.Start(Ours.Own));
    return Writing(
        Now, EightMemberRecord,
        [&](const Json::Value& jRecord, Json::Value&) { RequireOk(Into.Add(jRecord)); },
        [&](const Json::Value& jRecord, Json::Value&) { Hand.Load(jRecord); });
}

// A query is part of each fetch that it is compared with: the figure is a share.
Figure QueryShare(const Settings& Now) {
    TableStore Source(kRows);
    const Table Eight = EightMembers();
    VORN_JSON_DB::FindingList vecFindings;
    VORN_JSON_DB::Table::Parts Same(Source.Db.Get(), Eight.strName, Eight.jDefinition, {},
                                    vecFindings);
    RequireOk(Same.Meet());
    const std::vector<int> vecIds = Shuffled(kRows);
    Results Found;
    const auto fnQuery = [&](int i) {
        return Query().Where("id", vecIds[static_cast<size_t>(i)]).Limit(1);
    };
    return FromTiming(Interleave(
        HowOften(Now),
        [&](int i) {
            const Query Which = fnQuery(i);
            vornjsondb::QueryPlan Plan(Same.Of, Same.Codec);
            Plan.Resolve(Which, vornjsondb::QueryUse::kRead, vecFindings);
            vornjsondb::Statement Lent;
            const int nResult = Same.Kept.Take(
                Plan.Shape(), [] { return std::string("SELECT 1"); }, Lent);
            Require(nResult == SQLITE_OK && vecFindings.empty(), "a query and its statement");
        },
        [&](int i) { RequireOk(Source.Own.First(fnQuery(i), Found[i])); },
        [&](int) { Found.Clear(); }));
}

Figure LongInRatio(const Settings& Now) {
    constexpr int kMany = 10000;
    constexpr int kFew = 1000;
    TableStore Source(kRows);
    const std::vector<int> vecIds = Shuffled(kRows);
    const auto fnIds = [&](int nFirst, int nCount) {
        Json::Value jIds(Json::arrayValue);
        for (int i = nFirst; i < nFirst + nCount; ++i) {
            jIds.append(vecIds[static_cast<size_t>(i)]);
        }
        return jIds;
    };
    const Json::Value jMany = fnIds(0, kMany);
    std::vector<Json::Value> vecFew;
    for (int i = 0; i < kMany; i += kFew) {
        vecFew.push_back(fnIds(i, kFew));
    }
    const auto fnCount = [&](const Json::Value& jIds) {
        std::int64_t nFound = 0;
        RequireOk(Source.Own.Count(Query().Where("id", Op::kIn, jIds), nFound));
        Require(nFound == static_cast<std::int64_t>(jIds.size()), "$in finds each value");
    };
    return FromTiming(Interleave(
                          {Now.blShort ? 10 : 30, 1}, [&](int) { fnCount(jMany); },
                          [&](int) {
                              for (const Json::Value& jIds : vecFew) {
                                  fnCount(jIds);
                              }
                          }),
                      kMany);
}

}  // namespace bench
