#ifndef VORN_SQL_VORN_JSON_DB_API_VALUES_H
#define VORN_SQL_VORN_JSON_DB_API_VALUES_H

#include <vector>

#include <json/json.h>

#include "../base/JsonMember.h"
#include "../base/TextBuffer.h"
#include "../schema/HandleParts.h"

namespace vornjsondb {

// A declared member, and its value in a record: nullptr where the record lacks it.
struct DeclaredValue {
    MemberName Name;
    const Json::Value* pjValue;
};

// All declared members in key order, walked once for both lists.
std::vector<DeclaredValue> DeclaredValues(const Json::Value& jMember, const Json::Value& jRec);

// SqlExpandMemberName of all that are declared, without a record.
void AppendDeclaredNames(const Json::Value& jMember, TextBuffer& Sql);

// SqlExpandMemberName of a record's.
void AppendMemberNames(const std::vector<DeclaredValue>& vecValues, TextBuffer& Sql);

// SqlExpandMemberSymbol of these, which are jRec's. What stands in Sql already is a part of the
// format; when it fails, Sql stays as it is.
int AppendMemberValues(const HandleParts& Handle, const std::vector<DeclaredValue>& vecValues,
                       const Json::Value& jRec, TextBuffer& Sql);

}  // namespace vornjsondb

#endif  // VORN_SQL_VORN_JSON_DB_API_VALUES_H
