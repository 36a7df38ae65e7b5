// The input is a JSON text or a hostile value. Where the fast reader or writer takes it, JsonCpp's
// own must agree.

#include "../src/base/JsonText.h"
#include "../src/base/PlainJson.h"
#include "FuzzHost.h"
#include "JsonValues.h"

using namespace fuzzhost;

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    Json::Value jExpected;
    if (nSize > kMaxInput) {
        return 0;
    }
    const bool blTaken = TakeValue(pData, nSize, jExpected);
    const std::string strText(reinterpret_cast<const char*>(pData), nSize);
    Json::Value jRead;
    if (vornjsondb::ReadPlainJson(strText.c_str(), strText.length(), jRead)) {
        Require(blTaken, "what is read is JSON");
        Require(Same(jRead, jExpected), "the values are equal");
    }
    if (!blTaken) {
        return 0;
    }
    const std::string strExpected = Compact(jExpected);
    vornjsondb::TextBuffer Written;
    if (vornjsondb::WritePlainJson(jExpected, Written)) {
        Require(Written.View() == strExpected, "the texts are equal");
    }
    Require(vornjsondb::ToString(jExpected) == strExpected, "what is not plain is written, too");
    return 0;
}
