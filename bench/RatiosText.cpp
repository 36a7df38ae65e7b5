// How the time for SQL texts grows with the columns and with the length of the values.

#include <memory>
#include <string>

#include "RatioRows.h"
#include "support/Bench.h"
#include "support/Interleave.h"
#include "support/Records.h"
#include "support/SqlCapture.h"

namespace bench {

namespace {

constexpr int kMany = 512;
constexpr int kFew = 64;

// A handle on a wide table with a record, and the text in front of its value list.
struct WideWork {
    explicit WideWork(int nColumns)
        : pHandle(Wide(nColumns).Open(Db.Get())), jRecord(WideRecord(nColumns)) {
        strPrefix = "INSERT INTO wide (";
        pHandle->SqlExpandMemberName(strPrefix, &jRecord);
        strPrefix += ") VALUES (";
    }

    void Values() {
        std::string strSql = strPrefix;
        Require(pHandle->SqlExpandMemberSymbol(strSql, jRecord) == 0, "value list");
    }

    void Names() {
        std::string strSql = "INSERT INTO wide (";
        Require(pHandle->SqlExpandMemberName(strSql, &jRecord) == 0, "names list");
    }

    Database Db;
    std::unique_ptr<VornJsonDbApi> pHandle;
    Json::Value jRecord;
    std::string strPrefix;
};

Figure PerColumn(const Settings& Now, void (WideWork::*pfnWork)(), int nCalls) {
    WideWork Many(kMany);
    WideWork Few(kFew);
    const Timing Found = Interleave(
        {Now.blShort ? 10 : 30, nCalls}, [&](int) { (Many.*pfnWork)(); },
        [&](int) {
            for (int i = 0; i < kMany / kFew; ++i) {
                (Few.*pfnWork)();
            }
        });
    return {"ns", Found.dOurs / kMany, Found.dOther / kMany, Found.dRatio};
}

Figure LongTexts(const Settings& Now, const Json::Value& jRecord) {
    const Table Texts = EightTexts();
    const Database Ours;
    const Database Other;
    const auto pHandle = Texts.Open(Ours.Get());
    Other.Exec(Texts.strSqlCreate);
    Json::Value jIn = jRecord;
    const auto Create = [&](int) {
        Json::Value jStored;
        Require(pHandle->recCreate(jIn, jStored) == 0, "recCreate of long texts");
        Require(jStored.size() == jIn.size(), "long texts are read back");
    };
    std::string strSql;
    {
        SqlCapture Capture(Ours.Get());
        Create(0);
        strSql = Capture.Take();
    }
    const Timing Found = Interleave(
        {Now.blShort ? 10 : 16, 6}, Create, [&](int) { Other.Exec(strSql); },
        [&](int) {
            // Not a rollback: the freed pages are to be used again, on both sides.
            for (const Database* pDb : {&Ours, &Other}) {
                pDb->Exec("DELETE FROM texts");
            }
        });
    return {"ns", Found.dOurs, Found.dOther, Found.dRatio};
}

}  // namespace

Figure ValueListRatio(const Settings& Now) {
    return PerColumn(Now, &WideWork::Values, 20);
}

Figure NamesListRatio(const Settings& Now) {
    return PerColumn(Now, &WideWork::Names, 100);
}

Figure OneLongTextRatio(const Settings& Now) {
    Json::Value jRecord;
    for (int i = 0; i < 8; ++i) {
        jRecord["text" + std::to_string(i)] = "a short text";
    }
    jRecord["text0"] = std::string(1 << 20, 'x');
    return LongTexts(Now, jRecord);
}

Figure EightLongTextsRatio(const Settings& Now) {
    Json::Value jRecord;
    for (int i = 0; i < 8; ++i) {
        jRecord["text" + std::to_string(i)] = std::string(1 << 16, 'x');
    }
    return LongTexts(Now, jRecord);
}

}  // namespace bench
