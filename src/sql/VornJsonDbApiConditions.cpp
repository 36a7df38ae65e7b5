// Conditions and assignments: one member, and whole query objects.

#include "VornJsonDbApiConditions.h"

#include <VornJsonDbApi.h>

#include <cstring>
#include <string_view>

#include "../base/Digits.h"
#include "../base/JsonText.h"
#include "../base/SqlText.h"
#include "../core/LogLine.h"
#include "../schema/KnownTables.h"

namespace {

using vornjsondb::ConditionForm;
using vornjsondb::ListUse;
using vornjsondb::SqlText;
using vornjsondb::TableTypes;
using vornjsondb::TypedMember;

constexpr char kFilterKey[] = "vornSqlWhereFilter";

// The value's string form with quotes doubled.
char* EscapedString(const Json::Value& jValue) {
    switch (jValue.type()) {
        case Json::stringValue:
            return sqlite3_mprintf("%q", jValue.asCString());
        case Json::intValue:  // the same text as below, made in one step
            return sqlite3_mprintf("%lld", static_cast<long long>(jValue.asInt64()));
        default:
            return sqlite3_mprintf("%q", jValue.asString().c_str());
    }
}

// The value as text with quotes doubled; no text when SQLite has no memory or the value has no
// such form.
SqlText EscapedValue(ConditionForm eForm, const Json::Value& jValue) try {
    switch (eForm) {
        case ConditionForm::kBoolean:
            return SqlText(sqlite3_mprintf("%d", jValue.asInt()));
        case ConditionForm::kQuotedJson:
            return SqlText(sqlite3_mprintf("%q", vornjsondb::ToString(jValue).c_str()));
        default:
            return SqlText(EscapedString(jValue));
    }
} catch (const Json::Exception&) {
    return nullptr;
}

bool IsQuoted(ConditionForm eForm) {
    return eForm == ConditionForm::kQuotedText || eForm == ConditionForm::kQuotedJson;
}

void LogNoText(ConditionForm eForm) {
    switch (eForm) {
        case ConditionForm::kBoolean:
            VORN_LOG_CONDITION("NULL == (szSql = sqlite3_mprintf(\"%d\", jParam.asInt()))");
            break;
        case ConditionForm::kQuotedJson:
            VORN_LOG_CONDITION(
                "NULL == (szSql = sqlite3_mprintf(\"%q\", jParam.toString().c_str()))");
            break;
        default:
            VORN_LOG_CONDITION(
                "NULL == (szSql = sqlite3_mprintf(\"%q\", jParam.asString().c_str()))");
    }
}

// "name=value" of a member.
int AppendMatch(const TypedMember& Member, const Json::Value& jParam, std::string& strSqlOut) {
    const ConditionForm eForm = Member.pType->eCondition;
    const SqlText szSql = EscapedValue(eForm, jParam);
    if (!szSql) {
        LogNoText(eForm);
        return -1;
    }
    const size_t nValue = std::strlen(szSql.get());
    const bool blQuoted = IsQuoted(eForm);
    // Room for all of it first: memory that runs out in between must not leave half a condition.
    strSqlOut.reserve(strSqlOut.length() + Member.Name.Length() + nValue + 3);
    strSqlOut.append(Member.Name.pBegin, Member.Name.Length()).append("='", blQuoted ? 2 : 1);
    strSqlOut.append(szSql.get(), nValue);
    if (blQuoted) {
        strSqlOut += '\'';
    }
    return 0;
}

// Whether the formatter would write the value as it is, but for doubled quotes.
bool IsPlain(const TypedMember& Member, const Json::Value& jValue) {
    switch (Member.pType->eCondition) {
        case ConditionForm::kQuotedText:
            return jValue.type() == Json::stringValue;
        case ConditionForm::kBareText:
            return jValue.type() == Json::intValue;
        case ConditionForm::kBoolean:
            return jValue.type() == Json::booleanValue;
        default:
            return false;
    }
}

// AppendMatch of a value that is plain.
void AppendPlainMatch(const TypedMember& Member, const Json::Value& jValue,
                      std::string& strSqlOut) {
    strSqlOut.append(Member.Name.pBegin, Member.Name.Length()) += '=';
    if (jValue.isString()) {
        vornjsondb::AppendQuoted(jValue.asCString(), strSqlOut);
    } else {
        vornjsondb::AppendDigits(jValue.asInt64(), strSqlOut);
    }
}

// "name in (value )" of a member.
// The elements follow each other without a separator, so that several make one literal. Hosts
// pass one element; a list that suddenly matched more rows would delete more. Pinned by
// MemberCondition.ElementsFollowEachOtherWithoutSeparator.
int AppendList(const TypedMember& Member, const Json::Value& jList, std::string& strSqlOut) {
    const ConditionForm eForm = Member.pType->eCondition;
    // In a list a boolean is written by its string form, unlike after "=".
    const ConditionForm eElement =
        eForm == ConditionForm::kBoolean ? ConditionForm::kBareText : eForm;
    std::string strList;
    // By index: an array need not store all of its elements, and a missing one is a null.
    for (Json::ArrayIndex i = 0; i < jList.size(); ++i) {
        const SqlText szSql = EscapedValue(eElement, jList[i]);
        VORN_FAIL_IF_TEXT(!szSql && eElement == ConditionForm::kQuotedJson,
                          "NULL == (szSql = sqlite3_mprintf(\"%q\", jList[i].toString().c_str()))");
        VORN_FAIL_IF_TEXT(!szSql,
                          "NULL == (szSql = sqlite3_mprintf(\"%q\", jList[i].asString().c_str()))");
        if (i == 0) {
            strList.append(Member.Name.pBegin, Member.Name.Length()).append(" in (");
        }
        const char* szQuote = IsQuoted(eElement) ? "'" : "";
        strList.append(szQuote).append(szSql.get()).append(szQuote);
    }
    if (!strList.empty()) {
        strSqlOut.append(strList.append(" )"));
    }
    return 0;
}

// The same of the member szField, for any value.
int AppendListOf(const TableTypes& Types, const char* szField, const Json::Value& jList,
                 std::string& strSqlOut) {
    VORN_FAIL_IF(!szField || !szField[0]);
    const TypedMember* pMember = Types.Find(vornjsondb::NameOf(szField));
    VORN_FAIL_IF_TEXT(pMember == nullptr, "!jType.isMember(szField)");
    VORN_FAIL_IF(jList.type() != Json::arrayValue);
    return AppendList(*pMember, jList, strSqlOut);
}

// A member's condition or assignment: by its value or by a list of values.
int AppendMember(const TableTypes& Types, const TypedMember& Member, const Json::Value& jValue,
                 ListUse eUse, std::string& strSqlOut) {
    // mutate(false, exchanged): the formatter gives the same; a list is not plain.
    if (eUse == ListUse::kAssignments && IsPlain(Member, jValue)) {
        AppendPlainMatch(Member, jValue, strSqlOut);
        return 0;
    }
    if (jValue.isArray()) {
        // By name: for a list the name ends at its first NUL.
        VORN_FAIL_IF_TEXT(0 > AppendListOf(Types, Member.Name.pBegin, jValue, strSqlOut),
                          "0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)");
        return 0;
    }
    VORN_FAIL_IF_TEXT(0 > AppendMatch(Member, jValue, strSqlOut),
                      "0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)");
    return 0;
}

struct JoinMode {
    std::string_view Joiner;
    bool blWrapped;
};

// By VORN_SQL_WHERE_TYPE_...
constexpr JoinMode kJoinModes[] = {{" or ", true}, {" and ", true}, {" , ", false}};
constexpr int kJoinModeCount = sizeof(kJoinModes) / sizeof(kJoinModes[0]);

}  // namespace

int vornjsondb::AppendMemberList(const TableTypes& Types, const Json::Value& jRecParam,
                                 std::string& strSqlOut, int andType, ListUse eUse) {
    VORN_FAIL_IF(jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue);
    if (andType < 0 || andType >= kJoinModeCount) {
        VORN_LOG_LOCATED("error andType=%d", andType);
        return -1;
    }
    bool blWritten = false;
    const JoinMode& Mode = kJoinModes[andType];
    const std::string_view Opening = Mode.blWrapped ? " (" : "";
    TypeCursor NextType(Types);
    const Json::Value::const_iterator itEnd = jRecParam.end();
    for (Json::Value::const_iterator it = jRecParam.begin(); it != itEnd; ++it) {
        const MemberName Name = NameOf(it);
        const bool blFilter = Name.Is(kFilterKey);
        const TypedMember* pMember = NextType.Find(Name);
        if (blFilter ? eUse == ListUse::kAssignments : pMember == nullptr) {
            continue;
        }
        // Written before the member's own text: an empty list, which writes nothing, leaves its
        // joiner, and SQLite refuses the statement instead of running it without the condition.
        // Pinned by ConditionList.EmptyListLeavesItsJoinerBehind.
        strSqlOut += blWritten ? Mode.Joiner : Opening;
        if (blFilter) {
            VORN_FAIL_IF_TEXT(!it->isString(), "!jRecParam[jmFieldName[i]].isString()");
            strSqlOut.append(" ").append(it->asString()).append(" ");
        } else if (0 > AppendMember(Types, *pMember, *it, eUse, strSqlOut)) {
            return -1;
        }
        blWritten = true;
    }
    if (!blWritten) {
        return 1;
    }
    if (Mode.blWrapped) {
        strSqlOut += " )";
    }
    return 0;
}

int VornJsonDbApi::SqlMakeByMatchField(std::string& strField, Json::Value& jParam,
                                       std::string& strSqlOut) {
    const TableTypes& Types = vornjsondb::LookUpTable(m_jTableDef, m_strName).Types();
    const TypedMember* pMember = Types.Find(vornjsondb::NameOf(strField));
    VORN_FAIL_IF_TEXT(pMember == nullptr, "!jType.isMember(strField)");
    return AppendMatch(*pMember, jParam, strSqlOut);
}

int VornJsonDbApi::SqlMakeByListField(const char* szField, Json::Value& jList,
                                      std::string& strSqlOut) {
    const TableTypes& Types = vornjsondb::LookUpTable(m_jTableDef, m_strName).Types();
    return AppendListOf(Types, szField, jList, strSqlOut);
}

int VornJsonDbApi::SqlExpandMemberList(Json::Value& jRecParam, std::string& strSqlWhereOut,
                                       int andType) {
    const TableTypes& Types = vornjsondb::LookUpTable(m_jTableDef, m_strName).Types();
    return vornjsondb::AppendMemberList(Types, jRecParam, strSqlWhereOut, andType,
                                        vornjsondb::ListUse::kConditions);
}
