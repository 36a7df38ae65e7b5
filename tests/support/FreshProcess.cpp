// Runs a piece of a test in a new process of the same executable.
#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <utility>

#include "TestHost.h"

namespace testhost {
namespace {

constexpr const char* kFreshVariable = "VORNJSONDB_TEST_FRESH";
constexpr int kFreshSuccess = 77;  // unlike any status of a run that never reached the function

std::string BaseName(const std::string& strPath) {
    return strPath.substr(strPath.rfind('/') + 1);
}

std::string CurrentTestName() {
    const ::testing::TestInfo* pInfo = ::testing::UnitTest::GetInstance()->current_test_info();
    return std::string(pInfo->test_suite_name()) + "." + pInfo->name();
}

std::vector<std::string> CommandLineOf(pid_t nPid) {
    std::ifstream file("/proc/" + std::to_string(nPid) + "/cmdline", std::ios::binary);
    std::vector<std::string> vecArguments;
    for (std::string strArgument; std::getline(file, strArgument, '\0');) {
        vecArguments.push_back(strArgument);
    }
    return vecArguments;
}

// The program to start: this executable, or the emulator that runs the parent, with its options. A
// user-mode emulator hides behind /proc/self, but not behind another process's entry.
std::string Program(pid_t nParent) {
    // A checker that takes the place of the executable says itself what it runs.
    if (const char* szProgram = std::getenv("VORNJSONDB_TEST_PROGRAM")) {
        return szProgram;
    }
    char szPath[4096];
    const std::string strLink = "/proc/" + std::to_string(nParent) + "/exe";
    const ssize_t nLength = ::readlink(strLink.c_str(), szPath, sizeof(szPath));
    const std::string strPath(szPath, nLength < 0 ? 0 : static_cast<size_t>(nLength));
    return BaseName(strPath).compare(0, 4, "qemu") == 0 ? strLink : "/proc/self/exe";
}

[[noreturn]] void StartAgain(pid_t nParent, const std::string& strTest, int nCall) {
    std::vector<std::string> vecArguments;
    for (const std::string& strArgument : CommandLineOf(nParent)) {
        vecArguments.push_back(strArgument);
        if (BaseName(strArgument) == program_invocation_short_name) {
            break;
        }
    }
    vecArguments.push_back("--gtest_filter=" + strTest);
    std::vector<char*> vecPointers;
    vecPointers.reserve(vecArguments.size() + 1);
    for (std::string& strArgument : vecArguments) {
        vecPointers.push_back(strArgument.data());
    }
    vecPointers.push_back(nullptr);
    for (const char* szName : {"GTEST_OUTPUT", "GTEST_TOTAL_SHARDS", "GTEST_SHARD_INDEX",
                               "GTEST_SHARD_STATUS_FILE", "TEST_PREMATURE_EXIT_FILE"}) {
        ::unsetenv(szName);
    }
    ::setenv(kFreshVariable, std::to_string(nCall).c_str(), 1);
    ::execv(Program(nParent).c_str(), vecPointers.data());
    std::perror("cannot start the test executable again");
    ::_exit(EXIT_FAILURE);
}

std::string ReadAll(int nFd) {
    std::string strText;
    char szBuffer[4096];
    ssize_t nRead = 0;
    while ((nRead = ::read(nFd, szBuffer, sizeof(szBuffer))) > 0) {
        strText.append(szBuffer, static_cast<size_t>(nRead));
    }
    return strText;
}

struct Ended {
    int nStatus;
    std::string strOutput;
};

Ended StartAndWait(int nCall) {
    int aFds[2];
    if (::pipe(aFds) != 0) {
        return {-1, "no pipe"};
    }
    std::fflush(stdout);
    const pid_t nParent = ::getpid();
    const std::string strTest = CurrentTestName();
    const pid_t nChild = ::fork();
    if (nChild == 0) {
        ::dup2(aFds[1], STDOUT_FILENO);
        ::dup2(aFds[1], STDERR_FILENO);
        ::close(aFds[0]);
        ::close(aFds[1]);
        StartAgain(nParent, strTest, nCall);
    }
    ::close(aFds[1]);
    const std::string strOutput = ReadAll(aFds[0]);
    ::close(aFds[0]);
    int nStatus = 0;
    if (nChild < 0 || ::waitpid(nChild, &nStatus, 0) != nChild) {
        return {-1, strOutput};
    }
    if (WIFEXITED(nStatus) && WEXITSTATUS(nStatus) == kFreshSuccess) {
        return {0, strOutput};
    }
    return {nStatus == 0 ? -1 : nStatus, strOutput};
}

// Counts the calls within one run of one test; a repeated test begins anew.
class CallCounter : public ::testing::EmptyTestEventListener {
  public:
    // Number of this call within the running test, from 1.
    static int Count() {
        static CallCounter* const pCounter = Listening();
        return ++pCounter->m_nCalls;
    }

    void OnTestEnd(const ::testing::TestInfo&) override { m_nCalls = 0; }

  private:
    static CallCounter* Listening() {
        auto* const pCounter = new CallCounter;  // owned by the list of listeners
        ::testing::UnitTest::GetInstance()->listeners().Append(pCounter);
        return pCounter;
    }

    int m_nCalls = 0;
};

Ended RunFresh(const std::function<void()>& fn) {
    const int nCall = CallCounter::Count();
    const char* szFresh = std::getenv(kFreshVariable);
    if (szFresh == nullptr) {
        return StartAndWait(nCall);
    }
    if (szFresh != std::to_string(nCall)) {
        return {0, ""};
    }
    fn();
    std::exit(::testing::Test::HasFailure() ? EXIT_FAILURE : kFreshSuccess);
}

}  // namespace

int InFreshProcess(const std::function<void()>& fn) {
    const Ended ended = RunFresh(fn);
    if (ended.nStatus != 0) {
        std::fprintf(stderr, "output of the fresh process:\n%s\n", ended.strOutput.c_str());
    }
    return ended.nStatus;
}

int InFreshProcess(const std::function<void()>& fn, std::string& strOutput) {
    Ended ended = RunFresh(fn);
    strOutput = std::move(ended.strOutput);
    return ended.nStatus;
}

}  // namespace testhost
