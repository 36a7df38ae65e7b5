// The exits of the process, watched: the system log, standard output, sqlite3_exec, sqlite3_free,
// sqlite3_changes and usleep. An executable that links Interpose.cpp defines those functions
// itself, so the shared library that it uses calls the recorders here instead of the real ones.
#ifndef VORNJSONDB_TESTS_SUPPORT_HOSTEXITS_H
#define VORNJSONDB_TESTS_SUPPORT_HOSTEXITS_H

#include <VornJsonDbApi.h>

#include <functional>
#include <string>
#include <vector>

#include <sqlite3.h>

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

// Redirects file descriptor 1 into a file while it lives; one at a time.
class StdoutCapture {
  public:
    StdoutCapture();
    ~StdoutCapture();
    StdoutCapture(const StdoutCapture&) = delete;
    StdoutCapture& operator=(const StdoutCapture&) = delete;
    std::string Take();  // raw text printed since the last Take
};

// Whether captured text is shown when the capture ends. Each executable has a function of its own.
bool IsCapturedTextShown();

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

// ---- all of them -------------------------------------------------------------------------------
// Forgets everything recorded, planned faults and hooks, and sets both log flags to false.
void ResetExits();

}  // namespace testhost

#endif  // VORNJSONDB_TESTS_SUPPORT_HOSTEXITS_H
