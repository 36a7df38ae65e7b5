// What the campaigns share: options, seeded random numbers, violations and figures, databases used
// without the library, and the host's exits (system log, pauses).
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_CAMPAIGN_H
#define VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_CAMPAIGN_H

#include <VornJsonDbApi.h>

#include <cstdint>
#include <functional>
#include <string>

#include <json/json.h>
#include <sqlite3.h>

#include "../../support/JsonHelpers.h"

namespace campaign {

// ---- options ------------------------------------------------------------------------------------
//    --seed N    the random numbers; printed at the start of every run
//    --long      the long form
//    --scale N   1/N of the work, for slow machines and emulators
//    --count N   the campaign's own measure (sequences, kills, seconds, how far each single N is
//                taken), instead of its default
struct Options {
    std::uint64_t nSeed = 1;
    bool blLong = false;
    int nScale = 1;
    int nCount = 0;

    // nCount, or the default of the form, divided by the scale; at least 1.
    int Count(int nDefault, int nLong) const;
};
Options ParseOptions(int argc, char** argv, const char* szCampaign);

// ---- random numbers -----------------------------------------------------------------------------
// The same sequence on every machine.
class Random {
  public:
    explicit Random(std::uint64_t nSeed) : m_nState(nSeed) {}
    std::uint64_t Next();
    int Below(int nBound) { return static_cast<int>(Next() % static_cast<std::uint64_t>(nBound)); }
    bool OneIn(int nBound) { return Below(nBound) == 0; }
    template <typename Item, std::size_t nItems>
    const Item& Of(const Item (&items)[nItems]) {
        return items[Next() % nItems];
    }

  private:
    std::uint64_t m_nState;
};

// ---- violations and figures ---------------------------------------------------------------------
// Both are shared with child processes.

// Returns blHolds; prints strWhat and counts a violation when it is false.
bool Expect(bool blHolds, const std::function<std::string()>& fnWhat);
void Violation(const std::string& strWhat);

// A named sum, or a maximum. Call once for each before the first child starts.
std::uint64_t& Figure(const char* szName);

// For children that run side by side.
void AddTo(std::uint64_t& nFigure, std::uint64_t n);
void RaiseTo(std::uint64_t& nFigure, std::uint64_t n);

// Prints the figures in the order of their first use; returns the exit status.
int Finish(const char* szCampaign);

// Runs fn in a child process, which ends by exit, so that a leak check runs. False, and a
// violation, when the child crashed, or failed without telling why.
bool InChild(const std::string& strWhat, const std::function<void()>& fn);

// Runs fn in a child and returns what it returned.
Json::Value AskChild(const std::function<Json::Value()>& fn);

// ---- JSON ---------------------------------------------------------------------------------------
using jsonhelpers::Definition;
using jsonhelpers::NewHandle;
Json::Value FromText(const std::string& strText);
std::string ToText(const Json::Value& jValue);

// ---- databases ----------------------------------------------------------------------------------
class Database {
  public:
    explicit Database(const std::string& strPath = ":memory:", const char* szVfs = nullptr);
    ~Database();
    Database(const Database&) = delete;
    Database& operator=(const Database&) = delete;

    sqlite3* Get() const { return m_pDb; }

    // Must succeed; a failure is a violation.
    void Run(const std::string& strSql) const;

    // "a|b\nc|d\n", each value as an SQL literal. An error is part of the text.
    std::string Rows(const std::string& strSql) const;

  private:
    sqlite3* m_pDb = nullptr;
};

// A folder of this process that is removed at its end.
const std::string& TempFolder();
void RemoveDatabase(const std::string& strPath);
std::string ReadFile(const std::string& strPath);
void WriteFile(const std::string& strPath, const std::string& strBytes);

// ---- the host's exits ---------------------------------------------------------------------------
// System log lines are rendered, so that bad arguments show, and dropped.
std::uint64_t LogLines();

// Called for each pause between two attempts: usleep(10000) of the old handle, nanosleep of the
// second one. True: the pause is slept, false: it is not, but its time has passed all the same.
// Without a function it is slept.
extern bool (*g_pfnOnPause)(int nPause);

// SQLite's own sleeps, while a write-ahead log is busy, are left out.
extern bool g_blSkipSqliteSleeps;

struct Pauses {
    int nCount;        // since the last take
    int nInterrupted;  // ended early by a signal
};
Pauses TakePauses();

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_CAMPAIGN_H
