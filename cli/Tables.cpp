#include "Tables.h"

#include <algorithm>

#include "../table/Affinity.h"
#include "../table/RealTable.h"
#include "JsonCells.h"
#include "Sql.h"

namespace VORN_JSON_DB::Cli {

bool SameName(const std::string& strLeft, const std::string& strRight) {
    return sqlite3_stricmp(strLeft.c_str(), strRight.c_str()) == 0;
}

bool HasName(const std::vector<std::string>& vecNames, const std::string& strName) {
    return std::any_of(vecNames.begin(), vecNames.end(),
                       [&](const std::string& strEach) { return SameName(strEach, strName); });
}

std::vector<std::string> TableNames(sqlite3* pDb) {
    return Texts(pDb,
                 "SELECT name FROM sqlite_master WHERE type = 'table' AND name NOT LIKE "
                 "'sqlite\\_%' ESCAPE '\\' AND name <> 'vornjsondb_definition' ORDER BY name");
}

bool TableExists(sqlite3* pDb, const std::string& strTable) {
    return HasName(Texts(pDb, kTablesAndViews), strTable);
}

void FailNoTable(const Context& Call, sqlite3* pDb) {
    Fail(kExitNotFound,
         Call.Db() + ": there is no table \"" + Call.TableName() + "\"" +
             NearestHint(Call.TableName(), Texts(pDb, kTablesAndViews), "; see vornjsondb tables"));
}

void CheckNewName(const std::string& strTable) {
    if (strTable.empty()) {
        Fail(kExitUsage, "the name of the new table is empty; give it one");
    }
    if (!IsUtf8(strTable)) {
        Fail(kExitUsage, "\"" + strTable + "\": the name is no UTF-8; take another");
    }
    if (sqlite3_strnicmp(strTable.c_str(), "sqlite_", 7) == 0) {
        Fail(kExitUsage,
             "\"" + strTable + "\": names that begin with sqlite_ are SQLite's own; take another");
    }
    if (SameName(strTable, "vornjsondb_definition")) {
        Fail(kExitUsage, "\"" + strTable + "\": definitions are kept there; take another name");
    }
}

void CheckFree(const Context& Call, sqlite3* pDb, const std::string& strTable,
               const char* szRemedy) {
    if (TableExists(pDb, strTable)) {
        Fail(kExitDuplicate,
             Call.Db() + ": there is a table \"" + strTable + "\" already; " + szRemedy);
    }
    const std::vector<std::string> vecOf = Texts(
        pDb, "SELECT tbl_name FROM sqlite_master WHERE type = 'index' AND name = ?1 COLLATE NOCASE",
        strTable);
    if (!vecOf.empty()) {
        Fail(kExitDuplicate, Call.Db() + ": an index of table \"" + vecOf[0] +
                                 "\" has the name \"" + strTable +
                                 "\"; give the new table another name, or drop the index first");
    }
}

std::vector<std::string> NumberColumns(sqlite3* pDb, const std::string& strTable) {
    using vornjsondb::Affinity;
    vornjsondb::RealTable Real;
    if (vornjsondb::ReadRealTable(pDb, strTable, Real) != SQLITE_OK) {
        FailBySqlite(pDb);
    }
    std::vector<std::string> vecNames;
    for (const vornjsondb::RealColumn& Column : Real.vecColumns) {
        const Affinity eAffinity = vornjsondb::AffinityOf(Column.strType);
        if (eAffinity != Affinity::kNone && eAffinity != Affinity::kText) {
            vecNames.push_back(Column.strName);
        }
    }
    return vecNames;
}

std::string NumberColumnText(const std::string& strColumn, std::string_view strText) {
    return "member \"" + strColumn + "\": its column would turn the text \"" +
           std::string(strText) + "\" into a number: give a number, or make the column TEXT";
}

std::string RoundedText(const std::string& strColumn) {
    return "member \"" + strColumn +
           "\": with a point or an exponent a whole number from 2^53 on may be rounded: give its "
           "digits alone";
}

}  // namespace VORN_JSON_DB::Cli
