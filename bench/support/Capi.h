// SQLite's C interface by hand.

#ifndef VORN_BENCH_SUPPORT_CAPI_H
#define VORN_BENCH_SUPPORT_CAPI_H

#include <memory>
#include <string>

#include <json/json.h>
#include <sqlite3.h>

#include "Bench.h"

namespace bench {

// Binds a record of the table of eight, columns in key order. Texts are bound in place: jRecord and
// strTags outlive the step.
inline void BindRecord(sqlite3_stmt* pInsert, const Json::Value& jRecord,
                       const std::string& strTags) {
    const auto Text = [&](int i, const Json::Value& jText) {
        const char* pBegin = nullptr;
        const char* pEnd = nullptr;
        jText.getString(&pBegin, &pEnd);
        sqlite3_bind_text(pInsert, i, pBegin, static_cast<int>(pEnd - pBegin), SQLITE_STATIC);
    };
    sqlite3_bind_int(pInsert, 1, jRecord["active"].asBool() ? 1 : 0);
    sqlite3_bind_int(pInsert, 2, jRecord["amount"].asInt());
    Text(3, jRecord["city"]);
    sqlite3_bind_int(pInsert, 4, jRecord["id"].asInt());
    sqlite3_bind_int(pInsert, 5, jRecord["level"].asInt());
    Text(6, jRecord["name"]);
    Text(7, jRecord["note"]);
    sqlite3_bind_text(pInsert, 8, strTags.data(), static_cast<int>(strTags.length()),
                      SQLITE_STATIC);
}

struct FinalizeStatement {
    void operator()(sqlite3_stmt* pStatement) const { sqlite3_finalize(pStatement); }
};
using KeptStatement = std::unique_ptr<sqlite3_stmt, FinalizeStatement>;

inline sqlite3_stmt* Prepare(const Database& Db, const std::string& strSql) {
    sqlite3_stmt* pStatement = nullptr;
    Require(sqlite3_prepare_v2(Db.Get(), strSql.c_str(), -1, &pStatement, nullptr) == SQLITE_OK,
            strSql.c_str());
    return pStatement;
}

inline void StepTo(sqlite3_stmt* pStatement, int nExpected) {
    Require(sqlite3_step(pStatement) == nExpected, sqlite3_sql(pStatement));
}

}  // namespace bench

#endif  // VORN_BENCH_SUPPORT_CAPI_H
