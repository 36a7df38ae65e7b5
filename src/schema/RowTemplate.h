// The usual row, made quickly.
//
// All rows of a statement have the same columns, so the record is built once, empty, and copied
// for each row: no search for a member and its type in every cell. Its member names are shared by
// all records instead of being copied into each, which also makes a list smaller.

#ifndef VORN_SCHEMA_ROW_TEMPLATE_H
#define VORN_SCHEMA_ROW_TEMPLATE_H

#include <vector>

#include <json/json.h>

#include "TableTypes.h"

namespace vornjsondb {

class RowTemplate {
  public:
    // For columns that all have names.
    RowTemplate(const TableTypes& Types, int nColumns, char** szNames);

    static bool AreNamed(int nColumns, char** szNames);

    bool Matches(int nColumns, char** szNames) const;

    // False when a column is not declared, comes twice or cannot be read: such rows are gone
    // through column by column.
    bool IsUsable() const { return m_blUsable; }

    // The record of one row.
    Json::Value Record(char** szTexts) const;

  private:
    struct Column {
        const MemberType* pType;
        int nIndex;
    };

    bool Prepare(const TableTypes& Types);

    std::vector<const char*> m_vecNames;  // as the statement has them, kept for the process
    std::vector<Column> m_vecColumns;     // in key order
    Json::Value m_jEmpty;                 // every column, with null
    bool m_blUsable;
};

}  // namespace vornjsondb

#endif  // VORN_SCHEMA_ROW_TEMPLATE_H
