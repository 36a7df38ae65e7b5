// The tables and records that are measured.

#ifndef VORN_BENCH_SUPPORT_RECORDS_H
#define VORN_BENCH_SUPPORT_RECORDS_H

#include <VornJsonDbApi.h>

#include <memory>
#include <string>
#include <vector>

#include <json/json.h>
#include <sqlite3.h>

namespace bench {

// A table as its host describes it.
struct Table {
    std::string strName;
    std::string strSqlCreate;
    Json::Value jDefinition;

    std::unique_ptr<VornJsonDbApi> Open(sqlite3* pDb) const;
};

// Eight members: three integers, three texts, a boolean, a list as JSON text; "id" is the key.
Table EightMembers();
Json::Value EightMemberRecord(int nId);
std::vector<Json::Value> EightMemberRecords(int nCount);

// nColumns members whose types go round as in the table of eight; the first, an integer, is the
// key.
Table Wide(int nColumns);
Json::Value WideRecord(int nColumns, int nKey = 0);
std::string WideKey();

// Eight texts; no key.
Table EightTexts();

// Numbers 0 to nCount - 1 in an order that repeats with every run.
std::vector<int> Shuffled(int nCount);

// {"id": nId}
Json::Value ById(int nId);

}  // namespace bench

#endif  // VORN_BENCH_SUPPORT_RECORDS_H
