// Allocators that run out of memory on demand: operator new of the whole process, and SQLite's.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_MEMORY_H
#define VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_MEMORY_H

namespace campaign {

struct MemoryFault {
    const char* szName;
    bool blNew;      // operator new counts and fails
    bool blSqlite;   // SQLite's allocator counts and fails
    bool blForEver;  // from the Nth on, instead of the Nth alone
};

// Before SQLite starts.
void InstallSqliteAllocator();

void Arm(const MemoryFault& fault, long nNth);

// Stops failing; returns whether an allocation failed since Arm.
bool Disarm();

// Blocks of operator new that were not given back.
long OutstandingBlocks();

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_SUPPORT_MEMORY_H
