// A strftime that can be made to write nothing: no real date is longer than the library's buffer.

#include <VornJsonDbApi.h>

#include <dlfcn.h>

#include <clocale>
#include <ctime>
#include <string>

#include "../support/TestHost.h"

using namespace testhost;

namespace {

bool g_blWritesNothing = false;
const char* g_szNames = nullptr;  // written instead of the text, as a locale's own names would be
size_t g_nMax = 0;
int g_nLocaleCalls = 0;

}  // namespace

// The library must leave the locale to the host.
extern "C" char* setlocale(int nCategory, const char* szLocale) noexcept {
    using Setlocale = char* (*)(int, const char*);
    static const auto fnReal = reinterpret_cast<Setlocale>(dlsym(RTLD_NEXT, "setlocale"));
    ++g_nLocaleCalls;
    return fnReal(nCategory, szLocale);
}
extern "C" locale_t uselocale(locale_t pLocale) noexcept {
    using Uselocale = locale_t (*)(locale_t);
    static const auto fnReal = reinterpret_cast<Uselocale>(dlsym(RTLD_NEXT, "uselocale"));
    ++g_nLocaleCalls;
    return fnReal(pLocale);
}

extern "C" size_t strftime(char* szText, size_t nMax, const char* szFormat,
                           const struct tm* pTime) {
    using Strftime = size_t (*)(char*, size_t, const char*, const struct tm*);
    static const auto fnReal = reinterpret_cast<Strftime>(dlsym(RTLD_NEXT, "strftime"));
    g_nMax = nMax;
    if (g_szNames != nullptr) {
        return fnReal(szText, nMax, g_szNames, pTime);
    }
    return g_blWritesNothing ? 0 : fnReal(szText, nMax, szFormat, pTime);
}

namespace {

Lines LogOfARefusedText(int nType) {
    TakeLog();
    std::string strOut = "as it was";
    g_blWritesNothing = true;
    EXPECT_EQ(VORN_JSON_DB::convert2ReadableTime(0, strOut, nType), -1);
    g_blWritesNothing = false;
    EXPECT_EQ(strOut, "as it was");
    return TakeLog();
}

TEST(TimeTextLimit, DateLayoutThatWritesNothingIsRefused) {
    EXPECT_EQ(
        LogOfARefusedText(3),
        Lines{UtilCheck("0 == strftime(szTime, sizeof(szTime), \"%a, %d %b %Y %T GMT\", &sTime)")});
}

TEST(TimeTextLimit, NumericLayoutThatWritesNothingIsRefused) {
    EXPECT_EQ(
        LogOfARefusedText(5),
        Lines{UtilCheck("0 == strftime(szTime, sizeof(szTime), \"%Y-%m-%d %H:%M:%S\", &sTime)")});
}

TEST(TimeTextLimit, NamesAreThoseThatTheLocaleOfTheHostWrites) {
    std::string strOut;
    g_nLocaleCalls = 0;
    g_szNames = "dim., %d novembre %Y";
    EXPECT_EQ(VORN_JSON_DB::convert2ReadableTime(1794742200, strOut, 3), 0);
    g_szNames = nullptr;
    EXPECT_EQ(strOut, "dim., 15 novembre 2026");
    EXPECT_EQ(g_nLocaleCalls, 0);
}

TEST(TimeTextLimit, TextMayHave1023Characters) {
    std::string strOut;
    EXPECT_EQ(VORN_JSON_DB::convert2ReadableTime(0, strOut, 3), 0);
    EXPECT_EQ(g_nMax, 1024U);
    g_nMax = 0;
    EXPECT_EQ(VORN_JSON_DB::convert2ReadableTime(0, strOut, 5), 0);
    EXPECT_EQ(g_nMax, 1024U);
}

}  // namespace
