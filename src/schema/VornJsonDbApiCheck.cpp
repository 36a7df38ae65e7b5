// Whether a record's values fit the member types.

#include <VornJsonDbApi.h>

#include "../base/JsonText.h"
#include "../core/LogLine.h"
#include "KnownTables.h"

int VornJsonDbApi::checkJsonType(Json::Value& jParam) {
    vornjsondb::TypeCursor Types(vornjsondb::LookUpTable(m_jTableDef, m_strName).Types());
    // mutate(exchanged statements): what is no object has no members to go through.
    VORN_FAIL_IF_TEXT(!jParam.isObject(), "!jRecParam.isObject()");
    for (vornjsondb::MemberWalk Walk(jParam); !Walk.IsDone(); Walk.Next()) {
        const vornjsondb::MemberName Key = Walk.Name();
        const vornjsondb::TypedMember* pMember = Types.Find(Key);
        if (pMember == nullptr) {
            continue;
        }
        const auto pfnFits = pMember->pType->pfnFits;
        if (pfnFits == nullptr) {
            VORN_LOG_LOCATED("type not found!!, key=%s", Key.pBegin);
            return -1;
        }
        if (!pfnFits(Walk.Value())) {
            VORN_LOG_LOCATED("type failed, strKey=%s, jRecParam=%s", Key.pBegin,
                             vornjsondb::ToString(jParam).c_str());
            return -1;
        }
    }
    return 0;
}
