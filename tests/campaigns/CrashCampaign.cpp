// Crash: a child runs a seeded stream of operations, acknowledges each by one byte through a pipe,
// and is killed at a random moment. What it acknowledged must be in the file, nothing may be half
// there.

#include <poll.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <ctime>
#include <map>
#include <memory>

#include "support/Campaign.h"

namespace campaign {

namespace {

constexpr char kTable[] = "crash";
constexpr int kKeys = 120;

std::string Name(int nKey) {
    return "name-" + std::to_string(nKey);
}

struct Step {
    enum Kind {
        kCreate,
        kReplace,
        kUpdate,
        kDeleteByName,
        kDeleteRange,
        kBegin,
        kCommit,
        kRollback
    };
    Kind eKind;
    int nKey;
    std::string strText;
};

// The steps follow from the seed and the rows alone, so that child and parent see the same ones.
class Stream {
  public:
    using Rows = std::map<int, std::string>;

    Stream(std::uint64_t nSeed, Rows rows) : m_random(nSeed), m_rows(rows), m_committed(rows) {}

    Step Next() {
        const Step step = Choose();
        Apply(step);
        if (!m_blOpen) {
            m_committed = m_rows;
        }
        return step;
    }

    // What stands in the file when the process ends now.
    const Rows& Committed() const { return m_committed; }

  private:
    Step Choose() {
        const int nKey = 1 + m_random.Below(kKeys);
        const std::string strText =
            std::to_string(m_random.Next()) +
            std::string(static_cast<std::size_t>(m_random.Below(3000)), 'x');
        if (m_blOpen && m_random.OneIn(4)) {
            return {m_random.OneIn(3) ? Step::kRollback : Step::kCommit, 0, ""};
        }
        if (!m_blOpen && m_random.OneIn(6)) {
            return {Step::kBegin, 0, ""};
        }
        if (m_rows.count(nKey) == 0) {
            return {Step::kCreate, nKey, strText};
        }
        constexpr Step::Kind kOnRow[] = {Step::kReplace, Step::kUpdate, Step::kUpdate,
                                         Step::kDeleteByName, Step::kDeleteRange};
        return {m_random.Of(kOnRow), nKey, strText};
    }

    void Apply(const Step& step) {
        switch (step.eKind) {
            case Step::kCreate:
            case Step::kReplace:
            case Step::kUpdate:
                m_rows[step.nKey] = step.strText;
                break;
            case Step::kDeleteByName:
                m_rows.erase(step.nKey);
                break;
            case Step::kDeleteRange:
                m_rows.erase(m_rows.lower_bound(step.nKey), m_rows.upper_bound(step.nKey + 4));
                break;
            case Step::kRollback:
                m_rows = m_committed;
                m_blOpen = false;
                break;
            default:
                m_blOpen = step.eKind == Step::kBegin;
        }
    }

    Random m_random;
    Rows m_rows;
    Rows m_committed;
    bool m_blOpen = false;
};

std::unique_ptr<VornJsonDbApi> Handle(const Database& db) {
    return NewHandle(
        db.Get(), kTable, Definition(kTable, "id:int,name:string,text:string"),
        "CREATE TABLE IF NOT EXISTS crash (id INTEGER PRIMARY KEY, name TEXT UNIQUE, text TEXT)");
}

bool Run(VornJsonDbApi& handle, const Step& step) {
    Json::Value jRecord;
    jRecord["id"] = step.nKey;
    jRecord["name"] = Name(step.nKey);
    jRecord["text"] = step.strText;
    Json::Value jFilter;
    std::string strName = Name(step.nKey);
    switch (step.eKind) {
        case Step::kCreate:
            return handle.recCreate(jRecord, jRecord) == 0;
        case Step::kReplace:
            return handle.recSave(jRecord, false) == 0;
        case Step::kUpdate:
            jFilter["id"] = step.nKey;
            return handle.recUpdateByFilter(jFilter, jRecord) == 0;
        case Step::kDeleteByName:
            return handle.recDeleteByName(strName, "name") == 1;
        case Step::kDeleteRange:
            jFilter["vornSqlWhereFilter"] =
                "id between " + std::to_string(step.nKey) + " and " + std::to_string(step.nKey + 4);
            return handle.recDelete(jFilter) > 0;
        default:
            return handle.runSqlEx(step.eKind == Step::kBegin    ? "BEGIN"
                                   : step.eKind == Step::kCommit ? "COMMIT"
                                                                 : "ROLLBACK") >= 0;
    }
}

// Runs until it is killed.
[[noreturn]] void RunChild(const std::string& strPath, Stream stream, int nFd) {
    const Database db(strPath);
    db.Run("PRAGMA synchronous=NORMAL");
    // Changes reach the file before the commit, so that there is something to roll back.
    db.Run("PRAGMA cache_size=4");
    const std::unique_ptr<VornJsonDbApi> pHandle = Handle(db);
    for (;;) {
        const Step step = stream.Next();
        const bool blDone = Run(*pHandle, step);
        if (!Expect(blDone,
                    [&] {
                        return "step kind " + std::to_string(step.eKind) + " failed on key " +
                               std::to_string(step.nKey);
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

Stream::Rows ReadRows(const Database& db) {
    Stream::Rows rows;
    const std::unique_ptr<VornJsonDbApi> pHandle = Handle(db);
    Json::Value jQuery;
    Json::Value jRows;
    Expect(pHandle->recList(jQuery, jRows) == 0, [] { return std::string("cannot list"); });
    for (const Json::Value& jRow : jRows) {
        const int nKey = jRow["id"].asInt();
        rows[nKey] = jRow["text"].asString();
        Expect(jRow["name"] == Name(nKey), [&] { return "row " + ToText(jRow); });
    }
    return rows;
}

void RunRound(const std::string& strPath, Random& random, Stream::Rows& rows) {
    int aFds[2] = {-1, -1};
    Expect(pipe(aFds) == 0, [] { return std::string("no pipe"); });
    const std::uint64_t nSeed = random.Next();
    Stream stream(nSeed, rows);
    const pid_t nChild = fork();
    if (nChild == 0) {
        close(aFds[0]);
        RunChild(strPath, stream, aFds[1]);
    }
    close(aFds[1]);
    const int nSteps = KillChild(nChild, aFds[0], random);
    close(aFds[0]);

    for (int i = 0; i < nSteps; ++i) {
        stream.Next();
    }
    const Stream::Rows acknowledged = stream.Committed();
    stream.Next();
    Figure("rolled back at the next open") += access((strPath + "-journal").c_str(), F_OK) == 0;
    const Database db(strPath);
    rows = ReadRows(db);
    const bool blNext = rows != acknowledged && rows == stream.Committed();
    Expect(rows == acknowledged || blNext, [&] {
        return "stream " + std::to_string(nSeed) + ", after " + std::to_string(nSteps) +
               " acknowledged steps: other rows than those";
    });
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
        RemoveDatabase(strPath);
        {
            const Database db(strPath);
            db.Run(std::string("PRAGMA journal_mode=") + szMode);
            Handle(db);
        }
        Stream::Rows rows;
        for (int i = 0; i < (nKills + 1) / 2; ++i) {
            RunRound(strPath, random, rows);
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
