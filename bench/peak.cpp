// vornjsondb_peak ROWS: prints the heap that recList needs at its highest and the heap that the
// finished array holds, both in bytes, as one JSON object.
//
// The program's own malloc family counts; every library of the process calls it.

#include <dlfcn.h>
#include <malloc.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "support/Bench.h"
#include "support/Records.h"

namespace {

size_t g_nLive = 0;
size_t g_nPeak = 0;

void Add(void* pBlock) {
    g_nLive += malloc_usable_size(pBlock);
    if (g_nLive > g_nPeak) {
        g_nPeak = g_nLive;
    }
}

void Remove(void* pBlock) {
    g_nLive -= malloc_usable_size(pBlock);
}

}  // namespace

// glibc's own names, so that no look-up (which would allocate) is needed.
extern "C" {
void* __libc_malloc(size_t nBytes);
void* __libc_calloc(size_t nCount, size_t nBytes);
void* __libc_realloc(void* pBlock, size_t nBytes);
void __libc_free(void* pBlock);

void* malloc(size_t nBytes) {
    void* pBlock = __libc_malloc(nBytes);
    Add(pBlock);
    return pBlock;
}

void* calloc(size_t nCount, size_t nBytes) {
    void* pBlock = __libc_calloc(nCount, nBytes);
    Add(pBlock);
    return pBlock;
}

void* realloc(void* pBlock, size_t nBytes) {
    Remove(pBlock);
    void* pNew = __libc_realloc(pBlock, nBytes);
    Add(pNew == nullptr && nBytes > 0 ? pBlock : pNew);
    return pNew;
}

void free(void* pBlock) {
    Remove(pBlock);
    __libc_free(pBlock);
}
}

int main(int argc, char** argv) {
    using namespace bench;
    const int nRows = argc > 1 ? std::atoi(argv[1]) : 200000;
    const Database Db;
    const auto pHandle = EightMembers().Open(Db.Get());
    Db.Exec("BEGIN");
    for (int i = 0; i < nRows; ++i) {
        Json::Value jRecord = EightMemberRecord(i);
        Json::Value jStored;
        Require(pHandle->recCreate(jRecord, jStored) == 0, "recCreate");
    }

    Json::Value jAll;
    Json::Value jRows;
    const size_t nBefore = g_nLive;
    g_nPeak = g_nLive;
    Require(pHandle->recList(jAll, jRows) == 0, "recList");
    const size_t nPeak = g_nPeak - nBefore;
    const size_t nWithArray = g_nLive;
    Require(static_cast<int>(jRows.size()) == nRows, "all rows are listed");
    jRows = Json::Value();
    std::printf("{\"rows\": %d, \"peak\": %zu, \"array\": %zu}\n", nRows, nPeak,
                nWithArray - g_nLive);
    return 0;
}
