#include "TableTypes.h"

#include <algorithm>

namespace vornjsondb {

TableTypes::TableTypes(const Json::Value& jTypes) : m_jTypes(jTypes) {
    if (!m_jTypes.isObject()) {
        return;
    }
    m_vecMembers.reserve(m_jTypes.size());
    for (Json::Value::const_iterator it = m_jTypes.begin(); it != m_jTypes.end(); ++it) {
        m_vecMembers.push_back(TypedMember{NameOf(it), &TypeOfMember(*it), TypeName(*it),
                                           FindMember(*it, "cppDefaultValue")});
    }
}

const TypedMember* TableTypes::Find(const MemberName& Name) const {
    const auto itFound = std::lower_bound(m_vecMembers.begin(), m_vecMembers.end(), Name,
                                          [](const TypedMember& Each, const MemberName& Wanted) {
                                              return Compare(Each.Name, Wanted) < 0;
                                          });
    return itFound != m_vecMembers.end() && Compare(itFound->Name, Name) == 0 ? &*itFound : nullptr;
}

const TypedMember* TypeCursor::Find(const MemberName& Name) {
    for (; m_pNext != m_pEnd; ++m_pNext) {
        const int nOrder = Compare(m_pNext->Name, Name);
        if (nOrder >= 0) {
            return nOrder == 0 ? m_pNext : nullptr;
        }
    }
    return nullptr;
}

}  // namespace vornjsondb
