// Rows into records: what stops a statement, what is said then, and whose the records are.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

class RowsTest : public TableTest {
  protected:
    int List(Json::Value& jRows) {
        Json::Value jNoQuery;
        return m_pHandle->recList(jNoQuery, jRows);
    }

    // The lines of recList after the callback has stopped its statement.
    static Lines StoppedList(const Lines& vecLines, const std::string& strColumns) {
        const std::string strError = sqlite3_errstr(SQLITE_ABORT);
        const std::string strSql = "SELECT " + strColumns + " FROM t ;";
        return Joined(vecLines, {RunFailed(strError, strSql), Check(kListFailed),
                                 Plain("jRecParam=null"), SqlError(strError, strSql)});
    }

    // Saves {"id":1,"name":"a"} into a table whose read-back is stopped with these lines.
    void ExpectStoppedSave(const Lines& vecLines) {
        Json::Value jRecord = ParseJson(R"({"id":1,"name":"a"})");
        EXPECT_EQ(m_pHandle->recSave(jRecord, true), -1);
        const std::string strError = sqlite3_errstr(SQLITE_ABORT);
        const char* const szSql =
            "INSERT INTO t (id,name) VALUES (1,'a') ;select * from t where rowid == "
            "last_insert_rowid();";
        EXPECT_EQ(TakeLog(),
                  Joined(vecLines, {RunFailed(strError, szSql), Check(kSaveFailed),
                                    Plain("blCreate=1, jRecInOut=" + Compact(jRecord)),
                                    Plain("jType=" + Types()), SqlError(strError, szSql)}));
    }
};

}  // namespace

TEST_F(RowsTest, TypeWithoutAConversionAtTheFirstColumnLogsOnlyItsConditions) {
    for (const char* szType : {"long", "unsigned long", "unsigned", "double", "float", "uid_t",
                               "time_t", "String", "int ", "", "BOOL", "%s"}) {
        Open(std::string("a:") + szType + ",b:int");
        Sql("INSERT INTO t VALUES (1, 2)");
        Json::Value jRows;
        EXPECT_EQ(List(jRows), -1) << szType;
        EXPECT_EQ(TakeLog(), StoppedList({Located(std::string("type error, strType=") + szType),
                                          Check(kFieldFailed), Check(kRowFailed)},
                                         "a,b"));
        EXPECT_TRUE(jRows.isNull()) << szType;
    }
}

TEST_F(RowsTest, TypeWithoutAConversionAtALaterColumnAlsoLogsItsNameAndValue) {
    Open("a:int,b:string,c:double");
    Sql("INSERT INTO t VALUES (1, 'x', 2.5)");
    Json::Value jRows;
    EXPECT_EQ(List(jRows), -1);
    EXPECT_EQ(TakeLog(), StoppedList({Located("type error, strType=double"), Check(kFieldFailed),
                                      Plain("column_name[2]=c"), Plain("column_value[2]=2.5"),
                                      Check(kRowFailed)},
                                     "a,b,c"));
}

TEST_F(RowsTest, TypeNameThatGoesOnBehindANulIsAnotherName) {
    for (const std::string& strName : {std::string("int"), std::string("string"),
                                       std::string("Json::Value"), std::string("bool")}) {
        for (const std::string& strMore :
             {std::string(1, '\0'), std::string("\0x", 2), std::string(40, '\0')}) {
            Json::Value jMembers(Json::objectValue);
            jMembers["a"]["cpptype"] = strName + strMore;
            OpenMembers(jMembers, "a");
            Sql("INSERT INTO t VALUES (1)");
            Json::Value jRows;
            EXPECT_EQ(List(jRows), -1);
            EXPECT_EQ(TakeLog(), StoppedList({Located("type error, strType=" + strName),
                                              Check(kFieldFailed), Check(kRowFailed)},
                                             "a"));
        }
    }
}

TEST_F(RowsTest, BadRowStopsTheStatementAndEarlierRecordsStay) {
    Open("a:int,b:double");
    Sql("INSERT INTO t VALUES (1, NULL), (2, NULL), (3, 'x'), (4, NULL)");
    Json::Value jRows = ParseJson("[\"old\"]");
    EXPECT_EQ(List(jRows), -1);
    EXPECT_EQ(Compact(jRows), R"(["old",{"a":1},{"a":2}])");
    EXPECT_EQ(TakeSql().size(), 1U);
    EXPECT_EQ(TakePauses().size(), 0U);
    EXPECT_EQ(SqlErrorOf(*m_pHandle), sqlite3_errstr(SQLITE_ABORT));
}

TEST_F(RowsTest, ColumnMissingFromTheDefinitionFailsTheRow) {
    Open(kItem, "id, name, more DEFAULT 'm'");
    ExpectStoppedSave({Check("!jType.isMember(strName)"), Check(kFieldFailed),
                       Plain("column_name[2]=more"), Plain("column_value[2]=m"),
                       Check(kRowFailed)});
    EXPECT_EQ(All(), "1|a|m");
}

TEST_F(RowsTest, ColumnMissingFromTheDefinitionFailsTheRowEvenWhenItIsNull) {
    Open(kItem, "id, name, more");
    ExpectStoppedSave({Check("!jType.isMember(strName)"), Check(kFieldFailed),
                       Plain("column_name[2]=more"), Plain("column_value[2]=(null)"),
                       Check(kRowFailed)});
}

TEST_F(RowsTest, FirstColumnMissingFromTheDefinitionLogsNoNameAndValue) {
    Open(kItem, "more DEFAULT 'm', id, name");
    ExpectStoppedSave({Check("!jType.isMember(strName)"), Check(kFieldFailed), Check(kRowFailed)});
    EXPECT_EQ(All(), "m|1|a");
}

TEST_F(RowsTest, NullArrayBecomesAnArrayWithTheFirstRowOnly) {
    Open("a:int");
    Json::Value jRows;
    EXPECT_EQ(List(jRows), 0);
    EXPECT_TRUE(jRows.isNull());
    Sql("INSERT INTO t VALUES (1)");
    EXPECT_EQ(List(jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"a":1}])");
}

TEST_F(RowsTest, ColumnsMayComeInAnyOrderAndNullAtAnyPlace) {
    Open("z:int,a:string,\xC3\xBC:bool,a1:long long,B:int");
    Sql("INSERT INTO t VALUES (1, 'x', 1, 2, 3), (NULL, 'x', 1, 2, 3), (1, NULL, 1, 2, 3), (1, "
        "'x', NULL, 2, 3), "
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
        EXPECT_EQ(
            m_pHandle->runSqlEx("SELECT " + std::string(szColumns) + " FROM t", fnCallback, &jRows),
            0);
        EXPECT_EQ(jRows, jExpected) << szColumns;
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RowsTest, ManyTablesEachKeepTheirOwnTypes) {
    const std::pair<const char*, const char*> aTypes[] = {
        {"string", "\"1\""}, {"int", "1"}, {"bool", "true"}};
    std::vector<std::unique_ptr<VornJsonDbApi>> vecHandles;
    for (size_t i = 0; i < 300; ++i) {
        const std::string strTable = "t" + std::to_string(i);
        const std::string strMembers = std::string("a:") + aTypes[i % 3].first + ",b:int";
        vecHandles.push_back(NewHandle(
            m_pDb, strTable, Definition(strTable, strMembers),
            "CREATE TABLE " + strTable + " AS SELECT 1 AS a, " + std::to_string(i) + " AS b"));
    }
    for (size_t i = 0; i < 600; ++i) {
        Json::Value jNoQuery;
        Json::Value jRows;
        EXPECT_EQ(vecHandles[i % 300]->recList(jNoQuery, jRows), 0);
        EXPECT_EQ(Compact(jRows), "[{\"a\":" + std::string(aTypes[i % 3].second) +
                                      ",\"b\":" + std::to_string(i % 300) + "}]");
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RowsTest, RecordsAreTheCallersToChangeAndToKeep) {
    Open("a:int,b:Json::Value");
    Sql("INSERT INTO t VALUES (1, '{\"x\":[1]}'), (2, '{\"x\":[1]}')");
    Json::Value jRows = Listed();
    jRows[0]["b"]["x"][0] = 9;
    jRows[0]["a"] = "text";
    jRows[0]["c"] = 3;
    jRows[0].removeMember("b");
    EXPECT_EQ(Compact(jRows), R"([{"a":"text","c":3},{"a":2,"b":{"x":[1]}}])");
    EXPECT_EQ(Compact(Listed()), R"([{"a":1,"b":{"x":[1]}},{"a":2,"b":{"x":[1]}}])");
    Sql("DROP TABLE t");
    m_pHandle.reset();
    EXPECT_EQ(Compact(jRows), R"([{"a":"text","c":3},{"a":2,"b":{"x":[1]}}])");
}

TEST_F(RowsTest, LargeNumberOfRowsKeepsItsOrder) {
    Open("a:int");
    Sql("WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n WHERE i < 2000) INSERT "
        "INTO t SELECT i FROM n");
    const Json::Value jRows = Listed();
    ASSERT_EQ(jRows.size(), 2000U);
    for (Json::ArrayIndex i = 0; i < 2000; ++i) {
        ASSERT_EQ(jRows[i]["a"].asInt(), static_cast<int>(i + 1));
    }
}
