// recUpdateByWhere and recUpdateByFilter: changing stored rows in place.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

const char kDuplicate[] = "DUPLICATE_PRIMARY_KEY";
const char kRun[] = "0 > runSqlEx(strSql, NULL, NULL)";
const char kComma[] = "0 > SqlExpandMemberList(jColumnList, strSql2, VORN_SQL_WHERE_TYPE_COMMA)";
const char kAnd[] = "0 > SqlExpandMemberList(jFilterIn, strSql, VORN_SQL_WHERE_TYPE_AND)";
const char kInner[] = "0 > recUpdateByWhere(jParamIn, strSql)";
const char kMatchText[] = R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))";
const char kMatchFailed[] = "0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)";

class Update : public FreshTableTest {
  protected:
    // Three rows: 1|a|10, 2|b|20, 3|c|30.
    VornJsonDbApi& OpenItem() {
        VornJsonDbApi& api = Open("id:int,name:string,size:int",
                                  "id integer primary key,name text unique,size integer");
        Sql("insert into " + m_strTable + " values (1,'a',10),(2,'b',20),(3,'c',30);");
        return api;
    }

    std::string All() { return Rows("select * from " + m_strTable + " order by id;"); }

    std::string Statement(const std::string& strSet, const std::string& strWhere) {
        return "UPDATE " + m_strTable + " SET " + strSet + " WHERE " + strWhere + ";";
    }

    void ByWhere(VornJsonDbApi& api, const Json::Value& jGiven, const std::string& strGiven,
                 int nResult, const Lines& vecLines = {}) {
        Json::Value jRec = jGiven;
        std::string strWhere = strGiven;
        EXPECT_EQ(nResult, api.recUpdateByWhere(jRec, strWhere));
        EXPECT_EQ(jGiven, jRec);
        EXPECT_EQ(strGiven, strWhere);
        EXPECT_EQ(vecLines, TakeLog());
    }

    void ByFilter(VornJsonDbApi& api, const Json::Value& jFilterGiven, const Json::Value& jGiven,
                  int nResult, const Lines& vecLines = {}) {
        Json::Value jFilter = jFilterGiven;
        Json::Value jRec = jGiven;
        EXPECT_EQ(nResult, api.recUpdateByFilter(jFilter, jRec));
        EXPECT_EQ(jFilterGiven, jFilter);
        EXPECT_EQ(jGiven, jRec);
        EXPECT_EQ(vecLines, TakeLog());
    }

    std::string FilterTail(const std::string& strRecord) {
        return Plain("recUpdateByFilter failed, jParamIn=" + strRecord);
    }
};

const char kRows[] = "1|a|10\n2|b|20\n3|c|30";

}  // namespace

// ---- by where ----------------------------------------------------------------------------------

TEST_F(Update, SetsTheMembersOnEveryRowOfTheCondition) {
    VornJsonDbApi& api = OpenItem();
    ByWhere(api, ParseJson(R"({"size":7})"), "id > 1", 0);
    EXPECT_EQ(Lines{Statement("size=7", "id > 1")}, TakeSql());
    EXPECT_EQ("1|a|10\n2|b|7\n3|c|7", All());
}

TEST_F(Update, AssignmentsAreJoinedByCommas) {
    VornJsonDbApi& api = OpenItem();
    ByWhere(api, ParseJson(R"({"size":7,"name":"it's 100% %s","other":1})"), "id=1", 0);
    EXPECT_EQ(Lines{Statement("name='it''s 100% %s' , size=7", "id=1")}, TakeSql());
    EXPECT_EQ("1|it's 100% %s|7\n2|b|20\n3|c|30", All());
}

TEST_F(Update, EmptyConditionIsRefusedBeforeAnEmptyRecord) {
    VornJsonDbApi& api = OpenItem();
    ByWhere(api, ParseJson(R"({"size":7})"), "", -1,
            {Check("strSqlWhere.empty()"), Plain(R"(jRecIn={"size":7})")});
    ByWhere(api, ParseJson("{}"), "", -1, {Check("strSqlWhere.empty()"), Plain("jRecIn={}")});
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ(kRows, All());
}

TEST_F(Update, EmptyRecordIsRefused) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szRecord : {"null", "{}", "[]"}) {
        SCOPED_TRACE(szRecord);
        ByWhere(api, ParseJson(szRecord), "1=1", -1,
                {Check("jRecIn.empty()"), Plain(std::string("jRecIn=") + szRecord)});
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Update, RecordOfAWrongKindIsRefusedByTheAssignments) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szRecord : {"[1]", "\"name\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szRecord);
        ByWhere(api, ParseJson(szRecord), "1=1", -1,
                {Check("jRecParam.type() != Json::objectValue && "
                       "jRecParam.type() != Json::nullValue"),
                 Check(kComma), Plain(std::string("jRecIn=") + szRecord)});
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Update, RawFilterInTheRecordIsNoAssignment) {
    VornJsonDbApi& api = OpenItem();
    ByWhere(api, ParseJson(R"({"size":7,"vornSqlWhereFilter":"name='x'"})"), "id=1", 0);
    EXPECT_EQ(Lines{Statement("size=7", "id=1")}, TakeSql());
}

TEST_F(Update, RecordHoldingOnlyARawFilterIsRejectedBySqlite) {
    VornJsonDbApi& api = OpenItem();
    const std::string strSql = Statement("", "id=1");
    ByWhere(api, ParseJson(R"({"vornSqlWhereFilter":"size=7"})"), "id=1", -1,
            {RunFailed("near \"WHERE\": syntax error", strSql), Check(kRun),
             Plain(R"(jRecIn={"vornSqlWhereFilter":"size=7"})"),
             SqlError("near \"WHERE\": syntax error", strSql)});
    EXPECT_EQ(Lines{strSql}, TakeSql());
}

TEST_F(Update, ConditionThatSelectsNoRowSucceeds) {
    VornJsonDbApi& api = OpenItem();
    ByWhere(api, ParseJson(R"({"size":7})"), "id=99", 0);
    EXPECT_EQ(1U, TakeSql().size());
    EXPECT_EQ(kRows, All());
}

TEST_F(Update, ValueOfAWrongKindLeavesTheStatementAsFarAsItWasBuilt) {
    VornJsonDbApi& api = OpenItem();
    const Lines vecLines{Check(kMatchText), Check(kMatchFailed), Check(kComma),
                         Plain(R"(jRecIn={"name":"x","size":{}})")};
    ByWhere(api, ParseJson(R"({"name":"x","size":{}})"), "id=1", -1, vecLines);
    MakeStaleError(api);
    Lines vecStale = vecLines;
    vecStale.push_back(SqlError("no such column: stale", "UPDATE " + m_strTable + " SET "));
    ByWhere(api, ParseJson(R"({"name":"x","size":{}})"), "id=1", -1, vecStale);
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Update, EarlierErrorTextShowsWithAnEmptyStatementInTheTail) {
    VornJsonDbApi& api = OpenItem();
    MakeStaleError(api);
    ByWhere(api, ParseJson(R"({"size":7})"), "", -1,
            {Check("strSqlWhere.empty()"), Plain(R"(jRecIn={"size":7})"),
             SqlError("no such column: stale", "")});
    ByWhere(api, ParseJson("{}"), "1=1", -1,
            {Check("jRecIn.empty()"), Plain("jRecIn={}"), SqlError("no such column: stale", "")});
}

TEST_F(Update, ArrayValueBecomesAMembershipThatSqliteRejects) {
    VornJsonDbApi& api = OpenItem();
    const std::string strSql = Statement("name in ('x' )", "id=1");
    ByWhere(api, ParseJson(R"({"name":["x"]})"), "id=1", -1,
            {RunFailed("near \"in\": syntax error", strSql), Check(kRun),
             Plain(R"(jRecIn={"name":["x"]})"), SqlError("near \"in\": syntax error", strSql)});
}

TEST_F(Update, DuplicateByWhereLeavesTheErrorMessageAndChangesNoRow) {
    VornJsonDbApi& api = OpenItem();
    const std::string strSql = Statement("name='same'", "1=1");
    const std::string strError = "UNIQUE constraint failed: " + m_strTable + ".name";
    ByWhere(api, ParseJson(R"({"name":"same"})"), "1=1", -1,
            {RunFailed(strError, strSql), Check(kRun), Plain(R"(jRecIn={"name":"same"})"),
             SqlError(strError, strSql)});
    EXPECT_EQ("", api.getErrMsg());
    EXPECT_EQ(kRows, All());
}

TEST_F(Update, ByWhereChecksNoTypes) {
    VornJsonDbApi& api = OpenItem();
    ByWhere(api, ParseJson(R"({"name":5,"size":"7"})"), "id=1", 0);
    EXPECT_EQ(Lines{Statement("name='5' , size=7", "id=1")}, TakeSql());
}

// ---- by filter ---------------------------------------------------------------------------------

TEST_F(Update, FilterSelectsTheRows) {
    VornJsonDbApi& api = OpenItem();
    ByFilter(api, ParseJson(R"({"id":2,"name":"b"})"), ParseJson(R"({"name":"B","size":0})"), 0);
    EXPECT_EQ(Lines{Statement("name='B' , size=0", " (id=2 and name='b' )")}, TakeSql());
    EXPECT_EQ("1|a|10\n2|B|0\n3|c|30", All());
}

TEST_F(Update, FilterThatMatchesNothingSucceeds) {
    VornJsonDbApi& api = OpenItem();
    ByFilter(api, ParseJson(R"({"id":99})"), ParseJson(R"({"size":0})"), 0);
    EXPECT_EQ(kRows, All());
}

TEST_F(Update, EmptyFilterIsRefused) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szFilter : {"null", "{}", "[]"}) {
        SCOPED_TRACE(szFilter);
        ByFilter(api, ParseJson(szFilter), ParseJson(R"({"size":0})"), -1,
                 {Check("jFilterIn.empty()"), FilterTail(R"({"size":0})")});
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Update, FilterOfAWrongKindIsRefused) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szFilter : {"[1]", "\"id\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szFilter);
        ByFilter(api, ParseJson(szFilter), ParseJson("[2]"), -1,
                 {Check("jFilterIn.type() != Json::objectValue"), FilterTail("[2]")});
    }
}

TEST_F(Update, NewValuesOfAWrongKindAreRefused) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szRecord : {"null", "[]", "[1]", "\"name\"", "7", "true"}) {
        SCOPED_TRACE(szRecord);
        ByFilter(api, ParseJson(R"({"id":1})"), ParseJson(szRecord), -1,
                 {Check("jParamIn.type() != Json::objectValue"), FilterTail(szRecord)});
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Update, FirstOfSeveralRefusalsIsReported) {
    VornJsonDbApi& api = OpenItem();
    ByFilter(api, ParseJson("null"), ParseJson("[2]"), -1,
             {Check("jFilterIn.empty()"), FilterTail("[2]")});
    ByFilter(api, ParseJson(R"({"vornSqlWhereFilter":1})"), ParseJson("[2]"), -1,
             {Check("jParamIn.type() != Json::objectValue"), FilterTail("[2]")});
}

TEST_F(Update, RefusedFilterRunsNothing) {
    VornJsonDbApi& api = OpenItem();
    ByFilter(api, ParseJson(R"({"vornSqlWhereFilter":1})"), ParseJson(R"({"size":"bad"})"), -1,
             {Check("!jRecParam[jmFieldName[i]].isString()"), Check(kAnd),
              FilterTail(R"({"size":"bad"})")});
    ByFilter(api, ParseJson(R"({"size":{}})"), ParseJson(R"({"size":1})"), -1,
             {Check(kMatchText), Check(kMatchFailed), Check(kAnd), FilterTail(R"({"size":1})")});
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Update, FilterWithoutAConditionNeverBecomesAWholeTableUpdate) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szFilter : {R"({"limit":1})", R"({"sort_by":"id"})", R"({"nobody":[]})"}) {
        SCOPED_TRACE(szFilter);
        ByFilter(api, ParseJson(szFilter), ParseJson(R"({"size":"bad"})"), -1,
                 {Check("strSql.empty()"), FilterTail(R"({"size":"bad"})")});
    }
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ(kRows, All());
}

TEST_F(Update, EmptyListInTheFilterIsRejectedBySqlite) {
    VornJsonDbApi& api = OpenItem();
    const std::string strSql = Statement("size=0", " ( )");
    ByFilter(
        api, ParseJson(R"({"id":[]})"), ParseJson(R"({"size":0})"), -1,
        {RunFailed("near \")\": syntax error", strSql), Check(kRun), Plain(R"(jRecIn={"size":0})"),
         SqlError("near \")\": syntax error", strSql), Check(kInner), FilterTail(R"({"size":0})")});
    EXPECT_EQ(kRows, All());
}

TEST_F(Update, WronglyTypedNewValueRunsNothing) {
    VornJsonDbApi& api = OpenItem();
    ByFilter(api, ParseJson(R"({"id":1})"), ParseJson(R"({"size":"7"})"), -1,
             {Located(R"(type failed, strKey=size, jRecParam={"size":"7"})"),
              Check("0 > checkJsonType(jParamIn)"), FilterTail(R"({"size":"7"})")});
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ("", api.getErrMsg());
}

TEST_F(Update, EmptyNewValuesFailInTheInnerUpdate) {
    VornJsonDbApi& api = OpenItem();
    ByFilter(api, ParseJson(R"({"id":1})"), ParseJson("{}"), -1,
             {Check("jRecIn.empty()"), Plain("jRecIn={}"), Check(kInner), FilterTail("{}")});
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Update, KeyOfAnotherRowIsADuplicateAndChangesNoRow) {
    VornJsonDbApi& api = OpenItem();
    const std::string strSql = Statement("id=3", " ( id < 3  )");
    const std::string strError = "UNIQUE constraint failed: " + m_strTable + ".id";
    ByFilter(api, ParseJson(R"({"vornSqlWhereFilter":"id < 3"})"), ParseJson(R"({"id":3})"), -1,
             {RunFailed(strError, strSql), Check(kRun), Plain(R"(jRecIn={"id":3})"),
              SqlError(strError, strSql), Check(kInner), FilterTail(R"({"id":3})")});
    EXPECT_EQ(Lines{strSql}, TakeSql());
    EXPECT_EQ(kDuplicate, api.getErrMsg());
    EXPECT_EQ(kRows, All());
}

TEST_F(Update, LaterFailureWithoutSqlReportsTheStaleDuplicateAgain) {
    VornJsonDbApi& api = OpenItem();
    MakeStaleDuplicate(api);
    EXPECT_EQ("", api.getErrMsg());
    const std::pair<const char*, const char*> aRefused[] = {
        {"{}", "{}"},
        {"[1]", "{}"},
        {R"({"id":1})", "[]"},
        {R"({"vornSqlWhereFilter":1})", "{}"},
        {R"({"limit":1})", "{}"},
        {R"({"id":1})", R"({"size":"7"})"},
        {R"({"id":1})", "{}"},
    };
    for (const auto& [szFilter, szRecord] : aRefused) {
        SCOPED_TRACE(std::string(szFilter) + " " + szRecord);
        api.setErrMsg("");
        Json::Value jFilter = ParseJson(szFilter);
        Json::Value jRec = ParseJson(szRecord);
        EXPECT_EQ(-1, api.recUpdateByFilter(jFilter, jRec));
        EXPECT_EQ(kDuplicate, api.getErrMsg());
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Update, DuplicateIsReportedBehindTheLastLine) {
    VornJsonDbApi& api = OpenItem();
    MakeStaleDuplicate(api);
    std::string strAtTheTail = "no line";
    OnNextLine([&] { OnNextLine([&] { strAtTheTail = api.getErrMsg(); }); });
    ByFilter(api, ParseJson("{}"), ParseJson("{}"), -1,
             {Check("jFilterIn.empty()"), FilterTail("{}")});
    EXPECT_EQ("", strAtTheTail);
    EXPECT_EQ(kDuplicate, api.getErrMsg());
}

TEST_F(Update, WholeRealPassesForAnInteger) {
    VornJsonDbApi& api = OpenItem();
    ByFilter(api, ParseJson(R"({"id":1.0})"), ParseJson(R"({"size":3.0})"), 0);
    EXPECT_EQ(Lines{Statement("size=3.0", " (id=1.0 )")}, TakeSql());
    EXPECT_EQ("1|a|3\n2|b|20\n3|c|30", All());
}

TEST_F(Update, OtherRefusalAndSuccessLeaveTheErrorMessage) {
    VornJsonDbApi& api = OpenItem();
    api.setErrMsg("kept");
    ByFilter(api, ParseJson(R"({"id":1})"), ParseJson(R"({"size":1})"), 0);
    EXPECT_EQ("kept", api.getErrMsg());
    FailNextExec({{SQLITE_FULL, "database or disk is full", 28}});
    Json::Value jFilter = ParseJson(R"({"id":1})");
    Json::Value jRec = ParseJson(R"({"size":2})");
    EXPECT_EQ(-1, api.recUpdateByFilter(jFilter, jRec));
    EXPECT_EQ("kept", api.getErrMsg());
    TakeLog();
}

TEST_F(Update, UnknownNewValuesAreIgnoredBesideKnownOnes) {
    VornJsonDbApi& api = OpenItem();
    ByFilter(api, ParseJson(R"({"id":1})"),
             ParseJson(R"({"other":{},"size":5,"vornSqlWhereFilter":"x"})"), 0);
    EXPECT_EQ(Lines{Statement("size=5", " (id=1 )")}, TakeSql());
}

TEST_F(Update, SameObjectAsFilterAndNewValues) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jBoth = ParseJson(R"({"id":1,"name":"a"})");
    EXPECT_EQ(0, api.recUpdateByFilter(jBoth, jBoth));
    EXPECT_EQ(Lines{Statement("id=1 , name='a'", " (id=1 and name='a' )")}, TakeSql());
    EXPECT_EQ(kRows, All());
}

}  // namespace testhost
