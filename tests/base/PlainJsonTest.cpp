// The fast reader and writer against JsonCpp's own: whatever they accept must come out the same.

#include <limits>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <json/json.h>

#include "../../src/base/PlainJson.h"
#include "../support/JsonHelpers.h"

using namespace jsonhelpers;

namespace {

const char* const kPlainTexts[] = {
    "null",
    "true",
    "false",
    "0",
    "-0",
    "7",
    "-7",
    "2147483648",
    "-2147483649",
    "999999999999999999",
    "-999999999999999999",
    "\"\"",
    "\"text\"",
    "\"O'Neil 100%\"",
    "\"Gr\xc3\xbc\xc3\x9f"
    "e \xf0\x9f\x8c\x8d\"",
    "\"\x7f\"",
    "[]",
    "{}",
    "[1,\"two\",3]",
    "[[],[[]],{}]",
    "{\"a\":1,\"b\":[true,null],\"\":{}}",
    "{\"b\":1,\"a\":2}",
    "{\"a\":[1],\"a\":{\"b\":2}}",
    "[[[[[[[[1]]]]]]]]",
    "{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":1}}}}}}}}",
};

TEST(PlainJson, PlainTextsReadAsJsonCppReadsThem) {
    for (const char* szText : kPlainTexts) {
        Json::Value jRead;
        ASSERT_TRUE(vornjsondb::ReadPlainJson(szText, std::strlen(szText), jRead)) << szText;
        Json::Value jExpected;
        ASSERT_TRUE(Parse(szText, jExpected)) << szText;
        EXPECT_EQ(jRead, jExpected) << szText;
        EXPECT_EQ(KindsOf(jRead), KindsOf(jExpected)) << szText;
    }
}

TEST(PlainJson, ValuesAreWrittenAsJsonCppWritesThem) {
    for (const char* szText : kPlainTexts) {
        const Json::Value jValue = ReadLeniently(szText);
        vornjsondb::TextBuffer Written;
        ASSERT_TRUE(vornjsondb::WritePlainJson(jValue, Written)) << szText;
        EXPECT_EQ(Written.View(), Compact(jValue)) << szText;
    }
}

// Values that no parser makes: reals that are whole, texts that are no UTF-8, arrays that do not
// store all of their elements.
std::vector<Json::Value> ValuesThatNoParserMakes() {
    using Real = std::numeric_limits<double>;
    std::vector<Json::Value> vecValues;
    for (const double dReal :
         {0.0, -0.0, 3.0, -7.0, 1e15, 1e16, 1e17, -1e300, 5e-324, 9223372036854775808.0,
          Real::infinity(), -Real::infinity(), Real::quiet_NaN()}) {
        vecValues.emplace_back(dReal);
    }
    vecValues.emplace_back(std::numeric_limits<Json::Int64>::min());
    vecValues.emplace_back(std::numeric_limits<Json::UInt64>::max());
    vecValues.emplace_back(Json::UInt64(7));
    vecValues.emplace_back(Json::StaticString("not copied"));
    const std::string aTexts[] = {"",
                                  std::string("a\0b", 3),
                                  std::string(1, '\0'),
                                  "\x01",
                                  "\x1f",
                                  "\x7f",
                                  "\x80",
                                  "\xc3",
                                  "\xff\xfe",
                                  "\xc0\xaf",
                                  "\xed\xa0\x80",
                                  "\xf4\x90\x80\x80",
                                  "a\xe2\x82",
                                  "\"\\/"};
    for (const std::string& strText : aTexts) {
        vecValues.emplace_back(strText);
        vecValues.emplace_back(Json::objectValue);
        vecValues.back()[strText] = 1;
    }
    for (const Json::ArrayIndex nIndex : {0U, 1U, 5U}) {
        vecValues.emplace_back(Json::arrayValue);
        vecValues.back()[nIndex]["o"][nIndex] = 7;
        vecValues.emplace_back(Json::arrayValue);
        vecValues.back().resize(nIndex);
    }
    return vecValues;
}

Json::Value WithComments(Json::Value jValue) {
    jValue.setComment(std::string("// before"), Json::commentBefore);
    jValue.setComment(std::string("// behind"), Json::commentAfterOnSameLine);
    jValue.setComment(std::string("/* after */"), Json::commentAfter);
    jValue.setOffsetStart(3);
    return jValue;
}

// The fast writer may leave such a value to JsonCpp, but not write it otherwise.
TEST(PlainJson, ValuesThatNoParserMakesAreWrittenAsJsonCppWritesThem) {
    for (const Json::Value& jOne : ValuesThatNoParserMakes()) {
        Json::Value jList(Json::arrayValue);
        jList.append(WithComments(jOne));
        jList.append(jOne);
        for (const Json::Value& jValue : {jOne, WithComments(jOne), jList}) {
            vornjsondb::TextBuffer Written;
            if (vornjsondb::WritePlainJson(jValue, Written)) {
                EXPECT_EQ(Written.View(), Compact(jValue));
            }
        }
    }
}

TEST(PlainJson, WritingAppendsToTheText) {
    vornjsondb::TextBuffer Written;
    Written.Append("limit ");
    ASSERT_TRUE(vornjsondb::WritePlainJson(Json::Value(5), Written));
    EXPECT_EQ(Written.View(), "limit 5");
}

TEST(PlainJson, TextsOutOfTheOrdinaryAreLeftToJsonCpp) {
    const char* const szOthers[] = {
        "",
        " ",
        " 1",
        "1 ",
        "[1, 2]",
        "{\"a\" :1}",
        "01",
        "-",
        "-a",
        "00",
        "1.5",
        "1e3",
        "1x",
        "+1",
        "[",
        "[1",
        "[1,",
        "[1,]",
        "[,]",
        "[1}",
        "]",
        "{",
        "{\"a\"",
        "{\"a\":",
        "{\"a\":1",
        "{\"a\":1,",
        "{\"a\":1,}",
        "{a:1}",
        "{\"a\"}",
        "{1:2}",
        "{\"a\":1]",
        "\"",
        "\"a",
        "\"a\\n\"",
        "\"\t\"",
        "tru",
        "nul",
        "falsey",
        "nullx",
        "NaN",
        "// comment\n1",
        "[1]x",
        "1000000000000000000",
        "-1000000000000000000",
        "[[[[[[[[[1]]]]]]]]]",
        "[[[[[[[[[]]]]]]]]]",
        "{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":1}}}}}}}}}",
        "{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{}}}}}}}}}",
        "{\"a\\\"\":1}",
        // A part that is plain again behind one that is not.
        "[01,[]]",
        "{\"a\":01,\"b\":{}}",
        "{\"a\"[]}",
    };
    for (const char* szText : szOthers) {
        Json::Value jRead = "before";
        EXPECT_FALSE(vornjsondb::ReadPlainJson(szText, std::strlen(szText), jRead)) << szText;
        EXPECT_EQ(jRead, "before") << szText;
    }
}

TEST(PlainJson, ValuesOutOfTheOrdinaryAreLeftToJsonCpp) {
    const Json::Value jOthers[] = {
        Json::Value(1.5),
        Json::Value(3.0),
        Json::Value(Json::UInt64(5)),
        Json::Value("a \"quoted\" word"),
        Json::Value("a\\b"),
        Json::Value("a\nb"),
        Json::Value(std::string("a\0b", 3)),
        ReadLeniently("{\"a\\\"b\":1}"),
        ReadLeniently("[[1,[2.5]]]"),
        ReadLeniently("[[[[[[[[[1]]]]]]]]]"),
        ReadLeniently(R"({"a":{"a":{"a":{"a":{"a":{"a":{"a":{"a":{"a":1}}}}}}}}})"),
    };
    for (const Json::Value& jValue : jOthers) {
        vornjsondb::TextBuffer Written;
        EXPECT_FALSE(vornjsondb::WritePlainJson(jValue, Written)) << Compact(jValue);
    }
}

}  // namespace
