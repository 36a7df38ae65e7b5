// The type vocabulary: what each "cpptype" means, in one table.

#ifndef VORN_SCHEMA_MEMBER_TYPE_H
#define VORN_SCHEMA_MEMBER_TYPE_H

#include <json/json.h>

#include "../base/TextBuffer.h"

namespace vornjsondb {

// How a value stands in a condition or assignment.
enum class ConditionForm {
    kQuotedText,  // '...' around the escaped string form
    kQuotedJson,  // '...' around the escaped JSON text
    kBoolean,     // 0 or 1 after "=", the string form in a list
    kBareText     // the escaped string form without quotes
};

// What a value of a type is, for statements that bind values instead of writing them. A byte each:
// the table of types has to stay small.
enum class BoundKind : unsigned char {
    kNone,
    kText,
    kBoolean,
    kInteger,
    kReal,
    kObject,
    kList,
    kJson,
    kAny
};
enum class BoundRange : unsigned char { kNone, kInt32, kUInt32, kInt64, kUInt63, kDouble, kFloat };

struct BoundForm {
    BoundKind eKind;
    BoundRange eRange;  // of numbers
};

// One type name and its treatments. The treatments were never made alike for all types, and hosts
// depend on each: a missing one is a refusal, not an omission. Pinned by the vocabulary tests.
struct MemberType {
    const char* szName;

    // Column text into a value; nullptr: a row with such a column is refused.
    void (*pfnRead)(const char* szText, Json::Value& jOut);

    // Whether a record's value fits; nullptr: the record check refuses every value.
    bool (*pfnFits)(const Json::Value& jValue);

    // Appends a value to a value list, as SQLite's formatter writes it for szSpecifier; nullptr:
    // cannot be stored. Throws Json::Exception for a value that cannot be converted, and
    // std::logic_error when the formatter itself, which writes fractions, gives no text.
    void (*pfnAppend)(const Json::Value& jValue, TextBuffer& Out);
    const char* szSpecifier;

    ConditionForm eCondition;

    // Whether records may be deleted by a list of values of such a member.
    bool blDeleteByList;

    // Complete for every type, unlike the treatments above.
    BoundForm Bound;
};

// The row of that name; for an unknown name a row that refuses all but bare conditions.
const MemberType& FindMemberType(const char* pBegin, const char* pEnd);

// The same for a member's entry in the member types.
const MemberType& TypeOfMember(const Json::Value& jDefinition);

// The "cpptype" text of a member's entry, for messages.
const char* TypeName(const Json::Value& jDefinition);

}  // namespace vornjsondb

#endif  // VORN_SCHEMA_MEMBER_TYPE_H
