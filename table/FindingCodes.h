// Every finding's code, severity and remedy, in one list. docs/findings.md explains each.

#ifndef VORN_TABLE_FINDING_CODES_H
#define VORN_TABLE_FINDING_CODES_H

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
    X(kBadName, "bad-name", kError, "give the member another name")                               \
    X(kSameColumn, "same-column", kError, "give one of the two another name")                     \
    X(kUnknownKey, "unknown-key", kError, "name members of the definition in \"key\"")            \
    X(kNoKey, "no-key", kError, "name the key in the definition: {\"key\": \"<member>\"}")        \
    X(kBadDefault, "bad-default", kError, "give a \"cppDefaultValue\" that the type can hold")    \
    X(kMisspeltKey, "misspelt-key", kWarning, "correct the key: what is not known is ignored")    \
    X(kBadFlag, "bad-flag", kWarning, "write true or false: all else counts as false")            \
    X(kHidesQueryKey, "hides-query-key", kWarning,                                                \
      "give the member another name, or sort and page by ToOldQuery")                             \
    X(kOldName, "old-name", kWarning,                                                             \
      "use letters, digits and underscores, and no word of SQL")                                  \
    X(kRowidName, "rowid-name", kWarning, "give the member another name")                         \
    X(kOldType, "old-type", kWarning, "use a type of which AbilitiesOf says that it can do all")  \
    X(kNoLastDefault, "no-last-default", kWarning,                                                \
      "give the member a \"cppDefaultValue\", or every record a value for it")                    \
    X(kNullDefault, "null-default", kWarning, "leave the default out, or give it a value")        \
    /* definitions against real tables */                                                         \
    X(kMissingColumn, "missing-column", kError, "call Sync, which adds it")                       \
    X(kMissingKeyColumn, "missing-key-column", kError,                                            \
      "correct the key, or copy the rows into a new table")                                       \
    X(kExtraColumn, "extra-column", kWarning, "describe it in the definition")                    \
    X(kOtherCase, "other-case", kWarning, "spell the member as the table does")                   \
    X(kOtherAffinity, "other-affinity", kWarning,                                                 \
      "declare the member as DefinitionOf does, or copy the rows into a new table")               \
    X(kNullableColumn, "nullable-column", kWarning,                                               \
      "give the member a value in every record, or copy the rows into a new table")               \
    X(kOtherDefault, "other-default", kWarning,                                                   \
      "declare the default that the column has, or copy the rows into a new table")               \
    X(kView, "view", kWarning,                                                                    \
      "open the table that the view reads, or give it INSTEAD OF triggers")                       \
    X(kWithoutRowid, "without-rowid", kWarning,                                                   \
      "create the table without WITHOUT ROWID where a VornJsonDbApi writes it")                   \
    X(kKeyNotUnique, "key-not-unique", kWarning, "call Sync, which adds a unique index")          \
    X(kMissingUnique, "missing-unique", kWarning, "call Sync, which adds a unique index")         \
    /* plans */                                                                                   \
    X(kFullScan, "full-scan", kWarning, "call CreateIndex, where the table is or gets large")     \
    X(kNotOneStatement, "not-one-statement", kError, "pass the text of one statement")            \
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
    X(kEmptyNin, "empty-nin", kWarning, "make sure that no values means all records")             \
    /* records for old handles */                                                                 \
    X(kOldDropsMember, "old-drops-member", kWarning, "correct the name, or leave the member out") \
    X(kOldCannotWrite, "old-cannot-write", kError, "write the record by a Table")                 \
    X(kMissingLastMember, "missing-last-member", kError, "give the member a value")               \
    X(kPercentHalved, "percent-halved", kWarning,                                                 \
      "write the record by a Table, or set the member by recUpdateByFilter")                      \
    X(kPercentRefused, "percent-refused", kError,                                                 \
      "write the record by a Table, or set the member by recUpdateByFilter")                      \
    X(kNulCut, "nul-cut", kWarning, "encode binary data, in base64 for example")                  \
    X(kOldReadsOther, "old-reads-other", kWarning, "declare the member as \"long long\"")         \
    X(kOldJsonChanged, "old-json-changed", kWarning,                                              \
      "leave NaN out, and store flatter JSON: its reader stops at some depth")                    \
    /* queries for old handles */                                                                 \
    X(kOldIgnoresMember, "old-ignores-member", kWarning, "correct the name")                      \
    X(kOldIgnoresKey, "old-ignores-key", kWarning, "pass both keys or none")                      \
    X(kOldSelectsAll, "old-selects-all", kNote, "give a condition, unless every record is meant") \
    X(kOldReadingOnly, "old-reading-only", kNote,                                                 \
      "leave the key out where recUpdateByFilter or recDelete gets the query")                    \
    X(kRawSql, "raw-sql", kNote, "let no part of the text come from outside: ToOldQuery does")    \
    X(kOldRefuses, "old-refuses", kError, "pass a value of the kind that is expected")            \
    X(kBareText, "bare-text", kError, "pass the number itself, not a text")                       \
    X(kOldNull, "old-null", kWarning, "ask for NULL by ToOldQuery: {\"<member>\": null}")         \
    X(kOldOtherKind, "old-other-kind", kWarning, "pass a value of the member's type")             \
    X(kEmptyList, "empty-list", kError, "leave the call out: no value selects nothing")           \
    X(kRunTogether, "run-together", kError, "ask for several values by ToOldQuery and $in")       \
    X(kOldMembership, "old-membership", kWarning, "ask for the whole value by ToOldQuery")        \
    X(kSortsNothing, "sorts-nothing", kWarning, "sort by ToOldQuery")
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

// A list of findings grows no longer: what makes so many comes from no person.
constexpr size_t kMostFindings = 100;

// Adds one.
void Report(FindingList& vecFindings, FindingCode eCode, std::string strPath,
            std::string strMessage);

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
