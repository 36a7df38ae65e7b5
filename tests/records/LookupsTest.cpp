// Where each operation looks up the member types. A lookup is silent unless the table's name was
// refused before: then each one writes its four lines, so their number and their places show.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

const char kRows[] = "SELECT id,name FROM t ;";

class Lookups : public TableTest {
  protected:
    // The handle's definition is faultless, but the name of its table was refused before.
    void SetUp() override {
        TableTest::SetUp();
        Sql("insert into t values (1,'a'),(2,'b');");
        std::string strTable = "t";
        Json::Value jNone;
        VORN_JSON_DB::recType(jNone, strTable);
        TakeLog();
    }

    // The lines since the last call, those of a lookup replaced by one word.
    Lines Steps() {
        const Lines vecLog = TakeLog();
        Lines vecSteps;
        for (size_t i = 0; i < vecLog.size(); ++i) {
            if (IsLookup(vecLog, i, Compact(m_jDefinition))) {
                vecSteps.emplace_back("lookup");
                i += 3;
            } else if (IsLookup(vecLog, i, "null")) {
                vecSteps.emplace_back("lookup of the row callback");
                i += 3;
            } else {
                vecSteps.push_back(vecLog[i]);
            }
        }
        return vecSteps;
    }

    int Save(bool blOfCreate, const char* szRecord) {
        Json::Value jRec = ParseJson(szRecord);
        return blOfCreate ? m_pHandle->recCreate(jRec, jRec) : m_pHandle->recSave(jRec, true);
    }

    int List(const char* szQuery, const char* szOut = "null") {
        Json::Value jQuery = ParseJson(szQuery);
        Json::Value jRows = ParseJson(szOut);
        return m_pHandle->recList(jQuery, jRows);
    }

    int ByWhere(const char* szRecord, std::string strWhere) {
        Json::Value jRec = ParseJson(szRecord);
        return m_pHandle->recUpdateByWhere(jRec, strWhere);
    }

    int ByFilter(const char* szFilter, const char* szRecord) {
        Json::Value jFilter = ParseJson(szFilter);
        Json::Value jRec = ParseJson(szRecord);
        return m_pHandle->recUpdateByFilter(jFilter, jRec);
    }

    int Delete(const char* szQuery, bool blAllowAll = false) {
        Json::Value jQuery = ParseJson(szQuery);
        return m_pHandle->recDelete(jQuery, blAllowAll);
    }

    int Expand(const char* szQuery, int nMode) {
        Json::Value jQuery = ParseJson(szQuery);
        std::string strSql;
        return m_pHandle->SqlExpandMemberList(jQuery, strSql, nMode);
    }

    // The steps of a list whose first row is refused.
    Lines RefusedRow() const {
        return {"lookup",
                "lookup of the row callback",
                Check("!jType.isMember(strName)"),
                Check(kFieldFailed),
                Check(kRowFailed),
                RunFailed("query aborted", kRows),
                Check(kListFailed),
                Plain("jRecParam=null"),
                SqlError("query aborted", kRows)};
    }

    // The steps of a refused assignment, from the statement on.
    Lines RefusedUpdate(Lines vecSteps, const std::string& strWhere) const {
        const std::string strSql = "UPDATE t SET  WHERE " + strWhere + ";";
        const char* const szError = "near \"WHERE\": syntax error";
        vecSteps.insert(vecSteps.end(),
                        {RunFailed(szError, strSql), Check("0 > runSqlEx(strSql, NULL, NULL)"),
                         Plain(R"(jRecIn={"name":"x"})"), SqlError(szError, strSql)});
        return vecSteps;
    }

  private:
    bool IsLookup(const Lines& vecLog, size_t nAt, const std::string& strDefinition) const {
        return vecLog.size() - nAt >= 4 &&
               vecLog[nAt] == UtilCheck("jType[strJsonName].type() != Json::objectValue") &&
               vecLog[nAt + 1] == UtilPlain("strJsonName=t") &&
               vecLog[nAt + 2] == UtilPlain("jTableDef=" + strDefinition) &&
               vecLog[nAt + 3].compare(0, 18, "util plain: jType=") == 0;
    }
};

// The rest of a save that found no types.
Lines RefusedSave(Lines vecSteps) {
    vecSteps.insert(
        vecSteps.end(),
        {Check("!jType.isMember(strKey)"), Check("0 > SqlExpandMemberSymbol(strSql, jRecInOut)"),
         Plain(R"(blCreate=1, jRecInOut={"id":3,"name":"c"})"), Plain("jType=null")});
    return vecSteps;
}

// ---- create and save ---------------------------------------------------------------------------

TEST_F(Lookups, CreateLooksUpForDefaultsCheckSaveAndValues) {
    EXPECT_EQ(Save(true, R"({"id":3,"name":"c"})"), -1);
    Lines vecSteps = RefusedSave({"lookup", "lookup", "lookup", "lookup"});
    vecSteps.push_back(Check("0 > recSave(jParam, true)"));
    vecSteps.push_back(Plain(R"(call create rec, rec={"id":3,"name":"c"})"));
    EXPECT_EQ(Steps(), vecSteps);
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Lookups, CreateRefusesAnEmptyRecordBeforeTheFirst) {
    EXPECT_EQ(Save(true, "{}"), -1);
    EXPECT_EQ(Steps(), (Lines{Check("jRecIn.empty()"), Plain("call create rec, rec={}")}));
}

TEST_F(Lookups, CreateEndsAfterTheCheckOfARecordThatIsNoObject) {
    EXPECT_EQ(Save(true, "[1]"), -1);
    EXPECT_EQ(Steps(),
              (Lines{"lookup", "lookup", Check("!jRecParam.isObject()"),
                     Check("0 > checkJsonType(jParam)"), Plain("call create rec, rec=[1]")}));
}

TEST_F(Lookups, SaveLooksUpForItselfAndForTheValues) {
    EXPECT_EQ(Save(false, R"({"id":3,"name":"c"})"), -1);
    EXPECT_EQ(Steps(), RefusedSave({"lookup", "lookup"}));
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(Lookups, FirstOfAnOperationNamesTheReasonAndTheOthersTheRefusal) {
    OpenDefinition(ParseJson(R"({"other":1})"), "CREATE TABLE t (id)");
    Json::Value jRec = ParseJson(R"({"id":3})");
    EXPECT_EQ(m_pHandle->recSave(jRec, true), -1);
    const Lines vecLog = TakeLog();
    ASSERT_GE(vecLog.size(), 8U);
    EXPECT_EQ(vecLog[0], UtilCheck("!jTableDef.isMember(strJsonName)"));
    EXPECT_EQ(vecLog[4], UtilCheck("jType[strJsonName].type() != Json::objectValue"));
}

// ---- list --------------------------------------------------------------------------------------

TEST_F(Lookups, ListLooksUpForTheConditionsAndForTheRow) {
    EXPECT_EQ(List("null"), -1);
    EXPECT_EQ(Steps(), RefusedRow());
    EXPECT_EQ(TakeSql(), Lines{kRows});
}

TEST_F(Lookups, ListOfNoRowsLooksUpForTheConditionsOnly) {
    Sql("delete from t;");
    EXPECT_EQ(List("null"), 0);
    EXPECT_EQ(Steps(), Lines{"lookup"});
}

TEST_F(Lookups, ListChecksBothKindsBeforeTheFirst) {
    EXPECT_EQ(List("[1]"), -1);
    EXPECT_EQ(Steps(), (Lines{Check("jRecParam.type() != Json::objectValue && "
                                    "jRecParam.type() != Json::nullValue"),
                              Plain("jRecParam=[1]")}));
    EXPECT_EQ(List("{}", "{}"), -1);
    EXPECT_EQ(Steps(), (Lines{Check("jRecArrayOut.type() != Json::nullValue && "
                                    "jRecArrayOut.type() != Json::arrayValue"),
                              Plain("jRecParam={}")}));
}

TEST_F(Lookups, ListLooksUpBeforeTheSortTerm) {
    EXPECT_EQ(List(R"({"sort_by":7})"), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("!szSql"),
                              Check("0 > SqlFilterConditionFromJson(jRecParam, strSqlLimit)"),
                              Plain(R"(jRecParam={"sort_by":7})")}));
}

TEST_F(Lookups, GetOneLooksUpAsItsListDoes) {
    Json::Value jNoQuery;
    Json::Value jOut;
    EXPECT_EQ(m_pHandle->recGetOne(jNoQuery, jOut), -1);
    Lines vecSteps = RefusedRow();
    vecSteps.push_back(Check("0 > recList(jRecParam, jRecArray)"));
    EXPECT_EQ(Steps(), vecSteps);
}

// ---- update ------------------------------------------------------------------------------------

TEST_F(Lookups, UpdateByWhereLooksUpOnceForTheAssignments) {
    EXPECT_EQ(ByWhere(R"({"name":"x"})", "id=1"), -1);
    EXPECT_EQ(Steps(), RefusedUpdate({"lookup"}, "id=1"));
}

TEST_F(Lookups, UpdateByWhereMakesBothChecksBeforeTheLookup) {
    EXPECT_EQ(ByWhere("{}", ""), -1);
    EXPECT_EQ(Steps(), (Lines{Check("strSqlWhere.empty()"), Plain("jRecIn={}")}));
    EXPECT_EQ(ByWhere("{}", "id=1"), -1);
    EXPECT_EQ(Steps(), (Lines{Check("jRecIn.empty()"), Plain("jRecIn={}")}));
}

TEST_F(Lookups, UpdateByWhereLooksUpBeforeTheKindOfTheRecord) {
    EXPECT_EQ(ByWhere("[1]", "id=1"), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup",
                              Check("jRecParam.type() != Json::objectValue && "
                                    "jRecParam.type() != Json::nullValue"),
                              Check("0 > SqlExpandMemberList(jColumnList, strSql2, "
                                    "VORN_SQL_WHERE_TYPE_COMMA)"),
                              Plain("jRecIn=[1]")}));
}

TEST_F(Lookups, UpdateByFilterLooksUpForFilterCheckAndAssignments) {
    EXPECT_EQ(ByFilter(R"({"vornSqlWhereFilter":"1=1"})", R"({"name":"x"})"), -1);
    Lines vecSteps = RefusedUpdate({"lookup", "lookup", "lookup"}, " ( 1=1  )");
    vecSteps.push_back(Check("0 > recUpdateByWhere(jParamIn, strSql)"));
    vecSteps.push_back(Plain(R"(recUpdateByFilter failed, jParamIn={"name":"x"})"));
    EXPECT_EQ(Steps(), vecSteps);
}

TEST_F(Lookups, UpdateByFilterEndsAfterAFilterWithoutACondition) {
    EXPECT_EQ(ByFilter(R"({"id":1})", R"({"name":"x"})"), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("strSql.empty()"),
                              Plain(R"(recUpdateByFilter failed, jParamIn={"name":"x"})")}));
}

TEST_F(Lookups, UpdateByFilterChecksAllKindsBeforeTheFirst) {
    const std::string strTail = Plain(R"(recUpdateByFilter failed, jParamIn=[2])");
    EXPECT_EQ(ByFilter("{}", "[2]"), -1);
    EXPECT_EQ(Steps(), (Lines{Check("jFilterIn.empty()"), strTail}));
    EXPECT_EQ(ByFilter("[1]", "[2]"), -1);
    EXPECT_EQ(Steps(), (Lines{Check("jFilterIn.type() != Json::objectValue"), strTail}));
    EXPECT_EQ(ByFilter(R"({"id":1})", "[2]"), -1);
    EXPECT_EQ(Steps(), (Lines{Check("jParamIn.type() != Json::objectValue"), strTail}));
}

// ---- delete ------------------------------------------------------------------------------------

TEST_F(Lookups, DeleteLooksUpOnceForTheConditions) {
    EXPECT_EQ(Delete(R"({"id":1})"), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("strSql.empty()")}));
    EXPECT_EQ(Delete(R"({"vornSqlWhereFilter":"id=1"})"), 1);
    EXPECT_EQ(Steps(), Lines{"lookup"});
}

TEST_F(Lookups, DeleteChecksTheKindBeforeTheLookup) {
    EXPECT_EQ(Delete("null", true), -1);
    EXPECT_EQ(Steps(), Lines{Check("jRecParam.type() != Json::objectValue")});
}

TEST_F(Lookups, DeleteAllLooksUpThoughItNeedsNoTypes) {
    EXPECT_EQ(m_pHandle->recDeleteAll(), 2);
    EXPECT_EQ(Steps(), Lines{"lookup"});
}

TEST_F(Lookups, DeleteByArrayLooksUpOnceBeforeEveryCheck) {
    Lines vecNone;
    EXPECT_EQ(m_pHandle->recDeleteByArray(vecNone, nullptr), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("0 >= strVector.size()"),
                              Plain("recDeleteByArray failed, name=(null), strVector=")}));
    Lines vecOne{"a"};
    EXPECT_EQ(m_pHandle->recDeleteByArray(vecOne, "name"), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("!jType.isMember(szKey)"),
                              Plain("recDeleteByArray failed, name=name, strVector=a")}));
}

TEST_F(Lookups, DeleteByNameLooksUpOnceBeforeEveryCheck) {
    std::string strValue;
    EXPECT_EQ(m_pHandle->recDeleteByName(strValue, nullptr), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("strValue.empty()"),
                              Plain("recDeleteByName failed, name=(null), strValue=")}));
    strValue = "a";
    EXPECT_EQ(m_pHandle->recDeleteByName(strValue, "name"), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("!jType.isMember(szKey)"),
                              Plain("recDeleteByName failed, name=name, strValue=a")}));
}

TEST_F(Lookups, QueryObjectOfAVectorNeedsNone) {
    Lines vecOne{"a"};
    Json::Value jOut;
    EXPECT_EQ(m_pHandle->VectorParamToJson(vecOne, "nobody", jOut), 0);
    jOut = 7;
    EXPECT_EQ(m_pHandle->VectorParamToJson(vecOne, "nobody", jOut), -1);
    EXPECT_EQ(Steps(), Lines{Check("jParamOut.type() != Json::objectValue && "
                                   "jParamOut.type() != Json::nullValue")});
}

// ---- check, defaults and builders --------------------------------------------------------------

TEST_F(Lookups, TypeCheckLooksUpBeforeTheKindOfTheRecord) {
    Json::Value jRec = ParseJson("[1]");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("!jRecParam.isObject()")}));
    jRec = ParseJson(R"({"id":"no number"})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), 0);
    EXPECT_EQ(Steps(), Lines{"lookup"});
}

TEST_F(Lookups, DefaultsAreLookedUpOnceInEachMode) {
    for (const bool blStrict : {false, true}) {
        Json::Value jRec;
        EXPECT_EQ(m_pHandle->fillDefaultValue(jRec, blStrict), 0);
        EXPECT_EQ(Steps(), Lines{"lookup"});
    }
}

TEST_F(Lookups, NamesAndTailNeedNone) {
    std::string strSql;
    Json::Value jFilter = ParseJson(R"({"sort_by":"name","limit":2})");
    EXPECT_EQ(m_pHandle->SqlExpandMemberName(strSql), 0);
    EXPECT_EQ(m_pHandle->SqlFilterConditionFromJson(jFilter, strSql), 0);
    EXPECT_EQ(strSql, "id,name order by 'name' LIMIT 2");
    jFilter = 7;
    EXPECT_EQ(m_pHandle->SqlFilterConditionFromJson(jFilter, strSql), -1);
    EXPECT_EQ(Steps(), Lines{Check("jFilter.type() != Json::objectValue && "
                                   "jFilter.type() != Json::nullValue")});
}

TEST_F(Lookups, ValuesLookUpOnceAndKnowNoMember) {
    std::string strSql = "(";
    Json::Value jRec;
    EXPECT_EQ(m_pHandle->SqlExpandMemberSymbol(strSql, jRec), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("!jType.isMember(strKey)")}));
}

TEST_F(Lookups, ConditionListLooksUpBeforeItsChecks) {
    EXPECT_EQ(Expand("[]", 99), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("jRecParam.type() != Json::objectValue && "
                                              "jRecParam.type() != Json::nullValue")}));
    EXPECT_EQ(Expand("{}", 99), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Located("error andType=99")}));
    EXPECT_EQ(Expand(R"({"id":1,"name":[]})", 1), 1);
    EXPECT_EQ(Steps(), Lines{"lookup"});
}

TEST_F(Lookups, ConditionsOnOneMemberLookUpBeforeTheirChecks) {
    std::string strField = "id";
    std::string strSql;
    Json::Value jValue = 1;
    EXPECT_EQ(m_pHandle->SqlMakeByMatchField(strField, jValue, strSql), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("!jType.isMember(strField)")}));
    EXPECT_EQ(m_pHandle->SqlMakeByListField(nullptr, jValue, strSql), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("!szField || !szField[0]")}));
    EXPECT_EQ(m_pHandle->SqlMakeByListField("id", jValue, strSql), -1);
    EXPECT_EQ(Steps(), (Lines{"lookup", Check("!jType.isMember(szField)")}));
}

TEST_F(Lookups, RunningAStatementAndCreatingTheTableNeedNone) {
    EXPECT_EQ(m_pHandle->runSqlEx("delete from t where 0;"), 0);
    Sql("drop table t");
    EXPECT_EQ(m_pHandle->tableCreate(), 0);
    EXPECT_EQ(Steps(), Lines());
}

}  // namespace
