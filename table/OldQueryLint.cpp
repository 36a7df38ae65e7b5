// What a VornJsonDbApi makes of a query object.

#include <VornJsonDbTable.h>

#include "../src/base/JsonMember.h"
#include "../src/schema/MemberType.h"
#include "../src/schema/TableDefinition.h"
#include "Fit.h"
#include "LintCodes.h"
#include "Nearest.h"
#include "OldKeys.h"

namespace vornjsondb {

namespace {

// Kinds of values as the type knows them; null is another matter.
bool IsOfKind(BoundKind eKind, const Json::Value& jValue) {
    switch (eKind) {
        case BoundKind::kText:
            return jValue.isString();
        case BoundKind::kBoolean:
            return jValue.isBool();
        case BoundKind::kInteger:
        case BoundKind::kReal:
            return jValue.isNumeric();
        case BoundKind::kObject:
            return jValue.isObject();
        default:
            return true;
    }
}

class OldQueryLint {
  public:
    OldQueryLint(const Json::Value& jMembers, const Json::Value& jQuery, FindingList& vecFindings)
        : m_jMembers(jMembers), m_jQuery(jQuery), m_vecFindings(vecFindings) {}

    void Run() {
        if (!m_jQuery.isObject() && !m_jQuery.isNull()) {
            Report(m_vecFindings, FindingCode::kNotAQuery, "", Shown(m_jQuery) + " is no query");
            return;
        }
        bool blCondition = false;
        for (const std::string& strName : m_jQuery.getMemberNames()) {
            blCondition = LintMember(strName, m_jQuery[strName]) || blCondition;
        }
        if (!blCondition) {
            Report(m_vecFindings, LintCode::kOldSelectsAll, "",
                   "there is no condition: recList lists all records, recUpdateByFilter and " +
                       std::string("recDelete refuse"));
        }
        LintTail();
    }

  private:
    // Whether it is a condition.
    bool LintMember(const std::string& strName, const Json::Value& jValue) {
        const std::string strPath = Below("", strName);
        if (strName == kOldFilter) {
            LintFilter(jValue, strPath);
            return true;
        }
        const Json::Value* pjMember = FindMember(m_jMembers, strName);
        if (pjMember == nullptr) {
            if (!IsOldKey(strName)) {
                Report(m_vecFindings, LintCode::kOldIgnoresMember, strPath,
                       "there is no member " + ShownText(strName) + ", and the query goes " +
                           "without it" + Suggestion(strName, m_jMembers.getMemberNames()));
            }
            return false;
        }
        // mutate(exchanged): in any order.
        if (IsOldKey(strName)) {
            Report(m_vecFindings, LintCode::kHidesQueryKey, strPath,
                   Quoted(strName) + " is a condition and a key of the query at once");
        }
        m_strMember = "member " + ShownText(strName);
        const MemberType& Type = TypeOfMember(*pjMember);
        if (jValue.isArray()) {
            LintList(Type, jValue, strPath);
        } else {
            LintValue(Type, Type.eCondition, jValue, strPath, false);
        }
        return true;
    }

    void LintFilter(const Json::Value& jFilter, const std::string& strPath) {
        if (!jFilter.isString() || BytesOf(jFilter).empty()) {
            Report(m_vecFindings, LintCode::kOldRefuses, strPath,
                   Shown(jFilter) + " is no condition: expected is a text of SQL");
        } else {
            Report(m_vecFindings, LintCode::kRawSql, strPath,
                   "the text goes into the statement as SQL");
        }
    }

    void LintList(const MemberType& Type, const Json::Value& jList, const std::string& strPath) {
        if (jList.empty()) {
            Report(m_vecFindings, LintCode::kEmptyList, strPath,
                   m_strMember + ": an empty list makes a statement that SQLite refuses");
        } else if (jList.size() > 1) {
            Report(m_vecFindings, LintCode::kRunTogether, strPath,
                   m_strMember + ": " + std::to_string(jList.size()) +
                       " values run together into one");
        } else if (Type.eCondition == ConditionForm::kQuotedJson) {
            Report(m_vecFindings, LintCode::kOldMembership, strPath,
                   m_strMember + ": asks for records whose value is the list's element");
        } else {
            const bool blFlag = Type.eCondition == ConditionForm::kBoolean;
            LintValue(Type, blFlag ? ConditionForm::kBareText : Type.eCondition, jList[0],
                      Below(strPath, "0"), true);
        }
    }

    // In the place of a bare value it leaves nothing: "id=" or, of a list, "id in ()".
    void LintNull(ConditionForm eForm, bool blOfList, const std::string& strPath) {
        if (eForm == ConditionForm::kBareText && !blOfList) {
            Report(m_vecFindings, LintCode::kOldRefuses, strPath,
                   m_strMember + ": null leaves a gap in the statement, which SQLite refuses");
        } else {
            Report(m_vecFindings, LintCode::kOldNull, strPath,
                   m_strMember + ": null " + OfNull(eForm));
        }
    }

    void LintValue(const MemberType& Type, ConditionForm eForm, const Json::Value& jValue,
                   const std::string& strPath, bool blOfList) {
        if (jValue.isNull()) {
            LintNull(eForm, blOfList, strPath);
        } else if (IsRefused(eForm, jValue)) {
            Report(
                m_vecFindings, LintCode::kOldRefuses, strPath,
                m_strMember + ": " + Shown(jValue) + " cannot be compared with " + Expected(Type));
        } else if (eForm == ConditionForm::kBareText && jValue.isString()) {
            Report(m_vecFindings, LintCode::kBareText, strPath,
                   m_strMember + ": " + Shown(jValue) + " goes into the statement as SQL");
        } else if (!IsOfKind(Type.Bound.eKind, jValue)) {
            Report(m_vecFindings, LintCode::kOldOtherKind, strPath,
                   m_strMember + ": " + Shown(jValue) + " is converted: expected is " +
                       Expected(Type));
        } else if (eForm == ConditionForm::kQuotedText &&
                   BytesOf(jValue).find('\0') != std::string_view::npos) {
            Report(m_vecFindings, LintCode::kNulCut, strPath,
                   m_strMember + ": compared is the text before its NUL byte");
        }
    }

    static const char* OfNull(ConditionForm eForm) {
        switch (eForm) {
            case ConditionForm::kQuotedText:
                return "asks for the empty text";
            case ConditionForm::kQuotedJson:
                return "asks for the text null";
            case ConditionForm::kBoolean:
                return "asks for false";
            default:
                return "selects nothing";
        }
    }

    // Values that JsonCpp does not convert to the form.
    static bool IsRefused(ConditionForm eForm, const Json::Value& jValue) {
        if (eForm == ConditionForm::kQuotedJson) {
            return false;
        }
        return !jValue.isConvertibleTo(eForm == ConditionForm::kBoolean ? Json::intValue
                                                                        : Json::stringValue);
    }

    void LintTail() {
        const Json::Value* pjSort = FindMember(m_jQuery, kOldSort);
        // mutate(exchanged statements): what follows finds something only where nothing is sorted.
        if (pjSort != nullptr && pjSort->isString()) {
            Report(
                m_vecFindings, LintCode::kSortsNothing, Below("", kOldSort),
                Shown(*pjSort) + " is compared as a constant: the order stays that of the table");
        } else if (pjSort != nullptr) {
            Report(m_vecFindings, LintCode::kOldRefuses, Below("", kOldSort),
                   Shown(*pjSort) + " is no member's name");
        }
        LintPair(kOldDirection, kOldSort);
        // mutate(exchanged): only one of the two finds anything.
        LintPair(kOldOffset, kOldLimit);
        // mutate(hoisted): of a key that is not there nothing is told.
        if (FindMember(m_jQuery, kOldLimit) != nullptr) {
            LintCount(kOldLimit);
            LintCount(kOldOffset);
        }
    }

    void LintPair(const char* szKey, const char* szNeeded) {
        // mutate(exchanged): both only look.
        if (FindMember(m_jQuery, szKey) != nullptr && FindMember(m_jQuery, szNeeded) == nullptr) {
            Report(m_vecFindings, LintCode::kOldIgnoresKey, Below("", szKey),
                   Quoted(szKey) + " counts only beside " + Quoted(szNeeded));
        }
    }

    void LintCount(const char* szKey) {
        const Json::Value* pjCount = FindMember(m_jQuery, szKey);
        if (pjCount == nullptr) {
            return;
        }
        if (!pjCount->isInt64()) {
            Report(m_vecFindings, FindingCode::kBadCount, Below("", szKey),
                   Quoted(szKey) + " is " + Shown(*pjCount) + ", no whole number");
        } else {
            Report(m_vecFindings, LintCode::kOldReadingOnly, Below("", szKey),
                   Quoted(szKey) + " counts for recList and recGetOne alone");
        }
    }

    const Json::Value& m_jMembers;
    const Json::Value& m_jQuery;
    std::string m_strMember;  // that is being looked at, for messages
    FindingList& m_vecFindings;
};

}  // namespace

}  // namespace vornjsondb

namespace VORN_JSON_DB {

FindingList LintOldQuery(const std::string& strTable, const Json::Value& jDefinition,
                         const Json::Value& jOldQuery) {
    FindingList vecFindings;
    const Json::Value& jMembers = vornjsondb::DeclaredMembers(jDefinition, strTable);
    if (jMembers.empty()) {
        vornjsondb::ReportNoDefinition(strTable, vecFindings);
    } else {
        vornjsondb::OldQueryLint(jMembers, jOldQuery, vecFindings).Run();
    }
    return vecFindings;
}

}  // namespace VORN_JSON_DB
