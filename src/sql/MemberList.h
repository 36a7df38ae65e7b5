#ifndef VORN_SQL_MEMBER_LIST_H
#define VORN_SQL_MEMBER_LIST_H

#include <VornJsonDbApi.h>

#include <string>

namespace vornjsondb {

// What becomes of raw condition text ("vornSqlWhereFilter") among the members.
enum class RawFilter { kWritten, kLeftOut };

// SqlExpandMemberList with the table's member types looked up.
int ExpandMemberList(VornJsonDbApi& Handle, const Json::Value& jType, Json::Value& jRecParam,
                     std::string& strSqlOut, int andType, RawFilter eFilter);

}  // namespace vornjsondb

#endif  // VORN_SQL_MEMBER_LIST_H
