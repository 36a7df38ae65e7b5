// Columns into records and rows, by the members' types.

#ifndef VORN_TABLE_ROW_READER_H
#define VORN_TABLE_ROW_READER_H

#include <vector>

#include <json/json.h>
#include <sqlite3.h>

#include "../src/base/JsonText.h"
#include "Members.h"

namespace vornjsondb {

class RowReader {
  public:
    // For rows whose columns are these members, in the members' order. Of must outlive it.
    RowReader(const Members& Of, const std::vector<size_t>& vecColumns, VORN_JSON_DB::Nulls eNulls);

    // The statement's row as a record.
    Json::Value Read(sqlite3_stmt* pStatement, JsonCodec& Codec) const;

    const std::vector<size_t>& Columns() const { return m_vecColumns; }

  private:
    struct Column {
        const Member* pMember;
        BoundKind eKind;
        bool blKeepNull;
    };

    void LeaveOutNulls(sqlite3_stmt* pStatement, Json::Value& jRecord) const;

    std::vector<size_t> m_vecColumns;
    std::vector<Column> m_vecRead;
    Json::Value m_jEmpty;  // every member, with null
};

}  // namespace vornjsondb

// What a Row shows.
struct VORN_JSON_DB::Row::Source {
    sqlite3_stmt* pStatement;
    const vornjsondb::Members& Of;
    const std::vector<size_t>& vecColumns;
};

#endif  // VORN_TABLE_ROW_READER_H
