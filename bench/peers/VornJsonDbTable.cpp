// This library's second handle, which keeps its statements.

#include "../support/TableStore.h"
#include "Peer.h"

namespace bench {

namespace {

class VornJsonDbTable : public JsonCppPeer {
  public:
    VornJsonDbTable() : m_Store(0) {}

    void Create(const Json::Value& jIn, Json::Value& jStored) {
        RequireOk(m_Store.Own.Create(jIn, &jStored));
    }

    void Get(int nId, Json::Value& jFound) { RequireOk(m_Store.Own.Get(nId, jFound)); }

    void List(Json::Value& jAll) { RequireOk(m_Store.Own.List({}, jAll)); }

  private:
    TableStore m_Store;
};

VORN_BENCH_PEER(VornJsonDbTable);

}  // namespace

}  // namespace bench
