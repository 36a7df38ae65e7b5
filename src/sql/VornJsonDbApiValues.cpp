// The two lists of an INSERT.

#include <VornJsonDbApi.h>

#include "../base/JsonText.h"
#include "../core/LogLine.h"
#include "../schema/TableDefinition.h"
#include "../schema/TableTypes.h"
#include "AccumulatedFormat.h"

namespace {

using vornjsondb::MemberCursor;
using vornjsondb::MemberName;

}  // namespace

// In both lists the separator is decided by the member's place in the definition, not by what the
// record holds: a record that lacks the last declared member gets an unfinished statement, and
// SQLite refuses it. Hosts rely on such records being refused.
// Pinned by Names.MissingLastMemberLeavesATrailingComma.

int VornJsonDbApi::SqlExpandMemberName(std::string& strSql, Json::Value* pjRec) {
    const Json::Value& jMember = vornjsondb::DeclaredMembers(m_jTableDef, m_strName);
    MemberCursor RecordCursor(pjRec != nullptr ? *pjRec : Json::Value::nullSingleton());
    Json::ArrayIndex nLeft = jMember.size();
    const Json::Value::const_iterator itEnd = jMember.end();
    for (Json::Value::const_iterator it = jMember.begin(); it != itEnd; ++it) {
        --nLeft;
        const MemberName Key = vornjsondb::NameOf(it);
        if (pjRec != nullptr && RecordCursor.Find(Key) == nullptr) {
            continue;
        }
        strSql.append(Key.pBegin, Key.pEnd);
        if (nLeft > 0) {
            strSql += ',';
        }
    }
    return 0;
}

int VornJsonDbApi::SqlExpandMemberSymbol(std::string& strSql, Json::Value& jRec) {
    const Json::Value& jType = VORN_JSON_DB::recType(m_jTableDef, m_strName);
    const Json::Value& jMember = vornjsondb::DeclaredMembers(m_jTableDef, m_strName);
    vornjsondb::AccumulatedFormat Text(strSql);
    vornjsondb::TypeCursor Types(vornjsondb::TableTypes::Of(jType));
    MemberCursor RecordCursor(jRec);
    Json::ArrayIndex nLeft = jMember.size();
    const Json::Value::const_iterator itEnd = jMember.end();
    for (Json::Value::const_iterator it = jMember.begin(); it != itEnd; ++it) {
        --nLeft;
        const MemberName Key = vornjsondb::NameOf(it);
        const vornjsondb::TypedMember* pMember = Types.Find(Key);
        VORN_FAIL_IF_TEXT(pMember == nullptr, "!jType.isMember(strKey)");
        const Json::Value* pjValue = RecordCursor.Find(Key);
        if (pjValue == nullptr) {
            continue;
        }
        const vornjsondb::MemberType& Type = *pMember->pType;
        if (Type.szSpecifier == nullptr) {
            VORN_LOG_LOCATED("cannot support this type=%s", pMember->szTypeName);
            return -1;
        }
        try {
            VORN_FAIL_IF(Text.HoldsConversion());
            Text.Format(Type, *pjValue);
        } catch (const Json::Exception&) {
            VORN_LOG_LOCATED("type failed, strKey=%s, jRecParam=%s", Key.pBegin,
                             vornjsondb::ToString(jRec).c_str());
            return -1;
        }
        Text.Append(nLeft > 0 ? "," : ") ");
    }
    strSql.swap(Text.Text());
    return 0;
}
