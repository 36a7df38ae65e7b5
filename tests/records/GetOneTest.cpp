// recGetOne: the first row of a query, merged into the caller's record.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

const char kFailed[] = "0 > recList(jRecParam, jRecArray)";

class GetOne : public FreshTableTest {
  protected:
    VornJsonDbApi& OpenItem() {
        VornJsonDbApi& api = Open("id:int,name:string", "id integer primary key,name text");
        Sql("insert into " + m_strTable + " values (1,'a'),(2,'b'),(3,null);");
        return api;
    }

    // The record after the call.
    std::string Got(VornJsonDbApi& api, const char* szQuery, const char* szOut, int nResult) {
        Json::Value jQuery = ParseJson(szQuery);
        Json::Value jOut = ParseJson(szOut);
        EXPECT_EQ(nResult, api.recGetOne(jQuery, jOut));
        EXPECT_EQ(ParseJson(szQuery), jQuery);
        return Compact(jOut);
    }

    std::string Select(const std::string& strRest) {
        return "SELECT id,name FROM " + m_strTable + " " + strRest;
    }
};

}  // namespace

TEST_F(GetOne, FoundRowFillsANullRecord) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"({"id":2,"name":"b"})", Got(api, R"({"id":2})", "null", 1));
    EXPECT_EQ(Lines{}, TakeLog());
    EXPECT_EQ(Lines{Select(" WHERE  (id=2 );")}, TakeSql());
}

TEST_F(GetOne, NoRowLeavesTheRecordWhateverItIs) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szOut : {"null", "{}", "{\"id\":7}", "[]", "[1]", "\"text\"", "7"}) {
        SCOPED_TRACE(szOut);
        EXPECT_EQ(szOut, Got(api, R"({"id":99})", szOut, 0));
    }
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(GetOne, FirstOfSeveralRowsIsTaken) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"({"id":1,"name":"a"})", Got(api, "null", "null", 1));
    EXPECT_EQ(R"({"id":2,"name":"b"})", Got(api, R"({"vornSqlWhereFilter":"id > 1"})", "null", 1));
}

TEST_F(GetOne, MergeOverwritesSameMembersAndKeepsOthers) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"({"extra":[1],"id":1,"name":"a"})",
              Got(api, R"({"id":1})", R"({"extra":[1],"id":{},"name":5})", 1));
}

TEST_F(GetOne, NullColumnKeepsTheMemberThatTheRecordHad) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"({"id":3,"name":"kept"})", Got(api, R"({"id":3})", R"({"name":"kept"})", 1));
}

TEST_F(GetOne, RowOfNullsIsFoundAndLeavesANullRecordNull) {
    VornJsonDbApi& api = Open("a:int,b:string");
    Sql("insert into " + m_strTable + " values (null,null);");
    EXPECT_EQ("null", Got(api, "{}", "null", 1));
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(GetOne, AddsNoLimitSoEveryRowIsConverted) {
    VornJsonDbApi& api = Open("a:int,b:float");
    Sql("insert into " + m_strTable + " values (1,null),(2,2.5);");
    EXPECT_EQ("{}", Got(api, "{}", "{}", -1));
    EXPECT_EQ(Lines{"SELECT a,b FROM " + m_strTable + " ;"}, TakeSql());
    EXPECT_EQ(Check(kFailed), TakeLog().back());
    EXPECT_EQ(R"({"a":1})", Got(api, R"({"limit":1})", "{}", 1));
    EXPECT_EQ(Lines{"SELECT a,b FROM " + m_strTable + "  LIMIT 1;"}, TakeSql());
}

TEST_F(GetOne, RecordThatIsNeitherNullNorObjectIsRefusedAfterTheQuery) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szOut : {"[]", "[1]", "\"text\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szOut);
        EXPECT_EQ(szOut, Got(api, R"({"id":1})", szOut, -1));
        EXPECT_EQ(Lines{Select(" WHERE  (id=1 );")}, TakeSql());
        EXPECT_EQ(
            (Lines{UtilCheck("jIn.type() != Json::nullValue && jIn.type() != Json::objectValue"),
                   Check("0 > jsonCopyMember(jRecOut, jRecArray[0], true)")}),
            TakeLog());
    }
}

TEST_F(GetOne, QueryOfAWrongKindIsRefused) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"({"kept":1})", Got(api, "[1]", R"({"kept":1})", -1));
    EXPECT_EQ(
        (Lines{
            Check("jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue"),
            Plain("jRecParam=[1]"), Check(kFailed)}),
        TakeLog());
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(GetOne, RejectedStatementLogsTheListsLinesFirst) {
    VornJsonDbApi& api = OpenItem();
    const std::string strSql = Select(" WHERE  ( nonsense  );");
    EXPECT_EQ(R"({"kept":1})",
              Got(api, R"({"vornSqlWhereFilter":"nonsense"})", R"({"kept":1})", -1));
    EXPECT_EQ((Lines{RunFailed("no such column: nonsense", strSql),
                     Check("0 > runSqlEx(strSqlRun, DbCallBackFillList, &jRecArrayOut)"),
                     Plain(R"(jRecParam={"vornSqlWhereFilter":"nonsense"})"),
                     SqlError("no such column: nonsense", strSql), Check(kFailed)}),
              TakeLog());
    EXPECT_EQ(Lines{strSql}, TakeSql());
}

TEST_F(GetOne, SameObjectAsQueryAndRecordIsMerged) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jBoth = ParseJson(R"({"id":2,"limit":1})");
    EXPECT_EQ(1, api.recGetOne(jBoth, jBoth));
    EXPECT_EQ(R"({"id":2,"limit":1,"name":"b"})", Compact(jBoth));
}

}  // namespace testhost
