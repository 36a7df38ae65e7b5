// Cost against the number of rows.

#include <malloc.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <string>
#include <vector>

#include "../support/SqlCapture.h"
#include "../support/TypedList.h"
#include "Scale.h"

namespace {

using namespace bench;

// CPU time in seconds of a work that runs in a process of its own, forked from this one. Memory
// that earlier lists have used and freed would make the next ones faster or slower, depending on
// what they were; so every list is the first of its process, and free memory is
// handed back before: a fork would have to copy it. fnTouch runs unmeasured before the work, so
// that the pages of code that the new process has yet to map do not weigh on the short lists alone.
template <class Touch, class Work>
double SecondsInFork(Touch&& fnTouch, Work&& fnWork) {
    auto* pSeconds = static_cast<double*>(
        mmap(nullptr, sizeof(double), PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0));
    Require(pSeconds != MAP_FAILED, "mmap");
    malloc_trim(0);
    if (fork() == 0) {
        fnTouch();
        const double dStart = CpuNow();
        const Json::Value jResult = fnWork();
        *pSeconds = (CpuNow() - dStart) / 1e9;
        _exit(0);
    }
    int nStatus = 0;
    wait(&nStatus);
    Require(nStatus == 0, "a list in a process of its own");
    const double dSeconds = *pSeconds;
    munmap(pSeconds, sizeof(double));
    return dSeconds;
}

void List(benchmark::State& State) {
    const int nRows = static_cast<int>(State.range(0));
    Filled& Source = FilledOnce(nRows);
    Json::Value jAll;
    Json::Value jFirst;
    jFirst["limit"] = 1;
    const auto Rows = [&](Json::Value& jQuery) {
        Json::Value jRows;
        Require(Source.pHandle->recList(jQuery, jRows) == 0, "recList");
        return jRows;
    };
    for (auto _ : State) {
        State.SetIterationTime(SecondsInFork([&] { Rows(jFirst); },
                                             [&] {
                                                 Json::Value jRows = Rows(jAll);
                                                 Require(static_cast<int>(jRows.size()) == nRows,
                                                         "all rows are listed");
                                                 return jRows;
                                             }));
    }
    CountUnits(State, "row", nRows);
}
// What the machine itself adds as the rows outgrow its caches shows here as well.
void ListByHand(benchmark::State& State) {
    const int nRows = static_cast<int>(State.range(0));
    Filled& Source = FilledOnce(nRows);
    std::string strSql;
    {
        SqlCapture Capture(Source.Db.Get());
        Json::Value jQuery = ById(0);
        Json::Value jRows;
        Require(Source.pHandle->recList(jQuery, jRows) == 0, "recList");
        strSql = Capture.Take();
        strSql.resize(strSql.find(" WHERE "));
    }
    const TypedList Reader;
    for (auto _ : State) {
        State.SetIterationTime(SecondsInFork(
            [&] { Reader.Read(Source.Db.Get(), strSql + " LIMIT 1"); },
            [&] {
                Json::Value jRows = Reader.Read(Source.Db.Get(), strSql);
                Require(static_cast<int>(jRows.size()) == nRows, "all rows are listed");
                return jRows;
            }));
    }
    CountUnits(State, "row", nRows);
}
void Get(benchmark::State& State) {
    const int nRows = static_cast<int>(State.range(0));
    Filled& Source = FilledOnce(nRows);
    const std::vector<int> vecIds = Shuffled(nRows);
    size_t i = 0;
    for (auto _ : State) {
        Json::Value jQuery = ById(vecIds[i++ % vecIds.size()]);
        Json::Value jFound;
        Require(Source.pHandle->recGetOne(jQuery, jFound) == 1, "recGetOne");
    }
}
// Size by size, so that ours and the hand-written one come right after each other, and a table is
// filled once.
const bool g_blRegistered = [] {
    for (const int nRows : {1000, 10000, 100000, 1000000}) {
        for (auto* pList : {benchmark::RegisterBenchmark("List", List),
                            benchmark::RegisterBenchmark("ListByHand", ListByHand)}) {
            pList->Arg(nRows)->UseManualTime()->Unit(benchmark::kMicrosecond);
        }
        benchmark::RegisterBenchmark("Get", Get)->Arg(nRows)->Unit(benchmark::kMicrosecond);
    }
    return true;
}();

}  // namespace
