// fillDefaultValue: filling a record from the definition, and the strict mode that only looks.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

class Defaults : public TableTest {
  protected:
    // name has the default "x", size has none.
    void SetUp() override {
        TableTest::SetUp();
        OpenMembers(R"({"name":{"cpptype":"string","cppDefaultValue":"x"},
                        "size":{"cpptype":"int"}})",
                    "name,size");
    }
};

}  // namespace

TEST_F(Defaults, MissingMemberTakesItsDefaultAndOneWithoutStaysMissing) {
    Json::Value jRec(Json::objectValue);
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
    EXPECT_EQ(Compact(jRec), R"({"name":"x"})");
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Defaults, PresentNullIsNotReplaced) {
    Json::Value jRec = ParseJson(R"({"name":null})");
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
    EXPECT_EQ(Compact(jRec), R"({"name":null})");
}

TEST_F(Defaults, PresentValueOfAnyKindIsLeftAsItIs) {
    for (const char* szValue : {"7", "\"\"", "[]", "{}", "false", "1.5"}) {
        Json::Value jRec(Json::objectValue);
        jRec["name"] = ParseJson(szValue);
        EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
        EXPECT_EQ(Compact(jRec), std::string(R"({"name":)") + szValue + "}");
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(Defaults, DefaultKeepsItsKind) {
    OpenMembers(R"({"a":{"cpptype":"int","cppDefaultValue":0},
                    "b":{"cpptype":"string","cppDefaultValue":""},
                    "c":{"cpptype":"x","cppDefaultValue":[]},
                    "d":{"cpptype":"x","cppDefaultValue":{"k":[1,{}]}},
                    "e":{"cpptype":"x","cppDefaultValue":null},
                    "f":{"cpptype":"x","cppDefaultValue":false},
                    "g":{"cpptype":"x","cppDefaultValue":1.5}})",
                "a,b,c,d,e,f,g");
    Json::Value jRec(Json::objectValue);
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
    EXPECT_EQ(Compact(jRec),
              R"({"a":0,"b":"","c":[],"d":{"k":[1,{}]},"e":null,"f":false,"g":1.5})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(Defaults, EachRecordGetsItsOwnCopy) {
    OpenMembers(R"({"list":{"cpptype":"Json::arrayValue","cppDefaultValue":[1]}})", "list");
    Json::Value jFirst(Json::objectValue);
    EXPECT_EQ(m_pHandle->fillDefaultValue(jFirst, false), 0);
    jFirst["list"].append(2);
    Json::Value jSecond(Json::objectValue);
    EXPECT_EQ(m_pHandle->fillDefaultValue(jSecond, false), 0);
    EXPECT_EQ(Compact(jSecond), R"({"list":[1]})");
}

TEST_F(Defaults, MembersUnknownToTheTableAreUntouched) {
    Json::Value jRec = ParseJson(R"({"zz":[null],"aa":1})");
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
    EXPECT_EQ(Compact(jRec), R"({"aa":1,"name":"x","zz":[null]})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(Defaults, NullRecordBecomesAnObjectWithTheFirstDefault) {
    Json::Value jRec;
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
    EXPECT_EQ(Compact(jRec), R"({"name":"x"})");
}

TEST_F(Defaults, NullRecordStaysNullWithoutAnyDefault) {
    Open("a:int,b:string");
    Json::Value jRec;
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
    EXPECT_TRUE(jRec.isNull());
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(Defaults, RecordNeitherObjectNorNullIsLeftAloneWhenFilling) {
    for (const char* szValue : {"[]", "[1]", "\"name\"", "\"\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szValue);
        Json::Value jRec = ParseJson(szValue);
        EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
        EXPECT_EQ(jRec, ParseJson(szValue));
        EXPECT_EQ(TakeLog(), Lines());
    }
}

TEST_F(Defaults, StrictPassesACompleteRecordUnchanged) {
    Json::Value jRec = ParseJson(R"({"extra":1,"name":null,"size":"any"})");
    const Json::Value jBefore = jRec;
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), 0);
    EXPECT_EQ(jRec, jBefore);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(Defaults, StrictNamesTheMissingMember) {
    Json::Value jRec = ParseJson(R"({"name":"n"})");
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=size")}));
    EXPECT_EQ(Compact(jRec), R"({"name":"n"})");
}

TEST_F(Defaults, StrictShowsTheRecordOnlyWithDebugOutput) {
    Json::Value jRec = ParseJson(R"({"name":"n"})");
    blDebugOutput = true;
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), -1);
    EXPECT_EQ(TakeLog(),
              (Lines{Located("lost data member=size"), Plain(R"(jParam={"name":"n"})")}));
    blDebugOutput = false;
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=size")}));
}

TEST_F(Defaults, StrictPrintsBothLinesWhenLogGoesToStandardOutput) {
    Json::Value jRec(Json::objectValue);
    Lines vecLines;
    {
        StdoutCapture capture;
        blLogToStdout = true;
        blDebugOutput = true;
        EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), -1);
        vecLines = TakeLog();
        blLogToStdout = false;
    }
    EXPECT_EQ(vecLines, (Lines{Located("lost data member=name"), Plain("jParam={}")}));
    EXPECT_TRUE(TakeSyslogCalls().empty());
}

TEST_F(Defaults, StrictNeverFillsEvenWhereADefaultExists) {
    Json::Value jRec = ParseJson(R"({"size":1})");
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=name")}));
    EXPECT_EQ(Compact(jRec), R"({"size":1})");
}

TEST_F(Defaults, StrictReportsOnlyTheFirstMissingInKeyOrder) {
    Open("c:int,b:int,a:int");
    Json::Value jRec = ParseJson(R"({"a":1})");
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=b")}));
}

TEST_F(Defaults, StrictOnANullRecordFindsTheFirstMemberMissing) {
    Json::Value jRec;
    blDebugOutput = true;
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=name"), Plain("jParam=null")}));
    EXPECT_TRUE(jRec.isNull());
}

TEST_F(Defaults, StrictTreatsAWrongKindAsARecordWithoutMembers) {
    for (const char* szValue : {"[1]", "\"name\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szValue);
        Json::Value jRec = ParseJson(szValue);
        EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), -1);
        EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=name")}));
        EXPECT_EQ(jRec, ParseJson(szValue));
    }
}

TEST_F(Defaults, DefinitionWithoutMembersYieldsZeroInBothModes) {
    OpenMembers("{}", "a");
    Json::Value jRec = ParseJson(R"({"a":1})");
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), 0);
    const Lines vecLines = TakeLog();
    ASSERT_EQ(vecLines.size(), 4U);
    EXPECT_EQ(vecLines[0], UtilCheck("jType == Json::nullValue || !jType.isMember(strJsonName)"));
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
    EXPECT_EQ(TakeLog().at(0), UtilCheck("jType[strJsonName].type() != Json::objectValue"));
    EXPECT_EQ(Compact(jRec), R"({"a":1})");
}

TEST_F(Defaults, FirstDefinitionOfATableNameKeepsItsDefaults) {
    Json::Value jRec(Json::objectValue);
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
    Json::Value jOther(Json::objectValue);
    jOther["t"]["member"] = ParseJson(R"({"size":{"cpptype":"int","cppDefaultValue":9}})");
    const auto pSecond = NewHandle(m_pDb, "t", jOther, "SELECT 1");
    Json::Value jAgain(Json::objectValue);
    EXPECT_EQ(pSecond->fillDefaultValue(jAgain, false), 0);
    EXPECT_EQ(Compact(jAgain), R"({"name":"x"})");
}

TEST_F(Defaults, NoModeTouchesTheErrorMessage) {
    m_pHandle->setErrMsg("kept");
    Json::Value jRec(Json::objectValue);
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, true), -1);
    EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, false), 0);
    EXPECT_EQ(m_pHandle->getErrMsg(), "kept");
    TakeLog();
}
