// Rows into records: what stops a statement, what is said then, and whose the records are.
#include "RowsFixture.h"

using namespace testhost;

namespace {

using Lines = std::vector<std::string>;

const char* const kFieldCheck =
    "0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))";
const char* const kRecCheck = "0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)";

}  // namespace

TEST_F(RowsTest, TypeWithoutAConversionAtTheFirstColumnLogsOnlyItsConditions) {
    for (const char* szType : {"long", "unsigned long", "unsigned", "double", "float", "uid_t",
                               "time_t", "String", "int ", "", "BOOL", "%s"}) {
        Open(std::string("a:") + szType + ",b:int");
        Insert("(1, 2)");
        Json::Value jRows;
        EXPECT_EQ(List(jRows), -1) << szType;
        EXPECT_EQ(TakeLog(), StoppedList({Located(std::string("type error, strType=") + szType),
                                          Check(kFieldCheck), Check(kRecCheck)},
                                         "a,b"));
        EXPECT_TRUE(jRows.isNull()) << szType;
    }
}

TEST_F(RowsTest, TypeWithoutAConversionAtALaterColumnAlsoLogsItsNameAndValue) {
    Open("a:int,b:string,c:double");
    Insert("(1, 'x', 2.5)");
    Json::Value jRows;
    EXPECT_EQ(List(jRows), -1);
    EXPECT_EQ(TakeLog(), StoppedList({Located("type error, strType=double"), Check(kFieldCheck),
                                      Plain("column_name[2]=c"), Plain("column_value[2]=2.5"),
                                      Check(kRecCheck)},
                                     "a,b,c"));
}

TEST_F(RowsTest, TypeNameThatGoesOnBehindANulIsAnotherName) {
    for (const std::string& strName : {std::string("int"), std::string("string"),
                                       std::string("Json::Value"), std::string("bool")}) {
        for (const std::string& strMore :
             {std::string(1, '\0'), std::string("\0x", 2), std::string(40, '\0')}) {
            m_strTable = UniqueTable();
            Json::Value jDefinition = Definition(m_strTable, "a:int");
            jDefinition[m_strTable]["member"]["a"]["cpptype"] = strName + strMore;
            m_pHandle =
                NewHandle(m_pDb, m_strTable, jDefinition, "CREATE TABLE " + m_strTable + " (a)");
            Insert("(1)");
            Json::Value jRows;
            EXPECT_EQ(List(jRows), -1);
            EXPECT_EQ(TakeLog(), StoppedList({Located("type error, strType=" + strName),
                                              Check(kFieldCheck), Check(kRecCheck)},
                                             "a"));
        }
    }
}

TEST_F(RowsTest, BadRowStopsTheStatementAndEarlierRecordsStay) {
    Open("a:int,b:double");
    Insert("(1, NULL), (2, NULL), (3, 'x'), (4, NULL)");
    Json::Value jRows = ParseJson("[\"old\"]");
    EXPECT_EQ(List(jRows), -1);
    EXPECT_EQ(Compact(jRows), R"(["old",{"a":1},{"a":2}])");
    EXPECT_EQ(TakeSql().size(), 1U);
    EXPECT_EQ(TakePauses().size(), 0U);
    EXPECT_EQ(SqlErrorOf(*m_pHandle), sqlite3_errstr(SQLITE_ABORT));
}

TEST_F(RowsTest, ColumnMissingFromTheDefinitionFailsTheRow) {
    Open("id:int,name:string", ", more DEFAULT 'm'");
    Json::Value jRecord = ParseJson(R"({"id":1,"name":"a"})");
    EXPECT_EQ(m_pHandle->recSave(jRecord, true), -1);
    EXPECT_EQ(TakeLog(), StoppedSave({Check("!jType.isMember(strName)"), Check(kFieldCheck),
                                      Plain("column_name[2]=more"), Plain("column_value[2]=m"),
                                      Check(kRecCheck)},
                                     R"({"id":1,"name":"a"})", "(id,name) VALUES (1,'a') "));
    EXPECT_EQ(Rows("SELECT * FROM " + m_strTable), "1|a|m");
}

TEST_F(RowsTest, ColumnMissingFromTheDefinitionFailsTheRowEvenWhenItIsNull) {
    Open("id:int,name:string", ", more");
    Json::Value jRecord = ParseJson(R"({"id":1,"name":"a"})");
    EXPECT_EQ(m_pHandle->recSave(jRecord, true), -1);
    EXPECT_EQ(TakeLog(), StoppedSave({Check("!jType.isMember(strName)"), Check(kFieldCheck),
                                      Plain("column_name[2]=more"), Plain("column_value[2]=(null)"),
                                      Check(kRecCheck)},
                                     R"({"id":1,"name":"a"})", "(id,name) VALUES (1,'a') "));
}

TEST_F(RowsTest, FirstColumnMissingFromTheDefinitionLogsNoNameAndValue) {
    m_strTable = UniqueTable();
    m_pHandle = NewHandle(m_pDb, m_strTable, Definition(m_strTable, "id:int,name:string"),
                          "CREATE TABLE " + m_strTable + " (more DEFAULT 'm', id, name)");
    Json::Value jRecord = ParseJson(R"({"id":1,"name":"a"})");
    EXPECT_EQ(m_pHandle->recSave(jRecord, true), -1);
    EXPECT_EQ(TakeLog(),
              StoppedSave({Check("!jType.isMember(strName)"), Check(kFieldCheck), Check(kRecCheck)},
                          R"({"id":1,"name":"a"})", "(id,name) VALUES (1,'a') "));
    EXPECT_EQ(Rows("SELECT * FROM " + m_strTable), "m|1|a");
}

TEST_F(RowsTest, NullArrayBecomesAnArrayWithTheFirstRowOnly) {
    Open("a:int");
    Json::Value jRows;
    EXPECT_EQ(List(jRows), 0);
    EXPECT_TRUE(jRows.isNull());
    Insert("(1)");
    EXPECT_EQ(List(jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"a":1}])");
}

TEST_F(RowsTest, ColumnsMayComeInAnyOrderAndNullAtAnyPlace) {
    Open("z:int,a:string,\xC3\xBC:bool,a1:long long,B:int");
    Insert(
        "(1, 'x', 1, 2, 3), (NULL, 'x', 1, 2, 3), (1, NULL, 1, 2, 3), (1, 'x', NULL, 2, 3), "
        "(1, 'x', 1, NULL, 3), (1, 'x', 1, 2, NULL), (NULL, NULL, NULL, NULL, NULL)");
    Listed();
    const RowCallback fnCallback = LastRowCallback();
    const Json::Value jExpected = ParseJson(
        "[{\"B\":3,\"a\":\"x\",\"a1\":2,\"z\":1,\"\xC3\xBC\":true},"
        "{\"B\":3,\"a\":\"x\",\"a1\":2,\"\xC3\xBC\":true},"
        "{\"B\":3,\"a1\":2,\"z\":1,\"\xC3\xBC\":true},"
        "{\"B\":3,\"a\":\"x\",\"a1\":2,\"z\":1},"
        "{\"B\":3,\"a\":\"x\",\"z\":1,\"\xC3\xBC\":true},"
        "{\"a\":\"x\",\"a1\":2,\"z\":1,\"\xC3\xBC\":true},{}]");
    for (const char* szColumns : {"*", "a, z, a1, B, \xC3\xBC", "\xC3\xBC, z, B, a, a1", "*"}) {
        Json::Value jRows;
        EXPECT_EQ(m_pHandle->runSqlEx("SELECT " + std::string(szColumns) + " FROM " + m_strTable,
                                      fnCallback, &jRows),
                  0);
        EXPECT_EQ(jRows, jExpected) << szColumns;
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RowsTest, ManyTablesEachKeepTheirOwnTypes) {
    struct Table {
        std::string strTable;
        std::unique_ptr<VornJsonDbApi> pHandle;
        std::string strExpected;
    };
    const std::pair<const char*, const char*> aTypes[] = {
        {"string", "\"1\""}, {"int", "1"}, {"bool", "true"}};
    std::vector<Table> vecTables;
    for (size_t i = 0; i < 300; ++i) {
        Open(std::string("a:") + aTypes[i % 3].first + ",b:int");
        Insert("(1, " + std::to_string(i) + ")");
        vecTables.push_back({m_strTable, std::move(m_pHandle),
                             "[{\"a\":" + std::string(aTypes[i % 3].second) +
                                 ",\"b\":" + std::to_string(i) + "}]"});
    }
    for (int nPass = 0; nPass < 2; ++nPass) {
        for (const Table& table : vecTables) {
            Json::Value jNoQuery;
            Json::Value jRows;
            EXPECT_EQ(table.pHandle->recList(jNoQuery, jRows), 0);
            EXPECT_EQ(Compact(jRows), table.strExpected);
        }
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RowsTest, RecordsAreTheCallersToChangeAndToKeep) {
    Open("a:int,b:Json::Value");
    Insert("(1, '{\"x\":[1]}'), (2, '{\"x\":[1]}')");
    Json::Value jRows = Listed();
    jRows[0]["b"]["x"][0] = 9;
    jRows[0]["a"] = "text";
    jRows[0]["c"] = 3;
    jRows[0].removeMember("b");
    EXPECT_EQ(Compact(jRows), R"([{"a":"text","c":3},{"a":2,"b":{"x":[1]}}])");
    EXPECT_EQ(Compact(Listed()), R"([{"a":1,"b":{"x":[1]}},{"a":2,"b":{"x":[1]}}])");
    Sql("DROP TABLE " + m_strTable);
    m_pHandle.reset();
    EXPECT_EQ(Compact(jRows), R"([{"a":"text","c":3},{"a":2,"b":{"x":[1]}}])");
}

TEST_F(RowsTest, LargeNumberOfRowsKeepsItsOrder) {
    Open("a:int");
    Sql("WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < 2000) INSERT "
        "INTO " +
        m_strTable + " SELECT i FROM n");
    const Json::Value jRows = Listed();
    ASSERT_EQ(jRows.size(), 2000U);
    for (Json::ArrayIndex i = 0; i < 2000; ++i) {
        ASSERT_EQ(jRows[i]["a"].asInt(), static_cast<int>(i + 1));
    }
}
