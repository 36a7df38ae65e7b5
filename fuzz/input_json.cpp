// The input is JSON as one text, behind two bytes of options. Every good record is what JsonCpp
// reads from the record's own text, and a list that JsonCpp reads is read whole.

#include "FuzzHost.h"
#include "InputHost.h"

using namespace fuzzhost;
using namespace VORN_JSON_DB::Cli;

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    if (nSize < kOptionBytes || nSize > kMaxInput) {
        return 0;
    }
    ReadOptions How;
    How.blKeepText = (pData[0] & 1) != 0;
    const std::string strText(reinterpret_cast<const char*>(pData) + kOptionBytes,
                              nSize - kOptionBytes);
    const ReadInput Found = ReadTwice(strText, pData[1], How);
    for (const ReadRecord& Each : Found.vecRecords) {
        Json::Value jRecord;
        if (!Each.blBad && How.blKeepText && ParseStrictly(Each.strText, jRecord)) {
            Require(IsRecord(Each, jRecord), "a record is what its text says");
        }
        Require(!Each.strText.empty() == How.blKeepText, "a text is kept as asked for");
    }
    Json::Value jList;
    if (Found.Outcome.eEnd == ReadOutcome::End::kDone && ParseStrictly(strText, jList) &&
        jList.isArray()) {
        Require(jList.size() == Found.vecRecords.size(), "a list is read to its end");
        for (size_t i = 0; i < Found.vecRecords.size(); ++i) {
            const Json::Value& jElement = jList[static_cast<Json::ArrayIndex>(i)];
            Require(Found.vecRecords[i].blBad || IsRecord(Found.vecRecords[i], jElement),
                    "an element is a record");
        }
    }
    return 0;
}
