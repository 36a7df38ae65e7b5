#include "LockHolder.h"

#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>

namespace testhost {
namespace {

sqlite3* OpenLocked(const std::string& strPath) {
    sqlite3* pDb = nullptr;
    if (sqlite3_open(strPath.c_str(), &pDb) == SQLITE_OK &&
        BareExec(pDb, "BEGIN EXCLUSIVE") == SQLITE_OK) {
        return pDb;
    }
    sqlite3_close(pDb);
    return nullptr;
}

void Unlock(sqlite3*& pDb) {
    if (pDb != nullptr) {
        BareExec(pDb, "COMMIT");
        sqlite3_close(pDb);
        pDb = nullptr;
    }
}

void Send(int nFd) {
    const char chSignal = '!';
    EXPECT_EQ(::write(nFd, &chSignal, 1), 1);
}

bool Receive(int nFd) {
    char chSignal = '\0';
    return ::read(nFd, &chSignal, 1) == 1;
}

// Locks, says so, waits for the command or the parent's end, unlocks, says so.
[[noreturn]] void HoldLock(const std::string& strPath, int nCommandFd, int nAnswerFd) {
    sqlite3* pDb = OpenLocked(strPath);
    if (pDb == nullptr) {
        ::_exit(EXIT_FAILURE);
    }
    Send(nAnswerFd);
    Receive(nCommandFd);
    Unlock(pDb);
    Send(nAnswerFd);
    ::_exit(EXIT_SUCCESS);
}

}  // namespace

LockingConnection::LockingConnection(const std::string& strPath) : m_pDb(OpenLocked(strPath)) {
    EXPECT_NE(m_pDb, nullptr) << "cannot lock " << strPath;
}

LockingConnection::~LockingConnection() {
    Release();
}

void LockingConnection::Release() {
    Unlock(m_pDb);
}

LockingProcess::LockingProcess(const std::string& strPath) {
    int aCommand[2];
    int aAnswer[2];
    if (::pipe(aCommand) != 0 || ::pipe(aAnswer) != 0) {
        ADD_FAILURE() << "cannot create pipes";
        return;
    }
    m_nChild = ::fork();
    if (m_nChild == 0) {
        ::close(aCommand[1]);
        ::close(aAnswer[0]);
        HoldLock(strPath, aCommand[0], aAnswer[1]);
    }
    ::close(aCommand[0]);
    ::close(aAnswer[1]);
    m_nCommandFd = aCommand[1];
    m_nAnswerFd = aAnswer[0];
    EXPECT_TRUE(Receive(m_nAnswerFd)) << "the other process cannot lock " << strPath;
}

LockingProcess::~LockingProcess() {
    Release();
}

void LockingProcess::Release() {
    if (m_nChild < 0) {
        return;
    }
    Send(m_nCommandFd);
    EXPECT_TRUE(Receive(m_nAnswerFd));
    ::close(m_nCommandFd);
    ::close(m_nAnswerFd);
    int nStatus = 0;
    EXPECT_EQ(::waitpid(m_nChild, &nStatus, 0), m_nChild);
    EXPECT_EQ(nStatus, 0);
    m_nChild = -1;
}

}  // namespace testhost
