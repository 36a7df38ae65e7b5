// Definitions of the functions through which the library leaves the process. The dynamic linker
// finds those of the executable first, so the shared library calls these.
//
// <syslog.h> and the fortified headers define some of the names inline: they stay out of this file.
#undef _FORTIFY_SOURCE

#include <dlfcn.h>

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <deque>
#include <utility>

#include "HostExits.h"
#include "Recorder.h"

namespace testhost {
namespace {

using ExecFunction = int (*)(sqlite3*, const char*, int (*)(void*, int, char**, char**), void*,
                             char**);
using SleepFunction = int (*)(unsigned);
using ChangesFunction = int (*)(sqlite3*);
using FreeFunction = void (*)(void*);

Lines g_vecSql;
std::deque<ExecFault> g_queFaults;
std::function<void(int)> g_fnOnExec;
RowCallback g_fnRowCallback = nullptr;
std::function<void()> g_fnOnFree;
std::deque<int> g_queChanges;
std::vector<unsigned> g_vecPauses;
std::function<void(int)> g_fnOnPause;

template <typename Function>
Function RealFunction(const char* szName) {
    void* pFunction = ::dlsym(RTLD_NEXT, szName);
    if (pFunction == nullptr) {
        std::fprintf(stderr, "cannot find the real %s\n", szName);
        std::abort();
    }
    return reinterpret_cast<Function>(pFunction);
}

const void* ModuleOf(const void* pAddress) {
    Dl_info info;
    return ::dladdr(pAddress, &info) != 0 ? info.dli_fbase : nullptr;
}

// SQLite calls sqlite3_exec and usleep itself; those calls are none of the library's.
bool IsInsideSqlite(const void* pCaller) {
    static const void* const pSqlite =
        ModuleOf(reinterpret_cast<const void*>(RealFunction<ExecFunction>("sqlite3_exec")));
    return ModuleOf(pCaller) == pSqlite;
}

int AnswerFault(char** ppszError) {
    const ExecFault fault = g_queFaults.front();
    g_queFaults.pop_front();
    if (ppszError != nullptr) {
        *ppszError = fault.szError == nullptr ? nullptr : sqlite3_mprintf("%s", fault.szError);
    }
    errno = fault.nErrno;
    return fault.nResult;
}

int RecordExec(sqlite3* pDb, const char* szSql, int (*callback)(void*, int, char**, char**),
               void* pArg, char** ppszError) {
    const int nErrno = errno;
    const int nCall = static_cast<int>(g_vecSql.size());
    g_fnRowCallback = callback;
    g_vecSql.emplace_back(szSql == nullptr ? "(null)" : szSql);
    if (g_fnOnExec) {
        g_fnOnExec(nCall);
    }
    errno = nErrno;
    if (!g_queFaults.empty()) {
        return AnswerFault(ppszError);
    }
    return RealExec(pDb, szSql, callback, pArg, ppszError);
}

void RecordPause(unsigned nMicroseconds) {
    const int nErrno = errno;
    const int nPause = static_cast<int>(g_vecPauses.size());
    g_vecPauses.push_back(nMicroseconds);
    if (g_fnOnPause) {
        g_fnOnPause(nPause);
    }
    errno = nErrno;
}

}  // namespace

int RealExec(sqlite3* pDb, const char* szSql, int (*callback)(void*, int, char**, char**),
             void* pArg, char** ppszError) {
    static const ExecFunction fnReal = RealFunction<ExecFunction>("sqlite3_exec");
    return fnReal(pDb, szSql, callback, pArg, ppszError);
}

Lines TakeSql() {
    return std::exchange(g_vecSql, {});
}

void FailNextExec(std::vector<ExecFault> vecFaults) {
    g_queFaults.assign(vecFaults.begin(), vecFaults.end());
}

void OnExec(std::function<void(int)> fn) {
    g_fnOnExec = std::move(fn);
}

RowCallback LastRowCallback() {
    return g_fnRowCallback;
}

void OnFree(std::function<void()> fn) {
    g_fnOnFree = std::move(fn);
}

void FakeNextChanges(int nChanges) {
    g_queChanges.push_back(nChanges);
}

std::vector<unsigned> TakePauses() {
    return std::exchange(g_vecPauses, {});
}

void OnPause(std::function<void(int)> fn) {
    g_fnOnPause = std::move(fn);
}

void ResetExits() {
    blLogToStdout = false;
    blDebugOutput = false;
    FailNextExec({});
    OnExec(nullptr);
    OnPause(nullptr);
    OnFree(nullptr);
    g_queChanges.clear();
    TakeSql();
    TakePauses();
    ResetLog();
}

}  // namespace testhost

#define VORN_TEST_INTERPOSED extern "C" __attribute__((visibility("default")))

VORN_TEST_INTERPOSED int sqlite3_exec(sqlite3* pDb, const char* szSql,
                                      int (*callback)(void*, int, char**, char**), void* pArg,
                                      char** ppszError) {
    if (testhost::IsInsideSqlite(__builtin_return_address(0))) {
        return testhost::RealExec(pDb, szSql, callback, pArg, ppszError);
    }
    return testhost::RecordExec(pDb, szSql, callback, pArg, ppszError);
}

VORN_TEST_INTERPOSED int sqlite3_changes(sqlite3* pDb) {
    if (testhost::g_queChanges.empty()) {
        return testhost::RealFunction<testhost::ChangesFunction>("sqlite3_changes")(pDb);
    }
    const int nChanges = testhost::g_queChanges.front();
    testhost::g_queChanges.pop_front();
    return nChanges;
}

VORN_TEST_INTERPOSED void sqlite3_free(void* pMemory) {
    static const auto fnReal = testhost::RealFunction<testhost::FreeFunction>("sqlite3_free");
    fnReal(pMemory);
    if (testhost::g_fnOnFree && !testhost::IsInsideSqlite(__builtin_return_address(0))) {
        testhost::g_fnOnFree();
    }
}

VORN_TEST_INTERPOSED int usleep(unsigned nMicroseconds) {
    if (testhost::IsInsideSqlite(__builtin_return_address(0))) {
        return testhost::RealFunction<testhost::SleepFunction>("usleep")(nMicroseconds);
    }
    testhost::RecordPause(nMicroseconds);
    return 0;
}

VORN_TEST_INTERPOSED __attribute__((format(printf, 2, 0))) void vsyslog(int nPriority,
                                                                        const char* szFormat,
                                                                        va_list args) {
    testhost::RecordSyslog(nPriority, szFormat, args);
}

VORN_TEST_INTERPOSED __attribute__((format(printf, 2, 3))) void syslog(int nPriority,
                                                                       const char* szFormat, ...) {
    va_list args;
    va_start(args, szFormat);
    testhost::RecordSyslog(nPriority, szFormat, args);
    va_end(args);
}

// The forms that a library built with _FORTIFY_SOURCE calls.
VORN_TEST_INTERPOSED __attribute__((format(printf, 3, 0))) void __vsyslog_chk(int nPriority, int,
                                                                              const char* szFormat,
                                                                              va_list args) {
    testhost::RecordSyslog(nPriority, szFormat, args);
}

VORN_TEST_INTERPOSED __attribute__((format(printf, 3, 4))) void __syslog_chk(int nPriority, int,
                                                                             const char* szFormat,
                                                                             ...) {
    va_list args;
    va_start(args, szFormat);
    testhost::RecordSyslog(nPriority, szFormat, args);
    va_end(args);
}
