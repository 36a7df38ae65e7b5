// SqlExpandMemberList: a query object as conditions, a record as assignments.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

class ConditionList : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        Open("name:string,size:int");
    }

    std::string Expanded(const char* szQuery, int nMode, int nResult = 0) {
        std::string strSql;
        Json::Value jQuery = ParseJson(szQuery);
        const Json::Value jBefore = jQuery;
        EXPECT_EQ(m_pHandle->SqlExpandMemberList(jQuery, strSql, nMode), nResult);
        EXPECT_EQ(jQuery, jBefore);
        EXPECT_EQ(TakeLog(), Lines());
        EXPECT_EQ(TakeSql(), Lines());
        return strSql;
    }

    // What a failing call leaves in the text behind "x".
    std::string Left(const char* szQuery, int nMode, const Lines& vecLines) {
        std::string strSql = "x";
        Json::Value jQuery = ParseJson(szQuery);
        const Json::Value jBefore = jQuery;
        EXPECT_EQ(m_pHandle->SqlExpandMemberList(jQuery, strSql, nMode), -1);
        EXPECT_EQ(jQuery, jBefore);
        EXPECT_EQ(TakeLog(), vecLines);
        EXPECT_EQ(TakeSql(), Lines());
        EXPECT_EQ(strSql.substr(0, 1), "x");
        return strSql.substr(1);
    }
};

const int kOrMode = VORN_SQL_WHERE_TYPE_OR;
const int kAndMode = VORN_SQL_WHERE_TYPE_AND;
const int kCommaMode = VORN_SQL_WHERE_TYPE_COMMA;

const char kKindCheck[] =
    "jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue";
const char kMembershipFailed[] =
    "0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)";

}  // namespace

TEST_F(ConditionList, JoinModesHaveTheirNumbers) {
    EXPECT_EQ(kOrMode, 0);
    EXPECT_EQ(kAndMode, 1);
    EXPECT_EQ(kCommaMode, 2);
}

TEST_F(ConditionList, AndModeWrapsTheJoinedConditions) {
    EXPECT_EQ(Expanded(R"({"size":5,"name":"x"})", kAndMode), " (name='x' and size=5 )");
}

TEST_F(ConditionList, OrModeWrapsTheJoinedConditions) {
    Open("a:string,b:int");
    EXPECT_EQ(Expanded(R"({"a":"x","b":2})", kOrMode), " (a='x' or b=2 )");
}

TEST_F(ConditionList, CommaModeJoinsWithoutWrapping) {
    EXPECT_EQ(Expanded(R"({"name":"y","size":6})", kCommaMode), "name='y' , size=6");
}

TEST_F(ConditionList, SingleConditionNeedsNoJoiner) {
    EXPECT_EQ(Expanded(R"({"size":5})", kAndMode), " (size=5 )");
    EXPECT_EQ(Expanded(R"({"size":5})", kOrMode), " (size=5 )");
    EXPECT_EQ(Expanded(R"({"size":5})", kCommaMode), "size=5");
}

TEST_F(ConditionList, AppendsToTheTextItIsGiven) {
    std::string strSql = "WHERE";
    Json::Value jQuery = ParseJson(R"({"size":5})");
    EXPECT_EQ(m_pHandle->SqlExpandMemberList(jQuery, strSql, kAndMode), 0);
    EXPECT_EQ(strSql, "WHERE (size=5 )");
}

TEST_F(ConditionList, NullOrEmptyObjectGivesOneAndNoText) {
    for (int nMode : {kOrMode, kAndMode, kCommaMode}) {
        EXPECT_EQ(Expanded("null", nMode, 1), "");
        EXPECT_EQ(Expanded("{}", nMode, 1), "");
    }
}

TEST_F(ConditionList, SortAndPagingKeysAloneGiveOneAndNoText) {
    EXPECT_EQ(Expanded(R"({"sort_by":"name","limit":1,"offset":2})", kAndMode, 1), "");
    EXPECT_EQ(Expanded(R"({"limit":1})", kAndMode, 1), "");
    EXPECT_EQ(Expanded(R"({"sort_direction":"desc"})", kCommaMode, 1), "");
}

TEST_F(ConditionList, UnknownMembersAreSkippedSilently) {
    EXPECT_EQ(Expanded(R"({"Name":"x","zz":[]})", kAndMode, 1), "");
    EXPECT_EQ(Expanded(R"({"aa":1,"name":"x","nn":[],"size":1,"zz":{}})", kAndMode),
              " (name='x' and size=1 )");
}

TEST_F(ConditionList, MemberNamedLimitInTheTableIsACondition) {
    Open("limit:int,sort_by:string", "a");
    EXPECT_EQ(Expanded(R"({"limit":5,"offset":1,"sort_by":"x"})", kAndMode),
              " (limit=5 and sort_by='x' )");
}

TEST_F(ConditionList, ArrayValueIsAMembershipCondition) {
    EXPECT_EQ(Expanded(R"({"name":["a"],"size":[1,2]})", kAndMode),
              " (name in ('a' ) and size in (12 ) )");
}

TEST_F(ConditionList, ArrayOfAJsonTypedMemberIsAMembershipToo) {
    Open("j:Json::arrayValue");
    EXPECT_EQ(Expanded(R"({"j":[1,{}]})", kAndMode), " (j in ('1''{}' ) )");
}

TEST_F(ConditionList, ObjectValueIsAnEquality) {
    Open("j:Json::objectValue");
    EXPECT_EQ(Expanded(R"({"j":{"k":[1]}})", kAndMode), R"( (j='{"k":[1]}' ))");
}

TEST_F(ConditionList, NullValueIsAnEqualityWithItsStringForm) {
    EXPECT_EQ(Expanded(R"({"name":null,"size":null})", kAndMode), " (name='' and size= )");
}

TEST_F(ConditionList, RawFilterStandsBetweenTwoBlanksOnEachSide) {
    EXPECT_EQ(Expanded(R"({"name":"x","vornSqlWhereFilter":"size > 3"})", kAndMode),
              " (name='x' and  size > 3  )");
}

TEST_F(ConditionList, RawFilterAloneIsEnough) {
    EXPECT_EQ(Expanded(R"({"vornSqlWhereFilter":"1=1"})", kAndMode), " ( 1=1  )");
    EXPECT_EQ(Expanded(R"({"vornSqlWhereFilter":""})", kOrMode), " (   )");
}

TEST_F(ConditionList, RawFilterIsTakenAsItStands) {
    EXPECT_EQ(Expanded(u8R"({"vornSqlWhereFilter":"n like '100%s%%' or x='é' -- \"\n"})", kAndMode),
              u8" ( n like '100%s%%' or x='é' -- \"\n  )");
}

TEST_F(ConditionList, RawFilterLandsInASetList) {
    EXPECT_EQ(Expanded(R"({"name":"y","vornSqlWhereFilter":"size=6"})", kCommaMode),
              "name='y' ,  size=6 ");
}

TEST_F(ConditionList, RawFilterIsRawEvenWhenTheTableDefinesTheName) {
    Open("vornSqlWhereFilter:string");
    EXPECT_EQ(Expanded(R"({"vornSqlWhereFilter":"a=1"})", kAndMode), " ( a=1  )");
    Open("vornSqlWhereFilter:int");
    EXPECT_EQ(Left(R"({"vornSqlWhereFilter":1})", kAndMode,
                   {Check("!jRecParam[jmFieldName[i]].isString()")}),
              " (");
}

TEST_F(ConditionList, RawFilterThatIsNoStringIsRefusedWithTheLeadInWritten) {
    const Lines vecLines{Check("!jRecParam[jmFieldName[i]].isString()")};
    for (const char* szValue : {"5", "null", "true", "1.5", "[\"a\"]", "{}"}) {
        SCOPED_TRACE(szValue);
        const std::string strQuery = std::string(R"({"vornSqlWhereFilter":)") + szValue + "}";
        EXPECT_EQ(Left(strQuery.c_str(), kAndMode, vecLines), " (");
        EXPECT_EQ(Left(strQuery.c_str(), kCommaMode, vecLines), "");
    }
    EXPECT_EQ(Left(R"({"name":"x","vornSqlWhereFilter":5})", kAndMode, vecLines),
              " (name='x' and ");
}

TEST_F(ConditionList, EmptyListLeavesItsJoinerBehind) {
    Open("a:int,b:int");
    EXPECT_EQ(Expanded(R"({"a":[],"b":1})", kAndMode), " ( and b=1 )");
    EXPECT_EQ(Expanded(R"({"a":1,"b":[]})", kAndMode), " (a=1 and  )");
    EXPECT_EQ(Expanded(R"({"a":[],"b":1})", kOrMode), " ( or b=1 )");
    EXPECT_EQ(Expanded(R"({"a":[],"b":1})", kCommaMode), " , b=1");
    EXPECT_EQ(Expanded(R"({"a":1,"b":[]})", kCommaMode), "a=1 , ");
}

TEST_F(ConditionList, EmptyListAloneCountsAsWritten) {
    Open("a:int");
    EXPECT_EQ(Expanded(R"({"a":[]})", kAndMode, 0), " ( )");
    EXPECT_EQ(Expanded(R"({"a":[]})", kCommaMode, 0), "");
}

TEST_F(ConditionList, ArrayInASetListIsWrittenAsMembership) {
    EXPECT_EQ(Expanded(R"({"name":["a"]})", kCommaMode), "name in ('a' )");
}

TEST_F(ConditionList, QueryOfAWrongKindIsRefused) {
    for (const char* szQuery : {"[]", "[{\"name\":\"x\"}]", "\"name\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szQuery);
        EXPECT_EQ(Left(szQuery, kAndMode, {Check(kKindCheck)}), "");
        EXPECT_EQ(Left(szQuery, 99, {Check(kKindCheck)}), "");
    }
}

TEST_F(ConditionList, UnknownJoinModeIsNamed) {
    EXPECT_EQ(Left(R"({"name":"x"})", 3, {Located("error andType=3")}), "");
    EXPECT_EQ(Left(R"({"name":"x"})", -1, {Located("error andType=-1")}), "");
    EXPECT_EQ(Left("null", 3, {Located("error andType=3")}), "");
}

TEST_F(ConditionList, FailingEqualityIsReportedTwiceAndLeavesWhatStands) {
    EXPECT_EQ(Left(R"({"name":"x","size":{}})", kAndMode, {Check(kQuoteText), Check(kMatchFailed)}),
              " (name='x' and ");
    EXPECT_EQ(Left(R"({"name":{},"size":1})", kAndMode, {Check(kQuoteText), Check(kMatchFailed)}),
              " (");
    EXPECT_EQ(
        Left(R"({"name":"x","size":{}})", kCommaMode, {Check(kQuoteText), Check(kMatchFailed)}),
        "name='x' , ");
}

TEST_F(ConditionList, FormatterWithoutMemoryFailsInEveryMode) {
    Json::Value jQuery;
    jQuery["name"] = LongText();
    for (const int nMode : {kOrMode, kAndMode, kCommaMode}) {
        ScarceMemory scarce;
        std::string strSql;
        EXPECT_EQ(m_pHandle->SqlExpandMemberList(jQuery, strSql, nMode), -1) << nMode;
        EXPECT_EQ(TakeLog(), (Lines{Check(kQuoteText), Check(kMatchFailed)})) << nMode;
    }
}

TEST_F(ConditionList, FailingMembershipIsReportedTwiceAndLeavesWhatStands) {
    EXPECT_EQ(Left(R"({"name":"x","size":[1,[]]})", kOrMode,
                   {Check(kQuoteListText), Check(kMembershipFailed)}),
              " (name='x' or ");
}

TEST_F(ConditionList, WrongKindForABoolMemberNamesTheBoolCall) {
    Open("flag:bool");
    EXPECT_EQ(Left(R"({"flag":"yes"})", kAndMode,
                   {Check(R"(NULL == (szSql = sqlite3_mprintf("%d", jParam.asInt())))"),
                    Check(kMatchFailed)}),
              " (");
}

TEST_F(ConditionList, HandleWorksOnAfterAFailure) {
    Left(R"({"size":{}})", kAndMode, {Check(kQuoteText), Check(kMatchFailed)});
    EXPECT_EQ(Expanded(R"({"size":1})", kAndMode), " (size=1 )");
}

TEST_F(ConditionList, ConditionsStandInNameOrder) {
    Open("z:int,a:int,B:int");
    EXPECT_EQ(Expanded(R"({"z":3,"vornSqlWhereFilter":"raw","a":2,"B":1})", kAndMode),
              " (B=1 and a=2 and  raw  and z=3 )");
}

TEST_F(ConditionList, FiveHundredAndTwelveMembers) {
    Json::Value jQuery(Json::objectValue);
    std::string strExpected = " (";
    for (const std::string& strName : ManyMembers().getMemberNames()) {
        strExpected += (jQuery.empty() ? "" : " and ") + strName + "=7";
        jQuery[strName] = 7;
    }
    OpenMembers(ManyMembers(), "a");
    EXPECT_EQ(Expanded(Compact(jQuery).c_str(), kAndMode), strExpected + " )");
}
