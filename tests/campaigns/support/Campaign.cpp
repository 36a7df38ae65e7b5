#include "Campaign.h"

#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>

namespace campaign {

// ---- options ------------------------------------------------------------------------------------

int Options::Count(int nDefault, int nLong) const {
    const int nWanted = nCount > 0 ? nCount : (blLong ? nLong : nDefault);
    return nWanted / nScale > 0 ? nWanted / nScale : 1;
}

Options ParseOptions(int argc, char** argv, const char* szCampaign) {
    Options options;
    for (int i = 1; i < argc; ++i) {
        const std::string strOption = argv[i];
        if (strOption == "--long") {
            options.blLong = true;
            continue;
        }
        if (i + 1 >= argc) {
            std::fprintf(stderr, "usage: %s [--seed N] [--long] [--scale N] [--count N]\n",
                         argv[0]);
            std::exit(2);
        }
        const unsigned long long nValue = std::strtoull(argv[++i], nullptr, 10);
        if (strOption == "--seed") {
            options.nSeed = nValue;
        } else if (strOption == "--scale" && nValue > 0) {
            options.nScale = static_cast<int>(nValue);
        } else if (strOption == "--count" && nValue > 0) {
            options.nCount = static_cast<int>(nValue);
        } else {
            std::fprintf(stderr, "%s: cannot use %s %s\n", argv[0], strOption.c_str(), argv[i]);
            std::exit(2);
        }
    }
    std::printf("%s: seed %llu%s\n", szCampaign, static_cast<unsigned long long>(options.nSeed),
                options.blLong ? ", long form" : "");
    std::fflush(stdout);
    return options;
}

std::uint64_t Random::Next() {
    m_nState += 0x9E3779B97F4A7C15U;
    std::uint64_t n = m_nState;
    n = (n ^ (n >> 30U)) * 0xBF58476D1CE4E5B9U;
    n = (n ^ (n >> 27U)) * 0x94D049BB133111EBU;
    return n ^ (n >> 31U);
}

// ---- violations and figures ---------------------------------------------------------------------

namespace {

constexpr int kMaxFigures = 32;
constexpr int kMaxShown = 40;

struct Shared {
    std::uint64_t nViolations;
    int nFigures;
    struct {
        char szName[64];
        std::uint64_t nValue;
    } aFigures[kMaxFigures];
};

Shared& SharedPage() {
    static Shared* const s_pShared = [] {
        void* pPage = mmap(nullptr, sizeof(Shared), PROT_READ | PROT_WRITE,
                           MAP_SHARED | MAP_ANONYMOUS, -1, 0);
        if (pPage == MAP_FAILED) {
            std::perror("mmap");
            std::exit(2);
        }
        return new (pPage) Shared();
    }();
    return *s_pShared;
}

}  // namespace

void Violation(const std::string& strWhat) {
    if (__atomic_add_fetch(&SharedPage().nViolations, 1, __ATOMIC_SEQ_CST) <= kMaxShown) {
        std::printf("VIOLATION: %s\n", strWhat.c_str());
        std::fflush(stdout);
    }
}

bool Expect(bool blHolds, const std::function<std::string()>& fnWhat) {
    if (!blHolds) {
        Violation(fnWhat());
    }
    return blHolds;
}

std::uint64_t& Figure(const char* szName) {
    Shared& shared = SharedPage();
    for (int i = 0; i < shared.nFigures; ++i) {
        if (std::strcmp(shared.aFigures[i].szName, szName) == 0) {
            return shared.aFigures[i].nValue;
        }
    }
    if (shared.nFigures == kMaxFigures) {
        std::fprintf(stderr, "too many figures\n");
        std::exit(2);
    }
    auto& figure = shared.aFigures[shared.nFigures++];
    std::snprintf(figure.szName, sizeof(figure.szName), "%s", szName);
    return figure.nValue;
}

void AddTo(std::uint64_t& nFigure, std::uint64_t n) {
    __atomic_add_fetch(&nFigure, n, __ATOMIC_SEQ_CST);
}

void RaiseTo(std::uint64_t& nFigure, std::uint64_t n) {
    std::uint64_t nNow = __atomic_load_n(&nFigure, __ATOMIC_SEQ_CST);
    while (nNow < n && !__atomic_compare_exchange_n(&nFigure, &nNow, n, false, __ATOMIC_SEQ_CST,
                                                    __ATOMIC_SEQ_CST)) {
    }
}

int Finish(const char* szCampaign) {
    const Shared& shared = SharedPage();
    for (int i = 0; i < shared.nFigures; ++i) {
        std::printf("  %-44s %12llu\n", shared.aFigures[i].szName,
                    static_cast<unsigned long long>(shared.aFigures[i].nValue));
    }
    std::printf("  %-44s %12llu\n", "violations",
                static_cast<unsigned long long>(shared.nViolations));
    std::printf("%s: %s\n", szCampaign, shared.nViolations == 0 ? "passed" : "FAILED");
    std::fflush(stdout);
    return shared.nViolations == 0 ? 0 : 1;
}

bool InChild(const std::string& strWhat, const std::function<void()>& fn) {
    std::fflush(stdout);
    const std::uint64_t nBefore = SharedPage().nViolations;
    const pid_t nChild = fork();
    if (nChild == 0) {
        fn();
        std::exit(0);
    }
    int nStatus = 0;
    const bool blEnded = nChild > 0 && waitpid(nChild, &nStatus, 0) == nChild && nStatus == 0;
    if (!blEnded) {
        Violation(strWhat + ": the process ended with status " + std::to_string(nStatus));
    }
    return blEnded && nBefore == SharedPage().nViolations;
}

Json::Value AskChild(const std::function<Json::Value()>& fn) {
    int aFds[2] = {-1, -1};
    std::fflush(stdout);
    if (pipe(aFds) != 0) {
        Violation("no pipe");
        return Json::Value();
    }
    const pid_t nChild = fork();
    if (nChild == 0) {
        const std::string strAnswer = ToText(fn());
        std::size_t nDone = 0;
        while (nDone < strAnswer.size()) {
            const ssize_t n = write(aFds[1], strAnswer.data() + nDone, strAnswer.size() - nDone);
            nDone += n > 0 ? static_cast<std::size_t>(n) : 0;
        }
        _exit(0);
    }
    close(aFds[1]);
    std::string strAnswer;
    char szBuffer[4096];
    ssize_t n = 0;
    while ((n = read(aFds[0], szBuffer, sizeof(szBuffer))) > 0) {
        strAnswer.append(szBuffer, static_cast<std::size_t>(n));
    }
    close(aFds[0]);
    int nStatus = 0;
    waitpid(nChild, &nStatus, 0);
    if (nStatus != 0 || strAnswer.empty()) {
        Violation("a child process ended with status " + std::to_string(nStatus));
        return Json::Value();
    }
    return FromText(strAnswer);
}

// ---- JSON ---------------------------------------------------------------------------------------

Json::Value FromText(const std::string& strText) {
    Json::CharReaderBuilder builder;
    const std::unique_ptr<Json::CharReader> pReader(builder.newCharReader());
    Json::Value jValue;
    std::string strErrors;
    if (!pReader->parse(strText.data(), strText.data() + strText.size(), &jValue, &strErrors)) {
        Violation("a test's own text does not parse: " + strText);
    }
    return jValue;
}

std::string ToText(const Json::Value& jValue) {
    return jsonhelpers::Compact(jValue);
}

}  // namespace campaign
