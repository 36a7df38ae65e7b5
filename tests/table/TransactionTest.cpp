#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

using TransactionTest = TableTest;

TEST_F(TransactionTest, LeavingTheScopeRollsBack) {
    Open();
    {
        Transaction All;
        EXPECT_EQ("ok", Text(All.Begin(m_pDb)));
        EXPECT_TRUE(All.IsOpen());
        Create(R"({"id": 1})");
    }
    EXPECT_EQ("0", Rows("SELECT count(*) FROM task"));
    EXPECT_NE(0, sqlite3_get_autocommit(m_pDb));
}

TEST_F(TransactionTest, NestedOnesAreSavepoints) {
    Open();
    Transaction Outer;
    EXPECT_EQ("ok", Text(Outer.Begin(m_pDb)));
    Create(R"({"id": 1})");
    {
        Transaction Inner;
        EXPECT_EQ("ok", Text(Inner.Begin(m_pDb)));
        Create(R"({"id": 2})");
    }
    {
        Transaction Inner;
        EXPECT_EQ("ok", Text(Inner.Begin(m_pDb)));
        Create(R"({"id": 3})");
        EXPECT_EQ("ok", Text(Inner.Commit()));
    }
    EXPECT_EQ("ok", Text(Outer.Commit()));
    EXPECT_EQ("1;3", Rows("SELECT id FROM task ORDER BY id"));
}

// All savepoints have one name, and SQLite takes the innermost: to undo one must not touch another.
TEST_F(TransactionTest, SavepointInASavepointIsUndoneAlone) {
    Open();
    Transaction Outer, Middle;
    EXPECT_EQ(Text(Outer.Begin(m_pDb)), "ok");
    EXPECT_EQ(Text(Middle.Begin(m_pDb)), "ok");
    Create(R"({"id": 1})");
    {
        Transaction Inner;
        EXPECT_EQ(Text(Inner.Begin(m_pDb)), "ok");
        Create(R"({"id": 2})");
    }
    EXPECT_EQ(Rows("SELECT id FROM task"), "1");
    Json::Value jStored;
    EXPECT_EQ(m_Table.Create(Parse(R"({"id": 1})"), &jStored).Code(), StatusCode::kDuplicate);
    EXPECT_EQ(Text(Middle.Rollback()), "ok");
    EXPECT_EQ(Text(Outer.Commit()), "ok");
    EXPECT_EQ(Rows("SELECT id FROM task"), "");
}

TEST_F(TransactionTest, CallsOutOfTurnAreMisuse) {
    Transaction All;
    EXPECT_EQ("misuse: cannot commit a transaction: none was begun", Text(All.Commit()));
    EXPECT_EQ("misuse: cannot roll a transaction back: none was begun", Text(All.Rollback()));
    EXPECT_EQ("misuse: cannot begin a transaction: there is no connection",
              Text(All.Begin(nullptr)));
    EXPECT_EQ("ok", Text(All.Begin(m_pDb)));
    EXPECT_EQ("misuse: cannot begin a transaction: it is open already", Text(All.Begin(m_pDb)));
}

TEST_F(TransactionTest, TransactionThatAFailureHasUndoneSaysSo) {
    Open();
    Transaction All;
    EXPECT_EQ("ok", Text(All.Begin(m_pDb)));
    Run("ROLLBACK");
    const Status Outcome = All.Commit();
    EXPECT_EQ(
        "misuse: cannot commit a transaction: a failure has undone it, or a "
        "statement has ended it",
        Text(Outcome));
    EXPECT_EQ(Retry::kTransaction, Outcome.Advice());
    EXPECT_FALSE(All.IsOpen());
    EXPECT_EQ("ok", Text(All.Begin(m_pDb)));
    Run("ROLLBACK");
    EXPECT_EQ("ok", Text(All.Rollback()));
}

TEST_F(TransactionTest, CommitThatAForeignKeyForbidsLeavesTheTransaction) {
    Run("PRAGMA foreign_keys = ON; CREATE TABLE p (id INTEGER PRIMARY KEY);"
        "CREATE TABLE c (p REFERENCES p(id) DEFERRABLE INITIALLY DEFERRED)");
    Transaction All;
    EXPECT_EQ("ok", Text(All.Begin(m_pDb)));
    Run("INSERT INTO c VALUES (1)");
    EXPECT_EQ("constraint: cannot commit a transaction: FOREIGN KEY constraint failed",
              Text(All.Commit()));
    EXPECT_TRUE(All.IsOpen());
    Run("INSERT INTO p VALUES (1)");
    EXPECT_EQ("ok", Text(All.Commit()));
}

TEST_F(TransactionTest, CommitThatAHookForbidsSaysThatAllIsUndone) {
    Open();
    sqlite3_commit_hook(
        m_pDb, [](void*) { return 1; }, nullptr);
    Transaction All;
    EXPECT_EQ("ok", Text(All.Begin(m_pDb)));
    EXPECT_EQ(R"({"done":false,"id":1})", Create(R"({"id": 1})"));
    const Status Outcome = All.Commit();
    EXPECT_EQ(
        "constraint: cannot commit a transaction: constraint failed; the transaction is undone",
        Text(Outcome));
    EXPECT_EQ(SQLITE_CONSTRAINT_COMMITHOOK, Outcome.SqliteCode());
    EXPECT_EQ(Retry::kTransaction, Outcome.Advice());
    EXPECT_EQ("ok", Text(All.Rollback()));
    EXPECT_EQ("constraint: cannot save a record in table \"task\": constraint failed",
              Create(R"({"id": 1})"));
    sqlite3_commit_hook(m_pDb, nullptr, nullptr);
    EXPECT_EQ("", Rows("SELECT * FROM task"));
}

// SQLite has no other way than to undo all when the disk is full, and reports a ROLLBACK of nothing
// as the next error: what is told is the first one.
TEST_F(TransactionTest, FullDiskUndoesTheCallersTransactionAndIsTold) {
    Open();
    Run("PRAGMA max_page_count = 10");
    Json::Value jRecord;
    jRecord["name"] = std::string(100000, 'x');
    const std::string strFull =
        "disk-full: cannot save a record in table \"task\": database or disk is full; the "
        "transaction is undone";
    for (Json::Value* pjStored : {static_cast<Json::Value*>(nullptr), &jRecord}) {
        Run("BEGIN; INSERT INTO task (id) VALUES (1)");
        const Status Outcome = m_Table.Create(jRecord, pjStored);
        EXPECT_EQ(strFull, Text(Outcome));
        EXPECT_EQ(Retry::kTransaction, Outcome.Advice());
        EXPECT_EQ(SQLITE_FULL, Outcome.SqliteCode());
        EXPECT_NE(0, sqlite3_get_autocommit(m_pDb));
    }
    Create(R"({"id": 1})");
    Transaction All;
    EXPECT_EQ("ok", Text(All.Begin(m_pDb)));
    EXPECT_EQ(
        "disk-full: cannot update records of table \"task\": database or disk is full; the "
        "transaction is undone",
        Text(m_Table.Update(Query().Where("id", 1), jRecord)));
    const Status Outcome = All.Commit();
    EXPECT_EQ(
        "misuse: cannot commit a transaction: a failure has undone it, or a "
        "statement has ended it",
        Text(Outcome));
    EXPECT_EQ(Retry::kTransaction, Outcome.Advice());
    EXPECT_EQ("disk-full: cannot save a record in table \"task\": database or disk is full",
              Text(m_Table.Create(jRecord)));
    EXPECT_EQ("1", Rows("SELECT count(*) FROM task"));
}

// What a constraint refuses is one statement alone.
TEST_F(TransactionTest, OtherFailuresLeaveTheCallersTransaction) {
    Open();
    Run("BEGIN; INSERT INTO task (id) VALUES (1)");
    EXPECT_EQ(
        "duplicate: cannot save a record in table \"task\": UNIQUE constraint failed: task.id "
        "(id = 1)",
        Create(R"({"id": 1})"));
    EXPECT_EQ(0, sqlite3_get_autocommit(m_pDb));
    Run("COMMIT");
    EXPECT_EQ("1", Rows("SELECT count(*) FROM task"));
}

TEST_F(TransactionTest, WhatFailsLeavesNoSavepoint) {
    Open();
    Run("BEGIN; INSERT INTO task (id) VALUES (1)");
    Json::Value jStored;
    EXPECT_EQ(m_Table.Create(Parse(R"({"id": 1})"), &jStored).Code(), StatusCode::kDuplicate);
    EXPECT_EQ(sqlite3_exec(m_pDb, "RELEASE vornjsondb", nullptr, nullptr, nullptr), SQLITE_ERROR);
    Transaction Inner;
    EXPECT_EQ(Text(Inner.Begin(m_pDb)), "ok");
    EXPECT_EQ(Text(Inner.Rollback()), "ok");
    EXPECT_EQ(sqlite3_exec(m_pDb, "RELEASE vornjsondb", nullptr, nullptr, nullptr), SQLITE_ERROR);
    Run("COMMIT");
    EXPECT_EQ(Rows("SELECT id FROM task"), "1");
}

TEST_F(TransactionTest, NothingBeginsThatCouldNotBeUndone) {
    Options How;
    How.nStatements = 0;
    Open(kTasks, How);
    const auto fnNoRollback = [](void*, int nAction, const char* szWhat, const char*, const char*,
                                 const char*) {
        const bool blRollback = nAction == SQLITE_TRANSACTION && std::string(szWhat) == "ROLLBACK";
        return blRollback ? SQLITE_DENY : SQLITE_OK;
    };
    sqlite3_set_authorizer(m_pDb, fnNoRollback, nullptr);
    Json::Value jStored;
    EXPECT_EQ(Text(m_Table.Create(Parse(R"({"id": 1})"), &jStored)),
              "refused: cannot save a record in table \"task\": not authorized");
    Transaction All;
    EXPECT_EQ(Text(All.Begin(m_pDb)), "refused: cannot begin a transaction: not authorized");
    EXPECT_NE(sqlite3_get_autocommit(m_pDb), 0);
    EXPECT_EQ(Rows("SELECT count(*) FROM task"), "0");
}

}  // namespace

}  // namespace VORN_JSON_DB
