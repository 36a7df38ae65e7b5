// Crash: a child runs a seeded stream of operations, acknowledges each by one byte through a pipe,
// and is killed at a random moment. What it acknowledged must be in the file, nothing may be half
// there.

#include <poll.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <ctime>
#include <memory>

#include "support/Store.h"

namespace campaign {

namespace {

constexpr Owner kOwner = {0, 1, 120};

// Runs until it is killed.
[[noreturn]] void RunChild(const std::string& strPath, Stream stream, int nFd) {
    const Database db(strPath);
    db.Run("PRAGMA synchronous=NORMAL");
    // Changes reach the file before the commit, so that there is something to roll back.
    db.Run("PRAGMA cache_size=4");
    const std::unique_ptr<Store> pStore = NewStore(db);
    for (;;) {
        const Step step = stream.Choose();
        stream.Apply(step);
        const bool blDone = pStore->Run(step) >= 0;
        if (!Expect(blDone,
                    [&] {
                        return std::string(step.pRow->szName) + " failed on key " +
                               std::to_string(step.nKey) + ": " + pStore->Failure();
                    }) ||
            write(nFd, "a", 1) != 1) {
            _exit(1);
        }
    }
}

void Wait(int nMicroseconds) {
    const timespec wait = {0, nMicroseconds * 1000L};
    nanosleep(&wait, nullptr);
}

// Kills the child some time after its first step; returns the number of acknowledged steps.
int KillChild(pid_t nChild, int nFd, Random& random) {
    pollfd first = {nFd, POLLIN, 0};
    poll(&first, 1, 20000);
    Wait(random.Below(12000));
    kill(nChild, SIGKILL);
    int nStatus = 0;
    waitpid(nChild, &nStatus, 0);
    Expect(WIFSIGNALED(nStatus), [] { return std::string("the child ended by itself"); });
    int nSteps = 0;
    char szBuffer[4096];
    ssize_t n = 0;
    while ((n = read(nFd, szBuffer, sizeof(szBuffer))) > 0) {
        nSteps += static_cast<int>(n);
    }
    return nSteps;
}

void FollowOneStep(Stream& stream) {
    stream.Apply(stream.Choose());
}

// The handle sees what is in the file.
void CheckHandle(const Database& db, const State& now) {
    std::map<int, std::string> rows;
    Expect(NewStore(db)->List(kOwner.nOwner, rows) && rows == now.rows,
           [] { return std::string("the handle lists other rows"); });
}

void RunRound(const std::string& strPath, Random& random, State& now) {
    int aFds[2] = {-1, -1};
    Expect(pipe(aFds) == 0, [] { return std::string("no pipe"); });
    const std::uint64_t nSeed = random.Next();
    Stream stream(nSeed, kOwner, now);
    const pid_t nChild = fork();
    if (nChild == 0) {
        close(aFds[0]);
        RunChild(strPath, stream, aFds[1]);
    }
    close(aFds[1]);
    const int nSteps = KillChild(nChild, aFds[0], random);
    close(aFds[0]);

    for (int i = 0; i < nSteps; ++i) {
        FollowOneStep(stream);
    }
    const State acknowledged = stream.Committed();
    FollowOneStep(stream);
    Figure("rolled back at the next open") += access((strPath + "-journal").c_str(), F_OK) == 0;
    const Database db(strPath);
    now = ReadState(db, kOwner.nOwner);
    const bool blNext = now != acknowledged && now == stream.Committed();
    Expect(now == acknowledged || blNext, [&] {
        return "stream " + std::to_string(nSeed) + ", after " + std::to_string(nSteps) +
               " acknowledged steps: " + now.Text() + " instead of " + acknowledged.Text();
    });
    CheckHandle(db, now);
    Expect(db.Rows("PRAGMA integrity_check") == "'ok'\n",
           [] { return std::string("the database is damaged"); });
    ++Figure("kills");
    Figure("acknowledged steps") += static_cast<std::uint64_t>(nSteps);
    Figure("committed, but not yet acknowledged") += blNext ? 1 : 0;
}

int RunCrashCampaign(const Options& options) {
    for (const char* szFigure :
         {"kills", "acknowledged steps", "committed, but not yet acknowledged",
          "rolled back at the next open"}) {
        Figure(szFigure);
    }
    Random random(options.nSeed);
    const int nKills = options.Count(20, 400);
    for (const char* szMode : {"DELETE", "WAL"}) {
        const std::string strPath = TempFolder() + "/crash.db";
        NewFile(strPath, szMode);
        State now;
        for (int i = 0; i < (nKills + 1) / 2; ++i) {
            RunRound(strPath, random, now);
        }
        RemoveDatabase(strPath);
    }
    return Finish("crash");
}

}  // namespace

}  // namespace campaign

int main(int argc, char** argv) {
    return campaign::RunCrashCampaign(campaign::ParseOptions(argc, argv, "crash"));
}
