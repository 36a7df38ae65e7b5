// The code, severity and remedy of each finding that an operation can have, in one list;
// LintCodes.h has those that only looking has. docs/findings.md explains each.

#ifndef VORN_TABLE_FINDING_CODES_H
#define VORN_TABLE_FINDING_CODES_H

#include <cstdint>
#include <string>
#include <string_view>

#include "Failure.h"

// X(constant, "code", severity, "remedy"), grouped by what is looked at.
// clang-format off
#define VORN_FINDING_CODES(X)                                                                     \
    /* definitions */                                                                             \
    X(kNoDefinition, "no-definition", kError,                                                     \
      "give {\"<table>\": {\"member\": {\"<name>\": {\"cpptype\": \"<type>\"}}}}")                \
    X(kUnknownType, "unknown-type", kError, "use one of the type names in VornJsonDbTable.h")     \
    X(kBadName, "bad-name", kError, "give it another name")                                       \
    X(kSameColumn, "same-column", kError, "give one of the two another name")                     \
    X(kUnknownKey, "unknown-key", kError, "name members of the definition in \"key\"")            \
    X(kNamedTwice, "named-twice", kError, "name each member once")                                \
    X(kNoKey, "no-key", kError, "name the key in the definition: {\"key\": \"<member>\"}")        \
    /* records */                                                                                 \
    X(kNotARecord, "not-a-record", kError, "pass an object with at least one member")             \
    X(kUnknownMember, "unknown-member", kError,                                                   \
      "correct the name, or add the member to the definition and call Sync")                      \
    X(kGenerated, "generated", kError, "leave the member out: the table computes it")             \
    X(kWrongKind, "wrong-kind", kError, "pass a value of the member's type: none is converted")   \
    X(kOutOfRange, "out-of-range", kError, "correct the value, or declare a wider type")          \
    X(kNotANumber, "not-a-number", kError, "pass null, or leave the member out")                  \
    X(kOldCannotRead, "old-cannot-read", kError,                                                  \
      "clear Options::blCompatible when no VornJsonDbApi reads this table")                       \
    X(kTooDeep, "too-deep", kError, "store flatter JSON: its reader stops at this depth")         \
    X(kMissingKey, "missing-key", kError,                                                         \
      "give every member of the key a value that is not null")                                    \
    X(kRejected, "rejected", kError, "correct the record where it comes from")                    \
    /* queries */                                                                                 \
    X(kNotAQuery, "not-a-query", kError, "pass an object; {} is every record")                    \
    X(kUnknownQueryKey, "unknown-query-key", kError,                                              \
      "use \"where\", \"sort\", \"limit\", \"offset\" and \"members\"")                           \
    X(kNotConditions, "not-conditions", kError, "write {\"<member>\": <value>, ...}")             \
    X(kEmptyGroup, "empty-group", kError, "give the group a condition, or leave it out")          \
    X(kUnknownOperator, "unknown-operator", kError, "use an operator of VornJsonDbTable.h")       \
    X(kMisplacedOperator, "misplaced-operator", kError,                                           \
      "write {\"<member>\": {\"<operator>\": <operand>}}; $and and $or hold conditions")          \
    X(kMixedKeys, "mixed-keys", kError, "compare with a whole object by $eq")                     \
    X(kOperatorRefused, "operator-refused", kError, "pass the value alone")                       \
    X(kWrongOperator, "wrong-operator", kError, "use an operator that fits the member's type")    \
    X(kWrongOperand, "wrong-operand", kError, "pass the operand that the operator takes")         \
    X(kNullOperand, "null-operand", kError, "use $null to ask for NULL")                          \
    X(kSwappedEnds, "swapped-ends", kError, "put the lesser value first")                         \
    X(kListMember, "list-member", kError, "look into a list by $contains")                        \
    X(kNoJsonMember, "no-json-member", kError, "name the member alone")                           \
    X(kBadPath, "bad-path", kError, "write a path as in \"address.city\" and \"tags[0]\"")        \
    X(kNumberInPath, "number-in-path", kError, "write an index in brackets: \"tags[0]\"")         \
    X(kDecimalPoint, "decimal-point", kError,                                                     \
      "call setlocale(LC_NUMERIC, \"C\") behind any other setlocale")                             \
    X(kNulInJson, "nul-in-json", kError, "compare up to the NUL byte, or encode binary data")     \
    X(kBadPattern, "bad-pattern", kError, "escape text by EscapeLike")                            \
    X(kTooManyValues, "too-many-values", kError, "ask several times, with a part of the list")    \
    X(kTooManyConditions, "too-many-conditions", kError, "use $in where one member has many values") \
    X(kNestedTooDeep, "nested-too-deep", kError, "ask for the same in fewer levels")              \
    X(kBadSort, "bad-sort", kError, "write [\"<member>\", \"-<member>\"]")                        \
    X(kBadMembers, "bad-members", kError, "write [\"<member>\", ...], or leave it out for all")   \
    X(kBadCount, "bad-count", kError, "pass a whole number from 0, or leave it out")              \
    X(kNoCondition, "no-condition", kError, "give a condition; RemoveAll removes all records")    \
    X(kPagedChange, "paged-change", kError, "list what to change, then change it by its key")     \
    X(kEmptyNin, "empty-nin", kWarning, "make sure that no values means all records")
// clang-format on

namespace vornjsondb {

enum class FindingCode {
#define VORN_FINDING_CONSTANT(kConstant, szCode, kSeverity, szRemedy) kConstant,
    VORN_FINDING_CODES(VORN_FINDING_CONSTANT)
#undef VORN_FINDING_CONSTANT
        kCount
};

// Its row, for tests and lists; szCode, eSeverity and strRemedy are set.
Finding RowOf(FindingCode eCode);

// Rows as constants without a pointer, which would cost three times its size where a program is
// loaded at any address: the severities, and one text in which a NUL ends each code and remedy.
#define VORN_FINDING_TEXTS(kConstant, szCode, kSeverity, szRemedy) szCode "\0" szRemedy "\0"
#define VORN_FINDING_SEVERITY(kConstant, szCode, kSeverity, szRemedy) \
    static_cast<std::uint8_t>(Severity::kSeverity),
Finding RowAt(size_t nRow, const char* szTexts, const std::uint8_t* pSeverities);

// A list of findings grows no longer: what makes so many comes from no person.
constexpr size_t kMostFindings = 100;

// Adds one.
void Report(FindingList& vecFindings, FindingCode eCode, std::string_view strPath,
            std::string_view strMessage);
void Report(FindingList& vecFindings, Finding Row, std::string_view strPath,
            std::string_view strMessage);

// Adds those that another list has.
void ReportAll(const FindingList& vecOthers, FindingList& vecFindings);

// Reports a definition that has no members for the table.
void ReportNoDefinition(const std::string& strTable, FindingList& vecFindings);

// Reports what SQLite's own words say of a query that it would not prepare: too deep, too large.
void ReportRefusal(const std::string& strWords, FindingList& vecFindings);

// The JSON pointer one step further down.
std::string Below(const std::string& strPath, std::string_view strStep);

// A value as messages show it: numbers whole, texts in quotes and cut where they are long, lists
// and objects by their size.
std::string Shown(const Json::Value& jValue);
std::string ShownText(std::string_view strText);

// The bytes of a JSON value that is a text.
std::string_view BytesOf(const Json::Value& jText);

// A name in double quotes, as messages and SQL show it; quotes in it are doubled.
std::string Quoted(std::string_view strName);

// A text in quotes of that kind, those in it doubled.
std::string Enclosed(std::string_view strText, char cQuote);

}  // namespace vornjsondb

#endif  // VORN_TABLE_FINDING_CODES_H
