// One table in one file, for the handles of several processes.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_LOCKS_LOAD_H
#define VORNJSONDB_TESTS_CAMPAIGNS_LOCKS_LOAD_H

#include <memory>
#include <string>

#include "../support/Campaign.h"

namespace campaign {

constexpr int kAttempts = 500;

std::unique_ptr<VornJsonDbApi> LoadHandle(const Database& db);
Json::Value LoadRecord(int nKey, int nOwner, const std::string& strText);

// A fresh file in that journal mode, with the row that counts.
std::string NewLoadFile(const char* szMode);

// Eight processes with mixed operations on one file for that long; then the file must hold what
// they were told that it holds.
void RunLoad(const char* szMode, std::uint64_t nSeed, int nMilliseconds);

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_LOCKS_LOAD_H
