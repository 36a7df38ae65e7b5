// Cost against the number of tables that one process uses in turn.

#include <memory>
#include <string>
#include <vector>

#include "Scale.h"

namespace {

using namespace bench;

constexpr int kRowsPerTable = 100;

Table EightMembersNamed(const std::string& strName) {
    Table Eight = EightMembers();
    Json::Value jDefinition;
    jDefinition[strName] = Eight.jDefinition[Eight.strName];
    const size_t nAt = Eight.strSqlCreate.find(Eight.strName + " (");
    Eight.strSqlCreate.replace(nAt, Eight.strName.length(), strName);
    Eight.jDefinition = jDefinition;
    Eight.strName = strName;
    return Eight;
}

struct ManyTables {
    explicit ManyTables(int nTables) {
        Db.Exec("BEGIN");
        for (int n = 0; n < nTables; ++n) {
            vecHandles.push_back(EightMembersNamed("part" + std::to_string(n)).Open(Db.Get()));
            for (int i = 0; i < kRowsPerTable; ++i) {
                Json::Value jRecord = EightMemberRecord(i);
                Json::Value jStored;
                Require(vecHandles.back()->recCreate(jRecord, jStored) == 0, "filling a table");
            }
        }
    }

    VornJsonDbApi& Next() { return *vecHandles[nNext++ % vecHandles.size()]; }

    Database Db;
    std::vector<std::unique_ptr<VornJsonDbApi>> vecHandles;
    size_t nNext = 0;
};

void TableCounts(benchmark::internal::Benchmark* pBenchmark) {
    pBenchmark->RangeMultiplier(2)->Range(1, 64)->Unit(benchmark::kMicrosecond);
}

void GetTables(benchmark::State& State) {
    ManyTables All(static_cast<int>(State.range(0)));
    int nId = 0;
    for (auto _ : State) {
        Json::Value jQuery = ById(nId++ % kRowsPerTable);
        Json::Value jFound;
        Require(All.Next().recGetOne(jQuery, jFound) == 1, "recGetOne");
    }
}
BENCHMARK(GetTables)->Apply(TableCounts);

void ListTables(benchmark::State& State) {
    ManyTables All(static_cast<int>(State.range(0)));
    Json::Value jAll;
    for (auto _ : State) {
        Json::Value jRows;
        Require(All.Next().recList(jAll, jRows) == 0, "recList");
    }
    CountUnits(State, "row", kRowsPerTable);
}
BENCHMARK(ListTables)->Apply(TableCounts);

}  // namespace
