// Rows into records: what each type makes of a column's text.
#include <limits>

#include "../support/TableTest.h"

using namespace testhost;

namespace {

std::string Repeated(const std::string& str, size_t nTimes) {
    std::string strAll;
    for (size_t i = 0; i < nTimes; ++i) {
        strAll += str;
    }
    return strAll;
}

// The smallest and largest long, as the 32-bit integer that a conversion keeps of them.
const Json::Int kOfLongMax = sizeof(long) == 8 ? -1 : std::numeric_limits<Json::Int>::max();
const Json::Int kOfLongMin = sizeof(long) == 8 ? 0 : std::numeric_limits<Json::Int>::min();

class RowValues : public TableTest {
  protected:
    // What a member of the given type reads from a stored text.
    void ExpectRead(const char* szType, const std::string& strText, const Json::Value& jExpected) {
        SCOPED_TRACE(szType + (": " + strText));
        Open(std::string("a:") + szType);
        char* szSql = sqlite3_mprintf("INSERT INTO t VALUES (%Q)", strText.c_str());
        Sql(szSql);
        sqlite3_free(szSql);
        const Json::Value jRows = Listed();
        ASSERT_EQ(jRows.size(), 1U);
        ASSERT_TRUE(jRows[0].isMember("a"));
        EXPECT_EQ(jRows[0]["a"], jExpected);
        EXPECT_EQ(jRows[0]["a"].type(), jExpected.type());
    }
};

}  // namespace

TEST_F(RowValues, NullColumnLeavesTheMemberOutWhateverItsType) {
    Open(
        "a:string,b:int,c:bool,d:long long,e:Json::Value,f:double,g:no such type,h:unsigned "
        "int,i:Json::arrayValue");
    Sql("INSERT INTO t VALUES (NULL, NULL, NULL, NULL, NULL, NULL, NULL, NULL, NULL)");
    Sql("INSERT INTO t VALUES ('x', NULL, NULL, NULL, NULL, NULL, NULL, 8, NULL)");
    EXPECT_EQ(Compact(Listed()), R"([{},{"a":"x","h":8}])");
}

TEST_F(RowValues, StringIsTheTextItself) {
    for (const char* szText : {"", " ", "abc", "12", "null", "it's", "100%", "%s%n", "a\nb\t\"c\"",
                               "\xC3\xBC\xE2\x82\xAC\xF0\x9F\x98\x80", "{\"a\":1}"}) {
        ExpectRead("string", szText, Json::Value(szText));
    }
}

TEST_F(RowValues, StringOfANumberColumnIsItsText) {
    Open("a:string,b:string");
    Sql("INSERT INTO t VALUES (12, -1.5)");
    EXPECT_EQ(Compact(Listed()), R"([{"a":"12","b":"-1.5"}])");
}

TEST_F(RowValues, IntFollowsTheRulesOfTheCLibrary) {
    for (const char* szType : {"int", "unsigned int"}) {
        ExpectRead(szType, "42", Json::Value(Json::Int(42)));
        ExpectRead(szType, "-7", Json::Value(Json::Int(-7)));
        ExpectRead(szType, "+5", Json::Value(Json::Int(5)));
        ExpectRead(szType, " \t\n12", Json::Value(Json::Int(12)));
        ExpectRead(szType, "12abc", Json::Value(Json::Int(12)));
        ExpectRead(szType, "3.9", Json::Value(Json::Int(3)));
        ExpectRead(szType, "010", Json::Value(Json::Int(10)));
        ExpectRead(szType, " 010", Json::Value(Json::Int(10)));
        ExpectRead(szType, "0x10", Json::Value(Json::Int(0)));
        ExpectRead(szType, "+0x10", Json::Value(Json::Int(0)));
        ExpectRead(szType, "abc", Json::Value(Json::Int(0)));
        ExpectRead(szType, "", Json::Value(Json::Int(0)));
        ExpectRead(szType, "2147483647", Json::Value(Json::Int(2147483647)));
        ExpectRead(szType, "-2147483648", Json::Value(Json::Int(-2147483647 - 1)));
    }
}

TEST_F(RowValues, IntBeyondItsRangeKeepsTheLowBitsOfALongOrClampsToIt) {
    const bool blLong64 = sizeof(long) == 8;
    const Json::Int nMax = std::numeric_limits<Json::Int>::max();
    const Json::Int nMin = std::numeric_limits<Json::Int>::min();
    for (const char* szType : {"int", "unsigned int"}) {
        ExpectRead(szType, "2147483648", Json::Value(blLong64 ? nMin : nMax));
        ExpectRead(szType, "-2147483649", Json::Value(blLong64 ? nMax : nMin));
        ExpectRead(szType, "4294967297", Json::Value(blLong64 ? Json::Int(1) : nMax));
        ExpectRead(szType, "99999999999999999999", Json::Value(kOfLongMax));
        ExpectRead(szType, "-99999999999999999999", Json::Value(kOfLongMin));
    }
}

TEST_F(RowValues, UnsignedIntAboveTheSignedMaximumGoesThroughTheSignedConversion) {
    const bool blLong64 = sizeof(long) == 8;
    const Json::Int nMax = std::numeric_limits<Json::Int>::max();
    ExpectRead("unsigned int", "3000000000", Json::Value(blLong64 ? Json::Int(-1294967296) : nMax));
    ExpectRead("unsigned int", "4294967295", Json::Value(blLong64 ? Json::Int(-1) : nMax));
}

TEST_F(RowValues, LongLongIsASignedSixtyFourBitIntegerClampedToItsRange) {
    const Json::Int64 nMax = std::numeric_limits<Json::Int64>::max();
    const Json::Int64 nMin = std::numeric_limits<Json::Int64>::min();
    for (const char* szType : {"long long", "unsigned long long"}) {
        ExpectRead(szType, "42", Json::Value(Json::Int64(42)));
        ExpectRead(szType, "-1", Json::Value(Json::Int64(-1)));
        ExpectRead(szType, "  -8 9", Json::Value(Json::Int64(-8)));
        ExpectRead(szType, "7e3", Json::Value(Json::Int64(7)));
        ExpectRead(szType, "7a", Json::Value(Json::Int64(7)));
        ExpectRead(szType, "0x10", Json::Value(Json::Int64(0)));
        ExpectRead(szType, "010", Json::Value(Json::Int64(10)));
        ExpectRead(szType, "abc", Json::Value(Json::Int64(0)));
        ExpectRead(szType, "", Json::Value(Json::Int64(0)));
        ExpectRead(szType, "4294967296", Json::Value(Json::Int64(4294967296)));
        ExpectRead(szType, "9223372036854775807", Json::Value(nMax));
        ExpectRead(szType, "9223372036854775808", Json::Value(nMax));
        ExpectRead(szType, "18446744073709551615", Json::Value(nMax));
        ExpectRead(szType, "-9223372036854775808", Json::Value(nMin));
        ExpectRead(szType, "-9223372036854775809", Json::Value(nMin));
    }
}

TEST_F(RowValues, BoolIsTrueForTheNumberOneOnly) {
    for (const char* szTrue : {"1", " 1", "+1", "01", "1.9", "1x", "1a"}) {
        ExpectRead("bool", szTrue, Json::Value(true));
    }
    for (const char* szFalse :
         {"0", "2", "-1", "11", "true", "TRUE", "", "x1", "0x1", "4294967297"}) {
        ExpectRead("bool", szFalse, Json::Value(false));
    }
}

TEST_F(RowValues, JsonTypesParseTheirTextWhateverKindItHolds) {
    for (const char* szType : {"Json::Value", "Json::objectValue", "Json::arrayValue"}) {
        for (const char* szText : {R"({"a":[1,-2,true,null,"x"],"b":{}})", R"([[],{"k":"v"},1.5])",
                                   "{}", "[]", R"({"u":18446744073709551615,"i":-5})"}) {
            ExpectRead(szType, szText, ParseJson(szText));
        }
    }
}

TEST_F(RowValues, JsonTypesReadScalarsToo) {
    for (const char* szText : {"5", "-1.5", "true", "null", "\"text\""}) {
        ExpectRead("Json::Value", szText, ParseJson(szText));
    }
}

TEST_F(RowValues, TextThatIsNoJsonIsNoFailure) {
    Open("a:Json::objectValue,b:int");
    Sql("INSERT INTO t VALUES ('no json', 1), ('{\"x\":', 2), ('', 3), ('{\"x\":1}', 4), ('\xFF', "
        "5)");
    const Json::Value jRows = Listed();
    ASSERT_EQ(jRows.size(), 5U);
    for (Json::ArrayIndex i = 0; i < 5; ++i) {
        EXPECT_EQ(jRows[i]["b"], Json::Value(Json::Int(i + 1)));
    }
    EXPECT_EQ(Compact(jRows[3]), R"({"a":{"x":1},"b":4})");
}

// The reader gives up half way and leaves what it has read so far.
TEST_F(RowValues, JsonNestedTooDeepLeavesTheMemberAsTheReaderLeftItAndTheListGoesOn) {
    const std::string aTexts[] = {
        Repeated("[", 1100) + Repeated("]", 1100),
        Repeated("[", 1100),
        R"({"a":1,"b":)" + Repeated("[", 1100),
        Repeated("{\"k\":", 1100) + "1" + Repeated("}", 1100),
        R"(["\"[",)" + Repeated("[", 1100),
        "/* it's \" open */ " + Repeated("[", 1100) + Repeated("]", 1100),
        "// \"\n" + Repeated("[", 1100),
    };
    Open("a:int,b:Json::arrayValue,c:int");
    for (const std::string& strText : aTexts) {
        SCOPED_TRACE(strText.substr(0, 30));
        char* szSql = sqlite3_mprintf(
            "INSERT INTO t VALUES (1, '[1]', 3), (4, %Q, 6), (7, '[2]', 9)", strText.c_str());
        Sql(szSql);
        sqlite3_free(szSql);
        Json::Value jRows = Listed();
        ASSERT_EQ(jRows.size(), 3U);
        EXPECT_EQ(Compact(jRows[0]), R"({"a":1,"b":[1],"c":3})");
        EXPECT_TRUE(jRows[1]["b"] == ReadLeniently(strText));
        EXPECT_EQ(jRows[1]["c"], Json::Value(6));
        EXPECT_EQ(Compact(jRows[2]), R"({"a":7,"b":[2],"c":9})");
        Sql("DELETE FROM t");
    }
}

TEST_F(RowValues, RecordNestedTooDeepToBeReadIsCreated) {
    Open("a:Json::arrayValue,b:int");
    Json::Value jRecord(Json::objectValue);
    jRecord["a"] = Json::Value(Json::arrayValue);
    jRecord["b"] = 7;
    for (int i = 0; i < 1100; ++i) {
        Json::Value jOuter(Json::arrayValue);
        jOuter.append(std::move(jRecord["a"]));
        jRecord["a"] = std::move(jOuter);
    }
    Json::Value jStored;
    EXPECT_EQ(m_pHandle->recCreate(jRecord, jStored), 0);
    EXPECT_EQ(TakeLog().size(), 0U);
    EXPECT_EQ(jStored["b"], Json::Value(7));
    EXPECT_TRUE(jStored["a"] == ReadLeniently(Repeated("[", 1101) + Repeated("]", 1101)));
    EXPECT_EQ(Rows("SELECT length(a) FROM t"), "2202");
}

TEST_F(RowValues, NumberOutOfRangeInStoredJsonIsNoFailure) {
    Open("a:Json::arrayValue,b:int");
    Sql("INSERT INTO t VALUES ('[1e999, 99999999999999999999999]', 1)");
    EXPECT_EQ(Listed()[0]["b"], Json::Value(Json::Int(1)));
}
