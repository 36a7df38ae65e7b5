// SOCI and JsonCpp: statements prepared when they are used, and statements kept. The backend is
// named as text and loaded at run time: its header puts the declarations of sqlite3.h into a
// namespace, where nobody else finds them.

#include <soci/soci.h>

#include "../support/JsonText.h"
#include "Peer.h"

namespace bench {

namespace {

#define VORN_PEER_SOCI_INSERT              \
    "INSERT INTO part (" VORN_PEER_COLUMNS \
    ") VALUES (:active, :amount, :city, :id, :level, :name, :note, :tags)"
#define VORN_PEER_SOCI_BY_KEY "SELECT " VORN_PEER_COLUMNS " FROM part WHERE id = :id"

class SociStore : public JsonCppPeer {
  protected:
    struct Part {
        int nActive = 0;
        int nAmount = 0;
        std::string strCity;
        int nId = 0;
        int nLevel = 0;
        std::string strName;
        std::string strNote;
        std::string strTags;
    };

    SociStore() : m_Session("sqlite3", ":memory:") {
        m_Session << EightMembers().strSqlCreate;
        m_Session.begin();
    }

    void ToPart(const Json::Value& jIn, Part& To) {
        To.nActive = jIn["active"].asBool() ? 1 : 0;
        To.nAmount = jIn["amount"].asInt();
        To.strCity = jIn["city"].asString();
        To.nId = jIn["id"].asInt();
        To.nLevel = jIn["level"].asInt();
        To.strName = jIn["name"].asString();
        To.strNote = jIn["note"].asString();
        To.strTags = m_Text.Write(jIn["tags"]);
    }

    Json::Value ToRecord(const Part& One) {
        Json::Value jRecord(Json::objectValue);
        jRecord["active"] = One.nActive == 1;
        jRecord["amount"] = One.nAmount;
        jRecord["city"] = One.strCity;
        jRecord["id"] = One.nId;
        jRecord["level"] = One.nLevel;
        jRecord["name"] = One.strName;
        jRecord["note"] = One.strNote;
        m_Text.Read(One.strTags, jRecord["tags"]);
        return jRecord;
    }

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

  private:
    JsonText m_Text;
};

class Soci : public SociStore {
  public:
    void Create(const Json::Value& jIn, Json::Value& jStored) {
        Part In;
        ToPart(jIn, In);
        m_Session << VORN_PEER_SOCI_INSERT, soci::use(In.nActive), soci::use(In.nAmount),
            soci::use(In.strCity), soci::use(In.nId), soci::use(In.nLevel), soci::use(In.strName),
            soci::use(In.strNote), soci::use(In.strTags);
        soci::row Row;
        m_Session << kPeerSelectStored, soci::into(Row);
        Require(m_Session.got_data(), "the stored row");
        jStored = ReadRow(Row);
    }

    void Get(int nId, Json::Value& jFound) {
        soci::row Row;
        m_Session << VORN_PEER_SOCI_BY_KEY, soci::use(nId), soci::into(Row);
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
};

class SociPreparedOnce : public SociStore {
  public:
    void Create(const Json::Value& jIn, Json::Value& jStored) {
        ToPart(jIn, m_In);
        m_Insert.execute(true);
        Require(m_SelectStored.execute(true), "the stored row");
        jStored = ToRecord(m_Out);
    }

    void Get(int nId, Json::Value& jFound) {
        m_nId = nId;
        Require(m_SelectByKey.execute(true), "the row with this key");
        jFound = ToRecord(m_Out);
    }

    void List(Json::Value& jAll) {
        jAll = Json::Value(Json::arrayValue);
        m_Select.execute();
        while (m_Select.fetch()) {
            jAll.append(ToRecord(m_Out));
        }
    }

  private:
    soci::statement Select(const char* szSql) {
        return (m_Session.prepare << szSql, soci::into(m_Out.nActive), soci::into(m_Out.nAmount),
                soci::into(m_Out.strCity), soci::into(m_Out.nId), soci::into(m_Out.nLevel),
                soci::into(m_Out.strName), soci::into(m_Out.strNote), soci::into(m_Out.strTags));
    }

    // What the statements are bound to.
    Part m_In;
    Part m_Out;
    int m_nId = 0;
    soci::statement m_Insert =
        (m_Session.prepare << VORN_PEER_SOCI_INSERT, soci::use(m_In.nActive),
         soci::use(m_In.nAmount), soci::use(m_In.strCity), soci::use(m_In.nId),
         soci::use(m_In.nLevel), soci::use(m_In.strName), soci::use(m_In.strNote),
         soci::use(m_In.strTags));
    soci::statement m_SelectStored = Select(kPeerSelectStored);
    soci::statement m_SelectByKey =
        (m_Session.prepare << VORN_PEER_SOCI_BY_KEY, soci::use(m_nId), soci::into(m_Out.nActive),
         soci::into(m_Out.nAmount), soci::into(m_Out.strCity), soci::into(m_Out.nId),
         soci::into(m_Out.nLevel), soci::into(m_Out.strName), soci::into(m_Out.strNote),
         soci::into(m_Out.strTags));
    soci::statement m_Select = Select(kPeerSelect);
};

VORN_BENCH_PEER(Soci);
VORN_BENCH_PEER(SociPreparedOnce);

}  // namespace

}  // namespace bench
