#include "TableDefinition.h"

#include "../base/JsonMember.h"

namespace vornjsondb {

const Json::Value& DeclaredMembers(const Json::Value& jTableDef, const std::string& strName) {
    const Json::Value* pjTable = FindMember(jTableDef, strName);
    const Json::Value* pjMember = pjTable == nullptr ? nullptr : FindMember(*pjTable, "member");
    return pjMember != nullptr && pjMember->isObject() ? *pjMember : Json::Value::nullSingleton();
}

}  // namespace vornjsondb
