// recDeleteByArray, recDeleteByName and VectorParamToJson: rows removed by the values of one
// member.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

const char kKey[] = "!szKey || !szKey[0]";
const char kMember[] = "!jType.isMember(szKey)";
const char kType[] = R"(jType[szKey]["cpptype"].asString() != "string")";
const char kByArray[] = "0 > (err = recDeleteByArray(strVector, szKey))";

class DeleteByList : public TableTest {
  protected:
    // 1|a, 2|b, 3|a'b, 4|a
    void SetUp() override {
        TableTest::SetUp();
        Sql("insert into t values (1,'a'),(2,'b'),(3,'a''b'),(4,'a');");
    }

    void ByArray(const Lines& vecGiven, const char* szKey, int nResult,
                 const Lines& vecLines = {}) {
        Lines vecValues = vecGiven;
        EXPECT_EQ(m_pHandle->recDeleteByArray(vecValues, szKey), nResult);
        EXPECT_EQ(vecValues, vecGiven);
        EXPECT_EQ(TakeLog(), vecLines);
    }

    void ByName(const std::string& strGiven, const char* szKey, int nResult,
                const Lines& vecLines = {}) {
        std::string strValue = strGiven;
        EXPECT_EQ(m_pHandle->recDeleteByName(strValue, szKey), nResult);
        EXPECT_EQ(strValue, strGiven);
        EXPECT_EQ(TakeLog(), vecLines);
    }

    std::string ArrayTail(const std::string& strName, const std::string& strValues) {
        return Plain("recDeleteByArray failed, name=" + strName + ", strVector=" + strValues);
    }

    std::string NameTail(const std::string& strName, const std::string& strValue) {
        return Plain("recDeleteByName failed, name=" + strName + ", strValue=" + strValue);
    }

    std::string Statement(const std::string& strList) {
        return "DELETE FROM t  WHERE  (name in (" + strList + " ) );";
    }

    std::string Ids() { return Rows("select group_concat(id) from t;"); }
};

}  // namespace

// ---- by array ----------------------------------------------------------------------------------

TEST_F(DeleteByList, SingleValueDeletesItsRows) {
    ByArray({"a"}, "name", 2);
    EXPECT_EQ(TakeSql(), Lines{Statement("'a'")});
    EXPECT_EQ(Ids(), "2,3");
}

TEST_F(DeleteByList, NothingMatchedIsZero) {
    ByArray({"nobody"}, "name", 0);
    EXPECT_EQ(Ids(), "1,2,3,4");
}

TEST_F(DeleteByList, TwoValuesRunTogetherIntoOneLiteral) {
    ByArray({"a", "b"}, "name", 1);
    EXPECT_EQ(TakeSql(), Lines{Statement("'a''b'")});
    EXPECT_EQ(Ids(), "1,2,4");
}

TEST_F(DeleteByList, ValuesAreEscapedButPercentSignsAreNot) {
    Sql(u8"update t set name = 'O''Neil ☂ 100% %s%%' where id = 2;");
    ByArray({u8"O'Neil ☂ 100% %s%%"}, "name", 1);
    EXPECT_EQ(TakeSql(), Lines{Statement(u8"'O''Neil ☂ 100% %s%%'")});
    EXPECT_EQ(Ids(), "1,3,4");
}

TEST_F(DeleteByList, EmptyTextIsAValueLikeAnyOther) {
    ByArray({""}, "name", 0);
    EXPECT_EQ(TakeSql(), Lines{Statement("''")});
}

TEST_F(DeleteByList, EmptyVectorIsRefusedWithAnEmptyRendering) {
    ByArray({}, nullptr, -1, {Check("0 >= strVector.size()"), ArrayTail("(null)", "")});
    for (const char* szKey : {"name", "", "nobody", "id"}) {
        ByArray({}, szKey, -1, {Check("0 >= strVector.size()"), ArrayTail(szKey, "")});
    }
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(Ids(), "1,2,3,4");
}

TEST_F(DeleteByList, MissingKeyIsRefused) {
    ByArray({"a"}, nullptr, -1, {Check(kKey), ArrayTail("(null)", "a")});
    ByArray({"a"}, "", -1, {Check(kKey), ArrayTail("", "a")});
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(DeleteByList, KeyThatIsNoMemberIsRefused) {
    ByArray({"a", "b", "c"}, "Name", -1, {Check(kMember), ArrayTail("Name", "a,b,c")});
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(DeleteByList, MemberOfTypeIntIsRefused) {
    ByArray({"1", "2"}, "id", -1, {Check(kType), ArrayTail("id", "1,2")});
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(Ids(), "1,2,3,4");
}

TEST_F(DeleteByList, OnlyTheTypeStringIsAccepted) {
    for (const char* szType :
         {"int", "unsigned int", "long long", "unsigned long long", "Json::Value",
          "Json::objectValue", "Json::arrayValue", "bool", "long", "unsigned long", "unsigned",
          "double", "float", "uid_t", "time_t", "any", "String", "string ", ""}) {
        SCOPED_TRACE(szType);
        Open(std::string("name:") + szType);
        ByArray({"a"}, "name", -1, {Check(kType), ArrayTail("name", "a")});
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(DeleteByList, FailedDeleteIsReportedInOrder) {
    FailNextExec({{SQLITE_ERROR, "no luck", 0}});
    const std::string strSql = Statement("'a''b'");
    ByArray({"a", "b"}, "name", -1,
            {RunFailed("no luck", strSql), Check("0 > (err = runSqlEx(strSqlRun))"),
             SqlError("no luck", strSql), Check("0 > (err = recDelete(jParam))"),
             ArrayTail("name", "a,b")});
    EXPECT_EQ(TakeSql(), Lines{strSql});
    ByArray({"b"}, "name", 1);
}

TEST_F(DeleteByList, RenderingHasNoQuotesNoBlanksAndNoTrailingSeparator) {
    ByArray({"it's", "", " x ", "a,b", "50%s"}, "nobody", -1,
            {Check(kMember), ArrayTail("nobody", "it's,, x ,a,b,50%s")});
}

// ---- by name -----------------------------------------------------------------------------------

TEST_F(DeleteByList, NameDeletesItsRows) {
    ByName("a", "name", 2);
    EXPECT_EQ(TakeSql(), Lines{Statement("'a'")});
    ByName("a'b", "name", 1);
    EXPECT_EQ(TakeSql(), Lines{Statement("'a''b'")});
    ByName("nobody", "name", 0);
    EXPECT_EQ(Ids(), "2");
}

TEST_F(DeleteByList, EmptyNameIsRefusedBeforeTheKey) {
    ByName("", nullptr, -1, {Check("strValue.empty()"), NameTail("(null)", "")});
    for (const char* szKey : {"name", "", "nobody", "id"}) {
        ByName("", szKey, -1, {Check("strValue.empty()"), NameTail(szKey, "")});
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(DeleteByList, NameWithoutAKeyIsRefused) {
    ByName("a", nullptr, -1, {Check(kKey), NameTail("(null)", "a")});
    ByName("a", "", -1, {Check(kKey), NameTail("", "a")});
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(DeleteByList, NameOfAnUnknownMemberIsRefused) {
    ByName("a", "nobody", -1, {Check(kMember), NameTail("nobody", "a")});
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(DeleteByList, NameOfAMemberOfTypeIntIsRefusedByTheInnerCall) {
    ByName("1", "id", -1,
           {Check(kType), ArrayTail("id", "1"), Check(kByArray), NameTail("id", "1")});
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(DeleteByList, FailedDeleteByNameIsReportedInOrder) {
    FailNextExec({{SQLITE_ERROR, "no luck", 0}});
    const std::string strSql = Statement("'a'");
    ByName("a", "name", -1,
           {RunFailed("no luck", strSql), Check("0 > (err = runSqlEx(strSqlRun))"),
            SqlError("no luck", strSql), Check("0 > (err = recDelete(jParam))"),
            ArrayTail("name", "a"), Check(kByArray), NameTail("name", "a")});
}

TEST_F(DeleteByList, ValueOfAMillionBytes) {
    Sql("update t set name = '" + LongText() + "' where id = 2;");
    ByName(LongText(), "name", 1);
    EXPECT_EQ(Ids(), "1,3,4");
}

// ---- the query object --------------------------------------------------------------------------

TEST_F(DeleteByList, VectorBecomesAnArrayBesideTheOtherMembers) {
    Lines vecValues{"b", "a", "", "it's"};
    Json::Value jOut = ParseJson(R"({"x":1})");
    EXPECT_EQ(m_pHandle->VectorParamToJson(vecValues, "name", jOut), 0);
    EXPECT_EQ(Compact(jOut), R"({"name":["b","a","","it's"],"x":1})");
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(DeleteByList, VectorReplacesAnEarlierValueOfTheMember) {
    Lines vecValues{"new"};
    Json::Value jOut = ParseJson(R"({"name":{"old":1}})");
    EXPECT_EQ(m_pHandle->VectorParamToJson(vecValues, "name", jOut), 0);
    EXPECT_EQ(Compact(jOut), R"({"name":["new"]})");
}

TEST_F(DeleteByList, EmptyVectorGivesAnEmptyArrayInANewObject) {
    Lines vecNone;
    Json::Value jOut;
    EXPECT_EQ(m_pHandle->VectorParamToJson(vecNone, "any key", jOut), 0);
    EXPECT_EQ(Compact(jOut), R"({"any key":[]})");
}

TEST_F(DeleteByList, ObjectToFillOfAWrongKindIsRefusedBeforeTheKey) {
    Lines vecValues{"a"};
    for (const char* szOut : {"[]", "[1]", "\"text\"", "7", "1.5", "true"}) {
        SCOPED_TRACE(szOut);
        Json::Value jOut = ParseJson(szOut);
        EXPECT_EQ(m_pHandle->VectorParamToJson(vecValues, nullptr, jOut), -1);
        EXPECT_EQ(Compact(jOut), szOut);
        EXPECT_EQ(TakeLog(), Lines{Check("jParamOut.type() != Json::objectValue && "
                                         "jParamOut.type() != Json::nullValue")});
    }
}

TEST_F(DeleteByList, ObjectToFillWithoutAKeyIsRefused) {
    Lines vecValues{"a"};
    for (const char* szKey : {static_cast<const char*>(nullptr), ""}) {
        Json::Value jOut;
        EXPECT_EQ(m_pHandle->VectorParamToJson(vecValues, szKey, jOut), -1);
        EXPECT_TRUE(jOut.isNull());
        EXPECT_EQ(TakeLog(), Lines{Check(kKey)});
    }
}
