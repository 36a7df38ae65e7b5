// vornjsondb_instructions WORK: fixed work for counting instructions; scripts/bench-instructions.sh
// runs it under callgrind, which collects only inside MeasuredWork. Prints how many units (calls,
// or cells of a list) the count is to be divided by.
//
// WORK is one of the names in kWorks. Those that begin with "table-" are calls of the second
// handle, and those with "hand-" the same work by hand, with the same statements prepared once.

#include <cstdio>
#include <cstring>
#include <memory>
#include <vector>

#include "support/Bench.h"
#include "support/Records.h"
#include "support/TableStore.h"

namespace {

using namespace bench;

constexpr int kRows = 1000;
constexpr int kColumns = 8;
constexpr int kCalls = 200;
constexpr int kFirstCall = 20;  // calls before it, unmeasured, fill caches

// Which tables have rows: the old handle's, or the second one's and the one by hand.
enum Tables { kOld, kTable };

// Everything that a work needs, made before it is measured.
struct Stage {
    explicit Stage(Tables eNeeded)
        : pHandle(EightMembers().Open(Db.Get())),
          vecRecords(EightMemberRecords(2 * kRows)),
          Second(eNeeded == kTable ? kRows : 0),
          Third(eNeeded == kTable ? kRows : 0) {
        Db.Exec("BEGIN");
        for (int i = 0; i < kRows; ++i) {
            vecQueries.push_back(ById(i * 7 % kRows));
        }
        for (int i = 0; i < kRows && eNeeded == kOld; ++i) {
            Json::Value jStored;
            Require(pHandle->recCreate(vecRecords[static_cast<size_t>(i)], jStored) == 0, "fill");
        }
        vecResults.resize(kCalls);
        jChange["city"] = "Depot 100";
        jChange["level"] = 12;
        jChange["note"] = "moved to the yard";
        RequireOk(Into.Start(Second.Own));
        for (int i = 0; i < kCalls; ++i) {
            vecParts.push_back(EightMemberPart(kRows + i));
        }
    }

    Database Db;
    std::unique_ptr<VornJsonDbApi> pHandle;
    std::vector<Json::Value> vecRecords;
    std::vector<Json::Value> vecQueries;
    Json::Value jChange;
    Json::Value jNoCondition;
    std::vector<Json::Value> vecResults;

    // For the second handle, and for the work by hand.
    TableStore Second;
    TableStore Third;
    ByHand Hand{Third.Db};
    VORN_JSON_DB::Loader Into;
    std::vector<Part> vecParts;
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

void TableCreate(Stage& On, size_t i) {
    RequireOk(On.Second.Own.Create(On.vecRecords[kRows + i], &On.vecResults[i]));
}

void HandCreate(Stage& On, size_t i) {
    On.Hand.Create(On.vecRecords[kRows + i], On.vecResults[i]);
}

void TableGet(Stage& On, size_t i) {
    RequireOk(On.Second.Own.Get(On.vecQueries[i]["id"], On.vecResults[i]));
}

void HandGet(Stage& On, size_t i) {
    On.Hand.Get(On.vecQueries[i]["id"].asInt(), On.vecResults[i]);
}

void TableFirst(Stage& On, size_t i) {
    const auto Which = VORN_JSON_DB::Query().Where("id", On.vecQueries[i]["id"]).Limit(1);
    RequireOk(On.Second.Own.First(Which, On.vecResults[i]));
}

void TableList(Stage& On, size_t i) {
    RequireOk(On.Second.Own.List({}, On.vecResults[i]));
    Require(On.vecResults[i].size() == kRows, "all rows are listed");
}

void HandList(Stage& On, size_t i) {
    On.Hand.List(On.vecResults[i]);
    Require(On.vecResults[i].size() == kRows, "all rows are listed");
}

void TableLoad(Stage& On, size_t i) {
    Load(On.Into, On.vecParts[i]);
}

void TableLoadJson(Stage& On, size_t i) {
    RequireOk(On.Into.Add(On.vecRecords[kRows + i]));
}

void HandLoad(Stage& On, size_t i) {
    On.Hand.Load(On.vecParts[i]);
}

struct Work {
    const char* szName;
    Tables eNeeded;
    void (*pfnCall)(Stage& On, size_t i);
    int nFirst;
    int nLast;
    int nUnits;
};

constexpr Work kWorks[] = {
    {"create", kOld, Create, kFirstCall, kCalls, kCalls - kFirstCall},
    {"get", kOld, Get, kFirstCall, kCalls, kCalls - kFirstCall},
    {"update", kOld, Update, kFirstCall, kCalls, kCalls - kFirstCall},
    {"delete", kOld, Delete, kFirstCall, kCalls, kCalls - kFirstCall},
    {"list", kOld, List, 1, 3, 2 * kRows* kColumns},
    {"table-create", kTable, TableCreate, kFirstCall, kCalls, kCalls - kFirstCall},
    {"hand-create", kTable, HandCreate, kFirstCall, kCalls, kCalls - kFirstCall},
    {"table-get", kTable, TableGet, kFirstCall, kCalls, kCalls - kFirstCall},
    {"table-first", kTable, TableFirst, kFirstCall, kCalls, kCalls - kFirstCall},
    {"hand-get", kTable, HandGet, kFirstCall, kCalls, kCalls - kFirstCall},
    {"table-list", kTable, TableList, 1, 3, 2 * kRows* kColumns},
    {"hand-list", kTable, HandList, 1, 3, 2 * kRows* kColumns},
    {"table-load", kTable, TableLoad, kFirstCall, kCalls, kCalls - kFirstCall},
    {"table-json", kTable, TableLoadJson, kFirstCall, kCalls, kCalls - kFirstCall},
    {"hand-load", kTable, HandLoad, kFirstCall, kCalls, kCalls - kFirstCall},
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
            Stage On(One.eNeeded);
            for (int i = 0; i < One.nFirst; ++i) {
                One.pfnCall(On, static_cast<size_t>(i));
            }
            MeasuredWork(On, One);
            std::printf("%d\n", One.nUnits);
            return 0;
        }
    }
    std::fprintf(stderr, "usage: vornjsondb_instructions WORK\n");
    return 2;
}
