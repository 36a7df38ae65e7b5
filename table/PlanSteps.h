// SQLite's plan for a statement.

#ifndef VORN_TABLE_PLAN_STEPS_H
#define VORN_TABLE_PLAN_STEPS_H

#include <string>
#include <vector>

#include <sqlite3.h>

namespace vornjsondb {

// Its steps, those inside of another further right. Returns SQLite's result.
int ReadPlanSteps(sqlite3* pDb, const std::string& strSql, std::vector<std::string>& vecSteps);

// Whether a step goes through all rows of one of the tables, by the names that they have in the
// statement. Constants and elements of JSON are scanned, too, and no index helps there.
bool HasScan(const std::vector<std::string>& vecSteps, const std::vector<std::string>& vecTables);

// Whether SQLite makes an index of one of the tables by itself, each time anew.
bool HasOwnIndex(const std::vector<std::string>& vecSteps,
                 const std::vector<std::string>& vecTables);

}  // namespace vornjsondb

#endif  // VORN_TABLE_PLAN_STEPS_H
