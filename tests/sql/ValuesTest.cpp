// SqlExpandMemberSymbol: the value list of an INSERT. Percent signs have a test file of their own.
#include <stdexcept>

#include "../support/TableTest.h"

using namespace testhost;

namespace {

class Values : public TableTest {
  protected:
    // The text after a successful rendering behind "(", without a line logged or a statement run.
    std::string Rendered(const Json::Value& jRecord) {
        std::string strSql = "(";
        Json::Value jRec = jRecord;
        EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), 0);
        EXPECT_EQ(jRec, jRecord);
        EXPECT_EQ(TakeLog(), Lines());
        EXPECT_EQ(TakeSql(), Lines());
        return strSql;
    }

    void ExpectRefused(const Json::Value& jRecord, const Lines& vecLines) {
        std::string strSql = "(";
        Json::Value jRec = jRecord;
        EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), -1);
        EXPECT_EQ(strSql, "(");
        EXPECT_EQ(jRec, jRecord);
        EXPECT_EQ(TakeLog(), vecLines);
        EXPECT_EQ(TakeSql(), Lines());
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

}  // namespace

TEST_F(Values, EveryTypeRendersEveryKindOrNamesTheMember) {
    for (const Rendering& rendering : kRenderings) {
        Open(std::string("m:") + rendering.szType);
        for (std::size_t i = 0; i < 11; ++i) {
            SCOPED_TRACE(std::string(rendering.szType) + " " + kValues[i]);
            const Json::Value jRec = RecordOf(kValues[i]);
            if (rendering.pszTexts[i] == nullptr) {
                ExpectRefused(jRec, {Located("type failed, strKey=m, jRecParam=" + Compact(jRec))});
                continue;
            }
            const std::string strText = rendering.pszTexts[i] == kAsSqlite
                                            ? SqliteFixed(jRec["m"].asDouble())
                                            : rendering.pszTexts[i];
            EXPECT_EQ(Rendered(jRec), "(" + strText + ") ");
        }
    }
}

TEST_F(Values, OtherTypeNamesAreRefusedWhateverTheValue) {
    for (const char* szType : kRefusedTypes) {
        Open(std::string("m:") + szType);
        for (const char* szValue : kValues) {
            SCOPED_TRACE(std::string(szType) + " " + szValue);
            ExpectRefused(RecordOf(szValue),
                          {Located(std::string("cannot support this type=") + szType)});
        }
    }
}

TEST_F(Values, RefusedTypeDoesNotMatterWhileTheRecordLacksTheMember) {
    Open("a:time_t,b:int");
    EXPECT_EQ(Rendered(ParseJson(R"({"b":1})")), "(1) ");
}

TEST_F(Values, StatementOfTheTextbook) {
    Open("id:int,name:string");
    std::string strSql = "INSERT INTO t (id,name) VALUES (";
    Json::Value jRec = ParseJson(R"({"id":7,"name":"O'Neil"})");
    EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), 0);
    EXPECT_EQ(strSql, "INSERT INTO t (id,name) VALUES (7,'O''Neil') ");
}

TEST_F(Values, MissingMiddleMemberLeavesNoGap) {
    Open("a:int,b:int,c:int");
    EXPECT_EQ(Rendered(ParseJson(R"({"a":1,"c":3})")), "(1,3) ");
}

TEST_F(Values, MissingLastMemberLeavesTheListOpen) {
    Open("a:int,b:int,c:int");
    EXPECT_EQ(Rendered(ParseJson(R"({"a":1,"b":2})")), "(1,2,");
}

TEST_F(Values, RecordWithoutAnyMemberOfTheTableWritesNothing) {
    Open("a:int,b:int");
    EXPECT_EQ(Rendered(ParseJson("{}")), "(");
    EXPECT_EQ(Rendered(ParseJson(R"({"x":[],"y":{}})")), "(");
}

TEST_F(Values, RecordOfAWrongKindHasNoMembers) {
    Open("a:int,b:int");
    for (const char* szRecord : {"null", "[]", "[1,2]", "\"a\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szRecord);
        EXPECT_EQ(Rendered(ParseJson(szRecord)), "(");
    }
}

TEST_F(Values, UnknownMembersAreIgnoredSilently) {
    Open("a:int");
    EXPECT_EQ(Rendered(ParseJson(R"({"a":1,"b":[],"c":"x"})")), "(1) ");
}

TEST_F(Values, TrueIsOneAndAFloatHasSixDecimals) {
    Open("b:bool,f:float");
    EXPECT_EQ(Rendered(ParseJson(R"({"b":true,"f":1.5})")), "(1,1.500000) ");
}

TEST_F(Values, FloatGoesThroughSinglePrecisionAndDoubleDoesNot) {
    Open("d:double,f:float");
    EXPECT_EQ(Rendered(ParseJson(R"({"d":16777217,"f":16777217})")),
              "(16777217.000000,16777216.000000) ");
}

TEST_F(Values, RealBeyondTheIntegersCannotBeRenderedAsOne) {
    Open("m:int");
    ExpectRefused(RecordOf("1e30"),
                  {Located("type failed, strKey=m, jRecParam=" + Compact(RecordOf("1e30")))});
    Open("m:unsigned");
    ExpectRefused(RecordOf("-1.5"), {Located(R"(type failed, strKey=m, jRecParam={"m":-1.5})")});
}

TEST_F(Values, FirstRealBeyondARangeIsRefusedInsteadOfChangingItsSign) {
    Open("s:long long,u:unsigned long long");
    Json::Value jRec;
    jRec["s"] = 9223372036854775808.0;
    ExpectRefused(jRec, {Located("type failed, strKey=s, jRecParam=" + Compact(jRec))});
    jRec["s"] = -9223372036854775808.0;
    jRec["u"] = 9223372036854775808.0;
    EXPECT_EQ(Rendered(jRec), "(-9223372036854775808,9223372036854775808) ");
    jRec["u"] = 18446744073709551616.0;
    ExpectRefused(jRec, {Located("type failed, strKey=u, jRecParam=" + Compact(jRec))});
}

TEST_F(Values, FailureAfterEarlierMembersLeavesTheTextUnchanged) {
    Open("a:int,b:string,c:time_t");
    ExpectRefused(ParseJson(R"({"a":1,"b":"x","c":3})"),
                  {Located("cannot support this type=time_t")});
    ExpectRefused(ParseJson(R"({"a":1,"b":[]})"),
                  {Located(R"(type failed, strKey=b, jRecParam={"a":1,"b":[]})")});
    EXPECT_EQ(Rendered(ParseJson(R"({"a":1,"b":"x"})")), "(1,'x',");
}

TEST_F(Values, MemberThatTheCachedTypesLackIsRefusedEvenWhenTheRecordLacksIt) {
    Open("a:int");
    EXPECT_EQ(Rendered(ParseJson(R"({"a":1})")), "(1) ");
    m_pHandle = NewHandle(m_pDb, "t", Definition("t", "a:int,b:int"), "SELECT 1");
    TakeSql();
    ExpectRefused(ParseJson(R"({"a":1,"b":2})"), {Check("!jType.isMember(strKey)")});
    ExpectRefused(ParseJson(R"({"a":1})"), {Check("!jType.isMember(strKey)")});
}

TEST_F(Values, DefinitionWithoutMembersRendersNothing) {
    OpenMembers("{}", "a");
    std::string strSql = "100%s (";
    Json::Value jRec = ParseJson(R"({"a":1})");
    EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), 0);
    EXPECT_EQ(strSql, "100%s (");
    const Lines vecLines = TakeLog();
    ASSERT_EQ(vecLines.size(), 4U);
    EXPECT_EQ(vecLines[0], UtilCheck("jType == Json::nullValue || !jType.isMember(strJsonName)"));
}

TEST_F(Values, TextEndsAtAnEmbeddedNul) {
    Json::Value jRec(Json::objectValue);
    jRec["a"] = Json::Value(std::string("ab\0cd", 5));
    jRec["b"] = 1;
    Open("a:string,b:int");
    EXPECT_EQ(Rendered(jRec), "('ab',1) ");
}

TEST_F(Values, NulInTheCallersTextCutsItThereBeforeEachMember) {
    Open("a:int,b:string");
    Json::Value jRec = ParseJson(R"({"a":7,"b":"x"})");
    std::string strSql("VALUES\0 (", 9);
    EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), 0);
    EXPECT_EQ(strSql, "VALUES,'x') ");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(Values, EmbeddedNulInsideJsonTextIsEscapedAndKept) {
    Json::Value jRec(Json::objectValue);
    jRec["a"]["k"] = Json::Value(std::string("ab\0cd", 5));
    Open("a:Json::objectValue");
    EXPECT_EQ(Rendered(jRec), "('{\"k\":\"ab\\u0000cd\"}') ");
}

TEST_F(Values, ForeignLettersStayAsTheyAre) {
    Open("a:string,b:Json::arrayValue");
    EXPECT_EQ(Rendered(ParseJson(u8R"({"a":"Grün ☂ 😀","b":["é"]})")), u8"('Grün ☂ 😀','[\"é\"]') ");
}

TEST_F(Values, OnlySingleQuotesAreDoubled) {
    Open("a:string");
    EXPECT_EQ(Rendered(ParseJson(R"({"a":"'\"\\`;--\n''"})")), "('''\"\\`;--\n''''') ");
}

TEST_F(Values, TextOfAMillionBytesIsRenderedWhole) {
    Json::Value jRec(Json::objectValue);
    jRec["a"] = LongText();
    jRec["b"] = LongText();
    const std::string strExpected = "('" + LongText() + "','" + LongText() + "') ";
    Open("a:string,b:string");
    EXPECT_TRUE(strExpected == Rendered(jRec));
}

TEST_F(Values, FiveHundredAndTwelveMembers) {
    Json::Value jRec(Json::objectValue);
    std::string strExpected;
    for (const std::string& strName : ManyMembers().getMemberNames()) {
        strExpected += (jRec.empty() ? "(" : ",") + std::to_string(jRec.size());
        jRec[strName] = jRec.size();
    }
    strExpected += ") ";
    OpenMembers(ManyMembers(), "a");
    EXPECT_EQ(Rendered(jRec), strExpected);
}

TEST_F(Values, FormatterWithoutMemoryRaisesLogicErrorAndKeepsTheText) {
    Open("a:string,b:double");
    Json::Value jRec(Json::objectValue);
    jRec["a"] = LongText();
    jRec["b"] = 1e300;
    std::string strSql = "(";
    {
        ScarceMemory scarce(1);
        try {
            m_pHandle->SqlExpandMemberSymbol(strSql, jRec);
            ADD_FAILURE() << "no exception";
        } catch (const std::logic_error& Error) {
            EXPECT_STREQ("vornjsondb: the SQL formatter gave no text", Error.what());
        }
    }
    EXPECT_EQ(strSql, "(");
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(Rendered(ParseJson(R"({"a":"x","b":1.5})")), "('x',1.500000) ");
}
