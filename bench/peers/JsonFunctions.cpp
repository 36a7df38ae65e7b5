// SQLite's own JSON functions: one JSON text goes in, one comes out, and JsonCpp writes and parses
// it. Statements prepared when they are used, and statements kept.

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

class JsonFunctionsStore : public JsonCppPeer {
  protected:
    JsonFunctionsStore() {
        m_Db.Exec(EightMembers().strSqlCreate);
        m_Db.Exec("BEGIN");
    }

    void Insert(sqlite3_stmt* pInsert, const Json::Value& jIn) {
        const std::string strRecord = m_Text.Write(jIn);
        sqlite3_bind_text(pInsert, 1, strRecord.data(), static_cast<int>(strRecord.length()),
                          SQLITE_STATIC);
        StepTo(pInsert, SQLITE_DONE);
    }

    void ReadOne(sqlite3_stmt* pSelect, Json::Value& jOut) {
        StepTo(pSelect, SQLITE_ROW);
        const char* pText = reinterpret_cast<const char*>(sqlite3_column_text(pSelect, 0));
        m_Text.Read(pText, pText + sqlite3_column_bytes(pSelect, 0), jOut);
    }

    Database m_Db;

  private:
    JsonText m_Text;
};

class JsonFunctions : public JsonFunctionsStore {
  public:
    void Create(const Json::Value& jIn, Json::Value& jStored) {
        sqlite3_stmt* pInsert = Prepare(m_Db, kInsert);
        Insert(pInsert, jIn);
        sqlite3_finalize(pInsert);
        ReadAndFinalize(Prepare(m_Db, kSelectStored), jStored);
    }

    void Get(int nId, Json::Value& jFound) {
        sqlite3_stmt* pSelect = Prepare(m_Db, kSelectByKey);
        sqlite3_bind_int(pSelect, 1, nId);
        ReadAndFinalize(pSelect, jFound);
    }

    void List(Json::Value& jAll) { ReadAndFinalize(Prepare(m_Db, kSelectAll), jAll); }

  private:
    void ReadAndFinalize(sqlite3_stmt* pSelect, Json::Value& jOut) {
        ReadOne(pSelect, jOut);
        sqlite3_finalize(pSelect);
    }
};

class JsonFunctionsPreparedOnce : public JsonFunctionsStore {
  public:
    void Create(const Json::Value& jIn, Json::Value& jStored) {
        Insert(m_pInsert.get(), jIn);
        sqlite3_reset(m_pInsert.get());
        ReadAndReset(m_pSelectStored.get(), jStored);
    }

    void Get(int nId, Json::Value& jFound) {
        sqlite3_bind_int(m_pSelectByKey.get(), 1, nId);
        ReadAndReset(m_pSelectByKey.get(), jFound);
    }

    void List(Json::Value& jAll) { ReadAndReset(m_pSelectAll.get(), jAll); }

  private:
    void ReadAndReset(sqlite3_stmt* pSelect, Json::Value& jOut) {
        ReadOne(pSelect, jOut);
        sqlite3_reset(pSelect);
    }

    KeptStatement m_pInsert{Prepare(m_Db, kInsert)};
    KeptStatement m_pSelectStored{Prepare(m_Db, kSelectStored)};
    KeptStatement m_pSelectByKey{Prepare(m_Db, kSelectByKey)};
    KeptStatement m_pSelectAll{Prepare(m_Db, kSelectAll)};
};

VORN_BENCH_PEER(JsonFunctions);
VORN_BENCH_PEER(JsonFunctionsPreparedOnce);

}  // namespace

}  // namespace bench
