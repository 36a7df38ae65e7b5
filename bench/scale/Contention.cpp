// Several processes that create records in one database file, each record a transaction of its own.
// The time is that of the whole: most of it is waiting, for the disk and for each other.
//
// The transaction is begun by hand: a lock that is met between the INSERT and the read-back of a
// record would have the whole text run again, and its key would be there already.

#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <string>

#include "Scale.h"

namespace {

using namespace bench;

constexpr int kCreatesPerProcess = 40;

class TemporaryFolder {
  public:
    TemporaryFolder() {
        std::string strTemplate = std::filesystem::temp_directory_path() / "vornjsondb-XXXXXX";
        Require(mkdtemp(strTemplate.data()) != nullptr, "temporary folder");
        m_strPath = strTemplate;
    }
    ~TemporaryFolder() { std::filesystem::remove_all(m_strPath); }
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    std::string File(const char* szName) const { return m_strPath + "/" + szName; }

  private:
    std::string m_strPath;
};

bool CreateAlone(VornJsonDbApi& Handle, int nId) {
    Json::Value jRecord = EightMemberRecord(nId);
    Json::Value jStored;
    if (Handle.runSqlEx("BEGIN IMMEDIATE") < 0) {
        return false;
    }
    if (Handle.recCreate(jRecord, jStored) == 0 && Handle.runSqlEx("COMMIT") >= 0) {
        return true;
    }
    Handle.runSqlEx("ROLLBACK");
    return false;
}

// Runs in a process of its own: keys from nFirst on. The status is the number of failures.
[[noreturn]] void CreateAll(const std::string& strFile, int nFirst) {
    const Database Db(strFile.c_str());
    const auto pHandle = EightMembers().Open(Db.Get());
    int nFailed = 0;
    for (int i = nFirst; i < nFirst + kCreatesPerProcess; ++i) {
        nFailed += CreateAlone(*pHandle, i) ? 0 : 1;
    }
    _exit(nFailed);
}

int CountRows(const std::string& strFile) {
    const Database Db(strFile.c_str());
    const auto pHandle = EightMembers().Open(Db.Get());
    Json::Value jAll;
    Json::Value jRows;
    Require(pHandle->recList(jAll, jRows) == 0, "recList");
    return static_cast<int>(jRows.size());
}

void CreateContended(benchmark::State& State) {
    const int nProcesses = static_cast<int>(State.range(0));
    for (auto _ : State) {
        State.PauseTiming();
        const TemporaryFolder Folder;
        const std::string strFile = Folder.File("contended.db");
        CountRows(strFile);  // makes the table
        State.ResumeTiming();
        for (int n = 0; n < nProcesses; ++n) {
            if (fork() == 0) {
                CreateAll(strFile, n * kCreatesPerProcess);
            }
        }
        int nFailed = 0;
        for (int n = 0; n < nProcesses; ++n) {
            int nStatus = 0;
            wait(&nStatus);
            Require(WIFEXITED(nStatus), "a process that creates records");
            nFailed += WEXITSTATUS(nStatus);
        }
        State.PauseTiming();
        Require(CountRows(strFile) == nProcesses * kCreatesPerProcess - nFailed,
                "all records are there, but for those that were reported as failed");
        State.counters["failed"] = nFailed;
        State.ResumeTiming();
    }
    CountUnits(State, "record", nProcesses * kCreatesPerProcess);
}
BENCHMARK(CreateContended)
    ->Arg(1)
    ->Arg(2)
    ->Arg(4)
    ->Arg(8)
    ->UseRealTime()
    ->Iterations(1)
    ->Repetitions(3)
    ->Unit(benchmark::kMillisecond);

}  // namespace
