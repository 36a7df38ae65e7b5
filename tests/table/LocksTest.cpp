// Two connections on one file, and the time that passes between them.

#include <cstdio>
#include <numeric>

#include "FakeTime.h"
#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

class LocksTest : public testing::Test {
  protected:
    LocksTest() {
        EXPECT_EQ(SQLITE_OK, sqlite3_open(m_strFile.c_str(), &m_pDb));
        EXPECT_EQ(SQLITE_OK, sqlite3_open(m_strFile.c_str(), &m_pOther));
        Options How;
        How.blCreateTable = true;
        EXPECT_EQ("ok", Text(m_Table.Open(m_pDb, "task", Parse(kTasks), How)));
        Other("CREATE TABLE unrelated (a)");
    }
    ~LocksTest() override {
        m_Table = Table();
        EXPECT_EQ(SQLITE_OK, sqlite3_close(m_pOther));
        EXPECT_EQ(SQLITE_OK, sqlite3_close(m_pDb));
        std::remove(m_strFile.c_str());
        std::remove((m_strFile + "-journal").c_str());
    }
    LocksTest(const LocksTest&) = delete;
    LocksTest& operator=(const LocksTest&) = delete;

    void Other(const char* szSql) {
        EXPECT_EQ(SQLITE_OK, sqlite3_exec(m_pOther, szSql, nullptr, nullptr, nullptr))
            << sqlite3_errmsg(m_pOther);
    }

    std::string Create(int nId) {
        Json::Value jRecord;
        jRecord["id"] = nId;
        return Text(m_Table.Create(jRecord, &m_jStored));
    }

    std::string m_strFile = testing::TempDir() + "locks-" +
                            testing::UnitTest::GetInstance()->current_test_info()->name();
    sqlite3* m_pDb = nullptr;
    sqlite3* m_pOther = nullptr;
    Table m_Table;
    Json::Value m_jStored;
};

TEST_F(LocksTest, WriterThatGoesAwayIsWaitedFor) {
    Other("BEGIN IMMEDIATE");
    const FakeTime Time([this](int nPause) {
        if (nPause == 3) {
            Other("COMMIT");
        }
    });
    EXPECT_EQ("ok", Create(1));
    EXPECT_EQ(R"({"done":false,"id":1})", Text(m_jStored));
    EXPECT_EQ((std::vector<long>{1, 2, 4}), Time.Pauses());
}

TEST_F(LocksTest, WriterThatStaysIsReportedWhenTheTimeIsOver) {
    Other("BEGIN IMMEDIATE");
    const FakeTime Time;
    Json::Value jRecord = Parse(R"({"id": 1})");
    const Status Outcome = m_Table.Create(jRecord);
    EXPECT_EQ("locked: cannot save a record in table \"task\": database is locked (waited 5000 ms)",
              Text(Outcome));
    EXPECT_EQ(Retry::kCall, Outcome.Advice());
    EXPECT_EQ(SQLITE_BUSY, Outcome.SqliteCode());
    EXPECT_EQ(5000, std::accumulate(Time.Pauses().begin(), Time.Pauses().end(), 0L));
    EXPECT_EQ(50, Time.Pauses()[10]);
    Other("COMMIT");
    EXPECT_EQ("ok", Create(1));
}

TEST_F(LocksTest, ReaderThatStandsInTheWayOfACommitIsWaitedFor) {
    EXPECT_EQ("ok", Create(1));
    Other("BEGIN; SELECT * FROM task");
    const FakeTime Time([this](int nPause) {
        if (nPause == 2) {
            Other("COMMIT");
        }
    });
    EXPECT_EQ("ok", Create(2));
    EXPECT_EQ((std::vector<long>{1, 2}), Time.Pauses());
}

// The first try inserts, with the default of "done", the second one finds the other's record.
TEST_F(LocksTest, FurtherTryWritesOnlyWhatWasGiven) {
    Other("BEGIN; SELECT * FROM task");
    const FakeTime Time([this](int nPause) {
        if (nPause == 2) {
            Other("COMMIT; INSERT INTO task (id, done) VALUES (1, 1)");
        }
    });
    Written eWritten = Written::kInserted;
    EXPECT_EQ("ok", Text(m_Table.Save(Parse(R"({"id": 1, "name": "a"})"), OnDuplicate::kUpsert,
                                      &m_jStored, &eWritten)));
    EXPECT_EQ(R"({"done":true,"id":1,"name":"a"})", Text(m_jStored));
    EXPECT_EQ(Written::kUpdated, eWritten);
}

// The statement that reads around the call sees a state that stays as it is, so a pause is in vain.
TEST_F(LocksTest, ChangeBehindTheStateThatAForEachReadsDoesNotWait) {
    Other("PRAGMA journal_mode = WAL; INSERT INTO task (id) VALUES (1), (2)");
    Options How;
    How.blCompatible = false;
    Table Unrelated;
    EXPECT_EQ("ok", Text(Unrelated.Open(m_pDb, "unrelated", Json::Value(), How)));
    const FakeTime Time;
    EXPECT_EQ("ok", Text(m_Table.ForEach(Query(), [&](const Json::Value&) {
                  Other("INSERT INTO task (id) VALUES (3)");
                  const Status Outcome = Unrelated.Create(Parse(R"({"a": 1})"));
                  EXPECT_EQ(
                      "locked: cannot save a record in table \"unrelated\": database is locked",
                      Text(Outcome));
                  EXPECT_EQ(Retry::kCall, Outcome.Advice());
                  EXPECT_EQ(SQLITE_BUSY_SNAPSHOT, Outcome.SqliteCode());
                  return false;
              })));
    EXPECT_EQ(std::vector<long>{}, Time.Pauses());
    EXPECT_EQ("ok", Text(Unrelated.Create(Parse(R"({"a": 1})"))));
}

TEST_F(LocksTest, InsideOfATransactionThereIsNoWaiting) {
    EXPECT_EQ("ok", Create(1));
    Transaction All;
    EXPECT_EQ("ok", Text(All.Begin(m_pDb, Transaction::Mode::kDeferred)));
    Json::Value jRecord;
    EXPECT_EQ("ok", Text(m_Table.Get(1, jRecord)));
    Other("BEGIN IMMEDIATE");
    const FakeTime Time;
    const Status Outcome = m_Table.Create(Parse(R"({"id": 2})"));
    EXPECT_EQ("locked: cannot save a record in table \"task\": database is locked", Text(Outcome));
    EXPECT_EQ(Retry::kTransaction, Outcome.Advice());
    EXPECT_TRUE(Time.Pauses().empty());
    EXPECT_EQ("ok", Text(All.Rollback()));
    Other("COMMIT");
}

TEST_F(LocksTest, BeginWaitsAndCommitWaits) {
    Other("BEGIN IMMEDIATE");
    const FakeTime Time([this](int nPause) {
        if (nPause == 1) {
            Other("COMMIT; BEGIN; SELECT * FROM task");
        } else if (nPause == 3) {
            Other("COMMIT");
        }
    });
    Transaction All;
    EXPECT_EQ("ok", Text(All.Begin(m_pDb)));
    EXPECT_EQ("ok", Create(1));
    EXPECT_EQ("ok", Text(All.Commit()));
    EXPECT_EQ((std::vector<long>{1, 1, 2}), Time.Pauses());
}

TEST_F(LocksTest, CommitThatWaitedInVainCanBeTriedAgain) {
    Other("BEGIN; SELECT * FROM task");
    const FakeTime Time;
    Transaction All;
    EXPECT_EQ("ok", Text(All.Begin(m_pDb, Transaction::Mode::kImmediate, 3)));
    EXPECT_EQ("ok", Create(1));
    const Status Outcome = All.Commit();
    EXPECT_EQ("locked: cannot commit a transaction: database is locked (waited 3 ms)",
              Text(Outcome));
    EXPECT_EQ(Retry::kCall, Outcome.Advice());
    EXPECT_TRUE(All.IsOpen());
    Other("COMMIT");
    EXPECT_EQ("ok", Text(All.Commit()));
    EXPECT_FALSE(All.IsOpen());
}

TEST_F(LocksTest, TransactionThatDidNotBeginIsNotOpen) {
    Other("BEGIN IMMEDIATE");
    const FakeTime Time;
    Transaction All;
    EXPECT_EQ(Text(All.Begin(m_pDb, Transaction::Mode::kImmediate, 3)),
              "locked: cannot begin a transaction: database is locked (waited 3 ms)");
    EXPECT_FALSE(All.IsOpen());
    Other("COMMIT");
    EXPECT_EQ(Text(All.Begin(m_pDb)), "ok");
}

TEST_F(LocksTest, RefusedBeginLeavesTheTimeToWait) {
    Other("BEGIN; SELECT * FROM task");
    const FakeTime Time;
    Transaction All;
    EXPECT_EQ(Text(All.Begin(m_pDb, Transaction::Mode::kImmediate, 3)), "ok");
    EXPECT_EQ(Text(All.Begin(m_pDb, Transaction::Mode::kImmediate, 5)),
              "misuse: cannot begin a transaction: it is open already");
    EXPECT_EQ(Create(1), "ok");
    EXPECT_EQ(Text(All.Commit()),
              "locked: cannot commit a transaction: database is locked (waited 3 ms)");
    Other("COMMIT");
}

TEST_F(LocksTest, CallersBusyHandlerStays) {
    static int s_nCalls = 0;
    sqlite3_busy_handler(
        m_pDb, [](void*, int) { return ++s_nCalls > 0 ? 0 : 0; }, nullptr);
    Other("BEGIN IMMEDIATE");
    const FakeTime Time([this](int) { Other("COMMIT"); });
    EXPECT_EQ("ok", Create(1));
    EXPECT_EQ(1, s_nCalls);
}

TEST_F(LocksTest, WhatTheCallersBusyHandlerWaitsCounts) {
    FakeTime Time;
    sqlite3_busy_handler(
        m_pDb,
        [](void* pTime, int nCalls) {
            static_cast<FakeTime*>(pTime)->Sleep(4998000000);
            return nCalls == 0 ? 1 : 0;
        },
        &Time);
    Other("BEGIN IMMEDIATE");
    EXPECT_EQ("locked: cannot save a record in table \"task\": database is locked (waited 5000 ms)",
              Create(1));
    EXPECT_EQ((std::vector<long>{4998, 4998}), Time.Pauses());
    Other("COMMIT; BEGIN; SELECT * FROM task");
    Transaction All;
    EXPECT_EQ("ok", Text(All.Begin(m_pDb)));
    EXPECT_EQ("ok", Create(1));
    EXPECT_EQ("locked: cannot commit a transaction: database is locked (waited 5000 ms)",
              Text(All.Commit()));
    EXPECT_EQ((std::vector<long>{4998, 4998, 4998, 4998}), Time.Pauses());
    Other("COMMIT");
    sqlite3_busy_handler(m_pDb, nullptr, nullptr);
}

TEST_F(LocksTest, LoaderWaitsToBeginAndKeepsWhatItCannotCommitYet) {
    Other("BEGIN IMMEDIATE");
    const FakeTime Time([this](int nPause) {
        if (nPause == 2) {
            Other("COMMIT; BEGIN; SELECT * FROM task");
        }
    });
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    EXPECT_EQ("ok", Text(Into.Add(Parse(R"({"id": 1})"))));
    EXPECT_EQ((std::vector<long>{1, 2}), Time.Pauses());
    const Status Outcome = Into.Commit();
    EXPECT_EQ(
        "locked: cannot load records into table \"task\": cannot commit a transaction: database is "
        "locked (waited 5000 ms)",
        Text(Outcome));
    EXPECT_EQ(Retry::kCall, Outcome.Advice());
    Other("COMMIT");
    EXPECT_EQ("ok", Text(Into.Commit()));
    EXPECT_EQ(1, Into.Counts().nCommitted);
}

// Nobody would call again with the record that filled the transaction.
TEST_F(LocksTest, LoaderEndsWhenAFullTransactionCannotBeCommitted) {
    Other("BEGIN; SELECT * FROM task");
    const FakeTime Time;
    LoadOptions How;
    How.nRowsPerTransaction = 2;
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table, How)));
    EXPECT_EQ("ok", Text(Into.Add(Parse(R"({"id": 1})"))));
    const std::string strLocked =
        "locked: cannot load records into table \"task\": cannot commit a transaction: database is "
        "locked (waited 5000 ms)";
    const Status Locked = Into.Add(Parse(R"({"id": 2})"));
    EXPECT_EQ(strLocked, Text(Locked));
    EXPECT_EQ(Retry::kTransaction, Locked.Advice());
    EXPECT_EQ(0, Into.Counts().nInserted);
    Other("COMMIT");
    const Status Later = Into.Commit();
    EXPECT_EQ(strLocked, Text(Later));
    EXPECT_EQ(Retry::kTransaction, Later.Advice());
    EXPECT_EQ("ok", Create(1));
    EXPECT_EQ(R"({"done":false,"id":1})", Text(m_jStored));
}

TEST_F(LocksTest, LoaderThatCannotBeginNamesTheTable) {
    Other("BEGIN IMMEDIATE");
    const FakeTime Time;
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    const Status Outcome = Into.Add(Parse(R"({"id": 1})"));
    EXPECT_EQ(
        "locked: cannot load record 1 into table \"task\": cannot begin a transaction: database is "
        "locked (waited 5000 ms)",
        Text(Outcome));
    EXPECT_EQ(Retry::kTransaction, Outcome.Advice());
    EXPECT_EQ(SQLITE_BUSY, Outcome.SqliteCode());
    Other("COMMIT");
    EXPECT_EQ(Text(Outcome), Text(Into.Add(Parse(R"({"id": 1})"))));
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    EXPECT_EQ("ok", Text(Into.Add(Parse(R"({"id": 1})"))));
    EXPECT_EQ("ok", Text(Into.Commit()));
}

}  // namespace

}  // namespace VORN_JSON_DB
