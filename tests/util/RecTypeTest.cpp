// recType: which definitions it takes, what it keeps, what it says of those that it refuses.
//
// A failure logs the whole cache, so the tests of failures each run in a process whose cache is
// new.
#include <unistd.h>

#include "../support/TestHost.h"

using namespace testhost;

namespace {

using Lines = std::vector<std::string>;

const char* const kCachedCheck = "jType[strJsonName].type() != Json::objectValue";

class RecTypeTest : public ::testing::Test {
  protected:
    void SetUp() override { ResetHost(); }
    void TearDown() override { ResetHost(); }

    // The lookup; the definition and the name stay as they are.
    static Json::Value& Look(const std::string& strDefinition, const std::string& strName) {
        Json::Value jDefinition = ParseJson(strDefinition);
        std::string strGiven = strName;
        Json::Value& jType = VORN_JSON_DB::recType(jDefinition, strGiven);
        EXPECT_EQ(Compact(jDefinition), strDefinition);
        EXPECT_EQ(strGiven, strName);
        return jType;
    }

    static Lines Refusal(const std::string& strCondition, const std::string& strName,
                         const std::string& strDefinition, const std::string& strCache) {
        return {UtilCheck(strCondition), UtilPlain("strJsonName=" + strName),
                UtilPlain("jTableDef=" + strDefinition), UtilPlain("jType=" + strCache)};
    }

    // A first lookup that fails leaves a null entry, and a correct definition comes too late.
    static void ExpectFirstLookupRefused(const std::string& strCondition,
                                         const std::string& strName,
                                         const std::string& strDefinition) {
        EXPECT_TRUE(Look(strDefinition, strName).isNull());
        EXPECT_EQ(TakeLog(), Refusal(strCondition, strName, strDefinition, "null"));
        const std::string strGood = "{\"" + strName + R"(":{"member":{"a":{"cpptype":"int"}}}})";
        EXPECT_TRUE(Look(strGood, strName).isNull());
        EXPECT_EQ(TakeLog(), Refusal(kCachedCheck, strName, strGood, "{\"" + strName + "\":null}"));
    }
};

}  // namespace

TEST_F(RecTypeTest, EntryHoldsTypeAndDefaultAndNothingElse) {
    Json::Value& jType = Look(R"({"RtA":{"comment":"x","member":{)"
                              R"("a":{"cppDefaultValue":"d","cpptype":"string","sqltype":"TEXT"},)"
                              R"("b":{"cpptype":"int","other":[1]}}},"zz":7})",
                              "RtA");
    EXPECT_EQ(Compact(jType),
              R"({"a":{"cppDefaultValue":"d","cpptype":"string"},"b":{"cpptype":"int"}})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, DefaultsOfEveryKindAreCopiedAsTheyAre) {
    const std::string strMember =
        R"({"a":{"cppDefaultValue":null,"cpptype":"int"},"b":{"cppDefaultValue":0,"cpptype":"int"},)"
        R"("c":{"cppDefaultValue":[],"cpptype":"int"},"d":{"cppDefaultValue":{"x":[1.5,true]},"cpptype":"int"}})";
    EXPECT_EQ(Compact(Look("{\"RtB\":{\"member\":" + strMember + "}}", "RtB")), strMember);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, AnyTextIsATypeName) {
    const std::string strMember =
        R"({"a":{"cpptype":""},"b":{"cpptype":"no such type"},"c":{"cpptype":" INT "}})";
    EXPECT_EQ(Compact(Look("{\"RtC\":{\"member\":" + strMember + "}}", "RtC")), strMember);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, FirstDefinitionWins) {
    const Json::Value jFirst = Look(R"({"RtD":{"member":{"a":{"cpptype":"int"}}}})", "RtD");
    EXPECT_EQ(Look(R"({"RtD":{"member":{"b":{"cpptype":"string"}}}})", "RtD"), jFirst);
    EXPECT_EQ(Look(R"({"RtD":{"member":{"a":{"cpptype":7}}}})", "RtD"), jFirst);
    EXPECT_EQ(Compact(jFirst), R"({"a":{"cpptype":"int"}})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, CachedTableNeedsNoDefinition) {
    Json::Value& jFirst = Look(R"({"RtE":{"member":{"a":{"cpptype":"int"}}}})", "RtE");
    for (const char* szDefinition : {"null", "{}", "[]", "\"text\"", "7", R"({"RtE":null})"}) {
        EXPECT_EQ(&Look(szDefinition, "RtE"), &jFirst);
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, SecondTableLeavesTheFirstAlone) {
    const std::string strDefinition =
        R"({"RtF":{"member":{"a":{"cpptype":"int"}}},"RtG":{"member":{"b":{"cpptype":"bool"}}}})";
    Json::Value& jFirst = Look(strDefinition, "RtF");
    Json::Value& jSecond = Look(strDefinition, "RtG");
    EXPECT_EQ(Compact(jFirst), R"({"a":{"cpptype":"int"}})");
    EXPECT_EQ(Compact(jSecond), R"({"b":{"cpptype":"bool"}})");
    EXPECT_EQ(&Look("null", "RtF"), &jFirst);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecTypeTest, EntryIsACopyOfTheDefinition) {
    Json::Value jDefinition = ParseJson(R"({"RtH":{"member":{"a":{"cpptype":"int"}}}})");
    std::string strName = "RtH";
    Json::Value& jType = VORN_JSON_DB::recType(jDefinition, strName);
    jDefinition["RtH"]["member"]["a"]["cpptype"] = "string";
    jDefinition.clear();
    EXPECT_EQ(Compact(jType), R"({"a":{"cpptype":"int"}})");
}

TEST_F(RecTypeTest, EmptyDefinitionIsRefused) {
    for (const char* szDefinition : {"null", "{}", "[]"}) {
        EXPECT_EQ(0, InFreshProcess([szDefinition] {
                      ExpectFirstLookupRefused("jTableDef.empty()", "t", szDefinition);
                  }));
    }
}

TEST_F(RecTypeTest, DefinitionWithoutTheTableIsRefused) {
    EXPECT_EQ(0, InFreshProcess([] {
                  ExpectFirstLookupRefused("!jTableDef.isMember(strJsonName)", "t",
                                           R"({"T":{"member":{"a":{"cpptype":"int"}}}})");
              }));
}

TEST_F(RecTypeTest, DefinitionThatIsNoObjectHasNoTable) {
    for (const char* szDefinition : {"[1]", "\"t\"", "5"}) {
        EXPECT_EQ(0, InFreshProcess([szDefinition] {
                      ExpectFirstLookupRefused("!jTableDef.isMember(strJsonName)", "t",
                                               szDefinition);
                  }));
    }
}

TEST_F(RecTypeTest, TableEntryThatIsNoObjectIsRefused) {
    for (const char* szEntry : {"[]", "\"x\"", "1", "null"}) {
        EXPECT_EQ(0, InFreshProcess([szEntry] {
                      ExpectFirstLookupRefused("!jTableDef[strJsonName].isObject()", "t",
                                               "{\"t\":" + std::string(szEntry) + "}");
                  }));
    }
}

TEST_F(RecTypeTest, TableEntryWithoutMembersIsRefused) {
    EXPECT_EQ(0, InFreshProcess([] {
                  ExpectFirstLookupRefused("!jTableDef[strJsonName].isMember(\"member\")", "t",
                                           R"({"t":{"Member":{}}})");
              }));
}

TEST_F(RecTypeTest, MembersThatAreNoObjectAreRefused) {
    for (const char* szMember : {"[]", "\"x\"", "1", "null"}) {
        EXPECT_EQ(0, InFreshProcess([szMember] {
                      ExpectFirstLookupRefused(
                          "!jTableDef[strJsonName][\"member\"].isObject()", "t",
                          "{\"t\":{\"member\":" + std::string(szMember) + "}}");
                  }));
    }
}

TEST_F(RecTypeTest, NamesAreFoundInTurns) {
    const std::string strFirst = UniqueTable();
    const std::string strSecond = UniqueTable();
    Json::Value& jFirst =
        Look("{\"" + strFirst + R"(":{"member":{"a":{"cpptype":"int"}}}})", strFirst);
    Json::Value& jSecond =
        Look("{\"" + strSecond + R"(":{"member":{"b":{"cpptype":"int"}}}})", strSecond);
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(&Look("null", strFirst), &jFirst);
        EXPECT_EQ(&Look("null", strSecond), &jSecond);
        EXPECT_EQ(&Look("null", strSecond), &jSecond);
    }
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_TRUE(Look("null", "").isNull());
    EXPECT_EQ(TakeLog().size(), 4U);
}

TEST_F(RecTypeTest, EntryThatTheHostChangedIsRefusedAtOnce) {
    EXPECT_EQ(0, InFreshProcess([] {
                  Json::Value& jEntry = Look(R"({"t":{"member":{"a":{"cpptype":"int"}}}})", "t");
                  EXPECT_EQ(&Look("null", "t"), &jEntry);
                  EXPECT_EQ(&Look("null", "t"), &jEntry);
                  jEntry = 7;
                  EXPECT_EQ(&Look("null", "t"), &jEntry);
                  EXPECT_EQ(TakeLog(), Refusal(kCachedCheck, "t", "null", R"({"t":7})"));
              }));
}

TEST_F(RecTypeTest, EmptyNameIsRefusedOnlyAfterItsEntryWasFound) {
    EXPECT_EQ(0, InFreshProcess([] {
                  ExpectFirstLookupRefused("strJsonName.empty()", "",
                                           R"({"":{"member":{"a":{"cpptype":"int"}}}})");
              }));
    EXPECT_EQ(0, InFreshProcess([] {
                  ExpectFirstLookupRefused("!jTableDef.isMember(strJsonName)", "", R"({"t":{}})");
              }));
    EXPECT_EQ(0, InFreshProcess([] {
                  ExpectFirstLookupRefused("!jTableDef[strJsonName][\"member\"].isObject()", "",
                                           R"({"":{"member":[]}})");
              }));
}

TEST_F(RecTypeTest, MemberWithoutATypeIsRefused) {
    EXPECT_EQ(0, InFreshProcess([] {
                  ExpectFirstLookupRefused(
                      "!jTableDef[strJsonName][\"member\"][strKey].isMember(\"cpptype\")", "t",
                      R"({"t":{"member":{"a":{"cppDefaultValue":1}}}})");
              }));
}

TEST_F(RecTypeTest, MemberThatIsNoObjectHasNoType) {
    for (const char* szMember : {"5", "\"cpptype\"", "[\"cpptype\"]", "null"}) {
        EXPECT_EQ(0, InFreshProcess([szMember] {
                      ExpectFirstLookupRefused(
                          "!jTableDef[strJsonName][\"member\"][strKey].isMember(\"cpptype\")", "t",
                          "{\"t\":{\"member\":{\"a\":" + std::string(szMember) + "}}}");
                  }));
    }
}

TEST_F(RecTypeTest, TypeThatIsNoTextIsRefused) {
    for (const char* szType : {"5", "null", "[\"int\"]", "{}", "true"}) {
        EXPECT_EQ(0, InFreshProcess([szType] {
                      ExpectFirstLookupRefused(
                          "!jTableDef[strJsonName][\"member\"][strKey][\"cpptype\"].isString()",
                          "t",
                          "{\"t\":{\"member\":{\"a\":{\"cpptype\":" + std::string(szType) + "}}}}");
                  }));
    }
}

TEST_F(RecTypeTest, DefinitionWithNoMembersIsRefused) {
    EXPECT_EQ(0, InFreshProcess([] {
                  ExpectFirstLookupRefused(
                      "jType == Json::nullValue || !jType.isMember(strJsonName)", "t",
                      R"({"t":{"member":{}}})");
              }));
}

TEST_F(RecTypeTest, DefinitionWithNoMembersIsRefusedBesideOtherTables) {
    EXPECT_EQ(0, InFreshProcess([] {
                  Look(R"({"s":{"member":{"a":{"cpptype":"int"}}}})", "s");
                  const std::string strDefinition = R"({"t":{"member":{}}})";
                  EXPECT_TRUE(Look(strDefinition, "t").isNull());
                  EXPECT_EQ(TakeLog(),
                            Refusal("jType == Json::nullValue || !jType.isMember(strJsonName)", "t",
                                    strDefinition, R"({"s":{"a":{"cpptype":"int"}}})"));
                  EXPECT_EQ(Compact(Look("null", "s")), R"({"a":{"cpptype":"int"}})");
                  EXPECT_EQ(TakeLog(), Lines());
              }));
}

TEST_F(RecTypeTest, FaultyMemberLeavesTheEarlierOnesAsTheWholeEntry) {
    EXPECT_EQ(
        0, InFreshProcess([] {
            const std::string strDefinition =
                R"({"t":{"member":{"a":{"cpptype":"int"},"b":{"cpptype":5},"c":{"cpptype":"bool"}}}})";
            const std::string strEntry = R"({"a":{"cpptype":"int"}})";
            EXPECT_EQ(Compact(Look(strDefinition, "t")), strEntry);
            EXPECT_EQ(TakeLog(),
                      Refusal("!jTableDef[strJsonName][\"member\"][strKey][\"cpptype\"].isString()",
                              "t", strDefinition, "{\"t\":" + strEntry + "}"));
            EXPECT_EQ(Compact(Look(strDefinition, "t")), strEntry);
            EXPECT_EQ(Compact(Look("null", "t")), strEntry);
            EXPECT_EQ(TakeLog(), Lines());
        }));
}

TEST_F(RecTypeTest, MembersAreTakenInKeyOrderNotInTheOrderOfWriting) {
    EXPECT_EQ(0, InFreshProcess([] {
                  Json::Value jDefinition = ParseJson(
                      R"({"t":{"member":{"b":{"cpptype":"int"},"a":{},"B":{"cpptype":"bool"}}}})");
                  std::string strName = "t";
                  EXPECT_EQ(Compact(VORN_JSON_DB::recType(jDefinition, strName)),
                            R"({"B":{"cpptype":"bool"}})");
              }));
}

TEST_F(RecTypeTest, RefusalLinesDoNotDependOnTheDebugFlag) {
    EXPECT_EQ(0, InFreshProcess([] {
                  blDebugOutput = true;
                  ExpectFirstLookupRefused("jTableDef.empty()", "t", "null");
              }));
}

TEST_F(RecTypeTest, RefusalShowsTheCacheOfAllTables) {
    EXPECT_EQ(0, InFreshProcess([] {
                  Look("null", "lost");
                  Look(
                      "{\"s\":{\"member\":{\"a\":{\"cppDefaultValue\":\"\xC3\xBC\",\"cpptype\":"
                      "\"string\"}}}}",
                      "s");
                  TakeLog();
                  Look("{}", "t");
                  EXPECT_EQ(TakeLog(),
                            Refusal("jTableDef.empty()", "t", "{}",
                                    "{\"lost\":null,\"s\":{\"a\":{\"cppDefaultValue\":\"\xC3\xBC\","
                                    "\"cpptype\":\"string\"}}}"));
              }));
}

TEST_F(RecTypeTest, EntryMadeByReadingAnUnknownMemberIsAnUnknownType) {
    EXPECT_EQ(0, InFreshProcess([] {
                  std::string strTable = "t";
                  Json::Value jDefinition = Definition(strTable, "a:int");
                  // The reference is not const, so this makes a null entry.
                  EXPECT_TRUE(VORN_JSON_DB::recType(jDefinition, strTable)["nosuch"].isNull());
                  std::string strCreate = "CREATE TABLE t (a)";
                  VornJsonDbApi Handle(nullptr, strTable, jDefinition, strCreate);
                  TakeLog();
                  Json::Value jRecord = ParseJson(R"({"a":1,"nosuch":2})");
                  EXPECT_EQ(Handle.checkJsonType(jRecord), -1);
                  EXPECT_EQ(TakeLog(),
                            (std::vector<std::string>{Located("type not found!!, key=nosuch")}));
              }));
}

// A host's static that outlives the library's own and still calls it. Its destructor runs when the
// fresh process exits; a crash there is what the parent would see.
TEST_F(RecTypeTest, CallsFromTheDestructorOfAStaticStillWork) {
    EXPECT_EQ(0, InFreshProcess([] {
                  struct Late {
                      ~Late() {
                          std::string strTable = "t";
                          Json::Value jNone;
                          if (!VORN_JSON_DB::recType(jNone, strTable).isMember("a")) {
                              _exit(77);
                          }
                      }
                  };
                  static Late s_Late;
                  std::string strTable = "t";
                  Json::Value jDefinition = Definition(strTable, "a:int");
                  EXPECT_TRUE(VORN_JSON_DB::recType(jDefinition, strTable).isMember("a"));
              }));
}
