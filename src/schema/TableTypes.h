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
    // Of what recType returned; works on a copy. None for a value that is no object.
    explicit TableTypes(const Json::Value& jTypes);
    ~TableTypes() = default;
    TableTypes(const TableTypes&) = delete;
    TableTypes& operator=(const TableTypes&) = delete;

    const std::vector<TypedMember>& Members() const { return m_vecMembers; }

    const TypedMember* Find(const MemberName& Name) const;

  private:
    const Json::Value m_jTypes;  // the members point into it
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
