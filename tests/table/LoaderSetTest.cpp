// JSON texts that a loader is given for a member: as they will be stored already, and otherwise.

#include <limits>

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

class LoaderSetTest : public TableTest {
  protected:
    LoaderSetTest() {
        Options How;
        How.strSqlCreate =
            "CREATE TABLE item (id INTEGER PRIMARY KEY, list TEXT, map TEXT, name TEXT,"
            " made TEXT AS ('[]'))";
        Open(R"({"item": {"key": "id", "member": {
            "id": {"cpptype": "int"}, "list": {"cpptype": "Json::arrayValue"},
            "made": {"cpptype": "Json::arrayValue"}, "map": {"cpptype": "Json::objectValue"},
            "name": {"cpptype": "string"}}}})",
             How);
        LoadOptions GoOn;
        GoOn.blGoOnAfterBad = true;
        EXPECT_EQ(Text(m_Into.Start(m_Table, GoOn)), "ok");
    }
    ~LoaderSetTest() override { m_Into.Commit().Ignore(); }

    std::string Add(const std::string& strMember, const std::string& strJson) {
        m_Into.SetJson(m_Into.MemberIndex(strMember), strJson);
        return Text(m_Into.EndRecord());
    }

    Loader m_Into;
};

TEST_F(LoaderSetTest, WrittenJsonIsStoredAsItIs) {
    EXPECT_EQ(Add("list", R"([1,{"a":"b"}])"), "ok");
    EXPECT_EQ(Add("map", R"({"a":[]})"), "ok");
    EXPECT_EQ(Add("map", R"({"a": []})"), "ok");
    EXPECT_EQ(Rows("SELECT list, map FROM item ORDER BY id"),
              R"([1,{"a":"b"}]|NULL;NULL|{"a":[]};NULL|{"a":[]})");
}

// The text is the caller's again as soon as the call returns.
TEST_F(LoaderSetTest, TextsAreCopied) {
    std::string strList = "[1]";
    std::string strName = R"("a\u00e9")";
    m_Into.SetJson(m_Into.MemberIndex("list"), strList);
    m_Into.SetJson(m_Into.MemberIndex("name"), strName);
    strList = "[2]";
    strName = "gone away";
    EXPECT_EQ(Text(m_Into.EndRecord()), "ok");
    EXPECT_EQ(Rows("SELECT list, name FROM item"), "[1]|a\xc3\xa9");
}

TEST_F(LoaderSetTest, OfANameThatComesTwiceTheLastOneCounts) {
    EXPECT_EQ(Add("map", R"({"a": 1.5, "a": 2.5})"), "ok");
    EXPECT_EQ(Rows("SELECT map FROM item"), R"({"a":2.5})");
}

TEST_F(LoaderSetTest, WrittenJsonIsForMembersOfItsKind) {
    const auto Refused = [](const std::string& strRest) {
        return "refused: cannot load record " + strRest;
    };
    EXPECT_EQ(Add("list", "{}"),
              Refused("1 into table \"item\": member \"list\": an object of 0 is another kind of "
                      "value: expected is a list [wrong-kind /list]"));
    EXPECT_EQ(Add("map", "[1]"),
              Refused("2 into table \"item\": member \"map\": a list of 1 is another kind of "
                      "value: expected is an object [wrong-kind /map]"));
    EXPECT_EQ(Add("name", "[1]"),
              Refused("3 into table \"item\": member \"name\": a list of 1 is another kind of "
                      "value: expected is a text [wrong-kind /name]"));
    EXPECT_EQ(Add("made", "[1]"), Refused("4 into table \"item\": member \"made\" is computed by "
                                          "the table [generated /made]"));
    EXPECT_NE(sqlite3_get_autocommit(m_pDb), 0);
    EXPECT_EQ(Rows("SELECT count(*) FROM item"), "0");
}

TEST_F(LoaderSetTest, ValueThatDoesNotFitIsShown) {
    m_Into.SetText(m_Into.MemberIndex("id"), "seven");
    EXPECT_EQ(Text(m_Into.EndRecord()),
              "refused: cannot load record 1 into table \"item\": member \"id\": \"seven\" is "
              "another kind of value: expected is a whole number from -2147483648 to 2147483647 "
              "[wrong-kind /id]");
}

TEST_F(LoaderSetTest, BooleansAreForMembersOfTheirKind) {
    m_Into.SetBoolean(m_Into.MemberIndex("name"), false);
    EXPECT_EQ(
        Text(m_Into.EndRecord()),
        "refused: cannot load record 1 into table \"item\": member \"name\": false is another "
        "kind of value: expected is a text [wrong-kind /name]");
    m_Into.SetBoolean(-1, false);
    EXPECT_EQ(Text(m_Into.EndRecord()),
              "refused: cannot load record 2 into table \"item\": there is no member of number -1 "
              "[unknown-member ]");
    Loader NotStarted;
    NotStarted.SetBoolean(0, true);
    EXPECT_EQ(Text(NotStarted.EndRecord()),
              "misuse: cannot load records: the loader is not started");
}

TEST_F(LoaderSetTest, MembersOfABadRecordAreForgotten) {
    m_Into.SetText(m_Into.MemberIndex("name"), "a");
    EXPECT_EQ(Add("list", "{}"),
              "refused: cannot load record 1 into table \"item\": member \"list\": an object of 0 "
              "is another kind of value: expected is a list [wrong-kind /list]");
    EXPECT_EQ(Add("map", "{}"), "ok");
    EXPECT_EQ(Rows("SELECT name, list, map FROM item"), "NULL|NULL|{}");
}

TEST_F(LoaderSetTest, ValueThatFitsReplacesOneThatDidNot) {
    m_Into.SetJson(m_Into.MemberIndex("list"), "{}");
    EXPECT_EQ(Add("list", "[2]"), "ok");
    EXPECT_EQ(Rows("SELECT list FROM item"), "[2]");
}

TEST_F(LoaderSetTest, OfWhatIsWrongInOnePlaceTheLastIsTold) {
    m_Into.SetInteger(-1, 1);
    m_Into.SetInteger(std::numeric_limits<int>::max(), 1);
    EXPECT_EQ(Text(m_Into.EndRecord()),
              "refused: cannot load record 1 into table \"item\": there is no member of number "
              "2147483647 [unknown-member ]");
    m_Into.Reject("first");
    m_Into.Reject("second");
    EXPECT_EQ(Text(m_Into.EndRecord()),
              "refused: cannot load record 2 into table \"item\": second [rejected ]");
    EXPECT_EQ(Add("list", "[2]"), "ok");
}

}  // namespace

}  // namespace VORN_JSON_DB
