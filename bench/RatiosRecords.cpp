// Whole calls on the table of eight members.

#include <memory>
#include <string>
#include <vector>

#include "RatioRows.h"
#include "support/Bench.h"
#include "support/Interleave.h"
#include "support/Records.h"
#include "support/SqlCapture.h"
#include "support/TypedList.h"

namespace bench {

namespace {

constexpr int kRows = 20000;

Figure FromTiming(const Timing& Found) {
    return {"ns", Found.dOurs, Found.dOther, Found.dRatio};
}

Rounds HowOften(const Settings& Now, int nRounds, int nCalls) {
    return {Now.blShort ? 10 : nRounds, nCalls};
}

// A database with the table of eight, inside one transaction.
struct Store {
    explicit Store(int nRows) : pHandle(EightMembers().Open(Db.Get())) {
        Db.Exec("BEGIN");
        for (int i = 0; i < nRows; ++i) {
            Json::Value jRecord = EightMemberRecord(i);
            Json::Value jStored;
            Require(pHandle->recCreate(jRecord, jStored) == 0, "filling the table");
        }
    }

    Database Db;
    std::unique_ptr<VornJsonDbApi> pHandle;
};

// The text that the library runs for each of the numbers, taken from Source.
template <class Work>
std::vector<std::string> Texts(const Store& Source, int nCount, Work&& fnWork) {
    std::vector<std::string> vecTexts;
    SqlCapture Capture(Source.Db.Get());
    for (int i = 0; i < nCount; ++i) {
        fnWork(i);
        vecTexts.push_back(Capture.Take());
    }
    return vecTexts;
}

// Calls fnWork on one store in turns with the bare texts on another one that holds the same; the
// texts are those of the same calls on a third. Only the calls are measured: query objects are made
// before and results destroyed after.
template <class Work>
Figure AgainstExec(const Rounds& How, int nRows, Work&& fnWork) {
    std::vector<std::string> vecTexts;
    {
        const Store Source(nRows);
        Json::Value jResult;
        vecTexts = Texts(Source, CallsOf(How), [&](int i) {
            jResult = Json::Value();
            fnWork(*Source.pHandle, static_cast<size_t>(i), jResult);
        });
    }
    const Store Ours(nRows);
    const Store Other(nRows);
    std::vector<Json::Value> vecResults(static_cast<size_t>(How.nCalls));
    return FromTiming(Interleave(
        How,
        [&](int i) {
            fnWork(*Ours.pHandle, static_cast<size_t>(i),
                   vecResults[static_cast<size_t>(i % How.nCalls)]);
        },
        [&](int i) { Other.Db.Exec(vecTexts[static_cast<size_t>(i)]); },
        [&] { vecResults.assign(vecResults.size(), Json::Value()); }));
}

std::vector<Json::Value> QueriesByKey() {
    std::vector<Json::Value> vecQueries;
    for (const int nId : Shuffled(kRows)) {
        vecQueries.push_back(ById(nId));
    }
    return vecQueries;
}

}  // namespace

Figure CreateRatio(const Settings& Now) {
    const Rounds How = HowOften(Now, 30, 300);
    std::vector<Json::Value> vecRecords = EightMemberRecords(CallsOf(How));
    return AgainstExec(How, 0, [&](VornJsonDbApi& Handle, size_t i, Json::Value& jStored) {
        Require(Handle.recCreate(vecRecords[i], jStored) == 0, "recCreate");
    });
}

Figure GetRatio(const Settings& Now) {
    std::vector<Json::Value> vecQueries = QueriesByKey();
    return AgainstExec(HowOften(Now, 30, 300), kRows,
                       [&](VornJsonDbApi& Handle, size_t i, Json::Value& jFound) {
                           Require(Handle.recGetOne(vecQueries[i], jFound) == 1, "recGetOne");
                       });
}

Figure UpdateRatio(const Settings& Now) {
    std::vector<Json::Value> vecQueries = QueriesByKey();
    Json::Value jChange;
    jChange["city"] = "Depot 100";
    jChange["level"] = 12;
    jChange["note"] = "moved to the yard";
    return AgainstExec(HowOften(Now, 30, 300), kRows,
                       [&](VornJsonDbApi& Handle, size_t i, Json::Value&) {
                           Require(Handle.recUpdateByFilter(vecQueries[i], jChange) == 0, "update");
                       });
}

Figure DeleteRatio(const Settings& Now) {
    std::vector<Json::Value> vecQueries = QueriesByKey();
    return AgainstExec(HowOften(Now, 30, 300), kRows,
                       [&](VornJsonDbApi& Handle, size_t i, Json::Value&) {
                           Require(Handle.recDelete(vecQueries[i]) == 1, "recDelete");
                       });
}

Figure ListRatio(const Settings& Now) {
    const Store Source(kRows);
    Json::Value jAll;
    std::string strSql;
    {
        SqlCapture Capture(Source.Db.Get());
        Json::Value jRows;
        Require(Source.pHandle->recList(jAll, jRows) == 0, "recList");
        strSql = Capture.Take();
        Require(jRows.size() == kRows && jRows == TypedList().Read(Source.Db.Get(), strSql),
                "both lists are the same");
    }
    const TypedList Reader;
    Json::Value jOurs;
    Json::Value jOther;
    const Timing Found = Interleave(
        HowOften(Now, 14, 1),
        [&](int) { Require(Source.pHandle->recList(jAll, jOurs) == 0, "recList"); },
        [&](int) { jOther = Reader.Read(Source.Db.Get(), strSql); },
        [&] {
            jOurs = Json::Value();
            jOther = Json::Value();
        });
    return {"ns", Found.dOurs / kRows, Found.dOther / kRows, Found.dRatio};
}

}  // namespace bench
