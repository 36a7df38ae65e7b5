// getTimeAfterNow and convert2ReadableTime.
#include <cstdlib>
#include <ctime>
#include <limits>

#include "../support/TableTest.h"

using namespace testhost;

namespace {

constexpr long kStamp = 1794742200;  // 2026-11-15 11:30:00 UTC, a Sunday

class TimeTextTest : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        const char* szZone = std::getenv("TZ");
        m_blHadZone = szZone != nullptr;
        m_strZone = m_blHadZone ? szZone : "";
        SetZone("UTC0");
    }

    void TearDown() override {
        if (m_blHadZone) {
            SetZone(m_strZone.c_str());
        } else {
            ::unsetenv("TZ");
            ::tzset();
        }
        TableTest::TearDown();
    }

    static void SetZone(const char* szZone) {
        ::setenv("TZ", szZone, 1);
        ::tzset();
    }

    // The text of a stamp; the call must succeed.
    static std::string Text(long nStamp, int iType) {
        std::string strOut = "before";
        EXPECT_EQ(VORN_JSON_DB::convert2ReadableTime(nStamp, strOut, iType), 0);
        EXPECT_EQ(TakeLog(), Lines());
        return strOut;
    }

    static void ExpectRefused(long nStamp, int iType, const Lines& vecLog) {
        std::string strOut = "before";
        EXPECT_EQ(VORN_JSON_DB::convert2ReadableTime(nStamp, strOut, iType), -1);
        EXPECT_EQ(strOut, "before");
        EXPECT_EQ(TakeLog(), vecLog);
    }

  private:
    bool m_blHadZone = false;
    std::string m_strZone;
};

std::string BadType(int iType) {
    return UtilLocated("bad iType value=" + std::to_string(iType));
}

}  // namespace

TEST_F(TimeTextTest, TypeThreeIsTheDateLayoutInUtc) {
    SetZone("XXX-1");
    EXPECT_EQ(Text(0, 3), "Thu, 01 Jan 1970 00:00:00 GMT");
    EXPECT_EQ(Text(kStamp, 3), "Sun, 15 Nov 2026 11:30:00 GMT");
}

TEST_F(TimeTextTest, TypeFiveIsTheNumericLayoutInUtc) {
    SetZone("XXX-1");
    EXPECT_EQ(Text(0, 5), "1970-01-01 00:00:00");
    EXPECT_EQ(Text(kStamp, 5), "2026-11-15 11:30:00");
}

TEST_F(TimeTextTest, TypeFourIsTheNumericLayoutInLocalTime) {
    SetZone("XXX-1");
    EXPECT_EQ(Text(kStamp, 4), "2026-11-15 12:30:00");
    SetZone("XXX+5:30");
    EXPECT_EQ(Text(kStamp, 4), "2026-11-15 06:00:00");
}

TEST_F(TimeTextTest, TypeTwoIsLocalTimeUnderTheNameOfGmt) {
    SetZone("XXX-1");
    EXPECT_EQ(Text(kStamp, 2), "Sun, 15 Nov 2026 12:30:00 GMT");
    EXPECT_EQ(Text(0, 2), "Thu, 01 Jan 1970 01:00:00 GMT");
}

TEST_F(TimeTextTest, DateLayoutWinsOverTheNumericOne) {
    SetZone("XXX-1");
    EXPECT_EQ(Text(kStamp, 6), "Sun, 15 Nov 2026 12:30:00 GMT");
    EXPECT_EQ(Text(kStamp, 7), "Sun, 15 Nov 2026 11:30:00 GMT");
}

TEST_F(TimeTextTest, OtherBitsAreIgnored) {
    SetZone("XXX-1");
    EXPECT_EQ(Text(kStamp, 8 | 3), "Sun, 15 Nov 2026 11:30:00 GMT");
    EXPECT_EQ(Text(kStamp, 0x7ffffff0 | 4), "2026-11-15 12:30:00");
    EXPECT_EQ(Text(kStamp, -1), "Sun, 15 Nov 2026 11:30:00 GMT");
}

TEST_F(TimeTextTest, LayoutBitsBothClearAreRefused) {
    for (const int iType : {0, 1, 8, 9, -8}) {
        ExpectRefused(kStamp, iType, {BadType(iType)});
    }
}

TEST_F(TimeTextTest, LocalTimeFollowsSummerTime) {
    SetZone("CET-1CEST,M3.5.0,M10.5.0/3");
    EXPECT_EQ(Text(1782000000, 4), "2026-06-21 02:00:00");
    EXPECT_EQ(Text(kStamp, 4), "2026-11-15 12:30:00");
}

TEST_F(TimeTextTest, StampsBeforeTheEpochAreWritten) {
    EXPECT_EQ(Text(-1, 5), "1969-12-31 23:59:59");
    EXPECT_EQ(Text(-1, 3), "Wed, 31 Dec 1969 23:59:59 GMT");
}

TEST_F(TimeTextTest, LargestStampOfThirtyTwoBitsIsWritten) {
    EXPECT_EQ(Text(2147483647L, 5), "2038-01-19 03:14:07");
    EXPECT_EQ(Text(2147483647L, 3), "Tue, 19 Jan 2038 03:14:07 GMT");
}

TEST_F(TimeTextTest, TextReplacesWhatTheStringHeld) {
    std::string strOut(5000, 'x');
    EXPECT_EQ(VORN_JSON_DB::convert2ReadableTime(0, strOut, 5), 0);
    EXPECT_EQ(strOut, "1970-01-01 00:00:00");
}

// A stamp of 64 bits may lie beyond the years that can be counted; one of 32 bits never does.
TEST_F(TimeTextTest, StampBeyondTheCalendarFailsBeforeTheLayoutIsLookedAt) {
    const long nStamp = std::numeric_limits<long>::max();
    if (sizeof(long) == 4) {
        EXPECT_EQ(Text(nStamp, 5), "2038-01-19 03:14:07");
        ExpectRefused(nStamp, 1, {BadType(1)});
        return;
    }
    for (const int iType : {1, 3, 5}) {
        ExpectRefused(nStamp, iType, {UtilCheck("NULL == gmtime_r(&ullTimeStamp, &sTime)")});
    }
    for (const int iType : {0, 2, 4}) {
        ExpectRefused(nStamp, iType, {UtilCheck("NULL == localtime_r(&ullTimeStamp, &sTime)")});
    }
}

TEST_F(TimeTextTest, NumberIsTheTimeNowPlusTheOffset) {
    for (const int nOffset : {0, 86400, -86400, 1, -1}) {
        long nNow = 12345;
        const long nBefore = static_cast<long>(std::time(nullptr));
        EXPECT_EQ(VORN_JSON_DB::getTimeAfterNow(nOffset, nNow), 0);
        const long nAfter = static_cast<long>(std::time(nullptr));
        EXPECT_LE(nBefore + nOffset, nNow);
        EXPECT_GE(nAfter + nOffset, nNow);
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(TimeTextTest, TextFormWritesTheSameTimeAsTheNumberForm) {
    SetZone("XXX-1");
    for (const int nOffset : {0, 86400, -86400}) {
        for (const int iType : {2, 3, 4, 5}) {
            std::string strOut;
            std::time_t nBefore = 0;
            std::time_t nAfter = 1;
            while (nBefore != nAfter) {  // until the call lies within one second
                nBefore = std::time(nullptr);
                EXPECT_EQ(VORN_JSON_DB::getTimeAfterNow(nOffset, strOut, iType), 0);
                nAfter = std::time(nullptr);
            }
            EXPECT_EQ(strOut, Text(static_cast<long>(nBefore) + nOffset, iType));
        }
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(TimeTextTest, TextFormWithoutALayoutLogsTwoLines) {
    for (const int iType : {0, 1}) {
        std::string strOut = "before";
        EXPECT_EQ(VORN_JSON_DB::getTimeAfterNow(60, strOut, iType), -1);
        EXPECT_EQ(strOut, "before");
        EXPECT_EQ(TakeLog(), (Lines{BadType(iType),
                                    UtilCheck("0 > convert2ReadableTime(now, strOut, iType)")}));
    }
}
