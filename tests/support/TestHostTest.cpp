// The test host must not take a wrong log line for a right one, nor lose what it records.
#include <syslog.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>

#include "TableTest.h"

using namespace testhost;

namespace {

class TestHostTest : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        m_strPid = std::to_string(::getpid());
    }

    // What becomes of a line that is logged exactly so.
    static Lines Logged(const std::string& strLine, int nErrno = 0, int nPriority = LOG_ERR) {
        errno = nErrno;
        ::syslog(nPriority, "%s", strLine.c_str());
        errno = 0;
        return TakeLog();
    }

    static Lines Printed(const std::string& strText) {
        StdoutCapture capture;
        std::fputs(strText.c_str(), stdout);
        return TakeLog();
    }

    std::string m_strPid;
};

Lines MalformedLine(const std::string& strRaw) {
    return {"MALFORMED: " + strRaw};
}

}  // namespace

TEST_F(TestHostTest, LinesOfTheThreeVariantsAreRecognised) {
    EXPECT_EQ(Logged("util.cpp:7 (" + m_strPid + ")x"), (Lines{UtilPlain("x")}));
    EXPECT_EQ(Logged("VornJsonDbApiRows.cpp:7 (" + m_strPid + ")(%m)x", ENOENT),
              (Lines{Plain("x")}));
    EXPECT_EQ(Logged("util.cpp:7 (" + m_strPid + ")(util.cpp:7)(%m)x\n"),
              (Lines{UtilLocated("x")}));
    EXPECT_EQ(Printed("(" + m_strPid + ") util.cpp:7 x\n"), (Lines{UtilPlain("x")}));
    EXPECT_EQ(Printed("(" + m_strPid + ") util.cpp:7 (util.cpp:7)(" + std::strerror(0) + ")x\n\n"),
              (Lines{UtilLocated("x")}));
}

TEST_F(TestHostTest, LinesThatDifferInOneThingAreMalformed) {
    const std::string strPlain = "util.cpp:7 (" + m_strPid + ")x";
    EXPECT_EQ(Logged(strPlain, 0, LOG_DEBUG), MalformedLine(strPlain));
    EXPECT_EQ(Logged(strPlain, ENOENT), MalformedLine(strPlain));
    for (const std::string& strLine :
         {"util.cpp:7 (" + m_strPid + ")(%m)x", "src/util.cpp:7 (" + m_strPid + ")x",
          "util.cpp:0 (" + m_strPid + ")x", "util.cpp:7 (1" + m_strPid + ")x",
          "util.cpp:7(" + m_strPid + ")x", "other.cpp:7 (" + m_strPid + ")x",
          "util.cpp:7 (" + m_strPid + ")(util.cpp:7)(%m)x", std::string("x"), std::string()}) {
        EXPECT_EQ(Logged(strLine), MalformedLine(strLine));
    }
}

TEST_F(TestHostTest, PrintedLinesThatDifferInOneThingAreMalformed) {
    for (const std::string& strText :
         {"(" + m_strPid + ") util.cpp:7 x",
          "(" + m_strPid + ") util.cpp:7 (util.cpp:7)(Success)x\n",
          "(1" + m_strPid + ") util.cpp:7 x\n", "(" + m_strPid + ")util.cpp:7 x\n",
          "(" + m_strPid + ") /util.cpp:7 x\n", std::string("x\n")}) {
        EXPECT_EQ(Printed(strText), MalformedLine(strText));
    }
}

TEST_F(TestHostTest, AnotherPlaceInsideALocatedLineMakesItNoLocatedLine) {
    EXPECT_EQ(Logged("util.cpp:7 (" + m_strPid + ")(util.cpp:8)(%m)x\n"),
              (Lines{UtilPlain("(util.cpp:8)(%m)x\n")}));
}

TEST_F(TestHostTest, PrintedLinesAreSplitAtTheirHeadsOnly) {
    EXPECT_EQ(Printed("(" + m_strPid + ") util.cpp:7 a\n(b)\n\n(" + m_strPid + ") util.cpp:8 c\n"),
              (Lines{UtilPlain("a\n(b)\n"), UtilPlain("c")}));
}

TEST_F(TestHostTest, LinesOfBothSinksKeepTheirOrder) {
    StdoutCapture capture;
    const std::string strPrinted = "(" + m_strPid + ") util.cpp:7 1\n";
    std::fputs(strPrinted.c_str(), stdout);
    ::syslog(LOG_ERR, "%s:%d (%u)%d", "util.cpp", 8, static_cast<unsigned>(::getpid()), 2);
    std::fputs(("(" + m_strPid + ") util.cpp:9 3\n").c_str(), stdout);
    EXPECT_EQ(TakeLog(), (Lines{UtilPlain("1"), UtilPlain("2"), UtilPlain("3")}));
    EXPECT_EQ(capture.Take().substr(0, strPrinted.size()), strPrinted);
}

TEST_F(TestHostTest, ErrnoOfTheCallerSurvivesEveryRecorder) {
    FailNextExec({{SQLITE_ERROR, nullptr, ENOSPC}});
    OnExec([](int) { errno = EIO; });
    OnPause([](int) { errno = EIO; });
    EXPECT_EQ(sqlite3_exec(m_pDb, "SELECT 1", nullptr, nullptr, nullptr), SQLITE_ERROR);
    EXPECT_EQ(errno, ENOSPC);
    ::usleep(1);
    EXPECT_EQ(errno, ENOSPC);
    ::syslog(LOG_ERR, "%s", "x");
    EXPECT_EQ(errno, ENOSPC);
}

TEST_F(TestHostTest, StatementsOfSqliteItselfAreNotRecorded) {
    sqlite3* pDb = nullptr;
    const std::string strPath = TempFile("recorded.db");
    ASSERT_EQ(sqlite3_open(strPath.c_str(), &pDb), SQLITE_OK);
    EXPECT_EQ(BareExec(pDb, "CREATE TABLE a (x); VACUUM"), SQLITE_OK);
    sqlite3_close(pDb);
    ASSERT_EQ(sqlite3_open(strPath.c_str(), &pDb), SQLITE_OK);
    FailNextExec({{SQLITE_ERROR, nullptr, 0}});
    EXPECT_EQ(BareRows(pDb, "SELECT count(*) FROM a"), "0");
    sqlite3_close(pDb);
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(sqlite3_exec(m_pDb, "SELECT 1", nullptr, nullptr, nullptr), SQLITE_ERROR);
    EXPECT_EQ(TakeSql(), (Lines{"SELECT 1"}));
}

TEST_F(TestHostTest, FreshProcessReportsAFailureWithinIt) {
    std::string strOutput;
    EXPECT_NE(0, InFreshProcess([] { ADD_FAILURE() << "told by the process"; }, strOutput));
    EXPECT_NE(strOutput.find("told by the process"), std::string::npos) << strOutput;
}

TEST_F(TestHostTest, FreshProcessThatEndsInsideItsFunctionIsAFailure) {
    std::string strOutput;
    EXPECT_NE(0, InFreshProcess([] { ::_exit(0); }, strOutput));
}

TEST_F(TestHostTest, FreshProcessesRunEachTheirOwnFunction) {
    static int nRuns = 0;
    EXPECT_EQ(InFreshProcess([] { EXPECT_EQ(++nRuns, 1); }), 0);
    EXPECT_EQ(InFreshProcess([] { EXPECT_EQ(++nRuns, 1); }), 0);
    EXPECT_EQ(nRuns, 0);
}
