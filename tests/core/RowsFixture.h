// A fixture for rows read back through a handle.
#ifndef VORNJSONDB_TESTS_CORE_ROWSFIXTURE_H
#define VORNJSONDB_TESTS_CORE_ROWSFIXTURE_H

#include <sstream>

#include "../support/TableFixture.h"

namespace testhost {

class RowsTest : public DbTest {
  protected:
    void TearDown() override {
        m_pHandle.reset();
        DbTest::TearDown();
    }

    // A handle on a fresh table whose columns have no type, so that SQLite keeps every text as it
    // is.
    void Open(const std::string& strMembers, const std::string& strMoreColumns = "") {
        m_strTable = UniqueTable();
        std::string strColumns;
        std::istringstream stream(strMembers);
        for (std::string strOne; std::getline(stream, strOne, ',');) {
            strColumns += (strColumns.empty() ? "" : ",") + strOne.substr(0, strOne.find(':'));
        }
        m_pHandle =
            NewHandle(m_pDb, m_strTable, Definition(m_strTable, strMembers),
                      "CREATE TABLE " + m_strTable + " (" + strColumns + strMoreColumns + ")");
        ASSERT_EQ(TakeLog(), std::vector<std::string>());
        TakeSql();
    }

    void Insert(const std::string& strValues) {
        Sql("INSERT INTO " + m_strTable + " VALUES " + strValues);
    }

    int List(Json::Value& jRows) {
        Json::Value jNoQuery;
        return m_pHandle->recList(jNoQuery, jRows);
    }

    // All rows; none of them may fail.
    Json::Value Listed() {
        Json::Value jRows(Json::arrayValue);
        EXPECT_EQ(List(jRows), 0);
        EXPECT_EQ(TakeLog(), std::vector<std::string>());
        return jRows;
    }

    // What a member of the given type reads from a stored text.
    Json::Value Read(const char* szType, const std::string& strText) {
        Open(std::string("a:") + szType);
        char* szSql = sqlite3_mprintf("(%Q)", strText.c_str());
        Insert(szSql);
        sqlite3_free(szSql);
        const Json::Value jRows = Listed();
        EXPECT_EQ(jRows.size(), 1U);
        EXPECT_TRUE(jRows[0].isMember("a")) << szType << ": " << strText;
        return jRows[0]["a"];
    }

    void ExpectRead(const char* szType, const std::string& strText, const Json::Value& jExpected) {
        const Json::Value jRead = Read(szType, strText);
        EXPECT_EQ(jRead, jExpected) << szType << ": " << strText;
        EXPECT_EQ(jRead.type(), jExpected.type()) << szType << ": " << strText;
    }

    // The lines of recList after the callback has stopped its statement.
    std::vector<std::string> StoppedList(std::vector<std::string> vecLines,
                                         const std::string& strColumns) {
        const std::string strError = sqlite3_errstr(SQLITE_ABORT);
        const std::string strSql = "SELECT " + strColumns + " FROM " + m_strTable + " ;";
        vecLines.push_back(
            Plain("i=0,errno=0, run sql failed, error=" + strError + ", sql=" + strSql));
        vecLines.push_back(Check("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"));
        vecLines.push_back(Plain("jRecParam=null"));
        vecLines.push_back(Plain("sql error, err=" + strError + ", sql=" + strSql));
        return vecLines;
    }

    // The lines of recSave after its read-back was stopped.
    std::vector<std::string> StoppedSave(std::vector<std::string> vecLines,
                                         const std::string& strRecord,
                                         const std::string& strInsert) {
        const std::string strError = sqlite3_errstr(SQLITE_ABORT);
        const std::string strSql = "INSERT INTO " + m_strTable + " " + strInsert +
                                   ";select * from " + m_strTable +
                                   " where rowid == last_insert_rowid();";
        vecLines.push_back(
            Plain("i=0,errno=0, run sql failed, error=" + strError + ", sql=" + strSql));
        vecLines.push_back(Check("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"));
        vecLines.push_back(Plain("blCreate=1, jRecInOut=" + strRecord));
        vecLines.push_back(Plain(R"(jType={"id":{"cpptype":"int"},"name":{"cpptype":"string"}})"));
        vecLines.push_back(Plain("sql error, err=" + strError + ", sql=" + strSql));
        return vecLines;
    }

    std::string m_strTable;
    std::unique_ptr<VornJsonDbApi> m_pHandle;
};

}  // namespace testhost

#endif  // VORNJSONDB_TESTS_CORE_ROWSFIXTURE_H
