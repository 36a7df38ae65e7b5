// recSave: insert or replace one record and hand back the row as stored.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

const char kRun[] = "0 > runSqlEx(strSql, DbCallBackFillList, &jArrayTmp)";
const char kSymbol[] = "0 > SqlExpandMemberSymbol(strSql, jRecInOut)";

class Save : public FreshTableTest {
  protected:
    VornJsonDbApi& OpenTask() {
        m_strTypes = R"({"id":{"cpptype":"int"},"name":{"cpptype":"string"}})";
        return Open("id:int,name:string", "id integer primary key,name text");
    }

    std::string Statement(const std::string& strVerb, const std::string& strNames,
                          const std::string& strValues) {
        return strVerb + " INTO " + m_strTable + " (" + strNames + ") VALUES (" + strValues +
               ";select * from " + m_strTable + " where rowid == last_insert_rowid();";
    }

    // The record as it comes back from a save that says nothing.
    Json::Value Saved(VornJsonDbApi& api, Json::Value jRec, bool blCreate = true) {
        EXPECT_EQ(0, api.recSave(jRec, blCreate));
        EXPECT_EQ(Lines{}, TakeLog());
        return jRec;
    }

    void ExpectFailure(VornJsonDbApi& api, const Json::Value& jGiven, bool blCreate,
                       const Lines& vecHead, const Lines& vecTail = {}) {
        Json::Value jRec = jGiven;
        EXPECT_EQ(-1, api.recSave(jRec, blCreate));
        Lines vecExpected = vecHead;
        vecExpected.push_back(Plain("blCreate=" + std::string(blCreate ? "1" : "0") +
                                    ", jRecInOut=" + Compact(jGiven)));
        vecExpected.push_back(Plain("jType=" + m_strTypes));
        vecExpected.insert(vecExpected.end(), vecTail.begin(), vecTail.end());
        EXPECT_EQ(vecExpected, TakeLog());
        EXPECT_EQ(jGiven, jRec);
    }

    // A failure of SQLite itself: one statement, and the whole tail with SQLite's text.
    void ExpectSqlFailure(VornJsonDbApi& api, const Json::Value& jGiven, bool blCreate,
                          const std::string& strError, const std::string& strSql) {
        ExpectFailure(api, jGiven, blCreate, {RunFailed(strError, strSql), Check(kRun)},
                      {SqlError(strError, strSql)});
        EXPECT_EQ(Lines{strSql}, TakeSql());
    }

    std::string All() { return Rows("select * from " + m_strTable + " order by rowid;"); }

    std::string m_strTypes;
};

}  // namespace

TEST_F(Save, InsertAndReadBackRunAsOneText) {
    VornJsonDbApi& api = OpenTask();
    EXPECT_EQ(R"({"id":1,"name":"x"})", Compact(Saved(api, ParseJson(R"({"id":1,"name":"x"})"))));
    EXPECT_EQ(Lines{Statement("INSERT", "id,name", "1,'x') ")}, TakeSql());
    EXPECT_EQ("1|x", All());
}

TEST_F(Save, ReplaceOverwritesTheRowWithTheSameKey) {
    VornJsonDbApi& api = OpenTask();
    Saved(api, ParseJson(R"({"id":1,"name":"old"})"));
    TakeSql();
    EXPECT_EQ(R"({"id":1,"name":"new"})",
              Compact(Saved(api, ParseJson(R"({"id":1,"name":"new"})"), false)));
    EXPECT_EQ(Lines{Statement("REPLACE", "id,name", "1,'new') ")}, TakeSql());
    EXPECT_EQ("1|new", All());
}

TEST_F(Save, ReplaceWithoutAConflictInserts) {
    VornJsonDbApi& api = OpenTask();
    EXPECT_EQ(R"({"id":4,"name":"x"})",
              Compact(Saved(api, ParseJson(R"({"id":4,"name":"x"})"), false)));
    EXPECT_EQ("4|x", All());
}

TEST_F(Save, InsertWithAStoredKeyIsRefusedAndTheRowStays) {
    VornJsonDbApi& api = OpenTask();
    Saved(api, ParseJson(R"({"id":1,"name":"old"})"));
    TakeSql();
    api.setErrMsg("kept");
    ExpectSqlFailure(api, ParseJson(R"({"id":1,"name":"new"})"), true,
                     "UNIQUE constraint failed: " + m_strTable + ".id",
                     Statement("INSERT", "id,name", "1,'new') "));
    EXPECT_EQ("1|old", All());
    EXPECT_EQ("kept", api.getErrMsg());
}

TEST_F(Save, AssignedKeyComesBack) {
    VornJsonDbApi& api = OpenTask();
    Saved(api, ParseJson(R"({"id":41,"name":"a"})"));
    TakeSql();
    EXPECT_EQ(R"({"id":42,"name":"b"})", Compact(Saved(api, ParseJson(R"({"name":"b"})"))));
    EXPECT_EQ(Lines{Statement("INSERT", "name", "'b') ")}, TakeSql());
}

TEST_F(Save, ExtraMembersAreNeitherWrittenNorReturned) {
    VornJsonDbApi& api = OpenTask();
    EXPECT_EQ(R"({"id":1,"name":"x"})",
              Compact(Saved(api, ParseJson(R"({"extra":[1],"id":1,"name":"x","zz":null})"))));
    EXPECT_EQ(Lines{Statement("INSERT", "id,name", "1,'x') ")}, TakeSql());
}

TEST_F(Save, ReadBackWithoutARowFailsAndTheRowStays) {
    VornJsonDbApi& api = Open("n:int,rowid:string", "n integer,rowid text");
    m_strTypes = R"({"n":{"cpptype":"int"},"rowid":{"cpptype":"string"}})";
    ExpectFailure(api, ParseJson(R"({"n":5,"rowid":"own"})"), true,
                  {Check("0 == jArrayTmp.size()")});
    EXPECT_EQ(Lines{Statement("INSERT", "n,rowid", "5,'own') ")}, TakeSql());
    EXPECT_EQ("5|own", Rows("select * from " + m_strTable + ";"));
}

TEST_F(Save, FirstOfSeveralRowsReadBackIsTaken) {
    // A column of that name hides SQLite's own, so that the read-back finds all three rows.
    VornJsonDbApi& api = Open("n:int,rowid:int");
    Sql("insert into " + m_strTable + " values (10,3),(11,3);");
    EXPECT_EQ(R"({"n":10,"rowid":3})", Compact(Saved(api, ParseJson(R"({"n":12,"rowid":3})"))));
    EXPECT_EQ("3", Count());
}

TEST_F(Save, MissingLastMemberMakesAStatementThatSqliteRejects) {
    VornJsonDbApi& api = OpenTask();
    ExpectSqlFailure(api, ParseJson(R"({"id":1})"), true, "near \")\": syntax error",
                     Statement("INSERT", "id,", "1,"));
    EXPECT_EQ("", All());
}

TEST_F(Save, RecordWithoutAnyMemberMakesAStatementThatSqliteRejects) {
    VornJsonDbApi& api = OpenTask();
    for (const char* szRecord : {"{}", "null", "[]", "[1]", "{\"x\":1}", "\"name\"", "7", "true"}) {
        SCOPED_TRACE(szRecord);
        ExpectSqlFailure(api, ParseJson(szRecord), false, "near \")\": syntax error",
                         Statement("REPLACE", "", ""));
    }
}

TEST_F(Save, TypeThatCannotBeRenderedRunsNothing) {
    VornJsonDbApi& api = Open("a:int,t:time_t");
    m_strTypes = R"({"a":{"cpptype":"int"},"t":{"cpptype":"time_t"}})";
    ExpectFailure(api, ParseJson(R"({"a":1,"t":2})"), true,
                  {Located("cannot support this type=time_t"), Check(kSymbol)});
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(Save, ValueOfAWrongKindRunsNothing) {
    VornJsonDbApi& api = OpenTask();
    ExpectFailure(
        api, ParseJson(R"({"id":"1","name":"x"})"), false,
        {Located(R"(type failed, strKey=id, jRecParam={"id":"1","name":"x"})"), Check(kSymbol)});
    EXPECT_EQ(Lines{}, TakeSql());
    Saved(api, ParseJson(R"({"id":1,"name":"x"})"));
}

TEST_F(Save, EarlierErrorTextShowsInTheTailOfALaterRefusal) {
    VornJsonDbApi& api = OpenTask();
    MakeStaleError(api);
    ExpectFailure(
        api, ParseJson(R"({"id":[],"name":"x"})"), true,
        {Located(R"(type failed, strKey=id, jRecParam={"id":[],"name":"x"})"), Check(kSymbol)},
        {SqlError("no such column: stale", "INSERT INTO " + m_strTable + " (id,name) VALUES (")});
}

TEST_F(Save, SuccessEmptiesAnEarlierErrorText) {
    VornJsonDbApi& api = OpenTask();
    MakeStaleError(api);
    Saved(api, ParseJson(R"({"id":1,"name":"x"})"));
    ExpectFailure(
        api, ParseJson(R"({"id":[],"name":"x"})"), true,
        {Located(R"(type failed, strKey=id, jRecParam={"id":[],"name":"x"})"), Check(kSymbol)});
}

TEST_F(Save, FailureWithoutATextIsAnUnknownError) {
    VornJsonDbApi& api = OpenTask();
    FailNextExec({{SQLITE_ERROR, nullptr, 5}});
    const std::string strSql = Statement("INSERT", "id,name", "1,'x') ");
    ExpectFailure(
        api, ParseJson(R"({"id":1,"name":"x"})"), true,
        {Plain("i=0,errno=5, run sql failed, error=Unknow Error!!, sql=" + strSql), Check(kRun)},
        {SqlError("Unknow Error!!", strSql)});
    EXPECT_EQ(1U, TakeSql().size());
}

TEST_F(Save, ColumnThatTheDefinitionLacksFailsTheReadBackAndTheRowStays) {
    VornJsonDbApi& api = Open("a:int,b:int", "a,extra default 'e',b");
    m_strTypes = R"({"a":{"cpptype":"int"},"b":{"cpptype":"int"}})";
    const std::string strSql = Statement("INSERT", "a,b", "1,2) ");
    ExpectFailure(api, ParseJson(R"({"a":1,"b":2})"), true,
                  {Check("!jType.isMember(strName)"),
                   Check("0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))"),
                   Plain("column_name[1]=extra"), Plain("column_value[1]=e"),
                   Check("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)"),
                   RunFailed("query aborted", strSql), Check(kRun)},
                  {SqlError("query aborted", strSql)});
    EXPECT_EQ("1|e|2", All());
}

TEST_F(Save, DoubleIsStoredButCannotBeReadBack) {
    VornJsonDbApi& api = Open("d:double");
    m_strTypes = R"({"d":{"cpptype":"double"}})";
    const std::string strSql = Statement("INSERT", "d", "1.500000) ");
    ExpectFailure(api, ParseJson(R"({"d":1.5})"), true,
                  {Located("type error, strType=double"),
                   Check("0 > (iTmp = DbCallBackFillField(*pjRec, column_name, column_value, i))"),
                   Check("0 > DbCallBackFillRec(&jTmp, n_column, column_value, column_name)"),
                   RunFailed("query aborted", strSql), Check(kRun)},
                  {SqlError("query aborted", strSql)});
    EXPECT_EQ("1.5", All());
}

TEST_F(Save, RowThatComesBackReplacesTheRecordWhole) {
    VornJsonDbApi& api =
        Open("a:string,b:int,n:string,z:int", "a text default 'dflt',b integer,n text,z integer");
    EXPECT_EQ(R"({"a":"dflt","b":1,"z":0})",
              Compact(Saved(api, ParseJson(R"({"b":true,"other":{},"z":null})"))));
}

TEST_F(Save, ValuesComeBackAsTheirColumnTypes) {
    VornJsonDbApi& api = Open(
        "b:bool,i:int,l:long long,o:Json::objectValue,s:string,u:unsigned int,v:Json::arrayValue");
    EXPECT_EQ(
        R"({"b":true,"i":-3,"l":-9223372036854775808,"o":{"k":[1]},"s":"7","u":7,"v":[{},null]})",
        Compact(Saved(api, ParseJson(R"({"b":true,"i":-3,"l":-9223372036854775808,"o":{"k":[1]},
                                    "s":7,"u":7,"v":[{},null]})"))));
}

TEST_F(Save, ApostrophesAndForeignLettersSurvive) {
    VornJsonDbApi& api = Open("o:Json::objectValue,s:string");
    const Json::Value jRec =
        ParseJson(u8R"({"o":{"k'":"it's ☂"},"s":"O'Neil '' Grün 😀 ; -- \" \\"})");
    EXPECT_EQ(jRec, Saved(api, jRec));
}

TEST_F(Save, TextIsCutAtAnEmbeddedNul) {
    VornJsonDbApi& api = OpenTask();
    Json::Value jRec = ParseJson(R"({"id":1})");
    jRec["name"] = Json::Value(std::string("ab\0cd", 5));
    EXPECT_EQ(R"({"id":1,"name":"ab"})", Compact(Saved(api, jRec)));
}

TEST_F(Save, TextOfAMillionBytesSurvives) {
    VornJsonDbApi& api = OpenTask();
    Json::Value jRec = ParseJson(R"({"id":1})");
    jRec["name"] = LongText();
    EXPECT_TRUE(jRec == Saved(api, jRec));
}

TEST_F(Save, FiveHundredAndTwelveMembersSurvive) {
    Json::Value jMembers(Json::objectValue);
    Json::Value jRec(Json::objectValue);
    std::string strColumns;
    for (int i = 0; i < 512; ++i) {
        const std::string strName = "m" + std::to_string(1000 + i);
        jMembers[strName]["cpptype"] = "int";
        jRec[strName] = i;
        strColumns += (i == 0 ? "" : ",") + strName;
    }
    EXPECT_EQ(jRec, Saved(OpenMembers(jMembers, strColumns), jRec));
}

TEST_F(Save, DoubledPercentInTheLastMemberSurvives) {
    VornJsonDbApi& api = OpenTask();
    const Json::Value jRec = ParseJson(R"({"id":1,"name":"50%% 100% %s"})");
    EXPECT_EQ(jRec, Saved(api, jRec));
}

TEST_F(Save, DoubledPercentBeforeALaterMemberIsStoredSingle) {
    VornJsonDbApi& api = Open("a:string,b:int");
    EXPECT_EQ(R"({"a":"50%","b":1})", Compact(Saved(api, ParseJson(R"({"a":"50%%","b":1})"))));
}

}  // namespace testhost
