// The host process as the library sees it, with every exit watched: the system log, standard
// output, sqlite3_exec and usleep. The test executable defines those functions itself
// (Interpose.cpp), so the shared library under test calls the recorders here instead of the real
// ones.
#ifndef VORNJSONDB_TESTS_SUPPORT_TESTHOST_H
#define VORNJSONDB_TESTS_SUPPORT_TESTHOST_H

#include <VornJsonDbApi.h>

#include <functional>
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>
#include <json/json.h>
#include <sqlite3.h>

#include "JsonHelpers.h"

namespace testhost {

using Lines = std::vector<std::string>;

// ---- log lines ---------------------------------------------------------------------------------
// A line in canonical form names its source ("class" for files beginning VornJsonDbApi, "util" for
// util.cpp), its kind ("located" or "plain") and its text. "%m" stays the two characters %m.
// A line that is not one of the three variants byte for byte becomes "MALFORMED: " + raw text.
std::string Check(const std::string& strCondition);
std::string ShortCheck(const std::string& strCondition);
std::string Located(const std::string& strText);
std::string Plain(const std::string& strText);
std::string UtilCheck(const std::string& strCondition);
std::string UtilLocated(const std::string& strText);
std::string UtilPlain(const std::string& strText);

// Lines since the last take, in the order in which they were written, from the system log and,
// while a StdoutCapture lives, from standard output.
Lines TakeLog();

struct SyslogCall {
    int nPriority;
    int nErrno;               // errno when syslog was called
    std::string strFormat;    // as handed over
    std::string strRendered;  // with its arguments; %m kept
};
std::vector<SyslogCall> TakeSyslogCalls();

// Called once, behind the next line in the system log: what comes between two lines of one
// operation.
void OnNextLine(std::function<void()> fn);

// Redirects file descriptor 1 into a file while it lives; one at a time. A test that has failed
// gets the captured text shown when the capture ends, because it holds the test's own messages too.
class StdoutCapture {
  public:
    StdoutCapture();
    ~StdoutCapture();
    StdoutCapture(const StdoutCapture&) = delete;
    StdoutCapture& operator=(const StdoutCapture&) = delete;
    std::string Take();  // raw text printed since the last Take
};

// ---- SQL ---------------------------------------------------------------------------------------
// Text of every sqlite3_exec call since the last take. Calls that SQLite makes itself and calls of
// the functions further down are not among them.
Lines TakeSql();

struct ExecFault {
    int nResult;
    const char* szError;  // nullptr: fails without a text
    int nErrno;
};
// The next calls answer with these instead of running.
void FailNextExec(std::vector<ExecFault> vecFaults);

// Called before each recorded call with its number since the last TakeSql, from 0. An empty
// function switches it off.
void OnExec(std::function<void(int nCall)> fn);

// The row callback of the most recent recorded call: the library hands out its own only there.
using RowCallback = int (*)(void*, int, char**, char**);
RowCallback LastRowCallback();

// Called behind each sqlite3_free of the library.
void OnFree(std::function<void()> fn);

// The next sqlite3_changes answers with this.
void FakeNextChanges(int nChanges);

// ---- pauses ------------------------------------------------------------------------------------
// Microseconds of each usleep since the last take; usleep returns at once.
std::vector<unsigned> TakePauses();
void OnPause(std::function<void(int nPause)> fn);

// Has the library forget all tables: the process is as it was when it started.
void ForgetTables();

// The same, and forgets everything recorded, planned faults and hooks; clears errno and both flags.
void ResetHost();

// ---- database ----------------------------------------------------------------------------------
// The real sqlite3_exec, past the recorder.
int BareExec(sqlite3* pDb, const std::string& strSql, std::string* pstrError = nullptr);
std::string BareRows(sqlite3* pDb, const std::string& strSql);

// ---- JSON --------------------------------------------------------------------------------------
using jsonhelpers::Compact;
using jsonhelpers::Definition;
using jsonhelpers::KindsOf;
using jsonhelpers::NewHandle;
using jsonhelpers::ReadLeniently;

// Strict; a malformed text fails the test.
Json::Value ParseJson(const std::string& strText);

// ---- processes and files -----------------------------------------------------------------------
// Runs fn in a new process in which the library has not been used yet: the test executable is
// started again for the current test alone, and runs fn instead of what follows. Returns 0 when fn
// ran and no assertion failed. Statements of the test before the call run in the new process too.
int InFreshProcess(const std::function<void()>& fn);

// The same, but what the process printed goes to strOutput and nowhere else.
int InFreshProcess(const std::function<void()>& fn, std::string& strOutput);

// Path of a fresh file in a directory that is removed at exit.
std::string TempFile(const char* szStem);

}  // namespace testhost

#endif  // VORNJSONDB_TESTS_SUPPORT_TESTHOST_H
