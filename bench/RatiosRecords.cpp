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

// Calls fnWork(handle, input, result) on one store in turns with the bare texts on another one that
// holds the same; the texts are those of the same calls on a third. Only the calls are measured: a
// turn's inputs and texts are made right before it, as a caller makes a record and stores it, and
// results are destroyed after it.
template <class Make, class Work>
Figure AgainstExec(const Rounds& How, int nRows, Make&& fnMakeInput, Work&& fnWork) {
    const size_t nCalls = static_cast<size_t>(How.nCalls);
    std::vector<std::string> vecTexts;
    {
        const Store Source(nRows);
        Json::Value jResult;
        vecTexts = Texts(Source, CallsOf(How), [&](int i) {
            Json::Value jInput = fnMakeInput(i);
            jResult = Json::Value();
            fnWork(*Source.pHandle, jInput, jResult);
        });
    }
    const Store Ours(nRows);
    const Store Other(nRows);
    std::vector<Json::Value> vecInputs(nCalls);
    std::vector<Json::Value> vecResults(nCalls);
    std::vector<std::string> vecTextsOfTurn(nCalls);
    return FromTiming(Interleave(
        How,
        [&](int i) {
            const size_t nPlace = static_cast<size_t>(i) % nCalls;
            fnWork(*Ours.pHandle, vecInputs[nPlace], vecResults[nPlace]);
        },
        [&](int i) { Other.Db.Exec(vecTextsOfTurn[static_cast<size_t>(i) % nCalls]); },
        [&](int nFirst) {
            vecResults.assign(nCalls, Json::Value());
            for (size_t i = 0; i < nCalls; ++i) {
                vecInputs[i] = fnMakeInput(nFirst + static_cast<int>(i));
                vecTextsOfTurn[i] = vecTexts[static_cast<size_t>(nFirst) + i];
            }
        }));
}

// Every call has a key of its own.
constexpr int kRounds = 100;
constexpr int kCalls = 190;
static_assert((kRounds + kWarmUpRounds) * kCalls <= kRows, "more calls than keys");

// A query object for each running number.
auto ByKeys() {
    return [vecIds = Shuffled(kRows)](int i) { return ById(vecIds[static_cast<size_t>(i)]); };
}

}  // namespace

Figure CreateRatio(const Settings& Now) {
    return AgainstExec(HowOften(Now, kRounds, kCalls), 0, EightMemberRecord,
                       [](VornJsonDbApi& Handle, Json::Value& jRecord, Json::Value& jStored) {
                           Require(Handle.recCreate(jRecord, jStored) == 0, "recCreate");
                       });
}

Figure GetRatio(const Settings& Now) {
    return AgainstExec(HowOften(Now, kRounds, kCalls), kRows, ByKeys(),
                       [](VornJsonDbApi& Handle, Json::Value& jQuery, Json::Value& jFound) {
                           Require(Handle.recGetOne(jQuery, jFound) == 1, "recGetOne");
                       });
}

Figure UpdateRatio(const Settings& Now) {
    Json::Value jChange;
    jChange["city"] = "Depot 100";
    jChange["level"] = 12;
    jChange["note"] = "moved to the yard";
    return AgainstExec(HowOften(Now, kRounds, kCalls), kRows, ByKeys(),
                       [&](VornJsonDbApi& Handle, Json::Value& jQuery, Json::Value&) {
                           Require(Handle.recUpdateByFilter(jQuery, jChange) == 0, "update");
                       });
}

Figure DeleteRatio(const Settings& Now) {
    return AgainstExec(HowOften(Now, kRounds, kCalls), kRows, ByKeys(),
                       [](VornJsonDbApi& Handle, Json::Value& jQuery, Json::Value&) {
                           Require(Handle.recDelete(jQuery) == 1, "recDelete");
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
        [&](int) {
            jOurs = Json::Value();
            jOther = Json::Value();
        });
    return {"ns", Found.dOurs / kRows, Found.dOther / kRows, Found.dRatio};
}

}  // namespace bench
