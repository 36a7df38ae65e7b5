// SQLiteCpp and JsonCpp: statements prepared when they are used, and statements kept.

#include <SQLiteCpp/SQLiteCpp.h>

#include "../support/JsonText.h"
#include "Peer.h"

namespace bench {

namespace {

class SqliteCppStore : public JsonCppPeer {
  protected:
    SqliteCppStore() : m_Db(":memory:", SQLite::OPEN_READWRITE | SQLite::OPEN_CREATE) {
        m_Db.exec(EightMembers().strSqlCreate);
        m_Db.exec("BEGIN");
    }

    void Insert(SQLite::Statement& Insert, const Json::Value& jIn) {
        Insert.bind(1, jIn["active"].asBool() ? 1 : 0);
        Insert.bind(2, jIn["amount"].asInt());
        Insert.bind(3, jIn["city"].asString());
        Insert.bind(4, jIn["id"].asInt());
        Insert.bind(5, jIn["level"].asInt());
        Insert.bind(6, jIn["name"].asString());
        Insert.bind(7, jIn["note"].asString());
        Insert.bind(8, m_Text.Write(jIn["tags"]));
        Insert.exec();
    }

    void SelectOne(SQLite::Statement& Select, Json::Value& jFound) {
        Require(Select.executeStep(), "the row");
        jFound = ReadRow(Select);
    }

    void SelectAll(SQLite::Statement& Select, Json::Value& jAll) {
        jAll = Json::Value(Json::arrayValue);
        while (Select.executeStep()) {
            jAll.append(ReadRow(Select));
        }
    }

    SQLite::Database m_Db;

  private:
    Json::Value ReadRow(SQLite::Statement& Select) {
        Json::Value jRecord(Json::objectValue);
        jRecord["active"] = Select.getColumn(0).getInt() == 1;
        jRecord["amount"] = Select.getColumn(1).getInt();
        jRecord["city"] = Select.getColumn(2).getText();
        jRecord["id"] = Select.getColumn(3).getInt();
        jRecord["level"] = Select.getColumn(4).getInt();
        jRecord["name"] = Select.getColumn(5).getText();
        jRecord["note"] = Select.getColumn(6).getText();
        m_Text.Read(Select.getColumn(7).getString(), jRecord["tags"]);
        return jRecord;
    }

    JsonText m_Text;
};

class SqliteCpp : public SqliteCppStore {
  public:
    void Create(const Json::Value& jIn, Json::Value& jStored) {
        SQLite::Statement Into(m_Db, kPeerInsert);
        Insert(Into, jIn);
        SQLite::Statement Select(m_Db, kPeerSelectStored);
        SelectOne(Select, jStored);
    }

    void Get(int nId, Json::Value& jFound) {
        SQLite::Statement Select(m_Db, kPeerSelectByKey);
        Select.bind(1, nId);
        SelectOne(Select, jFound);
    }

    void List(Json::Value& jAll) {
        SQLite::Statement Select(m_Db, kPeerSelect);
        SelectAll(Select, jAll);
    }
};

class SqliteCppPreparedOnce : public SqliteCppStore {
  public:
    void Create(const Json::Value& jIn, Json::Value& jStored) {
        Insert(m_Insert, jIn);
        m_Insert.reset();
        SelectOne(m_SelectStored, jStored);
        m_SelectStored.reset();
    }

    void Get(int nId, Json::Value& jFound) {
        m_SelectByKey.bind(1, nId);
        SelectOne(m_SelectByKey, jFound);
        m_SelectByKey.reset();
    }

    void List(Json::Value& jAll) {
        SelectAll(m_Select, jAll);
        m_Select.reset();
    }

  private:
    SQLite::Statement m_Insert{m_Db, kPeerInsert};
    SQLite::Statement m_SelectStored{m_Db, kPeerSelectStored};
    SQLite::Statement m_SelectByKey{m_Db, kPeerSelectByKey};
    SQLite::Statement m_Select{m_Db, kPeerSelect};
};

VORN_BENCH_PEER(SqliteCpp);
VORN_BENCH_PEER(SqliteCppPreparedOnce);

}  // namespace

}  // namespace bench
