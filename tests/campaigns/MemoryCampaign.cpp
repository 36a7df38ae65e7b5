// Out of memory: each public operation, with the Nth allocation failing, N rising until the
// operation passes untouched.

#include <algorithm>
#include <memory>
#include <new>
#include <stdexcept>

#include "support/Memory.h"
#include "support/Operations.h"

namespace campaign {

namespace {

constexpr MemoryFault kFaults[] = {
    {"operator new, once", true, false, false}, {"operator new, for ever", true, false, true},
    {"SQLite, once", false, true, false},       {"SQLite, for ever", false, true, true},
    {"both, once", true, true, false},          {"both, for ever", true, true, true},
};

constexpr int kEvery = 1000000;

enum class Exit { kReturned, kBadAlloc, kLogicError };

// One operation on a fresh database in memory.
class Case {
  public:
    Case(const Operation& operation, int nMembers)
        : m_operation(operation),
          m_nMembers(nMembers),
          m_table("w" + std::to_string(nMembers), nMembers) {}

    // What happens without a fault, seen in a process of its own: the library's first use of
    // anything is left to the runs with faults.
    void LearnResult() {
        const Json::Value jAll = AskChild([this] {
            const Database db;
            const HandlePtr pHandle = Prepare(db, m_table);
            Json::Value jBefore = m_table.Content(db);
            Arguments args;
            m_operation.pfnPrepare(m_table, args);
            Subject subject = {m_table, db.Get(), pHandle.get()};
            const int nResult = m_operation.pfnRun(subject, args);
            Json::Value jResult;
            jResult["result"] = nResult;
            jResult["args"] = args.AsJson();
            jResult["before"] = jBefore;
            jResult["after"] = m_table.Content(db);
            jResult["slot"] = MessageSlot(*pHandle);
            return jResult;
        });
        m_nResult = jAll["result"].asInt();
        m_argsResult = Arguments::OfJson(jAll["args"]);
        m_strBefore = jAll["before"].asString();
        m_strAfter = jAll["after"].asString();
        m_strSlot = jAll["slot"].asString();
    }

    // What the library makes once for the process is made, so that no later run keeps it.
    void WarmUp() {
        static const MemoryFault s_none = {"no fault", false, false, false};
        if (!m_operation.blFirstUse) {
            Run(s_none, 1);
        }
    }

    // False when no allocation failed.
    bool Run(const MemoryFault& fault, long nNth) {
        m_pFault = &fault;
        m_nNth = nNth;
        bool blFailed = false;
        // What the library keeps for the process grows once; what is lost is lost again.
        Check(m_operation.blFirstUse || Kept(blFailed) == 0 || Kept(blFailed) == 0,
              "loses memory of operator new");
        if (m_operation.blFirstUse) {
            Kept(blFailed);
        }
        return blFailed;
    }

  private:
    HandlePtr Prepare(const Database& db, const Table& table) const {
        table.Fill(db);
        if (!m_operation.blFirstUse) {
            KnowTable(table);
        }
        return NewHandle(db, table);
    }

    long Kept(bool& blFailed) {
        const sqlite3_int64 nSqliteBefore = sqlite3_memory_used();
        const long nBlocksBefore = OutstandingBlocks();
        blFailed = RunOnce();
        Check(sqlite3_memory_used() == nSqliteBefore, "loses memory of SQLite");
        return OutstandingBlocks() - nBlocksBefore;
    }

    bool RunOnce() {
        static int s_nTable = 0;
        std::unique_ptr<Table> pFresh;
        if (m_operation.blFirstUse) {
            pFresh = std::make_unique<Table>("t" + std::to_string(++s_nTable), m_nMembers);
        }
        const Table& table = pFresh ? *pFresh : m_table;
        const Database db;
        const HandlePtr pHandle = Prepare(db, table);
        Subject subject = {table, db.Get(), pHandle.get()};

        Arguments argsBefore;
        m_operation.pfnPrepare(table, argsBefore);
        Arguments args = argsBefore;
        int nResult = -1;
        Arm(*m_pFault, m_nNth);
        const Exit eExit = Call(subject, args, nResult);
        const bool blFailed = Disarm();

        CheckResult(eExit, nResult, argsBefore, args);
        const std::string strSlot = MessageSlot(*pHandle);
        Check(strSlot.empty() || strSlot == m_strSlot, "message slot: " + strSlot);
        Check(sqlite3_get_autocommit(db.Get()) != 0, "a transaction was left open");
        const std::string strNow = table.Content(db);
        const bool blDone = eExit == Exit::kReturned && nResult == m_nResult && m_nResult >= 0;
        Check(strNow == m_strAfter || (!blDone && strNow == m_strBefore), "rows: " + strNow);
        Check(db.Rows("PRAGMA integrity_check") == "'ok'\n", "the database is damaged");
        CheckHandle(db, subject, strNow);
        return blFailed;
    }

    Exit Call(Subject& subject, Arguments& args, int& nResult) const {
        try {
            nResult = m_operation.pfnRun(subject, args);
            return Exit::kReturned;
        } catch (const std::bad_alloc&) {
            return Exit::kBadAlloc;
        } catch (const std::logic_error&) {
            return Exit::kLogicError;
        } catch (const std::exception& e) {
            Disarm();
            Check(false, std::string("threw ") + e.what());
            return Exit::kBadAlloc;
        }
    }

    void CheckResult(Exit eExit, int nResult, const Arguments& argsBefore,
                     const Arguments& args) const {
        if (eExit == Exit::kReturned) {
            Check(nResult == m_nResult || IsMemoryFailure(nResult),
                  "returned " + std::to_string(nResult));
        }
        Check(eExit != Exit::kBadAlloc || m_pFault->blNew, "threw bad_alloc without reason");
        Check(eExit != Exit::kLogicError || (m_operation.blLogicError && m_pFault->blSqlite),
              "threw logic_error");
        const bool blDone = eExit == Exit::kReturned && nResult == m_nResult && m_nResult >= 0;
        if (blDone) {
            Check(args == m_argsResult, "a success gave " + ToText(args.AsJson()));
        } else {
            Check(IsLeftAsDocumented(m_operation, argsBefore, args, m_argsResult),
                  "a failure left " + ToText(args.AsJson()));
        }
    }

    // The handle works on: the same operation now does what it does without a fault.
    void CheckHandle(const Database& db, Subject& subject, const std::string& strNow) const {
        if (strNow == m_strBefore) {
            RunAgain(db, subject);
        }
        Check(m_operation.blFirstUse || CanList(*subject.pHandle),
              "the handle cannot list any more");
    }

    void RunAgain(const Database& db, Subject& subject) const {
        Arguments args;
        m_operation.pfnPrepare(subject.table, args);
        const int nResult = m_operation.pfnRun(subject, args);
        Check(nResult == m_nResult, "afterwards returned " + std::to_string(nResult));
        Check(m_nResult < 0 || args == m_argsResult, "afterwards gave " + ToText(args.AsJson()));
        const std::string strRows = subject.table.Content(db);
        Check(strRows == m_strAfter, "afterwards rows: " + strRows);
    }

    void Check(bool blHolds, const std::string& strWhat) const {
        Expect(blHolds, [&] {
            return std::string(m_operation.szName) + ", " + std::to_string(m_nMembers) +
                   " members, " + m_pFault->szName + ", allocation " + std::to_string(m_nNth) +
                   ": " + strWhat;
        });
    }

    const Operation& m_operation;
    int m_nMembers;
    Table m_table;
    int m_nResult = 0;
    Arguments m_argsResult;
    std::string m_strBefore;
    std::string m_strAfter;
    std::string m_strSlot;
    const MemoryFault* m_pFault = nullptr;
    long m_nNth = 0;
};

// Each N up to the stride, then steps that grow with N.
long NextNth(long nNth, int nStride) {
    return nNth + 1 + nNth / nStride;
}

void RunOperation(const Operation& operation, int nMembers, int nStride) {
    Case theCase(operation, nMembers);
    theCase.LearnResult();
    theCase.WarmUp();
    for (const MemoryFault& fault : kFaults) {
        long nNth = 1;
        while (theCase.Run(fault, nNth)) {
            ++Figure("allocations failed");
            nNth = NextNth(nNth, nStride);
        }
        std::uint64_t& nMost = Figure("most allocations in one operation");
        nMost = std::max(nMost, static_cast<std::uint64_t>(nNth));
        ++Figure("operations passed untouched");
    }
}

// What the library makes once for the process (JSON reader and writer, type cache) fails in the
// making: each N in a process of its own.
void RunFirstUse(const Options& options, const Operation& operation, const MemoryFault& fault) {
    Case theCase(operation, 4);
    theCase.LearnResult();
    long nNth = 1;
    while (AskChild([&] { return Json::Value(theCase.Run(fault, nNth)); }).asBool()) {
        ++Figure("allocations failed in a fresh process");
        nNth = NextNth(nNth, options.Count(6, kEvery));
    }
}

int RunMemoryCampaign(const Options& options) {
    InstallSqliteAllocator();
    for (const char* szFigure :
         {"operations", "operations passed untouched", "allocations failed",
          "allocations failed in a fresh process", "most allocations in one operation"}) {
        Figure(szFigure);
    }
    const int nWide = std::max(40 / options.nScale, 8);
    for (const Operation& operation : kOperations) {
        ++Figure("operations");
        InChild(operation.szName, [&] {
            RunOperation(operation, 4, options.Count(8, kEvery));
            RunOperation(operation, nWide, options.Count(3, 60));
        });
    }
    for (const Operation& operation : kOperations) {
        const std::string strName = operation.szName;
        if (strName == "recCreate, first use" || strName == "recList, first use" ||
            strName == "Create, first use" || strName == "List, first use") {
            RunFirstUse(options, operation, kFaults[0]);
            RunFirstUse(options, operation, kFaults[1]);
        }
    }
    return Finish("memory");
}

}  // namespace

}  // namespace campaign

int main(int argc, char** argv) {
    return campaign::RunMemoryCampaign(campaign::ParseOptions(argc, argv, "memory"));
}
