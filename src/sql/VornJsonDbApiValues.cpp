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

std::vector<vornjsondb::DeclaredValue> vornjsondb::DeclaredValues(const Json::Value& jMember,
                                                                  const Json::Value& jRec) {
    MemberCursor Record(jRec);
    std::vector<DeclaredValue> vecValues;
    vecValues.reserve(jMember.size());
    const Json::Value::const_iterator itEnd = jMember.end();
    for (Json::Value::const_iterator it = jMember.begin(); it != itEnd; ++it) {
        const MemberName Name = NameOf(it);
        vecValues.push_back({Name, Record.Find(Name)});
    }
    return vecValues;
}

void vornjsondb::AppendDeclaredNames(const Json::Value& jMember, std::string& strSql) {
    const Json::Value::const_iterator itBegin = jMember.begin();
    const Json::Value::const_iterator itEnd = jMember.end();
    for (Json::Value::const_iterator it = itBegin; it != itEnd; ++it) {
        const MemberName Name = NameOf(it);
        strSql.append(",", it != itBegin ? 1 : 0).append(Name.pBegin, Name.Length());
    }
}

void vornjsondb::AppendMemberNames(const std::vector<DeclaredValue>& vecValues,
                                   std::string& strSql) {
    for (const DeclaredValue& Each : vecValues) {
        if (Each.pjValue == nullptr) {
            continue;
        }
        strSql.append(Each.Name.pBegin, Each.Name.Length());
        if (&Each != &vecValues.back()) {
            strSql += ',';
        }
    }
}

int vornjsondb::AppendMemberValues(const HandleParts& Handle,
                                   const std::vector<DeclaredValue>& vecValues,
                                   const Json::Value& jRec, std::string& strSql) {
    TypeCursor Types(Handle.LookUp().Types());
    AccumulatedFormat Text(strSql);
    for (const DeclaredValue& Each : vecValues) {
        const TypedMember* pMember = Types.Find(Each.Name);
        VORN_FAIL_IF_TEXT(pMember == nullptr, "!jType.isMember(strKey)");
        if (Each.pjValue == nullptr) {
            continue;
        }
        if (pMember->pType->pfnAppend == nullptr) {
            VORN_LOG_LOCATED("cannot support this type=%s", pMember->szTypeName);
            return -1;
        }
        try {
            VORN_FAIL_IF(Text.HoldsConversion());
            Text.Format(*pMember->pType, *Each.pjValue);
        } catch (const Json::Exception&) {
            VORN_LOG_LOCATED("type failed, strKey=%s, jRecParam=%s", Each.Name.pBegin,
                             ToString(jRec).c_str());
            return -1;
        }
        Text.Append(&Each != &vecValues.back() ? "," : ") ");
    }
    strSql.swap(Text.Text());
    return 0;
}

int VornJsonDbApi::SqlExpandMemberName(std::string& strSql, Json::Value* pjRec) {
    const Json::Value& jMember = vornjsondb::DeclaredMembers(m_jTableDef, m_strName);
    if (pjRec == nullptr) {
        vornjsondb::AppendDeclaredNames(jMember, strSql);
    } else {
        vornjsondb::AppendMemberNames(vornjsondb::DeclaredValues(jMember, *pjRec), strSql);
    }
    return 0;
}

int VornJsonDbApi::SqlExpandMemberSymbol(std::string& strSql, Json::Value& jRec) {
    const vornjsondb::HandleParts Handle{m_pDb, m_strName, m_jTableDef, m_strSqlError};
    return vornjsondb::AppendMemberValues(
        Handle, vornjsondb::DeclaredValues(Handle.Declared(), jRec), jRec, strSql);
}
