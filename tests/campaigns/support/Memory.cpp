#include "Memory.h"

#include <cstdio>
#include <cstdlib>
#include <new>

#include <sqlite3.h>

namespace campaign {

namespace {

bool g_blArmed = false;
bool g_blFailed = false;
MemoryFault g_fault = {};
long g_nUntilFault = 0;
long g_nOutstanding = 0;
sqlite3_mem_methods g_real = {};

bool IsOut(bool blCounts) {
    if (!g_blArmed || !blCounts) {
        return false;
    }
    --g_nUntilFault;
    const bool blOut = g_nUntilFault == 0 || (g_fault.blForEver && g_nUntilFault < 0);
    g_blFailed = g_blFailed || blOut;
    return blOut;
}

void* SqliteMalloc(int nBytes) {
    return IsOut(g_fault.blSqlite) ? nullptr : g_real.xMalloc(nBytes);
}

void* SqliteRealloc(void* pBlock, int nBytes) {
    return IsOut(g_fault.blSqlite) ? nullptr : g_real.xRealloc(pBlock, nBytes);
}

void* Allocate(std::size_t nBytes) {
    void* pBlock = IsOut(g_fault.blNew) ? nullptr : std::malloc(nBytes > 0 ? nBytes : 1);
    g_nOutstanding += pBlock == nullptr ? 0 : 1;
    return pBlock;
}

void Release(void* pBlock) {
    g_nOutstanding -= pBlock == nullptr ? 0 : 1;
    std::free(pBlock);
}

}  // namespace

void InstallSqliteAllocator() {
    sqlite3_mem_methods methods = {};
    bool blOk = sqlite3_config(SQLITE_CONFIG_GETMALLOC, &g_real) == SQLITE_OK;
    methods = g_real;
    methods.xMalloc = SqliteMalloc;
    methods.xRealloc = SqliteRealloc;
    blOk = blOk && sqlite3_config(SQLITE_CONFIG_MALLOC, &methods) == SQLITE_OK;
    // Small blocks come from the allocator, too.
    blOk = blOk && sqlite3_config(SQLITE_CONFIG_LOOKASIDE, 0, 0) == SQLITE_OK;
    blOk = blOk && sqlite3_config(SQLITE_CONFIG_MEMSTATUS, 1) == SQLITE_OK;
    if (!blOk) {
        std::fprintf(stderr, "SQLite does not take the allocator\n");
        std::exit(2);
    }
}

void Arm(const MemoryFault& fault, long nNth) {
    g_fault = fault;
    g_nUntilFault = nNth;
    g_blFailed = false;
    g_blArmed = true;
}

bool Disarm() {
    g_blArmed = false;
    return g_blFailed;
}

long OutstandingBlocks() {
    return g_nOutstanding;
}

namespace {

void* AllocateOrThrow(std::size_t nBytes) {
    void* pBlock = Allocate(nBytes);
    if (pBlock == nullptr) {
        throw std::bad_alloc();
    }
    return pBlock;
}

}  // namespace

}  // namespace campaign

void* operator new(std::size_t nBytes) {
    return campaign::AllocateOrThrow(nBytes);
}
void* operator new[](std::size_t nBytes) {
    return campaign::AllocateOrThrow(nBytes);
}
void* operator new(std::size_t nBytes, const std::nothrow_t&) noexcept {
    return campaign::Allocate(nBytes);
}
void* operator new[](std::size_t nBytes, const std::nothrow_t&) noexcept {
    return campaign::Allocate(nBytes);
}
void operator delete(void* pBlock) noexcept {
    campaign::Release(pBlock);
}
void operator delete[](void* pBlock) noexcept {
    campaign::Release(pBlock);
}
void operator delete(void* pBlock, std::size_t) noexcept {
    campaign::Release(pBlock);
}
void operator delete[](void* pBlock, std::size_t) noexcept {
    campaign::Release(pBlock);
}
void operator delete(void* pBlock, const std::nothrow_t&) noexcept {
    campaign::Release(pBlock);
}
void operator delete[](void* pBlock, const std::nothrow_t&) noexcept {
    campaign::Release(pBlock);
}
