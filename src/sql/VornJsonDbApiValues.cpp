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
    for (MemberWalk Walk(jMember); !Walk.IsDone(); Walk.Next()) {
        const MemberName Name = Walk.Name();
        vecValues.push_back({Name, Record.Find(Name)});
    }
    return vecValues;
}

void vornjsondb::AppendDeclaredNames(const Json::Value& jMember, TextBuffer& Sql) {
    for (MemberWalk Walk(jMember); !Walk.IsDone(); Walk.Next()) {
        Sql.Append(Walk.Name().View());
        if (!Walk.IsLast()) {
            Sql.Append(',');
        }
    }
}

void vornjsondb::AppendMemberNames(const std::vector<DeclaredValue>& vecValues, TextBuffer& Sql) {
    for (const DeclaredValue& Each : vecValues) {
        if (Each.pjValue == nullptr) {
            continue;
        }
        Sql.Append(Each.Name.View());
        if (&Each != &vecValues.back()) {
            Sql.Append(',');
        }
    }
}

int vornjsondb::AppendMemberValues(const HandleParts& Handle,
                                   const std::vector<DeclaredValue>& vecValues,
                                   const Json::Value& jRec, TextBuffer& Sql) {
    TypeCursor Types(Handle.LookUp().Types());
    AccumulatedFormat Text(Sql.View());
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
    Sql.Take(Text.Text());
    return 0;
}

int VornJsonDbApi::SqlExpandMemberName(std::string& strSql, Json::Value* pjRec) {
    const Json::Value& jMember = vornjsondb::DeclaredMembers(m_jTableDef, m_strName);
    vornjsondb::TextBuffer Names;
    if (pjRec == nullptr) {
        vornjsondb::AppendDeclaredNames(jMember, Names);
    } else {
        vornjsondb::AppendMemberNames(vornjsondb::DeclaredValues(jMember, *pjRec), Names);
    }
    strSql.append(Names.View());
    return 0;
}

int VornJsonDbApi::SqlExpandMemberSymbol(std::string& strSql, Json::Value& jRec) {
    const vornjsondb::HandleParts Handle{m_pDb, m_strName, m_jTableDef, m_strSqlError};
    vornjsondb::TextBuffer Sql;
    Sql.Append(strSql);
    const int nResult = vornjsondb::AppendMemberValues(
        Handle, vornjsondb::DeclaredValues(Handle.Declared(), jRec), jRec, Sql);
    strSql.assign(Sql.View());
    return nResult;
}
