// vornjsondb_peers: creating, fetching and listing records, by this library and by others that are
// found when the benchmarks are configured. Takes the options of Google Benchmark.

#include <benchmark/benchmark.h>

#include "../support/Bench.h"

int main(int argc, char** argv) {
    bench::KeepHeap();
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) {
        return 2;
    }
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
