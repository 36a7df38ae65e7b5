// What LintOldRecord says of records, beside what recCreate makes of them.

#include <cmath>
#include <limits>

#include "OldHandleFixture.h"

namespace VORN_JSON_DB {

namespace {

class OldRecordLintTest : public OldHandleTest {
  protected:
    void Expect(const Json::Value& jRecord, const std::string& strFindings,
                const std::string& strResult, const std::string& strRows) {
        EXPECT_EQ(Text(LintOldRecord(m_strName, m_jDefinition, jRecord)), strFindings);
        EXPECT_EQ(OldCreate(jRecord), strResult) << Text(jRecord);
        EXPECT_EQ(AllRows(), strRows) << Text(jRecord);
        Run("DELETE FROM " + m_strName);
    }
    void Expect(const char* szRecord, const std::string& strFindings, const std::string& strResult,
                const std::string& strRows) {
        Expect(Parse(szRecord), strFindings, strResult, strRows);
    }
};

constexpr char kThreeTexts[] =
    R"({"a": {"cpptype": "string"}, "b": {"cpptype": "string"}, "c": {"cpptype": "string"}})";

}  // namespace

TEST_F(OldRecordLintTest, RecordsThatAreStoredAsTheyAreHaveNoFindings) {
    Describe(R"({"a": {"cpptype": "string"}, "b": {"cpptype": "bool"}, "i": {"cpptype": "int"},
                 "j": {"cpptype": "Json::objectValue"}, "k": {"cpptype": "Json::arrayValue"},
                 "l": {"cpptype": "long long"}, "z": {"cpptype": "string"}})");
    Expect(R"({"a": "it's", "b": true, "i": -2147483648, "j": {"x": [null]}, "k": [1, {}],
               "l": 9223372036854775807, "z": "100 %d %% %"})",
           "",
           R"(0 {"a":"it's","b":true,"i":-2147483648,"j":{"x":[null]},"k":[1,{}],)"
           R"("l":9223372036854775807,"z":"100 %d %% %"})",
           R"(it's|1|-2147483648|{"x":[null]}|[1,{}]|9223372036854775807|100 %d %% %)");
    Expect(R"({"i": 3.0, "z": ""})", "", R"(0 {"i":3,"z":""})", "NULL|NULL|3|NULL|NULL|NULL|");
}

TEST_F(OldRecordLintTest, WhatIsNoRecord) {
    Describe(kThreeTexts);
    Expect("{}", "not-a-record : an object of 0 is no record: an object with members is expected",
           "-1", "");
    Expect("[1]", "not-a-record : a list of 1 is no record: an object with members is expected",
           "-1", "");
    EXPECT_EQ(Text(LintOldRecord("t", Parse(R"({"t": {"member": {}}})"), Parse(R"({"a": 1})"))),
              "no-definition /t: the definition names no members of table \"t\"");
    EXPECT_EQ(Text(LintOldRecord("nosuch", m_jDefinition, Parse("{}"))),
              "no-definition /nosuch: the definition names no members of table \"nosuch\"");
}

TEST_F(OldRecordLintTest, LastMemberIsMissing) {
    Describe(kThreeTexts);
    Expect(R"({"a": "x", "b": "y"})",
           "missing-last-member /c: member \"c\" is missing: recCreate refuses a record without "
           "the last one",
           "-1", "");
    Expect(R"({"c": "z"})", "", R"(0 {"c":"z"})", "NULL|NULL|z");
    Describe(R"({"a": {"cpptype": "string"}, "b": {"cpptype": "string", "cppDefaultValue": "d"}})");
    Expect(R"({"a": "x"})", "", R"(0 {"a":"x","b":"d"})", "x|d");
}

// Member by member, as the definition has them; in a text what is cut off before what is left.
TEST_F(OldRecordLintTest, FindingsAreInTheOrderOfTheDefinition) {
    Describe(kThreeTexts);
    Expect(R"({"a": 5, "b": "y"})",
           "wrong-kind /a: member \"a\": 5 is another kind of value: expected is a text; "
           "missing-last-member /c: member \"c\" is missing: recCreate refuses a record without "
           "the last one",
           "-1", "");
    Expect(R"({"a": "%%\u0000x", "c": "z"})",
           "nul-cut /a: member \"a\": \"%%\" is stored, and what follows the NUL byte is not; "
           "percent-halved /a: member \"a\": each %% is stored as %, because other members follow",
           R"(0 {"a":"%","c":"z"})", "%|NULL|z");
}

TEST_F(OldRecordLintTest, UnknownMembersAreDropped) {
    Describe(kThreeTexts);
    Expect(R"({"C": "x", "c": "z"})",
           "old-drops-member /C: there is no member \"C\", and recCreate drops it (did you mean "
           "\"c\"?)",
           R"(0 {"c":"z"})", "NULL|NULL|z");
}

TEST_F(OldRecordLintTest, PercentSignsBeforeOtherMembers) {
    Describe(kThreeTexts);
    const std::string strHalved =
        "percent-halved /a: member \"a\": each %% is stored as %, because other members follow";
    const std::string strRefused =
        "percent-refused /a: member \"a\": recCreate refuses the percent sign, because other "
        "members follow";
    Expect(R"({"a": "50%%", "c": "z"})", strHalved, R"(0 {"a":"50%","c":"z"})", "50%|NULL|z");
    Expect(R"({"a": "%%%%", "b": "", "c": ""})", strHalved, R"(0 {"a":"%","b":"","c":""})", "%||");
    Expect(R"({"a": "50%%", "b": "y", "c": "z"})", strRefused, "-1", "");
    Expect(R"({"a": "100 %", "c": "z"})", strRefused, "-1", "");
    Expect(R"({"a": "100%'s", "c": "z"})", strRefused, "-1", "");
    Expect(R"({"a": "%d", "c": "z"})", strRefused, "-1", "");
    Expect(R"({"c": "%d 100% %%"})", "", R"(0 {"c":"%d 100% %%"})", "NULL|NULL|%d 100% %%");
    Describe(R"({"a": {"cpptype": "Json::objectValue"}, "c": {"cpptype": "string"}})");
    Expect(R"({"a": {"k": "%s"}, "c": "z"})", strRefused, "-1", "");
    Expect(R"({"a": {"k": "%%"}, "c": "z"})", strHalved, R"(0 {"a":{"k":"%"},"c":"z"})",
           R"({"k":"%"}|z)");
}

TEST_F(OldRecordLintTest, TextsEndAtTheirFirstNul) {
    Describe(kThreeTexts);
    Expect(R"({"c": "a\u0000b"})",
           "nul-cut /c: member \"c\": \"a\" is stored, and what follows the NUL byte is not",
           R"(0 {"c":"a"})", "NULL|NULL|a");
    // What is cut off has no percent signs.
    Expect(R"({"a": "a\u0000%d", "c": ""})",
           "nul-cut /a: member \"a\": \"a\" is stored, and what follows the NUL byte is not",
           R"(0 {"a":"a","c":""})", "a|NULL|");
}

TEST_F(OldRecordLintTest, ValuesOfAnotherKindAreRefused) {
    Describe(R"({"b": {"cpptype": "bool"}, "i": {"cpptype": "int"},
                 "j": {"cpptype": "Json::objectValue"}, "z": {"cpptype": "string"}})");
    Expect(R"({"z": 5})",
           "wrong-kind /z: member \"z\": 5 is another kind of value: expected is a text", "-1", "");
    Expect(R"({"z": null})",
           "wrong-kind /z: member \"z\": null is another kind of value: expected is a text", "-1",
           "");
    Expect(R"({"b": 1, "z": ""})",
           "wrong-kind /b: member \"b\": 1 is another kind of value: expected is true or false",
           "-1", "");
    Expect(R"({"i": 1.5, "z": ""})",
           "wrong-kind /i: member \"i\": 1.5 is another kind of value: expected is a whole number "
           "from -2147483648 to 2147483647",
           "-1", "");
    Expect(R"({"j": [], "z": ""})",
           "wrong-kind /j: member \"j\": a list of 0 is another kind of value: expected is an "
           "object",
           "-1", "");
}

TEST_F(OldRecordLintTest, NumbersBeyondTheTypesRange) {
    Describe(R"({"i": {"cpptype": "int"}, "l": {"cpptype": "long long"}})");
    for (const char* szNumber : {"2147483648", "-2147483649", "9223372036854775807"}) {
        const Json::Value jRecord = Parse(std::string("{\"i\": ") + szNumber + ", \"l\": 1}");
        EXPECT_EQ(Text(LintOldRecord(m_strName, m_jDefinition, jRecord)),
                  std::string("old-reads-other /i: member \"i\": ") + szNumber +
                      " is stored, and a VornJsonDbApi reads another number: expected is a whole "
                      "number from -2147483648 to 2147483647");
        EXPECT_NE(OldCreate(jRecord), "0 " + Text(jRecord));
        EXPECT_EQ(AllRows(), std::string(szNumber) + "|1");
        Run("DELETE FROM " + m_strName);
    }
    Expect(R"({"l": 9223372036854775808})",
           "out-of-range /l: member \"l\": 9223372036854775808 is beyond 63 bits, which recCreate "
           "refuses",
           "-1", "");
    Expect(R"({"i": 1e19, "l": 1})",
           "out-of-range /i: member \"i\": 1.0e+19 is beyond 63 bits, which "
           "recCreate refuses",
           "-1", "");
}

TEST_F(OldRecordLintTest, TypesThatRecCreateRefuses) {
    Describe(
        R"({"d": {"cpptype": "double"}, "t": {"cpptype": "time_t"}, "z": {"cpptype": "int"}})");
    Expect(R"({"d": 0.5, "z": 1})",
           "old-cannot-write /d: member \"d\": recCreate refuses every value of type \"double\"",
           "-1", "");
    Expect(R"({"t": 5, "z": 1})",
           "old-cannot-write /t: member \"t\": recCreate refuses every value of type \"time_t\"",
           "-1", "");
}

TEST_F(OldRecordLintTest, JsonThatIsNotReadBackAsItWas) {
    Describe(R"({"j": {"cpptype": "Json::arrayValue"}})");
    Json::Value jRecord;
    jRecord["j"].append(std::nan(""));
    Expect(jRecord, "old-json-changed /j: member \"j\" holds NaN, which is stored as null",
           R"(0 {"j":[null]})", "[null]");
    jRecord["j"][0] = std::numeric_limits<double>::infinity();
    EXPECT_EQ(
        Text(LintOldRecord(m_strName, m_jDefinition, jRecord)),
        "old-json-changed /j: member \"j\" holds an infinity: it is stored, and JsonCpp 1.9.5 "
        "does not read it back");
    // What is read back depends on JsonCpp's version.
    EXPECT_EQ(OldCreate(jRecord).substr(0, 2), "0 ");
    EXPECT_EQ(AllRows(), "[1e+9999]");
    Run("DELETE FROM " + m_strName);
    jRecord["j"] = Nested(1100);
    EXPECT_EQ(Text(LintOldRecord(m_strName, m_jDefinition, jRecord)),
              "old-json-changed /j: member \"j\" is nested too deeply: it is stored, and only a "
              "part is read");
    const std::string strResult = OldCreate(jRecord);
    EXPECT_EQ(strResult.substr(0, 2), "0 ");
    EXPECT_NE(strResult, "0 " + Text(jRecord));
    EXPECT_EQ(AllRows(), std::string(1100, '[') + std::string(1100, ']'));
}

TEST_F(OldRecordLintTest, AllThatIsWrongWithJsonIsTold) {
    Describe(R"({"j": {"cpptype": "Json::arrayValue"}, "z": {"cpptype": "int"}})");
    Json::Value jRecord = Parse(R"({"j": ["%%"], "z": 1})");
    jRecord["j"].append(std::nan(""));
    const std::string strNaN =
        "old-json-changed /j: member \"j\" holds NaN, which is stored as null; ";
    const std::string strHalved =
        "percent-halved /j: member \"j\": each %% is stored as %, because other members follow";
    Expect(jRecord, strNaN + strHalved, R"(0 {"j":["%",null],"z":1})", R"(["%",null]|1)");
    jRecord["j"].append(Nested(1100));
    jRecord["j"].append(-std::numeric_limits<double>::infinity());
    EXPECT_EQ(
        Text(LintOldRecord(m_strName, m_jDefinition, jRecord)),
        strNaN +
            "old-json-changed /j: member \"j\" holds an infinity: it is stored, and JsonCpp 1.9.5 "
            "does not read it back; "
            "old-json-changed /j: member \"j\" is nested too deeply: it is stored, and only a part "
            "is read; " +
            strHalved);
}

}  // namespace VORN_JSON_DB
