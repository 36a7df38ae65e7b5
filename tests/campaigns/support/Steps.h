// What is done to the table of the crash and the lock campaign, and what it must hold then. Steps
// follow from seed and state alone, so that another process can follow them.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_STEPS_H
#define VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_STEPS_H

#include <map>
#include <string>
#include <vector>

#include "Campaign.h"

namespace campaign {

enum class Act {
    kCreate,
    kReplace,
    kUpsert,
    kUpdate,
    kRemove,
    kRemoveRange,
    kLoadReplace,  // committed by the loader itself
    kLoadSkip,     // committed by the caller
    kLoadUpsert,
    kSeveral,    // one record is written and the next one removed, as one
    kTakenBack,  // everything is removed, in a transaction that is not committed
    kCountUp,    // the row that all processes share
    kNewSide,    // the owner's side table is made anew, with two columns
    kSync,       // it gets three columns and a unique index
    kIndex,      // it gets an index
    kBegin,
    kCommit,
    kRollback
};

// When an act can be tried.
enum class When {
    kAlways,
    kPresent,  // the record is there
    kAbsent,
    kSideUsed,  // the side table is not as it is made, or not there
    kSideShort,
    kSideUnindexed,
    kOpen,  // a transaction
    kClosed
};

struct ActRow {
    const char* szName;
    Act eAct;
    When eWhen;
};

// The acts of the handle that a campaign is linked with.
extern const std::vector<ActRow> kActs;

struct Step {
    const ActRow* pRow;
    int nOwner;
    int nKey;
    int nStride;  // between the keys of an owner
    std::string strText;
};
constexpr int kKeysOfStep = 5;  // of the acts with several records

constexpr int kPlainColumns = 2;
constexpr int kSyncedColumns = 5;

// What an owner's rows are, and what else is only there as a whole.
struct State {
    std::map<int, std::string> rows;  // texts by key
    int nCounted = 0;
    int nSideColumns = 0;  // 0: no side table
    int nSideIndexes = 0;

    bool operator==(const State& other) const;
    bool operator!=(const State& other) const { return !(*this == other); }
    std::string Text() const;
};

struct Owner {
    int nOwner;
    int nOwners;
    int nKeys;  // for each owner
};

class Stream {
  public:
    Stream(std::uint64_t nSeed, const Owner& owner, State start)
        : m_random(nSeed), m_owner(owner), m_now(start), m_committed(start) {}

    // A step that is possible now.
    Step Choose();

    // The given act on that key of the owner, from 0.
    Step Make(const ActRow& row, int nNumber);
    bool IsPossible(When eWhen, int nKey) const;

    // The step has succeeded.
    void Apply(const Step& step);

    const State& Now() const { return m_now; }
    // What stands in the file when the process ends now.
    const State& Committed() const { return m_committed; }
    bool IsOpen() const { return m_blOpen; }
    Random& Dice() { return m_random; }

  private:
    void ApplyToRows(const Step& step);

    Random m_random;
    Owner m_owner;
    State m_now;
    State m_committed;
    bool m_blOpen = false;
};

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_STEPS_H
