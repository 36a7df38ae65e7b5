// The input is a text that holds anything, then the values that follow it, each behind a byte 1.
// What the scanner accepts is compared with sqlite3_mprintf itself, given arguments that nobody may
// take, and what it refuses holds a conversion.

#include "../src/base/SqlText.h"
#include "../src/sql/AccumulatedFormat.h"
#include "FuzzHost.h"
#include "JsonValues.h"

using namespace fuzzhost;
using vornjsondb::AccumulatedFormat;
using vornjsondb::SqlText;

namespace {

// Two sets of surplus arguments: when both give the same text, none of them was taken.
std::string Formatted(const std::string& strFormat, const char* szValue) {
    const SqlText szOne(sqlite3_mprintf(strFormat.c_str(), szValue, "<1>", "<2>", "<3>"));
    const SqlText szTwo(sqlite3_mprintf(strFormat.c_str(), szValue, "<44>", "<5>", "<666>"));
    Require(szOne && szTwo, "the formatter gives a text");
    Require(std::string(szOne.get()) == szTwo.get(), "no argument is taken that was not passed");
    return szOne.get();
}

// Percent signs in a row make pairs; an odd one takes what follows it.
bool HoldsConversion(const std::string& strFormat) {
    size_t nSigns = 0;
    for (const char* p = strFormat.c_str(); *p != '\0'; ++p) {
        if (*p != '%' && nSigns % 2 == 1) {
            return true;
        }
        nSigns = *p == '%' ? nSigns + 1 : 0;
    }
    return false;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    if (nSize > kMaxInput) {
        return 0;
    }
    const std::string strInput(reinterpret_cast<const char*>(pData), nSize);
    size_t nEnd = strInput.find('\1');
    std::string strModel = strInput.substr(0, nEnd);
    AccumulatedFormat Text(strModel);
    const vornjsondb::MemberType& Type =
        vornjsondb::TypeOfMember(Definition("t", "a:string")["t"]["member"]["a"]);

    for (int i = 0; i < 8 && nEnd != std::string::npos; ++i) {
        const size_t nBegin = nEnd + 1;
        nEnd = strInput.find('\1', nBegin);
        const std::string strValue =
            strInput.substr(nBegin, nEnd == std::string::npos ? std::string::npos : nEnd - nBegin);
        Require(Text.HoldsConversion() == HoldsConversion(strModel), "a conversion is refused");
        if (Text.HoldsConversion()) {
            return 0;
        }
        Text.Format(Type, Json::Value(strValue));
        // The text alone takes no argument, not even the value's.
        Require(Formatted(strModel, "<0>") == Formatted(strModel, "<00>"), "the text is plain");
        strModel = Formatted(strModel + Type.szSpecifier, strValue.c_str());
        Require(Text.Text().View() == strModel, "the text is what the formatter makes of it");
        Text.Append(",");
        strModel += ",";
    }
    return 0;
}
