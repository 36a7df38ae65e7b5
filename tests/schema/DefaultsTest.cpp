// fillDefaultValue: filling a record from the definition, and the strict mode that only looks.
#include "FreshTable.h"

namespace testhost {

namespace {

class Defaults : public FreshTableTest {
  protected:
    // name has the default "x", size has none.
    VornJsonDbApi& OpenNameAndSize() {
        return OpenMembers(ParseJson(R"({"name":{"cpptype":"string","cppDefaultValue":"x"},
                                    "size":{"cpptype":"int"}})"),
                           "name,size");
    }
};

}  // namespace

TEST_F(Defaults, MissingMemberTakesItsDefaultAndOneWithoutStaysMissing) {
    VornJsonDbApi& api = OpenNameAndSize();
    Json::Value jRec(Json::objectValue);
    EXPECT_EQ(0, api.fillDefaultValue(jRec, false));
    EXPECT_EQ(R"({"name":"x"})", Compact(jRec));
    EXPECT_EQ(Lines{}, TakeLog());
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Defaults, PresentNullIsNotReplaced) {
    VornJsonDbApi& api = OpenNameAndSize();
    Json::Value jRec = ParseJson(R"({"name":null})");
    EXPECT_EQ(0, api.fillDefaultValue(jRec, false));
    EXPECT_EQ(R"({"name":null})", Compact(jRec));
}

TEST_F(Defaults, PresentValueOfAnyKindIsLeftAsItIs) {
    VornJsonDbApi& api = OpenNameAndSize();
    for (const char* szValue : {"7", "\"\"", "[]", "{}", "false", "1.5"}) {
        Json::Value jRec(Json::objectValue);
        jRec["name"] = ParseJson(szValue);
        EXPECT_EQ(0, api.fillDefaultValue(jRec, false));
        EXPECT_EQ(std::string(R"({"name":)") + szValue + "}", Compact(jRec));
    }
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(Defaults, DefaultKeepsItsKind) {
    VornJsonDbApi& api = OpenMembers(ParseJson(R"({"a":{"cpptype":"int","cppDefaultValue":0},
                                              "b":{"cpptype":"string","cppDefaultValue":""},
                                              "c":{"cpptype":"x","cppDefaultValue":[]},
                                              "d":{"cpptype":"x","cppDefaultValue":{"k":[1,{}]}},
                                              "e":{"cpptype":"x","cppDefaultValue":null},
                                              "f":{"cpptype":"x","cppDefaultValue":false},
                                              "g":{"cpptype":"x","cppDefaultValue":1.5}})"),
                                     "a,b,c,d,e,f,g");
    Json::Value jRec(Json::objectValue);
    EXPECT_EQ(0, api.fillDefaultValue(jRec, false));
    EXPECT_EQ(R"({"a":0,"b":"","c":[],"d":{"k":[1,{}]},"e":null,"f":false,"g":1.5})",
              Compact(jRec));
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(Defaults, EachRecordGetsItsOwnCopy) {
    VornJsonDbApi& api = OpenMembers(
        ParseJson(R"({"list":{"cpptype":"Json::arrayValue","cppDefaultValue":[1]}})"), "list");
    Json::Value jFirst(Json::objectValue);
    EXPECT_EQ(0, api.fillDefaultValue(jFirst, false));
    jFirst["list"].append(2);
    Json::Value jSecond(Json::objectValue);
    EXPECT_EQ(0, api.fillDefaultValue(jSecond, false));
    EXPECT_EQ(R"({"list":[1]})", Compact(jSecond));
}

TEST_F(Defaults, MembersUnknownToTheTableAreUntouched) {
    VornJsonDbApi& api = OpenNameAndSize();
    Json::Value jRec = ParseJson(R"({"zz":[null],"aa":1})");
    EXPECT_EQ(0, api.fillDefaultValue(jRec, false));
    EXPECT_EQ(R"({"aa":1,"name":"x","zz":[null]})", Compact(jRec));
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(Defaults, NullRecordBecomesAnObjectWithTheFirstDefault) {
    VornJsonDbApi& api = OpenNameAndSize();
    Json::Value jRec;
    EXPECT_EQ(0, api.fillDefaultValue(jRec, false));
    EXPECT_EQ(R"({"name":"x"})", Compact(jRec));
}

TEST_F(Defaults, NullRecordStaysNullWithoutAnyDefault) {
    VornJsonDbApi& api = Open("a:int,b:string");
    Json::Value jRec;
    EXPECT_EQ(0, api.fillDefaultValue(jRec, false));
    EXPECT_TRUE(jRec.isNull());
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(Defaults, RecordNeitherObjectNorNullIsLeftAloneWhenFilling) {
    VornJsonDbApi& api = OpenNameAndSize();
    for (const char* szValue : {"[]", "[1]", "\"name\"", "\"\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szValue);
        Json::Value jRec = ParseJson(szValue);
        EXPECT_EQ(0, api.fillDefaultValue(jRec, false));
        EXPECT_EQ(ParseJson(szValue), jRec);
        EXPECT_EQ(Lines{}, TakeLog());
    }
}

TEST_F(Defaults, StrictPassesACompleteRecordUnchanged) {
    VornJsonDbApi& api = OpenNameAndSize();
    Json::Value jRec = ParseJson(R"({"extra":1,"name":null,"size":"any"})");
    const Json::Value jBefore = jRec;
    EXPECT_EQ(0, api.fillDefaultValue(jRec, true));
    EXPECT_EQ(jBefore, jRec);
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(Defaults, StrictNamesTheMissingMember) {
    VornJsonDbApi& api = OpenNameAndSize();
    Json::Value jRec = ParseJson(R"({"name":"n"})");
    EXPECT_EQ(-1, api.fillDefaultValue(jRec, true));
    EXPECT_EQ((Lines{Located("lost data member=size")}), TakeLog());
    EXPECT_EQ(R"({"name":"n"})", Compact(jRec));
}

TEST_F(Defaults, StrictShowsTheRecordOnlyWithDebugOutput) {
    VornJsonDbApi& api = OpenNameAndSize();
    Json::Value jRec = ParseJson(R"({"name":"n"})");
    blDebugOutput = true;
    EXPECT_EQ(-1, api.fillDefaultValue(jRec, true));
    EXPECT_EQ((Lines{Located("lost data member=size"), Plain(R"(jParam={"name":"n"})")}),
              TakeLog());
    blDebugOutput = false;
    EXPECT_EQ(-1, api.fillDefaultValue(jRec, true));
    EXPECT_EQ((Lines{Located("lost data member=size")}), TakeLog());
}

TEST_F(Defaults, StrictPrintsBothLinesWhenLogGoesToStandardOutput) {
    VornJsonDbApi& api = OpenNameAndSize();
    Json::Value jRec(Json::objectValue);
    Lines vecLines;
    {
        StdoutCapture capture;
        blLogToStdout = true;
        blDebugOutput = true;
        EXPECT_EQ(-1, api.fillDefaultValue(jRec, true));
        vecLines = TakeLog();
        blLogToStdout = false;
    }
    EXPECT_EQ((Lines{Located("lost data member=name"), Plain("jParam={}")}), vecLines);
    EXPECT_TRUE(TakeSyslogCalls().empty());
}

TEST_F(Defaults, StrictNeverFillsEvenWhereADefaultExists) {
    VornJsonDbApi& api = OpenNameAndSize();
    Json::Value jRec = ParseJson(R"({"size":1})");
    EXPECT_EQ(-1, api.fillDefaultValue(jRec, true));
    EXPECT_EQ((Lines{Located("lost data member=name")}), TakeLog());
    EXPECT_EQ(R"({"size":1})", Compact(jRec));
}

TEST_F(Defaults, StrictReportsOnlyTheFirstMissingInKeyOrder) {
    VornJsonDbApi& api = Open("c:int,b:int,a:int");
    Json::Value jRec = ParseJson(R"({"a":1})");
    EXPECT_EQ(-1, api.fillDefaultValue(jRec, true));
    EXPECT_EQ((Lines{Located("lost data member=b")}), TakeLog());
}

TEST_F(Defaults, StrictOnANullRecordFindsTheFirstMemberMissing) {
    VornJsonDbApi& api = OpenNameAndSize();
    Json::Value jRec;
    blDebugOutput = true;
    EXPECT_EQ(-1, api.fillDefaultValue(jRec, true));
    EXPECT_EQ((Lines{Located("lost data member=name"), Plain("jParam=null")}), TakeLog());
    EXPECT_TRUE(jRec.isNull());
}

TEST_F(Defaults, StrictTreatsAWrongKindAsARecordWithoutMembers) {
    VornJsonDbApi& api = OpenNameAndSize();
    for (const char* szValue : {"[1]", "\"name\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szValue);
        Json::Value jRec = ParseJson(szValue);
        EXPECT_EQ(-1, api.fillDefaultValue(jRec, true));
        EXPECT_EQ((Lines{Located("lost data member=name")}), TakeLog());
        EXPECT_EQ(ParseJson(szValue), jRec);
    }
}

TEST_F(Defaults, DefinitionWithoutMembersYieldsZeroInBothModes) {
    VornJsonDbApi& api = OpenMembers(ParseJson("{}"), "a");
    Json::Value jRec = ParseJson(R"({"a":1})");
    EXPECT_EQ(0, api.fillDefaultValue(jRec, true));
    const Lines vecLines = TakeLog();
    ASSERT_EQ(4U, vecLines.size());
    EXPECT_EQ(UtilCheck("jType == Json::nullValue || !jType.isMember(strJsonName)"), vecLines[0]);
    EXPECT_EQ(0, api.fillDefaultValue(jRec, false));
    EXPECT_EQ(UtilCheck("jType[strJsonName].type() != Json::objectValue"), TakeLog().at(0));
    EXPECT_EQ(R"({"a":1})", Compact(jRec));
}

TEST_F(Defaults, FirstDefinitionOfATableNameKeepsItsDefaults) {
    VornJsonDbApi& first = OpenNameAndSize();
    Json::Value jRec(Json::objectValue);
    EXPECT_EQ(0, first.fillDefaultValue(jRec, false));
    Json::Value jOther(Json::objectValue);
    jOther[m_strTable]["member"] = ParseJson(R"({"size":{"cpptype":"int","cppDefaultValue":9}})");
    VornJsonDbApi& second = OpenAs(m_strTable, jOther, "name,size");
    Json::Value jAgain(Json::objectValue);
    EXPECT_EQ(0, second.fillDefaultValue(jAgain, false));
    EXPECT_EQ(R"({"name":"x"})", Compact(jAgain));
}

TEST_F(Defaults, NoModeTouchesTheErrorMessage) {
    VornJsonDbApi& api = OpenNameAndSize();
    api.setErrMsg("kept");
    Json::Value jRec(Json::objectValue);
    EXPECT_EQ(-1, api.fillDefaultValue(jRec, true));
    EXPECT_EQ(0, api.fillDefaultValue(jRec, false));
    EXPECT_EQ("kept", api.getErrMsg());
    TakeLog();
}

}  // namespace testhost
