// recDelete and recDeleteAll: rows removed by a query object, and how many.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

const char kExpand[] = "0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)";

class Delete : public FreshTableTest {
  protected:
    // Rows 1|a, 2|b, 3|a and so on up to nRows.
    VornJsonDbApi& OpenItem(int nRows) {
        VornJsonDbApi& api = Open("id:int,name:string", "id integer primary key,name text");
        for (int i = 1; i <= nRows; ++i) {
            Sql("insert into " + m_strTable + " values (" + std::to_string(i) + ",'" +
                (i % 2 == 1 ? "a" : "b") + "');");
        }
        return api;
    }

    void Deletes(VornJsonDbApi& api, const char* szQuery, bool blAllowAll, int nResult,
                 const Lines& vecLines = {}) {
        Json::Value jQuery = ParseJson(szQuery);
        EXPECT_EQ(nResult, api.recDelete(jQuery, blAllowAll));
        EXPECT_EQ(ParseJson(szQuery), jQuery);
        EXPECT_EQ(vecLines, TakeLog());
    }

    std::string Statement(const std::string& strRest) {
        return "DELETE FROM " + m_strTable + " " + strRest + ";";
    }

    Lines SqlFailure(const std::string& strError, const std::string& strSql) {
        return {RunFailed(strError, strSql), Check("0 > (err = runSqlEx(strSqlRun))"),
                SqlError(strError, strSql)};
    }
};

}  // namespace

TEST_F(Delete, QueryWithoutConditionIsRefused) {
    VornJsonDbApi& api = OpenItem(3);
    Deletes(api, "{}", false, -1, {Check("strSql.empty()")});
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ("3", Count());
}

TEST_F(Delete, PermissionIsNotGivenByDefault) {
    VornJsonDbApi& api = OpenItem(3);
    Json::Value jQuery(Json::objectValue);
    EXPECT_EQ(-1, api.recDelete(jQuery));
    EXPECT_EQ(Lines{Check("strSql.empty()")}, TakeLog());
    EXPECT_EQ("3", Count());
}

TEST_F(Delete, QueryWithoutConditionEmptiesTheTableWithPermission) {
    VornJsonDbApi& api = OpenItem(7);
    Deletes(api, "{}", true, 7);
    EXPECT_EQ(Lines{Statement("")}, TakeSql());
    EXPECT_EQ("0", Count());
}

TEST_F(Delete, DeleteAllCountsTheRowsOfTheTable) {
    VornJsonDbApi& api = OpenItem(7);
    EXPECT_EQ(7, api.recDeleteAll());
    EXPECT_EQ(Lines{"DELETE FROM " + m_strTable + " ;"}, TakeSql());
    EXPECT_EQ("0", Count());
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(Delete, DeleteAllOnAnEmptyTableIsZero) {
    VornJsonDbApi& api = OpenItem(0);
    EXPECT_EQ(0, api.recDeleteAll());
    EXPECT_EQ(Lines{"DELETE FROM " + m_strTable + " ;"}, TakeSql());
}

TEST_F(Delete, QueryThatIsNoObjectIsRefusedEvenWithPermission) {
    VornJsonDbApi& api = OpenItem(2);
    for (const char* szQuery : {"null", "[]", "[{\"id\":1}]", "\"id\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szQuery);
        Deletes(api, szQuery, false, -1, {Check("jRecParam.type() != Json::objectValue")});
        Deletes(api, szQuery, true, -1, {Check("jRecParam.type() != Json::objectValue")});
    }
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ("2", Count());
}

TEST_F(Delete, ConditionCountsItsRows) {
    VornJsonDbApi& api = OpenItem(10);
    Sql("update " + m_strTable + " set name = 'x' where id in (2,5,9);");
    Deletes(api, R"({"name":"x"})", false, 3);
    EXPECT_EQ(Lines{Statement(" WHERE  (name='x' )")}, TakeSql());
    EXPECT_EQ("7", Count());
}

TEST_F(Delete, PermissionPlaysNoPartWhereConditionsExist) {
    VornJsonDbApi& api = OpenItem(4);
    Deletes(api, R"({"id":4})", true, 1);
    EXPECT_EQ(Lines{Statement(" WHERE  (id=4 )")}, TakeSql());
    EXPECT_EQ("3", Count());
}

TEST_F(Delete, NothingMatchedIsZero) {
    VornJsonDbApi& api = OpenItem(4);
    Deletes(api, R"({"id":99})", false, 0);
    EXPECT_EQ(1U, TakeSql().size());
}

TEST_F(Delete, SortAndPagingKeysAreNoConditions) {
    VornJsonDbApi& api = OpenItem(4);
    Deletes(api, R"({"limit":1})", false, -1, {Check("strSql.empty()")});
    Deletes(api, R"({"sort_by":"id"})", false, -1, {Check("strSql.empty()")});
    EXPECT_EQ(Lines{}, TakeSql());
    Deletes(api, R"({"limit":1,"sort_by":"id","offset":1})", true, 4);
    EXPECT_EQ(Lines{Statement("")}, TakeSql());
}

TEST_F(Delete, SortAndPagingKeysBesideAConditionHaveNoEffect) {
    VornJsonDbApi& api = OpenItem(4);
    Deletes(api, R"({"limit":1,"name":"a","sort_by":"id"})", false, 2);
    EXPECT_EQ(Lines{Statement(" WHERE  (name='a' )")}, TakeSql());
}

TEST_F(Delete, RawFilterAndListsSelectRows) {
    VornJsonDbApi& api = OpenItem(6);
    Deletes(api, R"({"name":["b"],"vornSqlWhereFilter":"id > 2"})", false, 2);
    EXPECT_EQ(Lines{Statement(" WHERE  (name in ('b' ) and  id > 2  )")}, TakeSql());
    EXPECT_EQ("1,2,3,5", Rows("select group_concat(id) from " + m_strTable + ";"));
}

TEST_F(Delete, ListThatDoesNotStoreItsFirstElementsSparesTheRowOfTheLast) {
    VornJsonDbApi& api = OpenItem(0);
    Sql("insert into " + m_strTable + " values (1,'x'),(2,'''''x');");
    Json::Value jQuery(Json::objectValue);
    jQuery["name"][2] = "x";
    EXPECT_EQ(1, api.recDelete(jQuery));
    EXPECT_EQ(Lines{Statement(" WHERE  (name in ('''''x' ) )")}, TakeSql());
    EXPECT_EQ("1|x", Rows("select * from " + m_strTable + ";"));
}

TEST_F(Delete, EmptyListIsRejectedBySqliteAndDeletesNothing) {
    VornJsonDbApi& api = OpenItem(3);
    std::string strSql = Statement(" WHERE  ( )");
    Deletes(api, R"({"id":[]})", true, -1, SqlFailure("near \")\": syntax error", strSql));
    strSql = Statement(" WHERE  ( and name='a' )");
    Deletes(api, R"({"id":[],"name":"a"})", false, -1,
            SqlFailure("near \"and\": syntax error", strSql));
    EXPECT_EQ("3", Count());
}

TEST_F(Delete, RefusedConditionRunsNothing) {
    VornJsonDbApi& api = OpenItem(3);
    Deletes(api, R"({"vornSqlWhereFilter":[]})", true, -1,
            {Check("!jRecParam[jmFieldName[i]].isString()"), Check(kExpand)});
    Deletes(
        api, R"({"name":{}})", true, -1,
        {Check(R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))"),
         Check("0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)"), Check(kExpand)});
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ("3", Count());
}

TEST_F(Delete, StatementThatSqliteRejectsIsReportedWhole) {
    VornJsonDbApi& api = OpenItem(3);
    const std::string strSql = Statement(" WHERE  ( nonsense  )");
    Deletes(api, R"({"vornSqlWhereFilter":"nonsense"})", false, -1,
            SqlFailure("no such column: nonsense", strSql));
    EXPECT_EQ(Lines{strSql}, TakeSql());
    EXPECT_EQ("", api.getErrMsg());
}

TEST_F(Delete, DeleteAllOfAMissingTableFails) {
    VornJsonDbApi& api = OpenItem(0);
    Sql("drop table " + m_strTable + ";");
    EXPECT_EQ(-1, api.recDeleteAll());
    EXPECT_EQ(SqlFailure("no such table: " + m_strTable, Statement("")), TakeLog());
}

TEST_F(Delete, EarlierErrorTextShowsWithAnEmptyStatementAtTheExit) {
    VornJsonDbApi& api = OpenItem(3);
    MakeStaleError(api);
    Deletes(api, "{}", false, -1, {Check("strSql.empty()"), SqlError("no such column: stale", "")});
    Deletes(
        api, "null", true, -1,
        {Check("jRecParam.type() != Json::objectValue"), SqlError("no such column: stale", "")});
    Deletes(api, R"({"vornSqlWhereFilter":1})", true, -1,
            {Check("!jRecParam[jmFieldName[i]].isString()"), Check(kExpand),
             SqlError("no such column: stale", "")});
    Deletes(api, R"({"id":1})", false, 1);
    Deletes(api, "{}", false, -1, {Check("strSql.empty()")});
}

TEST_F(Delete, SuccessIsLoggedOnlyWithDebugOutput) {
    VornJsonDbApi& api = OpenItem(24);
    Deletes(api, R"({"name":"a"})", false, 12);
    blDebugOutput = true;
    Deletes(api, R"({"name":"b"})", false, 12, {Plain("delete rec number=12")});
    Deletes(api, R"({"name":"b"})", false, 0, {Plain("delete rec number=0")});
    EXPECT_EQ(0, api.recDeleteAll());
    EXPECT_EQ(Lines{Plain("delete rec number=0")}, TakeLog());
}

TEST_F(Delete, DebugFlagIsReadWhenTheRowsAreGone) {
    VornJsonDbApi& api = OpenItem(2);
    OnExec([](int) { blDebugOutput = !blDebugOutput; });
    Deletes(api, R"({"id":1})", false, 1, {Plain("delete rec number=1")});
    Deletes(api, R"({"id":2})", false, 1);
}

}  // namespace testhost
