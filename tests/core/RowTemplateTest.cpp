// Rows of statements that share their columns, and those that stop being alike.

#include "../support/TableFixture.h"

using namespace testhost;

namespace {

using Lines = std::vector<std::string>;

class RowTemplateTest : public TableTest {
  protected:
    // What the handle lists, as compact JSON.
    static std::string Listed(VornJsonDbApi& Handle, int nExpected = 0) {
        Json::Value jNoQuery;
        Json::Value jRows(Json::arrayValue);
        EXPECT_EQ(Handle.recList(jNoQuery, jRows), nExpected);
        return Compact(jRows);
    }

    // Where the record's member names are kept.
    static std::vector<const char*> NamesKeptAt(const Json::Value& jRecord) {
        std::vector<const char*> vecNames;
        for (Json::Value::const_iterator it = jRecord.begin(); it != jRecord.end(); ++it) {
            const char* pEnd = nullptr;
            vecNames.push_back(it.memberName(&pEnd));
        }
        return vecNames;
    }

    static Json::Value AllOf(VornJsonDbApi& Handle) {
        Json::Value jNoQuery;
        Json::Value jRows(Json::arrayValue);
        EXPECT_EQ(Handle.recList(jNoQuery, jRows), 0);
        return jRows;
    }
};

// In fresh processes: the statements whose names are shared are counted for the whole process.
TEST_F(RowTemplateTest, RecordsOfOneStatementKeepTheirNamesOnce) {
    EXPECT_EQ(0, InFreshProcess([this] {
                  Sql("INSERT INTO " + m_strTable + " VALUES (1, 'a'), (2, 'b'), (3, NULL)");
                  const Json::Value jRows = AllOf(*m_pHandle);
                  const Json::Value jLater = AllOf(*m_pHandle);
                  const std::vector<const char*> vecNames = NamesKeptAt(jRows[0]);
                  EXPECT_EQ(vecNames.size(), 2U);
                  EXPECT_EQ(NamesKeptAt(jRows[1]), vecNames);
                  EXPECT_EQ(NamesKeptAt(jRows[2]), std::vector<const char*>{vecNames[0]});
                  EXPECT_EQ(NamesKeptAt(jLater[1]), vecNames);
              }));
}

TEST_F(RowTemplateTest, TablesInTurnsShareANameThatBothHave) {
    EXPECT_EQ(0, InFreshProcess([this] {
                  const std::string strOther = UniqueTable();
                  const auto pOther = NewHandle(m_pDb, strOther, Definition(strOther, "id:int"),
                                                "CREATE TABLE " + strOther + " (id)");
                  Sql("INSERT INTO " + m_strTable + " VALUES (1, 'a')");
                  Sql("INSERT INTO " + strOther + " VALUES (1)");
                  const Json::Value jRows = AllOf(*m_pHandle);
                  const Json::Value jOther = AllOf(*pOther);
                  const Json::Value jRowsAgain = AllOf(*m_pHandle);
                  const Json::Value jOtherAgain = AllOf(*pOther);
                  EXPECT_EQ(NamesKeptAt(jOther[0])[0], NamesKeptAt(jRows[0])[0]);
                  EXPECT_EQ(NamesKeptAt(jRowsAgain[0]), NamesKeptAt(jRows[0]));
                  EXPECT_EQ(NamesKeptAt(jOtherAgain[0]), NamesKeptAt(jOther[0]));
              }));
}

TEST_F(RowTemplateTest, NullsOfOneRowDoNotReachTheNext) {
    Sql("INSERT INTO " + m_strTable + " VALUES (1, 'a'), (2, NULL), (3, 'c')");
    EXPECT_EQ(Listed(*m_pHandle), R"([{"id":1,"name":"a"},{"id":2},{"id":3,"name":"c"}])");
}

TEST_F(RowTemplateTest, ColumnWithoutANameIsRefusedAfterGoodRowsToo) {
    Sql("INSERT INTO " + m_strTable + " VALUES (1, 'a')");
    EXPECT_EQ(Listed(*m_pHandle), R"([{"id":1,"name":"a"}])");
    const RowCallback fnCallback = LastRowCallback();
    char szId[] = "id";
    char szText[] = "7";
    char* aszNames[] = {szId, nullptr};
    char* aszValues[] = {szText, szText};
    TakeLog();
    Json::Value jRows(Json::arrayValue);
    EXPECT_EQ(fnCallback(&jRows, 2, aszValues, aszNames), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check("NULL == column_name[i]"), Plain("column_name[1]=(null)"),
                                Plain("column_value[1]=7"),
                                Check("0 > DbCallBackFillRec(&jTmp, n_column, column_value, "
                                      "column_name)")}));
}

TEST_F(RowTemplateTest, ColumnsInAnotherOrderFillTheSameMembers) {
    Sql("INSERT INTO " + m_strTable + " VALUES (1, 'a')");
    EXPECT_EQ(Listed(*m_pHandle), R"([{"id":1,"name":"a"}])");
    const RowCallback fnCallback = LastRowCallback();
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT name, id FROM " + m_strTable, fnCallback, &jRows), 0);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT id, name FROM " + m_strTable, fnCallback, &jRows), 0);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT id FROM " + m_strTable, fnCallback, &jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":1,"name":"a"},{"id":1,"name":"a"},{"id":1}])");
}

TEST_F(RowTemplateTest, StatementsThatDifferInTheFirstNameAloneAreToldApart) {
    Sql("INSERT INTO " + m_strTable + " VALUES (1, 'a')");
    EXPECT_EQ(Listed(*m_pHandle), R"([{"id":1,"name":"a"}])");
    const RowCallback fnCallback = LastRowCallback();
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT id FROM " + m_strTable, fnCallback, &jRows), 0);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT name FROM " + m_strTable, fnCallback, &jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":1},{"name":"a"}])");
}

TEST_F(RowTemplateTest, LaterNullDoesNotTakeBackAColumnOfTheSameName) {
    Sql("INSERT INTO " + m_strTable + " VALUES (1, 'a')");
    EXPECT_EQ(Listed(*m_pHandle), R"([{"id":1,"name":"a"}])");
    Json::Value jRows;
    EXPECT_EQ(
        m_pHandle->runSqlEx("SELECT id, NULL AS id FROM " + m_strTable, LastRowCallback(), &jRows),
        0);
    EXPECT_EQ(Compact(jRows), R"([{"id":1}])");
}

TEST_F(RowTemplateTest, MoreShapesThanTemplatesAreReadAlike) {
    Sql("INSERT INTO " + m_strTable + " VALUES (7, 'a'), (8, NULL)");
    EXPECT_EQ(Listed(*m_pHandle), R"([{"id":7,"name":"a"},{"id":8}])");
    const RowCallback fnCallback = LastRowCallback();
    // Columns that come twice make a shape of their own; memory for shapes ends with the 16th.
    std::string strColumns = "id, name";
    for (int i = 2; i <= 20; ++i) {
        strColumns += ", id";
        Json::Value jRows;
        EXPECT_EQ(
            m_pHandle->runSqlEx("SELECT " + strColumns + " FROM " + m_strTable, fnCallback, &jRows),
            0);
        EXPECT_EQ(Compact(jRows), R"([{"id":7,"name":"a"},{"id":8}])");
    }
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT name, id FROM " + m_strTable, fnCallback, &jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":7,"name":"a"},{"id":8}])");
    EXPECT_NE(NamesKeptAt(jRows[0]), NamesKeptAt(jRows[1]));
    EXPECT_EQ(Listed(*m_pHandle), R"([{"id":7,"name":"a"},{"id":8}])");
}

TEST_F(RowTemplateTest, RecordsLiveOnWhenTheirHandleIsGone) {
    Json::Value jRows;
    const std::string strTable = UniqueTable();
    {
        const auto pHandle = NewHandle(m_pDb, strTable, Definition(strTable, "n:int"),
                                       "CREATE TABLE " + strTable + " (n INT)");
        Sql("INSERT INTO " + strTable + " VALUES (7)");
        Json::Value jNoQuery;
        EXPECT_EQ(pHandle->recList(jNoQuery, jRows), 0);
    }
    Json::Value jCopy = jRows[0];
    jCopy["m"] = 1;
    EXPECT_EQ(Compact(jRows), R"([{"n":7}])");
    EXPECT_EQ(Compact(jCopy), R"({"m":1,"n":7})");
}

}  // namespace
