#include "JsonMember.h"

namespace vornjsondb {

MemberCursor::MemberCursor(const Json::Value& jValue) {
    if (jValue.isObject()) {
        m_it = jValue.begin();
        m_itEnd = jValue.end();
    }
}

const Json::Value* MemberCursor::Find(const MemberName& Name) {
    for (; m_it != m_itEnd; ++m_it) {
        const int nOrder = Compare(NameOf(m_it), Name);
        if (nOrder >= 0) {
            return nOrder == 0 ? &*m_it : nullptr;
        }
    }
    return nullptr;
}

}  // namespace vornjsondb
