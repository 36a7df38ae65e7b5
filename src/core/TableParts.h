#ifndef VORN_CORE_TABLE_PARTS_H
#define VORN_CORE_TABLE_PARTS_H

#include <VornJsonDbApi.h>

#include <string>

namespace vornjsondb {

// What of a handle the functions beside the class work on.
struct TableParts {
    sqlite3* pDb;
    const std::string& strName;
    std::string& strSqlError;
};

// runSqlEx, without a copy of the text: statements may hold long values.
int RunSql(const TableParts& Table, const std::string& strSql,
           int (*callback)(void*, int, char**, char**), void* pArg);

}  // namespace vornjsondb

#endif  // VORN_CORE_TABLE_PARTS_H
