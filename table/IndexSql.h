// CREATE INDEX statements.

#ifndef VORN_TABLE_INDEX_SQL_H
#define VORN_TABLE_INDEX_SQL_H

#include <string>
#include <vector>

#include <sqlite3.h>

#include "Members.h"
#include "PathSql.h"
#include "RealTable.h"

namespace vornjsondb {

// A member or a place in one, and how it was named.
struct IndexTerm {
    std::string strName;
    Place Where;
};

struct IndexPlan {
    std::string strSql;
    bool blThere = false;  // the table has this index, under the name in strSql
};

// Plans an index under a free name that tells its terms. vecPlanned are names that count as taken,
// and the new one is added to them. Returns SQLite's result.
int PlanIndex(sqlite3* pDb, const Members& Of, const RealIndexes& There,
              const std::vector<IndexTerm>& vecTerms, bool blUnique,
              std::vector<std::string>& vecPlanned, IndexPlan& Out);

}  // namespace vornjsondb

#endif  // VORN_TABLE_INDEX_SQL_H
