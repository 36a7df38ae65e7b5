// What LintDefinition says, beside what it would cost.

#include "OldHandleFixture.h"

namespace VORN_JSON_DB {

namespace {

class DefinitionLintTest : public OldHandleTest {
  protected:
    // Findings of a table "t" with these members, or with the whole entry.
    static std::string OfMembers(const std::string& strMembers) {
        return OfEntry("{\"member\": " + strMembers + "}");
    }
    static std::string OfEntry(const std::string& strEntry) {
        return Text(LintDefinition("t", Parse("{\"t\": " + strEntry + "}")));
    }

    // What an old handle lists of a table whose one column has that name and holds 70,
    // which is no hour of the day.
    std::string OldListOf(const std::string& strName) {
        Describe("{\"" + strName + "\": {\"cpptype\": \"int\"}}");
        Run("INSERT INTO " + m_strName + " VALUES (70)");
        return OldList(Json::Value(), strName.c_str());
    }
};

}  // namespace

TEST_F(DefinitionLintTest, DefinitionThatServesBothHandlesHasNoFindings) {
    EXPECT_EQ(OfEntry(R"({"key": "id", "comment": "x", "member": {
        "id": {"cpptype": "int"},
        "name": {"cpptype": "string", "notNull": true, "unique": true, "nullSeen": false,
                 "cppDefaultValue": "", "ui": {"label": "Name"}}}})"),
              "");
}

TEST_F(DefinitionLintTest, WhatNoHandleTakes) {
    EXPECT_EQ(Text(LintDefinition("t", Parse(R"({"u": {"member": {"a": {"cpptype": "int"}}}})"))),
              "no-definition /t: the definition names no members of table \"t\"");
    EXPECT_EQ(OfEntry(R"({"member": []})"),
              "no-definition /t: the definition names no members of table \"t\"");
    EXPECT_EQ(OfEntry(R"({"membr": 1, "member": {}})"),
              "no-definition /t: the definition names no members of table \"t\"");
    EXPECT_EQ(Text(LintDefinition("t", Json::Value(5))),
              "no-definition /t: the definition names no members of table \"t\"");
    EXPECT_EQ(OfMembers(R"({"a": {"cpptype": "text"}, "b": {}, "c": "int",
                            "d": {"cpptype": 5}, "z": {"cpptype": "int", "cppDefaultValue": 0}})"),
              "unknown-type /t/member/a/cpptype: member \"a\" has the unknown type \"text\"; "
              "unknown-type /t/member/b/cpptype: member \"b\" has the unknown type \"\"; "
              "unknown-type /t/member/c/cpptype: member \"c\" has the unknown type \"\"; "
              "unknown-type /t/member/d/cpptype: member \"d\" has the unknown type \"\"");
    EXPECT_EQ(OfEntry(R"({"key": ["a", "x", 5], "member": {
                          "a": {"cpptype": "int", "cppDefaultValue": 0}}})"),
              "unknown-key /t/key: \"x\" is no member that can be a key; "
              "unknown-key /t/key: 5 is no member that can be a key");
}

// As one reads a definition: the table, then member by member, its keys before what they say.
TEST_F(DefinitionLintTest, FindingsAreInTheOrderOfTheDefinition) {
    const FindingList vecFound = LintDefinition("a b", Parse(R"({"a b": {"membr": 1, "member": {
        "c d": {"cpptype": "double", "notnull": 1, "unique": 1, "cppDefaultValue": "x"},
        "z": {"cpptype": "int"}}}})"));
    std::string strOrder;
    for (const Finding& Each : vecFound) {
        strOrder += std::string(Each.szCode) + " " + Each.strPath + "\n";
    }
    EXPECT_EQ(strOrder,
              "misspelt-key /a b/membr\nold-name /a b\n"
              "misspelt-key /a b/member/c d/notnull\nbad-flag /a b/member/c d/unique\n"
              "old-name /a b/member/c d\nold-type /a b/member/c d/cpptype\n"
              "bad-default /a b/member/c d/cppDefaultValue\n"
              "no-last-default /a b/member/z\n");
}

TEST_F(DefinitionLintTest, NamesOfMembers) {
    const std::string strOldName =
        ": a VornJsonDbApi writes names as they stand, and SQL reads another thing";
    EXPECT_EQ(OfMembers(R"({"$a": {"cpptype": "int"},
                            "z": {"cpptype": "int", "cppDefaultValue": 0}})"),
              "bad-name /t/member/$a: \"$a\" cannot be a member: it begins with $ or holds a NUL "
              "byte; old-name /t/member/$a: member \"$a\"" +
                  strOldName);
    EXPECT_EQ(OfMembers(R"({"A": {"cpptype": "int"},
                            "a": {"cpptype": "int", "cppDefaultValue": 0}})"),
              "same-column /t/member/a: \"a\" is another member's column: letter case makes no "
              "difference");
    for (const char* szName : {"order", "a b", "1st", "a.b", "null", "current_date", "a'", "a--"}) {
        EXPECT_EQ(OfMembers(std::string("{\"") + szName +
                            R"(": {"cpptype": "int", "cppDefaultValue": 0}})"),
                  std::string("old-name /t/member/") + szName + ": member \"" + szName + "\"" +
                      strOldName);
        EXPECT_NE(OldListOf(szName), "70") << szName;
    }
    for (const char* szName : {"a", "_1", "key", "desc_", "Name", "\xc3\xa9", "replace"}) {
        EXPECT_EQ(OfMembers(std::string("{\"") + szName +
                            R"(": {"cpptype": "int", "cppDefaultValue": 0}})"),
                  "");
        EXPECT_EQ(OldListOf(szName), "70") << szName;
    }
    EXPECT_EQ(Text(LintDefinition("group", Parse(R"({"group": {"member": {
                  "a": {"cpptype": "int", "cppDefaultValue": 0}}}})"))),
              "old-name /group: table \"group\"" + strOldName);
}

TEST_F(DefinitionLintTest, NothingOfSqliteStaysOpen) {
    const sqlite3_int64 nBytes = sqlite3_memory_used();
    EXPECT_EQ(OfMembers(R"({"a": {"cpptype": "int", "cppDefaultValue": 0}})"), "");
    EXPECT_EQ(sqlite3_memory_used(), nBytes);
}

TEST_F(DefinitionLintTest, NamesThatAQueryHasAnotherMeaningFor) {
    for (const char* szName : {"offset", "sort_by", "sort_direction", "vornSqlWhereFilter"}) {
        EXPECT_EQ(OfMembers(std::string("{\"") + szName +
                            R"(": {"cpptype": "int", "cppDefaultValue": 0}})"),
                  std::string("hides-query-key /t/member/") + szName + ": member \"" + szName +
                      "\": a VornJsonDbApi takes this key of a query for more than a condition");
    }
    EXPECT_EQ(OfMembers(R"({"limit": {"cpptype": "int", "cppDefaultValue": 0}})"),
              "old-name /t/member/limit: member \"limit\": a VornJsonDbApi writes names as they "
              "stand, and SQL reads another thing; "
              "hides-query-key /t/member/limit: member \"limit\": a VornJsonDbApi takes this key "
              "of a query for more than a condition");
}

TEST_F(DefinitionLintTest, ColumnNamedRowidHidesTheRowNumber) {
    EXPECT_EQ(OfMembers(R"({"RowId": {"cpptype": "int", "cppDefaultValue": 0}})"),
              "rowid-name /t/member/RowId: member \"RowId\" hides the row number by which a "
              "VornJsonDbApi reads back what it has stored");
    EXPECT_EQ(OfEntry(R"({"key": "rowid",
                          "member": {"rowid": {"cpptype": "string", "cppDefaultValue": ""}}})"),
              "rowid-name /t/member/rowid: member \"rowid\" hides the row number by which a "
              "VornJsonDbApi reads back what it has stored");
    EXPECT_EQ(OfEntry(R"({"key": "rowid",
                          "member": {"a": {"cpptype": "int"},
                                     "rowid": {"cpptype": "int", "cppDefaultValue": 0}}})"),
              "");
    Describe(R"({"rowid": {"cpptype": "int"}})");
    EXPECT_EQ(OldCreate(Parse(R"({"rowid": 7})")), "-1");
    EXPECT_EQ(AllRows(), "7");
}

TEST_F(DefinitionLintTest, TypesThatAnOldHandleKnowsInPart) {
    EXPECT_EQ(OfMembers(R"({"a": {"cpptype": "double", "cppDefaultValue": 0.5},
                            "b": {"cpptype": "time_t"},
                            "c": {"cpptype": "Json::arrayValue"}, "d": {"cpptype": "any"},
                            "z": {"cpptype": "int", "cppDefaultValue": 0}})"),
              "old-type /t/member/a/cpptype: member \"a\" of type \"double\": a VornJsonDbApi "
              "cannot create, read, update; "
              "old-type /t/member/b/cpptype: member \"b\" of type \"time_t\": a VornJsonDbApi "
              "cannot create, read; "
              "old-type /t/member/c/cpptype: member \"c\" of type \"Json::arrayValue\": a "
              "VornJsonDbApi cannot update, query; "
              "old-type /t/member/d/cpptype: member \"d\" of type \"any\": a VornJsonDbApi cannot "
              "create, read, update, query");
}

TEST_F(DefinitionLintTest, Defaults) {
    EXPECT_EQ(OfMembers(R"({"a": {"cpptype": "int", "cppDefaultValue": "1"},
                            "b": {"cpptype": "int", "cppDefaultValue": 3000000000},
                            "c": {"cpptype": "int", "cppDefaultValue": null}})"),
              "bad-default /t/member/a/cppDefaultValue: member \"a\" cannot be \"1\": expected is "
              "a whole number from -2147483648 to 2147483647; "
              "bad-default /t/member/b/cppDefaultValue: member \"b\" cannot be 3000000000: "
              "expected is a whole number from -2147483648 to 2147483647; "
              "null-default /t/member/c/cppDefaultValue: member \"c\": a VornJsonDbApi refuses "
              "the records that it gives this default");
    Describe(R"({"a": {"cpptype": "int"}, "c": {"cpptype": "int", "cppDefaultValue": null}})");
    EXPECT_EQ(OldCreate(Parse(R"({"a": 1})")), "-1");
    EXPECT_EQ(OfMembers(R"({"a": {"cpptype": "int"}, "b": {"cpptype": "int"}})"),
              "no-last-default /t/member/b: member \"b\" comes last: a VornJsonDbApi refuses "
              "every record without it");
}

TEST_F(DefinitionLintTest, KeysAndFlags) {
    EXPECT_EQ(OfEntry(R"({"keys": "a", "member": {"a": {"cppType": "int", "cpptype": "int",
                          "not_null": true, "nullSeen": "yes", "unique": 1,
                          "cppDefaultValue": 0}}})"),
              "misspelt-key /t/keys: \"keys\" is no key of a definition (did you mean \"key\"?); "
              "misspelt-key /t/member/a/cppType: \"cppType\" is no key of a definition (did you "
              "mean \"cpptype\"?); "
              "misspelt-key /t/member/a/not_null: \"not_null\" is no key of a definition (did you "
              "mean \"notNull\"?); "
              "bad-flag /t/member/a/nullSeen: \"nullSeen\" is \"yes\", not true or false; "
              "bad-flag /t/member/a/unique: \"unique\" is 1, not true or false");
}

}  // namespace VORN_JSON_DB
