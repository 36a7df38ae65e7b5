#ifndef VORN_SCHEMA_TABLE_TYPES_H
#define VORN_SCHEMA_TABLE_TYPES_H

#include <vector>

#include <json/json.h>

#include "../base/JsonMember.h"
#include "MemberType.h"

namespace vornjsondb {

// One member as the operations need it, looked up once per table instead of once per use.
struct TypedMember {
    MemberName Name;
    const MemberType* pType;
    const char* szTypeName;
    const Json::Value* pjDefault;  // nullptr: none
};

// A table's members in key order.
class TableTypes {
  public:
    // Of what recType returned, kept for the calls to come: an entry that is an object never
    // changes again. Empty for anything else.
    static const TableTypes& Of(const Json::Value& jType);

    const std::vector<TypedMember>& Members() const { return m_vecMembers; }

    const TypedMember* Find(const MemberName& Name) const;

  private:
    std::vector<TypedMember> m_vecMembers;
};

// As MemberCursor, over a table's members.
class TypeCursor {
  public:
    explicit TypeCursor(const TableTypes& Types)
        : m_pNext(Types.Members().data()), m_pEnd(m_pNext + Types.Members().size()) {}

    const TypedMember* Find(const MemberName& Name);

  private:
    const TypedMember* m_pNext;
    const TypedMember* m_pEnd;
};

}  // namespace vornjsondb

#endif  // VORN_SCHEMA_TABLE_TYPES_H
