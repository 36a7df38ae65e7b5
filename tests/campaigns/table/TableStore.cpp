// VORN_JSON_DB::Table, Loader and Transaction.

#include <VornJsonDbTable.h>

#include "../support/Store.h"

namespace campaign {

namespace db = VORN_JSON_DB;

namespace {

constexpr int kWaitMs = 5000;
constexpr char kWaited[] = " (waited 5000 ms)";
// 1, 2, 4 ms and so on up to 50: so many pauses make 5 seconds.
constexpr int kPauses = 105;

Json::Value Keyed(const std::string& strTable, const char* szMembers) {
    Json::Value jDefinition = Definition(strTable, szMembers);
    jDefinition[strTable]["key"] = "id";
    return jDefinition;
}

class TableStore : public Store {
  public:
    explicit TableStore(const Database& db) : m_pDb(db.Get()) {
        Keep(m_table.Open(m_pDb, kSharedTable,
                          Keyed(kSharedTable, "id:int,name:string,owner:int,text:string")));
        Expect(m_last.Ok(), [&] { return "cannot open: " + m_last.Message(); });
    }

    int Run(const Step& step) override {
        Keep(Do(step));
        return m_last.Ok() ? 0 : -1;
    }

    bool List(int nOwner, std::map<int, std::string>& rows) override {
        rows.clear();
        Keep(m_table.ForEachRow(db::Query().Where("owner", nOwner).Members({"id", "text"}),
                                [&](const db::Row& row) {
                                    rows[static_cast<int>(row.Integer(0))] = row.Text(1);
                                    return true;
                                }));
        return m_last.Ok();
    }

    // Inside of a transaction a lock is told at once.
    bool IsGivenUp(int, bool blOpen) const override {
        const std::string& strMessage = m_last.Message();
        const bool blWaited = strMessage.size() > sizeof(kWaited) &&
                              strMessage.substr(strMessage.size() - sizeof(kWaited) + 1) == kWaited;
        return m_last.Code() == db::StatusCode::kLocked && (blWaited || blOpen);
    }

    bool IsAnswerLost(int) const override { return false; }
    bool MayBeDone() const override { return false; }
    std::string Failure() const override { return m_last.Message(); }

  private:
    void Keep(const db::Status& status) { m_last = status; }

    db::Status Do(const Step& step) {
        const Json::Value jRecord = RecordOf(step, step.nKey);
        std::int64_t nRows = 1;
        db::Status status;
        switch (step.pRow->eAct) {
            case Act::kCreate:
                return m_table.Create(jRecord);
            case Act::kReplace:
                return m_table.Save(jRecord, db::OnDuplicate::kReplace);
            case Act::kUpsert:
                return m_table.Save(jRecord, db::OnDuplicate::kUpsert);
            case Act::kUpdate:
                status = Update(step.nKey, step.strText, nRows);
                break;
            case Act::kRemove:
                status = m_table.Remove(db::Query().Where("name", jRecord["name"]), &nRows);
                break;
            case Act::kRemoveRange:
                return m_table.Remove(Range(step));
            case Act::kLoadReplace:
                return LoadOn(step);
            case Act::kLoadSkip:
                return Load(step, db::OnDuplicate::kSkip);
            case Act::kLoadUpsert:
                return Load(step, db::OnDuplicate::kUpsert);
            case Act::kCountUp:
                return CountUp();
            case Act::kSync:
                return Sync(step);
            case Act::kIndex:
                return Index(step);
            case Act::kBegin:
                m_pWhole = std::make_unique<db::Transaction>();
                return m_pWhole->Begin(m_pDb, db::Transaction::Mode::kImmediate, kWaitMs);
            case Act::kCommit:
                return m_pWhole->Commit();
            case Act::kRollback:
                return RollBack(step.nKey % 2 == 0);
            default:
                return Several(step);
        }
        Expect(!status.Ok() || nRows == 1,
               [&] { return "changed " + std::to_string(nRows) + " rows"; });
        return status;
    }

    db::Status Update(int nKey, const std::string& strText, std::int64_t& nRows) {
        Json::Value jMembers;
        jMembers["text"] = strText;
        return m_table.Update(db::Query().Where("id", nKey), jMembers, &nRows);
    }

    static db::Query Range(const Step& step) {
        Json::Value jEnds;
        jEnds.append(step.nKey);
        jEnds.append(step.nKey + (kKeysOfStep - 1) * step.nStride);
        return db::Query().Where("owner", step.nOwner).Where("id", db::Op::kBetween, jEnds);
    }

    static db::Status AddAll(const Step& step, db::Loader& loader) {
        db::Status status;
        for (int i = 0; status.Ok() && i < kKeysOfStep; ++i) {
            status = loader.Add(RecordOf(step, step.nKey + i * step.nStride));
        }
        return status;
    }

    db::Status Load(const Step& step, db::OnDuplicate eOnDuplicate) {
        db::LoadOptions options;
        options.eOnDuplicate = eOnDuplicate;
        db::Loader loader;
        db::Status status = loader.Start(m_table, options);
        if (status.Ok()) {
            status = AddAll(step, loader);
        }
        return status.Ok() ? loader.Commit() : status;
    }

    // One loader that goes on and on, with a transaction for each step.
    db::Status LoadOn(const Step& step) {
        db::Status status;
        if (!m_pLoader) {
            db::LoadOptions options;
            options.eOnDuplicate = db::OnDuplicate::kReplace;
            options.nRowsPerTransaction = kKeysOfStep;
            m_pLoader = std::make_unique<db::Loader>();
            status = m_pLoader->Start(m_table, options);
        }
        if (status.Ok()) {
            status = AddAll(step, *m_pLoader);
        }
        if (!status.Ok()) {
            m_pLoader.reset();
        }
        return status;
    }

    // The steps of an act in a transaction of its own.
    db::Status Several(const Step& step) {
        db::Transaction whole;
        db::Status status = whole.Begin(m_pDb, db::Transaction::Mode::kImmediate, kWaitMs);
        if (!status.Ok()) {
            return status;
        }
        switch (step.pRow->eAct) {
            case Act::kTakenBack:
                return m_table.RemoveAll();  // and whole goes out of scope
            case Act::kNewSide:
                NewSide(step);
                break;
            default:
                status = m_table.Save(RecordOf(step, step.nKey), db::OnDuplicate::kUpsert);
                if (status.Ok()) {
                    status = m_table.Remove(db::Query().Where("id", step.nKey + step.nStride));
                }
        }
        return status.Ok() ? whole.Commit() : status;
    }

    db::Status CountUp() {
        db::Transaction whole;
        db::Status status = whole.Begin(m_pDb, db::Transaction::Mode::kImmediate, kWaitMs);
        Json::Value jRow;
        if (status.Ok()) {
            status = m_table.Get(0, jRow);
        }
        std::int64_t nRows = 0;
        if (status.Ok()) {
            const int nNext = std::stoi(jRow["text"].asString()) + 1;
            status = Update(0, std::to_string(nNext), nRows);
        }
        return status.Ok() ? whole.Commit() : status;
    }

    db::Status RollBack(bool blSay) {
        const db::Status status = blSay ? m_pWhole->Rollback() : db::Status();
        m_pWhole.reset();
        return status;
    }

    // ---- the side table -------------------------------------------------------------------------

    static std::string SideOf(const Step& step) { return "side" + std::to_string(step.nOwner); }

    void NewSide(const Step& step) const {
        const std::string strSide = SideOf(step);
        const std::string strSql = "DROP TABLE IF EXISTS " + strSide + "; CREATE TABLE " + strSide +
                                   " (id INTEGER PRIMARY KEY, note TEXT); INSERT INTO " + strSide +
                                   " VALUES (1, 'a'), (2, 'b'), (3, NULL)";
        Expect(sqlite3_exec(m_pDb, strSql.c_str(), nullptr, nullptr, nullptr) == SQLITE_OK,
               [&] { return strSql + ": " + sqlite3_errmsg(m_pDb); });
    }

    db::Status Sync(const Step& step) {
        Json::Value jDefinition =
            Keyed(SideOf(step), "id:int,note:string,first:string,second:int,third:string");
        Json::Value& jMember = jDefinition[SideOf(step)]["member"];
        jMember["first"]["cppDefaultValue"] = "first";
        jMember["second"]["cppDefaultValue"] = 2;
        jMember["third"]["unique"] = true;
        db::Table side;
        db::SyncReport report;
        const db::Status status = side.Open(m_pDb, SideOf(step), jDefinition);
        return status.Ok() ? side.Sync(db::SyncMode::kChange, report) : status;
    }

    db::Status Index(const Step& step) {
        db::Table side;
        const db::Status status =
            side.Open(m_pDb, SideOf(step), Keyed(SideOf(step), "id:int,note:string"));
        return status.Ok() ? side.CreateIndex({"note"}, false) : status;
    }

    sqlite3* m_pDb;
    db::Table m_table;
    std::unique_ptr<db::Loader> m_pLoader;
    std::unique_ptr<db::Transaction> m_pWhole;
    db::Status m_last;
};

}  // namespace

const std::vector<ActRow> kActs = {
    {"Create", Act::kCreate, When::kAbsent},
    {"Save, replace", Act::kReplace, When::kAlways},
    {"Save, upsert", Act::kUpsert, When::kAlways},
    {"Update", Act::kUpdate, When::kPresent},
    {"Remove", Act::kRemove, When::kPresent},
    {"Remove, range", Act::kRemoveRange, When::kPresent},
    {"Loader, replace", Act::kLoadReplace, When::kClosed},
    {"Loader, skip", Act::kLoadSkip, When::kAlways},
    {"Loader, upsert", Act::kLoadUpsert, When::kAlways},
    {"Transaction", Act::kSeveral, When::kAlways},
    {"Transaction, taken back", Act::kTakenBack, When::kAlways},
    {"Transaction, counter", Act::kCountUp, When::kAlways},
    {"Transaction, new table", Act::kNewSide, When::kSideUsed},
    {"Sync", Act::kSync, When::kSideShort},
    {"CreateIndex", Act::kIndex, When::kSideUnindexed},
    {"Begin", Act::kBegin, When::kClosed},
    {"Commit", Act::kCommit, When::kOpen},
    {"Rollback", Act::kRollback, When::kOpen},
};

const std::vector<Known> kKnown = {
    {"never locked", 0, 0, true},
    {"free at the first pause", 1, 1, true},
    {"free before the last attempt", kPauses, kPauses, true},
    {"never free", kPauses + 1, kPauses, false},
};

const std::vector<Hold> kHolds = {
    {"BEGIN EXCLUSIVE", true, false},
    {"BEGIN IMMEDIATE", false, false},
    {"BEGIN; SELECT * FROM shared", false, true},
};

std::unique_ptr<Store> NewStore(const Database& db) {
    return std::make_unique<TableStore>(db);
}

}  // namespace campaign
