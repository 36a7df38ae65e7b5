// vornjsondb_instructions WORK: fixed work for counting instructions; scripts/bench-instructions.sh
// runs it under callgrind, which collects only inside MeasuredWork. Prints how many units (calls,
// or cells of a list) the count is to be divided by.
//
// WORK is one of: create, get, update, delete, list.

#include <cstdio>
#include <cstring>
#include <memory>
#include <vector>

#include "support/Bench.h"
#include "support/Records.h"

namespace {

using namespace bench;

constexpr int kRows = 1000;
constexpr int kColumns = 8;
constexpr int kCalls = 200;
constexpr int kFirstCall = 20;  // calls before it, unmeasured, fill caches

// Everything that a work needs, made before it is measured.
struct Stage {
    Stage() : pHandle(EightMembers().Open(Db.Get())), vecRecords(EightMemberRecords(2 * kRows)) {
        Db.Exec("BEGIN");
        for (int i = 0; i < kRows; ++i) {
            Json::Value jStored;
            Require(pHandle->recCreate(vecRecords[static_cast<size_t>(i)], jStored) == 0, "fill");
            vecQueries.push_back(ById(i * 7 % kRows));
        }
        vecResults.resize(kCalls);
        jChange["city"] = "Depot 100";
        jChange["level"] = 12;
        jChange["note"] = "moved to the yard";
    }

    Database Db;
    std::unique_ptr<VornJsonDbApi> pHandle;
    std::vector<Json::Value> vecRecords;
    std::vector<Json::Value> vecQueries;
    Json::Value jChange;
    Json::Value jNoCondition;
    std::vector<Json::Value> vecResults;
};

void Create(Stage& On, size_t i) {
    Require(On.pHandle->recCreate(On.vecRecords[kRows + i], On.vecResults[i]) == 0, "create");
}

void Get(Stage& On, size_t i) {
    Require(On.pHandle->recGetOne(On.vecQueries[i], On.vecResults[i]) == 1, "get");
}

void Update(Stage& On, size_t i) {
    Require(On.pHandle->recUpdateByFilter(On.vecQueries[i], On.jChange) == 0, "update");
}

void Delete(Stage& On, size_t i) {
    Require(On.pHandle->recDelete(On.vecQueries[i]) == 1, "delete");
}

void List(Stage& On, size_t i) {
    Require(On.pHandle->recList(On.jNoCondition, On.vecResults[i]) == 0, "list");
    Require(On.vecResults[i].size() == kRows, "all rows are listed");
}

struct Work {
    const char* szName;
    void (*pfnCall)(Stage& On, size_t i);
    int nFirst;
    int nLast;
    int nUnits;
};

constexpr Work kWorks[] = {
    {"create", Create, kFirstCall, kCalls, kCalls - kFirstCall},
    {"get", Get, kFirstCall, kCalls, kCalls - kFirstCall},
    {"update", Update, kFirstCall, kCalls, kCalls - kFirstCall},
    {"delete", Delete, kFirstCall, kCalls, kCalls - kFirstCall},
    {"list", List, 1, 3, 2 * kRows* kColumns},
};

// The counting goes by this function's name.
__attribute__((noinline, noclone)) void MeasuredWork(Stage& On, const Work& One) {
    for (int i = One.nFirst; i < One.nLast; ++i) {
        One.pfnCall(On, static_cast<size_t>(i));
    }
}

}  // namespace

int main(int argc, char** argv) {
    for (const Work& One : kWorks) {
        if (argc == 2 && std::strcmp(One.szName, argv[1]) == 0) {
            Stage On;
            for (int i = 0; i < One.nFirst; ++i) {
                One.pfnCall(On, static_cast<size_t>(i));
            }
            MeasuredWork(On, One);
            std::printf("%d\n", One.nUnits);
            return 0;
        }
    }
    std::fprintf(stderr, "usage: vornjsondb_instructions create|get|update|delete|list\n");
    return 2;
}
