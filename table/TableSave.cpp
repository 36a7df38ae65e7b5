// Writing one record.

#include <utility>

#include "Attempt.h"
#include "FindingCodes.h"
#include "RecordWriter.h"
#include "SelectSql.h"
#include "TableParts.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Doing;
using vornjsondb::FailBySqlite;
using Parts = Table::Parts;

// Reads the row that was just written. A row that is new is found by its rowid, which the key may
// not tell yet; all others by their key.
Status ReadBack(Parts& From, Written eWritten, const Doing& What, Json::Value& jStored) {
    const bool blByRowid = eWritten == Written::kInserted && !From.strRowid.empty();
    FindingList vecMissing;
    // mutate(exchanged): both only look.
    if (!blByRowid && !From.Values.HasKey(vecMissing)) {
        return vornjsondb::Fail(StatusCode::kNotFound, What,
                                "the row cannot be told from others: it has no rowid, and the "
                                "record no key");
    }
    vornjsondb::Statement Lent;
    int nResult = From.Kept.Take(
        blByRowid ? "rowid" : "key", [&] { return vornjsondb::SelectOneSql(From, blByRowid); },
        Lent);
    if (nResult == SQLITE_OK) {
        int nNext = 1;
        nResult = blByRowid ? sqlite3_bind_int64(Lent.Get(), 1, sqlite3_last_insert_rowid(From.pDb))
                            : From.Values.BindKey(Lent.Get(), nNext);
    }
    if (nResult == SQLITE_OK) {
        nResult = Lent.Step();
    }
    // mutate(hoisted): without a row nobody is given what was read.
    if (nResult == SQLITE_ROW) {
        jStored = From.WholeRow.Read(Lent.Get(), From.Codec);
        return {};
    }
    return nResult == SQLITE_DONE
               ? vornjsondb::Fail(StatusCode::kNotFound, What, "the row is gone once it is written")
               : FailBySqlite(From.pDb, nResult, What);
}

// A single statement is whole by itself, as long as nothing is looked at behind it.
bool IsOneStatement(const Parts& Into, OnDuplicate eOnDuplicate, const Json::Value* pjStored) {
    const bool blOne = eOnDuplicate == OnDuplicate::kStop || eOnDuplicate == OnDuplicate::kSkip;
    // mutate(exchanged): all only look.
    return blOne && pjStored == nullptr && !Into.HandsOut(Into.Values) && !Into.blFails;
}

Status Take(Parts& Into, const Json::Value& jRecord, OnDuplicate eOnDuplicate, const Doing& What) {
    FindingList vecFindings;
    Into.Values.Take(jRecord, vecFindings);
    vornjsondb::CheckEmpty(Into.Values, vecFindings);
    if (vecFindings.empty() && eOnDuplicate != OnDuplicate::kStop) {
        Into.Values.HasKey(vecFindings);
    }
    return vornjsondb::FromFindings(std::move(vecFindings), What);
}

Status Write(Parts& Into, const Json::Value& jRecord, OnDuplicate eOnDuplicate, const Doing& What,
             Json::Value* pjStored, Written& eWritten) {
    Status Fits = Take(Into, jRecord, eOnDuplicate, What);
    if (!Fits.Ok()) {
        return Fits;
    }
    bool blTaken = true;
    const auto fnSteps = [&]() -> Status {
        // Anew for each further try: the one before may have filled defaults.
        // mutate(hoisted, sunk): taken once more it is the same record.
        if (!std::exchange(blTaken, false)) {
            // mutate(doubled): taken once more it is the same record.
            Take(Into, jRecord, eOnDuplicate, What).Ignore();
        }
        vornjsondb::RecordWriter Writer(Into, Into.Values);
        Status Outcome = Writer.Write(eOnDuplicate, What, eWritten);
        if (Outcome.Ok() && pjStored != nullptr) {
            Outcome = ReadBack(Into, eWritten, What, *pjStored);
        }
        return Outcome;
    };
    return IsOneStatement(Into, eOnDuplicate, pjStored)
               ? vornjsondb::Attempt(Into.pDb, Into.How.nWaitMs, fnSteps)
               : vornjsondb::AttemptWhole(Into.pDb, Into.Kept, Into.How.nWaitMs, What, fnSteps);
}

}  // namespace

Status Table::Create(const Json::Value& jRecord, Json::Value* pjStored) {
    return Save(jRecord, OnDuplicate::kStop, pjStored, nullptr);
}

Status Table::Save(const Json::Value& jRecord, OnDuplicate eOnDuplicate, Json::Value* pjStored,
                   Written* peWritten) {
    const auto fnSave = [&](Parts& Into, const Doing& What) -> Status {
        Status Mode = vornjsondb::CheckMode(eOnDuplicate, What);
        if (!Mode.Ok()) {
            return Mode;
        }
        Json::Value jStored;
        Written eWritten = Written::kInserted;
        Status Outcome = Write(Into, jRecord, eOnDuplicate, What,
                               pjStored == nullptr ? nullptr : &jStored, eWritten);
        if (Outcome.Ok() && pjStored != nullptr) {
            pjStored->swapPayload(jStored);
        }
        if (Outcome.Ok() && peWritten != nullptr) {
            *peWritten = eWritten;
        }
        return Outcome;
    };
    return vornjsondb::Guarded(m_pParts.get(), "save a record in", true, fnSave);
}

}  // namespace VORN_JSON_DB
