// This library.

#include "Peer.h"

namespace bench {

namespace {

class VornJsonDb : public JsonCppPeer {
  public:
    VornJsonDb() : m_pHandle(EightMembers().Open(m_Db.Get())) { m_Db.Exec("BEGIN"); }

    void Create(const Json::Value& jIn, Json::Value& jStored) {
        // The library takes a reference that it does not write to.
        Require(m_pHandle->recCreate(const_cast<Json::Value&>(jIn), jStored) == 0, "recCreate");
    }

    void Get(int nId, Json::Value& jFound) {
        Json::Value jQuery;
        jQuery["id"] = nId;
        Require(m_pHandle->recGetOne(jQuery, jFound) == 1, "recGetOne");
    }

    void List(Json::Value& jAll) {
        Json::Value jNoCondition;
        Require(m_pHandle->recList(jNoCondition, jAll) == 0, "recList");
    }

  private:
    Database m_Db;
    std::unique_ptr<VornJsonDbApi> m_pHandle;
};

VORN_BENCH_PEER(VornJsonDb);

}  // namespace

}  // namespace bench
