#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

using GetTest = TableTest;

constexpr char kPairs[] = R"({"p": {"key": ["b", "a"], "member": {
    "a": {"cpptype": "int"}, "b": {"cpptype": "string"}, "v": {"cpptype": "int"}}}})";

TEST_F(GetTest, KeyIsAValueOrAnObject) {
    Open();
    Create(R"({"id": 1, "name": "a"})");
    EXPECT_EQ(R"({"done":false,"id":1,"name":"a"})", Get("1"));
    EXPECT_EQ(R"({"done":false,"id":1,"name":"a"})", Get(R"({"id": 1})"));
    EXPECT_EQ(R"({"done":false,"id":1,"name":"a"})", Get(R"({"id": 1, "name": "b"})"));
    EXPECT_EQ("not-found: cannot get a record from table \"task\": no record has the key 2",
              Get("2"));
}

TEST_F(GetTest, KeyOfSeveralMembersIsAnObject) {
    Open(kPairs);
    Create(R"({"a": 1, "b": "x", "v": 5})");
    EXPECT_EQ(R"({"a":1,"b":"x","v":5})", Get(R"({"a": 1, "b": "x"})"));
    EXPECT_EQ(
        "not-found: cannot get a record from table \"p\": no record has the key an object of 2",
        Get(R"({"a": 2, "b": "x"})"));
    EXPECT_EQ(
        "refused: cannot get a record from table \"p\": the key's member \"b\" has no value "
        "[missing-key /b]",
        Get(R"({"a": 1})"));
    EXPECT_EQ(
        "refused: cannot get a record from table \"p\": 1 is no record: an object with members is "
        "expected [not-a-record ]",
        Get("1"));
}

TEST_F(GetTest, KeyThatCannotBeOneIsRefused) {
    Open();
    EXPECT_EQ(
        "refused: cannot get a record from table \"task\": the key's member \"id\" has no value "
        "[missing-key /id]",
        Get("null"));
    EXPECT_EQ(
        "refused: cannot get a record from table \"task\": member \"id\": \"1\" is another kind of "
        "value: expected is a whole number from -2147483648 to 2147483647 [wrong-kind /id]",
        Get(R"("1")"));
    Open(R"({"n": {"member": {"a": {"cpptype": "int"}}}})");
    EXPECT_EQ(
        "refused: cannot get a record from table \"n\": the table has no key that tells records "
        "apart [no-key ]",
        Get(R"({"a": 1})"));
}

TEST_F(GetTest, TextThatNoOldHandleWouldReadCanBeLookedFor) {
    Open(R"({"t": {"key": "k", "member": {"k": {"cpptype": "string"}}}})");
    Json::Value jRecord = "untouched";
    EXPECT_EQ(
        "not-found: cannot get a record from table \"t\": no record has the key \"'; DROP TABLE "
        "t; --\"",
        Text(m_Table.Get("'; DROP TABLE t; --", jRecord)));
    EXPECT_EQ(StatusCode::kNotFound, m_Table.Get(std::string("a\0b", 3), jRecord).Code());
    EXPECT_EQ("\"untouched\"", Text(jRecord));
}

TEST_F(GetTest, TableThatIsDroppedAndMadeAnewIsReadAgain) {
    Open();
    Create(R"({"id": 1, "name": "a"})");
    Run("ALTER TABLE task RENAME TO gone");
    EXPECT_EQ("refused: cannot get a record from table \"task\": no such table: task", Get("1"));
    Run("CREATE TABLE task (extra, tags, done, size, name, id INTEGER PRIMARY KEY);"
        "INSERT INTO task (id, name, extra) VALUES (1, 'b', 'x')");
    EXPECT_EQ(R"({"id":1,"name":"b"})", Get("1"));
}

TEST_F(GetTest, MemberThatTheTableLacksIsNoText) {
    Options How;
    How.strSqlCreate = "CREATE TABLE task (id INTEGER PRIMARY KEY)";
    Open(kTasks, How);
    Run("INSERT INTO task VALUES (1)");
    EXPECT_EQ("refused: cannot get a record from table \"task\": no such column: task.done",
              Get("1"));
}

}  // namespace

}  // namespace VORN_JSON_DB
