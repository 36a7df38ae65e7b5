// The fixture: a database in memory, a process that knows no table, and one handle on the table t.
#ifndef VORNJSONDB_TESTS_SUPPORT_TABLETEST_H
#define VORNJSONDB_TESTS_SUPPORT_TABLETEST_H

#include <memory>

#include "TestHost.h"

namespace testhost {

// What OpenItem makes.
inline constexpr char kItem[] = "id:int,name:string";
inline constexpr char kCreateItem[] = "CREATE TABLE t (id INTEGER PRIMARY KEY, name TEXT)";

class TableTest : public ::testing::Test {
  protected:
    void SetUp() override;
    void TearDown() override;

    // Each opens m_pHandle on a new table t, in a process that knows no table. SetUp opens an item.
    void OpenItem();
    void Open(const std::string& strMembers);  // with an untyped column for each member
    void Open(const std::string& strMembers, const std::string& strColumns);
    void OpenMembers(const Json::Value& jMembers, const std::string& strColumns);
    void OpenMembers(const char* szMembers, const std::string& strColumns) {
        OpenMembers(ParseJson(szMembers), strColumns);
    }
    void OpenDefinition(const Json::Value& jDefinition, const std::string& strSqlCreate);

    void Sql(const std::string& strSql) const;          // must succeed
    std::string Rows(const std::string& strSql) const;  // "a|b\nc|d", NULL as "NULL"
    std::string Count() const { return Rows("SELECT count(*) FROM t"); }
    std::string All() const { return Rows("SELECT * FROM t ORDER BY rowid"); }

    // All rows as the handle lists them, without a word.
    Json::Value Listed();

    // Leaves "no such column: stale" as the handle's error text.
    void MakeStaleError();

    // Leaves a refused key as the handle's error text; takes a table whose key is id.
    void MakeStaleDuplicate();

    // The member types of m_pHandle as one line of JSON, for definitions of types and defaults.
    std::string Types() const { return Compact(m_jDefinition["t"]["member"]); }

    sqlite3* m_pDb = nullptr;
    Json::Value m_jDefinition;  // of m_pHandle
    std::unique_ptr<VornJsonDbApi> m_pHandle;
};

// {"m": what the text holds}.
inline Json::Value RecordOf(const char* szJson) {
    Json::Value jRec(Json::objectValue);
    jRec["m"] = ParseJson(szJson);
    return jRec;
}

// A handle's last SQL error. It has no accessor; a refused query shows it in its log lines, and
// runs no statement.
std::string SqlErrorOf(VornJsonDbApi& handle);

// ---- lines and texts that several operations share ----------------------------------------------
inline constexpr char kFieldFailed[] =
    "0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))";
inline constexpr char kRowFailed[] =
    "0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)";
inline constexpr char kListFailed[] = "0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)";
inline constexpr char kSaveFailed[] = "0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)";
inline constexpr char kMatchFailed[] =
    "0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)";
inline constexpr char kQuoteText[] =
    R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))";
inline constexpr char kQuoteListText[] =
    R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].asString().c_str())))";
inline constexpr char kDuplicate[] = "DUPLICATE_PRIMARY_KEY";

std::string RunFailed(const std::string& strError, const std::string& strSql, int nErrno = 0,
                      size_t nAttempts = 0);
std::string SqlError(const std::string& strError, const std::string& strSql);

// A row callback: counts in the int at pArg.
int CountRows(void* pArg, int nColumns, char** pszValues, char** pszNames);

Lines Joined(Lines vecFirst, const Lines& vecSecond);

// One MiB.
std::string LongText();

// 512 member definitions of the type "int" under names in key order.
Json::Value ManyMembers();

// While it lives, SQLite finds no memory for more than about so many bytes.
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

}  // namespace testhost

#endif  // VORNJSONDB_TESTS_SUPPORT_TABLETEST_H
