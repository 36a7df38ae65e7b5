// What the interposed functions and the test host share.
#ifndef VORNJSONDB_TESTS_SUPPORT_RECORDER_H
#define VORNJSONDB_TESTS_SUPPORT_RECORDER_H

#include <cstdarg>

#include <sqlite3.h>

namespace testhost {

// A syslog call: szFormat and args as handed over.
void RecordSyslog(int nPriority, const char* szFormat, va_list args)
    __attribute__((format(printf, 2, 0)));

// Forgets log lines, but not the text that a StdoutCapture keeps for its own Take.
void ResetLog();

// The functions behind the interposed ones.
int RealExec(sqlite3* pDb, const char* szSql, int (*callback)(void*, int, char**, char**),
             void* pArg, char** ppszError);

}  // namespace testhost

#endif  // VORNJSONDB_TESTS_SUPPORT_RECORDER_H
