// The host process as the library sees it: every exit watched (HostExits.h), a database, processes
// and files.
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

#include "HostExits.h"
#include "JsonHelpers.h"

namespace testhost {

// Has the library forget all tables: the process is as it was when it started.
void ForgetTables();

// The same, and resets the exits and errno.
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
