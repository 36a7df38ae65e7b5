// A fixture with one table and one handle, for the tests of what every handle does.
#ifndef VORNJSONDB_TESTS_SUPPORT_TABLEFIXTURE_H
#define VORNJSONDB_TESTS_SUPPORT_TABLEFIXTURE_H

#include <memory>

#include "TestHost.h"

namespace testhost {

// The handle's last SQL error. It has no accessor; a refused query shows it in its log lines, and
// runs no statement.
inline std::string SqlErrorOf(VornJsonDbApi& handle) {
    const std::vector<std::string> vecBefore = TakeLog();
    Json::Value jNoQuery(Json::arrayValue);
    Json::Value jRows;
    EXPECT_EQ(handle.recList(jNoQuery, jRows), -1);
    const std::vector<std::string> vecLog = TakeLog();
    if (vecLog.size() < 3) {
        return "";
    }
    const std::string strHead = "class plain: sql error, err=";
    const std::string strTail = ", sql=";
    EXPECT_EQ(vecLog.size(), 3U);
    EXPECT_EQ(vecLog[2].compare(0, strHead.size(), strHead), 0) << vecLog[2];
    return vecLog[2].substr(strHead.size(), vecLog[2].size() - strHead.size() - strTail.size());
}

// m_pHandle serves the empty table m_strTable (id INTEGER PRIMARY KEY, name TEXT).
class TableTest : public DbTest {
  protected:
    void SetUp() override {
        DbTest::SetUp();
        m_strTable = UniqueTable();
        m_jDefinition = Definition(m_strTable, "id:int,name:string");
        m_strCreate = "CREATE TABLE " + m_strTable + " (id INTEGER PRIMARY KEY, name TEXT)";
        m_pHandle = NewHandle(m_pDb, m_strTable, m_jDefinition, m_strCreate);
        ASSERT_EQ(TakeLog(), std::vector<std::string>());
        TakeSql();
    }

    void TearDown() override {
        m_pHandle.reset();
        DbTest::TearDown();
    }

    std::string m_strTable;
    Json::Value m_jDefinition;
    std::string m_strCreate;
    std::unique_ptr<VornJsonDbApi> m_pHandle;
};

}  // namespace testhost

#endif  // VORNJSONDB_TESTS_SUPPORT_TABLEFIXTURE_H
