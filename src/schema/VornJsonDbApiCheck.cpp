// Whether a record's values fit the member types.

#include <VornJsonDbApi.h>

#include "../base/JsonText.h"
#include "../core/LogLine.h"
#include "TableTypes.h"

int VornJsonDbApi::checkJsonType(Json::Value& jParam) {
    const Json::Value& jType = VORN_JSON_DB::recType(m_jTableDef, m_strName);
    VORN_FAIL_IF_TEXT(!jParam.isObject(), "!jRecParam.isObject()");
    vornjsondb::TypeCursor Types(vornjsondb::TableTypes::Of(jType));
    const Json::Value::const_iterator itEnd = jParam.end();
    for (Json::Value::const_iterator it = jParam.begin(); it != itEnd; ++it) {
        const vornjsondb::MemberName Key = vornjsondb::NameOf(it);
        const vornjsondb::TypedMember* pMember = Types.Find(Key);
        if (pMember == nullptr) {
            continue;
        }
        const auto pfnFits = pMember->pType->pfnFits;
        if (pfnFits == nullptr) {
            VORN_LOG_LOCATED("type not found!!, key=%s", Key.pBegin);
            return -1;
        }
        if (!pfnFits(*it)) {
            VORN_LOG_LOCATED("type failed, strKey=%s, jRecParam=%s", Key.pBegin,
                             vornjsondb::ToString(jParam).c_str());
            return -1;
        }
    }
    return 0;
}
