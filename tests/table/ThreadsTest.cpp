// Many threads, each with a connection and a Table of its own, on one file with a write-ahead log.
// A program by itself: scripts/test.sh --tsan runs it under ThreadSanitizer.

#include <VornJsonDbTable.h>
#include <unistd.h>

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <thread>
#include <vector>

namespace {

using namespace VORN_JSON_DB;

constexpr int kThreads = 8;
constexpr int kRounds = 25;

std::atomic<int> g_nFailures{0};

void Require(bool blHolds, const std::string& strWhat) {
    if (!blHolds) {
        ++g_nFailures;
        std::printf("FAILED: %s\n", strWhat.c_str());
    }
}

void Require(const Status& Outcome) {
    Require(Outcome.Ok(), Outcome.Message());
}

Json::Value Definition() {
    Json::Value jDefinition;
    Json::Value& jTable = jDefinition["reading"];
    jTable["key"] = "id";
    for (const char* szMember : {"id", "owner", "value"}) {
        jTable["member"][szMember]["cpptype"] = "long long";
    }
    jTable["member"]["tags"]["cpptype"] = "Json::arrayValue";
    return jDefinition;
}

sqlite3* Open(const std::string& strPath) {
    sqlite3* pDb = nullptr;
    Require(sqlite3_open(strPath.c_str(), &pDb) == SQLITE_OK, "open the file");
    return pDb;
}

Json::Value Record(int nId, int nOwner) {
    Json::Value jRecord;
    jRecord["id"] = nId;
    jRecord["owner"] = nOwner;
    jRecord["value"] = 0;
    jRecord["tags"].append("it's " + std::to_string(nId));
    return jRecord;
}

Options HowToOpen() {
    Options How;
    How.blCreateTable = true;
    How.nWaitMs = 60000;  // the sanitizer is slow, and so may be the machine
    return How;
}

// Every round leaves two records of this thread behind.
void RunRound(Table& Readings, int nOwner, int nRound) {
    const int nFirst = 1 + (nRound * kThreads + nOwner) * 3;
    Json::Value jOwn, jSet, jRecords, jStored;
    jOwn["where"]["owner"] = nOwner;
    jSet["value"] = nRound;
    Require(Readings.Create(Record(nFirst, nOwner), &jStored));
    Require(Readings.Save(Record(nFirst, nOwner), OnDuplicate::kUpsert));
    {
        Loader Into;
        Require(Into.Start(Readings));
        Require(Into.Add(Record(nFirst + 1, nOwner)));
        Require(Into.Add(Record(nFirst + 2, nOwner)));
        Require(Into.Commit());
    }
    Transaction Both;
    Require(Both.Begin(Readings.Connection(), Transaction::Mode::kImmediate, 60000));
    Require(Readings.Update(jOwn, jSet));
    Require(Readings.Remove(Query().Where("id", nFirst + 2)));
    Require(Both.Commit());
    Require(Readings.List(jOwn, jRecords));
    Require(static_cast<int>(jRecords.size()) == 2 * (nRound + 1), "a thread sees its own records");
    for (const Json::Value& jRecord : jRecords) {
        Require(jRecord["value"] == nRound, "a thread sees its own update");
    }
}

void RunThread(const std::string& strPath, int nOwner) {
    sqlite3* pDb = Open(strPath);
    {
        Table Readings;
        Require(Readings.Open(pDb, "reading", Definition(), HowToOpen()));
        for (int nRound = 0; nRound < kRounds; ++nRound) {
            RunRound(Readings, nOwner, nRound);
        }
    }
    Require(sqlite3_close(pDb) == SQLITE_OK, "close the file");
}

void CheckFile(const std::string& strPath) {
    sqlite3* pDb = Open(strPath);
    {
        Table Readings;
        std::int64_t nRecords = 0;
        Require(Readings.Open(pDb, "reading", Definition(), HowToOpen()));
        Require(Readings.Count(Query(), nRecords));
        Require(nRecords == 2 * kThreads * kRounds, "all records are there");
    }
    Require(sqlite3_close(pDb) == SQLITE_OK, "close the file");
}

}  // namespace

int main() {
    std::string strFolder = "/tmp/vornjsondb-XXXXXX";
    Require(mkdtemp(strFolder.data()) != nullptr, "make a folder");
    const std::string strPath = strFolder + "/threads.db";
    sqlite3* pDb = Open(strPath);
    Require(sqlite3_exec(pDb, "PRAGMA journal_mode=WAL", nullptr, nullptr, nullptr) == SQLITE_OK,
            "write-ahead log");
    std::vector<std::thread> vecThreads;
    for (int nOwner = 0; nOwner < kThreads; ++nOwner) {
        vecThreads.emplace_back(RunThread, strPath, nOwner);
    }
    for (std::thread& Each : vecThreads) {
        Each.join();
    }
    CheckFile(strPath);
    sqlite3_close(pDb);
    unlink(strPath.c_str());
    rmdir(strFolder.c_str());
    std::printf("%d threads, %d rounds each, %d failures\n", kThreads, kRounds, g_nFailures.load());
    return g_nFailures == 0 ? 0 : 1;
}
