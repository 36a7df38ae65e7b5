// What the fuzz targets share: a quiet host, a fenced database, and the promises that every call
// must keep whatever it is given.

#ifndef VORNJSONDB_FUZZ_FUZZHOST_H
#define VORNJSONDB_FUZZ_FUZZHOST_H

#include <VornJsonDbApi.h>

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>

namespace fuzzhost {

constexpr size_t kMaxInput = 4096;

// Ends the process with a message that names the broken promise.
void Require(bool blKept, const char* szPromise);

// A database in memory that runs row statements on its own tables and refuses everything else:
// raw filter text reaches SQLite as it stands, and an input must not write files or run for ever.
class Database {
  public:
    explicit Database(const char* szCreate);
    ~Database();
    Database(const Database&) = delete;
    Database& operator=(const Database&) = delete;

    sqlite3* Get() const { return m_pDb; }
    // Runs one statement, which must succeed; strValue is bound to its ?1, if it has one.
    // Returns the first column of the first row.
    std::string Run(const std::string& strSql, const std::string& strValue = "");
    bool Refused() const { return m_blRefused; }  // since the last Rearm
    void Rearm() {  // before each call: time to run, and a clean slate
        m_nTicks = 0;
        m_blRefused = false;
    }

  private:
    static int Authorize(void* pSelf, int nAction, const char*, const char*, const char*,
                         const char*);
    static int Tick(void* pSelf);

    sqlite3* m_pDb = nullptr;
    bool m_blFenced = false;
    bool m_blRefused = false;
    int m_nTicks = 0;
};

// Empties what the library knows of all tables.
void ForgetTables();

// Called before an input's first handle: it starts like a new process, so that a finding repeats by
// its input alone.
void Begin(Database& Db);

// Runs a call of the library. Only std::bad_alloc and std::logic_error may leave it, and no
// statement may stay open.
int Call(Database& Db, const std::function<int()>& fn);

std::unique_ptr<VornJsonDbApi> NewHandle(Database& Db, std::string strTable, Json::Value jTableDef,
                                         std::string strCreate);

}  // namespace fuzzhost

#endif  // VORNJSONDB_FUZZ_FUZZHOST_H
