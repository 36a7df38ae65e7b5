// Conditions and assignments: one member, and whole query objects.

#include "VornJsonDbApiConditions.h"

#include <VornJsonDbApi.h>

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
using vornjsondb::TextBuffer;
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

// What stands on both sides of a value.
std::string_view QuoteOf(ConditionForm eForm) {
    const bool blQuoted =
        eForm == ConditionForm::kQuotedText || eForm == ConditionForm::kQuotedJson;
    return {"'", blQuoted ? size_t{1} : size_t{0}};
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
int AppendMatch(const TypedMember& Member, const Json::Value& jParam, TextBuffer& Sql) {
    const ConditionForm eForm = Member.pType->eCondition;
    const SqlText szSql = EscapedValue(eForm, jParam);
    // mutate(exchanged): what a value is quoted by does not depend on it.
    if (!szSql) {
        LogNoText(eForm);
        return -1;
    }
    const std::string_view Quote = QuoteOf(eForm);
    Sql.Append(Member.Name.View()).Append('=').Append(Quote).Append(szSql.get()).Append(Quote);
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
void AppendPlainMatch(const TypedMember& Member, const Json::Value& jValue, TextBuffer& Sql) {
    Sql.Append(Member.Name.View()).Append('=');
    if (jValue.isString()) {
        vornjsondb::AppendQuoted(jValue.asCString(), Sql);
    } else {
        vornjsondb::AppendDigits(jValue.asInt64(), Sql);
    }
}

// "name in (value )" of a member.
// The elements follow each other without a separator, so that several make one literal. Hosts
// pass one element; a list that suddenly matched more rows would delete more. Pinned by
// MemberCondition.ElementsFollowEachOtherWithoutSeparator.
int AppendList(const TypedMember& Member, const Json::Value& jList, TextBuffer& Sql) {
    const ConditionForm eForm = Member.pType->eCondition;
    // In a list a boolean is written by its string form, unlike after "=".
    const ConditionForm eElement =
        eForm == ConditionForm::kBoolean ? ConditionForm::kBareText : eForm;
    const std::string_view Quote = QuoteOf(eElement);
    TextBuffer List;
    // By index: an array need not store all of its elements, and a missing one is a null.
    for (Json::ArrayIndex i = 0; i < jList.size(); ++i) {
        const SqlText szSql = EscapedValue(eElement, jList[i]);
        VORN_FAIL_IF_TEXT(!szSql && eElement == ConditionForm::kQuotedJson,
                          "NULL == (szSql = sqlite3_mprintf(\"%q\", jList[i].toString().c_str()))");
        // mutate(exchanged): of a list that is refused nothing is kept.
        VORN_FAIL_IF_TEXT(!szSql,
                          "NULL == (szSql = sqlite3_mprintf(\"%q\", jList[i].asString().c_str()))");
        if (i == 0) {
            List.Append(Member.Name.View()).Append(" in (");
        }
        List.Append(Quote).Append(szSql.get()).Append(Quote);
    }
    if (!List.IsEmpty()) {
        Sql.Append(List.View()).Append(" )");
    }
    return 0;
}

// The same of the member szField, for any value.
int AppendListOf(const TableTypes& Types, const char* szField, const Json::Value& jList,
                 TextBuffer& Sql) {
    VORN_FAIL_IF(!szField || !szField[0]);
    const TypedMember* pMember = Types.Find(vornjsondb::NameOf(szField));
    VORN_FAIL_IF_TEXT(pMember == nullptr, "!jType.isMember(szField)");
    VORN_FAIL_IF(jList.type() != Json::arrayValue);
    return AppendList(*pMember, jList, Sql);
}

// A member's condition or assignment: by its value or by a list of values.
int AppendMember(const TableTypes& Types, const TypedMember& Member, const Json::Value& jValue,
                 ListUse eUse, TextBuffer& Sql) {
    // mutate(false, exchanged): the formatter gives the same; a list is not plain.
    if (eUse == ListUse::kAssignments && IsPlain(Member, jValue)) {
        AppendPlainMatch(Member, jValue, Sql);
        return 0;
    }
    if (jValue.isArray()) {
        // By name: for a list the name ends at its first NUL.
        VORN_FAIL_IF_TEXT(0 > AppendListOf(Types, Member.Name.pBegin, jValue, Sql),
                          "0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)");
        return 0;
    }
    VORN_FAIL_IF_TEXT(0 > AppendMatch(Member, jValue, Sql),
                      "0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)");
    return 0;
}

struct JoinMode {
    std::string_view Opening;
    std::string_view Joiner;
    std::string_view Closing;
};

// By VORN_SQL_WHERE_TYPE_...
constexpr JoinMode kJoinModes[] = {{" (", " or ", " )"}, {" (", " and ", " )"}, {"", " , ", ""}};
constexpr int kJoinModeCount = sizeof(kJoinModes) / sizeof(kJoinModes[0]);

// Appends what was written, or written until it failed, and returns what that returned.
int AppendTo(std::string& strOut, const TextBuffer& Sql, int nResult) {
    strOut.append(Sql.View());
    return nResult;
}

}  // namespace

int vornjsondb::AppendMemberList(const TableTypes& Types, const Json::Value& jRecParam,
                                 TextBuffer& Sql, int andType, ListUse eUse) {
    VORN_FAIL_IF(jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue);
    if (andType < 0 || andType >= kJoinModeCount) {
        VORN_LOG_LOCATED("error andType=%d", andType);
        return -1;
    }
    bool blWritten = false;
    const JoinMode& Mode = kJoinModes[andType];
    TypeCursor NextType(Types);
    for (MemberWalk Walk(jRecParam); !Walk.IsDone(); Walk.Next()) {
        const MemberName Name = Walk.Name();
        const bool blFilter = Name.Is(kFilterKey);
        const TypedMember* pMember = NextType.Find(Name);
        if (blFilter ? eUse == ListUse::kAssignments : pMember == nullptr) {
            continue;
        }
        // Written before the member's own text: an empty list, which writes nothing, leaves its
        // joiner, and SQLite refuses the statement instead of running it without the condition.
        // Pinned by ConditionList.EmptyListLeavesItsJoinerBehind.
        Sql.Append(blWritten ? Mode.Joiner : Mode.Opening);
        if (blFilter) {
            VORN_FAIL_IF_TEXT(!Walk.Value().isString(), "!jRecParam[jmFieldName[i]].isString()");
            Sql.Append(' ').Append(Walk.Value().asString()).Append(' ');
        } else if (0 > AppendMember(Types, *pMember, Walk.Value(), eUse, Sql)) {
            return -1;
        }
        blWritten = true;
    }
    if (!blWritten) {
        return 1;
    }
    Sql.Append(Mode.Closing);
    return 0;
}

int vornjsondb::AppendConditions(const HandleParts& Handle, const Json::Value& jRecParam,
                                 TextBuffer& Sql) {
    return AppendMemberList(Handle.LookUp().Types(), jRecParam, Sql, VORN_SQL_WHERE_TYPE_AND,
                            ListUse::kConditions);
}

int VornJsonDbApi::SqlMakeByMatchField(std::string& strField, Json::Value& jParam,
                                       std::string& strSqlOut) {
    const TableTypes& Types = vornjsondb::LookUpTable(m_jTableDef, m_strName).Types();
    const TypedMember* pMember = Types.Find(vornjsondb::NameOf(strField));
    VORN_FAIL_IF_TEXT(pMember == nullptr, "!jType.isMember(strField)");
    TextBuffer Sql;
    return AppendTo(strSqlOut, Sql, AppendMatch(*pMember, jParam, Sql));
}

int VornJsonDbApi::SqlMakeByListField(const char* szField, Json::Value& jList,
                                      std::string& strSqlOut) {
    const TableTypes& Types = vornjsondb::LookUpTable(m_jTableDef, m_strName).Types();
    TextBuffer Sql;
    return AppendTo(strSqlOut, Sql, AppendListOf(Types, szField, jList, Sql));
}

int VornJsonDbApi::SqlExpandMemberList(Json::Value& jRecParam, std::string& strSqlWhereOut,
                                       int andType) {
    const TableTypes& Types = vornjsondb::LookUpTable(m_jTableDef, m_strName).Types();
    TextBuffer Sql;
    const int nResult = vornjsondb::AppendMemberList(Types, jRecParam, Sql, andType,
                                                     vornjsondb::ListUse::kConditions);
    return AppendTo(strSqlWhereOut, Sql, nResult);
}
