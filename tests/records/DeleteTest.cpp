// recDelete and recDeleteAll: rows removed by a query object, and how many.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

const char kNoConditions[] = "0 > SqlExpandMemberList(jRecParam, strSql, VORN_SQL_WHERE_TYPE_AND)";

class Delete : public TableTest {
  protected:
    // Rows 1|a, 2|b, 3|a and so on up to nRows.
    void Fill(int nRows) {
        for (int i = 1; i <= nRows; ++i) {
            Sql("insert into t values (" + std::to_string(i) + (i % 2 == 1 ? ",'a')" : ",'b')"));
        }
    }

    void Deletes(const char* szQuery, bool blAllowAll, int nResult, const Lines& vecLines = {}) {
        Json::Value jQuery = ParseJson(szQuery);
        EXPECT_EQ(m_pHandle->recDelete(jQuery, blAllowAll), nResult);
        EXPECT_EQ(jQuery, ParseJson(szQuery));
        EXPECT_EQ(TakeLog(), vecLines);
    }

    std::string Statement(const std::string& strRest) { return "DELETE FROM t " + strRest + ";"; }

    Lines SqlFailure(const std::string& strError, const std::string& strSql) {
        return {RunFailed(strError, strSql), Check("0 > (err = runSqlEx(strSqlRun))"),
                SqlError(strError, strSql)};
    }
};

}  // namespace

TEST_F(Delete, QueryWithoutConditionIsRefused) {
    Fill(3);
    Deletes("{}", false, -1, {Check("strSql.empty()")});
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(Count(), "3");
}

TEST_F(Delete, PermissionIsNotGivenByDefault) {
    Fill(3);
    Json::Value jQuery(Json::objectValue);
    EXPECT_EQ(m_pHandle->recDelete(jQuery), -1);
    EXPECT_EQ(TakeLog(), Lines{Check("strSql.empty()")});
    EXPECT_EQ(Count(), "3");
}

TEST_F(Delete, QueryWithoutConditionEmptiesTheTableWithPermission) {
    Fill(7);
    Deletes("{}", true, 7);
    EXPECT_EQ(TakeSql(), Lines{Statement("")});
    EXPECT_EQ(Count(), "0");
}

TEST_F(Delete, DeleteAllCountsTheRowsOfTheTable) {
    Fill(7);
    EXPECT_EQ(m_pHandle->recDeleteAll(), 7);
    EXPECT_EQ(TakeSql(), Lines{"DELETE FROM t ;"});
    EXPECT_EQ(Count(), "0");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(Delete, DeleteAllOnAnEmptyTableIsZero) {
    EXPECT_EQ(m_pHandle->recDeleteAll(), 0);
    EXPECT_EQ(TakeSql(), Lines{"DELETE FROM t ;"});
}

TEST_F(Delete, QueryThatIsNoObjectIsRefusedEvenWithPermission) {
    Fill(2);
    for (const char* szQuery : {"null", "[]", "[{\"id\":1}]", "\"id\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szQuery);
        Deletes(szQuery, false, -1, {Check("jRecParam.type() != Json::objectValue")});
        Deletes(szQuery, true, -1, {Check("jRecParam.type() != Json::objectValue")});
    }
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(Count(), "2");
}

TEST_F(Delete, ConditionCountsItsRows) {
    Fill(10);
    Sql("update t set name = 'x' where id in (2,5,9);");
    Deletes(R"({"name":"x"})", false, 3);
    EXPECT_EQ(TakeSql(), Lines{Statement(" WHERE  (name='x' )")});
    EXPECT_EQ(Count(), "7");
}

TEST_F(Delete, PermissionPlaysNoPartWhereConditionsExist) {
    Fill(4);
    Deletes(R"({"id":4})", true, 1);
    EXPECT_EQ(TakeSql(), Lines{Statement(" WHERE  (id=4 )")});
    EXPECT_EQ(Count(), "3");
}

TEST_F(Delete, NothingMatchedIsZero) {
    Fill(4);
    Deletes(R"({"id":99})", false, 0);
    EXPECT_EQ(TakeSql().size(), 1U);
}

TEST_F(Delete, SortAndPagingKeysAreNoConditions) {
    Fill(4);
    Deletes(R"({"limit":1})", false, -1, {Check("strSql.empty()")});
    Deletes(R"({"sort_by":"id"})", false, -1, {Check("strSql.empty()")});
    EXPECT_EQ(TakeSql(), Lines());
    Deletes(R"({"limit":1,"sort_by":"id","offset":1})", true, 4);
    EXPECT_EQ(TakeSql(), Lines{Statement("")});
}

TEST_F(Delete, SortAndPagingKeysBesideAConditionHaveNoEffect) {
    Fill(4);
    Deletes(R"({"limit":1,"name":"a","sort_by":"id"})", false, 2);
    EXPECT_EQ(TakeSql(), Lines{Statement(" WHERE  (name='a' )")});
}

TEST_F(Delete, RawFilterAndListsSelectRows) {
    Fill(6);
    Deletes(R"({"name":["b"],"vornSqlWhereFilter":"id > 2"})", false, 2);
    EXPECT_EQ(TakeSql(), Lines{Statement(" WHERE  (name in ('b' ) and  id > 2  )")});
    EXPECT_EQ(Rows("select group_concat(id) from t;"), "1,2,3,5");
}

TEST_F(Delete, ListThatDoesNotStoreItsFirstElementsSparesTheRowOfTheLast) {
    Sql("insert into t values (1,'x'),(2,'''''x');");
    Json::Value jQuery(Json::objectValue);
    jQuery["name"][2] = "x";
    EXPECT_EQ(m_pHandle->recDelete(jQuery), 1);
    EXPECT_EQ(TakeSql(), Lines{Statement(" WHERE  (name in ('''''x' ) )")});
    EXPECT_EQ(All(), "1|x");
}

TEST_F(Delete, EmptyListIsRejectedBySqliteAndDeletesNothing) {
    Fill(3);
    std::string strSql = Statement(" WHERE  ( )");
    Deletes(R"({"id":[]})", true, -1, SqlFailure("near \")\": syntax error", strSql));
    strSql = Statement(" WHERE  ( and name='a' )");
    Deletes(R"({"id":[],"name":"a"})", false, -1, SqlFailure("near \"and\": syntax error", strSql));
    EXPECT_EQ(Count(), "3");
}

TEST_F(Delete, RefusedConditionRunsNothing) {
    Fill(3);
    Deletes(R"({"vornSqlWhereFilter":[]})", true, -1,
            {Check("!jRecParam[jmFieldName[i]].isString()"), Check(kNoConditions)});
    Deletes(R"({"name":{}})", true, -1,
            {Check(R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))"),
             Check("0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)"),
             Check(kNoConditions)});
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(Count(), "3");
}

TEST_F(Delete, StatementThatSqliteRejectsIsReportedWhole) {
    Fill(3);
    const std::string strSql = Statement(" WHERE  ( nonsense  )");
    Deletes(R"({"vornSqlWhereFilter":"nonsense"})", false, -1,
            SqlFailure("no such column: nonsense", strSql));
    EXPECT_EQ(TakeSql(), Lines{strSql});
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
}

TEST_F(Delete, DeleteAllOfAMissingTableFails) {
    Sql("drop table t;");
    EXPECT_EQ(m_pHandle->recDeleteAll(), -1);
    EXPECT_EQ(TakeLog(), SqlFailure("no such table: t", Statement("")));
}

TEST_F(Delete, EarlierErrorTextShowsWithAnEmptyStatementAtTheExit) {
    Fill(3);
    MakeStaleError();
    Deletes("{}", false, -1, {Check("strSql.empty()"), SqlError("no such column: stale", "")});
    Deletes(
        "null", true, -1,
        {Check("jRecParam.type() != Json::objectValue"), SqlError("no such column: stale", "")});
    Deletes(R"({"vornSqlWhereFilter":1})", true, -1,
            {Check("!jRecParam[jmFieldName[i]].isString()"), Check(kNoConditions),
             SqlError("no such column: stale", "")});
    Deletes(R"({"id":1})", false, 1);
    Deletes("{}", false, -1, {Check("strSql.empty()")});
}

TEST_F(Delete, SuccessIsLoggedOnlyWithDebugOutput) {
    Fill(24);
    Deletes(R"({"name":"a"})", false, 12);
    blDebugOutput = true;
    Deletes(R"({"name":"b"})", false, 12, {Plain("delete rec number=12")});
    Deletes(R"({"name":"b"})", false, 0, {Plain("delete rec number=0")});
    EXPECT_EQ(m_pHandle->recDeleteAll(), 0);
    EXPECT_EQ(TakeLog(), Lines{Plain("delete rec number=0")});
}

TEST_F(Delete, DebugFlagIsReadWhenTheRowsAreGone) {
    Fill(2);
    OnExec([](int) { blDebugOutput = !blDebugOutput; });
    Deletes(R"({"id":1})", false, 1, {Plain("delete rec number=1")});
    Deletes(R"({"id":2})", false, 1);
}
