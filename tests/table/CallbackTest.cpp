// What SQLite calls in the middle of a call, functions and hooks of the program, and what calls the
// same Table from there.

#include <functional>
#include <utility>

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

constexpr char kNotReturned[] = "another call on it has not returned";

class CallbackTest : public TableTest {
  protected:
    CallbackTest() {
        Open();
        EXPECT_EQ(
            sqlite3_create_function(m_pDb, "again", 0, SQLITE_UTF8, this, Again, nullptr, nullptr),
            SQLITE_OK);
        Run("INSERT INTO task (id, name, done) VALUES (1, 'a', NULL), (2, 'b', NULL);"
            "CREATE TRIGGER ins BEFORE INSERT ON task BEGIN SELECT again(); END;"
            "CREATE TRIGGER upd BEFORE UPDATE ON task BEGIN SELECT again(); END;"
            "CREATE TRIGGER del BEFORE DELETE ON task BEGIN SELECT again(); END");
    }

    // Every call that runs SQL, each with its outcome; they must leave no trace.
    std::string CallAll() {
        Json::Value jOut;
        bool blExists = false;
        std::int64_t nRows = 0;
        FindingList vecFindings;
        SyncReport Report;
        Plan Found;
        const Query Which = Query().Where("name", Op::kNotEqual, std::string(100, 'x'));
        const Json::Value jRecord = Parse(R"({"id": 7, "name": "inner, long enough for memory"})");
        const auto fnRecord = [](const Json::Value&) { return true; };
        const auto fnRow = [](const Row&) { return true; };
        const Status aOutcomes[] = {
            m_Table.Create(jRecord, &jOut),
            m_Table.Save(jRecord, OnDuplicate::kUpsert),
            m_Table.Get(7, jOut),
            m_Table.First(Which, jOut),
            m_Table.List(Which, jOut),
            m_Table.Count(Which, nRows),
            m_Table.Exists(Which, blExists),
            m_Table.ForEach(Which, fnRecord),
            m_Table.ForEachRow(Which, fnRow),
            m_Table.Update(Which, jRecord),
            m_Table.Remove(Which),
            m_Table.RemoveAll(),
            m_Table.Lint(vecFindings),
            m_Table.Sync(SyncMode::kChange, Report),
            m_Table.Sync(SyncMode::kLook, Report),
            m_Table.CreateIndex({"name"}, false),
            m_Table.Explain(Which, Found),
            m_Table.ExplainSql("SELECT 1", Found),
            m_Table.ToOldQuery(Which, OldCall::kRead, jOut),
            m_Table.Open(m_pDb, "task", Parse(kTasks)),
            m_Load.Start(m_Table),
        };
        std::string strText;
        for (const Status& Each : aOutcomes) {
            strText += Text(Each) + "\n";
        }
        EXPECT_EQ(jOut, Json::Value());
        return strText;
    }

    static std::string Refused(const std::string& strWhy) {
        std::string strText;
        for (const char* szDo : {"save a record in",
                                 "save a record in",
                                 "get a record from",
                                 "get a record from",
                                 "list records of",
                                 "count records of",
                                 "look for records of",
                                 "read records of",
                                 "read records of",
                                 "update records of",
                                 "remove records from",
                                 "remove all records from",
                                 "compare the definition with",
                                 "bring the definition into",
                                 "bring the definition into",
                                 "create an index on",
                                 "explain a query of",
                                 "explain a statement on",
                                 "write an old query for",
                                 "open anew",
                                 "load records into"}) {
            strText += std::string("misuse: cannot ") + szDo + " table \"task\": " + strWhy + "\n";
        }
        return strText;
    }

    // What fnOuter gives when each trigger calls fnInner.
    std::string With(const std::function<void()>& fnInner,
                     const std::function<std::string()>& fnOuter) {
        m_fnInner = fnInner;
        m_nCalls = 0;
        std::string strOuter = fnOuter();
        m_fnInner = nullptr;
        EXPECT_GT(m_nCalls, 0);
        return strOuter;
    }

    std::string WithAll(const std::function<std::string()>& fnOuter) {
        return With([this] { EXPECT_EQ(CallAll(), Refused(kNotReturned)); }, fnOuter);
    }

    // The same for what only reads: called by SQLite as it prepares a statement and runs it.
    std::string WithAllInReading(const std::function<std::string()>& fnOuter) {
        sqlite3_set_authorizer(m_pDb, Authorize, this);
        sqlite3_progress_handler(m_pDb, 1, Progress, this);
        std::string strOuter = WithAll(fnOuter);
        sqlite3_set_authorizer(m_pDb, nullptr, nullptr);
        sqlite3_progress_handler(m_pDb, 0, nullptr, nullptr);
        return strOuter;
    }

    void CallInner() {
        ++m_nCalls;
        const std::function<void()> fnInner = std::exchange(m_fnInner, nullptr);
        if (fnInner) {
            fnInner();
            m_fnInner = fnInner;
        }
    }

    std::string Ids() { return Rows("SELECT id, name FROM task ORDER BY id"); }

    Loader m_Load;

    static void Again(sqlite3_context* pContext, int, sqlite3_value**) {
        static_cast<CallbackTest*>(sqlite3_user_data(pContext))->CallInner();
    }
    static int Authorize(void* pThis, int, const char*, const char*, const char*, const char*) {
        static_cast<CallbackTest*>(pThis)->CallInner();
        return SQLITE_OK;
    }
    static int Commit(void* pThis) {
        static_cast<CallbackTest*>(pThis)->CallInner();
        return 0;
    }

  private:
    static int Progress(void* pThis) {
        static_cast<CallbackTest*>(pThis)->CallInner();
        return 0;
    }

    std::function<void()> m_fnInner;
    int m_nCalls = 0;
};

TEST_F(CallbackTest, CallInTheMiddleOfAChangeDoesNothing) {
    EXPECT_EQ(WithAll([this] { return Create(R"({"id": 3, "name": "outer, no short text"})"); }),
              R"({"done":false,"id":3,"name":"outer, no short text"})");
    EXPECT_EQ(WithAll([this] {
                  return Save(R"({"id": 3, "name": "upserted, no short text"})",
                              OnDuplicate::kUpsert);
              }),
              R"(updated {"done":false,"id":3,"name":"upserted, no short text"})");
    EXPECT_EQ(WithAll([this] {
                  std::int64_t nRows = 0;
                  const Status Outcome =
                      m_Table.Update(Query().Where("id", Op::kGreater, 1),
                                     Parse(R"({"name": "updated, no short text"})"), &nRows);
                  return Text(Outcome) + " " + std::to_string(nRows);
              }),
              "ok 2");
    EXPECT_EQ(Ids(), "1|a;2|updated, no short text;3|updated, no short text");
    EXPECT_EQ(WithAll([this] { return Text(m_Table.Remove(Query().Where("id", 1))); }), "ok");
    EXPECT_EQ(WithAll([this] { return Text(m_Table.RemoveAll()); }), "ok");
    EXPECT_EQ(Ids(), "");
}

TEST_F(CallbackTest, CallInTheMiddleOfReadingDoesNothing) {
    const Query Second = Query().Where("name", std::string("b"));
    EXPECT_EQ(WithAllInReading([this] { return Get(R"({"id": 2})"); }), R"({"id":2,"name":"b"})");
    EXPECT_EQ(WithAllInReading([&] {
                  Json::Value jOut;
                  const Status Outcome = m_Table.First(Second, jOut);
                  return Text(Outcome) + " " + Text(jOut);
              }),
              R"(ok {"id":2,"name":"b"})");
    EXPECT_EQ(WithAllInReading([&] {
                  Json::Value jOut;
                  const Status Outcome = m_Table.List(Second, jOut);
                  return Text(Outcome) + " " + Text(jOut);
              }),
              R"(ok [{"id":2,"name":"b"}])");
    EXPECT_EQ(WithAllInReading([&] {
                  std::int64_t nRows = 0;
                  const Status Outcome = m_Table.Count(Second, nRows);
                  return Text(Outcome) + " " + std::to_string(nRows);
              }),
              "ok 1");
    EXPECT_EQ(WithAllInReading([&] {
                  bool blExists = false;
                  const Status Outcome = m_Table.Exists(Second, blExists);
                  return Text(Outcome) + " " + std::to_string(blExists);
              }),
              "ok 1");
}

// A callback of the table's own, around which SQLite does nothing, may read; what SQLite calls
// between two of them may not.
TEST_F(CallbackTest, CallbackOfForEachReadsAndWhatSqliteCallsDoesNot) {
    std::string strSeen;
    const auto fnOuter = [&] {
        return Text(m_Table.ForEach(Query().Sort("id"), [&](const Json::Value& jRecord) {
            strSeen += Text(jRecord) + Get(Text(jRecord["id"])) + " ";
            EXPECT_EQ(Text(m_Table.Remove(Query().Where("id", 1))),
                      "misuse: cannot remove records from table \"task\": a callback is reading "
                      "from it");
            return true;
        }));
    };
    EXPECT_EQ(WithAllInReading(fnOuter), "ok");
    EXPECT_EQ(strSeen,
              R"({"id":1,"name":"a"}{"id":1,"name":"a"} {"id":2,"name":"b"}{"id":2,"name":"b"} )");
}

TEST_F(CallbackTest, TableMayBeMovedAndDestroyedWhereItIsRead) {
    Table Other;
    std::string strSeen;
    EXPECT_EQ(Text(m_Table.ForEach(Query().Sort("id"),
                                   [&](const Json::Value& jRecord) {
                                       strSeen += Text(jRecord);
                                       std::swap(Other, m_Table);
                                       return true;
                                   })),
              "ok");
    EXPECT_EQ(Text(m_Table.ForEachRow(Query().Sort("id"),
                                      [&](const Row& Each) {
                                          m_Table = Table();
                                          strSeen += Each.Name(2) + " " + std::string(Each.Text(2));
                                          return true;
                                      })),
              "ok");
    EXPECT_EQ(strSeen, R"({"id":1,"name":"a"}{"id":2,"name":"b"}name aname b)");
    EXPECT_EQ(Text(m_Table.RemoveAll()),
              "misuse: cannot remove all records from: the table is not open");
}

TEST_F(CallbackTest, LoaderGoesOnWithoutItsTable) {
    EXPECT_EQ(Text(m_Load.Start(m_Table, {OnDuplicate::kReplace})), "ok");
    EXPECT_EQ(Text(m_Load.Add(Parse(R"({"id": 3, "name": "c"})"))), "ok");
    Table Other = std::move(m_Table);
    EXPECT_EQ(Text(m_Load.Add(Parse(R"({"id": 4, "name": "d"})"))), "ok");
    EXPECT_EQ(Text(Other.Open(m_pDb, "none", Parse(kTasks))).substr(0, 8), "refused:");
    EXPECT_EQ(Text(m_Load.Add(Parse(R"({"id": 4, "name": "e"})"))), "ok");
    EXPECT_EQ(Text(m_Load.Commit()), "ok");
    EXPECT_EQ(Ids(), "1|a;2|b;3|c;4|e");
}

TEST_F(CallbackTest, LoaderThatHasCommittedGoesOnWhereItsTableBecameAnother) {
    EXPECT_EQ(Text(m_Load.Start(m_Table)), "ok");
    EXPECT_EQ(Text(m_Load.Add(Parse(R"({"id": 3, "name": "c"})"))), "ok");
    EXPECT_EQ(Text(m_Load.Commit()), "ok");
    EXPECT_EQ(Text(m_Table.Open(m_pDb, "task", Json::Value())), "ok");
    EXPECT_EQ(Text(m_Load.Add(Parse(R"({"id": 4, "name": "d"})"))), "ok");
    EXPECT_EQ(Text(m_Load.Commit()), "ok");
    EXPECT_EQ(Text(m_Load.Start(m_Table)), "ok");
    EXPECT_EQ(Ids(), "1|a;2|b;3|c;4|d");
}

// The parameter alone is enough: no row is looked at.
TEST_F(CallbackTest, WithoutACallbackNothingIsRead) {
    EXPECT_EQ(Text(m_Table.ForEach(Query(), nullptr)),
              "misuse: cannot read records of table \"task\": there is no callback");
    EXPECT_EQ(Text(m_Table.ForEachRow(Query().Where("nosuch", 1), nullptr)),
              "misuse: cannot read records of table \"task\": there is no callback");
}

TEST_F(CallbackTest, CallbackThatThrowsEndsItsCall) {
    try {
        m_Table.ForEach(Query(), [](const Json::Value&) -> bool { throw 1; }).Ignore();
        ADD_FAILURE();
    } catch (int) {
    }
    EXPECT_EQ(Create(R"({"id": 3})"), R"({"done":false,"id":3})");
}

// Also from its own call, and by what would give the record that is being written other values.
TEST_F(CallbackTest, LoaderInTheMiddleOfACallDoesNothing) {
    constexpr char kRefused[] =
        "misuse: cannot load records into table \"task\": another call on it has not returned";
    EXPECT_EQ(Text(m_Load.Start(m_Table)), "ok");
    const int nName = m_Load.MemberIndex("name");
    const auto fnInner = [&] {
        m_Load.SetText(nName, "inner, long enough for memory of its own");
        m_Load.SetNull(m_Load.MemberIndex("id"));
        m_Load.SetJson(nName, "\"inner\"");
        m_Load.Reject("inner");
        EXPECT_EQ(Text(m_Load.EndRecord()), kRefused);
        EXPECT_EQ(Text(m_Load.Add(Parse(R"({"id": 9})"))), kRefused);
        EXPECT_EQ(Text(m_Load.Commit()), kRefused);
        EXPECT_EQ(Text(m_Load.Start(m_Table)), kRefused);
        Json::Value jOut;
        EXPECT_EQ(m_Table.Get(1, jOut).Code(), StatusCode::kMisuse);
    };
    EXPECT_EQ(With(fnInner,
                   [&] {
                       m_Load.SetInteger(m_Load.MemberIndex("id"), 3);
                       m_Load.SetText(nName, "outer, long enough for memory of its own");
                       return Text(m_Load.EndRecord());
                   }),
              "ok");
    EXPECT_EQ(With(fnInner, [&] { return Text(m_Load.Add(Parse(R"({"id": 4, "name": "c"})"))); }),
              "ok");
    sqlite3_commit_hook(m_pDb, Commit, this);
    EXPECT_EQ(With(fnInner, [&] { return Text(m_Load.Commit()); }), "ok");
    sqlite3_commit_hook(m_pDb, nullptr, nullptr);
    EXPECT_EQ(m_Load.Counts().nInserted, 2);
    EXPECT_EQ(Ids(), "1|a;2|b;3|outer, long enough for memory of its own;4|c");
}

// Their values are their own.
TEST_F(CallbackTest, OtherLoaderCanBeGivenValuesInTheMiddleOfACall) {
    EXPECT_EQ(Text(m_Load.Start(m_Table)), "ok");
    const auto fnInner = [&] {
        m_Load.SetInteger(m_Load.MemberIndex("id"), 4);
        m_Load.SetText(m_Load.MemberIndex("name"), "inner");
    };
    EXPECT_EQ(With(fnInner, [&] { return Create(R"({"id": 3, "name": "outer"})"); }),
              R"({"done":false,"id":3,"name":"outer"})");
    EXPECT_EQ(Text(m_Load.EndRecord()), "ok");
    EXPECT_EQ(Text(m_Load.Commit()), "ok");
    EXPECT_EQ(Ids(), "1|a;2|b;3|outer;4|inner");
}

}  // namespace

}  // namespace VORN_JSON_DB
