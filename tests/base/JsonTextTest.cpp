// JSON as the library writes and reads it, seen through stored values, statements and log lines.
#include <cstring>

#include "../../src/base/JsonText.h"
#include "../support/TableTest.h"

using namespace testhost;

namespace {

class JsonTextTest : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        Open("j:Json::objectValue");
    }

    // The text that stands in the column after a value was saved.
    std::string StoredAs(const Json::Value& jValue) {
        Json::Value jRecord(Json::objectValue);
        jRecord["j"] = jValue;
        EXPECT_EQ(m_pHandle->recSave(jRecord, true), 0);
        m_jBack = jRecord["j"];
        EXPECT_EQ(TakeLog(), Lines());
        return Rows("SELECT j FROM t ORDER BY rowid DESC LIMIT 1");
    }

    // The same for a value that comes back as it was.
    std::string Stored(const Json::Value& jValue) {
        const std::string strText = StoredAs(jValue);
        EXPECT_EQ(m_jBack, jValue);
        return strText;
    }

    Json::Value m_jBack;
};

}  // namespace

TEST_F(JsonTextTest, ObjectsAndArraysAreOneLineWithoutBlanks) {
    const std::string strText = R"({"a":[1,-2,[],{}],"b":{"c":null,"d":true,"e":false},"f":""})";
    EXPECT_EQ(Stored(ParseJson(strText)), strText);
}

TEST_F(JsonTextTest, EmptyObjectAndArrayAreTwoCharacters) {
    EXPECT_EQ(Stored(Json::Value(Json::objectValue)), "{}");
    EXPECT_EQ(Stored(Json::Value(Json::arrayValue)), "[]");
}

TEST_F(JsonTextTest, TextIsWrittenAsUtf8AndNotEscaped) {
    const std::string strText =
        "{\"k\xC3\xBC\":\"\xC3\xBC \xE2\x82\xAC \xF0\x9F\x98\x80 \xE6\x97\xA5\"}";
    EXPECT_EQ(Stored(ParseJson(strText)), strText);
}

TEST_F(JsonTextTest, QuotesBackslashesAndControlCharactersAreEscaped) {
    const std::string strText = R"({"a":"\"\\\n\t\r\b\f\u0001'/"})";
    EXPECT_EQ(Stored(ParseJson(strText)), strText);
}

// An array need not store all of its elements; one that it does not is a null.
TEST_F(JsonTextTest, ElementsThatAnArrayDoesNotStoreAreNulls) {
    Json::Value jArray(Json::arrayValue);
    jArray[2] = "x";
    EXPECT_EQ(StoredAs(jArray), R"([null,null,"x"])");
    jArray.resize(5);
    EXPECT_EQ(StoredAs(jArray), R"([null,null,"x",null,null])");
    EXPECT_TRUE(jArray[6].isNull());
    EXPECT_EQ(StoredAs(jArray), R"([null,null,"x",null,null,null,null])");
    Json::Value jNone(Json::arrayValue);
    jNone.resize(2);
    EXPECT_EQ(StoredAs(jNone), "[null,null]");
    Json::Value jNested(Json::objectValue);
    jNested["k"][1]["l"][1] = 7;
    EXPECT_EQ(StoredAs(jNested), R"({"k":[null,{"l":[null,7]}]})");
}

TEST_F(JsonTextTest, ElementsThatAnArrayDoesNotStoreAreNullsInLogLinesToo) {
    Json::Value jArray(Json::arrayValue);
    jArray[2] = "x";
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->recList(jArray, jRows), -1);
    EXPECT_EQ(TakeLog().at(1), Plain(R"(jRecParam=[null,null,"x"])"));
    Json::Value jFilter(Json::objectValue);
    jFilter["limit"][1] = 7;
    std::string strSql;
    EXPECT_EQ(m_pHandle->SqlFilterConditionFromJson(jFilter, strSql), 0);
    EXPECT_EQ(strSql, " LIMIT [null,7]");
}

TEST_F(JsonTextTest, WrittenTextIsThatOfTheWriterWhateverNeedsEscaping) {
    for (const char* szText : {R"({"k\"q":1,"l":2})", R"({"k":{"n\\":[1,"x"]},"l":2})",
                               R"({"k":"a\nb"})", R"({"k":["a\tb",{"":null}],"l":[]})"}) {
        EXPECT_EQ(Stored(ParseJson(szText)), szText);
    }
}

TEST_F(JsonTextTest, MembersAreWrittenInKeyOrder) {
    EXPECT_EQ(Stored(ParseJson(R"({"b":1,"a":2,"B":3,"10":4,"9":5})")),
              R"({"10":4,"9":5,"B":3,"a":2,"b":1})");
}

TEST_F(JsonTextTest, IntegersOfTheWholeRangeSurvive) {
    const std::string strText =
        R"([-9223372036854775808,9223372036854775807,18446744073709551615])";
    EXPECT_EQ(Stored(ParseJson(strText)), strText);
}

TEST_F(JsonTextTest, RealsComeBackAsTheSameNumbers) {
    Stored(ParseJson("[0.1,1.5,-2.25e-300,1e300,3.0,123456789.123456789]"));
}

TEST_F(JsonTextTest, LongTextsSurvive) {
    Json::Value jValue(Json::objectValue);
    jValue["a"] = std::string(300000, 'x');
    EXPECT_EQ(Stored(jValue), "{\"a\":\"" + std::string(300000, 'x') + "\"}");
}

TEST_F(JsonTextTest, JsonInLogLinesIsTheSameCompactText) {
    Json::Value jList = ParseJson("[{\"b\":[1, 2],\"a\":\"\xC3\xBC\\n\"}]");
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->recList(jList, jRows), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check("jRecParam.type() != Json::objectValue && "
                                      "jRecParam.type() != Json::nullValue"),
                                Plain("jRecParam=[{\"a\":\"\xC3\xBC\\n\",\"b\":[1,2]}]")}));
}

TEST_F(JsonTextTest, ScalarsInLogLinesAreTheirJsonText) {
    for (const char* szText : {"5", "-1", "true", "\"a\\\"b\"", "[]"}) {
        Json::Value jQuery = ParseJson(szText);
        Json::Value jRows;
        EXPECT_EQ(m_pHandle->recList(jQuery, jRows), -1);
        const Lines vecLog = TakeLog();
        ASSERT_EQ(vecLog.size(), 2U);
        EXPECT_EQ(vecLog[1], Plain("jRecParam=" + std::string(szText)));
    }
}

TEST_F(JsonTextTest, LimitAndOffsetAreTheirJsonText) {
    const auto tail = [this](const char* szFilter) {
        std::string strSql;
        Json::Value jFilter = ParseJson(szFilter);
        EXPECT_EQ(m_pHandle->SqlFilterConditionFromJson(jFilter, strSql), 0);
        return strSql;
    };
    EXPECT_EQ(tail(R"({"limit":10,"offset":20})"), " LIMIT 10 OFFSET 20");
    EXPECT_EQ(tail(R"({"limit":"10"})"), " LIMIT \"10\"");
    EXPECT_EQ(tail(R"({"limit":-1,"offset":null})"), " LIMIT -1 OFFSET null");
    EXPECT_EQ(tail(R"({"limit":[1,{"a":2}]})"), " LIMIT [1,{\"a\":2}]");
}

// Written by hand: of all other texts the reader decides (StoredJson).
TEST_F(JsonTextTest, ReaderDecodesEscapes) {
    Sql(R"(INSERT INTO t VALUES ('["\u00fc\ud83d\ude00\/\n"]'))");
    EXPECT_EQ(Listed()[0]["j"][0].asString(), "\xC3\xBC\xF0\x9F\x98\x80/\n");
}

TEST_F(JsonTextTest, CommentsOfAStoredTextAreNoPartOfTheValue) {
    Sql("INSERT INTO t VALUES ('// of the list\n[1.5]')");
    const Json::Value jRead = Listed()[0]["j"];
    EXPECT_EQ(Compact(jRead), "[1.5]");
    EXPECT_FALSE(jRead.hasComment(Json::commentBefore));
}

TEST_F(JsonTextTest, CommentsOfAValueAreNotWritten) {
    Json::Value jList(Json::arrayValue);
    jList.append(1.5);
    jList[0].setComment(std::string("// of the element"), Json::commentBefore);
    jList.setComment(std::string("// of the list"), Json::commentBefore);
    EXPECT_EQ(vornjsondb::JsonCodec().Write(jList), "[1.5]");
}

TEST_F(JsonTextTest, ReadingSaysWhetherTheTextIsJson) {
    vornjsondb::JsonCodec Codec;
    Json::Value jRead;
    for (const char* szText : {"[1]", "[1.5]", " [1, 2] "}) {
        EXPECT_TRUE(Codec.Read(szText, std::strlen(szText), jRead)) << szText;
    }
    const std::string strDeep(2000, '[');
    for (const char* szText : {"", "[1", "[1.5", strDeep.c_str()}) {
        EXPECT_FALSE(Codec.Read(szText, std::strlen(szText), jRead)) << szText;
    }
}

TEST_F(JsonTextTest, OneBadTextDoesNotSpoilTheNext) {
    Sql("INSERT INTO t VALUES ('{\"a\":[1,'), ('{\"b\":2}')");
    EXPECT_EQ(Compact(Listed()[1]), R"({"j":{"b":2}})");
    EXPECT_EQ(Stored(ParseJson("{\"c\":3}")), "{\"c\":3}");
}
