// I/O faults: each operation that reaches the files, with the Nth call of one kind failing, N
// rising until the operation passes untouched, with rollback journals and with a write-ahead log.

#include <algorithm>
#include <memory>

#include "support/FaultyVfs.h"
#include "support/Operations.h"

namespace campaign {

namespace {

constexpr IoFault kFaults[] = {
    IoFault::kAny,        IoFault::kRead,     IoFault::kShortRead, IoFault::kWrite,
    IoFault::kShortWrite, IoFault::kDiskFull, IoFault::kSync,      IoFault::kLock,
    IoFault::kLockBusy,   IoFault::kTruncate, IoFault::kFileSize,  IoFault::kOpen,
    IoFault::kDelete,     IoFault::kAccess,   IoFault::kShmMap,    IoFault::kShmLock,
};

// No lock is ever let go of by another process here: there is nothing to wait for.
bool SkipPause(int) {
    return false;
}

class Case {
  public:
    Case(const Operation& operation, const Table& table, const char* szMode)
        : m_operation(operation), m_table(table), m_szMode(szMode) {
        m_strPath = TempFolder() + "/io.db";
        RemoveDatabase(m_strPath);
        {
            const Database db(m_strPath);
            db.Run(std::string("PRAGMA journal_mode=") + m_szMode);
            db.Run("PRAGMA synchronous=OFF");
            m_table.Fill(db);
            m_strBefore = m_table.Content(db);
        }
        m_strFile = ReadFile(m_strPath);
        LearnResult();
    }

    // False when no call failed.
    bool Run(IoFault eFault, long nNth, bool blForEver) {
        m_eFault = eFault;
        m_nNth = nNth;
        m_blForEver = blForEver;
        RemoveDatabase(m_strPath);
        WriteFile(m_strPath, m_strFile);
        RunOnFile();
        const bool blFailed = DisarmIo();
        const Database db(m_strPath);
        db.Run("PRAGMA synchronous=OFF");
        Check(db.Rows("PRAGMA integrity_check") == "'ok'\n", "the database is damaged");
        const std::string strNow = m_table.Content(db);
        Check(strNow == m_strAfter || (!m_blAcknowledged && strNow == m_strBefore),
              (m_blAcknowledged ? "acknowledged, but rows: " : "rows: ") + strNow);
        return blFailed;
    }

  private:
    void LearnResult() {
        const Database db(m_strPath, kFaultyVfs);
        const HandlePtr pHandle = Open(db);
        Subject subject = {m_table, db.Get(), pHandle.get()};
        m_operation.pfnPrepare(m_table, m_argsResult);
        m_nResult = m_operation.pfnRun(subject, m_argsResult);
        m_strAfter = m_table.Content(db);
    }

    HandlePtr Open(const Database& db) const {
        db.Run("PRAGMA cache_size=2");
        db.Run(std::string("PRAGMA journal_mode=") + m_szMode);
        // The log is written back within the operation.
        db.Run("PRAGMA wal_autocheckpoint=1");
        return NewHandle(db, m_table);
    }

    void RunOnFile() {
        const Database db(m_strPath, kFaultyVfs);
        const HandlePtr pHandle = m_operation.eReach == Reach::kOpens ? nullptr : Open(db);
        Subject subject = {m_table, db.Get(), pHandle.get()};
        Arguments argsBefore;
        m_operation.pfnPrepare(m_table, argsBefore);
        Arguments args = argsBefore;
        // Pages that are not in memory have to be read.
        sqlite3_db_release_memory(db.Get());
        ArmIo(m_eFault, m_nNth, m_blForEver);
        const int nResult = m_operation.pfnRun(subject, args);
        // Now and then the connection is closed while the calls still fail.
        const bool blStillFails = m_blForEver && m_nNth % 2 == 0;
        if (!blStillFails) {
            DisarmIo();
        }
        m_blAcknowledged = nResult == m_nResult && m_nResult >= 0;
        Check(nResult == m_nResult || IsFileFailure(nResult),
              "returned " + std::to_string(nResult));
        if (m_blAcknowledged) {
            Check(args == m_argsResult, "a success gave " + ToText(args.AsJson()));
        } else {
            Check(IsLeftAsDocumented(m_operation, argsBefore, args, m_argsResult),
                  "a failure left " + ToText(args.AsJson()));
        }
        CheckKind(nResult);
        // Now and then the files are looked at as the fault has left them.
        if (!blStillFails && m_nNth % 3 != 0) {
            CheckHandle(db, subject);
        }
    }

    // What must not be seen at all: a transfer in pieces, a lock that is free again at the second
    // attempt.
    void CheckKind(int nResult) const {
        const int nPauses = TakePauses().nCount;
        const bool blPieces = m_eFault == IoFault::kShortRead || m_eFault == IoFault::kShortWrite;
        Check(!blPieces || nResult == m_nResult, "a transfer in pieces failed the operation");
        if (m_eFault != IoFault::kLockBusy) {
            Check(nPauses == 0, "paused without a lock");
            return;
        }
        Check(nPauses == 0 || nPauses == (m_blForEver ? kMostPauses : 1),
              "paused " + std::to_string(nPauses) + " times");
    }

    // The handle works on after the fault, on the same connection.
    void CheckHandle(const Database& db, Subject& subject) const {
        const std::string strNow = m_table.Content(db);
        const HandlePtr pOther = Open(db);
        if (strNow != m_strBefore) {
            Check(CanList(*pOther), "another handle cannot list");
            Check(subject.pHandle == nullptr || CanList(*subject.pHandle),
                  "the handle cannot list any more");
            return;
        }
        Arguments args;
        m_operation.pfnPrepare(m_table, args);
        const int nResult = m_operation.pfnRun(subject, args);
        Check(nResult == m_nResult, "afterwards returned " + std::to_string(nResult));
        Check(m_nResult < 0 || args == m_argsResult, "afterwards gave " + ToText(args.AsJson()));
        Check(m_table.Content(db) == m_strAfter, "afterwards other rows");
    }

    void Check(bool blHolds, const std::string& strWhat) const {
        Expect(blHolds, [&] {
            return std::string(m_operation.szName) + ", " + m_szMode + ", " +
                   IoFaultName(m_eFault) + (m_blForEver ? " for ever" : " once") + ", call " +
                   std::to_string(m_nNth) + ": " + strWhat;
        });
    }

    const Operation& m_operation;
    const Table& m_table;
    const char* m_szMode;
    std::string m_strPath;
    std::string m_strFile;
    std::string m_strBefore;
    std::string m_strAfter;
    int m_nResult = 0;
    Arguments m_argsResult;
    IoFault m_eFault = IoFault::kNone;
    long m_nNth = 0;
    bool m_blForEver = false;
    bool m_blAcknowledged = false;
};

void RunCase(const Options& options, Case& theCase) {
    constexpr int kFarthest = 5000;  // a retry may always find one more call
    for (const IoFault eFault : kFaults) {
        for (const bool blForEver : {false, true}) {
            std::uint64_t& nMost = Figure("most calls of one kind in an operation");
            const long nStride = options.Count(5, kFarthest);
            long nNth = 1;
            bool blFailed = true;
            while (blFailed && nNth < kFarthest) {
                blFailed = theCase.Run(eFault, nNth, blForEver);
                Figure("calls failed") += blFailed ? 1 : 0;
                Figure(IoFaultName(eFault)) += blFailed ? 1 : 0;
                nNth += 1 + nNth / nStride;
            }
            nMost = std::max(nMost, static_cast<std::uint64_t>(nNth));
        }
    }
}

int RunIoCampaign(const Options& options) {
    InstallFaultyVfs();
    g_pfnOnPause = SkipPause;
    g_blSkipSqliteSleeps = true;
    for (const char* szFigure : {"operations", "calls failed"}) {
        Figure(szFigure);
    }
    for (const IoFault eFault : kFaults) {
        Figure(IoFaultName(eFault));
    }
    const Table small("small", 4);
    const Table wide("wide", 40);
    for (const char* szMode : {"DELETE", "TRUNCATE", "WAL"}) {
        for (const Operation& operation : kOperations) {
            if (operation.eReach == Reach::kNoFiles || operation.blFirstUse) {
                continue;
            }
            ++Figure("operations");
            Case onSmall(operation, small, szMode);
            RunCase(options, onSmall);
            if (options.blLong) {
                Case onWide(operation, wide, szMode);
                RunCase(options, onWide);
            }
        }
    }
    RemoveDatabase(TempFolder() + "/io.db");
    return Finish("io");
}

}  // namespace

}  // namespace campaign

int main(int argc, char** argv) {
    return campaign::RunIoCampaign(campaign::ParseOptions(argc, argv, "io"));
}
