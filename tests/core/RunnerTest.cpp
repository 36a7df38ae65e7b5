// runSqlEx without a lock in the way: results, error texts, log lines.
#include <cerrno>

#include "../support/TableTest.h"

using namespace testhost;

namespace {

int StopAtFirstRow(void*, int, char**, char**) {
    return 1;
}

class RunnerTest : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        Sql("INSERT INTO t VALUES (1, 'a'), (2, 'b'), (3, 'c')");
        // A statement that changes nothing by its kind returns the count of the one before it.
        Sql("DELETE FROM t WHERE 0");
    }
};

}  // namespace

TEST_F(RunnerTest, EmptyStatementIsRefusedWithoutCallingSqlite) {
    EXPECT_EQ(m_pHandle->runSqlEx(""), -1);
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(TakeLog(), (Lines{Check("0 >= strSql.length()"), RunFailed("Unknow Error!!", "")}));
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "Unknow Error!!");
}

TEST_F(RunnerTest, EmptyStatementReplacesAnEarlierErrorText) {
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(m_pHandle->runSqlEx(""), -1);
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "Unknow Error!!");
}

TEST_F(RunnerTest, EmptyStatementKeepsAnEarlierErrorTextUntilItFails) {
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    std::string strAtTheCheck = "no line";
    OnNextLine([&] { strAtTheCheck = SqlErrorOf(*m_pHandle); });
    EXPECT_EQ(m_pHandle->runSqlEx(""), -1);
    EXPECT_EQ(strAtTheCheck, "near \"nonsense\": syntax error");
}

TEST_F(RunnerTest, EmptyStatementShowsErrnoAsItStands) {
    errno = ENOENT;
    EXPECT_EQ(m_pHandle->runSqlEx(""), -1);
    EXPECT_EQ(TakeLog(),
              (Lines{Check("0 >= strSql.length()"), RunFailed("Unknow Error!!", "", ENOENT)}));
}

TEST_F(RunnerTest, EmptyStatementWritesTheDebugLineWithoutAText) {
    blDebugOutput = true;
    EXPECT_EQ(m_pHandle->runSqlEx(""), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check("0 >= strSql.length()"), RunFailed("Unknow Error!!", ""),
                                Plain("run sql fail, err=(null)")}));
}

TEST_F(RunnerTest, UpdateOrDeleteThatMatchesNothingReturnsZero) {
    EXPECT_EQ(m_pHandle->runSqlEx("UPDATE t SET name = 'x' WHERE id = 99"), 0);
    EXPECT_EQ(m_pHandle->runSqlEx("DELETE FROM t WHERE id = 99"), 0);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RunnerTest, ResultWithoutCallbackIsTheNumberOfChangedRows) {
    EXPECT_EQ(m_pHandle->runSqlEx("UPDATE t SET name = 'x' WHERE id > 1"), 2);
    EXPECT_EQ(m_pHandle->runSqlEx("DELETE FROM t"), 3);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RunnerTest, ResultOfSeveralStatementsIsTheCountOfTheLastThatChangedRows) {
    const std::string strDelete = "DELETE FROM t";
    EXPECT_EQ(m_pHandle->runSqlEx(strDelete + " WHERE id < 3; " + strDelete + "; SELECT 1"), 1);
    EXPECT_EQ(Count(), "0");
}

TEST_F(RunnerTest, StatementThatCannotChangeRowsReturnsTheCountBeforeIt) {
    EXPECT_EQ(m_pHandle->runSqlEx("UPDATE t SET name = 'x' WHERE id > 1"), 2);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT * FROM t"), 2);
}

TEST_F(RunnerTest, ResultWithCallbackIsZeroHoweverManyRowsCame) {
    int nRows = 0;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT * FROM t", CountRows, &nRows), 0);
    EXPECT_EQ(nRows, 3);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1 WHERE 0", CountRows, &nRows), 0);
    EXPECT_EQ(nRows, 3);
    EXPECT_EQ(m_pHandle->runSqlEx("DELETE FROM t", CountRows, &nRows), 0);
    EXPECT_EQ(Count(), "0");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RunnerTest, CallbackIsHandedOnUnchanged) {
    int nRows = 0;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1", CountRows, &nRows), 0);
    EXPECT_EQ(LastRowCallback(), &CountRows);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(LastRowCallback(), nullptr);
}

TEST_F(RunnerTest, TextIsHandedOverUnchanged) {
    const std::string strSql = "  select 1 ;; -- 100% \n ; select 'it''s' ; ";
    EXPECT_EQ(m_pHandle->runSqlEx(strSql), 0);
    EXPECT_EQ(TakeSql(), (Lines{strSql}));
}

TEST_F(RunnerTest, SyntaxErrorIsNotRetried) {
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(TakeSql(), (Lines{"nonsense"}));
    EXPECT_EQ(TakePauses(), std::vector<unsigned>());
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("near \"nonsense\": syntax error", "nonsense")}));
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "near \"nonsense\": syntax error");
}

TEST_F(RunnerTest, FailureWithDebugFlagAddsTheRawErrorText) {
    blDebugOutput = true;
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("near \"nonsense\": syntax error", "nonsense"),
                                Plain("run sql fail, err=near \"nonsense\": syntax error")}));
}

TEST_F(RunnerTest, FailureWithCallbackIsReportedTheSameWay) {
    int nRows = 0;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT * FROM nowhere", CountRows, &nRows), -1);
    EXPECT_EQ(nRows, 0);
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("no such table: nowhere", "SELECT * FROM nowhere")}));
}

TEST_F(RunnerTest, SuccessEmptiesAnEarlierErrorText) {
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "");
    int nRows = 0;
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1", CountRows, &nRows), 0);
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "");
}

TEST_F(RunnerTest, EarlierErrorTextIsGoneBeforeTheFirstAttempt) {
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    std::string strDuringCall = "hook was not called";
    OnExec([&](int) { strDuringCall = SqlErrorOf(*m_pHandle); });
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(strDuringCall, "");
}

TEST_F(RunnerTest, ErrorTextsOfTwoHandlesAreApart) {
    const auto pSecond = NewHandle(m_pDb, "t", m_jDefinition, "SELECT 1");
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(pSecond->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "near \"nonsense\": syntax error");
    EXPECT_EQ(SqlErrorOf(*pSecond), "");
}

TEST_F(RunnerTest, FailureWithoutATextIsAnUnknownError) {
    FailNextExec({{SQLITE_IOERR, nullptr, ENOENT}});
    blDebugOutput = true;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    EXPECT_EQ(TakeSql(), (Lines{"SELECT 1"}));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("Unknow Error!!", "SELECT 1", ENOENT),
                                Plain("run sql fail, err=(null)")}));
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "Unknow Error!!");
}

TEST_F(RunnerTest, NullConnectionFailsOnceWithAnUnknownError) {
    const auto pHandle = NewHandle(nullptr, "t", m_jDefinition, "SELECT 1");
    TakeLog();
    TakeSql();
    EXPECT_EQ(pHandle->runSqlEx("SELECT 2"), -1);
    EXPECT_EQ(TakeSql(), (Lines{"SELECT 2"}));
    EXPECT_EQ(TakePauses(), std::vector<unsigned>());
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("Unknow Error!!", "SELECT 2")}));
    EXPECT_EQ(SqlErrorOf(*pHandle), "Unknow Error!!");
}

TEST_F(RunnerTest, TextThatComesWithSuccessIsDropped) {
    FailNextExec({{SQLITE_OK, "some advice", 0}, {SQLITE_OK, "some advice", 0}});
    int nRows = 0;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "");
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1", CountRows, &nRows), 0);
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RunnerTest, NegativeChangeCountIsAFailureAndTheResult) {
    FakeNextChanges(-5);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -5);
    EXPECT_EQ(TakeSql(), (Lines{"SELECT 1"}));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("Unknow Error!!", "SELECT 1")}));
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "Unknow Error!!");
}

TEST_F(RunnerTest, ChangesAreNotCountedForACallback) {
    int nRows = 0;
    FakeNextChanges(-5);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1", CountRows, &nRows), 0);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RunnerTest, ErrnoFromBeforeTheCallIsCleared) {
    errno = EAGAIN;
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(TakeSql(), (Lines{"nonsense"}));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("near \"nonsense\": syntax error", "nonsense")}));
}

TEST_F(RunnerTest, ErrnoOfTheFailedCallIsShown) {
    FailNextExec({{SQLITE_CANTOPEN, "unable to open database file", EACCES}});
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("unable to open database file", "SELECT 1", EACCES)}));
}

TEST_F(RunnerTest, CallbackThatStopsFailsTheStatementWithoutRetry) {
    const std::string strSql = "SELECT * FROM t";
    EXPECT_EQ(m_pHandle->runSqlEx(strSql, StopAtFirstRow), -1);
    EXPECT_EQ(TakeSql(), (Lines{strSql}));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed(sqlite3_errstr(SQLITE_ABORT), strSql)}));
    EXPECT_EQ(SqlErrorOf(*m_pHandle), sqlite3_errstr(SQLITE_ABORT));
}

TEST_F(RunnerTest, StatementsBeforeAFailingOneKeepTheirEffect) {
    const std::string strSql = "DELETE FROM t WHERE id = 1; nonsense; DELETE FROM t";
    EXPECT_EQ(m_pHandle->runSqlEx(strSql), -1);
    EXPECT_EQ(Rows("SELECT id FROM t"), "2\n3");
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("near \"nonsense\": syntax error", strSql)}));
}

TEST_F(RunnerTest, TransactionsAreTheCallersOwn) {
    EXPECT_EQ(m_pHandle->runSqlEx("BEGIN"), 0);
    EXPECT_EQ(m_pHandle->runSqlEx("DELETE FROM t"), 3);
    EXPECT_EQ(m_pHandle->runSqlEx("ROLLBACK"), 3);
    EXPECT_EQ(Count(), "3");
}

TEST_F(RunnerTest, RowsAreReadWithTheTypesOfTheHandleThatAsked) {
    const auto pOther = NewHandle(m_pDb, "u", Definition("u", "id:string"), "CREATE TABLE u (id)");
    Sql("INSERT INTO u VALUES (7)");
    Json::Value jNoQuery;
    Json::Value jFirst;
    Json::Value jOther;
    EXPECT_EQ(pOther->recList(jNoQuery, jOther), 0);
    EXPECT_EQ(m_pHandle->recList(jNoQuery, jFirst), 0);
    EXPECT_EQ(pOther->recList(jNoQuery, jOther), 0);
    EXPECT_EQ(Compact(jFirst[0]), R"({"id":1,"name":"a"})");
    EXPECT_EQ(Compact(jOther), R"([{"id":"7"},{"id":"7"}])");
    EXPECT_EQ(TakeLog(), Lines());
}
