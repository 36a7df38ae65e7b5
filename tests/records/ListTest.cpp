// recList: one SELECT for a query object, every row appended as a typed record.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

const char kExpand[] = "0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)";
const char kQueryKind[] =
    "jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue";
const char kOutKind[] =
    "jRecArrayOut.type() != Json::nullValue && jRecArrayOut.type() != Json::arrayValue";

class List : public TableTest {
  protected:
    // Three rows: 1|a, 2|b, 3|c.
    void SetUp() override {
        TableTest::SetUp();
        Sql("insert into t values (1,'a'),(2,'b'),(3,'c');");
    }

    std::string Select(const std::string& strRest) { return "SELECT id,name FROM t " + strRest; }

    // The rows for a query as JSON text; the one statement run is left for TakeSql.
    std::string Listed(const Json::Value& jGiven) {
        Json::Value jQuery = jGiven;
        Json::Value jRows;
        EXPECT_EQ(m_pHandle->recList(jQuery, jRows), 0);
        EXPECT_EQ(jQuery, jGiven);
        EXPECT_EQ(TakeLog(), Lines());
        return Compact(jRows);
    }

    std::string Listed(const char* szQuery) { return Listed(ParseJson(szQuery)); }

    void ExpectRefused(const char* szQuery, const Lines& vecHead, const Lines& vecTail = {}) {
        Json::Value jQuery = ParseJson(szQuery);
        Json::Value jRows = ParseJson("[0]");
        EXPECT_EQ(m_pHandle->recList(jQuery, jRows), -1);
        Lines vecExpected = vecHead;
        vecExpected.push_back(Plain(std::string("jRecParam=") + szQuery));
        vecExpected.insert(vecExpected.end(), vecTail.begin(), vecTail.end());
        EXPECT_EQ(TakeLog(), vecExpected);
        EXPECT_EQ(Compact(jRows), "[0]");
    }

    void ExpectSqlFailure(const char* szQuery, const std::string& strError,
                          const std::string& strSql) {
        ExpectRefused(szQuery, {RunFailed(strError, strSql), Check(kListFailed)},
                      {SqlError(strError, strSql)});
        EXPECT_EQ(TakeSql(), Lines{strSql});
    }
};

const char kAll[] = R"([{"id":1,"name":"a"},{"id":2,"name":"b"},{"id":3,"name":"c"}])";

}  // namespace

TEST_F(List, NullOrEmptyQueryListsTheWholeTable) {
    EXPECT_EQ(Listed("null"), kAll);
    EXPECT_EQ(Listed("{}"), kAll);
    EXPECT_EQ(TakeSql(), (Lines{Select(";"), Select(";")}));
}

TEST_F(List, ColumnsAreThoseOfTheDefinitionInNameOrder) {
    Open("b:int,a:int", "b,extra,a");
    Sql("insert into t values (1,'e',2);");
    EXPECT_EQ(Listed("null"), R"([{"a":2,"b":1}])");
    EXPECT_EQ(TakeSql(), Lines{"SELECT a,b FROM t ;"});
}

TEST_F(List, ConditionStandsBehindTwoBlanks) {
    EXPECT_EQ(Listed(R"({"name":"b"})"), R"([{"id":2,"name":"b"}])");
    EXPECT_EQ(TakeSql(), Lines{Select(" WHERE  (name='b' );")});
}

TEST_F(List, SeveralConditionsAreJoinedByAnd) {
    EXPECT_EQ(Listed(R"({"id":1,"name":"b"})"), "null");
    EXPECT_EQ(TakeSql(), Lines{Select(" WHERE  (id=1 and name='b' );")});
}

TEST_F(List, SortAndLimitAloneStandBehindTwoBlanksWithoutWhere) {
    Json::Value jRows;
    Json::Value jQuery = ParseJson(R"({"sort_by":"id","limit":2})");
    EXPECT_EQ(m_pHandle->recList(jQuery, jRows), 0);
    EXPECT_EQ(jRows.size(), 2U);
    EXPECT_EQ(TakeSql(), Lines{Select(" order by 'id' LIMIT 2;")});
}

TEST_F(List, EveryPieceTogether) {
    Listed(R"({"limit":1,"name":"b","offset":0,"sort_by":"id","sort_direction":"desc",
                    "vornSqlWhereFilter":"id > 1"})");
    EXPECT_EQ(
        TakeSql(),
        Lines{Select(" WHERE  (name='b' and  id > 1  ) order by 'id' DESC LIMIT 1 OFFSET 0;")});
}

TEST_F(List, LimitAndOffsetPageTheRows) {
    EXPECT_EQ(Listed(R"({"limit":1,"offset":1})"), R"([{"id":2,"name":"b"}])");
    EXPECT_EQ(TakeSql(), Lines{Select(" LIMIT 1 OFFSET 1;")});
}

TEST_F(List, OffsetWithoutLimitHasNoEffect) {
    EXPECT_EQ(Listed(R"({"offset":1})"), kAll);
    EXPECT_EQ(TakeSql(), Lines{Select(";")});
}

TEST_F(List, LimitGivenAsTextReachesSqliteInDoubleQuotes) {
    Json::Value jQuery = ParseJson(R"({"limit":"2"})");
    Json::Value jRows;
    m_pHandle->recList(jQuery, jRows);
    EXPECT_EQ(TakeSql(), Lines{Select(" LIMIT \"2\";")});
    TakeLog();
}

TEST_F(List, SortTermIsAConstantSoTheDirectionDoesNotOrderTheRows) {
    EXPECT_EQ(Listed(R"({"sort_by":"id","sort_direction":"desc"})"), kAll);
    EXPECT_EQ(TakeSql(), Lines{Select(" order by 'id' DESC;")});
}

TEST_F(List, RawFilterSelectsRows) {
    EXPECT_EQ(Listed(R"({"vornSqlWhereFilter":"id > 1"})"),
              R"([{"id":2,"name":"b"},{"id":3,"name":"c"}])");
    EXPECT_EQ(TakeSql(), Lines{Select(" WHERE  ( id > 1  );")});
}

TEST_F(List, OneElementListSelectsAndTwoRunTogether) {
    Sql("insert into t values (12,'a''b');");
    EXPECT_EQ(Listed(R"({"name":["a"]})"), R"([{"id":1,"name":"a"}])");
    EXPECT_EQ(Listed(R"({"name":["a","b"]})"), R"([{"id":12,"name":"a'b"}])");
    EXPECT_EQ(Listed(R"({"id":[1,2]})"), R"([{"id":12,"name":"a'b"}])");
    EXPECT_EQ(TakeSql(),
              (Lines{Select(" WHERE  (name in ('a' ) );"), Select(" WHERE  (name in ('a''b' ) );"),
                     Select(" WHERE  (id in (12 ) );")}));
}

TEST_F(List, JoinerLeftByAnEmptyListIsRejectedBySqlite) {
    ExpectSqlFailure(R"({"id":[],"name":"a"})", "near \"and\": syntax error",
                     Select(" WHERE  ( and name='a' );"));
    ExpectSqlFailure(R"({"id":1,"name":[]})", "near \")\": syntax error",
                     Select(" WHERE  (id=1 and  );"));
}

TEST_F(List, EmptyListAloneIsRejectedBySqlite) {
    ExpectSqlFailure(R"({"name":[]})", "near \")\": syntax error", Select(" WHERE  ( );"));
}

TEST_F(List, RowsAreAppendedBehindThoseAlreadyThere) {
    Json::Value jQuery;
    Json::Value jRows = ParseJson(R"(["old",{"id":0}])");
    EXPECT_EQ(m_pHandle->recList(jQuery, jRows), 0);
    EXPECT_EQ(Compact(jRows),
              R"(["old",{"id":0},{"id":1,"name":"a"},{"id":2,"name":"b"},{"id":3,"name":"c"}])");
    EXPECT_EQ(m_pHandle->recList(jQuery, jRows), 0);
    EXPECT_EQ(jRows.size(), 8U);
}

TEST_F(List, OutputKeepsItsKindWhenNoRowMatches) {
    Json::Value jQuery = ParseJson(R"({"id":99})");
    Json::Value jNull;
    Json::Value jArray(Json::arrayValue);
    EXPECT_EQ(m_pHandle->recList(jQuery, jNull), 0);
    EXPECT_EQ(m_pHandle->recList(jQuery, jArray), 0);
    EXPECT_TRUE(jNull.isNull());
    EXPECT_EQ(Compact(jArray), "[]");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(List, SameNullObjectAsQueryAndOutputBecomesTheRows) {
    Json::Value jBoth;
    EXPECT_EQ(m_pHandle->recList(jBoth, jBoth), 0);
    EXPECT_EQ(Compact(jBoth), kAll);
}

TEST_F(List, QueryOfAWrongKindRunsNothing) {
    for (const char* szQuery : {"[]", "[1]", "\"name\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szQuery);
        ExpectRefused(szQuery, {Check(kQueryKind)});
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(List, OutputOfAWrongKindRunsNothing) {
    for (const char* szOut : {"{}", "{\"id\":1}", "\"text\"", "7", "1.5", "false"}) {
        SCOPED_TRACE(szOut);
        Json::Value jQuery = ParseJson(R"({"id":1})");
        Json::Value jOut = ParseJson(szOut);
        EXPECT_EQ(m_pHandle->recList(jQuery, jOut), -1);
        EXPECT_EQ(TakeLog(), (Lines{Check(kOutKind), Plain(R"(jRecParam={"id":1})")}));
        EXPECT_EQ(Compact(jOut), szOut);
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(List, KindOfTheQueryIsCheckedBeforeTheOutput) {
    Json::Value jQuery = ParseJson("[1]");
    Json::Value jOut = ParseJson("{}");
    EXPECT_EQ(m_pHandle->recList(jQuery, jOut), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check(kQueryKind), Plain("jRecParam=[1]")}));
}

TEST_F(List, KindOfTheOutputIsCheckedBeforeTheCondition) {
    Json::Value jQuery = ParseJson(R"({"vornSqlWhereFilter":5})");
    Json::Value jOut = ParseJson("{}");
    EXPECT_EQ(m_pHandle->recList(jQuery, jOut), -1);
    EXPECT_EQ(TakeLog(), (Lines{Check(kOutKind), Plain(R"(jRecParam={"vornSqlWhereFilter":5})")}));
}

TEST_F(List, ConditionIsBuiltBeforeTheSortTerm) {
    ExpectRefused(R"({"sort_by":7,"vornSqlWhereFilter":5})",
                  {Check("!jRecParam[jmFieldName[i]].isString()"), Check(kExpand)});
}

TEST_F(List, RefusedConditionRunsNothing) {
    ExpectRefused(R"({"vornSqlWhereFilter":5})",
                  {Check("!jRecParam[jmFieldName[i]].isString()"), Check(kExpand)});
    ExpectRefused(
        R"({"id":{}})",
        {Check(R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))"),
         Check("0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)"), Check(kExpand)});
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(List, RefusedSortTermRunsNothing) {
    ExpectRefused(
        R"({"sort_by":7})",
        {Check("!szSql"), Check("0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit)")});
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(Listed("{}"), kAll);
}

TEST_F(List, EarlierErrorTextShowsWithAnEmptyStatementInTheTail) {
    MakeStaleError();
    ExpectRefused("[]", {Check(kQueryKind)}, {SqlError("no such column: stale", "")});
    ExpectRefused(
        R"({"sort_by":7})",
        {Check("!szSql"), Check("0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit)")},
        {SqlError("no such column: stale", "")});
    EXPECT_EQ(Listed("{}"), kAll);
    ExpectRefused("[]", {Check(kQueryKind)});
}

TEST_F(List, StatementThatSqliteRejectsIsReportedWhole) {
    ExpectSqlFailure(R"({"vornSqlWhereFilter":"nonsense = 1"})", "no such column: nonsense",
                     Select(" WHERE  ( nonsense = 1  );"));
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
}

TEST_F(List, RowsBeforeAFailingRowStay) {
    Open("a:int,b:double");
    Sql("insert into t values (1,null),(2,2.5),(3,null);");
    Json::Value jQuery(Json::objectValue);
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->recList(jQuery, jRows), -1);
    const std::string strSql = "SELECT a,b FROM t ;";
    EXPECT_EQ(TakeLog(),
              (Lines{Located("type error, strType=double"), Check(kFieldFailed),
                     Plain("column_name[1]=b"), Plain("column_value[1]=2.5"), Check(kRowFailed),
                     RunFailed("query aborted", strSql), Check(kListFailed), Plain("jRecParam={}"),
                     SqlError("query aborted", strSql)}));
    EXPECT_EQ(Compact(jRows), R"([{"a":1}])");
}

TEST_F(List, EveryTypeReadsItsColumnInItsOwnWay) {
    struct Case {
        const char* szType;
        const char* szStored;  // SQL literal
        const char* szRecord;
    };
    const Case kCases[] = {
        {"string", "'7'", R"({"m":"7"})"},
        {"string", "7", R"({"m":"7"})"},
        {"string", "''", R"({"m":""})"},
        {"int", "'-7'", R"({"m":-7})"},
        {"int", "' 12ab'", R"({"m":12})"},
        {"int", "'none'", R"({"m":0})"},
        {"int", "1.9", R"({"m":1})"},
        {"unsigned int", "7", R"({"m":7})"},
        {"unsigned int", "-7", R"({"m":-7})"},
        {"long long", "9223372036854775807", R"({"m":9223372036854775807})"},
        {"long long", "-9223372036854775808", R"({"m":-9223372036854775808})"},
        {"unsigned long long", "'18446744073709551615'", R"({"m":9223372036854775807})"},
        {"Json::Value", "'[1,{\"a\":null}]'", R"({"m":[1,{"a":null}]})"},
        {"Json::objectValue", "'{\"a\":1}'", R"({"m":{"a":1}})"},
        {"Json::arrayValue", "'[]'", R"({"m":[]})"},
        {"bool", "1", R"({"m":true})"},
        {"bool", "0", R"({"m":false})"},
        {"bool", "2", R"({"m":false})"},
        {"bool", "'true'", R"({"m":false})"},
    };
    for (const Case& oneCase : kCases) {
        SCOPED_TRACE(std::string(oneCase.szType) + " " + oneCase.szStored);
        Open(std::string("m:") + oneCase.szType);
        Sql("insert into t values (" + std::string(oneCase.szStored) + "),(null);");
        EXPECT_EQ(Listed("null"), "[" + std::string(oneCase.szRecord) + ",{}]");
    }
}

TEST_F(List, OtherTypesCannotBeReadBackUnlessTheColumnIsNull) {
    for (const char* szType : {"long", "unsigned long", "unsigned", "double", "float", "uid_t",
                               "time_t", "Int", "", "nonsense"}) {
        SCOPED_TRACE(szType);
        Open(std::string("m:") + szType);
        Sql("insert into t values (null);");
        EXPECT_EQ(Listed("null"), "[{}]");
        Sql("update t set m = 1;");
        Json::Value jQuery;
        Json::Value jRows;
        EXPECT_EQ(m_pHandle->recList(jQuery, jRows), -1);
        EXPECT_TRUE(jRows.isNull());
        EXPECT_EQ(TakeLog().at(0), Located(std::string("type error, strType=") + szType));
    }
}

TEST_F(List, MemberNamedLimitIsConditionAndPageAtOnce) {
    Open("\"limit\":int,limit:int", "\"limit\"");
    Json::Value jQuery = ParseJson(R"({"limit":1})");
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->recList(jQuery, jRows), -1);
    EXPECT_EQ(TakeSql(), Lines{"SELECT \"limit\",limit FROM t  WHERE  (limit=1 ) LIMIT 1;"});
    TakeLog();
}

TEST_F(List, ApostrophesAndForeignLettersMatch) {
    Sql(u8"update t set name = 'O''Neil ☂ 100% %s' where id = 2;");
    Json::Value jQuery(Json::objectValue);
    jQuery["name"] = u8"O'Neil ☂ 100% %s";
    EXPECT_EQ(Listed(jQuery), u8R"([{"id":2,"name":"O'Neil ☂ 100% %s"}])");
}

TEST_F(List, TextOfAMillionBytesMatches) {
    Sql("update t set name = '" + LongText() + "' where id = 3;");
    Json::Value jQuery(Json::objectValue);
    jQuery["name"] = LongText();
    EXPECT_TRUE(R"([{"id":3,"name":")" + LongText() + R"("}])" == Listed(jQuery));
}

TEST_F(List, DefinitionWithoutTheTableSelectsNoColumns) {
    OpenDefinition(ParseJson(R"({"other":1})"), "CREATE TABLE t (id)");
    Json::Value jQuery;
    Json::Value jRows;
    EXPECT_EQ(m_pHandle->recList(jQuery, jRows), -1);
    EXPECT_EQ(TakeSql(), Lines{"SELECT  FROM t ;"});
    EXPECT_EQ(TakeLog().at(0), UtilCheck("!jTableDef.isMember(strJsonName)"));
}
