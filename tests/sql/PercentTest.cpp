// Percent signs in a value list: text that is formatted again with every later present member.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

class Percent : public FreshTableTest {
  protected:
    // Three members in name order: two texts and a number.
    VornJsonDbApi& OpenThree() { return Open("a:string,b:string,c:int"); }

    std::string Rendered(VornJsonDbApi& api, const char* szRecord, std::string strSql = "(") {
        Json::Value jRec = ParseJson(szRecord);
        EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRec)) << szRecord;
        EXPECT_EQ(Lines{}, TakeLog());
        return strSql;
    }

    // One check of the library's own wording, the text as it came, and a handle that works on.
    void ExpectRefused(VornJsonDbApi& api, const Json::Value& jRecord,
                       const std::string& strText = "(") {
        std::string strSql = strText;
        Json::Value jRec = jRecord;
        EXPECT_EQ(-1, api.SqlExpandMemberSymbol(strSql, jRec));
        EXPECT_EQ(strText, strSql);
        EXPECT_EQ(jRecord, jRec);
        EXPECT_EQ(Lines{"check"}, WithFirstCheckNamed(TakeLog()));
        EXPECT_EQ("('x',1) ", Rendered(api, R"({"a":"x","c":1})"));
    }
};

// Texts that are read as a conversion, or as a broken one, when they are formatted once more.
const char* const kConversions[] = {
    "%s",  "%d",   "%n",      "%i",     "%u",   "%c",           "%x",   "%X",    "%o",    "%e",
    "%E",  "%f",   "%g",      "%G",     "%p",   "%q",           "%Q",   "%w",    "%z",    "%S",
    "%T",  "%r",   "%%%s",    "%ld",    "%lld", "%llu",         "%lf",  "%5d",   "%05d",  "%-5s",
    "%+d", "% d",  "%#x",     "%!f",    "%,d",  "%.3f",         "%.*f", "%*d",   "%*.*s", "%5%",
    "%-%", "%l%",  "%.2%",    "%*%",    "%",    "100%",         "%%%",  "50% x", "%k",    "%h",
    "%hd", "%Ld",  "%a",      "%y",     "%1$s", "%9999999999d", "%.",   "%l",    "%ll",   "%0",
    "%-",  "%lll", "a%sb%%c", "%%%%%d",
};

}  // namespace

TEST_F(Percent, DoubledSignBecomesSingleWithALaterMember) {
    EXPECT_EQ("('50%',1) ", Rendered(OpenThree(), R"({"a":"50%%","c":1})"));
}

TEST_F(Percent, DoubledSignStaysDoubledWithoutALaterPresentMember) {
    EXPECT_EQ("('50%%',", Rendered(OpenThree(), R"({"a":"50%%"})"));
    EXPECT_EQ("('50%%',", Rendered(OpenThree(), R"({"a":"50%%","zz":1})"));
}

TEST_F(Percent, DoubledSignInTheLastMemberStaysDoubled) {
    EXPECT_EQ("('x','50%%') ", Rendered(Open("a:string,b:string"), R"({"a":"x","b":"50%%"})"));
}

TEST_F(Percent, LastMemberIsStoredAsGivenWhateverItHolds) {
    for (const char* szText : kConversions) {
        SCOPED_TRACE(szText);
        VornJsonDbApi& api = Open("a:int,b:string");
        Json::Value jRec(Json::objectValue);
        jRec["a"] = 1;
        jRec["b"] = szText;
        std::string strSql = "(";
        EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRec));
        EXPECT_EQ("(1,'" + std::string(szText) + "') ", strSql);
        EXPECT_EQ(Lines{}, TakeLog());
    }
}

TEST_F(Percent, EveryLaterPresentMemberHalvesTheSigns) {
    VornJsonDbApi& api = OpenThree();
    EXPECT_EQ("('%','y',1) ", Rendered(api, R"({"a":"%%%%","b":"y","c":1})"));
    EXPECT_EQ("('%%',1) ", Rendered(api, R"({"a":"%%%%","c":1})"));
    EXPECT_EQ("('%%%','%',1) ", Rendered(api, R"({"a":"%%%%%%%%%%%%","b":"%%","c":1})"));
}

TEST_F(Percent, DoubledSignWithTwoLaterMembersIsBrokenAtTheSecond) {
    ExpectRefused(OpenThree(), ParseJson(R"({"a":"50%%","b":"y","c":1})"));
}

TEST_F(Percent, ConversionHiddenByOneDoublingIsFoundAtTheSecondPass) {
    VornJsonDbApi& api = OpenThree();
    EXPECT_EQ("('%s',1) ", Rendered(api, R"({"a":"%%s","c":1})"));
    ExpectRefused(api, ParseJson(R"({"a":"%%s","b":"y","c":1})"));
    ExpectRefused(api, ParseJson(R"({"a":"%%d","b":"y","c":1})"));
}

TEST_F(Percent, EveryOtherConversionInAnEarlierValueIsRefused) {
    VornJsonDbApi& api = OpenThree();
    for (const char* szText : kConversions) {
        SCOPED_TRACE(szText);
        Json::Value jRec(Json::objectValue);
        jRec["a"] = szText;
        jRec["c"] = 1;
        ExpectRefused(api, jRec);
    }
}

TEST_F(Percent, SignBeforeTheClosingQuoteIsRefused) {
    ExpectRefused(OpenThree(), ParseJson(R"({"a":"100%","b":"); drop table t; --","c":1})"));
}

TEST_F(Percent, SignBeforeAnApostropheIsRefused) {
    ExpectRefused(OpenThree(), ParseJson(R"({"a":"%'s","c":1})"));
}

TEST_F(Percent, SignBeforeAForeignLetterIsRefused) {
    ExpectRefused(OpenThree(), ParseJson(u8R"({"a":"5%é","c":1})"));
}

TEST_F(Percent, JsonTypedValueIsFormattedAgainToo) {
    VornJsonDbApi& api = Open("a:Json::objectValue,c:int");
    EXPECT_EQ("('{\"k\":\"%\"}',1) ", Rendered(api, R"({"a":{"k":"%%"},"c":1})"));
    std::string strSql = "(";
    Json::Value jRec = ParseJson(R"({"a":{"k":"%s"},"c":1})");
    EXPECT_EQ(-1, api.SqlExpandMemberSymbol(strSql, jRec));
    EXPECT_EQ("(", strSql);
    EXPECT_EQ(Lines{"check"}, WithFirstCheckNamed(TakeLog()));
}

TEST_F(Percent, MemberOfEveryRenderedTypeMakesAPass) {
    for (const char* szType : {"string", "long long", "int", "long", "bool", "unsigned long long",
                               "unsigned int", "unsigned long", "unsigned"}) {
        SCOPED_TRACE(szType);
        VornJsonDbApi& api = Open(std::string("a:string,z:") + szType);
        const std::string strOne = std::string(szType) == "string" ? "'1'" : "1";
        EXPECT_EQ("('%'," + strOne + ") ", Rendered(api, R"({"a":"%%","z":1})"));
    }
    for (const char* szType : {"float", "double"}) {
        SCOPED_TRACE(szType);
        EXPECT_EQ("('%',1.000000) ",
                  Rendered(Open(std::string("a:string,z:") + szType), R"({"a":"%%","z":1})"));
    }
    for (const char* szType : {"Json::objectValue", "Json::arrayValue"}) {
        SCOPED_TRACE(szType);
        EXPECT_EQ("('%','1') ",
                  Rendered(Open(std::string("a:string,z:") + szType), R"({"a":"%%","z":1})"));
    }
}

TEST_F(Percent, TextBeforeTheValuesIsFormattedWithEachMember) {
    VornJsonDbApi& api = OpenThree();
    EXPECT_EQ("INTO \"p%\" (1) ", Rendered(api, R"({"c":1})", "INTO \"p%%\" ("));
    EXPECT_EQ("INTO \"p%\" ('x',1) ", Rendered(api, R"({"a":"x","c":1})", "INTO \"p%%%%\" ("));
}

TEST_F(Percent, ConversionInTheTextBeforeTheValuesIsRefused) {
    VornJsonDbApi& api = OpenThree();
    for (const char* szText : {"INTO \"p%s\" (", "INTO \"p%\" (", "INTO p%%%n (", "% ("}) {
        SCOPED_TRACE(szText);
        ExpectRefused(api, ParseJson(R"({"c":1})"), szText);
    }
}

TEST_F(Percent, SignAtTheVeryEndOfTheTextDoublesTheOneOfTheSpecifier) {
    VornJsonDbApi& api = OpenThree();
    EXPECT_EQ("(%lld) ", Rendered(api, R"({"c":1})", "(%"));
    EXPECT_EQ("(%%Q,", Rendered(api, R"({"a":"x"})", "(%%%"));
}

TEST_F(Percent, ConversionBegunAtTheEndOfTheTextIsRefused) {
    VornJsonDbApi& api = OpenThree();
    for (const char* szText : {"(%5", "(%-", "(%l", "(%.", "(%*", "(%%%0"}) {
        SCOPED_TRACE(szText);
        ExpectRefused(api, ParseJson(R"({"a":"x"})"), szText);
    }
}

TEST_F(Percent, TextBeforeTheValuesEndsAtItsFirstNul) {
    VornJsonDbApi& api = OpenThree();
    // The formatter reads a C string, so the value's own place is cut off, too.
    EXPECT_EQ("() ", Rendered(api, R"({"c":1})", std::string("(\0%s", 4)));
    EXPECT_EQ("(%) ", Rendered(api, R"({"c":1})", std::string("(%\0s", 4)));
    ExpectRefused(api, ParseJson(R"({"c":1})"), std::string("(%s\0", 4));
}

TEST_F(Percent, WithoutAPresentMemberNothingIsFormatted) {
    EXPECT_EQ("%s %% %", Rendered(OpenThree(), "{}", "%s %% %"));
}

TEST_F(Percent, UnknownTypeIsReportedAfterTheMembersBeforeIt) {
    VornJsonDbApi& api = Open("a:string,b:time_t");
    Json::Value jRec = ParseJson(R"({"a":"%s","b":1})");
    std::string strSql = "(";
    EXPECT_EQ(-1, api.SqlExpandMemberSymbol(strSql, jRec));
    EXPECT_EQ((Lines{Located("cannot support this type=time_t")}), TakeLog());
}

TEST_F(Percent, AgreesWithTheFormatterPassByPass) {
    VornJsonDbApi& api = OpenThree();
    for (const char* szText : {"%%%%", "a%%%%b", "%%%%%%%%", "'%%%%'", "%%%% %%%% %%%%"}) {
        SCOPED_TRACE(szText);
        Json::Value jRec(Json::objectValue);
        jRec["a"] = szText;
        jRec["b"] = "it's";
        jRec["c"] = 5;
        std::string strSql = "(";
        EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRec));
        char* szFirst = sqlite3_mprintf("(%Q", szText);
        char* szSecond = sqlite3_mprintf((std::string(szFirst) + ",%Q").c_str(), "it's");
        char* szThird = sqlite3_mprintf((std::string(szSecond) + ",%lld").c_str(), 5LL);
        EXPECT_EQ(std::string(szThird) + ") ", strSql);
        sqlite3_free(szFirst);
        sqlite3_free(szSecond);
        sqlite3_free(szThird);
    }
}

TEST_F(Percent, LongTextFullOfDoubledSigns) {
    VornJsonDbApi& api = OpenThree();
    Json::Value jRec(Json::objectValue);
    jRec["a"] = std::string(512 * 1024, '%');
    jRec["c"] = 1;
    std::string strSql = "(";
    EXPECT_EQ(0, api.SqlExpandMemberSymbol(strSql, jRec));
    EXPECT_TRUE("('" + std::string(256 * 1024, '%') + "',1) " == strSql);
}

TEST_F(Percent, RefusedRecordRunsNothingAndTheHandleWorksOn) {
    VornJsonDbApi& api = OpenThree();
    Json::Value jRec = ParseJson(R"({"a":"%n","b":"y","c":1})");
    const Json::Value jBefore = jRec;
    EXPECT_EQ(-1, api.recSave(jRec, true));
    const std::string strTypes =
        R"({"a":{"cpptype":"string"},"b":{"cpptype":"string"},"c":{"cpptype":"int"}})";
    EXPECT_EQ(
        (Lines{"check", Check("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
               Plain("blCreate=1, jRecInOut=" + Compact(jBefore)), Plain("jType=" + strTypes)}),
        WithFirstCheckNamed(TakeLog()));
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ(jBefore, jRec);
    jRec["a"] = "fine";
    EXPECT_EQ(0, api.recSave(jRec, true));
    EXPECT_EQ("fine|y|1", Rows("select * from " + m_strTable + ";"));
}

TEST_F(Percent, EarlierErrorTextShowsBehindTheRefusal) {
    VornJsonDbApi& api = OpenThree();
    MakeStaleError(api);
    Json::Value jRec = ParseJson(R"({"a":"%n","b":"y","c":1})");
    EXPECT_EQ(-1, api.recSave(jRec, false));
    const Lines vecLines = WithFirstCheckNamed(TakeLog());
    ASSERT_EQ(5U, vecLines.size());
    EXPECT_EQ(SqlError("no such column: stale", "REPLACE INTO " + m_strTable + " (a,b,c) VALUES ("),
              vecLines[4]);
}

TEST_F(Percent, CreateReportsTheRefusalThroughItsOwnTail) {
    VornJsonDbApi& api = OpenThree();
    Json::Value jIn = ParseJson(R"({"a":"100%","b":"y","c":1})");
    Json::Value jOut("kept");
    EXPECT_EQ(-1, api.recCreate(jIn, jOut));
    const Lines vecLines = WithFirstCheckNamed(TakeLog());
    ASSERT_EQ(6U, vecLines.size());
    EXPECT_EQ("check", vecLines[0]);
    EXPECT_EQ(Check("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"), vecLines[1]);
    EXPECT_EQ(Check("0 > recSave(jParam, true)"), vecLines[4]);
    EXPECT_EQ(Plain("call create rec, rec=" + Compact(jIn)), vecLines[5]);
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ(Json::Value("kept"), jOut);
    EXPECT_EQ("", api.getErrMsg());
}

TEST_F(Percent, SignInTableAndColumnNames) {
    const std::string strTable = "\"" + UniqueTable() + "%%\"";
    VornJsonDbApi& api = OpenAs(strTable, Definition(strTable, "\"c%%\":int,d:int"), "x");
    Json::Value jRec = ParseJson(R"({"d":1})");
    EXPECT_EQ(-1, api.recSave(jRec, true));
    std::string strSingle = strTable;
    strSingle.erase(strSingle.find('%'), 1);
    EXPECT_EQ((Lines{"INSERT INTO " + strSingle + " (d) VALUES (1) ;select * from " + strTable +
                     " where rowid == last_insert_rowid();"}),
              TakeSql());
    TakeLog();
    Json::Value jBoth = ParseJson(R"({"\"c%%\"":1,"d":1})");
    EXPECT_EQ(-1, api.recSave(jBoth, true));
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ("check", WithFirstCheckNamed(TakeLog()).at(0));
}

}  // namespace testhost
