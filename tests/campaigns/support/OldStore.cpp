// VornJsonDbApi.

#include "Store.h"

namespace campaign {

namespace {

constexpr int kAttempts = 500;

class OldStore : public Store {
  public:
    explicit OldStore(const Database& db)
        : m_pHandle(NewHandle(db.Get(), kSharedTable,
                              Definition(kSharedTable, "id:int,name:string,owner:int,text:string"),
                              "SELECT 1")) {}

    int Run(const Step& step) override {
        m_blCreate = step.pRow->eAct == Act::kCreate;
        m_pHandle->setErrMsg("");
        m_nLast = Do(step);
        return m_nLast;
    }

    bool List(int nOwner, std::map<int, std::string>& rows) override {
        Json::Value jQuery;
        jQuery["owner"] = nOwner;
        Json::Value jRows(Json::arrayValue);
        m_blCreate = false;
        m_nLast = m_pHandle->recList(jQuery, jRows);
        rows.clear();
        for (const Json::Value& jRow : jRows) {
            rows[jRow["id"].asInt()] = jRow["text"].asString();
        }
        return m_nLast == 0;
    }

    bool IsGivenUp(int nPauses, bool) const override { return nPauses >= kAttempts; }

    // recCreate's text has two statements: when the second met the lock, the first was run again,
    // and found its own row there.
    bool IsAnswerLost(int nPauses) const override {
        return m_blCreate && nPauses > 0 && m_pHandle->getErrMsg() == "DUPLICATE_PRIMARY_KEY";
    }

    bool MayBeDone() const override { return true; }

    std::string Failure() const override { return m_pHandle->getErrMsg(); }

  private:
    int Do(const Step& step) {
        Json::Value jRecord = RecordOf(step, step.nKey);
        Json::Value jFilter;
        std::string strName = jRecord["name"].asString();
        switch (step.pRow->eAct) {
            case Act::kCreate:
                return m_pHandle->recCreate(jRecord, jRecord);
            case Act::kReplace:
                return m_pHandle->recSave(jRecord, false);
            case Act::kUpdate:
                jFilter["id"] = step.nKey;
                return m_pHandle->recUpdateByFilter(jFilter, jRecord);
            case Act::kRemove:
                return OneRow(m_pHandle->recDeleteByName(strName, "name"));
            case Act::kRemoveRange:
                jFilter["vornSqlWhereFilter"] =
                    "owner = " + std::to_string(step.nOwner) + " and id between " +
                    std::to_string(step.nKey) + " and " +
                    std::to_string(step.nKey + (kKeysOfStep - 1) * step.nStride);
                return m_pHandle->recDelete(jFilter);
            case Act::kCountUp:
                return OneRow(
                    m_pHandle->runSqlEx("UPDATE shared SET text = text + 1 WHERE id = 0"));
            case Act::kBegin:
                return m_pHandle->runSqlEx("BEGIN IMMEDIATE");
            case Act::kCommit:
                return m_pHandle->runSqlEx("COMMIT");
            default:
                return m_pHandle->runSqlEx("ROLLBACK");
        }
    }

    static int OneRow(int nResult) {
        Expect(nResult < 0 || nResult == 1,
               [&] { return "changed " + std::to_string(nResult) + " rows"; });
        return nResult;
    }

    std::unique_ptr<VornJsonDbApi> m_pHandle;
    bool m_blCreate = false;
    int m_nLast = 0;
};

}  // namespace

const std::vector<ActRow> kActs = {
    {"recCreate", Act::kCreate, When::kAbsent},
    {"recSave", Act::kReplace, When::kPresent},
    {"recUpdateByFilter", Act::kUpdate, When::kPresent},
    {"recDeleteByName", Act::kRemove, When::kPresent},
    {"recDelete", Act::kRemoveRange, When::kPresent},
    {"runSqlEx", Act::kCountUp, When::kAlways},
    {"BEGIN", Act::kBegin, When::kClosed},
    {"COMMIT", Act::kCommit, When::kOpen},
    {"ROLLBACK", Act::kRollback, When::kOpen},
};

const std::vector<Known> kKnown = {
    {"never locked", 0, 0, true},
    {"free at the first pause", 1, 1, true},
    {"free before the last attempt", kAttempts - 1, kAttempts - 1, true},
    {"free after the last attempt", kAttempts, kAttempts, false},
};

const std::vector<Hold> kHolds = {{"BEGIN EXCLUSIVE", true, false}};

std::unique_ptr<Store> NewStore(const Database& db) {
    return std::make_unique<OldStore>(db);
}

}  // namespace campaign
