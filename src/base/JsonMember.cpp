#include "JsonMember.h"

namespace vornjsondb {

MemberCursor::MemberCursor(const Json::Value& jValue) {
    if (jValue.isObject()) {
        m_it = jValue.begin();
        m_itEnd = jValue.end();
    }
}

const Json::Value* MemberCursor::Find(const MemberName& Name) {
    while (m_it != m_itEnd) {
        const int nOrder = Compare(NameOf(m_it), Name);
        if (nOrder > 0) {
            return nullptr;
        }
        const Json::Value& jMember = *m_it++;
        if (nOrder == 0) {
            return &jMember;
        }
    }
    return nullptr;
}

}  // namespace vornjsondb
