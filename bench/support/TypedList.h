// The table of eight read by hand: what a careful engineer would write for this one table.

#ifndef VORN_BENCH_SUPPORT_TYPED_LIST_H
#define VORN_BENCH_SUPPORT_TYPED_LIST_H

#include <memory>
#include <string>

#include <json/json.h>
#include <sqlite3.h>

namespace bench {

class TypedList {
  public:
    TypedList();

    // Prepares strSql, whose columns stand in key order, steps through it and returns the records.
    Json::Value Read(sqlite3* pDb, const std::string& strSql) const;

    // The row on which pStatement stands.
    Json::Value ReadRow(sqlite3_stmt* pStatement) const;

  private:
    std::unique_ptr<Json::CharReader> m_pReader;
};

}  // namespace bench

#endif  // VORN_BENCH_SUPPORT_TYPED_LIST_H
