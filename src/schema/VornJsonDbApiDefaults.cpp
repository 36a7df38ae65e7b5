// Members that a record lacks.

#include "VornJsonDbApiDefaults.h"

#include <VornJsonDbApi.h>

#include "../base/JsonMemory.h"
#include "../base/JsonText.h"
#include "../core/LogLine.h"
#include "KnownTables.h"

namespace vornjsondb {

bool LacksDefaults(const TableTypes& Types, const Json::Value& jRec) {
    MemberCursor Record(jRec);
    for (const TypedMember& Member : Types.Members()) {
        // mutate(true, && to ||): a copy that is not needed changes nothing.
        if (Member.pjDefault != nullptr && Record.Find(Member.Name) == nullptr) {
            return true;
        }
    }
    return false;  // mutate(false to true): the same.
}

void FillDefaults(const TableTypes& Types, Json::Value& jRec) {
    MemberCursor Record(jRec);
    for (const TypedMember& Member : Types.Members()) {
        if (Member.pjDefault != nullptr && Record.Find(Member.Name) == nullptr) {
            MakeMember(jRec, Member.Name) = *Member.pjDefault;
        }
    }
}

}  // namespace vornjsondb

namespace {

int CheckComplete(const vornjsondb::TableTypes& Types, const Json::Value& jParam) {
    vornjsondb::MemberCursor Record(jParam);
    for (const vornjsondb::TypedMember& Member : Types.Members()) {
        if (Record.Find(Member.Name) == nullptr) {
            VORN_LOG_LOCATED("lost data member=%s", Member.Name.pBegin);
            VORN_LOG_DEBUG("jParam=%s", vornjsondb::ToString(jParam).c_str());
            return -1;
        }
    }
    return 0;
}

}  // namespace

int VornJsonDbApi::fillDefaultValue(Json::Value& jParam, bool blStrict) try {
    const vornjsondb::TableTypes& Types = vornjsondb::LookUpTable(m_jTableDef, m_strName).Types();
    if (blStrict) {
        return CheckComplete(Types, jParam);
    }
    // A value of another kind is left for the type check to refuse.
    if (jParam.isObject() || jParam.type() == Json::nullValue) {
        vornjsondb::FillDefaults(Types, jParam);
    }
    return 0;
}
VORN_JSON_MEMORY_TO_BAD_ALLOC
