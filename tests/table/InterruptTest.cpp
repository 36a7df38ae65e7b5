// An interrupt lasts as long as any statement of the connection runs, and stops what would undo a
// transaction as well: what is told to be undone must be, all the same.

#include <cstring>
#include <functional>

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

class InterruptTest : public TableTest {
  protected:
    InterruptTest() {
        Open();
        Run("INSERT INTO task (id, name) VALUES (1, 'a'); CREATE TABLE other (x);"
            "INSERT INTO other VALUES (1)");
    }

    // What fnDo tells when it runs in a callback that reads another table, and the first statement
    // from then on that begins with szAt is interrupted.
    std::string InterruptAt(const char* szAt, const std::function<Status()>& fnDo) {
        Table Other;
        EXPECT_EQ(Text(Other.Open(m_pDb, "other", Json::Value())), "ok");
        m_szAt = szAt;
        std::string strText;
        const auto fnRow = [&](const Row&) {
            sqlite3_trace_v2(m_pDb, SQLITE_TRACE_STMT, Trace, this);
            strText = Text(fnDo());
            sqlite3_trace_v2(m_pDb, 0, nullptr, nullptr);
            return false;
        };
        EXPECT_EQ(Text(Other.ForEachRow(Query(), fnRow)), "ok");
        return strText;
    }

    // Also whether a transaction is open.
    std::string Ids() {
        const std::string strOpen = sqlite3_get_autocommit(m_pDb) == 0 ? "open: " : "";
        return strOpen + Rows("SELECT id, name FROM task ORDER BY id");
    }

    std::string Schema() {
        return Rows("SELECT sql FROM sqlite_schema WHERE name LIKE 'task%'") +
               (sqlite3_get_autocommit(m_pDb) == 0 ? " open" : "");
    }

    Status SaveOne(OnDuplicate eOnDuplicate) {
        Json::Value jStored;
        return m_Table.Save(Parse(R"({"id": 1, "name": "b"})"), eOnDuplicate, &jStored);
    }

    // A transaction with one record more, and its end.
    Status CreateAnd(Status (Transaction::*pfnEnd)()) {
        Transaction All;
        EXPECT_EQ(Text(All.Begin(m_pDb)), "ok");
        EXPECT_EQ(Text(m_Table.Create(Parse(R"({"id": 2})"))), "ok");
        return (All.*pfnEnd)();
    }

    // Calls fnDo again and again, and has it interrupted by a progress handler at its first call,
    // at its second and so on, until it ends before. fnAfter looks at how each ended.
    void InterruptEach(const std::function<void()>& fnBefore, const std::function<Status()>& fnDo,
                       const std::function<void(const Status&)>& fnAfter) {
        for (int nAt = 1, nLeft = 0; nLeft <= 0; ++nAt) {
            fnBefore();
            nLeft = nAt;
            sqlite3_progress_handler(m_pDb, 1, Count, &nLeft);
            const Status Outcome = fnDo();
            sqlite3_progress_handler(m_pDb, 0, nullptr, nullptr);
            fnAfter(Outcome);
        }
    }

  private:
    static int Count(void* pnLeft) { return --*static_cast<int*>(pnLeft) == 0 ? 1 : 0; }

    static int Trace(unsigned, void* pTest, void*, void* pSql) {
        auto* const pThis = static_cast<InterruptTest*>(pTest);
        if (std::strncmp(static_cast<const char*>(pSql), pThis->m_szAt,
                         std::strlen(pThis->m_szAt)) == 0) {
            sqlite3_interrupt(pThis->m_pDb);
        }
        return 0;
    }

    const char* m_szAt = "";
};

constexpr char kMade[] =
    R"({"made": {"key": "id", "member": {"id": {"cpptype": "int"}, "a": {"cpptype": "int"}}}})";
constexpr char kGrown[] = R"({"task": {"key": "id", "member": {"id": {"cpptype": "int"},
    "name": {"cpptype": "string", "unique": true}, "more": {"cpptype": "int"}}}})";

TEST_F(InterruptTest, CallIsUndone) {
    for (const char* szAt : {"SELECT", "COMMIT"}) {
        EXPECT_EQ(InterruptAt(szAt, [this] { return SaveOne(OnDuplicate::kUpsert); }),
                  "interrupted: cannot save a record in table \"task\": interrupted");
        EXPECT_EQ(Ids(), "1|a");
    }
}

TEST_F(InterruptTest, CallInATransactionUndoesAllOfIt) {
    for (const char* szAt : {"SELECT", "RELEASE"}) {
        Run("BEGIN; INSERT INTO task (id) VALUES (2)");
        EXPECT_EQ(InterruptAt(szAt, [this] { return SaveOne(OnDuplicate::kUpsert); }),
                  "interrupted: cannot save a record in table \"task\": interrupted; the "
                  "transaction is undone");
        EXPECT_EQ(Ids(), "1|a");
    }
}

TEST_F(InterruptTest, LeavingATransactionUndoesIt) {
    const auto fnLeave = [this] { return CreateAnd(&Transaction::Commit); };
    EXPECT_EQ(InterruptAt("COMMIT", fnLeave),
              "interrupted: cannot commit a transaction: interrupted");
    EXPECT_EQ(Ids(), "1|a");
    Run("BEGIN");
    EXPECT_EQ(InterruptAt("RELEASE", fnLeave),
              "interrupted: cannot commit a transaction: interrupted");
    EXPECT_EQ(Ids(), "1|a");
}

// All savepoints have one name, and the one around it would be undone.
TEST_F(InterruptTest, SavepointThatDoesNotBeginUndoesNone) {
    Transaction Outer, Inner;
    int nFailed = 0;
    InterruptEach(
        [&] {
            Run("BEGIN");
            EXPECT_EQ(Text(Outer.Begin(m_pDb)), "ok");
            Run("INSERT INTO task (id) VALUES (2)");
        },
        [&] { return Inner.Begin(m_pDb); },
        [&](const Status& Begun) {
            if (Begun.Ok()) {
                EXPECT_EQ(Text(Inner.Commit()), "ok");
            } else {
                ++nFailed;
            }
            EXPECT_EQ(Ids(), "open: 1|a;2|NULL");
            EXPECT_EQ(Text(Outer.Commit()), "ok");
            Run("ROLLBACK");
        });
    EXPECT_GT(nFailed, 0);
}

TEST_F(InterruptTest, RollbackThatIsInterruptedUndoesAll) {
    for (const char* szBefore : {"SELECT 1", "BEGIN"}) {
        Run(szBefore);
        EXPECT_EQ(InterruptAt("ROLLBACK", [this] { return CreateAnd(&Transaction::Rollback); }),
                  "interrupted: cannot roll a transaction back: interrupted; the transaction is "
                  "undone");
        EXPECT_EQ(Ids(), "1|a");
    }
}

// A progress handler is asked once more when a statement is done.
TEST_F(InterruptTest, WhatIsToldIsTrueWhereverAProgressHandlerStopsIt) {
    Transaction All;
    const auto fnReset = [this] { Run("UPDATE task SET name = 'a'"); };
    const auto fnBegin = [&] {
        fnReset();
        EXPECT_EQ(Text(All.Begin(m_pDb)), "ok");
        Run("UPDATE task SET name = 'b'");
    };
    const auto fnLook = [&](const Status& Outcome) {
        EXPECT_EQ(All.IsOpen() && Outcome.Ok(), false);
        if (All.IsOpen()) {
            EXPECT_EQ(Text(All.Rollback()), "ok");
        }
        EXPECT_EQ(Ids(), Outcome.Ok() ? "1|b" : "1|a") << Text(Outcome);
    };
    InterruptEach(
        fnReset, [this] { return SaveOne(OnDuplicate::kReplace); }, fnLook);
    InterruptEach(
        fnBegin, [&] { return All.Commit(); }, fnLook);
    InterruptEach(
        fnBegin, [&] { return All.Rollback(); },
        [this](const Status&) { EXPECT_EQ(Ids(), "1|a"); });
    InterruptEach([] {}, [&] { return All.Begin(m_pDb); },
                  [&](const Status& Outcome) {
                      EXPECT_EQ(All.IsOpen(), Outcome.Ok());
                      EXPECT_EQ(sqlite3_get_autocommit(m_pDb) == 0, Outcome.Ok());
                      Run(Outcome.Ok() ? "ROLLBACK" : "SELECT 1");
                      All.Rollback().Ignore();
                  });
}

// Nothing that a host may have denied is needed to undo a record.
TEST_F(InterruptTest, CallIsUndoneWithoutAPragma) {
    int nPragmas = 0;
    const auto fnDeny = [](void* pnPragmas, int nAction, const char*, const char*, const char*,
                           const char*) {
        const bool blPragma = nAction == SQLITE_PRAGMA;
        *static_cast<int*>(pnPragmas) += blPragma ? 1 : 0;
        return blPragma ? SQLITE_DENY : SQLITE_OK;
    };
    EXPECT_EQ(InterruptAt("COMMIT",
                          [&] {
                              sqlite3_set_authorizer(m_pDb, fnDeny, &nPragmas);
                              Status Outcome = SaveOne(OnDuplicate::kUpsert);
                              sqlite3_set_authorizer(m_pDb, nullptr, nullptr);
                              return Outcome;
                          }),
              "interrupted: cannot save a record in table \"task\": interrupted");
    EXPECT_EQ(Ids(), "1|a");
    EXPECT_EQ(nPragmas, 0);
}

// A schema that was changed is undone with the rest, and what SQLite knows of it, too.
TEST_F(InterruptTest, SchemaIsWholeOrAsItWas) {
    const std::string strBefore = Schema();
    const auto fnIndex = [this] { return m_Table.CreateIndex({"name"}, false); };
    const auto fnSync = [this] {
        Table Grown;
        const Status Opened = Grown.Open(m_pDb, "task", Parse(kGrown));
        SyncReport Report;
        return Opened.Ok() ? Grown.Sync(SyncMode::kChange, Report) : Opened;
    };
    struct Case {
        std::string strDo;
        std::function<Status()> fnDo;
        const char* szTakeBack;
    };
    const Case aCases[] = {{"create an index on", fnIndex, "DROP INDEX task_name"},
                           {"bring the definition into", fnSync,
                            "DROP INDEX task_name; ALTER TABLE task DROP COLUMN more"}};
    for (const Case& Each : aCases) {
        const std::string strTold =
            "interrupted: cannot " + Each.strDo + " table \"task\": interrupted";
        for (const char* szAt : {"BEGIN", "CREATE", "COMMIT"}) {
            EXPECT_EQ(InterruptAt(szAt, Each.fnDo), strTold) << szAt;
            EXPECT_EQ(Schema(), strBefore) << szAt;
        }
        for (const char* szAt : {"CREATE", "RELEASE"}) {
            Run("BEGIN; INSERT INTO task (id) VALUES (2)");
            EXPECT_EQ(InterruptAt(szAt, Each.fnDo), strTold + "; the transaction is undone")
                << szAt;
            EXPECT_EQ(Schema(), strBefore) << szAt;
            EXPECT_EQ(Ids(), "1|a") << szAt;
        }
        InterruptEach([] {}, Each.fnDo,
                      [&](const Status& Outcome) {
                          Run(Outcome.Ok() ? Each.szTakeBack : "SELECT 1");
                          EXPECT_EQ(Schema(), strBefore) << Text(Outcome);
                      });
    }
}

// Whatever was not read to its end is not taken for all that there is.
TEST_F(InterruptTest, OpeningIsToldAsInterruptedWhereverItIs) {
    Options How;
    How.blCreateTable = true;
    Table Made;
    InterruptEach(
        [&] {
            Made = Table();
            Run("DROP TABLE IF EXISTS made");
        },
        [&] { return Made.Open(m_pDb, "made", Parse(kMade), How); },
        [&](const Status& Outcome) {
            EXPECT_EQ(Text(Outcome),
                      Outcome.Ok() ? "ok" : "interrupted: cannot open table \"made\": interrupted");
            EXPECT_EQ(sqlite3_get_autocommit(m_pDb), 1);
        });
    EXPECT_EQ(Made.KeyMembers(), std::vector<std::string>{"id"});
}

TEST_F(InterruptTest, LoadIsUndone) {
    const auto fnLoad = [this] {
        Loader Into;
        EXPECT_EQ(Text(Into.Start(m_Table)), "ok");
        EXPECT_EQ(Text(Into.Add(Parse(R"({"id": 2})"))), "ok");
        return Into.Commit();
    };
    EXPECT_EQ(InterruptAt("COMMIT", fnLoad),
              "interrupted: cannot load records into table \"task\": cannot commit a transaction: "
              "interrupted");
    EXPECT_EQ(Ids(), "1|a");
    Run("BEGIN; INSERT INTO task (id) VALUES (3)");
    EXPECT_EQ(InterruptAt("RELEASE", fnLoad),
              "interrupted: cannot load records into table \"task\": cannot commit a transaction: "
              "interrupted; the transaction is undone");
    EXPECT_EQ(Ids(), "1|a");
}

}  // namespace

}  // namespace VORN_JSON_DB
