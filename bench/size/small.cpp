// A small program on a small device, twice: built plainly, and with VORN_BENCH_WITHOUT, which
// leaves the calls of VORN_JSON_DB::Table out and keeps the rest. The difference in size is what
// the calls pull in. See scripts/bench-size.sh.

#ifndef VORN_BENCH_WITHOUT
#include <VornJsonDbTable.h>
#endif

#include <iostream>

#include <json/json.h>
#include <sqlite3.h>

namespace {

#ifdef VORN_BENCH_WITHOUT

bool Work(sqlite3*, const Json::Value&, const Json::Value&, Json::Value&) {
    return true;
}

#else

bool Work(sqlite3* pDb, const Json::Value& jDefinition, const Json::Value& jRecord,
          Json::Value& jOut) {
    VORN_JSON_DB::Options How;
    How.blCreateTable = true;
    VORN_JSON_DB::Table Tasks;
    return Tasks.Open(pDb, "task", jDefinition, How).Ok() && Tasks.Create(jRecord, &jOut).Ok() &&
           Tasks.Get(jRecord["id"], jOut).Ok() && Tasks.List({}, jOut).Ok() &&
           Tasks.First(VORN_JSON_DB::Query(jRecord["query"]), jOut).Ok();
}

#endif

}  // namespace

int main() {
    Json::Value jDefinition;
    Json::Value jRecord;
    Json::Value jOut;
    std::cin >> jDefinition >> jRecord;
    sqlite3* pDb = nullptr;
    const bool blDone = sqlite3_open("task.db", &pDb) == SQLITE_OK &&
                        sqlite3_exec(pDb, "BEGIN", nullptr, nullptr, nullptr) == SQLITE_OK &&
                        Work(pDb, jDefinition, jRecord, jOut) &&
                        sqlite3_exec(pDb, "COMMIT", nullptr, nullptr, nullptr) == SQLITE_OK;
    sqlite3_close(pDb);
    std::cout << jOut << '\n';
    return blDone ? 0 : 1;
}
