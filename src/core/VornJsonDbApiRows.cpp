// Rows into records.

#include "VornJsonDbApiRows.h"

#include <VornJsonDbApi.h>

#include <exception>
#include <utility>

#include "../base/JsonMember.h"
#include "../schema/MemberType.h"
#include "CurrentTable.h"
#include "LogLine.h"
#include "RowTemplate.h"

namespace {

using vornjsondb::FindMember;
using vornjsondb::MemberType;
using vornjsondb::RowTemplate;

// One column into the member of the same name. A NULL column leaves the member out.
int DbCallBackFillField(Json::Value& jRec, const Json::Value& jType, const char* szName,
                        const char* szText) {
    const Json::Value* pjDefinition = FindMember(jType, szName);
    VORN_FAIL_IF_TEXT(pjDefinition == nullptr, "!jType.isMember(strName)");
    if (szText == nullptr) {
        return 0;
    }
    const MemberType& Type = vornjsondb::TypeOfMember(*pjDefinition);
    if (!vornjsondb::ReadColumn(Type, szText, jRec[szName])) {
        VORN_LOG_LOCATED("type error, strType=%s", vornjsondb::TypeName(*pjDefinition));
        return -1;
    }
    return 0;
}

// The member types come from the cache alone: the operation that runs the statement has looked
// them up with the table's definition before.
const Json::Value& CurrentMemberTypes() {
    static Json::Value& jNoDefinition = *new Json::Value;
    return VORN_JSON_DB::recType(jNoDefinition, g_strCurTable);
}

// Goes through the row column by column, so that a failure is reported where it lies.
int FillColumns(Json::Value& jRec, const Json::Value& jType, int n_column, char** column_value,
                char** column_name) {
    for (int i = 0; i < n_column; ++i) {
        int iTmp = -1;
        if (NULL == column_name[i]) {
            VORN_LOG_CONDITION("NULL == column_name[i]");
        } else {
            iTmp = DbCallBackFillField(jRec, jType, column_name[i], column_value[i]);
            if (0 > iTmp) {
                VORN_LOG_CONDITION(
                    "0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))");
            }
        }
        if (0 <= iTmp) {
            continue;
        }
        // The first column fails without these two lines: what reads the log tells by their
        // absence. Pinned by RowsTest.TypeWithoutAConversionAtTheFirstColumnLogsOnlyItsConditions.
        if (i > 0) {
            VORN_LOG_PLAIN("column_name[%d]=%s", i, column_name[i]);
            VORN_LOG_PLAIN("column_value[%d]=%s", i, column_value[i]);
        }
        return -1;
    }
    return 0;
}

int DbCallBackFillRec(Json::Value* pjRec, int n_column, char** column_value, char** column_name) {
    VORN_FAIL_IF(NULL == column_name || NULL == column_value);
    if (n_column < 1) {
        *pjRec = Json::Value(Json::objectValue);
        return 0;
    }
    VORN_FAIL_IF_TEXT(NULL == column_name[0], "NULL == column_name[i]");
    const RowTemplate* pTemplate = RowTemplate::Find(g_strCurTable, n_column, column_name);
    const Json::Value& jType = pTemplate != nullptr ? pTemplate->Types() : CurrentMemberTypes();
    if (pTemplate == nullptr) {
        pTemplate = RowTemplate::Make(g_strCurTable, jType, n_column, column_name);
    }
    if (pTemplate != nullptr && pTemplate->Fill(column_value, *pjRec)) {
        return 0;
    }
    *pjRec = Json::Value(Json::objectValue);
    return FillColumns(*pjRec, jType, n_column, column_value, column_name);
}

}  // namespace

int DbCallBackFillList(void* pArg, int n_column, char** column_value, char** column_name) try {
    Json::Value* pjRecArray = static_cast<Json::Value*>(pArg);
    VORN_FAIL_IF(!pjRecArray);
    VORN_FAIL_IF(pjRecArray->type() != Json::arrayValue && pjRecArray->type() != Json::nullValue);
    Json::Value jTmp;
    VORN_FAIL_IF(0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name));
    pjRecArray->append(std::move(jTmp));
    return 0;
} catch (const std::exception&) {
    VORN_LOG_CONDITION("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)");
    return -1;
}
