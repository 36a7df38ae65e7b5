#include "Definitions.h"

#include <algorithm>
#include <cstring>
#include <vector>

#include "JsonCells.h"
#include "JsonFile.h"
#include "Sql.h"
#include "Tables.h"

namespace VORN_JSON_DB::Cli {

namespace {

const char kKeptTable[] = "vornjsondb_definition";

// Members without a column go; columns that are no member come, but those that can be none.
void GoByColumns(const Json::Value& jColumns, Json::Value& jTable) {
    const std::vector<std::string> vecColumns = jColumns.getMemberNames();
    const std::vector<std::string> vecMembers = jTable["member"].getMemberNames();
    for (const std::string& strMember : vecMembers) {
        if (!HasName(vecColumns, strMember)) {
            jTable["member"].removeMember(strMember);
        }
    }
    for (const std::string& strColumn : vecColumns) {
        if (!HasName(vecMembers, strColumn) && strColumn.compare(0, 1, "$") != 0) {
            jTable["member"][strColumn] = jColumns[strColumn];
        }
    }
    // Without all of its members there is none; that of the real table counts.
    const Json::Value jKey = jTable.get("key", Json::Value());
    const auto fnGone = [&jTable](const Json::Value& jName) {
        return jName.isString() && !jTable["member"].isMember(jName.asString());
    };
    if (fnGone(jKey) || (jKey.isArray() && std::any_of(jKey.begin(), jKey.end(), fnGone))) {
        jTable.removeMember("key");
    }
}

Json::Value ParseKept(const Context& Call, const std::string& strTable,
                      const std::string& strText) {
    try {
        return ParseJson(strText, Call.Db() + ": the kept definition of \"" + strTable + "\"");
    } catch (Error& Failed) {
        Failed.strLine += "; give one by --def FILE, which vornjsondb sync keeps in its place";
        throw;
    }
}

}  // namespace

void CheckDefaults(const std::string& strTable, const Json::Value& jDefinition) {
    for (const Finding& Found : LintDefinition(strTable, jDefinition)) {
        if (std::strcmp(Found.szCode, "bad-default") == 0) {
            Fail(kExitBadData, "default of table \"" + strTable + "\": " + Found.strMessage +
                                   "; give one that the type can hold");
        }
    }
}

Json::Value KnownDefinition(const Context& Call, sqlite3* pDb, const std::string& strTable) {
    const std::string strFile = Call.Text("--def");
    if (!strFile.empty()) {
        Json::Value jDefinition = ParseJson(ReadFile(strFile), strFile);
        if (!jDefinition.isObject() || !jDefinition.isMember(strTable)) {
            Fail(kExitBadData, strFile + ": it holds no definition of \"" + strTable +
                                   "\"; it must be an object with that member");
        }
        return jDefinition;
    }
    // One that outlived its table says nothing about the next one of that name.
    if (!TableExists(pDb, kKeptTable) || !TableExists(pDb, strTable)) {
        return {};
    }
    const Statement pLook = Prepare(pDb,
                                    std::string("SELECT name, definition FROM ") + kKeptTable +
                                        " WHERE name = ?1 COLLATE NOCASE",
                                    strTable);
    if (!Step(pLook.get())) {
        return {};
    }
    const Json::Value jKept = ParseKept(Call, strTable, ColumnText(pLook.get(), 1));
    // To SQLite a table is the same in any letter case.
    const std::string strKept = ColumnText(pLook.get(), 0);
    Json::Value jDefinition;
    jDefinition[strTable] =
        jKept.isObject() && jKept.isMember(strKept) ? jKept[strKept] : Json::Value();
    return jDefinition;
}

Json::Value CurrentDefinition(const Context& Call, sqlite3* pDb, const std::string& strTable) {
    Json::Value jDefinition = KnownDefinition(Call, pDb, strTable);
    Json::Value jReal;
    const bool blKept = !jDefinition.isNull() && !Call.Has("--def") &&
                        jDefinition[strTable].isObject() &&
                        jDefinition[strTable]["member"].isObject();
    if (blKept && DefinitionOf(pDb, strTable, jReal).Ok()) {
        GoByColumns(jReal[strTable]["member"], jDefinition[strTable]);
    }
    return jDefinition;
}

std::vector<std::string> LeftOverDefinitions(sqlite3* pDb) {
    if (!TableExists(pDb, kKeptTable)) {
        return {};
    }
    return Texts(pDb, std::string("SELECT name FROM ") + kKeptTable + " k WHERE NOT EXISTS (" +
                          kTablesAndViews + " AND name = k.name COLLATE NOCASE) ORDER BY name");
}

void KeepDefinition(sqlite3* pDb, const std::string& strTable, const Json::Value& jDefinition) {
    Run(pDb, std::string("CREATE TABLE IF NOT EXISTS ") + kKeptTable +
                 " (name TEXT PRIMARY KEY NOT NULL, definition TEXT NOT NULL)");
    const Statement pDelete =
        Prepare(pDb, std::string("DELETE FROM ") + kKeptTable + " WHERE name = ?1 COLLATE NOCASE",
                strTable);
    const Statement pWrite =
        Prepare(pDb, std::string("INSERT INTO ") + kKeptTable + " VALUES (?1, ?2)", strTable);
    Json::Value jKept;
    jKept[strTable] = jDefinition[strTable];
    const std::string strText = CompactJson(jKept);
    sqlite3_bind_text(pWrite.get(), 2, strText.c_str(), -1, SQLITE_TRANSIENT);
    Step(pDelete.get());
    Step(pWrite.get());
}

}  // namespace VORN_JSON_DB::Cli
