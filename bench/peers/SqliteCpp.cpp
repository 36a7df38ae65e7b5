// SQLiteCpp and JsonCpp.

#include <SQLiteCpp/SQLiteCpp.h>

#include "../support/JsonText.h"
#include "Peer.h"

namespace bench {

namespace {

class SqliteCpp : public JsonCppPeer {
  public:
    SqliteCpp() : m_Db(":memory:", SQLite::OPEN_READWRITE | SQLite::OPEN_CREATE) {
        m_Db.exec(EightMembers().strSqlCreate);
        m_Db.exec("BEGIN");
    }

    void Create(const Json::Value& jIn, Json::Value& jStored) {
        SQLite::Statement Insert(m_Db, kPeerInsert);
        Insert.bind(1, jIn["active"].asBool() ? 1 : 0);
        Insert.bind(2, jIn["amount"].asInt());
        Insert.bind(3, jIn["city"].asString());
        Insert.bind(4, jIn["id"].asInt());
        Insert.bind(5, jIn["level"].asInt());
        Insert.bind(6, jIn["name"].asString());
        Insert.bind(7, jIn["note"].asString());
        Insert.bind(8, m_Text.Write(jIn["tags"]));
        Insert.exec();
        SQLite::Statement Select(m_Db, kPeerSelectStored);
        Require(Select.executeStep(), "the stored row");
        jStored = ReadRow(Select);
    }

    void Get(int nId, Json::Value& jFound) {
        SQLite::Statement Select(m_Db, kPeerSelectByKey);
        Select.bind(1, nId);
        Require(Select.executeStep(), "the row with this key");
        jFound = ReadRow(Select);
    }

    void List(Json::Value& jAll) {
        SQLite::Statement Select(m_Db, kPeerSelect);
        jAll = Json::Value(Json::arrayValue);
        while (Select.executeStep()) {
            jAll.append(ReadRow(Select));
        }
    }

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

    SQLite::Database m_Db;
    JsonText m_Text;
};

VORN_BENCH_PEER(SqliteCpp);

}  // namespace

}  // namespace bench
