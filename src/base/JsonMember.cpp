#include "JsonMember.h"

namespace vornjsondb {

const Json::Value* MemberCursor::Find(const MemberName& Name) {
    for (; !m_Walk.IsDone(); m_Walk.Next()) {
        const int nOrder = Compare(m_Walk.Name(), Name);
        // mutate(exchanged statements): it is one of both.
        if (nOrder > 0) {
            return nullptr;
        }
        if (nOrder == 0) {
            const Json::Value& jMember = m_Walk.Value();
            m_Walk.Next();  // mutate(dropped): the next search would step over it.
            return &jMember;
        }
    }
    return nullptr;
}

}  // namespace vornjsondb
