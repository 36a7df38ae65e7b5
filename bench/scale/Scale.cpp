// vornjsondb_scale: how the cost of a call changes with rows, columns, tables, length of texts and
// processes. Takes the options of Google Benchmark.

#include "Scale.h"

namespace bench {

Filled::Filled(int nRows) : pHandle(EightMembers().Open(Db.Get())) {
    Db.Exec("BEGIN");
    for (int i = 0; i < nRows; ++i) {
        Json::Value jRecord = EightMemberRecord(i);
        Json::Value jStored;
        Require(pHandle->recCreate(jRecord, jStored) == 0, "filling the table");
    }
}

Filled& FilledOnce(int nRows) {
    static std::unique_ptr<Filled> s_pFilled;
    static int s_nRows = 0;
    if (s_nRows != nRows) {
        s_pFilled.reset();
        s_pFilled = std::make_unique<Filled>(nRows);
        s_nRows = nRows;
    }
    return *s_pFilled;
}

void CountUnits(benchmark::State& State, const char* szName, int nUnits) {
    State.counters[szName] = benchmark::Counter(
        nUnits, benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
}

}  // namespace bench

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
