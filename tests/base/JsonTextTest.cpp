// JSON as the library writes and reads it, seen through stored values, statements and log lines.
#include "../support/TableFixture.h"

using namespace testhost;

namespace {

using Lines = std::vector<std::string>;

class JsonTextTest : public DbTest {
  protected:
    void SetUp() override {
        DbTest::SetUp();
        m_strTable = UniqueTable();
        m_pHandle = NewHandle(m_pDb, m_strTable, Definition(m_strTable, "j:Json::objectValue"),
                              "CREATE TABLE " + m_strTable + " (j)");
        ASSERT_EQ(TakeLog(), Lines());
        TakeSql();
    }

    void TearDown() override {
        m_pHandle.reset();
        DbTest::TearDown();
    }

    // The text that stands in the column after a value was saved.
    std::string StoredAs(const Json::Value& jValue) {
        Json::Value jRecord(Json::objectValue);
        jRecord["j"] = jValue;
        EXPECT_EQ(m_pHandle->recSave(jRecord, true), 0);
        m_jBack = jRecord["j"];
        EXPECT_EQ(TakeLog(), Lines());
        return Rows("SELECT j FROM " + m_strTable + " ORDER BY rowid DESC LIMIT 1");
    }

    // The same for a value that comes back as it was.
    std::string Stored(const Json::Value& jValue) {
        const std::string strText = StoredAs(jValue);
        EXPECT_EQ(m_jBack, jValue);
        return strText;
    }

    std::string m_strTable;
    std::unique_ptr<VornJsonDbApi> m_pHandle;
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

TEST_F(JsonTextTest, ReaderAcceptsBlanksAndNewlines) {
    Sql("INSERT INTO " + m_strTable + " VALUES (' {\n \"a\" :\t[ 1 , 2 ] } \n')");
    Json::Value jNoQuery;
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->recList(jNoQuery, jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"j":{"a":[1,2]}}])");
}

// Every text here is well-formed JSON, so what it means is beyond doubt.
TEST_F(JsonTextTest, ReaderReadsEveryTextAsTheJsonLibraryDoes) {
    const char* const aszTexts[] = {
        "0",
        "-0",
        "7",
        "-7",
        "123456789012345678",
        "1234567890123456789",
        "-123456789012345678",
        "-1234567890123456789",
        "9223372036854775807",
        "-9223372036854775808",
        "9223372036854775808",
        "18446744073709551615",
        "18446744073709551616",
        "1.0",
        "-1.5",
        "1e3",
        "1E-3",
        "0.1",
        "-0.0",
        "true",
        "false",
        "null",
        "\"\"",
        "\"a\"",
        "\"a\\nb\"",
        "\"\\u0041\"",
        "\"\\u00e9\\ud83d\\ude00\"",
        "\"\xC3\xA9\"",
        "\"\\\\\"",
        "\"\\\"\"",
        "\"tr\\/ue\"",
        "[]",
        "[ ]",
        "[1]",
        "[1 ,2]",
        "[1,2,3]",
        "[[],{}]",
        "[[[[[[[[1]]]]]]]]",
        "[[[[[[[[[1]]]]]]]]]",
        "[[[[[[[[[[[[]]]]]]]]]]]]",
        "[null,true,false,\"x\",-1,1.5]",
        "{}",
        "{ }",
        "{\"a\":1}",
        "{\"a\" : 1}",
        "{\"\":0}",
        "{\"a\":1,\"a\":2}",
        "{\"a\":{\"b\":1},\"a\":{\"c\":2}}",
        "{\"a\":[1],\"a\":3}",
        "{\"b\":1,\"a\":[{\"c\":\"d\"}]}",
        "{\"a\\u0062\":1}",
        "{\"\xC3\xBC\":\"\xE2\x82\xAC\"}",
        "{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":1}}}}}}}}}",
        "{\"t\":true,\"f\":false,\"n\":null}",
        " {\"a\":1}",
        "{\"a\":1}\n",
        "\t[1]\r\n"};
    for (const char* szText : aszTexts) {
        char* szSql = sqlite3_mprintf("DELETE FROM %s; INSERT INTO %s VALUES (%Q)",
                                      m_strTable.c_str(), m_strTable.c_str(), szText);
        Sql(szSql);
        sqlite3_free(szSql);
        Json::Value jNoQuery;
        Json::Value jRows;
        EXPECT_EQ(m_pHandle->recList(jNoQuery, jRows), 0) << szText;
        const Json::Value jExpected = ReadLeniently(szText);
        EXPECT_EQ(jRows[0]["j"], jExpected) << szText;
        EXPECT_EQ(jRows[0]["j"].type(), jExpected.type()) << szText;
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(JsonTextTest, ReaderDecodesEscapes) {
    Sql("INSERT INTO " + m_strTable + R"( VALUES ('["\u00fc\ud83d\ude00\/\n"]'))");
    Json::Value jNoQuery;
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->recList(jNoQuery, jRows), 0);
    EXPECT_EQ(jRows[0]["j"][0].asString(), "\xC3\xBC\xF0\x9F\x98\x80/\n");
}

TEST_F(JsonTextTest, OneBadTextDoesNotSpoilTheNext) {
    Sql("INSERT INTO " + m_strTable + " VALUES ('{\"a\":[1,'), ('{\"b\":2}')");
    Json::Value jNoQuery;
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->recList(jNoQuery, jRows), 0);
    ASSERT_EQ(jRows.size(), 2U);
    EXPECT_EQ(Compact(jRows[1]), R"({"j":{"b":2}})");
    EXPECT_EQ(Stored(ParseJson("{\"c\":3}")), "{\"c\":3}");
}
