// recCreate: defaults, type check, insert, and the one error message of the library's own.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

const char kDuplicate[] = "DUPLICATE_PRIMARY_KEY";

class Create : public FreshTableTest {
  protected:
    // id is the key, name has the default "new", size defaults to 0.
    VornJsonDbApi& OpenItem(const char* szMore = "") {
        return OpenMembers(
            ParseJson(R"({"id":{"cpptype":"int"},
                                    "name":{"cpptype":"string","cppDefaultValue":"new"},
                                    "size":{"cpptype":"int","cppDefaultValue":0}})"),
            std::string("id integer primary key,name text") + szMore + ",size integer");
    }

    std::string Insert(const std::string& strNames, const std::string& strValues) {
        return "INSERT INTO " + m_strTable + " (" + strNames + ") VALUES (" + strValues +
               ") ;select * from " + m_strTable + " where rowid == last_insert_rowid();";
    }

    // The lines of a refusal by SQLite, for the working copy as given.
    Lines SqlFailure(const std::string& strError, const std::string& strSql,
                     const std::string& strCopy) {
        return {RunFailed(strError, strSql),
                Check("0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)"),
                Plain("blCreate=1, jRecInOut=" + strCopy),
                Plain(R"(jType={"id":{"cpptype":"int"},)"
                      R"("name":{"cppDefaultValue":"new","cpptype":"string"},)"
                      R"("size":{"cppDefaultValue":0,"cpptype":"int"}})"),
                SqlError(strError, strSql),
                Check("0 > recSave(jParam, true)"),
                Plain("call create rec, rec=" + strCopy)};
    }

    void ExpectFailure(VornJsonDbApi& api, const Json::Value& jGiven, const Lines& vecLines,
                       const Lines& vecSql = {}) {
        Json::Value jIn = jGiven;
        Json::Value jOut = ParseJson(R"({"kept":1})");
        EXPECT_EQ(-1, api.recCreate(jIn, jOut));
        EXPECT_EQ(vecLines, TakeLog());
        EXPECT_EQ(vecSql, TakeSql());
        EXPECT_EQ(jGiven, jIn);
        EXPECT_EQ(R"({"kept":1})", Compact(jOut));
    }

    Json::Value Created(VornJsonDbApi& api, const Json::Value& jGiven) {
        Json::Value jIn = jGiven;
        Json::Value jOut = ParseJson(R"({"old":1})");
        EXPECT_EQ(0, api.recCreate(jIn, jOut));
        EXPECT_EQ(Lines{}, TakeLog());
        EXPECT_EQ(jGiven, jIn);
        return jOut;
    }

    std::string Refusal() { return "UNIQUE constraint failed: " + m_strTable + ".id"; }
};

}  // namespace

TEST_F(Create, DefaultsAreFilledAndTheStoredRowReplacesTheOutput) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"({"id":3,"name":"new","size":0})", Compact(Created(api, ParseJson(R"({"id":3})"))));
    EXPECT_EQ(Lines{Insert("id,name,size", "3,'new',0")}, TakeSql());
    EXPECT_EQ("3|new|0", Rows("select * from " + m_strTable + ";"));
}

TEST_F(Create, EmptyRecordIsRefused) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szRecord : {"null", "{}", "[]"}) {
        SCOPED_TRACE(szRecord);
        ExpectFailure(
            api, ParseJson(szRecord),
            {Check("jRecIn.empty()"), Plain(std::string("call create rec, rec=") + szRecord)});
    }
    EXPECT_EQ("0", Count());
    EXPECT_EQ("", api.getErrMsg());
}

TEST_F(Create, RecordThatIsNoObjectIsReportedByTheTypeCheck) {
    VornJsonDbApi& api = OpenItem();
    for (const char* szRecord : {"[1]", "\"x\"", "\"\"", "5", "0", "1.5", "true", "false"}) {
        SCOPED_TRACE(szRecord);
        ExpectFailure(api, ParseJson(szRecord),
                      {Check("!jRecParam.isObject()"), Check("0 > checkJsonType(jParam)"),
                       Plain(std::string("call create rec, rec=") + szRecord)});
    }
}

TEST_F(Create, WronglyTypedValueRunsNoSql) {
    VornJsonDbApi& api = OpenItem();
    const std::string strCopy = R"({"id":"3","name":"new","size":0})";
    ExpectFailure(api, ParseJson(R"({"id":"3"})"),
                  {Located("type failed, strKey=id, jRecParam=" + strCopy),
                   Check("0 > checkJsonType(jParam)"), Plain("call create rec, rec=" + strCopy)});
    EXPECT_EQ("", api.getErrMsg());
}

TEST_F(Create, RecordWithoutAnyMemberOfTheTableIsMadeOfDefaults) {
    VornJsonDbApi& api =
        OpenMembers(ParseJson(R"({"a":{"cpptype":"int","cppDefaultValue":7}})"), "a");
    EXPECT_EQ(R"({"a":7})", Compact(Created(api, ParseJson(R"({"unknown":1})"))));
}

TEST_F(Create, DefaultOfAWrongTypeIsRefusedLikeAnyValue) {
    VornJsonDbApi& api = OpenMembers(
        ParseJson(R"({"a":{"cpptype":"int"},"b":{"cpptype":"int","cppDefaultValue":"7"}})"), "a,b");
    ExpectFailure(
        api, ParseJson(R"({"a":1})"),
        {Located(R"(type failed, strKey=b, jRecParam={"a":1,"b":"7"})"),
         Check("0 > checkJsonType(jParam)"), Plain(R"(call create rec, rec={"a":1,"b":"7"})")});
}

TEST_F(Create, MemberOfATypeOutsideTheCheckIsRefused) {
    VornJsonDbApi& api = Open("a:unsigned int");
    ExpectFailure(api, ParseJson(R"({"a":1})"),
                  {Located("type not found!!, key=a"), Check("0 > checkJsonType(jParam)"),
                   Plain(R"(call create rec, rec={"a":1})")});
}

TEST_F(Create, TypeThatPassesTheCheckButCannotBeRenderedIsRefusedBySave) {
    VornJsonDbApi& api = Open("t:time_t");
    ExpectFailure(
        api, ParseJson(R"({"t":1})"),
        {Located("cannot support this type=time_t"),
         Check("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
         Plain(R"(blCreate=1, jRecInOut={"t":1})"), Plain(R"(jType={"t":{"cpptype":"time_t"}})"),
         Check("0 > recSave(jParam, true)"), Plain(R"(call create rec, rec={"t":1})")});
}

TEST_F(Create, StoredKeyIsADuplicate) {
    VornJsonDbApi& api = OpenItem();
    Created(api, ParseJson(R"({"id":1})"));
    TakeSql();
    const std::string strSql = Insert("id,name,size", "1,'again',0");
    ExpectFailure(api, ParseJson(R"({"id":1,"name":"again"})"),
                  SqlFailure(Refusal(), strSql, R"({"id":1,"name":"again","size":0})"), {strSql});
    EXPECT_EQ(kDuplicate, api.getErrMsg());
    EXPECT_EQ("1|new|0", Rows("select * from " + m_strTable + ";"));
}

TEST_F(Create, UniqueColumnOtherThanTheKeyIsADuplicateToo) {
    VornJsonDbApi& api = OpenItem(" unique");
    Created(api, ParseJson(R"({"id":1})"));
    Json::Value jIn = ParseJson(R"({"id":2})");
    EXPECT_EQ(-1, api.recCreate(jIn, jIn));
    EXPECT_EQ(kDuplicate, api.getErrMsg());
    TakeLog();
}

TEST_F(Create, LaterFailureWithoutSqlReportsTheStaleDuplicateAgain) {
    VornJsonDbApi& api = OpenItem();
    MakeStaleDuplicate(api);
    EXPECT_EQ("", api.getErrMsg());
    ExpectFailure(api, ParseJson("{}"),
                  {Check("jRecIn.empty()"), Plain("call create rec, rec={}")});
    EXPECT_EQ(kDuplicate, api.getErrMsg());
    api.setErrMsg("");
    ExpectFailure(api, ParseJson("[7]"),
                  {Check("!jRecParam.isObject()"), Check("0 > checkJsonType(jParam)"),
                   Plain("call create rec, rec=[7]")});
    EXPECT_EQ(kDuplicate, api.getErrMsg());
    api.setErrMsg("");
    Json::Value jWrong = ParseJson(R"({"id":"3"})");
    EXPECT_EQ(-1, api.recCreate(jWrong, jWrong));
    EXPECT_EQ(kDuplicate, api.getErrMsg());
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Create, RefusalByTheValuesReportsTheStaleDuplicateAgain) {
    VornJsonDbApi& api = Open("id:int,name:string,t:time_t", "id integer primary key,name text,t");
    for (const char* szRecord : {R"({"id":1,"name":"a","t":2})", R"({"id":1,"name":"%s","t":2})"}) {
        SCOPED_TRACE(szRecord);
        MakeStaleDuplicate(api);
        api.setErrMsg("");
        Json::Value jRec = ParseJson(szRecord);
        EXPECT_EQ(-1, api.recCreate(jRec, jRec));
        EXPECT_EQ(kDuplicate, api.getErrMsg());
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Create, DuplicateIsReportedBehindTheLastLine) {
    VornJsonDbApi& api = OpenItem();
    MakeStaleDuplicate(api);
    std::string strAtTheTail = "no line";
    OnNextLine([&] { OnNextLine([&] { strAtTheTail = api.getErrMsg(); }); });
    ExpectFailure(api, ParseJson("{}"),
                  {Check("jRecIn.empty()"), Plain("call create rec, rec={}")});
    EXPECT_EQ("", strAtTheTail);
    EXPECT_EQ(kDuplicate, api.getErrMsg());
}

TEST_F(Create, WholeRealPassesForAnIntegerAndIsStoredAsOne) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"({"id":3,"name":"new","size":-4})",
              Compact(Created(api, ParseJson(R"({"id":3.0,"size":-4.0})"))));
    EXPECT_EQ(Lines{Insert("id,name,size", "3,'new',-4")}, TakeSql());
    const std::string strCopy = R"({"id":3.5,"name":"new","size":0})";
    ExpectFailure(api, ParseJson(R"({"id":3.5})"),
                  {Located("type failed, strKey=id, jRecParam=" + strCopy),
                   Check("0 > checkJsonType(jParam)"), Plain("call create rec, rec=" + strCopy)});
}

TEST_F(Create, StatementThatSucceededEndsTheStaleDuplicate) {
    VornJsonDbApi& api = OpenItem();
    MakeStaleDuplicate(api);
    Created(api, ParseJson(R"({"id":1})"));
    TakeSql();
    ExpectFailure(api, ParseJson("{}"),
                  {Check("jRecIn.empty()"), Plain("call create rec, rec={}")});
    EXPECT_EQ("", api.getErrMsg());
}

TEST_F(Create, SuccessDoesNotClearTheErrorMessage) {
    VornJsonDbApi& api = OpenItem();
    api.setErrMsg("kept");
    Created(api, ParseJson(R"({"id":1})"));
    EXPECT_EQ("kept", api.getErrMsg());
}

TEST_F(Create, DuplicateReplacesAnEarlierErrorMessage) {
    VornJsonDbApi& api = OpenItem();
    api.setErrMsg("old");
    MakeStaleDuplicate(api);
    ExpectFailure(api, ParseJson("{}"),
                  {Check("jRecIn.empty()"), Plain("call create rec, rec={}")});
    EXPECT_EQ(kDuplicate, api.getErrMsg());
}

TEST_F(Create, OtherRefusalLeavesTheErrorMessage) {
    VornJsonDbApi& api = OpenItem(" check (name <> 'bad')");
    api.setErrMsg("kept");
    const std::string strSql = Insert("id,name,size", "1,'bad',0");
    ExpectFailure(api, ParseJson(R"({"id":1,"name":"bad"})"),
                  SqlFailure("CHECK constraint failed: name <> 'bad'", strSql,
                             R"({"id":1,"name":"bad","size":0})"),
                  {strSql});
    EXPECT_EQ("kept", api.getErrMsg());
}

TEST_F(Create, MissingTableLeavesTheErrorMessage) {
    VornJsonDbApi& api = OpenItem();
    Sql("drop table " + m_strTable + ";");
    const std::string strSql = Insert("id,name,size", "1,'new',0");
    ExpectFailure(
        api, ParseJson(R"({"id":1})"),
        SqlFailure("no such table: " + m_strTable, strSql, R"({"id":1,"name":"new","size":0})"),
        {strSql});
    EXPECT_EQ("", api.getErrMsg());
}

TEST_F(Create, FailedReadBackLeavesTheRowStoredAndTheOutputAlone) {
    VornJsonDbApi& api = OpenItem(",extra default 'e'");
    Json::Value jIn = ParseJson(R"({"id":1})");
    Json::Value jOut("kept");
    EXPECT_EQ(-1, api.recCreate(jIn, jOut));
    EXPECT_EQ(Json::Value("kept"), jOut);
    EXPECT_EQ("", api.getErrMsg());
    EXPECT_EQ("1|new|e|0", Rows("select * from " + m_strTable + ";"));
    EXPECT_EQ(Plain(R"(call create rec, rec={"id":1,"name":"new","size":0})"), TakeLog().back());
}

TEST_F(Create, AssignedKeyComesBack) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"({"id":1,"name":"a","size":0})",
              Compact(Created(api, ParseJson(R"({"name":"a"})"))));
    EXPECT_EQ(R"({"id":2,"name":"b","size":0})",
              Compact(Created(api, ParseJson(R"({"name":"b"})"))));
}

TEST_F(Create, UnknownMembersAreNotStoredAndNotReturned) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"({"id":1,"name":"new","size":0})",
              Compact(Created(api, ParseJson(R"({"id":1,"aa":{},"zz":null})"))));
}

TEST_F(Create, SameObjectAsInputAndOutputEndsAsTheStoredRow) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jRec = ParseJson(R"({"name":"a","other":1})");
    EXPECT_EQ(0, api.recCreate(jRec, jRec));
    EXPECT_EQ(R"({"id":1,"name":"a","size":0})", Compact(jRec));
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(Create, SameObjectAsInputAndOutputIsUnchangedByAFailure) {
    VornJsonDbApi& api = OpenItem();
    Json::Value jRec = ParseJson(R"({"id":"text"})");
    EXPECT_EQ(-1, api.recCreate(jRec, jRec));
    EXPECT_EQ(R"({"id":"text"})", Compact(jRec));
    TakeLog();
}

TEST_F(Create, PresentNullIsNotReplacedByTheDefaultAndFailsTheCheck) {
    VornJsonDbApi& api = OpenItem();
    const std::string strCopy = R"({"id":1,"name":null,"size":0})";
    ExpectFailure(api, ParseJson(R"({"id":1,"name":null})"),
                  {Located("type failed, strKey=name, jRecParam=" + strCopy),
                   Check("0 > checkJsonType(jParam)"), Plain("call create rec, rec=" + strCopy)});
}

TEST_F(Create, LastMemberWithADefaultMakesAShortRecordComplete) {
    VornJsonDbApi& api = OpenItem();
    EXPECT_EQ(R"({"id":9,"name":"n","size":0})",
              Compact(Created(api, ParseJson(R"({"id":9,"name":"n"})"))));
}

TEST_F(Create, LastMemberWithoutADefaultLeavesAStatementThatSqliteRejects) {
    VornJsonDbApi& api = Open("a:int,b:int");
    Json::Value jIn = ParseJson(R"({"a":1})");
    Json::Value jOut;
    EXPECT_EQ(-1, api.recCreate(jIn, jOut));
    const Lines vecSql = TakeSql();
    ASSERT_EQ(1U, vecSql.size());
    EXPECT_EQ("INSERT INTO " + m_strTable + " (a,) VALUES (1,;select * from " + m_strTable +
                  " where rowid == last_insert_rowid();",
              vecSql[0]);
    EXPECT_EQ(RunFailed("near \")\": syntax error", vecSql[0]), TakeLog().at(0));
    EXPECT_TRUE(jOut.isNull());
}

}  // namespace testhost
