// The operators of queries, in one table.

#ifndef VORN_TABLE_OPERATORS_H
#define VORN_TABLE_OPERATORS_H

#include <VornJsonDbTable.h>

#include <string>
#include <string_view>

#include "../src/schema/MemberType.h"

namespace vornjsondb {

enum class OperandForm {
    kValue,    // one that the member can have, or null
    kOrdered,  // a text or a number
    kPair,     // two of these
    kList,     // of values
    kText,
    kFlag,    // true or false
    kElement  // any JSON, as an element of a list
};

struct Operator {
    VORN_JSON_DB::Op eOp;
    const char* szName;
    OperandForm eForm;
    unsigned nKinds;           // of members that it is for: a bit for each BoundKind, and kPathBit
    const char* szSql;         // between the two that it compares
    const char* szNumbersEnd;  // a second comparison, where the first also takes other kinds of
    const char* szTextsEnd;    // values: numbers come before texts and texts before blobs
};

constexpr unsigned BitOf(BoundKind eKind) {
    return 1U << static_cast<unsigned>(eKind);
}

// Of places inside of JSON members.
constexpr unsigned kPathBit = BitOf(BoundKind::kAny) << 1U;

// Whether it is one: any number can be made an Op.
bool IsOperator(VORN_JSON_DB::Op eOp);
const Operator& RowOf(VORN_JSON_DB::Op eOp);

// nullptr: no such operator.
const Operator* FindOperator(std::string_view strName);

// " (did you mean \"$prefix\"?)" for a name that is none, or nothing.
std::string OperatorSuggestion(std::string_view strName);

// "true or false": the operand, for messages.
const char* Expected(OperandForm eForm);

}  // namespace vornjsondb

#endif  // VORN_TABLE_OPERATORS_H
