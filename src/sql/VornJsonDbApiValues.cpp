// The two lists of an INSERT.

#include "VornJsonDbApiValues.h"

#include <VornJsonDbApi.h>

#include "../base/JsonText.h"
#include "../core/LogLine.h"
#include "../schema/TableDefinition.h"
#include "AccumulatedFormat.h"

// In both lists the separator is decided by the member's place in the definition, not by what the
// record holds: a record that lacks the last declared member gets an unfinished statement, and
// SQLite refuses it. Hosts rely on such records being refused.
// Pinned by Names.MissingLastMemberLeavesATrailingComma.

int vornjsondb::AppendMemberNames(const Json::Value& jMember, const Json::Value* pjRec,
                                  std::string& strSql) {
    MemberCursor RecordCursor(pjRec != nullptr ? *pjRec : Json::Value::nullSingleton());
    Json::ArrayIndex nLeft = jMember.size();
    const Json::Value::const_iterator itEnd = jMember.end();
    for (Json::Value::const_iterator it = jMember.begin(); it != itEnd; ++it) {
        --nLeft;
        const MemberName Key = NameOf(it);
        if (pjRec != nullptr && RecordCursor.Find(Key) == nullptr) {
            continue;
        }
        strSql.append(Key.pBegin, Key.Length());
        if (nLeft > 0) {
            strSql += ',';
        }
    }
    return 0;
}

int vornjsondb::AppendMemberValues(const HandleParts& Handle, const Json::Value& jMember,
                                   const Json::Value& jRec, std::string& strSql) {
    TypeCursor Types(Handle.LookUp().Types());
    AccumulatedFormat Text(strSql);
    MemberCursor RecordCursor(jRec);
    Json::ArrayIndex nLeft = jMember.size();
    const Json::Value::const_iterator itEnd = jMember.end();
    for (Json::Value::const_iterator it = jMember.begin(); it != itEnd; ++it) {
        --nLeft;
        const MemberName Key = NameOf(it);
        const TypedMember* pMember = Types.Find(Key);
        VORN_FAIL_IF_TEXT(pMember == nullptr, "!jType.isMember(strKey)");
        const Json::Value* pjValue = RecordCursor.Find(Key);
        if (pjValue == nullptr) {
            continue;
        }
        if (pMember->pType->pfnAppend == nullptr) {
            VORN_LOG_LOCATED("cannot support this type=%s", pMember->szTypeName);
            return -1;
        }
        try {
            VORN_FAIL_IF(Text.HoldsConversion());
            Text.Format(*pMember->pType, *pjValue);
        } catch (const Json::Exception&) {
            VORN_LOG_LOCATED("type failed, strKey=%s, jRecParam=%s", Key.pBegin,
                             ToString(jRec).c_str());
            return -1;
        }
        Text.Append(nLeft > 0 ? "," : ") ");
    }
    strSql.swap(Text.Text());
    return 0;
}

int VornJsonDbApi::SqlExpandMemberName(std::string& strSql, Json::Value* pjRec) {
    return vornjsondb::AppendMemberNames(vornjsondb::DeclaredMembers(m_jTableDef, m_strName), pjRec,
                                         strSql);
}

int VornJsonDbApi::SqlExpandMemberSymbol(std::string& strSql, Json::Value& jRec) {
    const vornjsondb::HandleParts Handle{m_pDb, m_strName, m_jTableDef, m_strSqlError};
    return vornjsondb::AppendMemberValues(Handle, Handle.Declared(), jRec, strSql);
}
