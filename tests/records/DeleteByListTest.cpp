// recDeleteByArray, recDeleteByName and VectorParamToJson: rows removed by the values of one
// member.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

const char kKey[] = "!szKey || !szKey[0]";
const char kMember[] = "!jType.isMember(szKey)";
const char kType[] = R"(jType[szKey]["cpptype"].asString() != "string")";
const char kByArray[] = "0 > (err = recDeleteByArray(strVector, szKey))";

class DeleteByList : public FreshTableTest {
  protected:
    // 1|a, 2|b, 3|a'b, 4|a
    VornJsonDbApi& OpenItem() {
        VornJsonDbApi& api = Open("id:int,name:string", "id integer primary key,name text");
        Sql("insert into " + m_strTable + " values (1,'a'),(2,'b'),(3,'a''b'),(4,'a');");
        return api;
    }

    void ByArray(VornJsonDbApi& api, const Lines& vecGiven, const char* szKey, int nResult,
                 const Lines& vecLines = {}) {
        Lines vecValues = vecGiven;
        EXPECT_EQ(nResult, api.recDeleteByArray(vecValues, szKey));
        EXPECT_EQ(vecGiven, vecValues);
        EXPECT_EQ(vecLines, TakeLog());
    }

    void ByName(VornJsonDbApi& api, const std::string& strGiven, const char* szKey, int nResult,
                const Lines& vecLines = {}) {
        std::string strValue = strGiven;
        EXPECT_EQ(nResult, api.recDeleteByName(strValue, szKey));
        EXPECT_EQ(strGiven, strValue);
        EXPECT_EQ(vecLines, TakeLog());
    }

    std::string ArrayTail(const std::string& strName, const std::string& strValues) {
        return Plain("recDeleteByArray failed, name=" + strName + ", strVector=" + strValues);
    }

    std::string NameTail(const std::string& strName, const std::string& strValue) {
        return Plain("recDeleteByName failed, name=" + strName + ", strValue=" + strValue);
    }

    std::string Statement(const std::string& strList) {
        return "DELETE FROM " + m_strTable + "  WHERE  (name in (" + strList + " ) );";
    }

    std::string Ids() { return Rows("select group_concat(id) from " + m_strTable + ";"); }
};

}  // namespace

// ---- by array ----------------------------------------------------------------------------------

TEST_F(DeleteByList, SingleValueDeletesItsRows) {
    VornJsonDbApi& api = OpenItem();
    ByArray(api, {"a"}, "name", 2);
    EXPECT_EQ(Lines{Statement("'a'")}, TakeSql());
    EXPECT_EQ("2,3", Ids());
}

TEST_F(DeleteByList, NothingMatchedIsZero) {
    VornJsonDbApi& api = OpenItem();
    ByArray(api, {"nobody"}, "name", 0);
    EXPECT_EQ("1,2,3,4", Ids());
}

TEST_F(DeleteByList, TwoValuesRunTogetherIntoOneLiteral) {
    VornJsonDbApi& api = OpenItem();
    ByArray(api, {"a", "b"}, "name", 1);
    EXPECT_EQ(Lines{Statement("'a''b'")}, TakeSql());
    EXPECT_EQ("1,2,4", Ids());
}

TEST_F(DeleteByList, ValuesAreEscapedButPercentSignsAreNot) {
    VornJsonDbApi& api = OpenItem();
    Sql(u8"update " + m_strTable + u8" set name = 'O''Neil ☂ 100% %s%%' where id = 2;");
    ByArray(api, {u8"O'Neil ☂ 100% %s%%"}, "name", 1);
    EXPECT_EQ(Lines{Statement(u8"'O''Neil ☂ 100% %s%%'")}, TakeSql());
    EXPECT_EQ("1,3,4", Ids());
}

TEST_F(DeleteByList, EmptyTextIsAValueLikeAnyOther) {
    VornJsonDbApi& api = OpenItem();
    ByArray(api, {""}, "name", 0);
    EXPECT_EQ(Lines{Statement("''")}, TakeSql());
}

TEST_F(DeleteByList, EmptyVectorIsRefusedWithAnEmptyRendering) {
    VornJsonDbApi& api = OpenItem();
    ByArray(api, {}, nullptr, -1, {Check("0 >= strVector.size()"), ArrayTail("(null)", "")});
    for (const char* szKey : {"name", "", "nobody", "id"}) {
        ByArray(api, {}, szKey, -1, {Check("0 >= strVector.size()"), ArrayTail(szKey, "")});
    }
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ("1,2,3,4", Ids());
}

TEST_F(DeleteByList, MissingKeyIsRefused) {
    VornJsonDbApi& api = OpenItem();
    ByArray(api, {"a"}, nullptr, -1, {Check(kKey), ArrayTail("(null)", "a")});
    ByArray(api, {"a"}, "", -1, {Check(kKey), ArrayTail("", "a")});
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(DeleteByList, KeyThatIsNoMemberIsRefused) {
    VornJsonDbApi& api = OpenItem();
    ByArray(api, {"a", "b", "c"}, "Name", -1, {Check(kMember), ArrayTail("Name", "a,b,c")});
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(DeleteByList, MemberOfTypeIntIsRefused) {
    VornJsonDbApi& api = OpenItem();
    ByArray(api, {"1", "2"}, "id", -1, {Check(kType), ArrayTail("id", "1,2")});
    EXPECT_EQ(Lines{}, TakeSql());
    EXPECT_EQ("1,2,3,4", Ids());
}

TEST_F(DeleteByList, OnlyTheTypeStringIsAccepted) {
    for (const char* szType :
         {"int", "unsigned int", "long long", "unsigned long long", "Json::Value",
          "Json::objectValue", "Json::arrayValue", "bool", "long", "unsigned long", "unsigned",
          "double", "float", "uid_t", "time_t", "String", "string ", ""}) {
        SCOPED_TRACE(szType);
        VornJsonDbApi& api = Open(std::string("name:") + szType);
        ByArray(api, {"a"}, "name", -1, {Check(kType), ArrayTail("name", "a")});
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(DeleteByList, FailedDeleteIsReportedInOrder) {
    VornJsonDbApi& api = OpenItem();
    FailNextExec({{SQLITE_ERROR, "no luck", 0}});
    const std::string strSql = Statement("'a''b'");
    ByArray(api, {"a", "b"}, "name", -1,
            {RunFailed("no luck", strSql), Check("0 > (err = runSqlEx(strSqlRun))"),
             SqlError("no luck", strSql), Check("0 > (err = recDelete(jParam))"),
             ArrayTail("name", "a,b")});
    EXPECT_EQ(Lines{strSql}, TakeSql());
    ByArray(api, {"b"}, "name", 1);
}

TEST_F(DeleteByList, RenderingHasNoQuotesNoBlanksAndNoTrailingSeparator) {
    VornJsonDbApi& api = OpenItem();
    ByArray(api, {"it's", "", " x ", "a,b", "50%s"}, "nobody", -1,
            {Check(kMember), ArrayTail("nobody", "it's,, x ,a,b,50%s")});
}

// ---- by name -----------------------------------------------------------------------------------

TEST_F(DeleteByList, NameDeletesItsRows) {
    VornJsonDbApi& api = OpenItem();
    ByName(api, "a", "name", 2);
    EXPECT_EQ(Lines{Statement("'a'")}, TakeSql());
    ByName(api, "a'b", "name", 1);
    EXPECT_EQ(Lines{Statement("'a''b'")}, TakeSql());
    ByName(api, "nobody", "name", 0);
    EXPECT_EQ("2", Ids());
}

TEST_F(DeleteByList, EmptyNameIsRefusedBeforeTheKey) {
    VornJsonDbApi& api = OpenItem();
    ByName(api, "", nullptr, -1, {Check("strValue.empty()"), NameTail("(null)", "")});
    for (const char* szKey : {"name", "", "nobody", "id"}) {
        ByName(api, "", szKey, -1, {Check("strValue.empty()"), NameTail(szKey, "")});
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(DeleteByList, NameWithoutAKeyIsRefused) {
    VornJsonDbApi& api = OpenItem();
    ByName(api, "a", nullptr, -1, {Check(kKey), NameTail("(null)", "a")});
    ByName(api, "a", "", -1, {Check(kKey), NameTail("", "a")});
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(DeleteByList, NameOfAnUnknownMemberIsRefused) {
    VornJsonDbApi& api = OpenItem();
    ByName(api, "a", "nobody", -1, {Check(kMember), NameTail("nobody", "a")});
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(DeleteByList, NameOfAMemberOfTypeIntIsRefusedByTheInnerCall) {
    VornJsonDbApi& api = OpenItem();
    ByName(api, "1", "id", -1,
           {Check(kType), ArrayTail("id", "1"), Check(kByArray), NameTail("id", "1")});
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(DeleteByList, FailedDeleteByNameIsReportedInOrder) {
    VornJsonDbApi& api = OpenItem();
    FailNextExec({{SQLITE_ERROR, "no luck", 0}});
    const std::string strSql = Statement("'a'");
    ByName(api, "a", "name", -1,
           {RunFailed("no luck", strSql), Check("0 > (err = runSqlEx(strSqlRun))"),
            SqlError("no luck", strSql), Check("0 > (err = recDelete(jParam))"),
            ArrayTail("name", "a"), Check(kByArray), NameTail("name", "a")});
}

TEST_F(DeleteByList, ValueOfAMillionBytes) {
    VornJsonDbApi& api = OpenItem();
    Sql("update " + m_strTable + " set name = '" + LongText() + "' where id = 2;");
    ByName(api, LongText(), "name", 1);
    EXPECT_EQ("1,3,4", Ids());
}

// ---- the query object --------------------------------------------------------------------------

TEST_F(DeleteByList, VectorBecomesAnArrayBesideTheOtherMembers) {
    VornJsonDbApi& api = OpenItem();
    Lines vecValues{"b", "a", "", "it's"};
    Json::Value jOut = ParseJson(R"({"x":1})");
    EXPECT_EQ(0, api.VectorParamToJson(vecValues, "name", jOut));
    EXPECT_EQ(R"({"name":["b","a","","it's"],"x":1})", Compact(jOut));
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(DeleteByList, VectorReplacesAnEarlierValueOfTheMember) {
    VornJsonDbApi& api = OpenItem();
    Lines vecValues{"new"};
    Json::Value jOut = ParseJson(R"({"name":{"old":1}})");
    EXPECT_EQ(0, api.VectorParamToJson(vecValues, "name", jOut));
    EXPECT_EQ(R"({"name":["new"]})", Compact(jOut));
}

TEST_F(DeleteByList, EmptyVectorGivesAnEmptyArrayInANewObject) {
    VornJsonDbApi& api = OpenItem();
    Lines vecNone;
    Json::Value jOut;
    EXPECT_EQ(0, api.VectorParamToJson(vecNone, "any key", jOut));
    EXPECT_EQ(R"({"any key":[]})", Compact(jOut));
}

TEST_F(DeleteByList, ObjectToFillOfAWrongKindIsRefusedBeforeTheKey) {
    VornJsonDbApi& api = OpenItem();
    Lines vecValues{"a"};
    for (const char* szOut : {"[]", "[1]", "\"text\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szOut);
        Json::Value jOut = ParseJson(szOut);
        EXPECT_EQ(-1, api.VectorParamToJson(vecValues, nullptr, jOut));
        EXPECT_EQ(szOut, Compact(jOut));
        EXPECT_EQ(Lines{Check("jParamOut.type() != Json::objectValue && "
                              "jParamOut.type() != Json::nullValue")},
                  TakeLog());
    }
}

TEST_F(DeleteByList, ObjectToFillWithoutAKeyIsRefused) {
    VornJsonDbApi& api = OpenItem();
    Lines vecValues{"a"};
    for (const char* szKey : {static_cast<const char*>(nullptr), ""}) {
        Json::Value jOut;
        EXPECT_EQ(-1, api.VectorParamToJson(vecValues, szKey, jOut));
        EXPECT_TRUE(jOut.isNull());
        EXPECT_EQ(Lines{Check(kKey)}, TakeLog());
    }
}

}  // namespace testhost
