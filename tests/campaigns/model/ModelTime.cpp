// The model's time texts, by arithmetic.

#include <cerrno>
#include <cstdio>

#include "Model.h"

namespace campaign {

namespace {

constexpr long long kSecondsOfDay = 86400;
constexpr long long kLastYear = 2147483647LL + 1900;  // as far as the C library's years go

struct Date {
    long long nYear;
    int nMonth;  // from 0
    int nDay;
    int nWeekDay;  // from Sunday, 0
    int nSecond;   // of the day
};

bool IsLeap(long long nYear) {
    return (nYear % 4 == 0 && nYear % 100 != 0) || nYear % 400 == 0;
}

Date DateOf(long long nSeconds) {
    long long nDay = nSeconds / kSecondsOfDay;
    Date date = {1970, 0, 0, static_cast<int>((nDay + 4) % 7),
                 static_cast<int>(nSeconds % kSecondsOfDay)};
    while (nDay >= (IsLeap(date.nYear) ? 366 : 365)) {
        nDay -= IsLeap(date.nYear++) ? 366 : 365;
    }
    const int anDays[] = {31, IsLeap(date.nYear) ? 29 : 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    while (nDay >= anDays[date.nMonth]) {
        nDay -= anDays[date.nMonth++];
    }
    date.nDay = static_cast<int>(nDay) + 1;
    return date;
}

}  // namespace

int ModelTimeText(long nStamp, std::string& strOut, int nType) {
    const bool blUtc = (nType & 1) != 0;
    if (static_cast<long long>(nStamp) / (366 * kSecondsOfDay) > kLastYear) {
        Host().nErrno = EOVERFLOW;
        Host().UtilFails(true, blUtc ? "NULL == gmtime_r(&ullTimeStamp, &sTime)"
                                     : "NULL == localtime_r(&ullTimeStamp, &sTime)");
        return -1;
    }
    if ((nType & 6) == 0) {
        Host().UtilLocated("bad iType value=%d", {nType});
        return -1;
    }
    const Date date = DateOf(static_cast<long long>(nStamp) + (blUtc ? 0 : 3600));
    char szClock[32];
    char szOut[96];
    std::snprintf(szClock, sizeof(szClock), "%02d:%02d:%02d", date.nSecond / 3600,
                  date.nSecond / 60 % 60, date.nSecond % 60);
    if ((nType & 2) != 0) {
        static const char* const s_aszDays[] = {"Sun", "Mon", "Tue", "Wed", "Thu", "Fri", "Sat"};
        static const char* const s_aszMonths[] = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                                  "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
        std::snprintf(szOut, sizeof(szOut), "%s, %02d %s %lld %s GMT", s_aszDays[date.nWeekDay],
                      date.nDay, s_aszMonths[date.nMonth], date.nYear, szClock);
    } else {
        std::snprintf(szOut, sizeof(szOut), "%lld-%02d-%02d %s", date.nYear, date.nMonth + 1,
                      date.nDay, szClock);
    }
    strOut = szOut;
    return 0;
}

int ModelTimeAfterNow(long nStamp, std::string& strOut, int nType) {
    return Host().UtilFails(0 > ModelTimeText(nStamp, strOut, nType),
                            "0 > convert2ReadableTime(now, strOut, iType)")
               ? -1
               : 0;
}

}  // namespace campaign
