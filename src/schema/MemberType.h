// The type vocabulary: what each "cpptype" means, in one table.

#ifndef VORN_SCHEMA_MEMBER_TYPE_H
#define VORN_SCHEMA_MEMBER_TYPE_H

#include <json/json.h>

namespace vornjsondb {

// How a value stands in a condition or assignment.
enum class ConditionForm {
    kQuotedText,  // '...' around the escaped string form
    kQuotedJson,  // '...' around the escaped JSON text
    kBoolean,     // 0 or 1 after "=", the string form in a list
    kBareText     // the escaped string form without quotes
};

// One type name and its treatments. The treatments were never made alike for all types, and hosts
// depend on each: a missing one is a refusal, not an omission. Pinned by the vocabulary tests.
struct MemberType {
    const char* szName;

    // Column text into a value; nullptr: a row with such a column is refused.
    void (*pfnRead)(const char* szText, Json::Value& jOut);

    // Whether a record's value fits; nullptr: the record check refuses every value.
    bool (*pfnFits)(const Json::Value& jValue);

    // Formatting for a value list; nullptr: cannot be stored. pfnFormat hands szFormat, which
    // holds szSpecifier as its one conversion that takes an argument, and the value to
    // sqlite3_mprintf and returns its result, which the caller frees. Throws Json::Exception for
    // a value that cannot be converted.
    const char* szSpecifier;
    char* (*pfnFormat)(const char* szFormat, const Json::Value& jValue);

    ConditionForm eCondition;
};

// The row of that name; for an unknown name a row that refuses all but bare conditions.
const MemberType& FindMemberType(const char* pBegin, const char* pEnd);

// The same for a member's entry in the member types.
const MemberType& TypeOfMember(const Json::Value& jDefinition);

// The "cpptype" text of a member's entry, for messages.
const char* TypeName(const Json::Value& jDefinition);

// Reads a column text as Type says; false when the type cannot be read or the text is nested
// deeper than the JSON reader goes.
bool ReadColumn(const MemberType& Type, const char* szText, Json::Value& jOut);

}  // namespace vornjsondb

#endif  // VORN_SCHEMA_MEMBER_TYPE_H
