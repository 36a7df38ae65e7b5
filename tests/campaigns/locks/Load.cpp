// The load: workers that know what their rows are.

#include "Load.h"

#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <map>
#include <thread>

namespace campaign {

namespace {

constexpr char kTable[] = "load";
constexpr int kProcesses = 8;

}  // namespace

std::unique_ptr<VornJsonDbApi> LoadHandle(const Database& db) {
    return NewHandle(
        db.Get(), kTable, Definition(kTable, "id:int,name:string,owner:int,text:string"),
        "CREATE TABLE IF NOT EXISTS load (id INTEGER PRIMARY KEY, name TEXT UNIQUE, owner INTEGER, "
        "text TEXT)");
}

Json::Value LoadRecord(int nKey, int nOwner, const std::string& strText) {
    Json::Value jRecord;
    jRecord["id"] = nKey;
    jRecord["name"] = "name-" + std::to_string(nKey);
    jRecord["owner"] = nOwner;
    jRecord["text"] = strText;
    return jRecord;
}

std::string NewLoadFile(const char* szMode) {
    const std::string strPath = TempFolder() + "/locks.db";
    RemoveDatabase(strPath);
    const Database db(strPath);
    db.Run(std::string("PRAGMA journal_mode=") + szMode);
    LoadHandle(db);
    db.Run("INSERT INTO load VALUES (0, 'name-0', -1, '0')");
    return strPath;
}

namespace {

using Clock = std::chrono::steady_clock;

class Worker {
  public:
    Worker(const Database& db, int nOwner, std::uint64_t nSeed)
        : m_db(db), m_pHandle(LoadHandle(db)), m_nOwner(nOwner), m_random(nSeed) {}

    void Step() {
        const int nKey = 1 + m_nOwner + kProcesses * m_random.Below(40);
        const bool blThere = m_rows.count(nKey) > 0;
        switch (m_random.Below(7)) {
            case 0:
                CountUp();
                break;
            case 1:
                List();
                break;
            case 2:
                Transaction(nKey);
                break;
            case 3:
                blThere ? Delete(nKey) : Create(nKey);
                break;
            default:
                blThere ? Update(nKey) : Create(nKey);
        }
    }

    Json::Value Result() const {
        Json::Value jResult;
        jResult["counted"] = m_nCounted;
        jResult["rows"] = Json::Value(Json::objectValue);
        for (const auto& row : m_rows) {
            jResult["rows"][std::to_string(row.first)] = row.second;
        }
        return jResult;
    }

  private:
    // One call; returns whether it succeeded. A failure is right after all attempts only.
    bool Do(const char* szName, const std::function<int()>& fn) {
        TakePauses();
        const Clock::time_point start = Clock::now();
        m_nLast = fn();
        const auto nWait =
            std::chrono::duration_cast<std::chrono::microseconds>(Clock::now() - start).count();
        m_nPauses = TakePauses().nCount;
        AddTo(Figure("operations under load"), 1);
        AddTo(Figure("retries"), static_cast<std::uint64_t>(m_nPauses));
        RaiseTo(Figure("most retries of one operation"), static_cast<std::uint64_t>(m_nPauses));
        RaiseTo(Figure("longest operation, microseconds"), static_cast<std::uint64_t>(nWait));
        if (m_nLast < 0 && m_nPauses >= kAttempts) {
            AddTo(Figure("given up after 500 attempts"), 1);
        } else if (m_nLast < 0 && !IsRepeated(szName)) {
            Violation(std::string(szName) + " failed after " + std::to_string(m_nPauses) +
                      " pauses");
        }
        return m_nLast >= 0;
    }

    bool IsRepeated(const std::string& strName) const {
        return strName == "recCreate" && m_nPauses > 0;
    }

    std::string Text() { return std::to_string(m_random.Next()); }

    std::string Stored(int nKey) const {
        return m_db.Rows("SELECT text FROM load WHERE id=" + std::to_string(nKey));
    }

    void Create(int nKey) {
        Json::Value jRecord = LoadRecord(nKey, m_nOwner, Text());
        const std::string strText = jRecord["text"].asString();
        m_pHandle->setErrMsg("");
        if (Do("recCreate", [&] { return m_pHandle->recCreate(jRecord, jRecord); })) {
            m_rows[nKey] = strText;
            return;
        }
        // Its text has two statements: when the second met the lock, the first was run again, and
        // found its own row there.
        if (m_nPauses < kAttempts) {
            Expect(m_pHandle->getErrMsg() == "DUPLICATE_PRIMARY_KEY",
                   [] { return std::string("recCreate failed without a duplicate"); });
            AddTo(Figure("created, answer lost to a lock"), 1);
        }
        Resync(nKey, strText);
    }

    // A call that gave up may have stored its row all the same.
    void Resync(int nKey, const std::string& strText) {
        std::string strNow = "error";
        for (int i = 0; i < 10000 && strNow.compare(0, 5, "error") == 0; ++i) {
            // The others hold the file most of the time, and their writes may take long.
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
            strNow = Stored(nKey);
        }
        Expect(strNow.compare(0, 5, "error") != 0,
               [&] { return "the row could not be looked at: " + strNow; });
        if (strNow == "'" + strText + "'\n") {
            m_rows[nKey] = strText;
        }
    }

    void Update(int nKey) {
        Json::Value jFilter;
        jFilter["id"] = nKey;
        Json::Value jNew;
        jNew["text"] = Text();
        if (m_random.OneIn(3)) {
            Json::Value jRecord = LoadRecord(nKey, m_nOwner, jNew["text"].asString());
            const std::string strText = jNew["text"].asString();
            if (Do("recSave", [&] { return m_pHandle->recSave(jRecord, false); })) {
                m_rows[nKey] = strText;
            } else {
                Resync(nKey, strText);
            }
        } else if (Do("recUpdateByFilter",
                      [&] { return m_pHandle->recUpdateByFilter(jFilter, jNew); })) {
            m_rows[nKey] = jNew["text"].asString();
        }
    }

    void Delete(int nKey) {
        std::string strName = "name-" + std::to_string(nKey);
        if (Do("recDeleteByName", [&] { return m_pHandle->recDeleteByName(strName, "name"); })) {
            Expect(m_nLast == 1, [&] { return "deleted " + std::to_string(m_nLast) + " rows"; });
            m_rows.erase(nKey);
        }
    }

    void CountUp() {
        const std::string strSql = "UPDATE load SET text = text + 1 WHERE id = 0";
        if (Do("runSqlEx", [&] { return m_pHandle->runSqlEx(strSql); })) {
            Expect(m_nLast == 1, [] { return std::string("the counter is not there"); });
            ++m_nCounted;
        }
    }

    void List() {
        Json::Value jQuery;
        jQuery["owner"] = m_nOwner;
        Json::Value jRows(Json::arrayValue);
        if (!Do("recList", [&] {
                jRows.clear();
                return m_pHandle->recList(jQuery, jRows);
            })) {
            return;
        }
        std::map<int, std::string> rows;
        for (const Json::Value& jRow : jRows) {
            rows[jRow["id"].asInt()] = jRow["text"].asString();
        }
        Expect(rows == m_rows, [] { return std::string("listed other rows than were stored"); });
    }

    void Transaction(int nKey) {
        if (!Do("BEGIN", [&] { return m_pHandle->runSqlEx("BEGIN IMMEDIATE"); })) {
            return;
        }
        const std::map<int, std::string> before = m_rows;
        m_rows.count(nKey) > 0 ? Update(nKey) : Create(nKey);
        m_rows.count(nKey) > 0 ? Update(nKey) : Create(nKey);
        const bool blCommit = !m_random.OneIn(4);
        if (!blCommit || !Do("COMMIT", [&] { return m_pHandle->runSqlEx("COMMIT"); })) {
            m_pHandle->runSqlEx("ROLLBACK");
            m_rows = before;
        }
    }

    const Database& m_db;
    std::unique_ptr<VornJsonDbApi> m_pHandle;
    int m_nOwner;
    Random m_random;
    std::map<int, std::string> m_rows;
    int m_nCounted = 0;
    int m_nLast = 0;
    int m_nPauses = 0;
};

void RunWorker(const std::string& strPath, int nOwner, std::uint64_t nSeed, int nMilliseconds) {
    const Clock::time_point end = Clock::now() + std::chrono::milliseconds(nMilliseconds);
    const Database db(strPath);
    Worker worker(db, nOwner, nSeed);
    while (Clock::now() < end) {
        worker.Step();
    }
    WriteFile(strPath + "." + std::to_string(nOwner), ToText(worker.Result()));
}

void CheckFile(const std::string& strPath) {
    std::map<int, std::string> rows;
    int nCounted = 0;
    for (int i = 0; i < kProcesses; ++i) {
        const Json::Value jResult = FromText(ReadFile(strPath + "." + std::to_string(i)));
        nCounted += jResult["counted"].asInt();
        for (const std::string& strKey : jResult["rows"].getMemberNames()) {
            rows[std::stoi(strKey)] = jResult["rows"][strKey].asString();
        }
    }
    std::string strWanted = "0|'" + std::to_string(nCounted) + "'\n";
    for (const auto& row : rows) {
        strWanted += std::to_string(row.first) + "|'" + row.second + "'\n";
    }
    const Database db(strPath);
    Expect(db.Rows("SELECT id, text FROM load ORDER BY id") == strWanted,
           [] { return std::string("under load: the file holds other rows than were stored"); });
    Expect(db.Rows("PRAGMA integrity_check") == "'ok'\n",
           [] { return std::string("the database is damaged"); });
}

}  // namespace

void RunLoad(const char* szMode, std::uint64_t nSeed, int nMilliseconds) {
    const std::string strPath = NewLoadFile(szMode);
    g_pfnOnPause = nullptr;
    pid_t aChildren[kProcesses] = {};
    for (int i = 0; i < kProcesses; ++i) {
        aChildren[i] = fork();
        if (aChildren[i] == 0) {
            RunWorker(strPath, i, nSeed * kProcesses + static_cast<std::uint64_t>(i),
                      nMilliseconds);
            _exit(0);
        }
    }
    for (const pid_t nChild : aChildren) {
        int nStatus = 0;
        waitpid(nChild, &nStatus, 0);
        Expect(nStatus == 0, [&] { return "a process ended with " + std::to_string(nStatus); });
    }
    CheckFile(strPath);
}

}  // namespace campaign
