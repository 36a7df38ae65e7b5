// Rows of statements that share their columns, and those that stop being alike.

#include "../support/TableTest.h"

using namespace testhost;

namespace {

using RowTemplateTest = TableTest;

// Where the record's member names are kept.
std::vector<const char*> NamesKeptAt(const Json::Value& jRecord) {
    std::vector<const char*> vecNames;
    for (Json::Value::const_iterator it = jRecord.begin(); it != jRecord.end(); ++it) {
        const char* pEnd = nullptr;
        vecNames.push_back(it.memberName(&pEnd));
    }
    return vecNames;
}

TEST_F(RowTemplateTest, RecordsOfOneStatementKeepTheirNamesOnce) {
    Sql("INSERT INTO t VALUES (1, 'a'), (2, 'b'), (3, NULL)");
    const Json::Value jRows = Listed();
    const std::vector<const char*> vecNames = NamesKeptAt(jRows[0]);
    EXPECT_EQ(vecNames.size(), 2U);
    EXPECT_EQ(NamesKeptAt(jRows[1]), vecNames);
    EXPECT_EQ(NamesKeptAt(jRows[2]), std::vector<const char*>{vecNames[0]});
    EXPECT_EQ(NamesKeptAt(Listed()[1]), vecNames);
}

TEST_F(RowTemplateTest, TablesInTurnsShareANameThatBothHave) {
    Sql("INSERT INTO t VALUES (1, 'a')");
    const std::vector<const char*> vecNames = NamesKeptAt(Listed()[0]);
    const auto pFirst = std::move(m_pHandle);
    m_pHandle =
        NewHandle(m_pDb, "u", Definition("u", "id:int"), "CREATE TABLE u AS SELECT 1 AS id");
    EXPECT_EQ(NamesKeptAt(Listed()[0]), std::vector<const char*>{vecNames[0]});
    Json::Value jNoQuery;
    Json::Value jRows;
    EXPECT_EQ(pFirst->recList(jNoQuery, jRows), 0);
    EXPECT_EQ(NamesKeptAt(jRows[0]), vecNames);
}

TEST_F(RowTemplateTest, NullsOfOneRowDoNotReachTheNext) {
    Sql("INSERT INTO t VALUES (1, 'a'), (2, NULL), (3, 'c')");
    EXPECT_EQ(Compact(Listed()), R"([{"id":1,"name":"a"},{"id":2},{"id":3,"name":"c"}])");
}

TEST_F(RowTemplateTest, ColumnWithoutANameIsRefusedAfterGoodRowsToo) {
    Sql("INSERT INTO t VALUES (1, 'a')");
    EXPECT_EQ(Compact(Listed()), R"([{"id":1,"name":"a"}])");
    const RowCallback fnCallback = LastRowCallback();
    char szId[] = "id";
    char szText[] = "7";
    char* aszNames[] = {szId, nullptr};
    char* aszValues[] = {szText, szText};
    TakeLog();
    Json::Value jRows(Json::arrayValue);
    EXPECT_EQ(fnCallback(&jRows, 2, aszValues, aszNames), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check("NULL == column_name[i]"), Plain("column_name[1]=(null)"),
                                Plain("column_value[1]=7"), Check(kRowFailed)}));
}

TEST_F(RowTemplateTest, ColumnsInAnotherOrderFillTheSameMembers) {
    Sql("INSERT INTO t VALUES (1, 'a')");
    EXPECT_EQ(Compact(Listed()), R"([{"id":1,"name":"a"}])");
    const RowCallback fnCallback = LastRowCallback();
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT name, id FROM t", fnCallback, &jRows), 0);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT id, name FROM t", fnCallback, &jRows), 0);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT id FROM t", fnCallback, &jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":1,"name":"a"},{"id":1,"name":"a"},{"id":1}])");
}

TEST_F(RowTemplateTest, StatementsThatDifferInTheFirstNameAloneAreToldApart) {
    Sql("INSERT INTO t VALUES (1, 'a')");
    EXPECT_EQ(Compact(Listed()), R"([{"id":1,"name":"a"}])");
    const RowCallback fnCallback = LastRowCallback();
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT id FROM t", fnCallback, &jRows), 0);
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT name FROM t", fnCallback, &jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":1},{"name":"a"}])");
}

TEST_F(RowTemplateTest, LaterNullDoesNotTakeBackAColumnOfTheSameName) {
    Sql("INSERT INTO t VALUES (1, 'a')");
    EXPECT_EQ(Compact(Listed()), R"([{"id":1,"name":"a"}])");
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT id, NULL AS id FROM t", LastRowCallback(), &jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":1}])");
}

TEST_F(RowTemplateTest, MoreShapesThanTemplatesAreReadAlike) {
    Sql("INSERT INTO t VALUES (7, 'a'), (8, NULL)");
    EXPECT_EQ(Compact(Listed()), R"([{"id":7,"name":"a"},{"id":8}])");
    const RowCallback fnCallback = LastRowCallback();
    // Columns that come twice make a shape of their own; memory for shapes ends with the 16th.
    std::string strColumns = "id, name";
    for (int i = 2; i <= 20; ++i) {
        strColumns += ", id";
        Json::Value jRows;
        EXPECT_EQ(m_pHandle->runSqlEx("SELECT " + strColumns + " FROM t", fnCallback, &jRows), 0);
        EXPECT_EQ(Compact(jRows), R"([{"id":7,"name":"a"},{"id":8}])");
    }
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT name, id FROM t", fnCallback, &jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":7,"name":"a"},{"id":8}])");
    EXPECT_NE(NamesKeptAt(jRows[0]), NamesKeptAt(jRows[1]));
    EXPECT_EQ(Compact(Listed()), R"([{"id":7,"name":"a"},{"id":8}])");
}

TEST_F(RowTemplateTest, RecordsLiveOnWhenHandleAndTableAreForgotten) {
    Open("n:int");
    Sql("INSERT INTO t VALUES (7)");
    const Json::Value jRows = Listed();
    m_pHandle.reset();
    ForgetTables();
    Json::Value jCopy = jRows[0];
    jCopy["m"] = 1;
    EXPECT_EQ(Compact(jRows), R"([{"n":7}])");
    EXPECT_EQ(Compact(jCopy), R"({"m":1,"n":7})");
}

}  // namespace
