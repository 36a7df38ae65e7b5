#include "Bench.h"

#include <malloc.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <limits>

namespace bench {

namespace {

int IgnoreRow(void*, int, char**, char**) {
    return 0;
}

}  // namespace

void Require(bool blTrue, const char* szWhat) {
    if (!blTrue) {
        std::fprintf(stderr, "benchmark failed: %s\n", szWhat);
        std::exit(1);
    }
}

Database::Database(const char* szFile) {
    Require(sqlite3_open(szFile, &m_pDb) == SQLITE_OK, "sqlite3_open");
}

Database::~Database() {
    sqlite3_close(m_pDb);
}

void Database::Exec(const std::string& strSql) const {
    Require(sqlite3_exec(m_pDb, strSql.c_str(), IgnoreRow, nullptr, nullptr) == SQLITE_OK,
            strSql.c_str());
}

void KeepHeap() {
    constexpr int kNever = std::numeric_limits<int>::max();
    Require(mallopt(M_TRIM_THRESHOLD, kNever) == 1 && mallopt(M_MMAP_MAX, 0) == 1, "mallopt");
}

double CpuNow() {
    timespec Now{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &Now);
    return static_cast<double>(Now.tv_sec) * 1e9 + static_cast<double>(Now.tv_nsec);
}

double Median(std::vector<double> vecValues) {
    Require(!vecValues.empty(), "median of nothing");
    std::sort(vecValues.begin(), vecValues.end());
    const size_t nHalf = vecValues.size() / 2;
    return vecValues.size() % 2 == 1 ? vecValues[nHalf]
                                     : (vecValues[nHalf - 1] + vecValues[nHalf]) / 2;
}

}  // namespace bench
