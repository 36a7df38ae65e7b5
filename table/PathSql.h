// Members and places inside of JSON members, as queries name them and as SQL.

#ifndef VORN_TABLE_PATH_SQL_H
#define VORN_TABLE_PATH_SQL_H

#include <string>
#include <string_view>

#include "FindingCodes.h"
#include "Members.h"

namespace vornjsondb {

// What is wrong, for a finding whose path is made only when it is needed.
struct Problem {
    FindingCode eCode = FindingCode::kCount;
    std::string strMessage;
    std::string strStep{};  // from the operand to what is wrong in it

    // Tells what. Returns false, for a caller that returns whether nothing is wrong.
    bool Tell(FindingCode eWrong, std::string_view strText);
};

struct Place {
    size_t nMember = Members::kNone;
    std::string strPath;  // '$."address"."city"', a literal of SQL; empty: the member itself
};

// "name", "address.city", "tags[0]". A member whose name has a point in it goes before a path.
bool FindPlace(const Members& Of, std::string_view strName, Place& Out, Problem& Why);

// The value there as SQL, NULL where there is none, and its kind as SQLite's json_type names it.
// Text that is no JSON counts as having nothing: one such row must not make the statement fail.
// strColumn is as expressions or, for an index, as CREATE INDEX name the column; the index is only
// used by expressions that have the same text otherwise.
std::string ValueAt(const std::string& strColumn, const std::string& strPath);
std::string KindAt(const std::string& strColumn, const std::string& strPath);

// The elements of the list there: what stands in the parentheses of json_each.
std::string ElementsAt(const std::string& strColumn, const std::string& strPath);

}  // namespace vornjsondb

#endif  // VORN_TABLE_PATH_SQL_H
