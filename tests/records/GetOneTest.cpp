// recGetOne: the first row of a query, merged into the caller's record.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

const char kFailed[] = "0 > recList(jRecParam, jRecArray)";

class GetOne : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        Sql("insert into t values (1,'a'),(2,'b'),(3,null);");
    }

    // The record after the call.
    std::string Got(const char* szQuery, const char* szOut, int nResult) {
        Json::Value jQuery = ParseJson(szQuery);
        Json::Value jOut = ParseJson(szOut);
        EXPECT_EQ(m_pHandle->recGetOne(jQuery, jOut), nResult);
        EXPECT_EQ(jQuery, ParseJson(szQuery));
        return Compact(jOut);
    }

    std::string Select(const std::string& strRest) { return "SELECT id,name FROM t " + strRest; }
};

}  // namespace

TEST_F(GetOne, FoundRowFillsANullRecord) {
    EXPECT_EQ(Got(R"({"id":2})", "null", 1), R"({"id":2,"name":"b"})");
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(TakeSql(), Lines{Select(" WHERE  (id=2 );")});
}

TEST_F(GetOne, NoRowLeavesTheRecordWhateverItIs) {
    for (const char* szOut : {"null", "{}", "{\"id\":7}", "[]", "[1]", "\"text\"", "7"}) {
        SCOPED_TRACE(szOut);
        EXPECT_EQ(Got(R"({"id":99})", szOut, 0), szOut);
    }
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(GetOne, FirstOfSeveralRowsIsTaken) {
    EXPECT_EQ(Got("null", "null", 1), R"({"id":1,"name":"a"})");
    EXPECT_EQ(Got(R"({"vornSqlWhereFilter":"id > 1"})", "null", 1), R"({"id":2,"name":"b"})");
}

TEST_F(GetOne, MergeOverwritesSameMembersAndKeepsOthers) {
    EXPECT_EQ(Got(R"({"id":1})", R"({"extra":[1],"id":{},"name":5})", 1),
              R"({"extra":[1],"id":1,"name":"a"})");
}

TEST_F(GetOne, NullColumnKeepsTheMemberThatTheRecordHad) {
    EXPECT_EQ(Got(R"({"id":3})", R"({"name":"kept"})", 1), R"({"id":3,"name":"kept"})");
}

TEST_F(GetOne, RowOfNullsIsFoundAndLeavesANullRecordNull) {
    Open("a:int,b:string");
    Sql("insert into t values (null,null);");
    EXPECT_EQ(Got("{}", "null", 1), "null");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(GetOne, AddsNoLimitSoEveryRowIsConverted) {
    Open("a:int,b:float");
    Sql("insert into t values (1,null),(2,2.5);");
    EXPECT_EQ(Got("{}", "{}", -1), "{}");
    EXPECT_EQ(TakeSql(), Lines{"SELECT a,b FROM t ;"});
    EXPECT_EQ(TakeLog().back(), Check(kFailed));
    EXPECT_EQ(Got(R"({"limit":1})", "{}", 1), R"({"a":1})");
    EXPECT_EQ(TakeSql(), Lines{"SELECT a,b FROM t  LIMIT 1;"});
}

TEST_F(GetOne, RecordThatIsNeitherNullNorObjectIsRefusedAfterTheQuery) {
    for (const char* szOut : {"[]", "[1]", "\"text\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szOut);
        EXPECT_EQ(Got(R"({"id":1})", szOut, -1), szOut);
        EXPECT_EQ(TakeSql(), Lines{Select(" WHERE  (id=1 );")});
        EXPECT_EQ(
            TakeLog(),
            (Lines{UtilCheck("jIn.type() != Json::nullValue && jIn.type() != Json::objectValue"),
                   Check("0 > jsonCopyMember(jRecOut, jRecArray[0], true)")}));
    }
}

TEST_F(GetOne, QueryOfAWrongKindIsRefused) {
    EXPECT_EQ(Got("[1]", R"({"kept":1})", -1), R"({"kept":1})");
    EXPECT_EQ(
        TakeLog(),
        (Lines{
            Check("jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue"),
            Plain("jRecParam=[1]"), Check(kFailed)}));
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(GetOne, RejectedStatementLogsTheListsLinesFirst) {
    const std::string strSql = Select(" WHERE  ( nonsense  );");
    EXPECT_EQ(Got(R"({"vornSqlWhereFilter":"nonsense"})", R"({"kept":1})", -1), R"({"kept":1})");
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("no such column: nonsense", strSql), Check(kListFailed),
                                Plain(R"(jRecParam={"vornSqlWhereFilter":"nonsense"})"),
                                SqlError("no such column: nonsense", strSql), Check(kFailed)}));
    EXPECT_EQ(TakeSql(), Lines{strSql});
}

TEST_F(GetOne, SameObjectAsQueryAndRecordIsMerged) {
    Json::Value jBoth = ParseJson(R"({"id":2,"limit":1})");
    EXPECT_EQ(m_pHandle->recGetOne(jBoth, jBoth), 1);
    EXPECT_EQ(Compact(jBoth), R"({"id":2,"limit":1,"name":"b"})");
}
