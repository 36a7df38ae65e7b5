// Construction, table creation, the message slot and the end of a handle.
#include <type_traits>

#include "../support/TableTest.h"

using namespace testhost;

namespace {

using HandleTest = TableTest;

static_assert(!std::is_polymorphic<VornJsonDbApi>::value, "no virtual functions");
static_assert(!std::is_copy_constructible<VornJsonDbApi>::value, "handles are not copied");
static_assert(!std::is_copy_assignable<VornJsonDbApi>::value, "handles are not assigned");

// Lines of a construction whose CREATE statement failed.
Lines FailedCreate(const std::string& strError, const std::string& strSql) {
    return {RunFailed(strError, strSql), Located("create table failed, sql=" + strSql),
            SqlError(strError, strSql), Check("0 > tableCreate()")};
}

}  // namespace

TEST_F(HandleTest, ConstructionRunsTheCreateStatementUnchangedAndOnce) {
    const std::string strCreate = "create  table u(x) ; -- as it stands";
    const auto pHandle = NewHandle(m_pDb, "u", Definition("u", "x:int"), strCreate);
    EXPECT_EQ(TakeSql(), Lines{strCreate});
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(Rows("SELECT count(*) FROM u"), "0");
}

TEST_F(HandleTest, EmptyNameDefinitionAndStatementAreAllReportedAndTheHandleLives) {
    const auto pHandle = NewHandle(m_pDb, "", Json::Value(), "");
    EXPECT_EQ(TakeLog(), Joined({ShortCheck("strName.empty()"), ShortCheck("jTableDef.empty()"),
                                 ShortCheck("strSqlCreate.empty()"), Check("0 >= strSql.length()")},
                                FailedCreate("Unknow Error!!", "")));
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(pHandle->getErrMsg(), "");
}

TEST_F(HandleTest, NullConnectionIsReportedAndTheCreateFailsWithoutAText) {
    const auto pHandle = NewHandle(nullptr, "t", m_jDefinition, kCreateItem);
    EXPECT_EQ(TakeLog(), Joined({ShortCheck("!pDb")}, FailedCreate("Unknow Error!!", kCreateItem)));
    EXPECT_EQ(TakeSql(), (Lines{kCreateItem}));
    EXPECT_EQ(pHandle->getErrMsg(), "");
}

TEST_F(HandleTest, EmptyNameAloneIsReportedAndTheTableIsCreated) {
    NewHandle(m_pDb, "", m_jDefinition, "CREATE TABLE u(x)");
    EXPECT_EQ(TakeLog(), Lines{ShortCheck("strName.empty()")});
    EXPECT_EQ(Rows("SELECT count(*) FROM u"), "0");
}

TEST_F(HandleTest, DefinitionCountsAsEmptyWhenNullOrWithoutElements) {
    for (const char* szDefinition : {"null", "{}", "[]"}) {
        NewHandle(m_pDb, "u", ParseJson(szDefinition), "CREATE TABLE u(x)");
        EXPECT_EQ(TakeLog(), Lines{ShortCheck("jTableDef.empty()")}) << szDefinition;
        Sql("DROP TABLE u");
    }
}

TEST_F(HandleTest, EmptyStatementAloneIsReportedAndRefusedByTheRunner) {
    NewHandle(m_pDb, "t", m_jDefinition, "");
    EXPECT_EQ(TakeLog(), Joined({ShortCheck("strSqlCreate.empty()"), Check("0 >= strSql.length()")},
                                FailedCreate("Unknow Error!!", "")));
}

TEST_F(HandleTest, FailedCreateLogsTheSqlErrorAndLeavesAUsableHandle) {
    Sql("INSERT INTO t VALUES (1, 'a')");
    const auto pSecond = NewHandle(m_pDb, "t", m_jDefinition, kCreateItem);
    EXPECT_EQ(TakeLog(), FailedCreate("table t already exists", kCreateItem));
    Json::Value jNoQuery;
    Json::Value jRows;
    EXPECT_EQ(pSecond->recList(jNoQuery, jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":1,"name":"a"}])");
}

TEST_F(HandleTest, MessageSlotIsEmptyAfterConstructionEvenWhenTheCreateFailed) {
    const auto pSecond = NewHandle(m_pDb, "t", m_jDefinition, kCreateItem);
    EXPECT_EQ(pSecond->getErrMsg(), "");
    EXPECT_EQ(SqlErrorOf(*pSecond), "table t already exists");
}

TEST_F(HandleTest, SecondHandleIsSilentWhenTheStatementToleratesTheTable) {
    const std::string strCreate = "CREATE TABLE IF NOT EXISTS t (x)";
    const auto pSecond = NewHandle(m_pDb, "t", m_jDefinition, strCreate);
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(TakeSql(), (Lines{strCreate}));
}

TEST_F(HandleTest, HandleKeepsCopiesOfItsArguments) {
    std::string strName = "u";
    Json::Value jDefinition = Definition("u", "id:int");
    std::string strCreate = "CREATE TABLE u (id)";
    VornJsonDbApi handle(m_pDb, strName, jDefinition, strCreate);
    Sql("INSERT INTO u VALUES (5)");
    strName = "elsewhere";
    jDefinition["u"]["member"] = ParseJson("{\"other\":{\"cpptype\":\"string\"}}");
    strCreate = "nonsense";
    TakeSql();
    Json::Value jNoQuery;
    Json::Value jRows;
    EXPECT_EQ(handle.recList(jNoQuery, jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":5}])");
    EXPECT_EQ(handle.tableCreate(), -1);
    EXPECT_EQ(TakeSql(), (Lines{"SELECT id FROM u ;", "CREATE TABLE u (id)"}));
}

TEST_F(HandleTest, ConstructionLeavesItsArgumentsAlone) {
    std::string strName = "u";
    Json::Value jDefinition = Definition("u", "id:int");
    std::string strCreate = "CREATE TABLE u (id)";
    const VornJsonDbApi handle(m_pDb, strName, jDefinition, strCreate);
    EXPECT_EQ(strName, "u");
    EXPECT_EQ(jDefinition, Definition("u", "id:int"));
    EXPECT_EQ(strCreate, "CREATE TABLE u (id)");
}

TEST_F(HandleTest, TableCreateGivesZeroWhateverNumberOfRowsChanged) {
    const std::string strSql = "INSERT INTO t(name) VALUES ('a'), ('b'), ('c')";
    const auto pHandle = NewHandle(m_pDb, "t", m_jDefinition, strSql);
    EXPECT_EQ(pHandle->tableCreate(), 0);
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(Count(), "6");
}

TEST_F(HandleTest, TableCreateFailureLogsItsTwoLinesAndNoConditionOfTheConstructor) {
    EXPECT_EQ(m_pHandle->tableCreate(), -1);
    const std::string strError = "table t already exists";
    Lines vecExpected = FailedCreate(strError, kCreateItem);
    vecExpected.pop_back();
    EXPECT_EQ(TakeLog(), vecExpected);
}

TEST_F(HandleTest, TableCreateSaysNothingOfAnErrorWithAnEmptyText) {
    FailNextExec({{SQLITE_ERROR, "", 0}});
    EXPECT_EQ(m_pHandle->tableCreate(), -1);
    EXPECT_EQ(TakeLog(), (Lines{RunFailed("", kCreateItem),
                                Located(std::string("create table failed, sql=") + kCreateItem)}));
}

TEST_F(HandleTest, TableCreateSucceedsAgainAfterTheTableIsDropped) {
    EXPECT_EQ(m_pHandle->tableCreate(), -1);
    Sql("DROP TABLE t");
    TakeLog();
    EXPECT_EQ(m_pHandle->tableCreate(), 0);
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(SqlErrorOf(*m_pHandle), "");
}

TEST_F(HandleTest, MessageSlotHoldsWhatTheCallerPutThere) {
    m_pHandle->setErrMsg("x");
    EXPECT_EQ(m_pHandle->getErrMsg(), "x");
    m_pHandle->setErrMsg("");
    EXPECT_EQ(m_pHandle->getErrMsg(), "");
    const std::string strBinary("a\0b\xC3\xBC", 5);
    m_pHandle->setErrMsg(strBinary);
    EXPECT_EQ(m_pHandle->getErrMsg(), strBinary);
}

TEST_F(HandleTest, FailingStatementLeavesTheMessageSlotAlone) {
    m_pHandle->setErrMsg("x");
    EXPECT_EQ(m_pHandle->runSqlEx("nonsense"), -1);
    EXPECT_EQ(m_pHandle->tableCreate(), -1);
    EXPECT_EQ(m_pHandle->getErrMsg(), "x");
    EXPECT_EQ(m_pHandle->runSqlEx("SELECT 1"), 0);
    EXPECT_EQ(m_pHandle->getErrMsg(), "x");
}

TEST_F(HandleTest, MessageSlotsOfTwoHandlesAreApart) {
    const auto pSecond = NewHandle(m_pDb, "t", m_jDefinition, "SELECT 1");
    m_pHandle->setErrMsg("first");
    pSecond->setErrMsg("second");
    EXPECT_EQ(m_pHandle->getErrMsg(), "first");
    EXPECT_EQ(pSecond->getErrMsg(), "second");
}

TEST_F(HandleTest, DestroyedHandleLeavesTheConnectionToItsOwnerAndToOtherHandles) {
    auto pSecond = NewHandle(m_pDb, "t", m_jDefinition, "SELECT 1");
    pSecond.reset();
    Sql("INSERT INTO t VALUES (1, 'a')");
    EXPECT_EQ(m_pHandle->runSqlEx("UPDATE t SET name = 'b'"), 1);
    EXPECT_EQ(All(), "1|b");
    EXPECT_EQ(TakeLog(), Lines());
}
