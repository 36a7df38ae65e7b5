// Poco::Data::SQLite and JsonCpp: statements prepared when they are used, and statements kept.

#include <Poco/Data/SQLite/Connector.h>
#include <Poco/Data/Session.h>
#include <Poco/Data/Statement.h>

#include "../support/JsonText.h"
#include "Peer.h"

namespace bench {

namespace {

using namespace Poco::Data::Keywords;
using Poco::Data::Statement;

class PocoDataStore : public JsonCppPeer {
  protected:
    struct Row {
        int nActive = 0;
        int nAmount = 0;
        std::string strCity;
        int nId = 0;
        int nLevel = 0;
        std::string strName;
        std::string strNote;
        std::string strTags;
    };

    PocoDataStore() : m_Session(Open()) {
        m_Session << EightMembers().strSqlCreate, now;
        m_Session.begin();
    }

    Statement Insert(Row& From) {
        Statement Made(m_Session);
        Made << kPeerInsert, use(From.nActive), use(From.nAmount), use(From.strCity), use(From.nId),
            use(From.nLevel), use(From.strName), use(From.strNote), use(From.strTags);
        return Made;
    }

    Statement Select(const char* szSql, Row& To) {
        Statement Made(m_Session);
        Made << szSql, into(To.nActive), into(To.nAmount), into(To.strCity), into(To.nId),
            into(To.nLevel), into(To.strName), into(To.strNote), into(To.strTags);
        return Made;
    }

    void ToRow(const Json::Value& jIn, Row& To) {
        To.nActive = jIn["active"].asBool() ? 1 : 0;
        To.nAmount = jIn["amount"].asInt();
        To.strCity = jIn["city"].asString();
        To.nId = jIn["id"].asInt();
        To.nLevel = jIn["level"].asInt();
        To.strName = jIn["name"].asString();
        To.strNote = jIn["note"].asString();
        To.strTags = m_Text.Write(jIn["tags"]);
    }

    Json::Value ToRecord(const Row& One) {
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

    void SelectAll(Statement& From, const Row& One, Json::Value& jAll) {
        jAll = Json::Value(Json::arrayValue);
        do {
            From.execute();
            jAll.append(ToRecord(One));
        } while (!From.done());
    }

  private:
    static Poco::Data::Session Open() {
        Poco::Data::SQLite::Connector::registerConnector();
        return Poco::Data::Session("SQLite", ":memory:");
    }

    Poco::Data::Session m_Session;
    JsonText m_Text;
};

class PocoData : public PocoDataStore {
  public:
    void Create(const Json::Value& jIn, Json::Value& jStored) {
        Row One;
        ToRow(jIn, One);
        Insert(One).execute();
        Row Stored;
        Select(kPeerSelectStored, Stored).execute();
        jStored = ToRecord(Stored);
    }

    void Get(int nId, Json::Value& jFound) {
        Row One;
        (Select(kPeerSelectByKey, One), use(nId)).execute();
        jFound = ToRecord(One);
    }

    void List(Json::Value& jAll) {
        Row One;
        Statement All = (Select(kPeerSelect, One), range(0, 1));
        SelectAll(All, One, jAll);
    }
};

class PocoDataPreparedOnce : public PocoDataStore {
  public:
    void Create(const Json::Value& jIn, Json::Value& jStored) {
        ToRow(jIn, m_In);
        m_Insert.execute();
        m_SelectStored.execute();
        jStored = ToRecord(m_Out);
    }

    void Get(int nId, Json::Value& jFound) {
        m_nId = nId;
        m_SelectByKey.execute();
        jFound = ToRecord(m_Out);
    }

    void List(Json::Value& jAll) { SelectAll(m_Select, m_Out, jAll); }

  private:
    // What the statements are bound to.
    Row m_In;
    Row m_Out;
    int m_nId = 0;
    Statement m_Insert = Insert(m_In);
    Statement m_SelectStored = Select(kPeerSelectStored, m_Out);
    Statement m_SelectByKey = (Select(kPeerSelectByKey, m_Out), use(m_nId));
    Statement m_Select = (Select(kPeerSelect, m_Out), range(0, 1));
};

VORN_BENCH_PEER(PocoData);
VORN_BENCH_PEER(PocoDataPreparedOnce);

}  // namespace

}  // namespace bench
