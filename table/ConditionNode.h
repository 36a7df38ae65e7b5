// What a Condition holds. The JSON notation and the C++ form make the same trees.

#ifndef VORN_TABLE_CONDITION_NODE_H
#define VORN_TABLE_CONDITION_NODE_H

#include <VornJsonDbTable.h>

#include <string>
#include <vector>

namespace vornjsondb {

// Deeper trees, of conditions or of JSON, are refused where they come in: what walks, copies and
// frees them calls itself.
constexpr int kMaxLevels = 1000;

// SQLite takes a time that grows with the square of their number: a second for some thousands.
constexpr size_t kMaxConditions = 1000;

// Whether lists and objects are nested deeper than kMaxLevels. Does not call itself.
bool IsTooDeep(const Json::Value& jValue);

}  // namespace vornjsondb

// A group never has one part alone, but for kNot, and never one of its own kind.
struct VORN_JSON_DB::Condition::Node {
    enum class Kind { kLeaf, kAll, kAny, kNot, kTooDeep };
    Kind eKind = Kind::kLeaf;

    // A leaf.
    Op eOp = Op::kEqual;
    std::string strMember;  // or a path into it
    Json::Value jOperand;
    std::string strPath;  // where the notation has it, as a JSON pointer; empty: made in C++

    // A group.
    std::vector<Condition> vecParts;
    int nLevels = 0;     // of groups
    size_t nLeaves = 1;  // in all of it
};

#endif  // VORN_TABLE_CONDITION_NODE_H
