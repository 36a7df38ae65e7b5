// SQLite's C interface by hand, every statement prepared when it is used: the same work for SQLite
// as for a library that is handed SQL texts.

#include "../support/Capi.h"
#include "../support/JsonText.h"
#include "../support/TypedList.h"
#include "Peer.h"

namespace bench {

namespace {

class CapiPreparedEachTime : public JsonCppPeer {
  public:
    CapiPreparedEachTime() {
        m_Db.Exec(EightMembers().strSqlCreate);
        m_Db.Exec("BEGIN");
    }

    void Create(const Json::Value& jIn, Json::Value& jStored) {
        const std::string strTags = m_Text.Write(jIn["tags"]);
        sqlite3_stmt* pInsert = Prepare(m_Db, kPeerInsert);
        BindRecord(pInsert, jIn, strTags);
        StepTo(pInsert, SQLITE_DONE);
        sqlite3_finalize(pInsert);
        sqlite3_stmt* pSelect = Prepare(m_Db, kPeerSelectStored);
        StepTo(pSelect, SQLITE_ROW);
        jStored = m_Reader.ReadRow(pSelect);
        sqlite3_finalize(pSelect);
    }

    void Get(int nId, Json::Value& jFound) {
        sqlite3_stmt* pSelect = Prepare(m_Db, kPeerSelectByKey);
        sqlite3_bind_int(pSelect, 1, nId);
        StepTo(pSelect, SQLITE_ROW);
        jFound = m_Reader.ReadRow(pSelect);
        sqlite3_finalize(pSelect);
    }

    void List(Json::Value& jAll) { jAll = m_Reader.Read(m_Db.Get(), kPeerSelect); }

  private:
    Database m_Db;
    TypedList m_Reader;
    JsonText m_Text;
};

VORN_BENCH_PEER(CapiPreparedEachTime);

}  // namespace

}  // namespace bench
