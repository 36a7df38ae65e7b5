// SqlExpandMemberName: the column list of an INSERT or a SELECT.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

class Names : public FreshTableTest {
  protected:
    // The names written for a record given as JSON text, or for none at all.
    std::string Written(VornJsonDbApi& api, const char* szRecord = nullptr) {
        std::string strSql;
        if (szRecord == nullptr) {
            EXPECT_EQ(0, api.SqlExpandMemberName(strSql));
        } else {
            Json::Value jRec = ParseJson(szRecord);
            const Json::Value jBefore = jRec;
            EXPECT_EQ(0, api.SqlExpandMemberName(strSql, &jRec));
            EXPECT_EQ(jBefore, jRec);
        }
        EXPECT_EQ(Lines{}, TakeLog());
        EXPECT_EQ(Lines{}, TakeSql());
        return strSql;
    }
};

}  // namespace

TEST_F(Names, WithoutARecordEveryMemberIsListedInNameOrder) {
    EXPECT_EQ("a,b,c", Written(Open("c:int,a:int,b:string")));
}

TEST_F(Names, AppendsToTheTextItIsGiven) {
    VornJsonDbApi& api = Open("a:int,b:int");
    std::string strSql = "SELECT ";
    EXPECT_EQ(0, api.SqlExpandMemberName(strSql, nullptr));
    EXPECT_EQ("SELECT a,b", strSql);
}

TEST_F(Names, OrderIsThatOfTheBytes) {
    VornJsonDbApi& api = OpenMembers(
        ParseJson(u8R"({"é":{"cpptype":"int"},"a":{"cpptype":"int"},"B":{"cpptype":"int"},
                              "_":{"cpptype":"int"},"aa":{"cpptype":"int"},"Z":{"cpptype":"int"}})"),
        "a");
    EXPECT_EQ(u8"B,Z,_,a,aa,é", Written(api));
}

TEST_F(Names, CompleteRecordGivesTheWholeList) {
    EXPECT_EQ("a,b", Written(Open("a:int,b:int"), R"({"a":1,"b":2})"));
}

TEST_F(Names, MissingMiddleMemberLeavesNoGap) {
    EXPECT_EQ("a,c", Written(Open("a:int,b:int,c:int"), R"({"a":1,"c":3})"));
}

TEST_F(Names, MissingFirstMemberLeavesNoGap) {
    EXPECT_EQ("b,c", Written(Open("a:int,b:int,c:int"), R"({"b":1,"c":3})"));
}

TEST_F(Names, MissingLastMemberLeavesATrailingComma) {
    EXPECT_EQ("a,b,", Written(Open("a:int,b:int,c:int"), R"({"a":1,"b":3})"));
}

TEST_F(Names, RecordWithoutAnyMemberOfTheTableWritesNothing) {
    VornJsonDbApi& api = Open("a:int,b:int");
    EXPECT_EQ("", Written(api, "{}"));
    EXPECT_EQ("", Written(api, R"({"x":1,"A":2})"));
}

TEST_F(Names, UnknownMembersOfTheRecordAreIgnored) {
    EXPECT_EQ("a,b", Written(Open("a:int,b:int"), R"({"a":1,"ab":0,"b":2,"z":3})"));
}

TEST_F(Names, UnknownMemberThatBeginsADeclaredNameIsIgnored) {
    VornJsonDbApi& api = Open("ab:int,abc:int");
    EXPECT_EQ("abc", Written(api, R"({"a":1,"abc":2})"));
    EXPECT_EQ("ab,", Written(api, R"({"ab":1,"abcd":2})"));
}

TEST_F(Names, PresentNullCountsAsPresent) {
    EXPECT_EQ("a,b", Written(Open("a:int,b:int"), R"({"a":null,"b":null})"));
}

TEST_F(Names, RecordOfAWrongKindHasNoMembers) {
    VornJsonDbApi& api = Open("a:int,b:int");
    for (const char* szRecord : {"null", "[]", "[\"a\",\"b\"]", "\"a\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szRecord);
        EXPECT_EQ("", Written(api, szRecord));
    }
}

TEST_F(Names, ElementOfAListIsNoMemberWithoutAName) {
    VornJsonDbApi& api = Open(":int,b:int", "b");
    EXPECT_EQ("", Written(api, "[7]"));
    EXPECT_EQ(",", Written(api, R"({"":7})"));
}

TEST_F(Names, SingleMemberNeedsNoComma) {
    VornJsonDbApi& api = Open("only:int");
    EXPECT_EQ("only", Written(api));
    EXPECT_EQ("only", Written(api, R"({"only":1})"));
}

TEST_F(Names, NamesAreWrittenAsTheyStand) {
    VornJsonDbApi& api = OpenMembers(
        ParseJson(R"({"\"q\"":{"cpptype":"int"},"a b":{"cpptype":"int"},"it's":{"cpptype":"int"},
                 "p%s":{"cpptype":"int"}})"),
        "a");
    EXPECT_EQ(R"("q",a b,it's,p%s)", Written(api));
}

TEST_F(Names, EveryTypeNameIsListedEvenOneThatCannotBeRendered) {
    EXPECT_EQ("a,b,c",
              Written(Open("a:time_t,b:Json::Value,c:nonsense"), R"({"a":1,"b":2,"c":3})"));
}

TEST_F(Names, ListIsThatOfTheHandlesOwnDefinitionNotOfTheCache) {
    VornJsonDbApi& first = Open("a:int");
    Json::Value jRec = ParseJson(R"({"a":1})");
    EXPECT_EQ(0, first.checkJsonType(jRec));
    VornJsonDbApi& second = OpenAs(m_strTable, Definition(m_strTable, "a:int,b:int"), "a");
    EXPECT_EQ("a,b", Written(second));
}

TEST_F(Names, DefinitionOfAnyWrongShapeHasNoMembers) {
    for (const char* szDefinition :
         {"[1]", "\"text\"", "7", "true", "{\"other\":{}}", "{\"T\":[]}", "{\"T\":5}", "{\"T\":{}}",
          "{\"T\":{\"member\":[1]}}", "{\"T\":{\"member\":\"m\"}}", "{\"T\":{\"member\":null}}",
          "{\"T\":{\"member\":{}}}"}) {
        SCOPED_TRACE(szDefinition);
        const std::string strTable = UniqueTable();
        std::string strDefinition = szDefinition;
        const std::size_t nPos = strDefinition.find("\"T\"");
        if (nPos != std::string::npos) {
            strDefinition.replace(nPos, 3, "\"" + strTable + "\"");
        }
        VornJsonDbApi& api = OpenAs(strTable, ParseJson(strDefinition), "a");
        EXPECT_EQ("", Written(api));
        EXPECT_EQ("", Written(api, R"({"a":1})"));
    }
}

TEST_F(Names, FiveHundredAndTwelveMembers) {
    Json::Value jMembers(Json::objectValue);
    std::string strExpected;
    for (int i = 0; i < 512; ++i) {
        const std::string strName = "m" + std::to_string(1000 + i);
        jMembers[strName]["cpptype"] = "int";
        strExpected += (i == 0 ? "" : ",") + strName;
    }
    EXPECT_EQ(strExpected, Written(OpenMembers(jMembers, "a")));
}

}  // namespace testhost
