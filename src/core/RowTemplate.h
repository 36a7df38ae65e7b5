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
    // The template for these columns of the table, of one row or more; nullptr when none has been
    // made.
    static const RowTemplate* Find(const std::string& strTable, int nColumns, char** szNames);

    // Makes it, for the rows and statements to come, of the table's member types; nullptr when a
    // column is not declared, cannot be read or comes twice.
    static const RowTemplate* Make(const std::string& strTable, const Json::Value& jType,
                                   int nColumns, char** szNames);

    // Makes the record of one row. Returns false, with jRec as it was, when a text cannot be read.
    bool Fill(char** szTexts, Json::Value& jRec) const;

  private:
    struct Column {
        const MemberType* pType;
        size_t nIndex;
    };

    RowTemplate(std::string strTable, int nColumns, char** szNames);
    bool Prepare(const Json::Value& jType);
    bool Matches(const std::string& strTable, int nColumns, char** szNames) const;

    std::string m_strTable;               // stands for its member types, which never change
    std::vector<std::string> m_vecNames;  // as the statement has them
    std::vector<Column> m_vecColumns;     // in key order
    Json::Value m_jEmpty;                 // every column, with null; its keys lie in m_vecNames
};

}  // namespace vornjsondb

#endif  // VORN_CORE_ROW_TEMPLATE_H
