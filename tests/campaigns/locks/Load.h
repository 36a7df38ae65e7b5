// Many processes on one file.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_LOCKS_LOAD_H
#define VORNJSONDB_TESTS_CAMPAIGNS_LOCKS_LOAD_H

#include <string>

#include "../support/Campaign.h"

namespace campaign {

// Locks do not depend on it. To say so needs a moment without one.
constexpr char kFast[] = "PRAGMA busy_timeout=60000; PRAGMA synchronous=OFF; PRAGMA busy_timeout=0";

// Eight processes with mixed operations on a fresh file for that long; then the file must hold
// what they were told that it holds.
void RunLoad(const std::string& strPath, const char* szMode, std::uint64_t nSeed,
             int nMilliseconds);

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_LOCKS_LOAD_H
