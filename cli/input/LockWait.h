// Waiting for a database that another program holds.

#ifndef VORNJSONDB_CLI_INPUT_LOCK_WAIT_H
#define VORNJSONDB_CLI_INPUT_LOCK_WAIT_H

#include <string>

#include <sqlite3.h>

namespace VORN_JSON_DB::Cli {

// From then on each lock is waited for so long, but not beyond an Interrupt. SQLite alone waits:
// whoever tried again after that would wait twice as long.
void WaitForLocks(sqlite3* pDb, int nMilliseconds);
constexpr int kWaitedBySqlite = 0;  // what is handed to calls that would wait themselves

// The message of a lock, with how long was waited for it. Where an interrupt ended that it is an
// Error.
std::string WithWait(std::string strMessage);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_LOCK_WAIT_H
