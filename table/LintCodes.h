// The findings of Lint and its kin alone, as FindingCodes.h has the others: a program that looks at
// nothing does not hold their texts.

#ifndef VORN_TABLE_LINT_CODES_H
#define VORN_TABLE_LINT_CODES_H

#include "FindingCodes.h"

// clang-format off
#define VORN_LINT_CODES(X)                                                                        \
    /* definitions */                                                                             \
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

enum class LintCode {
#define VORN_LINT_CONSTANT(kConstant, szCode, kSeverity, szRemedy) kConstant,
    VORN_LINT_CODES(VORN_LINT_CONSTANT)
#undef VORN_LINT_CONSTANT
        kCount
};

Finding RowOf(LintCode eCode);

void Report(FindingList& vecFindings, LintCode eCode, std::string_view strPath,
            std::string_view strMessage);

}  // namespace vornjsondb

#endif  // VORN_TABLE_LINT_CODES_H
