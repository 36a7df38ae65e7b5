// Rows into records.

#include "VornJsonDbApiRows.h"

#include <VornJsonDbApi.h>

#include <exception>
#include <utility>

#include "../schema/KnownTables.h"
#include "LogLine.h"
#include "VornJsonDbApiRunner.h"

namespace {

using vornjsondb::MakeMember;
using vornjsondb::RowTemplate;
using vornjsondb::TableTypes;
using vornjsondb::TypedMember;

// One column into the member of the same name. A NULL column leaves the member out.
int DbCallBackFillField(Json::Value& jRec, const TableTypes& Types, const char* szName,
                        const char* szText) {
    const vornjsondb::MemberName Name = vornjsondb::NameOf(szName);
    const TypedMember* pMember = Types.Find(Name);
    VORN_FAIL_IF_TEXT(pMember == nullptr, "!jType.isMember(strName)");
    if (szText == nullptr) {
        return 0;
    }
    if (pMember->pType->pfnRead == nullptr) {
        VORN_LOG_LOCATED("type error, strType=%s", pMember->szTypeName);
        return -1;
    }
    pMember->pType->pfnRead(szText, MakeMember(jRec, Name));
    return 0;
}

// Goes through the row column by column, so that a failure is reported where it lies.
int FillColumns(Json::Value& jRec, const TableTypes& Types, int n_column, char** column_value,
                char** column_name) {
    for (int i = 0; i < n_column; ++i) {
        int iTmp = -1;
        if (NULL == column_name[i]) {
            VORN_LOG_CONDITION("NULL == column_name[i]");
        } else {
            iTmp = DbCallBackFillField(jRec, Types, column_name[i], column_value[i]);
            if (0 > iTmp) {
                VORN_LOG_CONDITION(
                    "0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))");
            }
        }
        if (0 <= iTmp) {
            continue;
        }
        // The first column fails without these two lines, and log readers go by that.
        // Pinned by RowsTest.TypeWithoutAConversionAtTheFirstColumnLogsOnlyItsConditions.
        if (i > 0) {
            const char* szName = column_name[i];
            const char* szText = column_value[i];
            VORN_LOG_PLAIN("column_name[%d]=%s", i, szName);
            VORN_LOG_PLAIN("column_value[%d]=%s", i, szText);
        }
        return -1;
    }
    return 0;
}

// What becomes of a row's record.
using Keep = void (*)(Json::Value& jOut, Json::Value&& jRec);

// One row into a record; jOut stays as it is when the row fails.
int DbCallBackFillRec(Keep pfnKeep, Json::Value& jOut, int n_column, char** column_value,
                      char** column_name) {
    VORN_FAIL_IF(NULL == column_name || NULL == column_value);
    if (n_column < 1) {
        pfnKeep(jOut, Json::Value(Json::objectValue));
        return 0;
    }
    VORN_FAIL_IF_TEXT(NULL == column_name[0], "NULL == column_name[i]");
    // Known without a definition: the operation that runs the statement has looked the table up
    // with its own before.
    vornjsondb::KnownTable& Table =
        vornjsondb::LookUpTable(Json::Value::nullSingleton(), g_strCurTable);
    const RowTemplate* pTemplate = Table.TemplateFor(n_column, column_name);
    if (pTemplate != nullptr) {
        pfnKeep(jOut, pTemplate->Record(column_value));
        return 0;
    }
    Json::Value jRec(Json::objectValue);
    if (0 > FillColumns(jRec, Table.Types(), n_column, column_value, column_name)) {
        return -1;
    }
    pfnKeep(jOut, std::move(jRec));
    return 0;
}

// The same for SQLite, through whose frames no exception must pass.
int DbCallBackFill(Keep pfnKeep, Json::Value& jOut, int n_column, char** column_value,
                   char** column_name) try {
    VORN_FAIL_IF_TEXT(0 > DbCallBackFillRec(pfnKeep, jOut, n_column, column_value, column_name),
                      "0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)");
    return 0;
} catch (const std::exception&) {
    VORN_LOG_CONDITION("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)");
    return -1;
}

void AppendToArray(Json::Value& jArray, Json::Value&& jRec) {
    jArray.append(std::move(jRec));
}

void KeepFirst(Json::Value& jFirst, Json::Value&& jRec) {
    if (jFirst.isNull()) {
        jFirst.swapPayload(jRec);
    }
}

}  // namespace

int DbCallBackFillList(void* pArg, int n_column, char** column_value, char** column_name) {
    Json::Value* pjRecArray = static_cast<Json::Value*>(pArg);
    VORN_FAIL_IF(!pjRecArray);
    VORN_FAIL_IF(pjRecArray->type() != Json::arrayValue && pjRecArray->type() != Json::nullValue);
    return DbCallBackFill(AppendToArray, *pjRecArray, n_column, column_value, column_name);
}

int DbCallBackFillFirst(void* pArg, int n_column, char** column_value, char** column_name) {
    return DbCallBackFill(KeepFirst, *static_cast<Json::Value*>(pArg), n_column, column_value,
                          column_name);
}
