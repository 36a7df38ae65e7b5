// The one logging rule, with whole lines as they reach the system log and standard output.
#include <sys/stat.h>
#include <syslog.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "../support/TableTest.h"

using namespace testhost;

namespace {

// Taken before any test sets them.
const bool kLogToStdoutAtLoad = blLogToStdout;
const bool kDebugOutputAtLoad = blDebugOutput;

// The line number cannot be known here; it is taken from the text itself, which is then compared.
std::string LineNumberIn(const std::string& strText) {
    const size_t nAt = strText.find(".cpp:");
    if (nAt == std::string::npos) {
        return "no line number";
    }
    const size_t nBegin = nAt + 5;
    return strText.substr(nBegin, strText.find_first_not_of("0123456789", nBegin) - nBegin);
}

int g_nLogOpenedOrClosed = 0;

class LogLineTest : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        m_strPid = std::to_string(::getpid());
    }

    // One short condition check, with errno as it is when this is called; its later lines follow.
    static SyslogCall ShortCheckCall() {
        NewHandle(nullptr, "u", ParseJson("{\"x\":1}"), "SELECT 1");
        const std::vector<SyslogCall> vecCalls = TakeSyslogCalls();
        return vecCalls.empty() ? SyslogCall{} : vecCalls[0];
    }

    // One long condition check and nothing else.
    static void LongCheck() {
        Json::Value jList(Json::arrayValue);
        Json::Value jNone;
        EXPECT_EQ(VORN_JSON_DB::jsonCopyMember(jList, jNone, true), -1);
    }

    static SyslogCall LongCheckCall() {
        LongCheck();
        const std::vector<SyslogCall> vecCalls = TakeSyslogCalls();
        EXPECT_EQ(vecCalls.size(), 1U);
        return vecCalls.empty() ? SyslogCall{} : vecCalls[0];
    }

    std::string m_strPid;
};

const char* const kLongText =
    "Failed [jIn.type() != Json::nullValue && jIn.type() != Json::objectValue], err=";

}  // namespace

extern "C" void openlog(const char*, int, int) {
    ++g_nLogOpenedOrClosed;
}
extern "C" void closelog() {
    ++g_nLogOpenedOrClosed;
}
extern "C" int setlogmask(int) noexcept {
    return ++g_nLogOpenedOrClosed;
}

TEST_F(LogLineTest, FlagsAreOneByteEachAndFalseAtFirst) {
    EXPECT_EQ(sizeof(blLogToStdout), 1U);
    EXPECT_EQ(sizeof(blDebugOutput), 1U);
    EXPECT_FALSE(kLogToStdoutAtLoad);
    EXPECT_FALSE(kDebugOutputAtLoad);
}

TEST_F(LogLineTest, ShortCheckOnStdoutIsPidFileLineTextAndOneNewline) {
    StdoutCapture capture;
    blLogToStdout = true;
    errno = ENOENT;
    NewHandle(nullptr, "u", ParseJson("{\"x\":1}"), "SELECT 1");
    const std::string strPrinted = capture.Take();
    const std::string strExpected =
        "(" + m_strPid + ") VornJsonDbApi.cpp:" + LineNumberIn(strPrinted) + " Failed [!pDb]\n";
    EXPECT_EQ(strPrinted.substr(0, strExpected.size()), strExpected);
    EXPECT_EQ(strPrinted[strExpected.size()], '(');
}

TEST_F(LogLineTest, ShortCheckInSyslogWithErrnoShowsItAfterThePid) {
    errno = ENOENT;
    const SyslogCall call = ShortCheckCall();
    EXPECT_EQ(call.nPriority, 3);
    EXPECT_EQ(call.nErrno, ENOENT);
    EXPECT_EQ(call.strRendered, "VornJsonDbApi.cpp:" + LineNumberIn(call.strRendered) + " (" +
                                    m_strPid + ")(%m)Failed [!pDb]");
}

TEST_F(LogLineTest, ShortCheckInSyslogWithoutErrnoHasNoErrnoText) {
    const SyslogCall call = ShortCheckCall();
    EXPECT_EQ(call.nPriority, 3);
    EXPECT_EQ(call.nErrno, 0);
    EXPECT_EQ(call.strRendered, "VornJsonDbApi.cpp:" + LineNumberIn(call.strRendered) + " (" +
                                    m_strPid + ")Failed [!pDb]");
}

TEST_F(LogLineTest, LongCheckOnStdoutRepeatsThePlaceAndEndsInTwoNewlines) {
    StdoutCapture capture;
    blLogToStdout = true;
    errno = ENOENT;
    LongCheck();
    const std::string strPrinted = capture.Take();
    const std::string strPlace = "util.cpp:" + LineNumberIn(strPrinted);
    const std::string strErrno = std::strerror(ENOENT);
    EXPECT_EQ(strPrinted, "(" + m_strPid + ") " + strPlace + " (" + strPlace + ")(" + strErrno +
                              ")" + kLongText + strErrno + "\n\n");
}

TEST_F(LogLineTest, LongCheckOnStdoutWithoutErrnoShowsTheTextOfErrorZero) {
    StdoutCapture capture;
    blLogToStdout = true;
    LongCheck();
    const std::string strPrinted = capture.Take();
    const std::string strPlace = "util.cpp:" + LineNumberIn(strPrinted);
    const std::string strErrno = std::strerror(0);
    EXPECT_EQ(strPrinted, "(" + m_strPid + ") " + strPlace + " (" + strPlace + ")(" + strErrno +
                              ")" + kLongText + strErrno + "\n\n");
}

TEST_F(LogLineTest, LongCheckInSyslogWithErrnoShowsItThreeTimes) {
    errno = ENOENT;
    const SyslogCall call = LongCheckCall();
    const std::string strPlace = "util.cpp:" + LineNumberIn(call.strRendered);
    EXPECT_EQ(call.nPriority, 3);
    EXPECT_EQ(call.nErrno, ENOENT);
    EXPECT_EQ(call.strRendered,
              strPlace + " (" + m_strPid + ")(%m)(" + strPlace + ")(%m)" + kLongText + "%m\n");
}

TEST_F(LogLineTest, LongCheckInSyslogWithoutErrnoKeepsBothErrnoConversions) {
    const SyslogCall call = LongCheckCall();
    const std::string strPlace = "util.cpp:" + LineNumberIn(call.strRendered);
    EXPECT_EQ(call.nPriority, 3);
    EXPECT_EQ(call.nErrno, 0);
    EXPECT_EQ(call.strRendered,
              strPlace + " (" + m_strPid + ")(" + strPlace + ")(%m)" + kLongText + "%m\n");
}

TEST_F(LogLineTest, FormatsHandedToSyslogAreThoseOfTheFourSyslogShapes) {
    EXPECT_EQ(ShortCheckCall().strFormat, "%s:%d (%u)Failed [%s]");
    EXPECT_EQ(LongCheckCall().strFormat, "%s:%d (%u)(%s:%d)(%m)Failed [%s], err=%m\n");
    errno = ENOENT;
    EXPECT_EQ(ShortCheckCall().strFormat, "%s:%d (%u)(%m)Failed [%s]");
    errno = ENOENT;
    EXPECT_EQ(LongCheckCall().strFormat, "%s:%d (%u)(%m)(%s:%d)(%m)Failed [%s], err=%m\n");
}

TEST_F(LogLineTest, FreeTextErrorOnStdoutIsALocatedLine) {
    StdoutCapture capture;
    blLogToStdout = true;
    std::string strOut;
    EXPECT_EQ(VORN_JSON_DB::convert2ReadableTime(0, strOut, 8), -1);
    const std::string strPrinted = capture.Take();
    const std::string strPlace = "util.cpp:" + LineNumberIn(strPrinted);
    EXPECT_EQ(strPrinted, "(" + m_strPid + ") " + strPlace + " (" + strPlace + ")(" +
                              std::strerror(0) + ")bad iType value=8\n\n");
}

TEST_F(LogLineTest, PrintedLinesReadTheSameAsThoseInTheSystemLog) {
    const auto fail = [this] {
        FailNextExec({{SQLITE_ERROR, "no such luck", ENOENT}});
        EXPECT_EQ(m_pHandle->tableCreate(), -1);
        return TakeLog();
    };
    const Lines vecExpected = {RunFailed("no such luck", kCreateItem, ENOENT),
                               Located(std::string("create table failed, sql=") + kCreateItem),
                               SqlError("no such luck", kCreateItem)};
    EXPECT_EQ(fail(), vecExpected);
    StdoutCapture capture;
    blLogToStdout = true;
    EXPECT_EQ(fail(), vecExpected);
    EXPECT_EQ(TakeSyslogCalls().size(), 3U);
}

TEST_F(LogLineTest, LinesOfAHandleWithNothingInItComeInTheOrderOfItsSteps) {
    NewHandle(nullptr, "", Json::Value(), "");
    EXPECT_EQ(
        TakeLog(),
        (Lines{ShortCheck("!pDb"), ShortCheck("strName.empty()"), ShortCheck("jTableDef.empty()"),
               ShortCheck("strSqlCreate.empty()"), Check("0 >= strSql.length()"),
               Plain("i=0,errno=0, run sql failed, error=Unknow Error!!, sql="),
               Located("create table failed, sql="), Plain("sql error, err=Unknow Error!!, sql="),
               Check("0 > tableCreate()")}));
}

TEST_F(LogLineTest, StdoutFlagSetBetweenTwoLinesMovesTheNextLine) {
    StdoutCapture capture;
    LongCheck();
    blLogToStdout = true;
    LongCheck();
    EXPECT_EQ(TakeSyslogCalls().size(), 1U);
    const std::string strPrinted = capture.Take();
    EXPECT_EQ(strPrinted.find(kLongText), strPrinted.rfind(kLongText));
    EXPECT_NE(strPrinted.find(kLongText), std::string::npos);
    blLogToStdout = false;
    LongCheck();
    EXPECT_EQ(TakeSyslogCalls().size(), 1U);
    EXPECT_EQ(capture.Take(), "");
}

TEST_F(LogLineTest, StdoutFlagSetWithinOneOperationMovesItsRemainingLines) {
    StdoutCapture capture;
    OnExec([](int) { blLogToStdout = true; });
    const std::string strSql = "SELECT 1";
    NewHandle(nullptr, "u", ParseJson("{\"x\":1}"), strSql);
    EXPECT_EQ(TakeSyslogCalls().size(), 1U);
    EXPECT_EQ(
        TakeLog(),
        (Lines{ShortCheck("!pDb"),
               Plain("i=0,errno=0, run sql failed, error=Unknow Error!!, sql=" + strSql),
               Located("create table failed, sql=" + strSql),
               Plain("sql error, err=Unknow Error!!, sql=" + strSql), Check("0 > tableCreate()")}));
}

TEST_F(LogLineTest, BothFlagsAreReadAgainForEachLineOfOneFailure) {
    const std::string strSql = "nonsense";
    const std::string strError = "near \"nonsense\": syntax error";
    OnNextLine([] { blDebugOutput = blLogToStdout = true; });
    StdoutCapture capture;
    EXPECT_EQ(m_pHandle->runSqlEx(strSql), -1);
    EXPECT_EQ(TakeSyslogCalls().size(), 1U);
    EXPECT_EQ(TakeLog(),
              (Lines{Plain("i=0,errno=0, run sql failed, error=" + strError + ", sql=" + strSql),
                     Plain("run sql fail, err=" + strError)}));
    blLogToStdout = false;
    OnNextLine([] { blDebugOutput = false; });
    EXPECT_EQ(m_pHandle->runSqlEx(strSql), -1);
    EXPECT_EQ(TakeSyslogCalls().size(), 1U);
}

TEST_F(LogLineTest, BothFlagsAreReadAgainForEachAttempt) {
    FailNextExec({{SQLITE_BUSY, "database is locked", 0},
                  {SQLITE_BUSY, "database is locked", 0},
                  {SQLITE_BUSY, "database is locked", 0}});
    // The first attempt says nothing, the second prints its line, the third writes it to the log.
    OnPause([](int nPause) {
        blDebugOutput = true;
        blLogToStdout = nPause == 0;
    });
    StdoutCapture capture;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    const std::string strRest = ", errno=0, run sql failed, error=database is locked, sql=SELECT 1";
    EXPECT_EQ(TakeLog(), (Lines{Plain("retry, i=1" + strRest), Plain("retry, i=2" + strRest)}));
    EXPECT_EQ(TakeSyslogCalls().size(), 1U);
}

TEST_F(LogLineTest, DebugLineAfterAnErrorReadsItsFlagBehindIt) {
    Json::Value jEmpty(Json::objectValue);
    OnNextLine([] { blDebugOutput = true; });
    EXPECT_EQ(m_pHandle->fillDefaultValue(jEmpty, true), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=id"), Plain("jParam={}")}));
}

TEST_F(LogLineTest, PrintedLineStaysInTheBufferOfTheHost) {
    // In a process whose standard output is a pipe: there nothing but a flush empties the buffer.
    EXPECT_EQ(InFreshProcess([] {
                  StdoutCapture capture;
                  blLogToStdout = true;
                  LongCheck();
                  struct stat status = {};
                  EXPECT_EQ(::fstat(STDOUT_FILENO, &status), 0);
                  EXPECT_EQ(status.st_size, 0);
                  EXPECT_NE(capture.Take(), "");
              }),
              0);
}

TEST_F(LogLineTest, SystemLogIsNeitherOpenedNorClosed) {
    g_nLogOpenedOrClosed = 0;
    LongCheck();
    NewHandle(nullptr, "", Json::Value(), "");
    blDebugOutput = true;
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(g_nLogOpenedOrClosed, 0);
}

TEST_F(LogLineTest, DebugLineIsNotWrittenWhileItsFlagIsClearWhateverTheSink) {
    Json::Value jEmpty(Json::objectValue);
    EXPECT_EQ(m_pHandle->fillDefaultValue(jEmpty, true), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=id")}));
    StdoutCapture capture;
    blLogToStdout = true;
    EXPECT_EQ(m_pHandle->fillDefaultValue(jEmpty, true), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=id")}));
}

TEST_F(LogLineTest, DebugLineInSyslogIsAPlainLineAtErrorPriority) {
    blDebugOutput = true;
    Json::Value jEmpty(Json::objectValue);
    EXPECT_EQ(m_pHandle->fillDefaultValue(jEmpty, true), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=id"), Plain("jParam={}")}));
    const std::vector<SyslogCall> vecCalls = TakeSyslogCalls();
    ASSERT_EQ(vecCalls.size(), 2U);
    EXPECT_EQ(vecCalls[1].nPriority, 3);
    EXPECT_EQ(vecCalls[1].strFormat, "%s:%d (%u)jParam=%s");
}

TEST_F(LogLineTest, DebugLineOnStdoutIsAPlainLineWithOneNewline) {
    blDebugOutput = true;
    blLogToStdout = true;
    StdoutCapture capture;
    Json::Value jEmpty(Json::objectValue);
    EXPECT_EQ(m_pHandle->fillDefaultValue(jEmpty, true), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("lost data member=id"), Plain("jParam={}")}));
    const std::string strPrinted = capture.Take();
    const std::string strEnd = " jParam={}\n";
    EXPECT_EQ(strPrinted.substr(strPrinted.size() - strEnd.size()), strEnd);
    EXPECT_EQ(TakeSyslogCalls().size(), 0U);
}

TEST_F(LogLineTest, ErrorLineDoesNotDependOnTheDebugFlag) {
    blDebugOutput = true;
    LongCheck();
    blDebugOutput = false;
    LongCheck();
    const std::string strLine =
        UtilCheck("jIn.type() != Json::nullValue && jIn.type() != Json::objectValue");
    EXPECT_EQ(TakeLog(), (Lines{strLine, strLine}));
}

TEST_F(LogLineTest, SuccessfulOperationsWriteNothingWithBothFlagsSet) {
    blDebugOutput = true;
    blLogToStdout = true;
    StdoutCapture capture;
    Json::Value jRecord = ParseJson("{\"id\":1,\"name\":\"a\"}");
    Json::Value jRows;
    Json::Value jNoQuery;
    EXPECT_EQ(m_pHandle->recSave(jRecord, true), 0);
    EXPECT_EQ(m_pHandle->recList(jNoQuery, jRows), 0);
    EXPECT_EQ(capture.Take(), "");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(LogLineTest, MessageTextIsNeverReadAsAFormat) {
    const std::string strSql = "SELECT '%s%n%d%m' FROM nowhere";
    EXPECT_EQ(m_pHandle->runSqlEx(strSql), -1);
    EXPECT_EQ(
        TakeLog(),
        (Lines{Plain("i=0,errno=0, run sql failed, error=no such table: nowhere, sql=" + strSql)}));
}
