#include "TableTest.h"

#include <sstream>

namespace testhost {

void TableTest::SetUp() {
    ASSERT_EQ(sqlite3_open(":memory:", &m_pDb), SQLITE_OK);
    ResetHost();
    OpenItem();
}

void TableTest::TearDown() {
    ResetHost();
    m_pHandle.reset();
    EXPECT_EQ(sqlite3_close(m_pDb), SQLITE_OK);
}

void TableTest::OpenItem() {
    OpenDefinition(Definition("t", kItem), kCreateItem);
}

void TableTest::Open(const std::string& strMembers) {
    std::string strColumns;
    std::istringstream stream(strMembers);
    for (std::string strOne; std::getline(stream, strOne, ',');) {
        strColumns += (strColumns.empty() ? "" : ",") + strOne.substr(0, strOne.find(':'));
    }
    Open(strMembers, strColumns);
}

void TableTest::Open(const std::string& strMembers, const std::string& strColumns) {
    OpenDefinition(Definition("t", strMembers), "CREATE TABLE t (" + strColumns + ")");
}

void TableTest::OpenMembers(const Json::Value& jMembers, const std::string& strColumns) {
    Json::Value jDefinition(Json::objectValue);
    jDefinition["t"]["member"] = jMembers;
    OpenDefinition(jDefinition, "CREATE TABLE t (" + strColumns + ")");
}

void TableTest::OpenDefinition(const Json::Value& jDefinition, const std::string& strSqlCreate) {
    m_pHandle.reset();
    ForgetTables();
    Sql("DROP TABLE IF EXISTS t");
    TakeLog();
    TakeSql();
    m_jDefinition = jDefinition;
    m_pHandle = NewHandle(m_pDb, "t", jDefinition, strSqlCreate);
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(TakeSql(), Lines{strSqlCreate});
}

void TableTest::Sql(const std::string& strSql) const {
    std::string strError;
    ASSERT_EQ(BareExec(m_pDb, strSql, &strError), SQLITE_OK) << strSql << ": " << strError;
}

std::string TableTest::Rows(const std::string& strSql) const {
    return BareRows(m_pDb, strSql);
}

Json::Value TableTest::Listed() {
    Json::Value jNoQuery;
    Json::Value jRows(Json::arrayValue);
    EXPECT_EQ(m_pHandle->recList(jNoQuery, jRows), 0);
    EXPECT_EQ(TakeLog(), Lines());
    return jRows;
}

void TableTest::MakeStaleError() {
    EXPECT_EQ(m_pHandle->runSqlEx("select stale;"), -1);
    TakeLog();
    TakeSql();
}

void TableTest::MakeStaleDuplicate() {
    const std::string strInsert = "insert into t (id) values (77);";
    EXPECT_EQ(m_pHandle->runSqlEx(strInsert), 1);
    EXPECT_EQ(m_pHandle->runSqlEx(strInsert), -1);
    Sql("delete from t where id = 77;");
    TakeLog();
    TakeSql();
}

std::string SqlErrorOf(VornJsonDbApi& handle) {
    const Lines vecBefore = TakeLog();
    Json::Value jNoQuery(Json::arrayValue);
    Json::Value jRows;
    EXPECT_EQ(handle.recList(jNoQuery, jRows), -1);
    const Lines vecLog = TakeLog();
    if (vecLog.size() < 3) {
        return "";
    }
    const std::string strHead = "class plain: sql error, err=";
    const std::string strTail = ", sql=";
    EXPECT_EQ(vecLog.size(), 3U);
    EXPECT_EQ(vecLog[2].compare(0, strHead.size(), strHead), 0) << vecLog[2];
    return vecLog[2].substr(strHead.size(), vecLog[2].size() - strHead.size() - strTail.size());
}

std::string RunFailed(const std::string& strError, const std::string& strSql, int nErrno,
                      size_t nAttempts) {
    return Plain("i=" + std::to_string(nAttempts) + ",errno=" + std::to_string(nErrno) +
                 ", run sql failed, error=" + strError + ", sql=" + strSql);
}

std::string SqlError(const std::string& strError, const std::string& strSql) {
    return Plain("sql error, err=" + strError + ", sql=" + strSql);
}

int CountRows(void* pArg, int, char**, char**) {
    ++*static_cast<int*>(pArg);
    return 0;
}

Lines Joined(Lines vecFirst, const Lines& vecSecond) {
    vecFirst.insert(vecFirst.end(), vecSecond.begin(), vecSecond.end());
    return vecFirst;
}

std::string LongText() {
    return std::string(1024 * 1024, 'x');
}

Json::Value ManyMembers() {
    Json::Value jMembers(Json::objectValue);
    for (int i = 0; i < 512; ++i) {
        jMembers["m" + std::to_string(1000 + i)]["cpptype"] = "int";
    }
    return jMembers;
}

}  // namespace testhost
