// Shared by the benchmarks of this folder.

#ifndef VORN_BENCH_SCALE_SCALE_H
#define VORN_BENCH_SCALE_SCALE_H

#include <VornJsonDbApi.h>

#include <benchmark/benchmark.h>

#include <memory>

#include "../support/Bench.h"
#include "../support/Records.h"

namespace bench {

// A database with nRows rows in the table of eight, inside one transaction.
struct Filled {
    explicit Filled(int nRows);

    Database Db;
    std::unique_ptr<VornJsonDbApi> pHandle;
};

// The table of this size. The one before it is closed first: large ones take time and memory.
Filled& FilledOnce(int nRows);

// Time for one of nUnits parts of each iteration, shown beside the time of the whole.
void CountUnits(benchmark::State& State, const char* szName, int nUnits);

}  // namespace bench

#endif  // VORN_BENCH_SCALE_SCALE_H
