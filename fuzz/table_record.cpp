// The first byte selects table and operation, the second the operation of a second call; the rest
// is the record for both, as JSON text or as a hostile value.

#include "JsonValues.h"
#include "TableHost.h"
#include "TableMembers.h"

using namespace fuzzhost;
using VORN_JSON_DB::OnDuplicate;
using VORN_JSON_DB::Status;
using VORN_JSON_DB::Table;
using VORN_JSON_DB::Written;
using Use = TableHost::Use;

namespace {

constexpr OnDuplicate kModes[] = {OnDuplicate::kStop, OnDuplicate::kSkip, OnDuplicate::kReplace,
                                  OnDuplicate::kUpsert};

VORN_JSON_DB::Options How(bool blCompatible) {
    VORN_JSON_DB::Options Made;
    Made.blCompatible = blCompatible;
    Made.eNulls = VORN_JSON_DB::Nulls::kLeaveOut;
    return Made;
}

// Texts byte by byte, whole numbers exactly, JSON as the text that both handles write.
void CheckValue(TableHost& Host, const std::string& strName, const Json::Value& jGiven,
                const Json::Value& jStored) {
    if (jGiven.isString() && strName != "f") {
        Require(jStored == jGiven, "a text is stored");
    } else if (jGiven.isBool()) {
        Require(jStored == jGiven, "a boolean is stored");
    } else if (jGiven.isIntegral() && jGiven.type() != Json::realValue && strName != "f") {
        // As digits, where it is no fraction: JsonCpp rounds an unsigned number that becomes a
        // double otherwise than one with a sign.
        const bool blReal = jStored.type() == Json::realValue;
        Require(jStored.isNumeric() && (blReal ? jStored.asDouble() == jGiven.asDouble()
                                               : jStored.asString() == jGiven.asString()),
                "a number is stored");
    } else if (jGiven.isObject() || jGiven.isArray()) {
        Require(Host.Ask("SELECT \"" + strName + "\" FROM t") == Compact(jGiven),
                "JSON is stored whole");
    }
}

void CheckStored(TableHost& Host, Table& Of, const Json::Value& jGiven,
                 const Json::Value& jStored) {
    for (const std::string& strName : jGiven.getMemberNames()) {
        CheckValue(Host, strName, jGiven[strName], jStored[strName]);
    }
    Json::Value jFound;
    const Status Got = Host.Call(Use::kRead, [&] { return Of.Get(jStored["b"], jFound); });
    Require(Got.Ok() && Compact(jFound) == Compact(jStored), "the stored record comes back");
}

// An old handle reads all that was stored for it.
void CheckOldHandle(TableHost& Host, Table& Of, const Json::Value& jStored) {
    std::string strTable = "t";
    std::string strCreate = "SELECT 1";
    Json::Value jDefinition = Of.Definition();
    VornJsonDbApi Old(Host.Db().Get(), strTable, jDefinition, strCreate);
    Json::Value jNoQuery;
    Json::Value jFound(Json::arrayValue);
    Require(Old.recList(jNoQuery, jFound) == 0 && jFound.size() == 1, "an old handle reads it");
    Require(Compact(jFound[0]) == Compact(jStored), "an old handle reads the same");
}

void Save(TableHost& Host, Table& Of, const Json::Value& jRecord, unsigned nOperation,
          bool blCompatible) {
    const std::string strBefore = Host.Ask("SELECT count(*) FROM t");
    Json::Value jStored = "before";
    Written eWritten = Written::kInserted;
    const Status Outcome = Host.Call(Use::kChange, [&] {
        return nOperation % 5 == 4 ? Of.Create(jRecord, &jStored)
                                   : Of.Save(jRecord, kModes[nOperation % 5], &jStored, &eWritten);
    });
    const std::string strNow = Host.Ask("SELECT count(*) FROM t");
    if (!Outcome.Ok()) {
        Require(jStored == "before", "a failure leaves the output");
        Require(strNow == strBefore, "a failure stores nothing");
        return;
    }
    Require(strNow == "1", "one record makes one row");
    Require((strBefore == "0") == (eWritten == Written::kInserted), "what happened is told");
    CheckStored(Host, Of, jRecord, jStored);
    if (blCompatible) {
        CheckOldHandle(Host, Of, jStored);
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    Json::Value jRecord;
    if (nSize < 3 || nSize > kMaxInput || !TakeValue(pData + 2, nSize - 2, jRecord)) {
        return 0;
    }
    static TableHost s_New(kTableMembers, kTableKey, "", How(false));
    static TableHost s_Both(kTableMembers, kTableKey, "", How(true));
    const bool blCompatible = pData[0] % 2 == 1;
    TableHost& Host = blCompatible ? s_Both : s_New;
    Table& Of = Host.Begin();
    const Json::Value jBefore = jRecord;
    Save(Host, Of, jRecord, pData[0] / 2U, blCompatible);
    Require(Same(jRecord, jBefore), "the input is left alone");
    // Without a key the same record would make a second row.
    if (jRecord.isObject() && !jRecord["b"].isNull()) {
        Save(Host, Of, jRecord, pData[1], blCompatible);
    }
    return 0;
}
