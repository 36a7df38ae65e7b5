// recCreate: defaults, type check, insert, and the one error message of the library's own.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

class Create : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        OpenItem();
    }

    // id is the key, name has the default "new", size defaults to 0.
    void OpenItem(const char* szMore = "") {
        OpenMembers(R"({"id":{"cpptype":"int"},
                        "name":{"cpptype":"string","cppDefaultValue":"new"},
                        "size":{"cpptype":"int","cppDefaultValue":0}})",
                    std::string("id integer primary key,name text") + szMore + ",size integer");
    }

    std::string Insert(const std::string& strNames, const std::string& strValues) {
        return "INSERT INTO t (" + strNames + ") VALUES (" + strValues +
               ") ;select * from t where rowid == last_insert_rowid();";
    }

    // The lines of a refusal by SQLite, for the working copy as given.
    Lines SqlFailure(const std::string& strError, const std::string& strSql,
                     const std::string& strCopy) {
        return {RunFailed(strError, strSql),
                Check(kSaveFailed),
                Plain("blCreate=1, jRecInOut=" + strCopy),
                Plain("jType=" + Types()),
                SqlError(strError, strSql),
                Check("0 > recSave(jParam, true)"),
                Plain("call create rec, rec=" + strCopy)};
    }

    void ExpectFailure(const std::string& strGiven, const Lines& vecLines,
                       const Lines& vecSql = {}) {
        const Json::Value jGiven = ParseJson(strGiven);
        Json::Value jIn = jGiven;
        Json::Value jOut = ParseJson(R"({"kept":1})");
        EXPECT_EQ(m_pHandle->recCreate(jIn, jOut), -1);
        EXPECT_EQ(TakeLog(), vecLines);
        EXPECT_EQ(TakeSql(), vecSql);
        EXPECT_EQ(jIn, jGiven);
        EXPECT_EQ(Compact(jOut), R"({"kept":1})");
    }

    // The stored record.
    std::string Created(const std::string& strGiven) {
        const Json::Value jGiven = ParseJson(strGiven);
        Json::Value jIn = jGiven;
        Json::Value jOut = ParseJson(R"({"old":1})");
        EXPECT_EQ(m_pHandle->recCreate(jIn, jOut), 0);
        EXPECT_EQ(TakeLog(), Lines());
        EXPECT_EQ(jIn, jGiven);
        return Compact(jOut);
    }
};

}  // namespace

TEST_F(Create, DefaultsAreFilledAndTheStoredRowReplacesTheOutput) {
    EXPECT_EQ(Created(R"({"id":3})"), R"({"id":3,"name":"new","size":0})");
    EXPECT_EQ(TakeSql(), Lines{Insert("id,name,size", "3,'new',0")});
    EXPECT_EQ(All(), "3|new|0");
}

TEST_F(Create, EmptyRecordIsRefused) {
    for (const char* szRecord : {"null", "{}", "[]"}) {
        SCOPED_TRACE(szRecord);
        ExpectFailure(szRecord, {Check("jRecIn.empty()"),
                                 Plain(std::string("call create rec, rec=") + szRecord)});
    }
    EXPECT_EQ(Count(), "0");
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
}

TEST_F(Create, RecordThatIsNoObjectIsReportedByTheTypeCheck) {
    for (const char* szRecord : {"[1]", "\"x\"", "\"\"", "5", "0", "1.5", "true", "false"}) {
        SCOPED_TRACE(szRecord);
        ExpectFailure(szRecord, {Check("!jRecParam.isObject()"), Check("0 > checkJsonType(jParam)"),
                                 Plain(std::string("call create rec, rec=") + szRecord)});
    }
}

TEST_F(Create, WronglyTypedValueRunsNoSql) {
    const std::string strCopy = R"({"id":"3","name":"new","size":0})";
    ExpectFailure(R"({"id":"3"})",
                  {Located("type failed, strKey=id, jRecParam=" + strCopy),
                   Check("0 > checkJsonType(jParam)"), Plain("call create rec, rec=" + strCopy)});
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
}

TEST_F(Create, RecordWithoutAnyMemberOfTheTableIsMadeOfDefaults) {
    OpenMembers(R"({"a":{"cpptype":"int","cppDefaultValue":7}})", "a");
    EXPECT_EQ(Created(R"({"unknown":1})"), R"({"a":7})");
}

TEST_F(Create, DefaultOfAWrongTypeIsRefusedLikeAnyValue) {
    OpenMembers(R"({"a":{"cpptype":"int"},"b":{"cpptype":"int","cppDefaultValue":"7"}})", "a,b");
    ExpectFailure(R"({"a":1})", {Located(R"(type failed, strKey=b, jRecParam={"a":1,"b":"7"})"),
                                 Check("0 > checkJsonType(jParam)"),
                                 Plain(R"(call create rec, rec={"a":1,"b":"7"})")});
}

TEST_F(Create, MemberOfATypeOutsideTheCheckIsRefused) {
    Open("a:unsigned int");
    ExpectFailure(R"({"a":1})",
                  {Located("type not found!!, key=a"), Check("0 > checkJsonType(jParam)"),
                   Plain(R"(call create rec, rec={"a":1})")});
}

TEST_F(Create, TypeThatPassesTheCheckButCannotBeRenderedIsRefusedBySave) {
    Open("t:time_t");
    ExpectFailure(
        R"({"t":1})",
        {Located("cannot support this type=time_t"),
         Check("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
         Plain(R"(blCreate=1, jRecInOut={"t":1})"), Plain(R"(jType={"t":{"cpptype":"time_t"}})"),
         Check("0 > recSave(jParam, true)"), Plain(R"(call create rec, rec={"t":1})")});
}

TEST_F(Create, StoredKeyIsADuplicate) {
    Created(R"({"id":1})");
    TakeSql();
    const std::string strSql = Insert("id,name,size", "1,'again',0");
    ExpectFailure(
        R"({"id":1,"name":"again"})",
        SqlFailure("UNIQUE constraint failed: t.id", strSql, R"({"id":1,"name":"again","size":0})"),
        {strSql});
    EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
    EXPECT_EQ(All(), "1|new|0");
}

TEST_F(Create, UniqueColumnOtherThanTheKeyIsADuplicateToo) {
    OpenItem(" unique");
    Created(R"({"id":1})");
    Json::Value jIn = ParseJson(R"({"id":2})");
    EXPECT_EQ(m_pHandle->recCreate(jIn, jIn), -1);
    EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
    TakeLog();
}

TEST_F(Create, TextThatOnlyResemblesThatOfADuplicateIsNone) {
    for (const char* szError : {"NIQUE constraint failed", "UNIQUE constraint faile"}) {
        FailNextExec({{SQLITE_CONSTRAINT, szError, 0}});
        Json::Value jIn = ParseJson(R"({"id":1})");
        EXPECT_EQ(m_pHandle->recCreate(jIn, jIn), -1) << szError;
        EXPECT_EQ(m_pHandle->getErrMsg(), "") << szError;
    }
}

TEST_F(Create, LaterFailureWithoutSqlReportsTheStaleDuplicateAgain) {
    MakeStaleDuplicate();
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
    ExpectFailure("{}", {Check("jRecIn.empty()"), Plain("call create rec, rec={}")});
    EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
    m_pHandle->setErrMsg("");
    ExpectFailure("[7]", {Check("!jRecParam.isObject()"), Check("0 > checkJsonType(jParam)"),
                          Plain("call create rec, rec=[7]")});
    EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
    m_pHandle->setErrMsg("");
    Json::Value jWrong = ParseJson(R"({"id":"3"})");
    EXPECT_EQ(m_pHandle->recCreate(jWrong, jWrong), -1);
    EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Create, RefusalByTheValuesReportsTheStaleDuplicateAgain) {
    Open("id:int,name:string,t:time_t", "id integer primary key,name text,t");
    for (const char* szRecord : {R"({"id":1,"name":"a","t":2})", R"({"id":1,"name":"%s","t":2})"}) {
        SCOPED_TRACE(szRecord);
        MakeStaleDuplicate();
        m_pHandle->setErrMsg("");
        Json::Value jRec = ParseJson(szRecord);
        EXPECT_EQ(m_pHandle->recCreate(jRec, jRec), -1);
        EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Create, DuplicateIsReportedBehindTheLastLine) {
    MakeStaleDuplicate();
    std::string strAtTheTail = "no line";
    OnNextLine([&] { OnNextLine([&] { strAtTheTail = m_pHandle->getErrMsg(); }); });
    ExpectFailure("{}", {Check("jRecIn.empty()"), Plain("call create rec, rec={}")});
    EXPECT_EQ(strAtTheTail, "");
    EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
}

TEST_F(Create, WholeRealPassesForAnIntegerAndIsStoredAsOne) {
    EXPECT_EQ(Created(R"({"id":3.0,"size":-4.0})"), R"({"id":3,"name":"new","size":-4})");
    EXPECT_EQ(TakeSql(), Lines{Insert("id,name,size", "3,'new',-4")});
    const std::string strCopy = R"({"id":3.5,"name":"new","size":0})";
    ExpectFailure(R"({"id":3.5})",
                  {Located("type failed, strKey=id, jRecParam=" + strCopy),
                   Check("0 > checkJsonType(jParam)"), Plain("call create rec, rec=" + strCopy)});
}

TEST_F(Create, StatementThatSucceededEndsTheStaleDuplicate) {
    MakeStaleDuplicate();
    Created(R"({"id":1})");
    TakeSql();
    ExpectFailure("{}", {Check("jRecIn.empty()"), Plain("call create rec, rec={}")});
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
}

TEST_F(Create, SuccessDoesNotClearTheErrorMessage) {
    m_pHandle->setErrMsg("kept");
    Created(R"({"id":1})");
    EXPECT_EQ(m_pHandle->getErrMsg(), "kept");
}

TEST_F(Create, DuplicateReplacesAnEarlierErrorMessage) {
    m_pHandle->setErrMsg("old");
    MakeStaleDuplicate();
    ExpectFailure("{}", {Check("jRecIn.empty()"), Plain("call create rec, rec={}")});
    EXPECT_EQ(m_pHandle->getErrMsg(), kDuplicate);
}

TEST_F(Create, OtherRefusalLeavesTheErrorMessage) {
    OpenItem(" check (name <> 'bad')");
    m_pHandle->setErrMsg("kept");
    const std::string strSql = Insert("id,name,size", "1,'bad',0");
    ExpectFailure(R"({"id":1,"name":"bad"})",
                  SqlFailure("CHECK constraint failed: name <> 'bad'", strSql,
                             R"({"id":1,"name":"bad","size":0})"),
                  {strSql});
    EXPECT_EQ(m_pHandle->getErrMsg(), "kept");
}

TEST_F(Create, MissingTableLeavesTheErrorMessage) {
    Sql("drop table t;");
    const std::string strSql = Insert("id,name,size", "1,'new',0");
    ExpectFailure(R"({"id":1})",
                  SqlFailure("no such table: t", strSql, R"({"id":1,"name":"new","size":0})"),
                  {strSql});
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
}

TEST_F(Create, FailedReadBackLeavesTheRowStoredAndTheOutputAlone) {
    OpenItem(",extra default 'e'");
    Json::Value jIn = ParseJson(R"({"id":1})");
    Json::Value jOut("kept");
    EXPECT_EQ(m_pHandle->recCreate(jIn, jOut), -1);
    EXPECT_EQ(jOut, Json::Value("kept"));
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
    EXPECT_EQ(All(), "1|new|e|0");
    EXPECT_EQ(TakeLog().back(), Plain(R"(call create rec, rec={"id":1,"name":"new","size":0})"));
}

TEST_F(Create, AssignedKeyComesBack) {
    EXPECT_EQ(Created(R"({"name":"a"})"), R"({"id":1,"name":"a","size":0})");
    EXPECT_EQ(Created(R"({"name":"b"})"), R"({"id":2,"name":"b","size":0})");
}

TEST_F(Create, UnknownMembersAreNotStoredAndNotReturned) {
    EXPECT_EQ(Created(R"({"id":1,"aa":{},"zz":null})"), R"({"id":1,"name":"new","size":0})");
}

TEST_F(Create, SameObjectAsInputAndOutputEndsAsTheStoredRow) {
    Json::Value jRec = ParseJson(R"({"name":"a","other":1})");
    EXPECT_EQ(m_pHandle->recCreate(jRec, jRec), 0);
    EXPECT_EQ(Compact(jRec), R"({"id":1,"name":"a","size":0})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(Create, SameObjectAsInputAndOutputIsUnchangedByAFailure) {
    Json::Value jRec = ParseJson(R"({"id":"text"})");
    EXPECT_EQ(m_pHandle->recCreate(jRec, jRec), -1);
    EXPECT_EQ(Compact(jRec), R"({"id":"text"})");
    TakeLog();
}

TEST_F(Create, PresentNullIsNotReplacedByTheDefaultAndFailsTheCheck) {
    const std::string strCopy = R"({"id":1,"name":null,"size":0})";
    ExpectFailure(R"({"id":1,"name":null})",
                  {Located("type failed, strKey=name, jRecParam=" + strCopy),
                   Check("0 > checkJsonType(jParam)"), Plain("call create rec, rec=" + strCopy)});
}

TEST_F(Create, LastMemberWithADefaultMakesAShortRecordComplete) {
    EXPECT_EQ(Created(R"({"id":9,"name":"n"})"), R"({"id":9,"name":"n","size":0})");
}

TEST_F(Create, LastMemberWithoutADefaultLeavesAStatementThatSqliteRejects) {
    Open("a:int,b:int");
    Json::Value jIn = ParseJson(R"({"a":1})");
    Json::Value jOut;
    EXPECT_EQ(m_pHandle->recCreate(jIn, jOut), -1);
    const Lines vecSql = TakeSql();
    ASSERT_EQ(vecSql.size(), 1U);
    EXPECT_EQ(vecSql[0],
              "INSERT INTO t (a,) VALUES (1,;select * from t where rowid == last_insert_rowid();");
    EXPECT_EQ(TakeLog().at(0), RunFailed("near \")\": syntax error", vecSql[0]));
    EXPECT_TRUE(jOut.isNull());
}
