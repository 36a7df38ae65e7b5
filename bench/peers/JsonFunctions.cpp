// SQLite's own JSON functions: one JSON text goes in, one comes out, and JsonCpp writes and parses
// it.

#include "../support/Capi.h"
#include "../support/JsonText.h"
#include "Peer.h"

namespace bench {

namespace {

// The table has no JSON booleans: they are made on the way out, as lists are marked to be JSON.
#define VORN_PEER_OBJECT                                                           \
    "json_object('active', json(iif(active, 'true', 'false')), 'amount', amount, " \
    "'city', city, 'id', id, 'level', level, 'name', name, 'note', note, "         \
    "'tags', json(tags))"

constexpr char kInsert[] =
    "INSERT INTO part (" VORN_PEER_COLUMNS
    ") SELECT "
    "json_extract(?1, '$.active'), json_extract(?1, '$.amount'), json_extract(?1, '$.city'), "
    "json_extract(?1, '$.id'), json_extract(?1, '$.level'), json_extract(?1, '$.name'), "
    "json_extract(?1, '$.note'), json_extract(?1, '$.tags')";
constexpr char kSelectStored[] =
    "SELECT " VORN_PEER_OBJECT " FROM part WHERE rowid = last_insert_rowid()";
constexpr char kSelectByKey[] = "SELECT " VORN_PEER_OBJECT " FROM part WHERE id = ?";
constexpr char kSelectAll[] = "SELECT json_group_array(" VORN_PEER_OBJECT ") FROM part";

class JsonFunctions : public JsonCppPeer {
  public:
    JsonFunctions() {
        m_Db.Exec(EightMembers().strSqlCreate);
        m_Db.Exec("BEGIN");
    }

    void Create(const Json::Value& jIn, Json::Value& jStored) {
        const std::string strRecord = m_Text.Write(jIn);
        sqlite3_stmt* pInsert = Prepare(m_Db, kInsert);
        sqlite3_bind_text(pInsert, 1, strRecord.data(), static_cast<int>(strRecord.length()),
                          SQLITE_STATIC);
        StepTo(pInsert, SQLITE_DONE);
        sqlite3_finalize(pInsert);
        ReadOne(Prepare(m_Db, kSelectStored), jStored);
    }

    void Get(int nId, Json::Value& jFound) {
        sqlite3_stmt* pSelect = Prepare(m_Db, kSelectByKey);
        sqlite3_bind_int(pSelect, 1, nId);
        ReadOne(pSelect, jFound);
    }

    void List(Json::Value& jAll) { ReadOne(Prepare(m_Db, kSelectAll), jAll); }

  private:
    void ReadOne(sqlite3_stmt* pSelect, Json::Value& jOut) {
        StepTo(pSelect, SQLITE_ROW);
        const char* pText = reinterpret_cast<const char*>(sqlite3_column_text(pSelect, 0));
        m_Text.Read(pText, pText + sqlite3_column_bytes(pSelect, 0), jOut);
        sqlite3_finalize(pSelect);
    }

    Database m_Db;
    JsonText m_Text;
};

VORN_BENCH_PEER(JsonFunctions);

}  // namespace

}  // namespace bench
