// The statements that a connection runs, as texts: what the library is measured against is the very
// same text, so it is taken from the library itself and not written a second time here.

#ifndef VORN_BENCH_SUPPORT_SQL_CAPTURE_H
#define VORN_BENCH_SUPPORT_SQL_CAPTURE_H

#include <string>
#include <vector>

#include <sqlite3.h>

namespace bench {

class SqlCapture {
  public:
    explicit SqlCapture(sqlite3* pDb);
    ~SqlCapture();
    SqlCapture(const SqlCapture&) = delete;
    SqlCapture& operator=(const SqlCapture&) = delete;

    // All statements since the last take: one after the other, or each for itself.
    std::string Take();
    std::vector<std::string> TakeEach();

  private:
    static int OnStatement(unsigned nEvent, void* pContext, void* pStatement, void* pText);

    sqlite3* m_pDb;
    std::vector<std::string> m_vecSql;
};

}  // namespace bench

#endif  // VORN_BENCH_SUPPORT_SQL_CAPTURE_H
