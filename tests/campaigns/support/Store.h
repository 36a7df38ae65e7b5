// The table of the crash and the lock campaign, through one of the handles: a campaign is linked
// with one of them.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_STORE_H
#define VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_STORE_H

#include <memory>
#include <string>
#include <vector>

#include "Steps.h"

namespace campaign {

class Store {
  public:
    Store() = default;
    virtual ~Store() = default;
    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    // Negative when it failed.
    virtual int Run(const Step& step) = 0;

    virtual bool List(int nOwner, std::map<int, std::string>& rows) = 0;

    // Whether the last call failed as documented when another one holds a lock, after so many
    // pauses and with or without an open transaction.
    virtual bool IsGivenUp(int nPauses, bool blOpen) const = 0;

    // Whether the last step was done all the same, and a lock took its answer.
    virtual bool IsAnswerLost(int nPauses) const = 0;

    // Whether a step that failed may have been done all the same.
    virtual bool MayBeDone() const = 0;

    virtual std::string Failure() const = 0;
};

// The connection must outlive it, and the table must be there.
std::unique_ptr<Store> NewStore(const Database& db);

// A fresh file in that journal mode, with the row that counts.
void NewFile(const std::string& strPath, const char* szMode);

Json::Value RecordOf(const Step& step, int nKey);

// What the file holds; the counter is that of all owners.
State ReadState(const Database& db, int nOwner);

// A lock that is let go of at a pause of that number, from 1, and what comes of it.
struct Known {
    const char* szName;
    int nFreeAt;  // 0: there is no lock
    int nPauses;
    bool blDone;
};
extern const std::vector<Known> kKnown;

// How another connection holds the file.
struct Hold {
    const char* szSql;
    bool blReading;   // in the way of reading, too
    bool blAtCommit;  // in the way of a commit alone
};
extern const std::vector<Hold> kHolds;

constexpr char kSharedTable[] = "shared";

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_STORE_H
