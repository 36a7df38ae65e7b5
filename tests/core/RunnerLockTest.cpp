// runSqlEx while another connection holds the database: attempts, pauses, what a retry repeats.
#include <cerrno>

#include "../support/LockHolder.h"
#include "../support/TableTest.h"

using namespace testhost;

namespace {

constexpr size_t kAttempts = 500;
const char* const kLockText = "database is locked";

std::string RetryLine(size_t nAttempt, int nErrno, const std::string& strError,
                      const std::string& strSql) {
    return Plain("retry, i=" + std::to_string(nAttempt) + ", errno=" + std::to_string(nErrno) +
                 ", run sql failed, error=" + strError + ", sql=" + strSql);
}

std::vector<unsigned> Pauses(size_t nCount) {
    return std::vector<unsigned>(nCount, 10000U);
}

void LockNextExec(size_t nTimes, const char* szError = kLockText, int nErrno = 0) {
    FailNextExec(std::vector<ExecFault>(nTimes, ExecFault{SQLITE_BUSY, szError, nErrno}));
}

int StopWithEagain(void* pArg, int, char**, char**) {
    ++*static_cast<int*>(pArg);
    errno = EAGAIN;
    return 1;
}

using RunnerLockTest = TableTest;

// m_pHandle's connection has the file m_strPath attached as f, with the empty table f.stored.
class RunnerFileLockTest : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        m_strPath = TempFile("locked.db");
        Sql("ATTACH '" + m_strPath + "' AS f");
        Sql("CREATE TABLE f.stored (x)");
    }

    std::string m_strPath;
    std::string m_strInsert = "INSERT INTO f.stored VALUES (1)";
};

}  // namespace

TEST_F(RunnerLockTest, GivesUpAfterFiveHundredAttemptsEachFollowedByAPause) {
    LockNextExec(kAttempts + 100);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    EXPECT_EQ(TakeSql(), Lines(kAttempts, "SELECT 1"));
    EXPECT_EQ(TakePauses(), Pauses(kAttempts));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed(kLockText, "SELECT 1", 0, 500)}));
    EXPECT_EQ(SqlErrorOf(*m_pHandle), kLockText);
}

TEST_F(RunnerLockTest, GivingUpWithDebugFlagShowsEveryRetry) {
    blDebugOutput = true;
    LockNextExec(kAttempts, kLockText, EAGAIN);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    Lines vecExpected;
    for (size_t i = 0; i < kAttempts; ++i) {
        vecExpected.push_back(RetryLine(i, EAGAIN, kLockText, "SELECT 1"));
    }
    vecExpected.push_back(RunFailed(kLockText, "SELECT 1", EAGAIN, 500));
    vecExpected.push_back(Plain("run sql fail, err=database is locked"));
    EXPECT_EQ(TakeLog(), vecExpected);
}

TEST_F(RunnerLockTest, PauseComesAfterItsRetryLineAndBeforeTheNextAttempt) {
    Lines vecEvents;
    blDebugOutput = true;
    LockNextExec(2);
    OnExec([&](int) { vecEvents.push_back("attempt"); });
    OnPause([&](int) {
        for (const std::string& strLine : TakeLog()) {
            vecEvents.push_back(strLine);
        }
        vecEvents.push_back("pause");
    });
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(vecEvents,
              (Lines{"attempt", RetryLine(0, 0, kLockText, "SELECT 1"), "pause", "attempt",
                     RetryLine(1, 0, kLockText, "SELECT 1"), "pause", "attempt"}));
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RunnerLockTest, ClearedLockGivesTheSuccessResultAndLogsNothing) {
    Sql("INSERT INTO t VALUES (1, 'a'), (2, 'b')");
    LockNextExec(3);
    EXPECT_EQ(m_pHandle->runSqlEx("DELETE FROM t"), 2);
    EXPECT_EQ(TakeSql(), Lines(4, "DELETE FROM t"));
    EXPECT_EQ(TakePauses(), Pauses(3));
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "");
}

TEST_F(RunnerLockTest, ClearedLockWithCallbackReturnsZero) {
    int nRows = 0;
    LockNextExec(3);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1", CountRows, &nRows), 0);
    EXPECT_EQ(nRows, 1);
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "");
}

TEST_F(RunnerLockTest, LastAttemptMayStillSucceed) {
    LockNextExec(kAttempts - 1);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(TakeSql().size(), kAttempts);
    EXPECT_EQ(TakePauses(), Pauses(kAttempts - 1));
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RunnerLockTest, OtherErrorDuringRetriesEndsThemWithItsOwnTextAndCount) {
    FailNextExec({{SQLITE_BUSY, kLockText, EAGAIN},
                  {SQLITE_BUSY, kLockText, EAGAIN},
                  {SQLITE_FULL, "database or disk is full", ENOSPC}});
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    EXPECT_EQ(TakeSql().size(), 3U);
    EXPECT_EQ(TakePauses(), Pauses(2));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("database or disk is full", "SELECT 1", ENOSPC, 2)}));
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "database or disk is full");
}

TEST_F(RunnerLockTest, FailureWithoutATextDuringRetriesIsAnUnknownError) {
    FailNextExec({{SQLITE_BUSY, kLockText, 0}, {SQLITE_IOERR, nullptr, 0}});
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("Unknow Error!!", "SELECT 1", 0, 1)}));
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "Unknow Error!!");
}

TEST_F(RunnerLockTest, LockTextIsFoundInsideALongerText) {
    LockNextExec(1, "f.db: database is locked (5)");
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(TakePauses(), Pauses(1));
}

TEST_F(RunnerLockTest, TextsThatOnlyResembleTheLockTextAreNotRetried) {
    for (const char* szError : {"database table is locked", "Database is locked",
                                "database is locke", "database  is locked", ""}) {
        LockNextExec(1, szError);
        EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1) << szError;
        EXPECT_EQ(TakeSql().size(), 1U) << szError;
        EXPECT_EQ(TakePauses(), Pauses(0)) << szError;
        EXPECT_EQ(TakeLog(), (Lines{RunFailed(szError, "SELECT 1", 0, 0)})) << szError;
    }
}

TEST_F(RunnerLockTest, ResultCodeDoesNotDecideOnRetry) {
    FailNextExec({{SQLITE_ERROR, kLockText, 0}, {SQLITE_BUSY, "busy", 0}});
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    EXPECT_EQ(TakeSql().size(), 2U);
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("busy", "SELECT 1", 0, 1)}));
}

TEST_F(RunnerLockTest, EagainCountsAsLockedWhateverTheText) {
    LockNextExec(2, "disk I/O error", EAGAIN);
    blDebugOutput = true;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(TakePauses(), Pauses(2));
    EXPECT_EQ(TakeLog(), (Lines{RetryLine(0, EAGAIN, "disk I/O error", "SELECT 1"),
                                RetryLine(1, EAGAIN, "disk I/O error", "SELECT 1")}));
}

TEST_F(RunnerLockTest, EagainHasTheSameLimit) {
    LockNextExec(kAttempts, "disk I/O error", EAGAIN);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    EXPECT_EQ(TakeSql().size(), kAttempts);
    EXPECT_EQ(TakePauses(), Pauses(kAttempts));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("disk I/O error", "SELECT 1", EAGAIN, 500)}));
}

TEST_F(RunnerLockTest, EagainOfOneAttemptIsClearedBeforeTheNext) {
    FailNextExec({{SQLITE_BUSY, kLockText, EAGAIN}});
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(TakeSql(), Lines(2, "nonsense"));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("near \"nonsense\": syntax error", "nonsense", 0, 1)}));
}

TEST_F(RunnerLockTest, ErrnoThatAFreeLeavesDoesNotDecideOnTheRetry) {
    OnFree([] { errno = EAGAIN; });
    FailNextExec({{SQLITE_BUSY, kLockText, 0}, {SQLITE_IOERR, "disk I/O error", ENOSPC}});
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    EXPECT_EQ(TakePauses(), Pauses(1));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("disk I/O error", "SELECT 1", ENOSPC, 1)}));
    // A statement that leaves errno as it finds it.
    LockNextExec(1);
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("near \"nonsense\": syntax error", "nonsense", 0, 1)}));
}

TEST_F(RunnerLockTest, FailureWithoutATextIsNoLockWhateverErrnoHolds) {
    FailNextExec({{SQLITE_BUSY, nullptr, EAGAIN}});
    blDebugOutput = true;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    EXPECT_EQ(TakeSql(), Lines{"SELECT 1"});
    EXPECT_EQ(TakePauses(), Pauses(0));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("Unknow Error!!", "SELECT 1", EAGAIN, 0),
                                Plain("run sql fail, err=(null)")}));
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "Unknow Error!!");
    blDebugOutput = false;
    FailNextExec({{SQLITE_BUSY, kLockText, EAGAIN}, {SQLITE_BUSY, nullptr, EAGAIN}});
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), -1);
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("Unknow Error!!", "SELECT 1", EAGAIN, 1)}));
}

TEST_F(RunnerLockTest, CallbackThatStopsWithEagainIsRunAgain) {
    int nCalls = 0;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1", StopWithEagain, &nCalls), -1);
    EXPECT_EQ(nCalls, 500);
    EXPECT_EQ(TakePauses(), Pauses(kAttempts));
    EXPECT_EQ(TakeLog(), (Lines{RunFailed(sqlite3_errstr(SQLITE_ABORT), "SELECT 1", EAGAIN, 500)}));
}

TEST_F(RunnerLockTest, TextOfThePreviousAttemptIsKeptDuringTheRetry) {
    Lines vecErrors;
    FailNextExec({{SQLITE_BUSY, "first: database is locked", 0},
                  {SQLITE_BUSY, "second: database is locked", 0}});
    OnExec([&](int) { vecErrors.push_back(SqlErrorOf(*m_pHandle)); });
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(vecErrors, (Lines{"", "first: database is locked", "second: database is locked"}));
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "");
}

TEST_F(RunnerLockTest, EveryAttemptNamesItsTableAgain) {
    const auto pOther = NewHandle(m_pDb, "u", Definition("u", "id:string"), "CREATE TABLE u (id)");
    Sql("INSERT INTO t VALUES (7, 'a')");
    LockNextExec(1);
    OnPause([&](int) { EXPECT_EQ(pOther->runSqlEx("SELECT 1"), 1); });
    Json::Value jNoQuery;
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->recList(jNoQuery, jRows), 0);
    EXPECT_EQ(TakePauses(), Pauses(1));
    EXPECT_EQ(Compact(jRows), R"([{"id":7,"name":"a"}])");
}

TEST_F(RunnerFileLockTest, LockOfAnotherConnectionHeldTooLongFailsTheStatement) {
    LockingConnection lock(m_strPath);
    EXPECT_EQ(m_pHandle->runSqlEx(m_strInsert), -1);
    EXPECT_EQ(TakeSql(), Lines(kAttempts, m_strInsert));
    EXPECT_EQ(TakePauses(), Pauses(kAttempts));
    const std::vector<SyslogCall> vecCalls = TakeSyslogCalls();
    ASSERT_EQ(vecCalls.size(), 1U);
    EXPECT_EQ(TakeLog(), (Lines{RunFailed(kLockText, m_strInsert, vecCalls[0].nErrno, kAttempts)}));
    lock.Release();
    EXPECT_EQ(Rows("SELECT count(*) FROM f.stored"), "0");
}

TEST_F(RunnerFileLockTest, LockOfAnotherConnectionReleasedBeforeAnAttemptLetsItSucceed) {
    for (const int nAttempt : {1, 2, 30, 499, 500}) {
        LockingConnection lock(m_strPath);
        OnExec([&](int nCall) {
            if (nCall == nAttempt - 1) {
                lock.Release();
            }
        });
        EXPECT_EQ(m_pHandle->runSqlEx(m_strInsert), 1) << nAttempt;
        EXPECT_EQ(TakeSql(), Lines(static_cast<size_t>(nAttempt), m_strInsert));
        EXPECT_EQ(TakePauses(), Pauses(static_cast<size_t>(nAttempt - 1)));
        EXPECT_EQ(TakeLog(), Lines());
    }
    EXPECT_EQ(Rows("SELECT count(*) FROM f.stored"), "5");
}

TEST_F(RunnerFileLockTest, LockReleasedInTheLastPauseComesTooLate) {
    LockingConnection lock(m_strPath);
    OnPause([&](int nPause) {
        if (nPause == 499) {
            lock.Release();
        }
    });
    EXPECT_EQ(m_pHandle->runSqlEx(m_strInsert), -1);
    EXPECT_EQ(TakeSql().size(), kAttempts);
    EXPECT_EQ(Rows("SELECT count(*) FROM f.stored"), "0");
}

TEST_F(RunnerFileLockTest, LockOfAnotherProcessHeldTooLongFailsTheStatement) {
    LockingProcess lock(m_strPath);
    EXPECT_EQ(m_pHandle->runSqlEx(m_strInsert), -1);
    EXPECT_EQ(TakeSql(), Lines(kAttempts, m_strInsert));
    EXPECT_EQ(TakePauses(), Pauses(kAttempts));
    const std::vector<SyslogCall> vecCalls = TakeSyslogCalls();
    ASSERT_EQ(vecCalls.size(), 1U);
    EXPECT_EQ(TakeLog(), (Lines{RunFailed(kLockText, m_strInsert, vecCalls[0].nErrno, kAttempts)}));
    lock.Release();
    EXPECT_EQ(Rows("SELECT count(*) FROM f.stored"), "0");
}

TEST_F(RunnerFileLockTest, LockOfAnotherProcessReleasedAfterSomePausesLetsTheStatementSucceed) {
    LockingProcess lock(m_strPath);
    OnPause([&](int nPause) {
        if (nPause == 29) {
            lock.Release();
        }
    });
    EXPECT_EQ(m_pHandle->runSqlEx(m_strInsert), 1);
    EXPECT_EQ(TakeSql(), Lines(31, m_strInsert));
    EXPECT_EQ(TakePauses(), Pauses(30));
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(Rows("SELECT count(*) FROM f.stored"), "1");
}

TEST_F(RunnerFileLockTest, RetryRunsTheWholeTextAgainFromItsFirstStatement) {
    const std::string strSql = "INSERT INTO t(name) VALUES ('before'); " + m_strInsert;
    LockingConnection lock(m_strPath);
    OnExec([&](int nCall) {
        if (nCall == 3) {
            lock.Release();
        }
    });
    EXPECT_EQ(m_pHandle->runSqlEx(strSql), 1);
    EXPECT_EQ(TakeSql(), Lines(4, strSql));
    EXPECT_EQ(Rows("SELECT name FROM t"), "before\nbefore\nbefore\nbefore");
    EXPECT_EQ(Rows("SELECT count(*) FROM f.stored"), "1");
}

TEST_F(RunnerFileLockTest, RowsReadBeforeTheLockWasMetAreReadAgain) {
    int nRows = 0;
    LockingConnection lock(m_strPath);
    OnExec([&](int nCall) {
        if (nCall == 2) {
            lock.Release();
        }
    });
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1; SELECT 2; " + m_strInsert, CountRows, &nRows), 0);
    EXPECT_EQ(nRows, 6);
}
