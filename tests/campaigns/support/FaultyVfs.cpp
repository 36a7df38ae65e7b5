#include "FaultyVfs.h"

#include <sys/types.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include <sqlite3.h>

namespace campaign {

namespace {

IoFault g_eFault = IoFault::kNone;
long g_nUntilFault = 0;
bool g_blForEver = false;
bool g_blFailed = false;

bool Fails(IoFault eCall) {
    if (g_eFault != eCall && (g_eFault != IoFault::kAny || eCall == IoFault::kShortRead ||
                              eCall == IoFault::kShortWrite || eCall == IoFault::kLockBusy)) {
        return false;
    }
    --g_nUntilFault;
    const bool blFails = g_nUntilFault == 0 || (g_blForEver && g_nUntilFault < 0);
    g_blFailed = g_blFailed || blFails;
    return blFails;
}

// ---- a file -------------------------------------------------------------------------------------

struct File {
    sqlite3_file base;
    sqlite3_file* pReal;  // behind this struct
};

sqlite3_file* Real(sqlite3_file* pFile) {
    return reinterpret_cast<File*>(pFile)->pReal;
}

int Close(sqlite3_file* pFile) {
    return Real(pFile)->pMethods->xClose(Real(pFile));
}

int Read(sqlite3_file* pFile, void* pBuffer, int nBytes, sqlite3_int64 nOffset) {
    if (Fails(IoFault::kRead)) {
        return SQLITE_IOERR_READ;
    }
    return Real(pFile)->pMethods->xRead(Real(pFile), pBuffer, nBytes, nOffset);
}

int Write(sqlite3_file* pFile, const void* pBuffer, int nBytes, sqlite3_int64 nOffset) {
    const bool blFull = Fails(IoFault::kDiskFull);
    if (!blFull && !Fails(IoFault::kWrite)) {
        return Real(pFile)->pMethods->xWrite(Real(pFile), pBuffer, nBytes, nOffset);
    }
    // A write that fails may have written a part.
    Real(pFile)->pMethods->xWrite(Real(pFile), pBuffer, nBytes / 2, nOffset);
    return blFull ? SQLITE_FULL : SQLITE_IOERR_WRITE;
}

int Truncate(sqlite3_file* pFile, sqlite3_int64 nSize) {
    return Fails(IoFault::kTruncate) ? SQLITE_IOERR_TRUNCATE
                                     : Real(pFile)->pMethods->xTruncate(Real(pFile), nSize);
}

int Sync(sqlite3_file*, int) {
    return Fails(IoFault::kSync) ? SQLITE_IOERR_FSYNC : SQLITE_OK;
}

int FileSize(sqlite3_file* pFile, sqlite3_int64* pnSize) {
    return Fails(IoFault::kFileSize) ? SQLITE_IOERR_FSTAT
                                     : Real(pFile)->pMethods->xFileSize(Real(pFile), pnSize);
}

int Lock(sqlite3_file* pFile, int nLock) {
    if (Fails(IoFault::kLockBusy)) {
        return SQLITE_BUSY;
    }
    return Fails(IoFault::kLock) ? SQLITE_IOERR_LOCK
                                 : Real(pFile)->pMethods->xLock(Real(pFile), nLock);
}

int Unlock(sqlite3_file* pFile, int nLock) {
    return Real(pFile)->pMethods->xUnlock(Real(pFile), nLock);
}

int CheckReservedLock(sqlite3_file* pFile, int* pnHeld) {
    return Fails(IoFault::kLock) ? SQLITE_IOERR_CHECKRESERVEDLOCK
                                 : Real(pFile)->pMethods->xCheckReservedLock(Real(pFile), pnHeld);
}

int FileControl(sqlite3_file* pFile, int nOperation, void* pArg) {
    return Real(pFile)->pMethods->xFileControl(Real(pFile), nOperation, pArg);
}

int SectorSize(sqlite3_file* pFile) {
    return Real(pFile)->pMethods->xSectorSize(Real(pFile));
}

int DeviceCharacteristics(sqlite3_file* pFile) {
    return Real(pFile)->pMethods->xDeviceCharacteristics(Real(pFile));
}

int ShmMap(sqlite3_file* pFile, int nPage, int nBytes, int blExtend, void volatile** ppMemory) {
    return Fails(IoFault::kShmMap)
               ? SQLITE_IOERR_SHMMAP
               : Real(pFile)->pMethods->xShmMap(Real(pFile), nPage, nBytes, blExtend, ppMemory);
}

int ShmLock(sqlite3_file* pFile, int nOffset, int n, int nFlags) {
    const bool blTakes = (nFlags & SQLITE_SHM_LOCK) != 0;
    constexpr int kWriterLock = 0;
    if (blTakes && nOffset == kWriterLock && Fails(IoFault::kLockBusy)) {
        return SQLITE_BUSY;
    }
    return blTakes && Fails(IoFault::kShmLock)
               ? SQLITE_IOERR_SHMLOCK
               : Real(pFile)->pMethods->xShmLock(Real(pFile), nOffset, n, nFlags);
}

void ShmBarrier(sqlite3_file* pFile) {
    Real(pFile)->pMethods->xShmBarrier(Real(pFile));
}

int ShmUnmap(sqlite3_file* pFile, int blDelete) {
    return Real(pFile)->pMethods->xShmUnmap(Real(pFile), blDelete);
}

constexpr sqlite3_io_methods kMethods = {2,
                                         Close,
                                         Read,
                                         Write,
                                         Truncate,
                                         Sync,
                                         FileSize,
                                         Lock,
                                         Unlock,
                                         CheckReservedLock,
                                         FileControl,
                                         SectorSize,
                                         DeviceCharacteristics,
                                         ShmMap,
                                         ShmLock,
                                         ShmBarrier,
                                         ShmUnmap,
                                         nullptr,
                                         nullptr};

// ---- the VFS ------------------------------------------------------------------------------------

sqlite3_vfs* RealVfs(sqlite3_vfs* pVfs) {
    return static_cast<sqlite3_vfs*>(pVfs->pAppData);
}

int Open(sqlite3_vfs* pVfs, const char* szName, sqlite3_file* pFile, int nFlags, int* pnOut) {
    pFile->pMethods = nullptr;
    if (Fails(IoFault::kOpen)) {
        return SQLITE_CANTOPEN;
    }
    File* pOwn = reinterpret_cast<File*>(pFile);
    pOwn->pReal = reinterpret_cast<sqlite3_file*>(pOwn + 1);
    const int nStatus = RealVfs(pVfs)->xOpen(RealVfs(pVfs), szName, pOwn->pReal, nFlags, pnOut);
    if (nStatus == SQLITE_OK) {
        pFile->pMethods = &kMethods;
    }
    return nStatus;
}

int Delete(sqlite3_vfs* pVfs, const char* szName, int) {
    return Fails(IoFault::kDelete) ? SQLITE_IOERR_DELETE
                                   : RealVfs(pVfs)->xDelete(RealVfs(pVfs), szName, 0);
}

int Access(sqlite3_vfs* pVfs, const char* szName, int nFlags, int* pnOut) {
    return Fails(IoFault::kAccess) ? SQLITE_IOERR_ACCESS
                                   : RealVfs(pVfs)->xAccess(RealVfs(pVfs), szName, nFlags, pnOut);
}

int FullPathname(sqlite3_vfs* pVfs, const char* szName, int nOut, char* szOut) {
    return RealVfs(pVfs)->xFullPathname(RealVfs(pVfs), szName, nOut, szOut);
}

// ---- short transfers ----------------------------------------------------------------------------

sqlite3_syscall_ptr g_pfnRead = nullptr;
sqlite3_syscall_ptr g_pfnWrite = nullptr;

// Half of what was asked for, or an interruption by a signal.
bool IsShort(IoFault eFault, std::size_t& nBytes) {
    if (!Fails(eFault)) {
        return false;
    }
    nBytes = nBytes > 1 ? nBytes / 2 : nBytes;
    return nBytes % 3 == 0;
}

ssize_t ShortRead(int nFd, void* pBuffer, std::size_t nBytes, off_t nOffset) {
    if (IsShort(IoFault::kShortRead, nBytes) && !g_blForEver) {
        errno = EINTR;
        return -1;
    }
    return reinterpret_cast<ssize_t (*)(int, void*, std::size_t, off_t)>(g_pfnRead)(
        nFd, pBuffer, nBytes, nOffset);
}

ssize_t ShortWrite(int nFd, const void* pBuffer, std::size_t nBytes, off_t nOffset) {
    if (IsShort(IoFault::kShortWrite, nBytes) && !g_blForEver) {
        errno = EINTR;
        return -1;
    }
    return reinterpret_cast<ssize_t (*)(int, const void*, std::size_t, off_t)>(g_pfnWrite)(
        nFd, pBuffer, nBytes, nOffset);
}

// SQLite names its system calls; the one with 64-bit offsets is used where there is one.
void TakeSystemCall(sqlite3_vfs* pVfs, const char* szName, sqlite3_syscall_ptr pfnOwn,
                    sqlite3_syscall_ptr& pfnReal) {
    sqlite3_syscall_ptr pfnFound = pVfs->xGetSystemCall(pVfs, szName);
    if (pfnFound != nullptr && sizeof(off_t) == 8 &&
        pVfs->xSetSystemCall(pVfs, szName, pfnOwn) == SQLITE_OK) {
        pfnReal = pfnFound;
    }
}

}  // namespace

const char* IoFaultName(IoFault eFault) {
    static constexpr const char* kNames[] = {
        "no fault",          "anything",          "read", "short read", "write",
        "short write",       "disk full",         "sync", "lock",       "lock held",
        "truncate",          "file size",         "open", "delete",     "access",
        "shared memory map", "shared memory lock"};
    return kNames[static_cast<int>(eFault)];
}

void InstallFaultyVfs() {
    sqlite3_vfs* pReal = sqlite3_vfs_find(nullptr);
    static sqlite3_vfs s_vfs = *pReal;
    s_vfs.pNext = nullptr;
    s_vfs.zName = kFaultyVfs;
    s_vfs.szOsFile = static_cast<int>(sizeof(File)) + pReal->szOsFile;
    s_vfs.pAppData = pReal;
    s_vfs.xOpen = Open;
    s_vfs.xDelete = Delete;
    s_vfs.xAccess = Access;
    s_vfs.xFullPathname = FullPathname;
    sqlite3_vfs_register(&s_vfs, 0);

    const bool bl64 = pReal->xGetSystemCall(pReal, "pread64") != nullptr;
    TakeSystemCall(pReal, bl64 ? "pread64" : "pread",
                   reinterpret_cast<sqlite3_syscall_ptr>(ShortRead), g_pfnRead);
    TakeSystemCall(pReal, bl64 ? "pwrite64" : "pwrite",
                   reinterpret_cast<sqlite3_syscall_ptr>(ShortWrite), g_pfnWrite);
}

void ArmIo(IoFault eFault, long nNth, bool blForEver) {
    g_eFault = eFault;
    g_nUntilFault = nNth;
    g_blForEver = blForEver;
    g_blFailed = false;
}

bool DisarmIo() {
    g_eFault = IoFault::kNone;
    return g_blFailed;
}

}  // namespace campaign
