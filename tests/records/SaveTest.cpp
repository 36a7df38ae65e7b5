// recSave: insert or replace one record and hand back the row as stored.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

const char kSymbol[] = "0 > SqlExpandMemberSymbol(strSql, jRecInOut)";

class Save : public TableTest {
  protected:
    std::string Statement(const std::string& strVerb, const std::string& strNames,
                          const std::string& strValues) {
        return strVerb + " INTO t (" + strNames + ") VALUES (" + strValues +
               ";select * from t where rowid == last_insert_rowid();";
    }

    // The record as it comes back from a save that says nothing.
    Json::Value Saved(Json::Value jRec, bool blCreate = true) {
        EXPECT_EQ(m_pHandle->recSave(jRec, blCreate), 0);
        EXPECT_EQ(TakeLog(), Lines());
        return jRec;
    }

    void ExpectStored(const std::string& strGiven, const std::string& strStored,
                      bool blCreate = true) {
        EXPECT_EQ(Compact(Saved(ParseJson(strGiven), blCreate)), strStored);
    }

    void ExpectFailure(const std::string& strGiven, bool blCreate, const Lines& vecHead,
                       const Lines& vecTail = {}) {
        const Json::Value jGiven = ParseJson(strGiven);
        Json::Value jRec = jGiven;
        EXPECT_EQ(m_pHandle->recSave(jRec, blCreate), -1);
        Lines vecExpected = vecHead;
        vecExpected.push_back(Plain("blCreate=" + std::string(blCreate ? "1" : "0") +
                                    ", jRecInOut=" + Compact(jGiven)));
        vecExpected.push_back(Plain("jType=" + Types()));
        vecExpected.insert(vecExpected.end(), vecTail.begin(), vecTail.end());
        EXPECT_EQ(TakeLog(), vecExpected);
        EXPECT_EQ(jRec, jGiven);
    }

    // A failure of SQLite itself: one statement, and the whole tail with SQLite's text.
    void ExpectSqlFailure(const std::string& strGiven, bool blCreate, const std::string& strError,
                          const std::string& strSql) {
        ExpectFailure(strGiven, blCreate, {RunFailed(strError, strSql), Check(kSaveFailed)},
                      {SqlError(strError, strSql)});
        EXPECT_EQ(TakeSql(), Lines{strSql});
    }
};

}  // namespace

TEST_F(Save, InsertAndReadBackSaveFailedAsOneText) {
    ExpectStored(R"({"id":1,"name":"x"})", R"({"id":1,"name":"x"})");
    EXPECT_EQ(TakeSql(), Lines{Statement("INSERT", "id,name", "1,'x') ")});
    EXPECT_EQ(All(), "1|x");
}

TEST_F(Save, ReplaceOverwritesTheRowWithTheSameKey) {
    Saved(ParseJson(R"({"id":1,"name":"old"})"));
    TakeSql();
    ExpectStored(R"({"id":1,"name":"new"})", R"({"id":1,"name":"new"})", false);
    EXPECT_EQ(TakeSql(), Lines{Statement("REPLACE", "id,name", "1,'new') ")});
    EXPECT_EQ(All(), "1|new");
}

// Wherever the text has to be moved to a larger place.
TEST_F(Save, StatementOfAnyLengthIsWhole) {
    for (size_t nLength = 0; nLength < 1200; ++nLength) {
        const std::string strLong(nLength, 'x');
        Json::Value jRec = ParseJson(R"({"id":1})");
        jRec["name"] = strLong + "'y";
        ASSERT_EQ(Saved(jRec, false), jRec) << nLength;
        ASSERT_EQ(TakeSql(), Lines{Statement("REPLACE", "id,name", "1,'" + strLong + "''y') ")})
            << nLength;
    }
}

TEST_F(Save, ReplaceWithoutAConflictInserts) {
    ExpectStored(R"({"id":4,"name":"x"})", R"({"id":4,"name":"x"})", false);
    EXPECT_EQ(All(), "4|x");
}

TEST_F(Save, InsertWithAStoredKeyIsRefusedAndTheRowStays) {
    Saved(ParseJson(R"({"id":1,"name":"old"})"));
    TakeSql();
    m_pHandle->setErrMsg("kept");
    ExpectSqlFailure(R"({"id":1,"name":"new"})", true, "UNIQUE constraint failed: t.id",
                     Statement("INSERT", "id,name", "1,'new') "));
    EXPECT_EQ(All(), "1|old");
    EXPECT_EQ(m_pHandle->getErrMsg(), "kept");
}

TEST_F(Save, AssignedKeyComesBack) {
    Saved(ParseJson(R"({"id":41,"name":"a"})"));
    TakeSql();
    ExpectStored(R"({"name":"b"})", R"({"id":42,"name":"b"})");
    EXPECT_EQ(TakeSql(), Lines{Statement("INSERT", "name", "'b') ")});
}

TEST_F(Save, ExtraMembersAreNeitherWrittenNorReturned) {
    ExpectStored(R"({"extra":[1],"id":1,"name":"x","zz":null})", R"({"id":1,"name":"x"})");
    EXPECT_EQ(TakeSql(), Lines{Statement("INSERT", "id,name", "1,'x') ")});
}

TEST_F(Save, ReadBackWithoutARowFailsAndTheRowStays) {
    Open("n:int,rowid:string", "n integer,rowid text");
    ExpectFailure(R"({"n":5,"rowid":"own"})", true, {Check("0 == jArrayTmp.size()")});
    EXPECT_EQ(TakeSql(), Lines{Statement("INSERT", "n,rowid", "5,'own') ")});
    EXPECT_EQ(All(), "5|own");
}

TEST_F(Save, FirstOfSeveralRowsReadBackIsTaken) {
    // A column of that name hides SQLite's own, so that the read-back finds all three rows.
    Open("n:int,rowid:int");
    Sql("insert into t values (10,3),(11,3);");
    ExpectStored(R"({"n":12,"rowid":3})", R"({"n":10,"rowid":3})");
    EXPECT_EQ(Count(), "3");
}

TEST_F(Save, MissingLastMemberMakesAStatementThatSqliteRejects) {
    ExpectSqlFailure(R"({"id":1})", true, "near \")\": syntax error",
                     Statement("INSERT", "id,", "1,"));
    EXPECT_EQ(All(), "");
}

TEST_F(Save, RecordWithoutAnyMemberMakesAStatementThatSqliteRejects) {
    for (const char* szRecord : {"{}", "null", "[]", "[1]", "{\"x\":1}", "\"name\"", "7", "true"}) {
        SCOPED_TRACE(szRecord);
        ExpectSqlFailure(szRecord, false, "near \")\": syntax error", Statement("REPLACE", "", ""));
    }
}

TEST_F(Save, TypeThatCannotBeRenderedRunsNothing) {
    Open("a:int,t:time_t");
    ExpectFailure(R"({"a":1,"t":2})", true,
                  {Located("cannot support this type=time_t"), Check(kSymbol)});
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Save, ValueOfAWrongKindRunsNothing) {
    ExpectFailure(
        R"({"id":"1","name":"x"})", false,
        {Located(R"(type failed, strKey=id, jRecParam={"id":"1","name":"x"})"), Check(kSymbol)});
    EXPECT_EQ(TakeSql(), Lines());
    Saved(ParseJson(R"({"id":1,"name":"x"})"));
}

TEST_F(Save, EarlierErrorTextShowsInTheTailOfALaterRefusal) {
    MakeStaleError();
    ExpectFailure(
        R"({"id":[],"name":"x"})", true,
        {Located(R"(type failed, strKey=id, jRecParam={"id":[],"name":"x"})"), Check(kSymbol)},
        {SqlError("no such column: stale", "INSERT INTO t (id,name) VALUES (")});
}

TEST_F(Save, SuccessEmptiesAnEarlierErrorText) {
    MakeStaleError();
    Saved(ParseJson(R"({"id":1,"name":"x"})"));
    ExpectFailure(
        R"({"id":[],"name":"x"})", true,
        {Located(R"(type failed, strKey=id, jRecParam={"id":[],"name":"x"})"), Check(kSymbol)});
}

TEST_F(Save, FailureWithoutATextIsAnUnknownError) {
    FailNextExec({{SQLITE_ERROR, nullptr, 5}});
    const std::string strSql = Statement("INSERT", "id,name", "1,'x') ");
    ExpectFailure(R"({"id":1,"name":"x"})", true,
                  {Plain("i=0,errno=5, run sql failed, error=Unknow Error!!, sql=" + strSql),
                   Check(kSaveFailed)},
                  {SqlError("Unknow Error!!", strSql)});
    EXPECT_EQ(TakeSql().size(), 1U);
}

TEST_F(Save, ColumnThatTheDefinitionLacksFailsTheReadBackAndTheRowStays) {
    Open("a:int,b:int", "a,extra default 'e',b");
    const std::string strSql = Statement("INSERT", "a,b", "1,2) ");
    ExpectFailure(R"({"a":1,"b":2})", true,
                  {Check("!jType.isMember(strName)"), Check(kFieldFailed),
                   Plain("column_name[1]=extra"), Plain("column_value[1]=e"), Check(kRowFailed),
                   RunFailed("query aborted", strSql), Check(kSaveFailed)},
                  {SqlError("query aborted", strSql)});
    EXPECT_EQ(All(), "1|e|2");
}

TEST_F(Save, DoubleIsStoredButCannotBeReadBack) {
    Open("d:double");
    const std::string strSql = Statement("INSERT", "d", "1.500000) ");
    ExpectFailure(R"({"d":1.5})", true,
                  {Located("type error, strType=double"), Check(kFieldFailed), Check(kRowFailed),
                   RunFailed("query aborted", strSql), Check(kSaveFailed)},
                  {SqlError("query aborted", strSql)});
    EXPECT_EQ(All(), "1.5");
}

TEST_F(Save, RowThatComesBackReplacesTheRecordWhole) {
    Open("a:string,b:int,n:string,z:int", "a text default 'dflt',b integer,n text,z integer");
    ExpectStored(R"({"b":true,"other":{},"z":null})", R"({"a":"dflt","b":1,"z":0})");
}

TEST_F(Save, ValuesComeBackAsTheirColumnTypes) {
    Open("b:bool,i:int,l:long long,o:Json::objectValue,s:string,u:unsigned int,v:Json::arrayValue");
    ExpectStored(
        R"({"b":true,"i":-3,"l":-9223372036854775808,"o":{"k":[1]},
                                    "s":7,"u":7,"v":[{},null]})",
        R"({"b":true,"i":-3,"l":-9223372036854775808,"o":{"k":[1]},"s":"7","u":7,"v":[{},null]})");
}

TEST_F(Save, ApostrophesAndForeignLettersSurvive) {
    Open("o:Json::objectValue,s:string");
    const Json::Value jRec =
        ParseJson(u8R"({"o":{"k'":"it's ☂"},"s":"O'Neil '' Grün 😀 ; -- \" \\"})");
    EXPECT_EQ(Saved(jRec), jRec);
}

TEST_F(Save, TextIsCutAtAnEmbeddedNul) {
    Json::Value jRec = ParseJson(R"({"id":1})");
    jRec["name"] = Json::Value(std::string("ab\0cd", 5));
    EXPECT_EQ(Compact(Saved(jRec)), R"({"id":1,"name":"ab"})");
}

TEST_F(Save, TextOfAMillionBytesSurvives) {
    Json::Value jRec = ParseJson(R"({"id":1})");
    jRec["name"] = LongText();
    EXPECT_TRUE(jRec == Saved(jRec));
}

TEST_F(Save, FiveHundredAndTwelveMembersSurvive) {
    Json::Value jRec(Json::objectValue);
    std::string strColumns;
    for (const std::string& strName : ManyMembers().getMemberNames()) {
        strColumns += (jRec.empty() ? "" : ",") + strName;
        jRec[strName] = static_cast<int>(jRec.size());
    }
    OpenMembers(ManyMembers(), strColumns);
    EXPECT_TRUE(Saved(jRec) == jRec);
}

TEST_F(Save, DoubledPercentInTheLastMemberSurvives) {
    const Json::Value jRec = ParseJson(R"({"id":1,"name":"50%% 100% %s"})");
    EXPECT_EQ(Saved(jRec), jRec);
}

TEST_F(Save, DoubledPercentBeforeALaterMemberIsStoredSingle) {
    Open("a:string,b:int");
    ExpectStored(R"({"a":"50%%","b":1})", R"({"a":"50%","b":1})");
}
