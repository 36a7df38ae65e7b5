// jsonCopyMember: a merge, not a replacement.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

const char* const kDestinationCheck =
    "jIn.type() != Json::nullValue && jIn.type() != Json::objectValue";
const char* const kSourceCheck = "jSubSet.type() != Json::objectValue";

class JsonCopyMemberTest : public TableTest {
  protected:
    // Copies and checks that the source stays as it is.
    int Copy(const std::string& strSource, bool blOverwrite) {
        Json::Value jSource = ParseJson(strSource);
        const int nResult = VORN_JSON_DB::jsonCopyMember(m_jIn, jSource, blOverwrite);
        EXPECT_EQ(Compact(jSource), strSource);
        return nResult;
    }

    Json::Value m_jIn;
};

}  // namespace

TEST_F(JsonCopyMemberTest, OverwritingReplacesAndAdds) {
    m_jIn = ParseJson(R"({"a":1,"b":2})");
    EXPECT_EQ(Copy(R"({"b":3,"c":4})", true), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"a":1,"b":3,"c":4})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(JsonCopyMemberTest, NotOverwritingOnlyAdds) {
    m_jIn = ParseJson(R"({"a":1,"b":2})");
    EXPECT_EQ(Copy(R"({"b":3,"c":4})", false), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"a":1,"b":2,"c":4})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(JsonCopyMemberTest, NotOverwritingKeepsANullMember) {
    m_jIn = ParseJson(R"({"a":null})");
    EXPECT_EQ(Copy(R"({"a":1})", false), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"a":null})");
}

TEST_F(JsonCopyMemberTest, NullDestinationStaysNullWhenTheSourceIsEmpty) {
    EXPECT_EQ(Copy("{}", true), 0);
    EXPECT_TRUE(m_jIn.isNull());
    EXPECT_EQ(Copy("{}", false), 0);
    EXPECT_TRUE(m_jIn.isNull());
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(JsonCopyMemberTest, EmptySourceLeavesTheDestinationAlone) {
    m_jIn = ParseJson(R"({"a":1})");
    EXPECT_EQ(Copy("{}", true), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"a":1})");
}

TEST_F(JsonCopyMemberTest, NullDestinationBecomesAnObjectWithTheFirstMember) {
    EXPECT_EQ(Copy(R"({"x":[1,2]})", true), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"x":[1,2]})");
    m_jIn = Json::Value();
    EXPECT_EQ(Copy(R"({"x":[1,2]})", false), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"x":[1,2]})");
}

TEST_F(JsonCopyMemberTest, DestinationOfAnotherKindIsRefusedBeforeTheSourceIsLookedAt) {
    for (const char* szIn : {"[]", "[{\"a\":1}]", "\"text\"", "1", "-1.5", "true"}) {
        for (const char* szSource : {"{\"a\":2}", "[]", "null", "{}"}) {
            m_jIn = ParseJson(szIn);
            EXPECT_EQ(Copy(szSource, true), -1);
            EXPECT_EQ(Compact(m_jIn), szIn);
            EXPECT_EQ(TakeLog(), (Lines{UtilCheck(kDestinationCheck)})) << szIn << szSource;
        }
    }
}

TEST_F(JsonCopyMemberTest, SourceOfAnotherKindIsRefusedNullIncluded) {
    for (const char* szSource : {"null", "[]", "[1]", "\"text\"", "1", "false"}) {
        m_jIn = ParseJson(R"({"a":1})");
        EXPECT_EQ(Copy(szSource, true), -1);
        EXPECT_EQ(Compact(m_jIn), R"({"a":1})");
        EXPECT_EQ(TakeLog(), (Lines{UtilCheck(kSourceCheck)})) << szSource;
    }
}

TEST_F(JsonCopyMemberTest, RefusedSourceLeavesANullDestinationNull) {
    EXPECT_EQ(Copy("null", true), -1);
    EXPECT_TRUE(m_jIn.isNull());
    EXPECT_EQ(TakeLog(), (Lines{UtilCheck(kSourceCheck)}));
}

TEST_F(JsonCopyMemberTest, NullMemberIsCopiedAsNull) {
    m_jIn = ParseJson(R"({"a":1})");
    EXPECT_EQ(Copy(R"({"a":null,"b":null})", true), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"a":null,"b":null})");
}

TEST_F(JsonCopyMemberTest, NestedValuesAreReplacedWholeAndNotMerged) {
    m_jIn = ParseJson(R"({"o":{"x":1,"y":2},"l":[1,2,3]})");
    EXPECT_EQ(Copy(R"({"l":[9],"o":{"x":5}})", true), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"l":[9],"o":{"x":5}})");
}

TEST_F(JsonCopyMemberTest, CopyIsDeep) {
    Json::Value jSource = ParseJson(R"({"o":{"x":[1]}})");
    EXPECT_EQ(VORN_JSON_DB::jsonCopyMember(m_jIn, jSource, true), 0);
    jSource["o"]["x"][0] = 2;
    EXPECT_EQ(Compact(m_jIn), R"({"o":{"x":[1]}})");
    m_jIn["o"]["x"][0] = 3;
    EXPECT_EQ(Compact(jSource), R"({"o":{"x":[2]}})");
}

TEST_F(JsonCopyMemberTest, ObjectMergedIntoItselfStaysAsItIs) {
    m_jIn = ParseJson(R"({"a":{"b":1},"c":[2]})");
    EXPECT_EQ(VORN_JSON_DB::jsonCopyMember(m_jIn, m_jIn, true), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"a":{"b":1},"c":[2]})");
}

TEST_F(JsonCopyMemberTest, NamesOfAnyKindAreCopied) {
    EXPECT_EQ(Copy("{\"\":1,\"a b\":2,\"\xC3\xBC\":3}", true), 0);
    EXPECT_EQ(Compact(m_jIn), "{\"\":1,\"a b\":2,\"\xC3\xBC\":3}");
}

TEST_F(JsonCopyMemberTest, SourceInsideTheDestinationIsCopiedAsItWas) {
    m_jIn = ParseJson(R"({"a":{"a":1,"b":2},"z":0})");
    EXPECT_EQ(VORN_JSON_DB::jsonCopyMember(m_jIn, m_jIn["a"], true), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"a":1,"b":2,"z":0})");
}

TEST_F(JsonCopyMemberTest, DestinationInsideTheSourceReceivesTheSourceAsItWas) {
    m_jIn = ParseJson(R"({"a":{"x":1},"b":2})");
    EXPECT_EQ(VORN_JSON_DB::jsonCopyMember(m_jIn["a"], m_jIn, true), 0);
    EXPECT_EQ(Compact(m_jIn), R"({"a":{"a":{"x":1},"b":2,"x":1},"b":2})");
}
