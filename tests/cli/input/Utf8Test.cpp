// What is text: looked at in steps of several bytes, and character by character.

#include <string>

#include <gtest/gtest.h>

#include "../../../cli/input/Utf8.h"

namespace VORN_JSON_DB::Cli {

namespace {

// One character after the other.
size_t FindSlowly(std::string_view strBytes, std::int32_t nLeast) {
    for (size_t i = 0; i < strBytes.size();) {
        std::int32_t nCode = 0;
        const size_t nLength = ReadCharacter(strBytes.substr(i), nCode);
        if (nCode < nLeast) {
            return i;
        }
        i += nLength;
    }
    return std::string_view::npos;
}

// In the middle of a step, across two, and at the end of a text.
TEST(Utf8, TwoBytesOfAllKindsAtEachPlace) {
    for (unsigned nPair = 0; nPair < 0x10000; ++nPair) {
        const std::string strPair = {static_cast<char>(nPair >> 8), static_cast<char>(nPair)};
        for (const size_t nPlace : {2U, 7U, 15U}) {
            std::string strText(19, 'x');
            strText.replace(nPlace, 2, strPair);
            ASSERT_EQ(FindNoUtf8(strText), FindSlowly(strText, 0)) << nPair << " at " << nPlace;
            ASSERT_EQ(IsUtf8WithoutControls(strText),
                      FindSlowly(strText, ' ') == std::string_view::npos)
                << nPair << " at " << nPlace;
            strText.resize(nPlace + 2);
            ASSERT_EQ(FindNoUtf8(strText), FindSlowly(strText, 0)) << nPair << " at " << nPlace;
        }
    }
}

TEST(Utf8, CharactersOfEachLengthOneAfterAnother) {
    const std::string strAll =
        "x\xC2\x80\xDF\xBF\xE0\xA0\x80\xED\x9F\xBF\xEF\xBF\xBF\xF0\x90\x80\x80 "
        "\xF4\x8F\xBF\xBF\xC3\xA9";
    for (size_t nBefore = 0; nBefore < 17; ++nBefore) {
        const std::string strText = std::string(nBefore, 'y') + strAll + strAll;
        EXPECT_EQ(FindNoUtf8(strText), std::string::npos) << nBefore;
        for (size_t nCut = 0; nCut < strText.size(); ++nCut) {
            const std::string strCut = strText.substr(0, nCut);
            EXPECT_EQ(FindNoUtf8(strCut), FindSlowly(strCut, 0)) << nBefore << " cut at " << nCut;
        }
    }
    EXPECT_EQ(FindNoUtf8(strAll + "\xED\xA0\x80"), strAll.size());
    EXPECT_EQ(WithoutBadBytes(strAll + "\xC3" + strAll + "\xBF"),
              strAll + "\xEF\xBF\xBD" + strAll + "\xEF\xBF\xBD");
}

}  // namespace

}  // namespace VORN_JSON_DB::Cli
