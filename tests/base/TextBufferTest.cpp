// A text that is written piece by piece, in the buffer itself and beyond it.

#include <string>

#include <gtest/gtest.h>

#include "../../src/base/TextBuffer.h"

namespace {

using vornjsondb::TextBuffer;

constexpr size_t kUsual = 512;  // what the buffer itself has room for, with the NUL

std::string Letters(size_t nLength) {
    std::string strText;
    for (size_t i = 0; i < nLength; ++i) {
        strText += static_cast<char>('a' + i % 26);
    }
    return strText;
}

TEST(TextBufferTest, IsEmptyAtFirst) {
    TextBuffer Text;
    EXPECT_TRUE(Text.IsEmpty());
    EXPECT_EQ(Text.Length(), 0U);
    EXPECT_STREQ(Text.CStr(), "");
}

TEST(TextBufferTest, PiecesFollowEachOther) {
    TextBuffer Text;
    Text.Append("SELECT ").Append('*').Append(std::string(" FROM t")).Append("");
    EXPECT_FALSE(Text.IsEmpty());
    EXPECT_EQ(Text.View(), "SELECT * FROM t");
    EXPECT_STREQ(Text.CStr(), "SELECT * FROM t");
}

TEST(TextBufferTest, NulIsAByteAsAnyOther) {
    TextBuffer Text;
    Text.Append(std::string("a\0b", 3));
    EXPECT_EQ(Text.Terminated(), std::string("a\0b", 3));
}

TEST(TextBufferTest, LastTextThatFitsLiesInTheBufferItself) {
    TextBuffer Text;
    Text.Append(Letters(kUsual - 1));
    const char* const pBefore = Text.CStr();
    EXPECT_GE(pBefore, reinterpret_cast<const char*>(&Text));
    EXPECT_LT(pBefore, reinterpret_cast<const char*>(&Text + 1));
    Text.Append('x');
    EXPECT_NE(Text.CStr(), pBefore);
    EXPECT_EQ(Text.View(), Letters(kUsual - 1) + 'x');
}

TEST(TextBufferTest, GrowsWithPiecesOfAnyLength) {
    for (const size_t nPiece : {1U, 2U, 511U, 512U, 513U, 5000U}) {
        TextBuffer Text;
        std::string strExpected;
        while (strExpected.length() < 20000) {
            Text.Append(Letters(nPiece));
            strExpected += Letters(nPiece);
            ASSERT_EQ(Text.CStr(), strExpected) << nPiece;
        }
    }
}

TEST(TextBufferTest, WhatEndsAStatementHasRoomBehindALongPiece) {
    TextBuffer Text;
    Text.Append(Letters(100000));
    const char* const pBefore = Text.CStr();
    Text.Append(Letters(500));
    EXPECT_EQ(Text.CStr(), pBefore);
}

TEST(TextBufferTest, CutLeavesTheBeginning) {
    TextBuffer Text;
    Text.Append("UPDATE t SET a=1");
    Text.Cut(13);
    EXPECT_EQ(Text.Terminated(), "UPDATE t SET ");
    Text.Append("b=2");
    EXPECT_STREQ(Text.CStr(), "UPDATE t SET b=2");
    Text.Cut(0);
    EXPECT_TRUE(Text.IsEmpty());
}

TEST(TextBufferTest, TakesWhatTheOtherHas) {
    for (const size_t nBefore : {0U, 10U, 1000U}) {
        for (const size_t nTaken : {0U, 20U, 2000U}) {
            TextBuffer Text;
            Text.Append(std::string(nBefore, '.'));
            TextBuffer Other;
            Other.Append(Letters(nTaken));
            Text.Take(Other);
            EXPECT_EQ(Text.Terminated(), Letters(nTaken)) << nBefore;
            EXPECT_EQ(Other.Terminated(), "") << nBefore << ' ' << nTaken;
            // Each is a whole buffer still.
            Text.Append(Letters(3000));
            Other.Append(Letters(600)).Append('!');
            EXPECT_EQ(Text.Terminated(), Letters(nTaken) + Letters(3000)) << nBefore;
            EXPECT_EQ(Other.Terminated(), Letters(600) + '!') << nBefore << ' ' << nTaken;
        }
    }
}

TEST(TextBufferTest, LongTextIsTakenWithoutACopy) {
    TextBuffer Long;
    Long.Append(Letters(2000));
    const char* const pText = Long.CStr();
    TextBuffer Text;
    Text.Take(Long);
    EXPECT_EQ(Text.CStr(), pText);
}

}  // namespace
