// What every peer has to do, and the benchmarks that measure it.
//
// A peer is a class of its own file, written as that library's manual recommends, that opens a
// database in memory with the table of eight, inside one transaction, and has
//
//    Record, Records                            its JSON object and its JSON array
//    static Record FromJson(const Json::Value&) unmeasured
//    static Json::Value ToJson(const Records&)  unmeasured; one Record will do as well
//    void Create(const Record& In, Record& Stored)   stores In and reads the row back
//    void Get(int nId, Record& Found)                the row with this key
//    void List(Records& All)                         all rows, in the order of the key
//
// All of them but our own are written for this one table: names and types of its columns stand in
// their source text. Ours takes them from a definition at run time.

#ifndef VORN_BENCH_PEERS_PEER_H
#define VORN_BENCH_PEERS_PEER_H

#include <benchmark/benchmark.h>

#include <string>
#include <vector>

#include <json/json.h>

#include "../support/Bench.h"
#include "../support/Records.h"

namespace bench {

constexpr int kPeerRows = 20000;
constexpr int kPeerCalls = 2000;

// The SQL that the peers share; columns in key order.
#define VORN_PEER_COLUMNS "active, amount, city, id, level, name, note, tags"
constexpr char kPeerInsert[] =
    "INSERT INTO part (" VORN_PEER_COLUMNS ") VALUES (?, ?, ?, ?, ?, ?, ?, ?)";
constexpr char kPeerSelect[] = "SELECT " VORN_PEER_COLUMNS " FROM part";
constexpr char kPeerSelectStored[] =
    "SELECT " VORN_PEER_COLUMNS " FROM part WHERE rowid = last_insert_rowid()";
constexpr char kPeerSelectByKey[] = "SELECT " VORN_PEER_COLUMNS " FROM part WHERE id = ?";

// Base of those whose records are JsonCpp's.
struct JsonCppPeer {
    using Record = Json::Value;
    using Records = Json::Value;
    static const Record& FromJson(const Json::Value& jRecord) { return jRecord; }
    static const Json::Value& ToJson(const Records& All) { return All; }
};

// One peer with the rows 0 to kPeerRows - 1, for all its measurements of reading. Every record is
// compared on its way in and on its way out. The peer is never destroyed: at the end of the program
// its library may already be unloaded.
template <class Peer>
Peer& FilledPeer() {
    static Peer* s_pPeer = nullptr;
    if (s_pPeer == nullptr) {
        s_pPeer = new Peer;
        Json::Value jExpected(Json::arrayValue);
        for (int i = 0; i < kPeerRows; ++i) {
            const Json::Value& jRecord = jExpected.append(EightMemberRecord(i));
            typename Peer::Record Stored;
            s_pPeer->Create(Peer::FromJson(jRecord), Stored);
            Require(Peer::ToJson(Stored) == jRecord, "a peer stores what it is given");
        }
        typename Peer::Record Found;
        s_pPeer->Get(kPeerRows / 2, Found);
        Require(Peer::ToJson(Found) == EightMemberRecord(kPeerRows / 2), "a peer finds by key");
        typename Peer::Records All;
        s_pPeer->List(All);
        Require(Peer::ToJson(All) == jExpected, "a peer lists what was stored");
    }
    return *s_pPeer;
}

template <class Peer>
void Create(benchmark::State& State) {
    FilledPeer<Peer>();
    Peer Fresh;
    std::vector<typename Peer::Record> vecIn;
    for (int i = 0; i < kPeerCalls; ++i) {
        vecIn.push_back(Peer::FromJson(EightMemberRecord(i)));
    }
    std::vector<typename Peer::Record> vecStored(static_cast<size_t>(kPeerCalls));
    size_t i = 0;
    for (auto _ : State) {
        Fresh.Create(vecIn[i], vecStored[i]);
        ++i;
    }
}

template <class Peer>
void Get(benchmark::State& State) {
    Peer& Source = FilledPeer<Peer>();
    const std::vector<int> vecIds = Shuffled(kPeerRows);
    std::vector<typename Peer::Record> vecFound(static_cast<size_t>(kPeerCalls));
    size_t i = 0;
    for (auto _ : State) {
        Source.Get(vecIds[i], vecFound[i]);
        ++i;
    }
}

template <class Peer>
void List(benchmark::State& State) {
    Peer& Source = FilledPeer<Peer>();
    typename Peer::Records All;
    for (auto _ : State) {
        Source.List(All);
        State.PauseTiming();
        All = typename Peer::Records();
        State.ResumeTiming();
    }
}

// Fixed numbers of calls: every peer's table has grown to the same size at the same call.
#define VORN_BENCH_PEER(Peer)                                 \
    BENCHMARK_TEMPLATE(Create, Peer)->Iterations(kPeerCalls); \
    BENCHMARK_TEMPLATE(Get, Peer)->Iterations(kPeerCalls);    \
    BENCHMARK_TEMPLATE(List, Peer)->Iterations(2)->Unit(benchmark::kMicrosecond)

}  // namespace bench

#endif  // VORN_BENCH_PEERS_PEER_H
