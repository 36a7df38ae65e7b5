#include "TableTypes.h"

#include <algorithm>

namespace vornjsondb {

TableTypes::TableTypes(const Json::Value& jTypes)
    : m_jTypes(jTypes), m_vecMembers(CountMembers(jTypes)) {
    Json::Value::const_iterator it = m_jTypes.begin();
    for (TypedMember& Member : m_vecMembers) {
        Member = TypedMember{NameOf(it), &TypeOfMember(*it), TypeName(*it),
                             FindMember(*it, "cppDefaultValue")};
        ++it;
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
    while (m_pNext != m_pEnd) {
        const int nOrder = Compare(m_pNext->Name, Name);
        if (nOrder > 0) {
            return nullptr;
        }
        const TypedMember* pMember = m_pNext++;
        if (nOrder == 0) {
            return pMember;
        }
    }
    return nullptr;
}

}  // namespace vornjsondb
