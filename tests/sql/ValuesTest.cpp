// SqlExpandMemberSymbol: the value list of an INSERT. Percent signs have a test file of their own.
#include <stdexcept>

#include "../schema/FreshTable.h"

namespace testhost {

namespace {

class Values : public FreshTableTest {
  protected:
    // The text after a successful rendering behind "(", without a line logged or a statement run.
    std::string Rendered(VornJsonDbApi& api, const Json::Value& jRecord) {
        std::string strSql = "(";
        Json::Value jRec = jRecord;
        EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRec));
        EXPECT_EQ(jRecord, jRec);
        EXPECT_EQ(Lines{}, TakeLog());
        EXPECT_EQ(Lines{}, TakeSql());
        return strSql;
    }

    void ExpectRefused(VornJsonDbApi& api, const Json::Value& jRecord, const Lines& vecLines) {
        std::string strSql = "(";
        Json::Value jRec = jRecord;
        EXPECT_EQ(-1, api.SqlExpandMemberSymbol(strSql, jRec));
        EXPECT_EQ("(", strSql);
        EXPECT_EQ(jRecord, jRec);
        EXPECT_EQ(vecLines, TakeLog());
        EXPECT_EQ(Lines{}, TakeSql());
    }
};

// Values of every kind, in the order of the columns below.
const char* const kValues[] = {
    "null",
    "true",
    "false",
    "7",
    "-7",
    "9223372036854775807",
    "18446744073709551615",
    "1.5",
    R"("O'Neil")",
    R"([1,"a"])",
    R"({"k":"it's"})",
};

// The digits of such a number are SQLite's own.
const char kAsSqlite[] = "as SQLite writes it";

std::string SqliteFixed(double dValue) {
    char* szText = sqlite3_mprintf("%f", dValue);
    std::string strText = szText;
    sqlite3_free(szText);
    return strText;
}

// What each value is rendered as; null where it cannot be converted.
const char* const kText[] = {
    "''",
    "'true'",
    "'false'",
    "'7'",
    "'-7'",
    "'9223372036854775807'",
    "'18446744073709551615'",
    "'1.5'",
    "'O''Neil'",
    nullptr,
    nullptr,
};
const char* const kSigned[] = {
    "0", "1", "0", "7", "-7", "9223372036854775807", nullptr, "1", nullptr, nullptr, nullptr,
};
const char* const kUnsigned[] = {
    "0", "1",     "0",     "7",     nullptr, "9223372036854775807", "18446744073709551615",
    "1", nullptr, nullptr, nullptr,
};
const char* const kReal[] = {
    "0.000000", "1.000000", "0.000000", "7.000000", "-7.000000", kAsSqlite,
    kAsSqlite,  "1.500000", nullptr,    nullptr,    nullptr,
};
const char* const kJsonText[] = {
    "'null'",
    "'true'",
    "'false'",
    "'7'",
    "'-7'",
    "'9223372036854775807'",
    "'18446744073709551615'",
    "'1.5'",
    R"('"O''Neil"')",
    R"('[1,"a"]')",
    R"('{"k":"it''s"}')",
};

struct Rendering {
    const char* szType;
    const char* const* pszTexts;
};

const Rendering kRenderings[] = {
    {"string", kText},
    {"long long", kSigned},
    {"int", kSigned},
    {"long", kSigned},
    {"bool", kSigned},
    {"unsigned long long", kUnsigned},
    {"unsigned int", kUnsigned},
    {"unsigned long", kUnsigned},
    {"unsigned", kUnsigned},
    {"float", kReal},
    {"double", kReal},
    {"Json::objectValue", kJsonText},
    {"Json::arrayValue", kJsonText},
};

const char* const kRefusedTypes[] = {
    "Json::Value", "uid_t", "time_t", "Int", "int ", "unsigned  int", "", "text", "100%s",
};

Json::Value RecordOf(const char* szValue) {
    Json::Value jRec(Json::objectValue);
    jRec["m"] = ParseJson(szValue);
    return jRec;
}

}  // namespace

TEST_F(Values, EveryTypeRendersEveryKindOrNamesTheMember) {
    for (const Rendering& rendering : kRenderings) {
        VornJsonDbApi& api = Open(std::string("m:") + rendering.szType);
        for (std::size_t i = 0; i < 11; ++i) {
            SCOPED_TRACE(std::string(rendering.szType) + " " + kValues[i]);
            const Json::Value jRec = RecordOf(kValues[i]);
            if (rendering.pszTexts[i] == nullptr) {
                ExpectRefused(api, jRec,
                              {Located("type failed, strKey=m, jRecParam=" + Compact(jRec))});
                continue;
            }
            const std::string strText = rendering.pszTexts[i] == kAsSqlite
                                            ? SqliteFixed(jRec["m"].asDouble())
                                            : rendering.pszTexts[i];
            EXPECT_EQ("(" + strText + ") ", Rendered(api, jRec));
        }
    }
}

TEST_F(Values, OtherTypeNamesAreRefusedWhateverTheValue) {
    for (const char* szType : kRefusedTypes) {
        VornJsonDbApi& api = Open(std::string("m:") + szType);
        for (const char* szValue : kValues) {
            SCOPED_TRACE(std::string(szType) + " " + szValue);
            ExpectRefused(api, RecordOf(szValue),
                          {Located(std::string("cannot support this type=") + szType)});
        }
    }
}

TEST_F(Values, RefusedTypeDoesNotMatterWhileTheRecordLacksTheMember) {
    EXPECT_EQ("(1) ", Rendered(Open("a:time_t,b:int"), ParseJson(R"({"b":1})")));
}

TEST_F(Values, StatementOfTheTextbook) {
    VornJsonDbApi& api = Open("id:int,name:string");
    std::string strSql = "INSERT INTO t (id,name) VALUES (";
    Json::Value jRec = ParseJson(R"({"id":7,"name":"O'Neil"})");
    EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRec));
    EXPECT_EQ("INSERT INTO t (id,name) VALUES (7,'O''Neil') ", strSql);
}

TEST_F(Values, MissingMiddleMemberLeavesNoGap) {
    EXPECT_EQ("(1,3) ", Rendered(Open("a:int,b:int,c:int"), ParseJson(R"({"a":1,"c":3})")));
}

TEST_F(Values, MissingLastMemberLeavesTheListOpen) {
    EXPECT_EQ("(1,2,", Rendered(Open("a:int,b:int,c:int"), ParseJson(R"({"a":1,"b":2})")));
}

TEST_F(Values, RecordWithoutAnyMemberOfTheTableWritesNothing) {
    VornJsonDbApi& api = Open("a:int,b:int");
    EXPECT_EQ("(", Rendered(api, ParseJson("{}")));
    EXPECT_EQ("(", Rendered(api, ParseJson(R"({"x":[],"y":{}})")));
}

TEST_F(Values, RecordOfAWrongKindHasNoMembers) {
    VornJsonDbApi& api = Open("a:int,b:int");
    for (const char* szRecord : {"null", "[]", "[1,2]", "\"a\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szRecord);
        EXPECT_EQ("(", Rendered(api, ParseJson(szRecord)));
    }
}

TEST_F(Values, UnknownMembersAreIgnoredSilently) {
    EXPECT_EQ("(1) ", Rendered(Open("a:int"), ParseJson(R"({"a":1,"b":[],"c":"x"})")));
}

TEST_F(Values, TrueIsOneAndAFloatHasSixDecimals) {
    EXPECT_EQ("(1,1.500000) ",
              Rendered(Open("b:bool,f:float"), ParseJson(R"({"b":true,"f":1.5})")));
}

TEST_F(Values, FloatGoesThroughSinglePrecisionAndDoubleDoesNot) {
    EXPECT_EQ("(16777217.000000,16777216.000000) ",
              Rendered(Open("d:double,f:float"), ParseJson(R"({"d":16777217,"f":16777217})")));
}

TEST_F(Values, RealBeyondTheIntegersCannotBeRenderedAsOne) {
    ExpectRefused(Open("m:int"), RecordOf("1e30"),
                  {Located("type failed, strKey=m, jRecParam=" + Compact(RecordOf("1e30")))});
    ExpectRefused(Open("m:unsigned"), RecordOf("-1.5"),
                  {Located(R"(type failed, strKey=m, jRecParam={"m":-1.5})")});
}

TEST_F(Values, FirstRealBeyondARangeIsRefusedInsteadOfChangingItsSign) {
    VornJsonDbApi& api = Open("s:long long,u:unsigned long long");
    Json::Value jRec;
    jRec["s"] = 9223372036854775808.0;
    ExpectRefused(api, jRec, {Located("type failed, strKey=s, jRecParam=" + Compact(jRec))});
    jRec["s"] = -9223372036854775808.0;
    jRec["u"] = 9223372036854775808.0;
    EXPECT_EQ("(-9223372036854775808,9223372036854775808) ", Rendered(api, jRec));
    jRec["u"] = 18446744073709551616.0;
    ExpectRefused(api, jRec, {Located("type failed, strKey=u, jRecParam=" + Compact(jRec))});
}

TEST_F(Values, FailureAfterEarlierMembersLeavesTheTextUnchanged) {
    VornJsonDbApi& api = Open("a:int,b:string,c:time_t");
    ExpectRefused(api, ParseJson(R"({"a":1,"b":"x","c":3})"),
                  {Located("cannot support this type=time_t")});
    ExpectRefused(api, ParseJson(R"({"a":1,"b":[]})"),
                  {Located(R"(type failed, strKey=b, jRecParam={"a":1,"b":[]})")});
    EXPECT_EQ("(1,'x',", Rendered(api, ParseJson(R"({"a":1,"b":"x"})")));
}

TEST_F(Values, MemberThatTheCachedTypesLackIsRefusedEvenWhenTheRecordLacksIt) {
    VornJsonDbApi& first = Open("a:int");
    EXPECT_EQ("(1) ", Rendered(first, ParseJson(R"({"a":1})")));
    VornJsonDbApi& second = OpenAs(m_strTable, Definition(m_strTable, "a:int,b:int"), "a");
    ExpectRefused(second, ParseJson(R"({"a":1,"b":2})"), {Check("!jType.isMember(strKey)")});
    ExpectRefused(second, ParseJson(R"({"a":1})"), {Check("!jType.isMember(strKey)")});
}

TEST_F(Values, DefinitionWithoutMembersRendersNothing) {
    VornJsonDbApi& api = OpenMembers(ParseJson("{}"), "a");
    std::string strSql = "100%s (";
    Json::Value jRec = ParseJson(R"({"a":1})");
    EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRec));
    EXPECT_EQ("100%s (", strSql);
    const Lines vecLines = TakeLog();
    ASSERT_EQ(4U, vecLines.size());
    EXPECT_EQ(UtilCheck("jType == Json::nullValue || !jType.isMember(strJsonName)"), vecLines[0]);
}

TEST_F(Values, TextEndsAtAnEmbeddedNul) {
    Json::Value jRec(Json::objectValue);
    jRec["a"] = Json::Value(std::string("ab\0cd", 5));
    jRec["b"] = 1;
    EXPECT_EQ("('ab',1) ", Rendered(Open("a:string,b:int"), jRec));
}

TEST_F(Values, NulInTheCallersTextCutsItThereBeforeEachMember) {
    VornJsonDbApi& api = Open("a:int,b:string");
    Json::Value jRec = ParseJson(R"({"a":7,"b":"x"})");
    std::string strSql("VALUES\0 (", 9);
    EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRec));
    EXPECT_EQ("VALUES,'x') ", strSql);
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(Values, EmbeddedNulInsideJsonTextIsEscapedAndKept) {
    Json::Value jRec(Json::objectValue);
    jRec["a"]["k"] = Json::Value(std::string("ab\0cd", 5));
    EXPECT_EQ("('{\"k\":\"ab\\u0000cd\"}') ", Rendered(Open("a:Json::objectValue"), jRec));
}

TEST_F(Values, ForeignLettersStayAsTheyAre) {
    EXPECT_EQ(u8"('Grün ☂ 😀','[\"é\"]') ", Rendered(Open("a:string,b:Json::arrayValue"),
                                                    ParseJson(u8R"({"a":"Grün ☂ 😀","b":["é"]})")));
}

TEST_F(Values, OnlySingleQuotesAreDoubled) {
    EXPECT_EQ("('''\"\\`;--\n''''') ",
              Rendered(Open("a:string"), ParseJson(R"({"a":"'\"\\`;--\n''"})")));
}

TEST_F(Values, TextOfAMillionBytesIsRenderedWhole) {
    Json::Value jRec(Json::objectValue);
    jRec["a"] = LongText();
    jRec["b"] = LongText();
    const std::string strExpected = "('" + LongText() + "','" + LongText() + "') ";
    EXPECT_TRUE(strExpected == Rendered(Open("a:string,b:string"), jRec));
}

TEST_F(Values, FiveHundredAndTwelveMembers) {
    Json::Value jMembers(Json::objectValue);
    Json::Value jRec(Json::objectValue);
    std::string strExpected = "(";
    for (int i = 0; i < 512; ++i) {
        const std::string strName = "m" + std::to_string(1000 + i);
        jMembers[strName]["cpptype"] = i % 2 == 0 ? "int" : "string";
        if (i % 2 == 0) {
            jRec[strName] = i;
            strExpected += std::to_string(i) + ",";
        } else {
            jRec[strName] = "v" + std::to_string(i);
            strExpected += "'v" + std::to_string(i) + "'" + (i == 511 ? ") " : ",");
        }
    }
    EXPECT_EQ(strExpected, Rendered(OpenMembers(jMembers, "a"), jRec));
}

TEST_F(Values, FormatterWithoutMemoryRaisesLogicErrorAndKeepsTheText) {
    VornJsonDbApi& api = Open("a:string,b:double");
    Json::Value jRec(Json::objectValue);
    jRec["a"] = LongText();
    jRec["b"] = 1e300;
    std::string strSql = "(";
    {
        ScarceMemory scarce(1);
        try {
            api.SqlExpandMemberSymbol(strSql, jRec);
            ADD_FAILURE() << "no exception";
        } catch (const std::logic_error& Error) {
            EXPECT_STREQ("vornjsondb: the SQL formatter gave no text", Error.what());
        }
    }
    EXPECT_EQ("(", strSql);
    EXPECT_EQ(Lines{}, TakeLog());
    EXPECT_EQ("('x',1.500000) ", Rendered(api, ParseJson(R"({"a":"x","b":1.5})")));
}

}  // namespace testhost
