// An SQLite VFS over the default one that fails on demand. Syncing is counted, not done: what a
// power failure loses is not tested here, and a disk that is waited for makes no fault better.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_FAULTYVFS_H
#define VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_FAULTYVFS_H

namespace campaign {

// Which calls count, and what the Nth of them answers.
enum class IoFault {
    kNone,
    kAny,  // every call below, each with its own error
    kRead,
    kShortRead,  // the system's read gives less than was asked for: no error, to be read on
    kWrite,
    kShortWrite,  // the same for writing
    kDiskFull,
    kSync,
    kLock,
    kLockBusy,  // another process seems to hold the lock
    kTruncate,
    kFileSize,
    kOpen,
    kDelete,
    kAccess,
    kShmMap,
    kShmLock
};
const char* IoFaultName(IoFault eFault);

constexpr const char* kFaultyVfs = "faulty";
void InstallFaultyVfs();

void ArmIo(IoFault eFault, long nNth, bool blForEver);

// Stops failing; returns whether a call failed since ArmIo.
bool DisarmIo();

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_FAULTYVFS_H
