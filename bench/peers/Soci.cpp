// SOCI and JsonCpp. The backend is named as text and loaded at run time: its header puts the
// declarations of sqlite3.h into a namespace, where nobody else finds them.

#include <soci/soci.h>

#include "../support/JsonText.h"
#include "Peer.h"

namespace bench {

namespace {

class Soci : public JsonCppPeer {
  public:
    Soci() : m_Session("sqlite3", ":memory:") {
        m_Session << EightMembers().strSqlCreate;
        m_Session.begin();
    }

    void Create(const Json::Value& jIn, Json::Value& jStored) {
        const int nActive = jIn["active"].asBool() ? 1 : 0;
        const int nAmount = jIn["amount"].asInt();
        const std::string strCity = jIn["city"].asString();
        const int nId = jIn["id"].asInt();
        const int nLevel = jIn["level"].asInt();
        const std::string strName = jIn["name"].asString();
        const std::string strNote = jIn["note"].asString();
        const std::string strTags = m_Text.Write(jIn["tags"]);
        m_Session << "INSERT INTO part (" VORN_PEER_COLUMNS
                     ") VALUES (:active, :amount, :city, :id, :level, :name, :note, :tags)",
            soci::use(nActive), soci::use(nAmount), soci::use(strCity), soci::use(nId),
            soci::use(nLevel), soci::use(strName), soci::use(strNote), soci::use(strTags);
        soci::row Row;
        m_Session << kPeerSelectStored, soci::into(Row);
        Require(m_Session.got_data(), "the stored row");
        jStored = ReadRow(Row);
    }

    void Get(int nId, Json::Value& jFound) {
        soci::row Row;
        m_Session << "SELECT " VORN_PEER_COLUMNS " FROM part WHERE id = :id", soci::use(nId),
            soci::into(Row);
        Require(m_Session.got_data(), "the row with this key");
        jFound = ReadRow(Row);
    }

    void List(Json::Value& jAll) {
        jAll = Json::Value(Json::arrayValue);
        const soci::rowset<soci::row> Rows = (m_Session.prepare << kPeerSelect);
        for (const soci::row& Row : Rows) {
            jAll.append(ReadRow(Row));
        }
    }

  private:
    Json::Value ReadRow(const soci::row& Row) {
        Json::Value jRecord(Json::objectValue);
        jRecord["active"] = Row.get<int>(0) == 1;
        jRecord["amount"] = Row.get<int>(1);
        jRecord["city"] = Row.get<std::string>(2);
        jRecord["id"] = Row.get<int>(3);
        jRecord["level"] = Row.get<int>(4);
        jRecord["name"] = Row.get<std::string>(5);
        jRecord["note"] = Row.get<std::string>(6);
        m_Text.Read(Row.get<std::string>(7), jRecord["tags"]);
        return jRecord;
    }

    soci::session m_Session;
    JsonText m_Text;
};

VORN_BENCH_PEER(Soci);

}  // namespace

}  // namespace bench
