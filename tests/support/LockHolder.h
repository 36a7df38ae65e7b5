// Other users of a database file, holding it locked.
#ifndef VORNJSONDB_TESTS_SUPPORT_LOCKHOLDER_H
#define VORNJSONDB_TESTS_SUPPORT_LOCKHOLDER_H

#include <string>

#include "TestHost.h"

namespace testhost {

// A second connection of this process, holding an exclusive lock until Release.
class LockingConnection {
  public:
    explicit LockingConnection(const std::string& strPath);
    ~LockingConnection();
    LockingConnection(const LockingConnection&) = delete;
    LockingConnection& operator=(const LockingConnection&) = delete;
    void Release();

  private:
    sqlite3* m_pDb = nullptr;
};

// The same in another process. Release returns when the lock is gone.
class LockingProcess {
  public:
    explicit LockingProcess(const std::string& strPath);
    ~LockingProcess();
    LockingProcess(const LockingProcess&) = delete;
    LockingProcess& operator=(const LockingProcess&) = delete;
    void Release();

  private:
    int m_nChild = -1;
    int m_nCommandFd = -1;
    int m_nAnswerFd = -1;
};

}  // namespace testhost

#endif  // VORNJSONDB_TESTS_SUPPORT_LOCKHOLDER_H
