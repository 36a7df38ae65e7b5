// The input is JSON Lines, behind two bytes of options. A bad line harms no other: each is read as
// if it were alone, and a good one is what JsonCpp reads from it.

#include "FuzzHost.h"
#include "InputHost.h"

using namespace fuzzhost;
using namespace VORN_JSON_DB::Cli;

namespace {

// Records of each line, read by itself.
size_t ReadAlone(const std::string& strText, const ReadOptions& How, const ReadInput& Whole) {
    size_t nRecords = 0;
    size_t nBegin = 0;
    while (nBegin < strText.size()) {
        const size_t nEnd = std::min(strText.find('\n', nBegin), strText.size());
        const ReadInput Line = Read(strText.substr(nBegin, nEnd - nBegin), 0, How);
        for (const ReadRecord& Each : Line.vecRecords) {
            Require(nRecords < Whole.vecRecords.size(), "no record is lost");
            const ReadRecord& There = Whole.vecRecords[nRecords++];
            Require(Each.blBad == There.blBad && Each.strReason == There.strReason &&
                        Each.vecCells.size() == There.vecCells.size(),
                    "a line is read as if it were alone");
        }
        nBegin = nEnd + 1;
    }
    return nRecords;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    if (nSize < kOptionBytes || nSize > kMaxInput) {
        return 0;
    }
    ReadOptions How;
    How.eFormat = Format::kJsonLines;
    How.blKeepText = (pData[0] & 1) != 0;
    const std::string strText(reinterpret_cast<const char*>(pData) + kOptionBytes,
                              nSize - kOptionBytes);
    const ReadInput Found = ReadTwice(strText, pData[1], How);
    const bool blUtf16 = Found.Outcome.eEnd == ReadOutcome::End::kFailed;
    Require(!blUtf16 || Found.vecRecords.empty(), "lines have no failure that ends all");
    for (const ReadRecord& Each : Found.vecRecords) {
        Json::Value jRecord;
        if (!Each.blBad && How.blKeepText && ParseStrictly(Each.strText, jRecord)) {
            Require(IsRecord(Each, jRecord), "a record is what its line says");
        }
    }
    // A byte order mark, and zeros that tell an encoding, count at the input's begin alone.
    constexpr std::string_view kEncodingBytes("\xEF\xFE\xFF\0", 4);
    if (strText.find_first_of(kEncodingBytes) == std::string::npos) {
        Require(ReadAlone(strText, How, Found) == Found.vecRecords.size(), "no record is made up");
    }
    return 0;
}
