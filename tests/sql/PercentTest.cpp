// Percent signs in a value list: text that is formatted again with every later present member.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

// True for one long condition check of the class, whatever its condition.
bool IsCheck(const std::string& strLine) {
    const std::string strHead = "class located: Failed [";
    const std::string strTail = "], err=%m";
    return strLine.size() > strHead.size() + strTail.size() &&
           strLine.compare(0, strHead.size(), strHead) == 0 &&
           strLine.compare(strLine.size() - strTail.size(), strTail.size(), strTail) == 0;
}

// Lines with the first one replaced by "check" when it is some condition check: for a refusal whose
// condition text is nobody's promise.
Lines WithFirstCheckNamed(Lines vecLines) {
    if (!vecLines.empty() && IsCheck(vecLines.front())) {
        vecLines.front() = "check";
    }
    return vecLines;
}

class Percent : public TableTest {
  protected:
    // Three members in name order: two texts and a number.
    void SetUp() override {
        TableTest::SetUp();
        Open("a:string,b:string,c:int");
    }

    std::string Rendered(const char* szRecord, std::string strSql = "(") {
        Json::Value jRec = ParseJson(szRecord);
        EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), 0) << szRecord;
        EXPECT_EQ(TakeLog(), Lines());
        return strSql;
    }

    // One check of the library's own wording, the text as it came, and a handle that works on.
    void ExpectRefused(const Json::Value& jRecord, const std::string& strText = "(") {
        std::string strSql = strText;
        Json::Value jRec = jRecord;
        EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), -1);
        EXPECT_EQ(strSql, strText);
        EXPECT_EQ(jRec, jRecord);
        EXPECT_EQ(WithFirstCheckNamed(TakeLog()), Lines{"check"});
        EXPECT_EQ(Rendered(R"({"a":"x","c":1})"), "('x',1) ");
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
    EXPECT_EQ(Rendered(R"({"a":"50%%","c":1})"), "('50%',1) ");
}

TEST_F(Percent, DoubledSignStaysDoubledWithoutALaterPresentMember) {
    EXPECT_EQ(Rendered(R"({"a":"50%%"})"), "('50%%',");
    EXPECT_EQ(Rendered(R"({"a":"50%%","zz":1})"), "('50%%',");
}

TEST_F(Percent, DoubledSignInTheLastMemberStaysDoubled) {
    Open("a:string,b:string");
    EXPECT_EQ(Rendered(R"({"a":"x","b":"50%%"})"), "('x','50%%') ");
}

TEST_F(Percent, LastMemberIsStoredAsGivenWhateverItHolds) {
    for (const char* szText : kConversions) {
        SCOPED_TRACE(szText);
        Open("a:int,b:string");
        Json::Value jRec(Json::objectValue);
        jRec["a"] = 1;
        jRec["b"] = szText;
        std::string strSql = "(";
        EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), 0);
        EXPECT_EQ(strSql, "(1,'" + std::string(szText) + "') ");
        EXPECT_EQ(TakeLog(), Lines());
    }
}

TEST_F(Percent, EveryLaterPresentMemberHalvesTheSigns) {
    EXPECT_EQ(Rendered(R"({"a":"%%%%","b":"y","c":1})"), "('%','y',1) ");
    EXPECT_EQ(Rendered(R"({"a":"%%%%","c":1})"), "('%%',1) ");
    EXPECT_EQ(Rendered(R"({"a":"%%%%%%%%%%%%","b":"%%","c":1})"), "('%%%','%',1) ");
}

TEST_F(Percent, DoubledSignWithTwoLaterMembersIsBrokenAtTheSecond) {
    ExpectRefused(ParseJson(R"({"a":"50%%","b":"y","c":1})"));
}

TEST_F(Percent, ConversionHiddenByOneDoublingIsFoundAtTheSecondPass) {
    EXPECT_EQ(Rendered(R"({"a":"%%s","c":1})"), "('%s',1) ");
    ExpectRefused(ParseJson(R"({"a":"%%s","b":"y","c":1})"));
    ExpectRefused(ParseJson(R"({"a":"%%d","b":"y","c":1})"));
}

TEST_F(Percent, EveryOtherConversionInAnEarlierValueIsRefused) {
    for (const char* szText : kConversions) {
        SCOPED_TRACE(szText);
        Json::Value jRec(Json::objectValue);
        jRec["a"] = szText;
        jRec["c"] = 1;
        ExpectRefused(jRec);
    }
}

TEST_F(Percent, SignBeforeTheClosingQuoteIsRefused) {
    ExpectRefused(ParseJson(R"({"a":"100%","b":"); drop table t; --","c":1})"));
}

TEST_F(Percent, SignBeforeAnApostropheIsRefused) {
    ExpectRefused(ParseJson(R"({"a":"%'s","c":1})"));
}

TEST_F(Percent, SignBeforeAForeignLetterIsRefused) {
    ExpectRefused(ParseJson(u8R"({"a":"5%é","c":1})"));
}

TEST_F(Percent, JsonTypedValueIsFormattedAgainToo) {
    Open("a:Json::objectValue,c:int");
    EXPECT_EQ(Rendered(R"({"a":{"k":"%%"},"c":1})"), "('{\"k\":\"%\"}',1) ");
    std::string strSql = "(";
    Json::Value jRec = ParseJson(R"({"a":{"k":"%s"},"c":1})");
    EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), -1);
    EXPECT_EQ(strSql, "(");
    EXPECT_EQ(WithFirstCheckNamed(TakeLog()), Lines{"check"});
}

TEST_F(Percent, MemberOfEveryRenderedTypeMakesAPass) {
    for (const char* szType : {"string", "long long", "int", "long", "bool", "unsigned long long",
                               "unsigned int", "unsigned long", "unsigned"}) {
        SCOPED_TRACE(szType);
        Open(std::string("a:string,z:") + szType);
        const std::string strOne = std::string(szType) == "string" ? "'1'" : "1";
        EXPECT_EQ(Rendered(R"({"a":"%%","z":1})"), "('%'," + strOne + ") ");
    }
    for (const char* szType : {"float", "double"}) {
        SCOPED_TRACE(szType);
        Open(std::string("a:string,z:") + szType);
        EXPECT_EQ(Rendered(R"({"a":"%%","z":1})"), "('%',1.000000) ");
    }
    for (const char* szType : {"Json::objectValue", "Json::arrayValue"}) {
        SCOPED_TRACE(szType);
        Open(std::string("a:string,z:") + szType);
        EXPECT_EQ(Rendered(R"({"a":"%%","z":1})"), "('%','1') ");
    }
}

TEST_F(Percent, TextBeforeTheValuesIsFormattedWithEachMember) {
    EXPECT_EQ(Rendered(R"({"c":1})", "INTO \"p%%\" ("), "INTO \"p%\" (1) ");
    EXPECT_EQ(Rendered(R"({"a":"x","c":1})", "INTO \"p%%%%\" ("), "INTO \"p%\" ('x',1) ");
}

TEST_F(Percent, ConversionInTheTextBeforeTheValuesIsRefused) {
    for (const char* szText : {"INTO \"p%s\" (", "INTO \"p%\" (", "INTO p%%%n (", "% ("}) {
        SCOPED_TRACE(szText);
        ExpectRefused(ParseJson(R"({"c":1})"), szText);
    }
}

TEST_F(Percent, SignAtTheVeryEndOfTheTextDoublesTheOneOfTheSpecifier) {
    EXPECT_EQ(Rendered(R"({"c":1})", "(%"), "(%lld) ");
    EXPECT_EQ(Rendered(R"({"a":"x"})", "(%%%"), "(%%Q,");
}

TEST_F(Percent, ConversionBegunAtTheEndOfTheTextIsRefused) {
    for (const char* szText : {"(%5", "(%-", "(%l", "(%.", "(%*", "(%%%0"}) {
        SCOPED_TRACE(szText);
        ExpectRefused(ParseJson(R"({"a":"x"})"), szText);
    }
}

TEST_F(Percent, TextBeforeTheValuesEndsAtItsFirstNul) {
    // The formatter reads a C string, so the value's own place is cut off, too.
    EXPECT_EQ(Rendered(R"({"c":1})", std::string("(\0%s", 4)), "() ");
    EXPECT_EQ(Rendered(R"({"c":1})", std::string("(%\0s", 4)), "(%) ");
    ExpectRefused(ParseJson(R"({"c":1})"), std::string("(%s\0", 4));
}

TEST_F(Percent, WithoutAPresentMemberNothingIsFormatted) {
    EXPECT_EQ(Rendered("{}", "%s %% %"), "%s %% %");
}

TEST_F(Percent, UnknownTypeIsReportedAfterTheMembersBeforeIt) {
    Open("a:string,b:time_t");
    Json::Value jRec = ParseJson(R"({"a":"%s","b":1})");
    std::string strSql = "(";
    EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("cannot support this type=time_t")}));
}

TEST_F(Percent, AgreesWithTheFormatterPassByPass) {
    for (const char* szText : {"%%%%", "a%%%%b", "%%%%%%%%", "'%%%%'", "%%%% %%%% %%%%"}) {
        SCOPED_TRACE(szText);
        Json::Value jRec(Json::objectValue);
        jRec["a"] = szText;
        jRec["b"] = "it's";
        jRec["c"] = 5;
        std::string strSql = "(";
        EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), 0);
        char* szFirst = sqlite3_mprintf("(%Q", szText);
        char* szSecond = sqlite3_mprintf((std::string(szFirst) + ",%Q").c_str(), "it's");
        char* szThird = sqlite3_mprintf((std::string(szSecond) + ",%lld").c_str(), 5LL);
        EXPECT_EQ(strSql, std::string(szThird) + ") ");
        sqlite3_free(szFirst);
        sqlite3_free(szSecond);
        sqlite3_free(szThird);
    }
}

TEST_F(Percent, LongTextFullOfDoubledSigns) {
    Json::Value jRec(Json::objectValue);
    jRec["a"] = std::string(512 * 1024, '%');
    jRec["c"] = 1;
    std::string strSql = "(";
    EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), 0);
    EXPECT_TRUE("('" + std::string(256 * 1024, '%') + "',1) " == strSql);
}

TEST_F(Percent, RefusedRecordRunsNothingAndTheHandleWorksOn) {
    Json::Value jRec = ParseJson(R"({"a":"%n","b":"y","c":1})");
    const Json::Value jBefore = jRec;
    EXPECT_EQ(m_pHandle->recSave(jRec, true), -1);
    EXPECT_EQ(
        WithFirstCheckNamed(TakeLog()),
        (Lines{"check", Check("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
               Plain("blCreate=1, jRecInOut=" + Compact(jBefore)), Plain("jType=" + Types())}));
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(jRec, jBefore);
    jRec["a"] = "fine";
    EXPECT_EQ(m_pHandle->recSave(jRec, true), 0);
    EXPECT_EQ(All(), "fine|y|1");
}

TEST_F(Percent, EarlierErrorTextShowsBehindTheRefusal) {
    MakeStaleError();
    Json::Value jRec = ParseJson(R"({"a":"%n","b":"y","c":1})");
    EXPECT_EQ(m_pHandle->recSave(jRec, false), -1);
    const Lines vecLines = WithFirstCheckNamed(TakeLog());
    ASSERT_EQ(vecLines.size(), 5U);
    EXPECT_EQ(vecLines[4], SqlError("no such column: stale", "REPLACE INTO t (a,b,c) VALUES ("));
}

TEST_F(Percent, CreateReportsTheRefusalThroughItsOwnTail) {
    Json::Value jIn = ParseJson(R"({"a":"100%","b":"y","c":1})");
    Json::Value jOut("kept");
    EXPECT_EQ(m_pHandle->recCreate(jIn, jOut), -1);
    const Lines vecLines = WithFirstCheckNamed(TakeLog());
    ASSERT_EQ(vecLines.size(), 6U);
    EXPECT_EQ(vecLines[0], "check");
    EXPECT_EQ(vecLines[1], Check("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"));
    EXPECT_EQ(vecLines[4], Check("0 > recSave(jParam, true)"));
    EXPECT_EQ(vecLines[5], Plain("call create rec, rec=" + Compact(jIn)));
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(jOut, Json::Value("kept"));
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
}

TEST_F(Percent, SignInTableAndColumnNames) {
    m_pHandle = NewHandle(m_pDb, "\"t%%\"", Definition("\"t%%\"", "\"c%%\":int,d:int"), "SELECT 1");
    TakeSql();
    Json::Value jRec = ParseJson(R"({"d":1})");
    EXPECT_EQ(m_pHandle->recSave(jRec, true), -1);
    EXPECT_EQ(TakeSql(),
              Lines{"INSERT INTO \"t%\" (d) VALUES (1) ;select * from \"t%%\" where rowid "
                    "== last_insert_rowid();"});
    TakeLog();
    Json::Value jBoth = ParseJson(R"({"\"c%%\"":1,"d":1})");
    EXPECT_EQ(m_pHandle->recSave(jBoth, true), -1);
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(WithFirstCheckNamed(TakeLog()).at(0), "check");
}
