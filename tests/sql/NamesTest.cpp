// SqlExpandMemberName: the column list of an INSERT or a SELECT.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

class Names : public TableTest {
  protected:
    // The names written for a record given as JSON text, or for none at all.
    std::string Written(const char* szRecord = nullptr) {
        std::string strSql;
        if (szRecord == nullptr) {
            EXPECT_EQ(m_pHandle->SqlExpandMemberName(strSql), 0);
        } else {
            Json::Value jRec = ParseJson(szRecord);
            const Json::Value jBefore = jRec;
            EXPECT_EQ(m_pHandle->SqlExpandMemberName(strSql, &jRec), 0);
            EXPECT_EQ(jRec, jBefore);
        }
        EXPECT_EQ(TakeLog(), Lines());
        EXPECT_EQ(TakeSql(), Lines());
        return strSql;
    }
};

}  // namespace

TEST_F(Names, WithoutARecordEveryMemberIsListedInNameOrder) {
    Open("c:int,a:int,b:string");
    EXPECT_EQ(Written(), "a,b,c");
}

TEST_F(Names, AppendsToTheTextItIsGiven) {
    Open("a:int,b:int");
    std::string strSql = "SELECT ";
    EXPECT_EQ(m_pHandle->SqlExpandMemberName(strSql, nullptr), 0);
    EXPECT_EQ(strSql, "SELECT a,b");
}

TEST_F(Names, OrderIsThatOfTheBytes) {
    OpenMembers(
        u8R"({"é":{"cpptype":"int"},"a":{"cpptype":"int"},"B":{"cpptype":"int"},
                              "_":{"cpptype":"int"},"aa":{"cpptype":"int"},"Z":{"cpptype":"int"}})",
        "a");
    EXPECT_EQ(Written(), u8"B,Z,_,a,aa,é");
}

TEST_F(Names, CompleteRecordGivesTheWholeList) {
    Open("a:int,b:int");
    EXPECT_EQ(Written(R"({"a":1,"b":2})"), "a,b");
}

TEST_F(Names, MissingMiddleMemberLeavesNoGap) {
    Open("a:int,b:int,c:int");
    EXPECT_EQ(Written(R"({"a":1,"c":3})"), "a,c");
}

TEST_F(Names, MissingFirstMemberLeavesNoGap) {
    Open("a:int,b:int,c:int");
    EXPECT_EQ(Written(R"({"b":1,"c":3})"), "b,c");
}

TEST_F(Names, MissingLastMemberLeavesATrailingComma) {
    Open("a:int,b:int,c:int");
    EXPECT_EQ(Written(R"({"a":1,"b":3})"), "a,b,");
}

TEST_F(Names, RecordWithoutAnyMemberOfTheTableWritesNothing) {
    Open("a:int,b:int");
    EXPECT_EQ(Written("{}"), "");
    EXPECT_EQ(Written(R"({"x":1,"A":2})"), "");
}

TEST_F(Names, UnknownMembersOfTheRecordAreIgnored) {
    Open("a:int,b:int");
    EXPECT_EQ(Written(R"({"a":1,"ab":0,"b":2,"z":3})"), "a,b");
}

TEST_F(Names, UnknownMemberThatBeginsADeclaredNameIsIgnored) {
    Open("ab:int,abc:int");
    EXPECT_EQ(Written(R"({"a":1,"abc":2})"), "abc");
    EXPECT_EQ(Written(R"({"ab":1,"abcd":2})"), "ab,");
}

TEST_F(Names, PresentNullCountsAsPresent) {
    Open("a:int,b:int");
    EXPECT_EQ(Written(R"({"a":null,"b":null})"), "a,b");
}

TEST_F(Names, RecordOfAWrongKindHasNoMembers) {
    Open("a:int,b:int");
    for (const char* szRecord : {"null", "[]", "[\"a\",\"b\"]", "\"a\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szRecord);
        EXPECT_EQ(Written(szRecord), "");
    }
}

TEST_F(Names, ElementOfAListIsNoMemberWithoutAName) {
    Open(":int,b:int", "b");
    EXPECT_EQ(Written("[7]"), "");
    EXPECT_EQ(Written(R"({"":7})"), ",");
}

TEST_F(Names, SingleMemberNeedsNoComma) {
    Open("only:int");
    EXPECT_EQ(Written(), "only");
    EXPECT_EQ(Written(R"({"only":1})"), "only");
}

TEST_F(Names, NamesAreWrittenAsTheyStand) {
    OpenMembers(R"({"\"q\"":{"cpptype":"int"},"a b":{"cpptype":"int"},"it's":{"cpptype":"int"},
                 "p%s":{"cpptype":"int"}})",
                "a");
    EXPECT_EQ(Written(), R"("q",a b,it's,p%s)");
}

TEST_F(Names, EveryTypeNameIsListedEvenOneThatCannotBeRendered) {
    Open("a:time_t,b:Json::Value,c:nonsense");
    EXPECT_EQ(Written(R"({"a":1,"b":2,"c":3})"), "a,b,c");
}

TEST_F(Names, ListIsThatOfTheHandlesOwnDefinitionNotOfTheCache) {
    Open("a:int");
    Json::Value jRec = ParseJson(R"({"a":1})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), 0);
    m_pHandle = NewHandle(m_pDb, "t", Definition("t", "a:int,b:int"), "SELECT 1");
    TakeSql();
    EXPECT_EQ(Written(), "a,b");
}

TEST_F(Names, DefinitionOfAnyWrongShapeHasNoMembers) {
    for (const char* szDefinition :
         {"[1]", "\"text\"", "7", "true", "{\"other\":{}}", "{\"t\":[]}", "{\"t\":5}", "{\"t\":{}}",
          "{\"t\":{\"member\":[1]}}", "{\"t\":{\"member\":\"m\"}}", "{\"t\":{\"member\":null}}",
          "{\"t\":{\"member\":{}}}"}) {
        SCOPED_TRACE(szDefinition);
        OpenDefinition(ParseJson(szDefinition), "CREATE TABLE t (a)");
        EXPECT_EQ(Written(), "");
        EXPECT_EQ(Written(R"({"a":1})"), "");
    }
}

TEST_F(Names, FiveHundredAndTwelveMembers) {
    std::string strExpected;
    for (const std::string& strName : ManyMembers().getMemberNames()) {
        strExpected += (strExpected.empty() ? "" : ",") + strName;
    }
    OpenMembers(ManyMembers(), "a");
    EXPECT_EQ(Written(), strExpected);
}
