// The input is a JSON text. Where the fast reader or writer takes it, JsonCpp's own must agree.

#include "../src/base/PlainJson.h"
#include "FuzzHost.h"

using namespace fuzzhost;

namespace {

std::string KindsOf(const Json::Value& jValue) {
    std::string strKinds = std::to_string(jValue.type());
    for (const Json::Value& jChild : jValue) {
        strKinds += '(' + KindsOf(jChild) + ')';
    }
    return strKinds;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    // A C string, as a column's text is.
    const std::string strText(reinterpret_cast<const char*>(pData), nSize);
    if (nSize > kMaxInput || strText.find('\0') != std::string::npos) {
        return 0;
    }
    Json::Value jExpected;
    const bool blParsed = Parse(strText, jExpected);
    Json::Value jRead;
    if (vornjsondb::ReadPlainJson(strText.c_str(), strText.length(), jRead)) {
        Require(blParsed, "what is read is JSON");
        Require(jRead == jExpected && KindsOf(jRead) == KindsOf(jExpected), "the values are equal");
    }
    std::string strWritten;
    if (blParsed && vornjsondb::WritePlainJson(jExpected, strWritten)) {
        Require(strWritten == Compact(jExpected), "the texts are equal");
    }
    return 0;
}
