// recUpdateByWhere and recUpdateByFilter: changing stored rows in place.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

const char kRun[] = "0 > runSqlEx(strSql, NULL, NULL)";
const char kComma[] = "0 > SqlExpandMemberList(jColumnList, strSql2, VORN_SQL_WHERE_TYPE_COMMA)";
const char kAnd[] = "0 > SqlExpandMemberList(jFilterIn, strSql, VORN_SQL_WHERE_TYPE_AND)";
const char kInner[] = "0 > recUpdateByWhere(jParamIn, strSql)";

class Update : public TableTest {
  protected:
    // Three rows: 1|a|10, 2|b|20, 3|c|30.
    void SetUp() override {
        TableTest::SetUp();
        Open("id:int,name:string,size:int", "id integer primary key,name text unique,size integer");
        Sql("insert into t values (1,'a',10),(2,'b',20),(3,'c',30);");
    }

    std::string Statement(const std::string& strSet, const std::string& strWhere) {
        return "UPDATE t SET " + strSet + " WHERE " + strWhere + ";";
    }

    void ByWhere(const std::string& strJson, const std::string& strGiven, int nResult,
                 const Lines& vecLines = {}) {
        const Json::Value jGiven = ParseJson(strJson);
        Json::Value jRec = jGiven;
        std::string strWhere = strGiven;
        EXPECT_EQ(m_pHandle->recUpdateByWhere(jRec, strWhere), nResult);
        EXPECT_EQ(jRec, jGiven);
        EXPECT_EQ(strWhere, strGiven);
        EXPECT_EQ(TakeLog(), vecLines);
    }

    void ByFilter(const std::string& strFilter, const std::string& strJson, int nResult,
                  const Lines& vecLines = {}) {
        Json::Value jFilter = ParseJson(strFilter);
        Json::Value jRec = ParseJson(strJson);
        EXPECT_EQ(m_pHandle->recUpdateByFilter(jFilter, jRec), nResult);
        EXPECT_EQ(jFilter, ParseJson(strFilter));
        EXPECT_EQ(jRec, ParseJson(strJson));
        EXPECT_EQ(TakeLog(), vecLines);
    }

    std::string FilterTail(const std::string& strRecord) {
        return Plain("recUpdateByFilter failed, jParamIn=" + strRecord);
    }
};

const char kThreeRows[] = "1|a|10\n2|b|20\n3|c|30";

}  // namespace

// ---- by where ----------------------------------------------------------------------------------

TEST_F(Update, SetsTheMembersOnEveryRowOfTheCondition) {
    ByWhere(R"({"size":7})", "id > 1", 0);
    EXPECT_EQ(TakeSql(), Lines{Statement("size=7", "id > 1")});
    EXPECT_EQ(All(), "1|a|10\n2|b|7\n3|c|7");
}

TEST_F(Update, AssignmentsAreJoinedByCommas) {
    ByWhere(R"({"size":7,"name":"it's 100% %s","other":1})", "id=1", 0);
    EXPECT_EQ(TakeSql(), Lines{Statement("name='it''s 100% %s' , size=7", "id=1")});
    EXPECT_EQ(All(), "1|it's 100% %s|7\n2|b|20\n3|c|30");
}

TEST_F(Update, EmptyConditionIsRefusedBeforeAnEmptyRecord) {
    ByWhere(R"({"size":7})", "", -1, {Check("strSqlWhere.empty()"), Plain(R"(jRecIn={"size":7})")});
    ByWhere("{}", "", -1, {Check("strSqlWhere.empty()"), Plain("jRecIn={}")});
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(All(), kThreeRows);
}

TEST_F(Update, EmptyRecordIsRefused) {
    for (const char* szRecord : {"null", "{}", "[]"}) {
        SCOPED_TRACE(szRecord);
        ByWhere(szRecord, "1=1", -1,
                {Check("jRecIn.empty()"), Plain(std::string("jRecIn=") + szRecord)});
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Update, RecordOfAWrongKindIsRefusedByTheAssignments) {
    for (const char* szRecord : {"[1]", "\"name\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szRecord);
        ByWhere(szRecord, "1=1", -1,
                {Check("jRecParam.type() != Json::objectValue && "
                       "jRecParam.type() != Json::nullValue"),
                 Check(kComma), Plain(std::string("jRecIn=") + szRecord)});
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Update, RawFilterInTheRecordIsNoAssignment) {
    ByWhere(R"({"size":7,"vornSqlWhereFilter":"name='x'"})", "id=1", 0);
    EXPECT_EQ(TakeSql(), Lines{Statement("size=7", "id=1")});
}

TEST_F(Update, RecordHoldingOnlyARawFilterIsRejectedBySqlite) {
    const std::string strSql = Statement("", "id=1");
    ByWhere(R"({"vornSqlWhereFilter":"size=7"})", "id=1", -1,
            {RunFailed("near \"WHERE\": syntax error", strSql), Check(kRun),
             Plain(R"(jRecIn={"vornSqlWhereFilter":"size=7"})"),
             SqlError("near \"WHERE\": syntax error", strSql)});
    EXPECT_EQ(TakeSql(), Lines{strSql});
}

TEST_F(Update, ConditionThatSelectsNoRowSucceeds) {
    ByWhere(R"({"size":7})", "id=99", 0);
    EXPECT_EQ(TakeSql().size(), 1U);
    EXPECT_EQ(All(), kThreeRows);
}

TEST_F(Update, ValueOfAWrongKindLeavesTheStatementAsFarAsItWasBuilt) {
    const Lines vecLines{Check(kQuoteText), Check(kMatchFailed), Check(kComma),
                         Plain(R"(jRecIn={"name":"x","size":{}})")};
    ByWhere(R"({"name":"x","size":{}})", "id=1", -1, vecLines);
    MakeStaleError();
    Lines vecStale = vecLines;
    vecStale.push_back(SqlError("no such column: stale", "UPDATE t SET "));
    ByWhere(R"({"name":"x","size":{}})", "id=1", -1, vecStale);
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Update, EarlierErrorTextShowsWithAnEmptyStatementInTheTail) {
    MakeStaleError();
    ByWhere(R"({"size":7})", "", -1,
            {Check("strSqlWhere.empty()"), Plain(R"(jRecIn={"size":7})"),
             SqlError("no such column: stale", "")});
    ByWhere("{}", "1=1", -1,
            {Check("jRecIn.empty()"), Plain("jRecIn={}"), SqlError("no such column: stale", "")});
}

TEST_F(Update, ArrayValueBecomesAMembershipThatSqliteRejects) {
    const std::string strSql = Statement("name in ('x' )", "id=1");
    ByWhere(R"({"name":["x"]})", "id=1", -1,
            {RunFailed("near \"in\": syntax error", strSql), Check(kRun),
             Plain(R"(jRecIn={"name":["x"]})"), SqlError("near \"in\": syntax error", strSql)});
}

TEST_F(Update, DuplicateByWhereLeavesTheErrorMessageAndChangesNoRow) {
    const std::string strSql = Statement("name='same'", "1=1");
    const std::string strError = "UNIQUE constraint failed: t.name";
    ByWhere(R"({"name":"same"})", "1=1", -1,
            {RunFailed(strError, strSql), Check(kRun), Plain(R"(jRecIn={"name":"same"})"),
             SqlError(strError, strSql)});
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
    EXPECT_EQ(All(), kThreeRows);
}

TEST_F(Update, ByWhereChecksNoTypes) {
    ByWhere(R"({"name":5,"size":"7"})", "id=1", 0);
    EXPECT_EQ(TakeSql(), Lines{Statement("name='5' , size=7", "id=1")});
}

TEST_F(Update, AssignmentIsTheTextOfAConditionForEveryTypeAndKind) {
    const Json::Value jValues = ParseJson(
        R"([null, true, false, 0, -7, -9223372036854775808, 9223372036854775807,
            18446744073709551615, 1.5, "", "it's ''", "100% %s %%", "a\u0000b", "\u00e9", {"k":"it's"}])");
    for (const char* szType : {"string", "int", "long long", "bool", "Json::objectValue",
                               "Json::arrayValue", "Json::Value", "unsigned int", "unsigned long",
                               "double", "float", "uid_t", "time_t", "nosuch"}) {
        Open(std::string("v:") + szType, "v");
        for (const Json::Value& jValue : jValues) {
            std::string strName = "v";
            Json::Value jParam = jValue;
            std::string strText;
            const int nResult = m_pHandle->SqlMakeByMatchField(strName, jParam, strText);
            TakeLog();
            TakeSql();
            Json::Value jRec;
            jRec["v"] = jValue;
            std::string strWhere = "1";
            m_pHandle->recUpdateByWhere(jRec, strWhere);
            TakeLog();
            EXPECT_EQ(TakeSql(), nResult == 0 ? Lines{Statement(strText, "1")} : Lines())
                << szType << " " << Compact(jValue);
        }
    }
}

TEST_F(Update, TextToSetNeedsNoMemoryOfTheFormatter) {
    Json::Value jRec;
    jRec["name"] = LongText();
    std::string strWhere = "id=1";
    {
        ScarceMemory scarce;
        EXPECT_EQ(m_pHandle->recUpdateByWhere(jRec, strWhere), -1);
    }
    const Lines vecLog = TakeLog();
    ASSERT_FALSE(vecLog.empty());
    const std::string strSql = Statement("name='" + LongText() + "'", strWhere);
    EXPECT_TRUE(vecLog.front() == RunFailed("out of memory", strSql));
    EXPECT_EQ(All(), kThreeRows);
}

// ---- by filter ---------------------------------------------------------------------------------

TEST_F(Update, FilterSelectsTheRows) {
    ByFilter(R"({"id":2,"name":"b"})", R"({"name":"B","size":0})", 0);
    EXPECT_EQ(TakeSql(), Lines{Statement("name='B' , size=0", " (id=2 and name='b' )")});
    EXPECT_EQ(All(), "1|a|10\n2|B|0\n3|c|30");
}

TEST_F(Update, FilterThatMatchesNothingSucceeds) {
    ByFilter(R"({"id":99})", R"({"size":0})", 0);
    EXPECT_EQ(All(), kThreeRows);
}

TEST_F(Update, EmptyFilterIsRefused) {
    for (const char* szFilter : {"null", "{}", "[]"}) {
        SCOPED_TRACE(szFilter);
        ByFilter(szFilter, R"({"size":0})", -1,
                 {Check("jFilterIn.empty()"), FilterTail(R"({"size":0})")});
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Update, FilterOfAWrongKindIsRefused) {
    for (const char* szFilter : {"[1]", "\"id\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szFilter);
        ByFilter(szFilter, "[2]", -1,
                 {Check("jFilterIn.type() != Json::objectValue"), FilterTail("[2]")});
    }
}

TEST_F(Update, NewValuesOfAWrongKindAreRefused) {
    for (const char* szRecord : {"null", "[]", "[1]", "\"name\"", "7", "true"}) {
        SCOPED_TRACE(szRecord);
        ByFilter(R"({"id":1})", szRecord, -1,
                 {Check("jParamIn.type() != Json::objectValue"), FilterTail(szRecord)});
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Update, FirstOfSeveralRefusalsIsReported) {
    ByFilter("null", "[2]", -1, {Check("jFilterIn.empty()"), FilterTail("[2]")});
    ByFilter(R"({"vornSqlWhereFilter":1})", "[2]", -1,
             {Check("jParamIn.type() != Json::objectValue"), FilterTail("[2]")});
}

TEST_F(Update, RefusedFilterRunsNothing) {
    ByFilter(R"({"vornSqlWhereFilter":1})", R"({"size":"bad"})", -1,
             {Check("!jRecParam[jmFieldName[i]].isString()"), Check(kAnd),
              FilterTail(R"({"size":"bad"})")});
    ByFilter(R"({"size":{}})", R"({"size":1})", -1,
             {Check(kQuoteText), Check(kMatchFailed), Check(kAnd), FilterTail(R"({"size":1})")});
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Update, FilterWithoutAConditionNeverBecomesAWholeTableUpdate) {
    for (const char* szFilter : {R"({"limit":1})", R"({"sort_by":"id"})", R"({"nobody":[]})"}) {
        SCOPED_TRACE(szFilter);
        ByFilter(szFilter, R"({"size":"bad"})", -1,
                 {Check("strSql.empty()"), FilterTail(R"({"size":"bad"})")});
    }
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(All(), kThreeRows);
}

TEST_F(Update, EmptyListInTheFilterIsRejectedBySqlite) {
    const std::string strSql = Statement("size=0", " ( )");
    ByFilter(
        R"({"id":[]})", R"({"size":0})", -1,
        {RunFailed("near \")\": syntax error", strSql), Check(kRun), Plain(R"(jRecIn={"size":0})"),
         SqlError("near \")\": syntax error", strSql), Check(kInner), FilterTail(R"({"size":0})")});
    EXPECT_EQ(All(), kThreeRows);
}

TEST_F(Update, WronglyTypedNewValueRunsNothing) {
    ByFilter(R"({"id":1})", R"({"size":"7"})", -1,
             {Located(R"(type failed, strKey=size, jRecParam={"size":"7"})"),
              Check("0 > checkJsonType(jParamIn)"), FilterTail(R"({"size":"7"})")});
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
}

TEST_F(Update, EmptyNewValuesFailInTheInnerUpdate) {
    ByFilter(R"({"id":1})", "{}", -1,
             {Check("jRecIn.empty()"), Plain("jRecIn={}"), Check(kInner), FilterTail("{}")});
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Update, KeyOfAnotherRowIsADuplicateAndChangesNoRow) {
    const std::string strSql = Statement("id=3", " ( id < 3  )");
    const std::string strError = "UNIQUE constraint failed: t.id";
    ByFilter(R"({"vornSqlWhereFilter":"id < 3"})", R"({"id":3})", -1,
             {RunFailed(strError, strSql), Check(kRun), Plain(R"(jRecIn={"id":3})"),
              SqlError(strError, strSql), Check(kInner), FilterTail(R"({"id":3})")});
    EXPECT_EQ(TakeSql(), Lines{strSql});
    EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
    EXPECT_EQ(All(), kThreeRows);
}

TEST_F(Update, LaterFailureWithoutSqlReportsTheStaleDuplicateAgain) {
    MakeStaleDuplicate();
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
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
        m_pHandle->setErrMsg("");
        Json::Value jFilter = ParseJson(szFilter);
        Json::Value jRec = ParseJson(szRecord);
        EXPECT_EQ(m_pHandle->recUpdateByFilter(jFilter, jRec), -1);
        EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Update, DuplicateIsReportedBehindTheLastLine) {
    MakeStaleDuplicate();
    std::string strAtTheTail = "no line";
    OnNextLine([&] { OnNextLine([&] { strAtTheTail = m_pHandle->getErrMsg(); }); });
    ByFilter("{}", "{}", -1, {Check("jFilterIn.empty()"), FilterTail("{}")});
    EXPECT_EQ(strAtTheTail, "");
    EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
}

TEST_F(Update, WholeRealPassesForAnInteger) {
    ByFilter(R"({"id":1.0})", R"({"size":3.0})", 0);
    EXPECT_EQ(TakeSql(), Lines{Statement("size=3.0", " (id=1.0 )")});
    EXPECT_EQ(All(), "1|a|3\n2|b|20\n3|c|30");
}

TEST_F(Update, OtherRefusalAndSuccessLeaveTheErrorMessage) {
    m_pHandle->setErrMsg("kept");
    ByFilter(R"({"id":1})", R"({"size":1})", 0);
    EXPECT_EQ(m_pHandle->getErrMsg(), "kept");
    FailNextExec({{SQLITE_FULL, "database or disk is full", 28}});
    Json::Value jFilter = ParseJson(R"({"id":1})");
    Json::Value jRec = ParseJson(R"({"size":2})");
    EXPECT_EQ(m_pHandle->recUpdateByFilter(jFilter, jRec), -1);
    EXPECT_EQ(m_pHandle->getErrMsg(), "kept");
    TakeLog();
}

TEST_F(Update, UnknownNewValuesAreIgnoredBesideKnownOnes) {
    ByFilter(R"({"id":1})", R"({"other":{},"size":5,"vornSqlWhereFilter":"x"})", 0);
    EXPECT_EQ(TakeSql(), Lines{Statement("size=5", " (id=1 )")});
}

TEST_F(Update, SameObjectAsFilterAndNewValues) {
    Json::Value jBoth = ParseJson(R"({"id":1,"name":"a"})");
    EXPECT_EQ(m_pHandle->recUpdateByFilter(jBoth, jBoth), 0);
    EXPECT_EQ(TakeSql(), Lines{Statement("id=1 , name='a'", " (id=1 and name='a' )")});
    EXPECT_EQ(All(), kThreeRows);
}
