// Every public operation as one row: how its arguments are made, how it is called, and what its
// arguments may hold after a failure. The fault campaigns run each row with the Nth thing failing.
// Both handles fill such a list; a campaign is linked with one of them.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_OPERATIONS_H
#define VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_OPERATIONS_H

#include <memory>
#include <string>
#include <vector>

#include "Campaign.h"

namespace campaign {

// A table of nMembers members, of five rows.
struct Table {
    Table(std::string strTableName, int nMembers);

    std::string strName;
    std::vector<std::string> vecMembers;  // in key order; the last has a default
    Json::Value jDefinition;
    std::string strCreate;

    // A record of that key that holds every member but the last.
    Json::Value Record(int nKey) const;
    void Fill(const Database& db) const;
    std::string Content(const Database& db) const;
};

struct Arguments {
    Json::Value jFirst;
    Json::Value jSecond;
    std::string strFirst;
    std::string strSecond;
    std::vector<std::string> vecValues;

    bool operator==(const Arguments& other) const;
    Json::Value AsJson() const;
    static Arguments OfJson(const Json::Value& jAll);
};

// What is tried: each list of operations has its own.
struct Handle;
struct HandleEnd {
    void operator()(Handle* pHandle) const;
};
using HandlePtr = std::unique_ptr<Handle, HandleEnd>;

struct Subject {
    const Table& table;
    sqlite3* pDb;
    Handle* pHandle;
};

enum class After {
    kUnchanged,  // a failure leaves the arguments as they were
    kPart        // a failure may leave a part of what a success writes
};

enum class Reach {
    kNoFiles,  // does without SQLite's files
    kFiles,
    kOpens  // is the connection's first use, for which the files are not open yet
};

struct Operation {
    const char* szName;
    Reach eReach;
    bool blFirstUse;    // the table name is new to the type cache
    bool blLogicError;  // std::logic_error may leave it
    After eAfter;
    void (*pfnPrepare)(const Table&, Arguments&);
    int (*pfnRun)(Subject&, Arguments&);  // negative: failed
};

extern const std::vector<Operation> kOperations;

// A handle on the table, which must be there.
HandlePtr NewHandle(const Database& db, const Table& table);

// What the library makes once for a table, without a fault.
void KnowTable(const Table& table);

bool CanList(Handle& handle);

// The message that failures leave in the handle.
std::string MessageSlot(const Handle& handle);

// How often an operation pauses for a lock that nobody lets go of.
extern const int kMostPauses;

// What a call may return when memory ran out, or when the files failed.
bool IsMemoryFailure(int nResult);
bool IsFileFailure(int nResult);

// Whether after a failure the arguments are as eAfter says, for a success that gives argsResult.
bool IsLeftAsDocumented(const Operation& operation, const Arguments& argsBefore,
                        const Arguments& argsNow, const Arguments& argsResult);

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_OPERATIONS_H
