// The usual row, made quickly.
//
// All rows of a statement have the same columns, so the record is built once, empty, and copied
// for each row: no search for a member and its type in every cell. Its member names are shared by
// all records instead of being copied into each, which also makes a list smaller.

#ifndef VORN_CORE_ROW_TEMPLATE_H
#define VORN_CORE_ROW_TEMPLATE_H

#include <string>
#include <vector>

#include <json/json.h>

#include "../schema/MemberType.h"

namespace vornjsondb {

class RowTemplate {
  public:
    // The template that was made for these columns of the table, or nullptr.
    static const RowTemplate* Find(const std::string& strTable, int nColumns, char** szNames);

    // Makes one, for this row and those to come, with the table's member types; nullptr when there
    // are too many, or there is nothing to make it of.
    static const RowTemplate* Make(const std::string& strTable, const Json::Value& jType,
                                   int nColumns, char** szNames);

    // Records and templates share names, so a template stays what and where it is.
    RowTemplate(const RowTemplate&) = delete;
    RowTemplate& operator=(const RowTemplate&) = delete;
    ~RowTemplate() = default;

    // The member types that it was made with.
    const Json::Value& Types() const { return *m_pjType; }

    // Makes the record of one row. Returns false, with jRec as it was, when a column is not
    // declared, comes twice or cannot be read: such rows are gone through column by column.
    bool Fill(char** szTexts, Json::Value& jRec) const;

  private:
    struct Column {
        const MemberType* pType;
        size_t nIndex;
    };

    RowTemplate(std::string strTable, const Json::Value& jType, int nColumns, char** szNames);
    bool Prepare();
    bool Matches(const std::string& strTable, int nColumns, char** szNames) const;

    std::string m_strTable;
    const Json::Value* m_pjType;  // never changes, and lives as long as the process
    bool m_blUsable = false;
    std::vector<std::string> m_vecNames;  // as the statement has them
    std::vector<Column> m_vecColumns;     // in key order
    Json::Value m_jEmpty;                 // every column, with null; its keys lie in m_vecNames
};

}  // namespace vornjsondb

#endif  // VORN_CORE_ROW_TEMPLATE_H
