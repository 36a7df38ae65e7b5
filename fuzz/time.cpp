// The input is a time stamp (8 bytes), the type bits (4) and a time zone (1).

#include <cstdlib>
#include <cstring>
#include <ctime>

#include "FuzzHost.h"

using namespace fuzzhost;

namespace {

constexpr const char* kZones[] = {"UTC0", "CET-1CEST,M3.5.0,M10.5.0/3", "XXX14", "YYY-14:30", ":"};

// Reads back what the two UTC forms say.
void CheckText(long now, const std::string& strText, int iType) {
    struct tm Time = {};
    const bool blLong = (iType & 2) != 0;
    const char* szForm = blLong ? "%a, %d %b %Y %T GMT" : "%Y-%m-%d %H:%M:%S";
    const char* szEnd = strptime(strText.c_str(), szForm, &Time);
    Require(szEnd != nullptr && *szEnd == '\0', "the text has the documented form");
    Require(timegm(&Time) == now, "the text names the given second");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    if (nSize != 13) {
        return 0;
    }
    static Database s_Db("CREATE TABLE t(a)");
    int64_t nNow = 0;
    int iType = 0;
    std::memcpy(&nNow, pData, sizeof(nNow));
    std::memcpy(&iType, pData + sizeof(nNow), sizeof(iType));
    setenv("TZ", kZones[pData[12] % 5U], 1);
    tzset();

    const long now = static_cast<long>(nNow);
    std::string strText = "before";
    const int nResult =
        Call(s_Db, [&] { return VORN_JSON_DB::convert2ReadableTime(now, strText, iType); });
    Require(nResult == 0 || nResult == -1, "the answer is 0 or -1");
    Require((iType & 6) != 0 || nResult == -1, "without a form there is no text");
    Require(nResult == 0 || strText == "before", "a failure leaves the output");
    // Four digits of the year are what strptime reads.
    if (nResult == 0 && (iType & 1) != 0 && now > -62135596800 && now < 253402300800) {
        CheckText(now, strText, iType);
    }
    Call(s_Db, [&] { return VORN_JSON_DB::getTimeAfterNow(iType, strText, pData[12]); });
    return 0;
}
