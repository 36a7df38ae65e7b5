// Poco::Data::SQLite and JsonCpp.

#include <Poco/Data/SQLite/Connector.h>
#include <Poco/Data/Session.h>
#include <Poco/Data/Statement.h>

#include "../support/JsonText.h"
#include "Peer.h"

namespace bench {

namespace {

using namespace Poco::Data::Keywords;

class PocoData : public JsonCppPeer {
  public:
    PocoData() : m_Session(Open()) {
        m_Session << EightMembers().strSqlCreate, now;
        m_Session.begin();
    }

    void Create(const Json::Value& jIn, Json::Value& jStored) {
        Row One;
        One.nActive = jIn["active"].asBool() ? 1 : 0;
        One.nAmount = jIn["amount"].asInt();
        One.strCity = jIn["city"].asString();
        One.nId = jIn["id"].asInt();
        One.nLevel = jIn["level"].asInt();
        One.strName = jIn["name"].asString();
        One.strNote = jIn["note"].asString();
        One.strTags = m_Text.Write(jIn["tags"]);
        m_Session << kPeerInsert, use(One.nActive), use(One.nAmount), use(One.strCity),
            use(One.nId), use(One.nLevel), use(One.strName), use(One.strNote), use(One.strTags),
            now;
        Row Stored;
        m_Session << kPeerSelectStored, into(Stored.nActive), into(Stored.nAmount),
            into(Stored.strCity), into(Stored.nId), into(Stored.nLevel), into(Stored.strName),
            into(Stored.strNote), into(Stored.strTags), now;
        jStored = ToRecord(Stored);
    }

    void Get(int nId, Json::Value& jFound) {
        Row One;
        m_Session << kPeerSelectByKey, use(nId), into(One.nActive), into(One.nAmount),
            into(One.strCity), into(One.nId), into(One.nLevel), into(One.strName),
            into(One.strNote), into(One.strTags), now;
        jFound = ToRecord(One);
    }

    void List(Json::Value& jAll) {
        jAll = Json::Value(Json::arrayValue);
        Row One;
        Poco::Data::Statement Select(m_Session);
        Select << kPeerSelect, into(One.nActive), into(One.nAmount), into(One.strCity),
            into(One.nId), into(One.nLevel), into(One.strName), into(One.strNote),
            into(One.strTags), range(0, 1);
        while (!Select.done()) {
            Select.execute();
            jAll.append(ToRecord(One));
        }
    }

  private:
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

    static Poco::Data::Session Open() {
        Poco::Data::SQLite::Connector::registerConnector();
        return Poco::Data::Session("SQLite", ":memory:");
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

    Poco::Data::Session m_Session;
    JsonText m_Text;
};

VORN_BENCH_PEER(PocoData);

}  // namespace

}  // namespace bench
