#include "TableTypes.h"

#include <algorithm>
#include <map>
#include <utility>

namespace vornjsondb {

const TableTypes& TableTypes::Of(const Json::Value& jType) {
    static const TableTypes& s_None = *new TableTypes;
    static std::map<const Json::Value*, TableTypes>& s_mapTypes =
        *new std::map<const Json::Value*, TableTypes>;
    const auto itKnown = s_mapTypes.find(&jType);
    if (itKnown != s_mapTypes.end()) {
        return itKnown->second;
    }
    if (!jType.isObject()) {
        return s_None;
    }
    TableTypes Types;
    Types.m_vecMembers.reserve(jType.size());
    for (Json::Value::const_iterator it = jType.begin(); it != jType.end(); ++it) {
        Types.m_vecMembers.push_back(TypedMember{NameOf(it), &TypeOfMember(*it), TypeName(*it),
                                                 FindMember(*it, "cppDefaultValue")});
    }
    return s_mapTypes.emplace(&jType, std::move(Types)).first->second;
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
