// What LintOldQuery says of query objects, beside what an old handle makes of them.

#include "OldHandleFixture.h"

namespace VORN_JSON_DB {

namespace {

class OldQueryLintTest : public OldHandleTest {
  protected:
    OldQueryLintTest() {
        Describe(R"({"done": {"cpptype": "bool"}, "id": {"cpptype": "int"},
                     "map": {"cpptype": "Json::objectValue"}, "name": {"cpptype": "string"},
                     "tags": {"cpptype": "Json::arrayValue"}})");
        for (const char* szRecord :
             {R"({"done": true, "id": 1, "map": {"x": 1}, "name": "a", "tags": ["t"]})",
              R"({"done": false, "id": 2, "name": "5"})", R"({"done": null, "id": 12, "name": ""})",
              R"({"done": true, "id": 3, "name": null})"}) {
            EXPECT_EQ(Text(m_Table.Create(Parse(szRecord))), "ok");
        }
    }

    void Expect(const char* szQuery, const std::string& strFindings, const std::string& strIds) {
        const Json::Value jQuery = Parse(szQuery);
        EXPECT_EQ(Text(LintOldQuery(m_strName, m_jDefinition, jQuery)), strFindings);
        EXPECT_EQ(OldList(jQuery), strIds) << szQuery;
    }
};

constexpr char kAll[] = "1,2,12,3";
constexpr char kNoCondition[] =
    "old-selects-all : there is no condition: recList lists all records, recUpdateByFilter and "
    "recDelete refuse";

}  // namespace

TEST_F(OldQueryLintTest, QueriesThatMeanWhatTheySayHaveNoFindings) {
    Expect(R"({"id": 1})", "", "1");
    Expect(R"({"name": "a"})", "", "1");
    Expect(R"({"name": ["a"]})", "", "1");
    Expect(R"({"id": [12]})", "", "12");
    Expect(R"({"done": true})", "", "1,3");
    Expect(R"({"done": [false]})", "", "2");
    Expect(R"({"map": {"x": 1}})", "", "1");
    Expect(R"({"name": "100 %d %%"})", "", "");
}

TEST_F(OldQueryLintTest, WhatIsNoQuery) {
    Expect("[]", "not-a-query : a list of 0 is no query", "-1");
    Expect("5", "not-a-query : 5 is no query", "-1");
    EXPECT_EQ(Text(LintOldQuery("t", Parse(R"({"t": {"member": {}}})"), Parse(R"({"a": 1})"))),
              "no-definition /t: the definition names no members of table \"t\"");
    EXPECT_EQ(Text(LintOldQuery("nosuch", m_jDefinition, Parse("{}"))),
              "no-definition /nosuch: the definition names no members of table \"nosuch\"");
}

TEST_F(OldQueryLintTest, QueryWithoutAConditionSelectsAll) {
    Expect("null", kNoCondition, kAll);
    Expect("{}", kNoCondition, kAll);
    Expect(R"({"nmae": "a"})",
           std::string("old-ignores-member /nmae: there is no member \"nmae\", and the query goes "
                       "without it (did you mean \"name\"?); ") +
               kNoCondition,
           kAll);
    Json::Value jQuery = Parse(R"({"nmae": "a"})"), jNew = Parse(R"({"name": "b"})");
    EXPECT_EQ(m_pOld->recUpdateByFilter(jQuery, jNew), -1);
    EXPECT_EQ(m_pOld->recDelete(jQuery), -1);
    Expect(R"({"id": 1, "nmae": "b"})",
           "old-ignores-member /nmae: there is no member \"nmae\", and the query goes without it "
           "(did you mean \"name\"?)",
           "1");
}

TEST_F(OldQueryLintTest, NumberAsTextIsSql) {
    Expect(R"({"id": "5 or 1=1"})",
           "bare-text /id: member \"id\": \"5 or 1=1\" goes into the statement as SQL", kAll);
    Expect(R"({"id": ["1) or (1=1"]})",
           "bare-text /id/0: member \"id\": \"1) or (1=1\" goes into the statement as SQL", kAll);
    Expect(R"({"done": ["1) or (1=1"]})",
           "bare-text /done/0: member \"done\": \"1) or (1=1\" goes into the statement as SQL",
           kAll);
    Expect(R"({"id": "1"})", "bare-text /id: member \"id\": \"1\" goes into the statement as SQL",
           "1");
    Json::Value jQuery = Parse(R"({"id": "5 or 1=1"})");
    EXPECT_EQ(m_pOld->recDelete(jQuery), 4);
}

TEST_F(OldQueryLintTest, ListsOfSeveralValuesAndOfNone) {
    Expect(R"({"id": [1, 2]})", "run-together /id: member \"id\": 2 values run together into one",
           "12");
    Expect(R"({"name": ["a", "b", "c"]})",
           "run-together /name: member \"name\": 3 values run together into one", "");
    Expect(R"({"id": []})",
           "empty-list /id: member \"id\": an empty list makes a statement that SQLite refuses",
           "-1");
}

TEST_F(OldQueryLintTest, NullIsNotIsNull) {
    Expect(R"({"name": null})", "old-null /name: member \"name\": null asks for the empty text",
           "12");
    Expect(R"({"done": null})", "old-null /done: member \"done\": null asks for false", "2");
    Expect(R"({"map": null})", "old-null /map: member \"map\": null asks for the text null", "");
    Expect(
        R"({"id": null})",
        "old-refuses /id: member \"id\": null leaves a gap in the statement, which SQLite refuses",
        "-1");
    Expect(
        R"({"id": null, "name": "a"})",
        "old-refuses /id: member \"id\": null leaves a gap in the statement, which SQLite refuses",
        "-1");
    Expect(R"({"id": [null]})", "old-null /id/0: member \"id\": null selects nothing", "");
}

TEST_F(OldQueryLintTest, ValuesOfAnotherKindAreRefusedOrConverted) {
    Expect(R"({"name": {}})",
           "old-refuses /name: member \"name\": an object of 0 cannot be compared with a text",
           "-1");
    Expect(R"({"id": {"$gt": 1}})",
           "old-refuses /id: member \"id\": an object of 1 cannot be compared with a whole number "
           "from -2147483648 to 2147483647",
           "-1");
    Expect(R"({"done": "x"})",
           "old-refuses /done: member \"done\": \"x\" cannot be compared with true or false", "-1");
    Expect(R"({"name": 5})",
           "old-other-kind /name: member \"name\": 5 is converted: expected is a text", "2");
    Expect(R"({"done": 1})",
           "old-other-kind /done: member \"done\": 1 is converted: expected is true or false",
           "1,3");
    Expect(R"({"id": true})",
           "old-other-kind /id: member \"id\": true is converted: expected is a whole number from "
           "-2147483648 to 2147483647",
           "1");
    EXPECT_EQ(Text(LintOldQuery("t", Parse(R"({"t": {"member": {"a": {"cpptype": "any"}}}})"),
                                Parse(R"({"a": 5})"))),
              "");
    Expect(R"({"map": "x"})",
           "old-other-kind /map: member \"map\": \"x\" is converted: expected is an object", "");
}

TEST_F(OldQueryLintTest, ListForAJsonMemberAsksForItsElement) {
    const std::string strFinding =
        "old-membership /tags: member \"tags\": asks for records whose value is the list's element";
    Expect(R"({"tags": ["t"]})", strFinding, "");
    Expect(R"({"tags": [["t"]]})", strFinding, "1");
}

TEST_F(OldQueryLintTest, TextIsComparedUpToItsFirstNul) {
    Expect(R"({"name": "a\u0000b"})",
           "nul-cut /name: member \"name\": compared is the text before its NUL byte", "1");
}

TEST_F(OldQueryLintTest, SortingSortsNothing) {
    Expect(R"({"id": [12], "sort_by": "name", "sort_direction": "desc"})",
           "sorts-nothing /sort_by: \"name\" is compared as a constant: the order stays that of "
           "the table",
           "12");
    Expect(R"({"sort_by": "id", "sort_direction": "desc"})",
           std::string(kNoCondition) +
               "; sorts-nothing /sort_by: \"id\" is compared as a constant: the order stays that "
               "of the table",
           kAll);
    Expect(R"({"id": 1, "sort_by": 5})", "old-refuses /sort_by: 5 is no member's name", "-1");
    Expect(R"({"id": 1, "sort_direction": "desc"})",
           "old-ignores-key /sort_direction: \"sort_direction\" counts only beside \"sort_by\"",
           "1");
}

TEST_F(OldQueryLintTest, PagingKeys) {
    Expect(R"({"done": true, "limit": 1, "offset": 1})",
           "old-reading-only /limit: \"limit\" counts for recList and recGetOne alone; "
           "old-reading-only /offset: \"offset\" counts for recList and recGetOne alone",
           "3");
    Expect(R"({"id": 1, "sort_direction": "desc", "offset": 1})",
           "old-ignores-key /sort_direction: \"sort_direction\" counts only beside \"sort_by\"; "
           "old-ignores-key /offset: \"offset\" counts only beside \"limit\"",
           "1");
    Expect(R"({"done": true, "offset": 1})",
           "old-ignores-key /offset: \"offset\" counts only beside \"limit\"", "1,3");
    Expect(R"({"id": 1, "limit": null})", "bad-count /limit: \"limit\" is null, no whole number",
           "-1");
    Expect(R"({"id": 1, "limit": {}})",
           "bad-count /limit: \"limit\" is an object of 0, no whole number", "-1");
    Json::Value jQuery = Parse(R"({"done": true, "limit": 1})");
    EXPECT_EQ(m_pOld->recDelete(jQuery), 2);
}

TEST_F(OldQueryLintTest, RawFilter) {
    Expect(R"({"vornSqlWhereFilter": "id < 3"})",
           "raw-sql /vornSqlWhereFilter: the text goes into the statement as SQL", "1,2");
    Expect(R"({"vornSqlWhereFilter": ""})",
           "old-refuses /vornSqlWhereFilter: \"\" is no condition: expected is a text of SQL",
           "-1");
    Expect(R"({"vornSqlWhereFilter": 5})",
           "old-refuses /vornSqlWhereFilter: 5 is no condition: expected is a text of SQL", "-1");
}

TEST_F(OldQueryLintTest, MemberNamedAsAKeyIsBoth) {
    Describe(R"({"id": {"cpptype": "int"}, "offset": {"cpptype": "int"}})");
    Run("INSERT INTO " + m_strName + " VALUES (1, 1), (2, 1), (3, 0)");
    Expect(R"({"offset": 1, "limit": 5})",
           "hides-query-key /offset: \"offset\" is a condition and a key of the query at once; "
           "old-reading-only /limit: \"limit\" counts for recList and recGetOne alone; "
           "old-reading-only /offset: \"offset\" counts for recList and recGetOne alone",
           "2");
}

}  // namespace VORN_JSON_DB
