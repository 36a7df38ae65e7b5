#ifndef VORN_RECORDS_UNIQUE_FAILURE_H
#define VORN_RECORDS_UNIQUE_FAILURE_H

#include <string>

namespace vornjsondb {

// What the caller's message slot says after a refused duplicate.
constexpr char kDuplicateKeyMessage[] = "DUPLICATE_PRIMARY_KEY";

// Whether SQLite's text tells of a UNIQUE constraint. Asked of the handle's last error text even
// when the failing call ran no SQL: the slot reports the handle's last refusal by the database.
// Pinned by Create.LaterFailureWithoutSqlReportsTheStaleDuplicateAgain.
inline bool IsUniqueFailure(const std::string& strSqlError) {
    return strSqlError.find("UNIQUE constraint failed") != std::string::npos;
}

}  // namespace vornjsondb

#endif  // VORN_RECORDS_UNIQUE_FAILURE_H
