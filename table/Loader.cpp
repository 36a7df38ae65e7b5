// Many records through statements that stay prepared.

#include <utility>

#include "Attempt.h"
#include "FindingCodes.h"
#include "LoaderParts.h"

namespace VORN_JSON_DB {

namespace {

constexpr char kDo[] = "load records into";

// Why a call of a loader cannot do anything.
Status NotReady(const Loader::Parts* pParts) {
    return pParts != nullptr ? pParts->State()
                             : vornjsondb::Fail(StatusCode::kMisuse, {"load records", nullptr},
                                                "the loader is not started");
}

}  // namespace

Loader::Parts::Parts(std::shared_ptr<Table::Parts> pTo, const LoadOptions& HowToLoad)
    : pOwn(std::move(pTo)),
      Into(*pOwn),
      How(HowToLoad),
      Values(Into.Of, Into.Codec, Into.How.blCompatible, Into.How.blIgnoreUnknown),
      vecWrong(Into.Of.Size() + 2),
      Writer(Into, Values) {}

void Loader::Parts::SetWrong(size_t nPlace, FindingList& vecFindings) {
    SetRight(nPlace);
    vecWrong[nPlace] = std::move(vecFindings[0]);
    ++nWrong;
}

void Loader::Parts::SetRight(size_t nPlace) {
    if (vecWrong[nPlace].szCode != nullptr) {
        vecWrong[nPlace] = Finding();
        --nWrong;
    }
}

void Loader::Parts::TakeWrong(FindingList& vecFindings) {
    vecFindings.reserve(nWrong);
    for (size_t nPlace = 0; nWrong > 0; ++nPlace) {
        // mutate(sunk): what is right stays so.
        if (vecWrong[nPlace].szCode != nullptr) {
            vecFindings.push_back(std::move(vecWrong[nPlace]));
            SetRight(nPlace);
        }
    }
}

Status Loader::Parts::Begin(const vornjsondb::Doing& What) {
    // mutate(exchanged): nobody asks a load that has ended whose transaction it was in.
    if (All.IsOpen()) {
        return vornjsondb::Fail(StatusCode::kMisuse, What, "its transaction was ended by others");
    }
    blCallers = sqlite3_get_autocommit(Into.pDb) == 0;
    return Within(What, All.Begin(Into.pDb, Transaction::Mode::kImmediate, Into.How.nWaitMs));
}

Status Loader::Parts::Write(FindingList& vecFindings) {
    const vornjsondb::Doing What{"load record", &Into.Of.Table(), Now.nRecords};
    vornjsondb::CheckEmpty(Values, vecFindings);
    if (vecFindings.empty() && How.eOnDuplicate != OnDuplicate::kStop) {
        Values.HasKey(vecFindings);
    }
    if (!vecFindings.empty()) {
        return vornjsondb::FromFindings(std::move(vecFindings), What);
    }
    const bool blBegun = All.IsOpen() && sqlite3_get_autocommit(Into.pDb) == 0;
    if (!blBegun) {
        Status Begun = Begin(What);
        if (!Begun.Ok()) {
            return Begun;
        }
    }
    Written eWritten = Written::kInserted;
    const auto fnWrite = [&] { return Writer.Write(How.eOnDuplicate, What, eWritten); };
    Status Outcome =
        Into.blFails ? vornjsondb::AttemptWhole(Into.pDb, Into.Kept, 0, What, fnWrite) : fnWrite();
    if (Outcome.Ok()) {
        static constexpr std::int64_t LoadCounts::*kCounts[] = {
            &LoadCounts::nInserted, &LoadCounts::nSkipped, &LoadCounts::nReplaced,
            &LoadCounts::nReplaced};
        ++(Now.*kCounts[static_cast<size_t>(eWritten)]);
        return Outcome;
    }
    return vornjsondb::InTransaction(Into.pDb, Outcome);
}

// What is the record's own fault does not touch the others, as long as their transaction is there.
Status Loader::Parts::Fail(const Status& Outcome) {
    const StatusCode eCode = Outcome.Code();
    const bool blBad = eCode == StatusCode::kRefused || eCode == StatusCode::kDuplicate ||
                       eCode == StatusCode::kConstraint;
    Now.nFailed += blBad ? 1 : 0;
    const bool blGone = All.IsOpen() && sqlite3_get_autocommit(Into.pDb) != 0;
    // mutate(exchanged): both only look.
    const bool blGoOn = How.blGoOnAfterBad && !Writer.HasStored();
    return blBad && !blGone && blGoOn ? Outcome : End(Outcome);
}

// Nothing is left that a further call could go on with, so a lock asks for all of it anew.
Status Loader::Parts::End(const Status& Outcome) {
    const bool blLock = vornjsondb::IsLock(Outcome);
    Ended = blLock ? vornjsondb::Amended(Outcome, Retry::kTransaction, "") : Outcome;
    // mutate(true, sunk): to roll back nothing fails, which is ignored.
    if (All.IsOpen()) {
        const bool blThere = sqlite3_get_autocommit(Into.pDb) == 0;
        All.Rollback().Ignore();  // mutate(doubled): a second time there is nothing to undo.
        if (blCallers && blThere) {
            Ended = vornjsondb::InTransaction(Into.pDb, Ended);
        }
    }
    Now.nInserted = Kept.nInserted;
    Now.nReplaced = Kept.nReplaced;
    Now.nSkipped = Kept.nSkipped;
    return Ended;
}

Status Loader::Parts::EndRecord(FindingList& vecFindings) {
    const vornjsondb::Running Busy(Into, this);
    ++Now.nRecords;
    Status Outcome;
    try {
        Outcome = Write(vecFindings);
    } catch (...) {
        Values.Clear();  // the next record has none of this one's
        throw;
    }
    Values.Clear();
    if (!Outcome.Ok()) {
        return Fail(Outcome);
    }
    const bool blFull = !blCallers && How.nRowsPerTransaction > 0 &&
                        Now.nRecords - Now.nCommitted >= How.nRowsPerTransaction;
    if (!blFull) {
        return Outcome;
    }
    Outcome = Commit();
    if (Outcome.Ok() || !Ended.Ok()) {
        return Outcome;
    }
    return End(Outcome);
}

Status Loader::Parts::Commit() {
    if (All.IsOpen()) {
        const Status Outcome = vornjsondb::Within(Into.Do(kDo), All.Commit());
        if (!Outcome.Ok()) {
            const bool blAgain = Outcome.Code() == StatusCode::kLocked;  // it is open still
            return blAgain ? Outcome : End(Outcome);
        }
    }
    Now.nCommitted = Now.nRecords;
    Kept = Now;
    return {};
}

Status Loader::Parts::State() const {
    return Ended.Ok() ? vornjsondb::CheckState(&Into, kDo, true) : Ended;
}

Loader::Loader() = default;
Loader::~Loader() = default;

Status Loader::Start(Table& Into, const LoadOptions& How) {
    if (m_pParts && m_pParts->Into.pRunning != nullptr) {
        return vornjsondb::CheckState(&m_pParts->Into, kDo, true);
    }
    m_pParts.reset();
    Status Outcome = vornjsondb::CheckState(Into.m_pParts.get(), kDo, true);
    if (Outcome.Ok()) {
        Outcome = vornjsondb::CheckMode(How.eOnDuplicate, Into.m_pParts->Do(kDo));
    }
    if (!Outcome.Ok()) {
        return Outcome;
    }
    if (How.eOnDuplicate != OnDuplicate::kStop && Into.m_pParts->Of.Key().empty()) {
        FindingList vecFindings;
        Report(vecFindings, vornjsondb::FindingCode::kNoKey, "", vornjsondb::kNoKeyText);
        return vornjsondb::FromFindings(std::move(vecFindings), Into.m_pParts->Do(kDo));
    }
    m_pParts = std::make_unique<Parts>(Into.m_pParts, How);
    return Outcome;
}

Status Loader::Add(const Json::Value& jRecord) {
    if (!m_pParts || !m_pParts->IsReady()) {
        return NotReady(m_pParts.get());
    }
    FindingList vecFindings;
    if (m_pParts->nWrong > 0) {  // mutate(sunk): what is empty stays so.
        // mutate(doubled): the second time there is none.
        m_pParts->TakeWrong(vecFindings);
        vecFindings.clear();
    }
    m_pParts->Values.Take(jRecord, vecFindings);
    return m_pParts->EndRecord(vecFindings);
}

Status Loader::EndRecord() {
    if (!m_pParts || !m_pParts->IsReady()) {
        return NotReady(m_pParts.get());
    }
    FindingList vecFindings;
    if (m_pParts->nWrong > 0) {  // mutate(true, hoisted, sunk): of none none is taken.
        // mutate(doubled): the second time there is none.
        m_pParts->TakeWrong(vecFindings);
    }
    return m_pParts->EndRecord(vecFindings);
}

Status Loader::Commit() {
    if (!m_pParts || !m_pParts->IsReady()) {
        return NotReady(m_pParts.get());
    }
    const vornjsondb::Running Busy(m_pParts->Into, m_pParts.get());
    return m_pParts->Commit();
}

const LoadCounts& Loader::Counts() const {
    static constexpr LoadCounts kNone;
    return m_pParts ? m_pParts->Now : kNone;
}

}  // namespace VORN_JSON_DB
