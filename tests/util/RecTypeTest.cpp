// recType: which definitions it takes, what it keeps, what it says of those that it refuses.
#include <unistd.h>

#include "../support/TableTest.h"

using namespace testhost;

namespace {

const char kCachedCheck[] = "jType[strJsonName].type() != Json::objectValue";
const char kTypeMissing[] = "!jTableDef[strJsonName][\"member\"][strKey].isMember(\"cpptype\")";
const char kTypeNoText[] = "!jTableDef[strJsonName][\"member\"][strKey][\"cpptype\"].isString()";
const char kNoMembers[] = "jType == Json::nullValue || !jType.isMember(strJsonName)";
const char kOneInt[] = R"({"t":{"member":{"a":{"cpptype":"int"}}}})";

class RecTypeTest : public TableTest {
  protected:
    // The lookup; the definition and the name stay as they are.
    static Json::Value& Look(const std::string& strDefinition, const std::string& strName = "t") {
        Json::Value jDefinition = ParseJson(strDefinition);
        std::string strGiven = strName;
        Json::Value& jType = VORN_JSON_DB::recType(jDefinition, strGiven);
        EXPECT_EQ(Compact(jDefinition), strDefinition);
        EXPECT_EQ(strGiven, strName);
        return jType;
    }

    static Lines Refusal(const std::string& strCondition, const std::string& strDefinition,
                         const std::string& strCache, const std::string& strName = "t") {
        return {UtilCheck(strCondition), UtilPlain("strJsonName=" + strName),
                UtilPlain("jTableDef=" + strDefinition), UtilPlain("jType=" + strCache)};
    }

    // A first lookup that fails leaves a null entry, and a correct definition comes too late.
    static void ExpectRefused(const std::string& strCondition, const std::string& strDefinition,
                              const std::string& strName = "t") {
        SCOPED_TRACE(strDefinition);
        ForgetTables();
        EXPECT_TRUE(Look(strDefinition, strName).isNull());
        EXPECT_EQ(TakeLog(), Refusal(strCondition, strDefinition, "null", strName));
        const std::string strGood = "{\"" + strName + R"(":{"member":{"a":{"cpptype":"int"}}}})";
        EXPECT_TRUE(Look(strGood, strName).isNull());
        EXPECT_EQ(TakeLog(), Refusal(kCachedCheck, strGood, "{\"" + strName + "\":null}", strName));
    }
};

}  // namespace

TEST_F(RecTypeTest, EntryHoldsTypeAndDefaultAndNothingElse) {
    Json::Value& jType = Look(R"({"t":{"comment":"x","member":{)"
                              R"("a":{"cppDefaultValue":"d","cpptype":"string","sqltype":"TEXT"},)"
                              R"("b":{"cpptype":"int","other":[1]}}},"zz":7})");
    EXPECT_EQ(Compact(jType),
              R"({"a":{"cppDefaultValue":"d","cpptype":"string"},"b":{"cpptype":"int"}})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, DefaultsOfEveryKindAreCopiedAsTheyAre) {
    const std::string strMember =
        R"({"a":{"cppDefaultValue":null,"cpptype":"int"},"b":{"cppDefaultValue":0,"cpptype":"int"},)"
        R"("c":{"cppDefaultValue":[],"cpptype":"int"},"d":{"cppDefaultValue":{"x":[1.5,true]},"cpptype":"int"}})";
    EXPECT_EQ(Compact(Look("{\"t\":{\"member\":" + strMember + "}}")), strMember);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, AnyTextIsATypeName) {
    const std::string strMember =
        R"({"a":{"cpptype":""},"b":{"cpptype":"no such type"},"c":{"cpptype":" INT "}})";
    EXPECT_EQ(Compact(Look("{\"t\":{\"member\":" + strMember + "}}")), strMember);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, FirstDefinitionWins) {
    const Json::Value jFirst = Look(kOneInt);
    EXPECT_EQ(Look(R"({"t":{"member":{"b":{"cpptype":"string"}}}})"), jFirst);
    EXPECT_EQ(Look(R"({"t":{"member":{"a":{"cpptype":7}}}})"), jFirst);
    EXPECT_EQ(Compact(jFirst), R"({"a":{"cpptype":"int"}})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, CachedTableNeedsNoDefinition) {
    Json::Value& jFirst = Look(kOneInt);
    for (const char* szDefinition : {"null", "{}", "[]", "\"text\"", "7", R"({"t":null})"}) {
        EXPECT_EQ(&Look(szDefinition), &jFirst);
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, SecondTableLeavesTheFirstAlone) {
    const std::string strDefinition =
        R"({"t":{"member":{"a":{"cpptype":"int"}}},"u":{"member":{"b":{"cpptype":"bool"}}}})";
    Json::Value& jFirst = Look(strDefinition);
    Json::Value& jSecond = Look(strDefinition, "u");
    EXPECT_EQ(Compact(jFirst), R"({"a":{"cpptype":"int"}})");
    EXPECT_EQ(Compact(jSecond), R"({"b":{"cpptype":"bool"}})");
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(&Look("null"), &jFirst);
        EXPECT_EQ(&Look("null", "u"), &jSecond);
        EXPECT_EQ(&Look("null", "u"), &jSecond);
    }
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_TRUE(Look("null", "").isNull());
    EXPECT_EQ(TakeLog().size(), 4U);
}

TEST_F(RecTypeTest, EntryIsACopyOfTheDefinition) {
    Json::Value jDefinition = ParseJson(kOneInt);
    std::string strName = "t";
    Json::Value& jType = VORN_JSON_DB::recType(jDefinition, strName);
    jDefinition["t"]["member"]["a"]["cpptype"] = "string";
    jDefinition.clear();
    EXPECT_EQ(Compact(jType), R"({"a":{"cpptype":"int"}})");
}

TEST_F(RecTypeTest, EmptyDefinitionIsRefused) {
    for (const char* szDefinition : {"null", "{}", "[]"}) {
        ExpectRefused("jTableDef.empty()", szDefinition);
    }
}

TEST_F(RecTypeTest, DefinitionWithoutTheTableIsRefused) {
    for (const char* szDefinition :
         {R"({"T":{"member":{"a":{"cpptype":"int"}}}})", "[1]", "\"t\"", "5"}) {
        ExpectRefused("!jTableDef.isMember(strJsonName)", szDefinition);
    }
}

TEST_F(RecTypeTest, TableEntryThatIsNoObjectIsRefused) {
    for (const char* szEntry : {"[]", "\"x\"", "1", "null"}) {
        ExpectRefused("!jTableDef[strJsonName].isObject()", "{\"t\":" + std::string(szEntry) + "}");
    }
}

TEST_F(RecTypeTest, TableEntryWithoutMembersIsRefused) {
    ExpectRefused("!jTableDef[strJsonName].isMember(\"member\")", R"({"t":{"Member":{}}})");
}

TEST_F(RecTypeTest, MembersThatAreNoObjectAreRefused) {
    for (const char* szMember : {"[]", "\"x\"", "1", "null"}) {
        ExpectRefused("!jTableDef[strJsonName][\"member\"].isObject()",
                      "{\"t\":{\"member\":" + std::string(szMember) + "}}");
    }
}

TEST_F(RecTypeTest, EntryThatTheHostChangedIsRefusedAtOnce) {
    Json::Value& jEntry = Look(kOneInt);
    EXPECT_EQ(&Look("null"), &jEntry);
    jEntry = 7;
    EXPECT_EQ(&Look("null"), &jEntry);
    EXPECT_EQ(TakeLog(), Refusal(kCachedCheck, "null", R"({"t":7})"));
}

TEST_F(RecTypeTest, EmptyNameIsRefusedOnlyAfterItsEntryWasFound) {
    ExpectRefused("strJsonName.empty()", R"({"":{"member":{"a":{"cpptype":"int"}}}})", "");
    ExpectRefused("!jTableDef.isMember(strJsonName)", R"({"t":{}})", "");
    ExpectRefused("!jTableDef[strJsonName][\"member\"].isObject()", R"({"":{"member":[]}})", "");
}

TEST_F(RecTypeTest, MemberWithoutATypeIsRefused) {
    for (const char* szMember :
         {R"({"cppDefaultValue":1})", "5", "\"cpptype\"", "[\"cpptype\"]", "null"}) {
        ExpectRefused(kTypeMissing, "{\"t\":{\"member\":{\"a\":" + std::string(szMember) + "}}}");
    }
}

TEST_F(RecTypeTest, TypeThatIsNoTextIsRefused) {
    for (const char* szType : {"5", "null", "[\"int\"]", "{}", "true"}) {
        ExpectRefused(kTypeNoText,
                      "{\"t\":{\"member\":{\"a\":{\"cpptype\":" + std::string(szType) + "}}}}");
    }
}

TEST_F(RecTypeTest, DefinitionWithNoMembersIsRefused) {
    ExpectRefused(kNoMembers, R"({"t":{"member":{}}})");
}

TEST_F(RecTypeTest, DefinitionWithNoMembersIsRefusedBesideOtherTables) {
    Look(R"({"s":{"member":{"a":{"cpptype":"int"}}}})", "s");
    const std::string strDefinition = R"({"t":{"member":{}}})";
    EXPECT_TRUE(Look(strDefinition).isNull());
    EXPECT_EQ(TakeLog(), Refusal(kNoMembers, strDefinition, R"({"s":{"a":{"cpptype":"int"}}})"));
    EXPECT_EQ(Compact(Look("null", "s")), R"({"a":{"cpptype":"int"}})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, FaultyMemberLeavesTheEarlierOnesAsTheWholeEntry) {
    const std::string strDefinition =
        R"({"t":{"member":{"a":{"cpptype":"int"},"b":{"cpptype":5},"c":{"cpptype":"bool"}}}})";
    const std::string strEntry = R"({"a":{"cpptype":"int"}})";
    EXPECT_EQ(Compact(Look(strDefinition)), strEntry);
    EXPECT_EQ(TakeLog(), Refusal(kTypeNoText, strDefinition, "{\"t\":" + strEntry + "}"));
    EXPECT_EQ(Compact(Look(strDefinition)), strEntry);
    EXPECT_EQ(Compact(Look("null")), strEntry);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, MembersAreTakenInKeyOrderNotInTheOrderOfWriting) {
    Json::Value jDefinition =
        ParseJson(R"({"t":{"member":{"b":{"cpptype":"int"},"a":{},"B":{"cpptype":"bool"}}}})");
    std::string strName = "t";
    EXPECT_EQ(Compact(VORN_JSON_DB::recType(jDefinition, strName)), R"({"B":{"cpptype":"bool"}})");
}

TEST_F(RecTypeTest, RefusalLinesDoNotDependOnTheDebugFlag) {
    blDebugOutput = true;
    ExpectRefused("jTableDef.empty()", "null");
}

TEST_F(RecTypeTest, RefusalShowsTheCacheOfAllTables) {
    const std::string strEntry = R"({"a":{"cppDefaultValue":"ü","cpptype":"string"}})";
    Look("null", "lost");
    Look("{\"s\":{\"member\":" + strEntry + "}}", "s");
    TakeLog();
    Look("{}");
    EXPECT_EQ(TakeLog(),
              Refusal("jTableDef.empty()", "{}", "{\"lost\":null,\"s\":" + strEntry + "}"));
}

TEST_F(RecTypeTest, EntryMadeByReadingAnUnknownMemberIsAnUnknownType) {
    // The reference is not const, so this makes a null entry.
    EXPECT_TRUE(Look(kOneInt)["nosuch"].isNull());
    Json::Value jRecord = ParseJson(R"({"a":1,"nosuch":2})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRecord), -1);
    EXPECT_EQ(TakeLog(), Lines{Located("type not found!!, key=nosuch")});
}

// A host's static that outlives the library's own and still calls it. Its destructor runs when the
// fresh process exits; a crash there is what the parent would see.
TEST_F(RecTypeTest, CallsFromTheDestructorOfAStaticStillWork) {
    EXPECT_EQ(InFreshProcess([] {
                  struct Late {
                      ~Late() {
                          std::string strTable = "t";
                          Json::Value jNone;
                          if (!VORN_JSON_DB::recType(jNone, strTable).isMember("a")) {
                              _exit(1);
                          }
                      }
                  };
                  static Late s_Late;
                  EXPECT_TRUE(Look(kOneInt).isMember("a"));
              }),
              0);
}
