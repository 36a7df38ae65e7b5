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

constexpr char kGone[] = "the row is gone once it is written";

// Reads the row that was just written. A row that is new is found by its rowid, which the key may
// not tell yet; all others by their key.
Status ReadBack(Parts& From, Written eWritten, const Doing& What, Json::Value& jStored) {
    const bool blByRowid = eWritten == Written::kInserted && !From.strRowid.empty();
    if (eWritten == Written::kSkipped && From.Of.Key().empty()) {
        return vornjsondb::Fail(StatusCode::kNotFound, What, kGone);
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
    if (nResult == SQLITE_ROW) {
        jStored = From.WholeRow.Read(Lent.Get(), From.Codec);
        return {};
    }
    return nResult == SQLITE_DONE ? vornjsondb::Fail(StatusCode::kNotFound, What, kGone)
                                  : FailBySqlite(From.pDb, nResult, What);
}

// A single statement is whole by itself.
bool IsOneStatement(OnDuplicate eOnDuplicate, const Json::Value* pjStored) {
    const bool blOne = eOnDuplicate == OnDuplicate::kStop || eOnDuplicate == OnDuplicate::kSkip;
    return blOne && pjStored == nullptr;
}

Status Take(Parts& Into, const Json::Value& jRecord, OnDuplicate eOnDuplicate, const Doing& What) {
    FindingList vecFindings;
    if (Into.Values.Take(jRecord, vecFindings) && eOnDuplicate != OnDuplicate::kStop) {
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
        if (!std::exchange(blTaken, false)) {
            Take(Into, jRecord, eOnDuplicate, What).Ignore();
        }
        vornjsondb::RecordWriter Writer(Into, Into.Values);
        Status Outcome = Writer.Write(eOnDuplicate, What, eWritten);
        if (Outcome.Ok() && pjStored != nullptr) {
            Outcome = ReadBack(Into, eWritten, What, *pjStored);
        }
        return Outcome;
    };
    return IsOneStatement(eOnDuplicate, pjStored)
               ? vornjsondb::Attempt(Into.pDb, Into.How.nWaitMs, fnSteps)
               : vornjsondb::AttemptWhole(Into.pDb, Into.Kept, Into.How.nWaitMs, What, fnSteps);
}

}  // namespace

Status Table::Create(const Json::Value& jRecord, Json::Value* pjStored) {
    return Save(jRecord, OnDuplicate::kStop, pjStored, nullptr);
}

Status Table::Save(const Json::Value& jRecord, OnDuplicate eOnDuplicate, Json::Value* pjStored,
                   Written* peWritten) {
    const auto fnSave = [&](Parts& Into, const Doing& What) {
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
