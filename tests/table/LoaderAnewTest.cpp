// What a loader keeps of one record, or of one load, for the next: nothing.

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

class LoaderAnewTest : public TableTest {
  protected:
    LoaderAnewTest() { Open(); }

    void Start(OnDuplicate eOnDuplicate = OnDuplicate::kStop) {
        LoadOptions How;
        How.eOnDuplicate = eOnDuplicate;
        EXPECT_EQ(Text(m_Into.Start(m_Table, How)), "ok");
    }
    std::string Add(const std::string& strRecord) { return Text(m_Into.Add(Parse(strRecord))); }

    // inserted, replaced, skipped
    std::string Counts() const {
        const LoadCounts& Now = m_Into.Counts();
        return std::to_string(Now.nInserted) + " " + std::to_string(Now.nReplaced) + " " +
               std::to_string(Now.nSkipped);
    }

    std::string Ids() { return Rows("SELECT id FROM task ORDER BY id"); }

    Loader m_Into;
};

TEST_F(LoaderAnewTest, StartThatFailsUndoesTheLoadBefore) {
    Start();
    EXPECT_EQ(Add(R"({"id": 1})"), "ok");
    Table Closed;
    EXPECT_EQ(Text(m_Into.Start(Closed)),
              "misuse: cannot load records into: the table is not open");
    EXPECT_EQ(Counts(), "0 0 0");
    EXPECT_EQ(Ids(), "");
    EXPECT_NE(sqlite3_get_autocommit(m_pDb), 0);
}

TEST_F(LoaderAnewTest, RefusedStartIsNone) {
    Run("CREATE TABLE keyless (a INTEGER)");
    Table Keyless;
    EXPECT_EQ(Text(Keyless.Open(m_pDb, "keyless", Json::Value())), "ok");
    LoadOptions How;
    How.eOnDuplicate = OnDuplicate::kSkip;
    EXPECT_EQ(m_Into.Start(Keyless, How).Code(), StatusCode::kRefused);
    EXPECT_EQ(Add(R"({"a": 1})"), "misuse: cannot load records: the loader is not started");
}

TEST_F(LoaderAnewTest, WholeRecordTakesTheWrongsOfTheStepsBefore) {
    Start();
    m_Into.Reject("no good");
    EXPECT_EQ(Add(R"({"id": 1})"), "ok");
    m_Into.SetInteger(m_Into.MemberIndex("id"), 2);
    EXPECT_EQ(Text(m_Into.EndRecord()), "ok");
    EXPECT_EQ(Ids(), "1;2");
    EXPECT_EQ(Text(m_Into.Commit()), "ok");
}

TEST_F(LoaderAnewTest, WhatIsWrongWithAWholeRecordIsNotForgottenWithTheStepsBefore) {
    Start();
    m_Into.Reject("no good");
    EXPECT_EQ(
        Add(R"({"id": 1, "name": 2})"),
        "refused: cannot load record 1 into table \"task\": member \"name\": 2 is another kind "
        "of value: expected is a text [wrong-kind /name]");
    EXPECT_EQ(Ids(), "");
}

TEST_F(LoaderAnewTest, MembersAreThoseOfOneRecord) {
    Start();
    m_Into.SetInteger(m_Into.MemberIndex("id"), 1);
    EXPECT_EQ(Text(m_Into.EndRecord()), "ok");
    EXPECT_EQ(Text(m_Into.EndRecord()),
              "refused: cannot load record 2 into table \"task\": the record has no members "
              "[not-a-record ]");
}

// Records of two shapes in turn prepare two statements, and not one for each record.
TEST_F(LoaderAnewTest, StatementsOfEachShapeAreKept) {
    Start();
    EXPECT_EQ(Add(R"({"id": 1})"), "ok");
    sqlite3_stmt* const pFirst = sqlite3_next_stmt(m_pDb, nullptr);
    EXPECT_EQ(Add(R"({"id": 2, "name": "a"})"), "ok");
    sqlite3_stmt* const pSecond = sqlite3_next_stmt(m_pDb, nullptr);
    EXPECT_EQ(sqlite3_next_stmt(m_pDb, pSecond), pFirst);
    EXPECT_EQ(Add(R"({"id": 3, "name": "b"})"), "ok");
    EXPECT_EQ(Add(R"({"id": 4})"), "ok");
    EXPECT_EQ(sqlite3_next_stmt(m_pDb, nullptr), pSecond);
    EXPECT_EQ(Text(m_Into.Commit()), "ok");
}

// A key that the table hands out ends a load only where its member cannot hold it.
TEST_F(LoaderAnewTest, BadRecordBehindAKeyThatWasHandedOutIsLeftOut) {
    LoadOptions How;
    How.blGoOnAfterBad = true;
    EXPECT_EQ(Text(m_Into.Start(m_Table, How)), "ok");
    EXPECT_EQ(Add(R"({"name": "a"})"), "ok");
    EXPECT_EQ(Add(R"({"id": 1})"),
              "duplicate: cannot load record 2 into table \"task\": UNIQUE constraint failed: "
              "task.id (id = 1)");
    EXPECT_EQ(Add(R"({"name": "b"})"), "ok");
    EXPECT_EQ(Text(m_Into.Commit()), "ok");
    EXPECT_EQ(Ids(), "1;2");
}

TEST_F(LoaderAnewTest, FailureTakesBackWhatWasReplacedOrSkipped) {
    for (const auto eMode : {OnDuplicate::kReplace, OnDuplicate::kSkip}) {
        Run("DELETE FROM task");
        Start(eMode);
        EXPECT_EQ(Add(R"({"id": 1})"), "ok");
        EXPECT_EQ(Add(R"({"id": 1})"), "ok");
        EXPECT_EQ(Text(m_Into.Commit()), "ok");
        EXPECT_EQ(Add(R"({"id": 1})"), "ok");
        EXPECT_EQ(Counts(), eMode == OnDuplicate::kSkip ? "1 0 2" : "1 2 0");
        EXPECT_EQ(Add("{}"),
                  "refused: cannot load record 4 into table \"task\": an object of 0 is no record: "
                  "an object with members is expected [not-a-record ]");
        EXPECT_EQ(Counts(), eMode == OnDuplicate::kSkip ? "1 0 1" : "1 1 0");
    }
}

}  // namespace

}  // namespace VORN_JSON_DB
