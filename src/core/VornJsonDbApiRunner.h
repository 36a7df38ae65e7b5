#ifndef VORN_CORE_VORN_JSON_DB_API_RUNNER_H
#define VORN_CORE_VORN_JSON_DB_API_RUNNER_H

#include <string>
#include <string_view>

#include "../schema/HandleParts.h"

// Name of the table whose statement runs. One for the process, because the row callback is given
// nothing but the caller's argument.
extern std::string g_strCurTable;

namespace vornjsondb {

// runSqlEx of a text behind which a NUL stands, without a copy: statements may hold long values.
int RunSql(const HandleParts& Handle, std::string_view Sql,
           int (*callback)(void*, int, char**, char**), void* pArg);

}  // namespace vornjsondb

#endif  // VORN_CORE_VORN_JSON_DB_API_RUNNER_H
