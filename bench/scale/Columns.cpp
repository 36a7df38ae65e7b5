// Cost against the number of columns and the length of a text.

#include <string>
#include <vector>

#include "../support/SqlCapture.h"
#include "Scale.h"

namespace {

using namespace bench;

constexpr int kRecords = 64;

void ColumnCounts(benchmark::internal::Benchmark* pBenchmark) {
    pBenchmark->RangeMultiplier(2)->Range(1, 512)->Unit(benchmark::kMicrosecond);
}

// A wide table with the keys below kRecords, and the texts that creating and fetching them took.
struct WideTable {
    explicit WideTable(int nColumns)
        : pHandle(Wide(nColumns).Open(Db.Get())),
          strTable("wide" + std::to_string(nColumns)),
          nWidth(static_cast<Json::ArrayIndex>(nColumns)) {
        Db.Exec("BEGIN");
        SqlCapture Capture(Db.Get());
        for (int i = 0; i < kRecords; ++i) {
            vecRecords.push_back(WideRecord(nColumns, i));
            Create(vecRecords.back());
            vecCreateTexts.push_back(Capture.Take());
            vecQueries.emplace_back();
            vecQueries.back()[WideKey()] = i;
            Get(vecQueries.back());
            vecGetTexts.push_back(Capture.Take());
        }
    }

    void Create(Json::Value& jRecord) {
        Json::Value jStored;
        Require(pHandle->recCreate(jRecord, jStored) == 0, "recCreate");
        Require(jStored.size() == nWidth, "all columns are read back");
    }

    void Get(Json::Value& jQuery) {
        Json::Value jFound;
        Require(pHandle->recGetOne(jQuery, jFound) == 1, "recGetOne");
    }

    // Calls fnWork with the keys in turn; when blEmpty is set, on a table without them.
    template <class Work>
    void Measure(benchmark::State& State, bool blEmpty, Work&& fnWork) {
        size_t i = 0;
        for (auto _ : State) {
            if (blEmpty && i % kRecords == 0) {
                State.PauseTiming();
                Db.Exec("DELETE FROM " + strTable);
                State.ResumeTiming();
            }
            fnWork(i++ % kRecords);
        }
    }

    Database Db;
    std::unique_ptr<VornJsonDbApi> pHandle;
    std::string strTable;
    Json::ArrayIndex nWidth;
    std::vector<Json::Value> vecRecords;
    std::vector<Json::Value> vecQueries;
    std::vector<std::string> vecCreateTexts;
    std::vector<std::string> vecGetTexts;
};

void CreateColumns(benchmark::State& State) {
    WideTable All(static_cast<int>(State.range(0)));
    All.Measure(State, true, [&](size_t i) { All.Create(All.vecRecords[i]); });
}
BENCHMARK(CreateColumns)->Apply(ColumnCounts);

// The same texts without the library: how SQLite's own cost grows.
void ExecCreateColumns(benchmark::State& State) {
    WideTable All(static_cast<int>(State.range(0)));
    All.Measure(State, true, [&](size_t i) { All.Db.Exec(All.vecCreateTexts[i]); });
}
BENCHMARK(ExecCreateColumns)->Apply(ColumnCounts);

void GetColumns(benchmark::State& State) {
    WideTable All(static_cast<int>(State.range(0)));
    All.Measure(State, false, [&](size_t i) { All.Get(All.vecQueries[i]); });
}
BENCHMARK(GetColumns)->Apply(ColumnCounts);

void ExecGetColumns(benchmark::State& State) {
    WideTable All(static_cast<int>(State.range(0)));
    All.Measure(State, false, [&](size_t i) { All.Db.Exec(All.vecGetTexts[i]); });
}
BENCHMARK(ExecGetColumns)->Apply(ColumnCounts);

// One text of the given length beside seven short ones.
void CreateText(benchmark::State& State) {
    const auto nBytes = static_cast<size_t>(State.range(0));
    const Database Db;
    const auto pHandle = EightTexts().Open(Db.Get());
    Json::Value jRecord;
    for (int i = 0; i < 8; ++i) {
        jRecord["text" + std::to_string(i)] = "a short text";
    }
    jRecord["text0"] = std::string(nBytes, 'x');
    int nStored = 0;
    for (auto _ : State) {
        Json::Value jStored;
        Require(pHandle->recCreate(jRecord, jStored) == 0, "recCreate");
        if (++nStored % 16 == 0) {
            // However long the measurement takes, the table must not grow.
            State.PauseTiming();
            Db.Exec("DELETE FROM texts");
            State.ResumeTiming();
        }
    }
    CountUnits(State, "byte", static_cast<int>(nBytes));
}
BENCHMARK(CreateText)->RangeMultiplier(8)->Range(16, 1 << 20)->Unit(benchmark::kMicrosecond);

}  // namespace
