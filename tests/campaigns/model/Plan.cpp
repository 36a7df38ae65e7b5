// What goes wrong on purpose during one step, and where its log lines go.

#include <cerrno>

#include "Generator.h"

namespace campaign {

namespace {

using testhost::ExecFault;

constexpr const char kLocked[] = "database is locked";

// Answered again and again, one after the other.
constexpr ExecFault kLocks[] = {{SQLITE_BUSY, kLocked, 0},
                                {SQLITE_BUSY, kLocked, ENOENT},
                                {SQLITE_ERROR, "so: database is locked (5)", EIO},
                                {SQLITE_IOERR, "disk I/O error", EAGAIN},
                                {SQLITE_IOERR, "", EAGAIN}};
constexpr ExecFault kFailures[] = {{SQLITE_IOERR, nullptr, EAGAIN},
                                   {SQLITE_NOMEM, nullptr, 0},
                                   {SQLITE_BUSY, nullptr, EIO},
                                   {SQLITE_CONSTRAINT, "UNIQUE constraint failed: t.a", 0},
                                   {SQLITE_CONSTRAINT, "so: UNIQUE constraint failed", EAGAIN + 1},
                                   {SQLITE_CONSTRAINT, "NOT NULL constraint failed: t.a", ENOSPC},
                                   {SQLITE_LOCKED, "database table is locked", 0},
                                   {SQLITE_BUSY, "Database is locked", 0},
                                   {SQLITE_ERROR, "", 0}};
// Answered without running anything, so that no row comes back.
constexpr ExecFault kSuccesses[] = {
    {SQLITE_OK, nullptr, 0}, {SQLITE_OK, nullptr, EAGAIN}, {SQLITE_OK, kLocked, ENOENT}};
constexpr int kCounts[] = {-1, -7, 0, 3};
constexpr int kErrnos[] = {0, 0, ENOENT, EAGAIN, ERANGE};

Flags AnyFlags(Random& random) {
    return {random.OneIn(4), random.OneIn(2)};
}

void AddLocks(Random& random, Plan& plan) {
    const int nLocks = random.OneIn(20) ? 498 + random.Below(4) : 1 + random.Below(4);
    for (int i = 0; i < nLocks; ++i) {
        plan.vecFaults.push_back(random.Of(kLocks));
    }
}

}  // namespace

Plan AnyPlan(Random& random, bool blConnected) {
    Plan plan;
    plan.flags = AnyFlags(random);
    plan.nErrno = random.Of(kErrnos);
    if (random.OneIn(8)) {
        plan.nFlagsAtStatement = random.Below(3);
        plan.flagsAtStatement = AnyFlags(random);
    }
    if (random.OneIn(8)) {
        plan.nFlagsAtPause = random.Below(3);
        plan.flagsAtPause = AnyFlags(random);
    }
    if (random.OneIn(8)) {
        plan.blFlagsAfterLine = true;
        plan.flagsAfterLine = AnyFlags(random);
    }
    plan.nErrnoOfFree = random.OneIn(4) ? EAGAIN : 0;
    if (random.OneIn(12)) {
        AddLocks(random, plan);
    }
    if (random.OneIn(12)) {
        plan.vecFaults.push_back(random.Of(kFailures));
    } else if (blConnected && random.OneIn(20)) {
        plan.vecFaults.push_back(random.Of(kSuccesses));
    }
    if (random.OneIn(8)) {
        plan.vecChanges.push_back(random.Of(kCounts));
    }
    return plan;
}

}  // namespace campaign
