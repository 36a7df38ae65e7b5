// SQLite's C interface by hand, statements prepared once and kept: what is left when SQLite need
// not parse any text again. Not the same job: the statements must be known beforehand.

#include "../support/Capi.h"
#include "../support/JsonText.h"
#include "../support/TypedList.h"
#include "Peer.h"

namespace bench {

namespace {

class CapiPreparedOnce : public JsonCppPeer {
  public:
    CapiPreparedOnce() {
        m_Db.Exec(EightMembers().strSqlCreate);
        m_Db.Exec("BEGIN");
        m_pInsert = Prepare(m_Db, kPeerInsert);
        m_pSelectStored = Prepare(m_Db, kPeerSelectStored);
        m_pSelectByKey = Prepare(m_Db, kPeerSelectByKey);
        m_pSelect = Prepare(m_Db, kPeerSelect);
    }

    ~CapiPreparedOnce() {
        for (sqlite3_stmt* pStatement : {m_pInsert, m_pSelectStored, m_pSelectByKey, m_pSelect}) {
            sqlite3_finalize(pStatement);
        }
    }

    CapiPreparedOnce(const CapiPreparedOnce&) = delete;
    CapiPreparedOnce& operator=(const CapiPreparedOnce&) = delete;

    void Create(const Json::Value& jIn, Json::Value& jStored) {
        const std::string strTags = m_Text.Write(jIn["tags"]);
        BindRecord(m_pInsert, jIn, strTags);
        StepTo(m_pInsert, SQLITE_DONE);
        sqlite3_reset(m_pInsert);
        StepTo(m_pSelectStored, SQLITE_ROW);
        jStored = m_Reader.ReadRow(m_pSelectStored);
        sqlite3_reset(m_pSelectStored);
    }

    void Get(int nId, Json::Value& jFound) {
        sqlite3_bind_int(m_pSelectByKey, 1, nId);
        StepTo(m_pSelectByKey, SQLITE_ROW);
        jFound = m_Reader.ReadRow(m_pSelectByKey);
        sqlite3_reset(m_pSelectByKey);
    }

    void List(Json::Value& jAll) {
        jAll = Json::Value(Json::arrayValue);
        while (sqlite3_step(m_pSelect) == SQLITE_ROW) {
            jAll.append(m_Reader.ReadRow(m_pSelect));
        }
        sqlite3_reset(m_pSelect);
    }

  private:
    Database m_Db;
    TypedList m_Reader;
    JsonText m_Text;
    sqlite3_stmt* m_pInsert = nullptr;
    sqlite3_stmt* m_pSelectStored = nullptr;
    sqlite3_stmt* m_pSelectByKey = nullptr;
    sqlite3_stmt* m_pSelect = nullptr;
};

VORN_BENCH_PEER(CapiPreparedOnce);

}  // namespace

}  // namespace bench
