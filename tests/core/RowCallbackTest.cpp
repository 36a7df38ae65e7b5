// The row callback called as SQLite would call it, with what SQLite itself never hands over. The
// library gives its callback to sqlite3_exec and to nobody else, so it is caught there.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

// m_fnCallback is the library's, and t the table whose statement ran last.
class RowCallbackTest : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        Json::Value jNoQuery;
        Json::Value jRows;
        ASSERT_EQ(m_pHandle->recList(jNoQuery, jRows), 0);
        m_fnCallback = LastRowCallback();
        ASSERT_NE(m_fnCallback, nullptr);
    }

    RowCallback m_fnCallback = nullptr;
    char m_szId[3] = "id";
    char m_szName[5] = "name";
    char m_szSeven[2] = "7";
    char m_szText[2] = "x";
    char* m_aszNames[2] = {m_szId, m_szName};
    char* m_aszValues[2] = {m_szSeven, m_szText};
};

}  // namespace

TEST_F(RowCallbackTest, RowIsAppendedToAnArrayAndToNull) {
    Json::Value jRows;
    EXPECT_EQ(m_fnCallback(&jRows, 2, m_aszValues, m_aszNames), 0);
    EXPECT_EQ(m_fnCallback(&jRows, 1, m_aszValues, m_aszNames), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":7,"name":"x"},{"id":7}])");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RowCallbackTest, MissingArrayIsRefused) {
    EXPECT_EQ(m_fnCallback(nullptr, 2, m_aszValues, m_aszNames), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check("!pjRecArray")}));
}

TEST_F(RowCallbackTest, ArrayArgumentOfAnotherKindIsRefusedAndLeftAlone) {
    for (const char* szArgument : {"{}", "{\"a\":1}", "1", "\"text\"", "true"}) {
        Json::Value jArgument = ParseJson(szArgument);
        EXPECT_EQ(m_fnCallback(&jArgument, 2, m_aszValues, m_aszNames), -1);
        EXPECT_EQ(Compact(jArgument), szArgument);
        EXPECT_EQ(TakeLog(), (Lines{Check("pjRecArray->type() != Json::arrayValue && "
                                          "pjRecArray->type() != Json::nullValue")}));
    }
}

TEST_F(RowCallbackTest, ObjectAsArrayArgumentMakesTheFirstRowStopTheStatement) {
    Sql("INSERT INTO t VALUES (1, 'a'), (2, 'b')");
    const std::string strSql = "SELECT * FROM t";
    Json::Value jObject(Json::objectValue);
    EXPECT_EQ(m_pHandle->runSqlEx(strSql, m_fnCallback, &jObject), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check("pjRecArray->type() != Json::arrayValue && "
                                      "pjRecArray->type() != Json::nullValue"),
                                RunFailed(sqlite3_errstr(SQLITE_ABORT), strSql)}));
}

TEST_F(RowCallbackTest, RowidColumnFailsTheStatementBecauseTheDefinitionLacksIt) {
    Sql("INSERT INTO t VALUES (1, 'a')");
    const std::string strSql = "SELECT id, rowid AS rowid FROM t";
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->runSqlEx(strSql, m_fnCallback, &jRows), -1);
    EXPECT_EQ(TakeLog(),
              (Lines{Check("!jType.isMember(strName)"), Check(kFieldFailed),
                     Plain("column_name[1]=rowid"), Plain("column_value[1]=1"), Check(kRowFailed),
                     RunFailed(sqlite3_errstr(SQLITE_ABORT), strSql)}));
    EXPECT_TRUE(jRows.isNull());
}

TEST_F(RowCallbackTest, PlaceOfALateColumnIsADecimalNumber) {
    Sql("INSERT INTO t VALUES (1, 'a')");
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT id, id, id, id, id, id, id, id, id, id, rowid AS rowid "
                                  "FROM t",
                                  m_fnCallback, &jRows),
              -1);
    const Lines vecLog = TakeLog();
    ASSERT_EQ(vecLog.size(), 6U);
    EXPECT_EQ(vecLog[2], Plain("column_name[10]=rowid"));
    EXPECT_EQ(vecLog[3], Plain("column_value[10]=1"));
}

TEST_F(RowCallbackTest, RowWithoutNamesOrValuesIsRefused) {
    Json::Value jRows(Json::arrayValue);
    EXPECT_EQ(m_fnCallback(&jRows, 2, nullptr, m_aszNames), -1);
    EXPECT_EQ(m_fnCallback(&jRows, 2, m_aszValues, nullptr), -1);
    EXPECT_EQ(m_fnCallback(&jRows, 0, nullptr, nullptr), -1);
    const std::string strCheck = Check("NULL == column_name || NULL == column_value");
    EXPECT_EQ(TakeLog(), (Lines{strCheck, Check(kRowFailed), strCheck, Check(kRowFailed), strCheck,
                                Check(kRowFailed)}));
    EXPECT_EQ(Compact(jRows), "[]");
}

TEST_F(RowCallbackTest, RowWithoutColumnsIsAnEmptyRecord) {
    Json::Value jRows;
    EXPECT_EQ(m_fnCallback(&jRows, 0, m_aszValues, m_aszNames), 0);
    EXPECT_EQ(m_fnCallback(&jRows, -1, m_aszValues, m_aszNames), 0);
    m_aszNames[0] = nullptr;
    EXPECT_EQ(m_fnCallback(&jRows, 0, m_aszValues, m_aszNames), 0);
    EXPECT_EQ(Compact(jRows), "[{},{},{}]");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RowCallbackTest, FirstColumnWithoutANameLogsOnlyTheConditions) {
    Json::Value jRows(Json::arrayValue);
    m_aszNames[0] = nullptr;
    EXPECT_EQ(m_fnCallback(&jRows, 2, m_aszValues, m_aszNames), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check("NULL == column_name[i]"), Check(kRowFailed)}));
    EXPECT_EQ(Compact(jRows), "[]");
}

TEST_F(RowCallbackTest, FirstColumnWithoutANameIsRefusedBeforeTheTypesAreLookedUp) {
    const auto pHandle = NewHandle(m_pDb, "u", Json::Value(), "SELECT 1");
    EXPECT_EQ(pHandle->runSqlEx("SELECT 1"), 0);
    TakeLog();
    Json::Value jRows;
    m_aszNames[0] = nullptr;
    EXPECT_EQ(m_fnCallback(&jRows, 2, m_aszValues, m_aszNames), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check("NULL == column_name[i]"), Check(kRowFailed)}));
}

TEST_F(RowCallbackTest, LaterColumnWithoutANameAlsoLogsItsValue) {
    Json::Value jRows(Json::arrayValue);
    m_aszNames[1] = nullptr;
    EXPECT_EQ(m_fnCallback(&jRows, 2, m_aszValues, m_aszNames), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check("NULL == column_name[i]"), Plain("column_name[1]=(null)"),
                                Plain("column_value[1]=x"), Check(kRowFailed)}));
    EXPECT_EQ(Compact(jRows), "[]");
}

TEST_F(RowCallbackTest, SecondColumnOfTheSameNameWins) {
    Json::Value jRows;
    m_aszNames[1] = m_szId;
    char szEight[] = "8";
    m_aszValues[1] = szEight;
    EXPECT_EQ(m_fnCallback(&jRows, 2, m_aszValues, m_aszNames), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":8}])");
}

TEST_F(RowCallbackTest, TypesAreThoseOfTheTableWhoseStatementRanLast) {
    const auto pOther = NewHandle(m_pDb, "u", Definition("u", "id:string"), "CREATE TABLE u (id)");
    Json::Value jNoQuery;
    Json::Value jRows;
    EXPECT_EQ(pOther->recList(jNoQuery, jRows), 0);
    EXPECT_EQ(m_fnCallback(&jRows, 1, m_aszValues, m_aszNames), 0);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(m_fnCallback(&jRows, 1, m_aszValues, m_aszNames), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":"7"},{"id":7}])");
}

TEST_F(RowCallbackTest, LookupByTheCallbackAloneSpoilsTheTableNameForGood) {
    OpenItem();
    Sql("INSERT INTO t VALUES (1, 'a')");
    const std::string strSql = "SELECT id FROM t";
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->runSqlEx(strSql, m_fnCallback, &jRows), -1);
    EXPECT_EQ(TakeLog(),
              (Lines{UtilCheck("jTableDef.empty()"), UtilPlain("strJsonName=t"),
                     UtilPlain("jTableDef=null"), UtilPlain("jType=null"),
                     Check("!jType.isMember(strName)"), Check(kFieldFailed), Check(kRowFailed),
                     RunFailed(sqlite3_errstr(SQLITE_ABORT), strSql)}));
    Json::Value jNoQuery;
    EXPECT_EQ(m_pHandle->recList(jNoQuery, jRows), -1);
    Lines vecLog = TakeLog();
    vecLog.resize(4);
    EXPECT_EQ(vecLog,
              (Lines{UtilCheck("jType[strJsonName].type() != Json::objectValue"),
                     UtilPlain("strJsonName=t"), UtilPlain("jTableDef=" + Compact(m_jDefinition)),
                     UtilPlain(R"(jType={"t":null})")}));
    EXPECT_TRUE(jRows.isNull());
}
