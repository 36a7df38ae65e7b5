// SqlExpandMemberList: a query object as conditions, a record as assignments.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

class ConditionList : public FreshTableTest {
  protected:
    VornJsonDbApi& OpenNameAndSize() { return Open("name:string,size:int"); }

    std::string Expanded(VornJsonDbApi& api, const char* szQuery, int nMode, int nResult = 0) {
        std::string strSql;
        Json::Value jQuery = ParseJson(szQuery);
        const Json::Value jBefore = jQuery;
        EXPECT_EQ(nResult, api.SqlExpandMemberList(jQuery, strSql, nMode));
        EXPECT_EQ(jBefore, jQuery);
        EXPECT_EQ(Lines{}, TakeLog());
        EXPECT_EQ(Lines{}, TakeSql());
        return strSql;
    }

    // What a failing call leaves in the text behind "x".
    std::string Left(VornJsonDbApi& api, const char* szQuery, int nMode, const Lines& vecLines) {
        std::string strSql = "x";
        Json::Value jQuery = ParseJson(szQuery);
        const Json::Value jBefore = jQuery;
        EXPECT_EQ(-1, api.SqlExpandMemberList(jQuery, strSql, nMode));
        EXPECT_EQ(jBefore, jQuery);
        EXPECT_EQ(vecLines, TakeLog());
        EXPECT_EQ(Lines{}, TakeSql());
        EXPECT_EQ("x", strSql.substr(0, 1));
        return strSql.substr(1);
    }
};

const int kOr = VORN_SQL_WHERE_TYPE_OR;
const int kAnd = VORN_SQL_WHERE_TYPE_AND;
const int kComma = VORN_SQL_WHERE_TYPE_COMMA;

const char kKindCheck[] =
    "jRecParam.type() != Json::objectValue && jRecParam.type() != Json::nullValue";
const char kListFailed[] = "0 > SqlMakeByListField(jmFieldName[i].c_str(), jTmp, strSqlWhereOut)";
const char kMatchFailed[] = "0 > SqlMakeByMatchField(jmFieldName[i], jTmp, strSqlWhereOut)";
const char kMatchText[] = R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))";
const char kListText[] = R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].asString().c_str())))";

}  // namespace

TEST_F(ConditionList, JoinModesHaveTheirNumbers) {
    EXPECT_EQ(0, kOr);
    EXPECT_EQ(1, kAnd);
    EXPECT_EQ(2, kComma);
}

TEST_F(ConditionList, AndModeWrapsTheJoinedConditions) {
    EXPECT_EQ(" (name='x' and size=5 )",
              Expanded(OpenNameAndSize(), R"({"size":5,"name":"x"})", kAnd));
}

TEST_F(ConditionList, OrModeWrapsTheJoinedConditions) {
    EXPECT_EQ(" (a='x' or b=2 )", Expanded(Open("a:string,b:int"), R"({"a":"x","b":2})", kOr));
}

TEST_F(ConditionList, CommaModeJoinsWithoutWrapping) {
    EXPECT_EQ("name='y' , size=6", Expanded(OpenNameAndSize(), R"({"name":"y","size":6})", kComma));
}

TEST_F(ConditionList, SingleConditionNeedsNoJoiner) {
    VornJsonDbApi& api = OpenNameAndSize();
    EXPECT_EQ(" (size=5 )", Expanded(api, R"({"size":5})", kAnd));
    EXPECT_EQ(" (size=5 )", Expanded(api, R"({"size":5})", kOr));
    EXPECT_EQ("size=5", Expanded(api, R"({"size":5})", kComma));
}

TEST_F(ConditionList, AppendsToTheTextItIsGiven) {
    VornJsonDbApi& api = OpenNameAndSize();
    std::string strSql = "WHERE";
    Json::Value jQuery = ParseJson(R"({"size":5})");
    EXPECT_EQ(0, api.SqlExpandMemberList(jQuery, strSql, kAnd));
    EXPECT_EQ("WHERE (size=5 )", strSql);
}

TEST_F(ConditionList, NullOrEmptyObjectGivesOneAndNoText) {
    VornJsonDbApi& api = OpenNameAndSize();
    for (int nMode : {kOr, kAnd, kComma}) {
        EXPECT_EQ("", Expanded(api, "null", nMode, 1));
        EXPECT_EQ("", Expanded(api, "{}", nMode, 1));
    }
}

TEST_F(ConditionList, SortAndPagingKeysAloneGiveOneAndNoText) {
    VornJsonDbApi& api = OpenNameAndSize();
    EXPECT_EQ("", Expanded(api, R"({"sort_by":"name","limit":1,"offset":2})", kAnd, 1));
    EXPECT_EQ("", Expanded(api, R"({"limit":1})", kAnd, 1));
    EXPECT_EQ("", Expanded(api, R"({"sort_direction":"desc"})", kComma, 1));
}

TEST_F(ConditionList, UnknownMembersAreSkippedSilently) {
    VornJsonDbApi& api = OpenNameAndSize();
    EXPECT_EQ("", Expanded(api, R"({"Name":"x","zz":[]})", kAnd, 1));
    EXPECT_EQ(" (name='x' and size=1 )",
              Expanded(api, R"({"aa":1,"name":"x","nn":[],"size":1,"zz":{}})", kAnd));
}

TEST_F(ConditionList, MemberNamedLimitInTheTableIsACondition) {
    EXPECT_EQ(" (limit=5 and sort_by='x' )",
              Expanded(Open("limit:int,sort_by:string", "a"),
                       R"({"limit":5,"offset":1,"sort_by":"x"})", kAnd));
}

TEST_F(ConditionList, ArrayValueIsAMembershipCondition) {
    VornJsonDbApi& api = OpenNameAndSize();
    EXPECT_EQ(" (name in ('a' ) and size in (12 ) )",
              Expanded(api, R"({"name":["a"],"size":[1,2]})", kAnd));
}

TEST_F(ConditionList, ArrayOfAJsonTypedMemberIsAMembershipToo) {
    EXPECT_EQ(" (j in ('1''{}' ) )", Expanded(Open("j:Json::arrayValue"), R"({"j":[1,{}]})", kAnd));
}

TEST_F(ConditionList, ObjectValueIsAnEquality) {
    EXPECT_EQ(R"( (j='{"k":[1]}' ))",
              Expanded(Open("j:Json::objectValue"), R"({"j":{"k":[1]}})", kAnd));
}

TEST_F(ConditionList, NullValueIsAnEqualityWithItsStringForm) {
    EXPECT_EQ(" (name='' and size= )",
              Expanded(OpenNameAndSize(), R"({"name":null,"size":null})", kAnd));
}

TEST_F(ConditionList, RawFilterStandsBetweenTwoBlanksOnEachSide) {
    EXPECT_EQ(" (name='x' and  size > 3  )",
              Expanded(OpenNameAndSize(), R"({"name":"x","vornSqlWhereFilter":"size > 3"})", kAnd));
}

TEST_F(ConditionList, RawFilterAloneIsEnough) {
    VornJsonDbApi& api = OpenNameAndSize();
    EXPECT_EQ(" ( 1=1  )", Expanded(api, R"({"vornSqlWhereFilter":"1=1"})", kAnd));
    EXPECT_EQ(" (   )", Expanded(api, R"({"vornSqlWhereFilter":""})", kOr));
}

TEST_F(ConditionList, RawFilterIsTakenAsItStands) {
    EXPECT_EQ(u8" ( n like '100%s%%' or x='é' -- \"\n  )",
              Expanded(OpenNameAndSize(),
                       u8R"({"vornSqlWhereFilter":"n like '100%s%%' or x='é' -- \"\n"})", kAnd));
}

TEST_F(ConditionList, RawFilterLandsInASetList) {
    EXPECT_EQ("name='y' ,  size=6 ",
              Expanded(OpenNameAndSize(), R"({"name":"y","vornSqlWhereFilter":"size=6"})", kComma));
}

TEST_F(ConditionList, RawFilterIsRawEvenWhenTheTableDefinesTheName) {
    EXPECT_EQ(" ( a=1  )",
              Expanded(Open("vornSqlWhereFilter:string"), R"({"vornSqlWhereFilter":"a=1"})", kAnd));
    EXPECT_EQ(" (", Left(Open("vornSqlWhereFilter:int"), R"({"vornSqlWhereFilter":1})", kAnd,
                         {Check("!jRecParam[jmFieldName[i]].isString()")}));
}

TEST_F(ConditionList, RawFilterThatIsNoStringIsRefusedWithTheLeadInWritten) {
    VornJsonDbApi& api = OpenNameAndSize();
    const Lines vecLines{Check("!jRecParam[jmFieldName[i]].isString()")};
    for (const char* szValue : {"5", "null", "true", "1.5", "[\"a\"]", "{}"}) {
        SCOPED_TRACE(szValue);
        const std::string strQuery = std::string(R"({"vornSqlWhereFilter":)") + szValue + "}";
        EXPECT_EQ(" (", Left(api, strQuery.c_str(), kAnd, vecLines));
        EXPECT_EQ("", Left(api, strQuery.c_str(), kComma, vecLines));
    }
    EXPECT_EQ(" (name='x' and ",
              Left(api, R"({"name":"x","vornSqlWhereFilter":5})", kAnd, vecLines));
}

TEST_F(ConditionList, EmptyListLeavesItsJoinerBehind) {
    VornJsonDbApi& api = Open("a:int,b:int");
    EXPECT_EQ(" ( and b=1 )", Expanded(api, R"({"a":[],"b":1})", kAnd));
    EXPECT_EQ(" (a=1 and  )", Expanded(api, R"({"a":1,"b":[]})", kAnd));
    EXPECT_EQ(" ( or b=1 )", Expanded(api, R"({"a":[],"b":1})", kOr));
    EXPECT_EQ(" , b=1", Expanded(api, R"({"a":[],"b":1})", kComma));
    EXPECT_EQ("a=1 , ", Expanded(api, R"({"a":1,"b":[]})", kComma));
}

TEST_F(ConditionList, EmptyListAloneCountsAsWritten) {
    VornJsonDbApi& api = Open("a:int");
    EXPECT_EQ(" ( )", Expanded(api, R"({"a":[]})", kAnd, 0));
    EXPECT_EQ("", Expanded(api, R"({"a":[]})", kComma, 0));
}

TEST_F(ConditionList, ArrayInASetListIsWrittenAsMembership) {
    EXPECT_EQ("name in ('a' )", Expanded(OpenNameAndSize(), R"({"name":["a"]})", kComma));
}

TEST_F(ConditionList, QueryOfAWrongKindIsRefused) {
    VornJsonDbApi& api = OpenNameAndSize();
    for (const char* szQuery : {"[]", "[{\"name\":\"x\"}]", "\"name\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szQuery);
        EXPECT_EQ("", Left(api, szQuery, kAnd, {Check(kKindCheck)}));
        EXPECT_EQ("", Left(api, szQuery, 99, {Check(kKindCheck)}));
    }
}

TEST_F(ConditionList, UnknownJoinModeIsNamed) {
    VornJsonDbApi& api = OpenNameAndSize();
    EXPECT_EQ("", Left(api, R"({"name":"x"})", 3, {Located("error andType=3")}));
    EXPECT_EQ("", Left(api, R"({"name":"x"})", -1, {Located("error andType=-1")}));
    EXPECT_EQ("", Left(api, "null", 3, {Located("error andType=3")}));
}

TEST_F(ConditionList, FailingEqualityIsReportedTwiceAndLeavesWhatStands) {
    VornJsonDbApi& api = OpenNameAndSize();
    EXPECT_EQ(" (name='x' and ", Left(api, R"({"name":"x","size":{}})", kAnd,
                                      {Check(kMatchText), Check(kMatchFailed)}));
    EXPECT_EQ(" (",
              Left(api, R"({"name":{},"size":1})", kAnd, {Check(kMatchText), Check(kMatchFailed)}));
    EXPECT_EQ("name='x' , ", Left(api, R"({"name":"x","size":{}})", kComma,
                                  {Check(kMatchText), Check(kMatchFailed)}));
}

TEST_F(ConditionList, FailingMembershipIsReportedTwiceAndLeavesWhatStands) {
    VornJsonDbApi& api = OpenNameAndSize();
    EXPECT_EQ(" (name='x' or ", Left(api, R"({"name":"x","size":[1,[]]})", kOr,
                                     {Check(kListText), Check(kListFailed)}));
}

TEST_F(ConditionList, WrongKindForABoolMemberNamesTheBoolCall) {
    EXPECT_EQ(" (", Left(Open("flag:bool"), R"({"flag":"yes"})", kAnd,
                         {Check(R"(NULL == (szSql = sqlite3_mprintf("%d", jParam.asInt())))"),
                          Check(kMatchFailed)}));
}

TEST_F(ConditionList, HandleWorksOnAfterAFailure) {
    VornJsonDbApi& api = OpenNameAndSize();
    Left(api, R"({"size":{}})", kAnd, {Check(kMatchText), Check(kMatchFailed)});
    EXPECT_EQ(" (size=1 )", Expanded(api, R"({"size":1})", kAnd));
}

TEST_F(ConditionList, ConditionsStandInNameOrder) {
    EXPECT_EQ(" (B=1 and a=2 and  raw  and z=3 )",
              Expanded(Open("z:int,a:int,B:int"),
                       R"({"z":3,"vornSqlWhereFilter":"raw","a":2,"B":1})", kAnd));
}

TEST_F(ConditionList, FiveHundredAndTwelveMembers) {
    Json::Value jMembers(Json::objectValue);
    Json::Value jQuery(Json::objectValue);
    std::string strExpected = " (";
    for (int i = 0; i < 512; ++i) {
        const std::string strName = "m" + std::to_string(1000 + i);
        jMembers[strName]["cpptype"] = "int";
        jQuery[strName] = i;
        strExpected += (i == 0 ? "" : " and ") + strName + "=" + std::to_string(i);
    }
    EXPECT_EQ(strExpected + " )",
              Expanded(OpenMembers(jMembers, "a"), Compact(jQuery).c_str(), kAnd));
}

}  // namespace testhost
