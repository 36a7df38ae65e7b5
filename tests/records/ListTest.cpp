// recList: one SELECT for a query object, every row appended as a typed record.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

const char kRun[] = "0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)";
const char kExpand[] = "0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)";
const char kQueryKind[] =
    "jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue";
const char kOutKind[] =
    "jRecArrayOut.type() != Json::nullValue && jRecArrayOut.type() != Json::arrayValue";

class List : public FreshTableTest {
  protected:
    // Three rows: 1|a, 2|b, 3|c.
    VornJsonDbApi& OpenItem() {
        VornJsonDbApi& api = Open("id:int,name:string", "id integer primary key,name text");
        Sql("insert into " + m_strTable + " values (1,'a'),(2,'b'),(3,'c');");
        return api;
    }

    std::string Select(const std::string& strRest) {
        return "SELECT id,name FROM " + m_strTable + " " + strRest;
    }

    // The rows for a query as JSON text; the one statement run is left for TakeSql.
    std::string Listed(VornJsonDbApi& api, const Json::Value& jGiven) {
        Json::Value jQuery = jGiven;
        Json::Value jRows;
        EXPECT_EQ(0, api.recList(jQuery, jRows));
        EXPECT_EQ(jGiven, jQuery);
        EXPECT_EQ(Lines{}, TakeLog());
        return Compact(jRows);
    }

    std::string Listed(VornJsonDbApi& api, const char* szQuery) {
        return Listed(api, ParseJson(szQuery));
    }

    void ExpectRefused(VornJsonDbApi& api, const char* szQuery, const Lines& vecHead,
                       const Lines& vecTail = {}) {
        Json::Value jQuery = ParseJson(szQuery);
        Json::Value jRows = ParseJson("[0]");
        EXPECT_EQ(-1, api.recList(jQuery, jRows));
        Lines vecExpected = vecHead;
        vecExpected.push_back(Plain(std::string("jRecParam=") + szQuery));
        vecExpected.insert(vecExpected.end(), vecTail.begin(), vecTail.end());
        EXPECT_EQ(vecExpected, TakeLog());
        EXPECT_EQ("[0]", Compact(jRows));
    }

    void ExpectSqlFailure(VornJsonDbApi& api, const char* szQuery, const std::string& strError,
                          const std::string& strSql) {
        ExpectRefused(api, szQuery, {RunFailed(strError, strSql), Check(kRun)},
                      {SqlError(strError, strSql)});
        EXPECT_EQ(Lines{strSql}, TakeSql());
    }
};

const char kAll[] = R"([{"id":1,"name":"a"},{"id":2,"name":"b"},{"id":3,"name":"c"}])";

}  // namespace

TEST_F(List, NullOrEmptyQueryListsTheWholeTable) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(kAll, Listed(api, "null"));
    EXPECT_EQ(kAll, Listed(api, "{}"));
    EXPECT_EQ((Lines{Select(";"), Select(";")}), TakeSql());
}

TEST_F(List, ColumnsAreThoseOfTheDefinitionInNameOrder) {
    VornJsonDbApi& api = Open("b:int,a:int", "b,extra,a");
    Sql("insert into " + m_strTable + " values (1,'e',2);");
    EXPECT_EQ(R"([{"a":2,"b":1}])", Listed(api, "null"));
    EXPECT_EQ(Lines{"SELECT a,b FROM " + m_strTable + " ;"}, TakeSql());
}

TEST_F(List, ConditionStandsBehindTwoBlanks) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"([{"id":2,"name":"b"}])", Listed(api, R"({"name":"b"})"));
    EXPECT_EQ(Lines{Select(" WHERE  (name='b' );")}, TakeSql());
}

TEST_F(List, SeveralConditionsAreJoinedByAnd) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ("null", Listed(api, R"({"id":1,"name":"b"})"));
    EXPECT_EQ(Lines{Select(" WHERE  (id=1 and name='b' );")}, TakeSql());
}

TEST_F(List, SortAndLimitAloneStandBehindTwoBlanksWithoutWhere) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jRows;
    Json::Value jQuery = ParseJson(R"({"sort_by":"id","limit":2})");
    EXPECT_EQ(0, api.recList(jQuery, jRows));
    EXPECT_EQ(2U, jRows.size());
    EXPECT_EQ(Lines{Select(" order by 'id' LIMIT 2;")}, TakeSql());
}

TEST_F(List, EveryPieceTogether) {
    VornJsonDbApi& api = OpenItem();
    Listed(api, R"({"limit":1,"name":"b","offset":0,"sort_by":"id","sort_direction":"desc",
                    "vornSqlWhereFilter":"id > 1"})");
    EXPECT_EQ(
        Lines{Select(" WHERE  (name='b' and  id > 1  ) order by 'id' DESC LIMIT 1 OFFSET 0;")},
        TakeSql());
}

TEST_F(List, LimitAndOffsetPageTheRows) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"([{"id":2,"name":"b"}])", Listed(api, R"({"limit":1,"offset":1})"));
    EXPECT_EQ(Lines{Select(" LIMIT 1 OFFSET 1;")}, TakeSql());
}

TEST_F(List, OffsetWithoutLimitHasNoEffect) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(kAll, Listed(api, R"({"offset":1})"));
    EXPECT_EQ(Lines{Select(";")}, TakeSql());
}

TEST_F(List, LimitGivenAsTextReachesSqliteInDoubleQuotes) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jQuery = ParseJson(R"({"limit":"2"})");
    Json::Value jRows;
    api.recList(jQuery, jRows);
    EXPECT_EQ(Lines{Select(" LIMIT \"2\";")}, TakeSql());
    TakeLog();
}

TEST_F(List, SortTermIsAConstantSoTheDirectionDoesNotOrderTheRows) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(kAll, Listed(api, R"({"sort_by":"id","sort_direction":"desc"})"));
    EXPECT_EQ(Lines{Select(" order by 'id' DESC;")}, TakeSql());
}

TEST_F(List, RawFilterSelectsRows) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"([{"id":2,"name":"b"},{"id":3,"name":"c"}])",
              Listed(api, R"({"vornSqlWhereFilter":"id > 1"})"));
    EXPECT_EQ(Lines{Select(" WHERE  ( id > 1  );")}, TakeSql());
}

TEST_F(List, OneElementListSelectsAndTwoRunTogether) {
    VornJsonDbApi& api = OpenItem();
    Sql("insert into " + m_strTable + " values (12,'a''b');");
    EXPECT_EQ(R"([{"id":1,"name":"a"}])", Listed(api, R"({"name":["a"]})"));
    EXPECT_EQ(R"([{"id":12,"name":"a'b"}])", Listed(api, R"({"name":["a","b"]})"));
    EXPECT_EQ(R"([{"id":12,"name":"a'b"}])", Listed(api, R"({"id":[1,2]})"));
    EXPECT_EQ((Lines{Select(" WHERE  (name in ('a' ) );"), Select(" WHERE  (name in ('a''b' ) );"),
                     Select(" WHERE  (id in (12 ) );")}),
              TakeSql());
}

TEST_F(List, JoinerLeftByAnEmptyListIsRejectedBySqlite) {
    VornJsonDbApi& api = OpenItem();
    ExpectSqlFailure(api, R"({"id":[],"name":"a"})", "near \"and\": syntax error",
                     Select(" WHERE  ( and name='a' );"));
    ExpectSqlFailure(api, R"({"id":1,"name":[]})", "near \")\": syntax error",
                     Select(" WHERE  (id=1 and  );"));
}

TEST_F(List, EmptyListAloneIsRejectedBySqlite) {
    VornJsonDbApi& api = OpenItem();
    ExpectSqlFailure(api, R"({"name":[]})", "near \")\": syntax error", Select(" WHERE  ( );"));
}

TEST_F(List, RowsAreAppendedBehindThoseAlreadyThere) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jQuery;
    Json::Value jRows = ParseJson(R"(["old",{"id":0}])");
    EXPECT_EQ(0, api.recList(jQuery, jRows));
    EXPECT_EQ(R"(["old",{"id":0},{"id":1,"name":"a"},{"id":2,"name":"b"},{"id":3,"name":"c"}])",
              Compact(jRows));
    EXPECT_EQ(0, api.recList(jQuery, jRows));
    EXPECT_EQ(8U, jRows.size());
}

TEST_F(List, OutputKeepsItsKindWhenNoRowMatches) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jQuery = ParseJson(R"({"id":99})");
    Json::Value jNull;
    Json::Value jArray(Json::arrayValue);
    EXPECT_EQ(0, api.recList(jQuery, jNull));
    EXPECT_EQ(0, api.recList(jQuery, jArray));
    EXPECT_TRUE(jNull.isNull());
    EXPECT_EQ("[]", Compact(jArray));
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(List, SameNullObjectAsQueryAndOutputBecomesTheRows) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jBoth;
    EXPECT_EQ(0, api.recList(jBoth, jBoth));
    EXPECT_EQ(kAll, Compact(jBoth));
}

TEST_F(List, QueryOfAWrongKindRunsNothing) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szQuery : {"[]", "[1]", "\"name\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szQuery);
        ExpectRefused(api, szQuery, {Check(kQueryKind)});
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(List, OutputOfAWrongKindRunsNothing) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szOut : {"{}", "{\"id\":1}", "\"text\"", "7", "1.5", "false"}) {
        SCOPED_TRACE(szOut);
        Json::Value jQuery = ParseJson(R"({"id":1})");
        Json::Value jOut = ParseJson(szOut);
        EXPECT_EQ(-1, api.recList(jQuery, jOut));
        EXPECT_EQ((Lines{Check(kOutKind), Plain(R"(jRecParam={"id":1})")}), TakeLog());
        EXPECT_EQ(szOut, Compact(jOut));
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(List, KindOfTheQueryIsCheckedBeforeTheOutput) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jQuery = ParseJson("[1]");
    Json::Value jOut = ParseJson("{}");
    EXPECT_EQ(-1, api.recList(jQuery, jOut));
    EXPECT_EQ((Lines{Check(kQueryKind), Plain("jRecParam=[1]")}), TakeLog());
}

TEST_F(List, KindOfTheOutputIsCheckedBeforeTheCondition) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jQuery = ParseJson(R"({"vornSqlWhereFilter":5})");
    Json::Value jOut = ParseJson("{}");
    EXPECT_EQ(-1, api.recList(jQuery, jOut));
    EXPECT_EQ((Lines{Check(kOutKind), Plain(R"(jRecParam={"vornSqlWhereFilter":5})")}), TakeLog());
}

TEST_F(List, ConditionIsBuiltBeforeTheSortTerm) {
    VornJsonDbApi& api = OpenItem();
    ExpectRefused(api, R"({"sort_by":7,"vornSqlWhereFilter":5})",
                  {Check("!jRecParam[jmFieldName[i]].isString()"), Check(kExpand)});
}

TEST_F(List, RefusedConditionRunsNothing) {
    VornJsonDbApi& api = OpenItem();
    ExpectRefused(api, R"({"vornSqlWhereFilter":5})",
                  {Check("!jRecParam[jmFieldName[i]].isString()"), Check(kExpand)});
    ExpectRefused(
        api, R"({"id":{}})",
        {Check(R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))"),
         Check("0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)"), Check(kExpand)});
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(List, RefusedSortTermRunsNothing) {
    VornJsonDbApi& api = OpenItem();
    ExpectRefused(
        api, R"({"sort_by":7})",
        {Check("!szSql"), Check("0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit)")});
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ(kAll, Listed(api, "{}"));
}

TEST_F(List, EarlierErrorTextShowsWithAnEmptyStatementInTheTail) {
    VornJsonDbApi& api = OpenItem();
    MakeStaleError(api);
    ExpectRefused(api, "[]", {Check(kQueryKind)}, {SqlError("no such column: stale", "")});
    EXPECT_EQ(kAll, Listed(api, "{}"));
    ExpectRefused(api, "[]", {Check(kQueryKind)});
}

TEST_F(List, StatementThatSqliteRejectsIsReportedWhole) {
    VornJsonDbApi& api = OpenItem();
    ExpectSqlFailure(api, R"({"vornSqlWhereFilter":"nonsense = 1"})", "no such column: nonsense",
                     Select(" WHERE  ( nonsense = 1  );"));
    EXPECT_EQ("", api.getErrMsg());
}

TEST_F(List, RowsBeforeAFailingRowStay) {
    VornJsonDbApi& api = Open("a:int,b:double");
    Sql("insert into " + m_strTable + " values (1,null),(2,2.5),(3,null);");
    Json::Value jQuery(Json::objectValue);
    Json::Value jRows;
    EXPECT_EQ(-1, api.recList(jQuery, jRows));
    const std::string strSql = "SELECT a,b FROM " + m_strTable + " ;";
    EXPECT_EQ(
        (Lines{Located("type error, strType=double"),
               Check("0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))"),
               Plain("column_name[1]=b"), Plain("column_value[1]=2.5"),
               Check("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)"),
               RunFailed("query aborted", strSql), Check(kRun), Plain("jRecParam={}"),
               SqlError("query aborted", strSql)}),
        TakeLog());
    EXPECT_EQ(R"([{"a":1}])", Compact(jRows));
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
        VornJsonDbApi& api = Open(std::string("m:") + oneCase.szType);
        Sql("insert into " + m_strTable + " values (" + oneCase.szStored + "),(null);");
        EXPECT_EQ("[" + std::string(oneCase.szRecord) + ",{}]", Listed(api, "null"));
    }
}

TEST_F(List, OtherTypesCannotBeReadBackUnlessTheColumnIsNull) {
    for (const char* szType : {"long", "unsigned long", "unsigned", "double", "float", "uid_t",
                               "time_t", "Int", "", "nonsense"}) {
        SCOPED_TRACE(szType);
        VornJsonDbApi& api = Open(std::string("m:") + szType);
        Sql("insert into " + m_strTable + " values (null);");
        EXPECT_EQ("[{}]", Listed(api, "null"));
        Sql("update " + m_strTable + " set m = 1;");
        Json::Value jQuery;
        Json::Value jRows;
        EXPECT_EQ(-1, api.recList(jQuery, jRows));
        EXPECT_TRUE(jRows.isNull());
        EXPECT_EQ(Located(std::string("type error, strType=") + szType), TakeLog().at(0));
    }
}

TEST_F(List, MemberNamedLimitIsConditionAndPageAtOnce) {
    VornJsonDbApi& api = Open("\"limit\":int,limit:int", "\"limit\"");
    Json::Value jQuery = ParseJson(R"({"limit":1})");
    Json::Value jRows;
    EXPECT_EQ(-1, api.recList(jQuery, jRows));
    EXPECT_EQ(Lines{"SELECT \"limit\",limit FROM " + m_strTable + "  WHERE  (limit=1 ) LIMIT 1;"},
              TakeSql());
    TakeLog();
}

TEST_F(List, ApostrophesAndForeignLettersMatch) {
    VornJsonDbApi& api = OpenItem();
    Sql(u8"update " + m_strTable + u8" set name = 'O''Neil ☂ 100% %s' where id = 2;");
    Json::Value jQuery(Json::objectValue);
    jQuery["name"] = u8"O'Neil ☂ 100% %s";
    EXPECT_EQ(u8R"([{"id":2,"name":"O'Neil ☂ 100% %s"}])", Listed(api, jQuery));
}

TEST_F(List, TextOfAMillionBytesMatches) {
    VornJsonDbApi& api = OpenItem();
    Sql("update " + m_strTable + " set name = '" + LongText() + "' where id = 3;");
    Json::Value jQuery(Json::objectValue);
    jQuery["name"] = LongText();
    EXPECT_TRUE(R"([{"id":3,"name":")" + LongText() + R"("}])" == Listed(api, jQuery));
}

TEST_F(List, DefinitionWithoutTheTableSelectsNoColumns) {
    VornJsonDbApi& api = OpenAs(UniqueTable(), ParseJson(R"({"other":1})"), "id");
    Json::Value jQuery;
    Json::Value jRows;
    EXPECT_EQ(-1, api.recList(jQuery, jRows));
    EXPECT_EQ(Lines{"SELECT  FROM " + m_strTable + " ;"}, TakeSql());
    EXPECT_EQ(UtilCheck("!jTableDef.isMember(strJsonName)"), TakeLog().at(0));
}

}  // namespace testhost
