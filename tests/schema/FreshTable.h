// Handles on fresh tables, and the log lines that several operations share.
#ifndef VORNJSONDB_TESTS_SCHEMA_FRESHTABLE_H
#define VORNJSONDB_TESTS_SCHEMA_FRESHTABLE_H

#include <VornJsonDbApi.h>

#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "../support/TestHost.h"

namespace testhost {

using Lines = std::vector<std::string>;

// A test that works through one handle (or several) on tables of the in-memory database.
class FreshTableTest : public DbTest {
  protected:
    // One untyped column per member.
    VornJsonDbApi& Open(const std::string& strMembers) {
        std::string strColumns;
        std::istringstream stream(strMembers);
        for (std::string strOne; std::getline(stream, strOne, ',');) {
            strColumns += (strColumns.empty() ? "" : ",") + strOne.substr(0, strOne.find(':'));
        }
        return Open(strMembers, strColumns);
    }

    VornJsonDbApi& Open(const std::string& strMembers, const std::string& strColumns) {
        const std::string strTable = UniqueTable();
        return OpenAs(strTable, Definition(strTable, strMembers), strColumns);
    }

    // jMembers is the "member" object itself, for definitions with defaults.
    VornJsonDbApi& OpenMembers(const Json::Value& jMembers, const std::string& strColumns) {
        const std::string strTable = UniqueTable();
        Json::Value jDef(Json::objectValue);
        jDef[strTable]["member"] = jMembers;
        return OpenAs(strTable, jDef, strColumns);
    }

    VornJsonDbApi& OpenAs(const std::string& strTable, const Json::Value& jDef,
                          const std::string& strColumns) {
        m_strTable = strTable;
        TakeSql();
        const std::string strCreate =
            "create table if not exists " + strTable + " (" + strColumns + ");";
        m_vecHandles.push_back(NewHandle(m_pDb, strTable, jDef, strCreate));
        EXPECT_EQ(Lines{}, TakeLog());
        EXPECT_EQ(Lines{strCreate}, TakeSql());
        return *m_vecHandles.back();
    }

    // Leaves "no such column: stale" as the error text of the handle and drops its traces.
    void MakeStaleError(VornJsonDbApi& api) {
        EXPECT_EQ(-1, api.runSqlEx("select stale;"));
        TakeLog();
        TakeSql();
    }

    // Leaves a uniqueness refusal as the error text of the handle; takes a table whose key is id.
    void MakeStaleDuplicate(VornJsonDbApi& api) {
        const std::string strInsert = "insert into " + m_strTable + " (id) values (77);";
        EXPECT_EQ(1, api.runSqlEx(strInsert));
        EXPECT_EQ(-1, api.runSqlEx(strInsert));
        Sql("delete from " + m_strTable + " where id = 77;");
        TakeLog();
        TakeSql();
    }

    void CloseAll() { m_vecHandles.clear(); }

    std::string Count() { return Rows("select count(*) from " + m_strTable + ";"); }

    std::string m_strTable;

  private:
    std::vector<std::unique_ptr<VornJsonDbApi>> m_vecHandles;
};

// While it lives, SQLite finds no memory for a text of more than about 64 KiB.
class ScarceMemory {
  public:
    explicit ScarceMemory(int nLeft = 64 * 1024) {
        sqlite3_hard_heap_limit64(sqlite3_memory_used() + nLeft);
    }
    ~ScarceMemory() {
        sqlite3_hard_heap_limit64(0);
        sqlite3_soft_heap_limit64(0);
    }
    ScarceMemory(const ScarceMemory&) = delete;
    ScarceMemory& operator=(const ScarceMemory&) = delete;
};

inline std::string RunFailed(const std::string& strError, const std::string& strSql) {
    return Plain("i=0,errno=0, run sql failed, error=" + strError + ", sql=" + strSql);
}

inline std::string SqlError(const std::string& strError, const std::string& strSql) {
    return Plain("sql error, err=" + strError + ", sql=" + strSql);
}

// True for one long condition check of the class, whatever its condition.
inline bool IsCheck(const std::string& strLine) {
    const std::string strHead = "class located: Failed [";
    const std::string strTail = "], err=%m";
    return strLine.size() > strHead.size() + strTail.size() &&
           strLine.compare(0, strHead.size(), strHead) == 0 &&
           strLine.compare(strLine.size() - strTail.size(), strTail.size(), strTail) == 0;
}

// Lines with the first one replaced by "check" when it is some condition check: for a refusal whose
// condition text is nobody's promise.
inline Lines WithFirstCheckNamed(Lines vecLines) {
    if (!vecLines.empty() && IsCheck(vecLines.front())) {
        vecLines.front() = "check";
    }
    return vecLines;
}

// One MiB.
inline std::string LongText() {
    return std::string(1024 * 1024, 'x');
}

}  // namespace testhost

#endif
