// What every measurement needs: a database, a clock, a median, and a way to stop when a result is
// not the expected one. A benchmark of wrong results measures nothing, so checks are never left
// out.

#ifndef VORN_BENCH_SUPPORT_BENCH_H
#define VORN_BENCH_SUPPORT_BENCH_H

#include <string>
#include <vector>

#include <sqlite3.h>

namespace bench {

// Ends the program with szWhat on standard error when blTrue is false.
void Require(bool blTrue, const char* szWhat);

// An in-memory database unless a file is named.
class Database {
  public:
    explicit Database(const char* szFile = ":memory:");
    ~Database();
    Database(const Database&) = delete;
    Database& operator=(const Database&) = delete;

    sqlite3* Get() const { return m_pDb; }
    // Runs statements that must succeed; rows are passed to a callback that does nothing.
    void Exec(const std::string& strSql) const;

  private:
    sqlite3* m_pDb = nullptr;
};

// Keeps freed memory in the process. Otherwise the system takes pages back, and whoever runs first
// pays for getting them again.
void KeepHeap();

// Nanoseconds that this thread has computed. Other programs on the machine do not add to
// it.
double CpuNow();

double Median(std::vector<double> vecValues);

}  // namespace bench

#endif  // VORN_BENCH_SUPPORT_BENCH_H
