// The library's cost in ratios, each against the least that the same work can cost.
//
//    vornjsondb_ratios [--short] [--json FILE] [FILTER]
//
// Only the rows whose name contains FILTER are measured. --short takes a fifth of the time and
// suits a first look. A row is measured in turns with what it is compared with, in this process;
// every figure is a median of rounds, and of three passes over all rows. The status is 1 when a
// goal is missed.

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include <json/json.h>

#include "RatioRows.h"
#include "support/Bench.h"

namespace {

using namespace bench;

struct Row {
    const char* szName;
    const char* szWork;
    const char* szAgainst;
    double dGoal;  // 0: printed only
    Figure (*pfnMeasure)(const Settings& Now);
};

// clang-format off
constexpr Row kRows[] = {
    {"create", "recCreate", "sqlite3_exec of the same text", 1.25, CreateRatio},
    {"get", "recGetOne by key in 20,000 rows", "sqlite3_exec of the same text", 1.22, GetRatio},
    {"list", "recList of 20,000 rows, per row", "hand-written typed reader", 0.58, ListRatio},
    {"update", "recUpdateByFilter by key", "sqlite3_exec of the same text", 1.18, UpdateRatio},
    {"delete", "recDelete by key", "sqlite3_exec of the same text", 1.12, DeleteRatio},
    {"values", "value list, per column at 512 columns", "per column at 64", 1.10, ValueListRatio},
    {"names", "names list, per column at 512 columns", "per column at 64", 1.10, NamesListRatio},
    {"text-1M", "recCreate, 1 MiB in the first of 8", "sqlite3_exec of the same text", 1.15, OneLongTextRatio},
    {"text-8x64K", "recCreate, 64 KiB in each of 8", "sqlite3_exec of the same text", 1.15, EightLongTextsRatio},
    {"peak", "peak memory of recList, 200,000 rows", "the finished array", 1.05, PeakMemoryRatio},
    {"handle", "construct and destroy a handle", "sqlite3_exec of its CREATE", 0, HandleRatio},
    {"load", "dlopen, its dependencies loaded", "dlopen of libsqlite3", 0, LoadTimeRatio},
    {"relocations", "relocations of the library", "those of libsqlite3", 0, RelocationRatio},
    {"table-create", "Table::Create with the stored row", "by hand, prepared once", 1.15, TableCreateRatio},
    {"table-old", "Table::Create with the stored row", "recCreate", 0.33, TableToOldRatio},
    {"table-get", "Table::Get in 20,000 rows", "by hand, prepared once", 1.15, TableGetRatio},
    {"table-list", "Table::List of 20,000 rows, per row", "hand-written typed reader", 0.60, TableListRatio},
    {"load-set", "Loader, by setters", "hand-written bind loop", 1.10, LoadBySettersRatio},
    {"load-json", "Loader, from Json::Value", "hand-written bind loop", 1.30, LoadFromJsonRatio},
    {"load-same", "Loader, from Json::Value", "bind loop from the same Json::Value", 1.30, LoadSameJsonRatio},
    {"query", "making a query and finding its statement", "Table::First with it", 0.10, QueryShare},
    {"in", "$in with 10,000 values, per value", "per value of 1,000", 1.30, LongInRatio},
    {"size", "stripped library (figure: KiB)", "libsqlite3", 0, StrippedSize},
};
// clang-format on

struct Arguments {
    Settings Now;
    std::string strJson;
    std::string strFilter;
};

// Programs and library lie where the build put them.
Arguments Parse(int argc, char** argv) {
    Arguments All;
    All.Now.strPeakProgram = VORN_BENCH_PEAK;
    All.Now.strLoadProgram = VORN_BENCH_LOAD;
    All.Now.strLibrary = VORN_BENCH_LIBRARY;
    for (int i = 1; i < argc; ++i) {
        if (std::strcmp(argv[i], "--short") == 0) {
            All.Now.blShort = true;
        } else if (std::strcmp(argv[i], "--json") == 0 && i + 1 < argc) {
            All.strJson = argv[++i];
        } else {
            Require(argv[i][0] != '-', "usage: vornjsondb_ratios [--short] [--json FILE] [FILTER]");
            All.strFilter = argv[i];
        }
    }
    return All;
}

const char* Verdict(const Row& One, const Figure& Found) {
    if (One.dGoal <= 0) {
        return "";
    }
    return Found.dFigure <= One.dGoal ? "met" : "MISSED";
}

Json::Value ToJson(const Row& One, const Figure& Found) {
    Json::Value jRow;
    jRow["name"] = One.szName;
    jRow["work"] = One.szWork;
    jRow["against"] = One.szAgainst;
    jRow["unit"] = Found.szUnit;
    jRow["ours"] = Found.dOurs;
    jRow["other"] = Found.dOther;
    jRow["figure"] = Found.dFigure;
    jRow["goal"] = One.dGoal;
    return jRow;
}

void Print(const Row& One, const Figure& Found) {
    std::printf("%-12s %12.1f %12.1f %-6s %8.3f %6.2f  %-6s  %s / %s\n", One.szName, Found.dOurs,
                Found.dOther, Found.szUnit, Found.dFigure, One.dGoal, Verdict(One, Found),
                One.szWork, One.szAgainst);
}

// The one of the passes whose figure is in the middle.
Figure MiddleOf(std::vector<Figure> vecPasses) {
    std::sort(vecPasses.begin(), vecPasses.end(),
              [](const Figure& A, const Figure& B) { return A.dFigure < B.dFigure; });
    return vecPasses[vecPasses.size() / 2];
}

}  // namespace

int main(int argc, char** argv) {
    const Arguments All = Parse(argc, argv);
    KeepHeap();
    std::vector<Row> vecRows;
    std::copy_if(
        std::begin(kRows), std::end(kRows), std::back_inserter(vecRows),
        [&](const Row& One) { return std::strstr(One.szName, All.strFilter.c_str()) != nullptr; });

    // All rows, then all again: what disturbs the machine for some seconds spoils one pass of a
    // row.
    std::vector<std::vector<Figure>> vecFound(vecRows.size());
    for (int n = 0; n < (All.Now.blShort ? 1 : 3); ++n) {
        for (size_t i = 0; i < vecRows.size(); ++i) {
            vecFound[i].push_back(vecRows[i].pfnMeasure(All.Now));
        }
    }

    Json::Value jRows(Json::arrayValue);
    int nMissed = 0;
    std::printf("%-12s %12s %12s %-6s %8s %6s  %-6s  %s\n", "name", "ours", "other", "unit",
                "figure", "goal", "", "work / compared with");
    for (size_t i = 0; i < vecRows.size(); ++i) {
        const Figure Found = MiddleOf(vecFound[i]);
        Print(vecRows[i], Found);
        nMissed += vecRows[i].dGoal > 0 && Found.dFigure > vecRows[i].dGoal ? 1 : 0;
        jRows.append(ToJson(vecRows[i], Found));
    }
    if (!All.strJson.empty()) {
        std::ofstream(All.strJson) << jRows;
    }
    return nMissed == 0 ? 0 : 1;
}
