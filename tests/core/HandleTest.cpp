// Construction, table creation, the message slot and the end of a handle.
#include <cerrno>
#include <type_traits>

#include "../support/TableFixture.h"

using namespace testhost;

namespace {

using Lines = std::vector<std::string>;
using HandleTest = TableTest;

static_assert(!std::is_polymorphic<VornJsonDbApi>::value, "no virtual functions");
static_assert(!std::is_copy_constructible<VornJsonDbApi>::value, "handles are not copied");
static_assert(!std::is_copy_assignable<VornJsonDbApi>::value, "handles are not assigned");

// Lines of a construction whose CREATE statement failed.
Lines FailedCreate(const std::string& strError, const std::string& strSql) {
    return {Plain("i=0,errno=0, run sql failed, error=" + strError + ", sql=" + strSql),
            Located("create table failed, sql=" + strSql),
            Plain("sql error, err=" + strError + ", sql=" + strSql), Check("0 > tableCreate()")};
}

Lines Joined(Lines vecFirst, const Lines& vecSecond) {
    vecFirst.insert(vecFirst.end(), vecSecond.begin(), vecSecond.end());
    return vecFirst;
}

}  // namespace

TEST_F(HandleTest, ConstructionRunsTheCreateStatementUnchangedAndOnce) {
    const std::string strTable = UniqueTable();
    const std::string strCreate = "create  table " + strTable + "(x) ; -- as it stands";
    const auto pHandle = NewHandle(m_pDb, strTable, Definition(strTable, "x:int"), strCreate);
    EXPECT_EQ(TakeSql(), (Lines{strCreate}));
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(Rows("SELECT name FROM sqlite_master WHERE name = '" + strTable + "'"), strTable);
}

TEST_F(HandleTest, EmptyNameDefinitionAndStatementAreAllReportedAndTheHandleLives) {
    errno = 0;
    const auto pHandle = NewHandle(m_pDb, "", Json::Value(), "");
    EXPECT_EQ(TakeLog(), Joined({ShortCheck("strName.empty()"), ShortCheck("jTableDef.empty()"),
                                 ShortCheck("strSqlCreate.empty()"), Check("0 >= strSql.length()")},
                                FailedCreate("Unknow Error!!", "")));
    EXPECT_EQ(TakeSql(), Lines());
    EXPECT_EQ(pHandle->getErrMsg(), "");
}

TEST_F(HandleTest, NullConnectionIsReportedAndTheCreateFailsWithoutAText) {
    const auto pHandle = NewHandle(nullptr, m_strTable, m_jDefinition, m_strCreate);
    EXPECT_EQ(TakeLog(), Joined({ShortCheck("!pDb")}, FailedCreate("Unknow Error!!", m_strCreate)));
    EXPECT_EQ(TakeSql(), (Lines{m_strCreate}));
    EXPECT_EQ(pHandle->getErrMsg(), "");
}

TEST_F(HandleTest, EmptyNameAloneIsReportedAndTheTableIsCreated) {
    const std::string strTable = UniqueTable();
    NewHandle(m_pDb, "", m_jDefinition, "CREATE TABLE " + strTable + "(x)");
    EXPECT_EQ(TakeLog(), (Lines{ShortCheck("strName.empty()")}));
    EXPECT_EQ(Rows("SELECT count(*) FROM " + strTable), "0");
}

TEST_F(HandleTest, DefinitionCountsAsEmptyWhenNullOrWithoutElements) {
    for (const char* szDefinition : {"null", "{}", "[]"}) {
        const std::string strTable = UniqueTable();
        NewHandle(m_pDb, strTable, ParseJson(szDefinition), "CREATE TABLE " + strTable + "(x)");
        EXPECT_EQ(TakeLog(), (Lines{ShortCheck("jTableDef.empty()")})) << szDefinition;
        EXPECT_EQ(Rows("SELECT count(*) FROM " + strTable), "0");
    }
}

TEST_F(HandleTest, EmptyStatementAloneIsReportedAndRefusedByTheRunner) {
    errno = 0;
    NewHandle(m_pDb, m_strTable, m_jDefinition, "");
    EXPECT_EQ(TakeLog(), Joined({ShortCheck("strSqlCreate.empty()"), Check("0 >= strSql.length()")},
                                FailedCreate("Unknow Error!!", "")));
}

TEST_F(HandleTest, FailedCreateLogsTheSqlErrorAndLeavesAUsableHandle) {
    Sql("INSERT INTO " + m_strTable + " VALUES (1, 'a')");
    const auto pSecond = NewHandle(m_pDb, m_strTable, m_jDefinition, m_strCreate);
    EXPECT_EQ(TakeLog(), FailedCreate("table " + m_strTable + " already exists", m_strCreate));
    Json::Value jNoQuery;
    Json::Value jRows;
    EXPECT_EQ(pSecond->recList(jNoQuery, jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":1,"name":"a"}])");
}

TEST_F(HandleTest, MessageSlotIsEmptyAfterConstructionEvenWhenTheCreateFailed) {
    const auto pSecond = NewHandle(m_pDb, m_strTable, m_jDefinition, m_strCreate);
    EXPECT_EQ(pSecond->getErrMsg(), "");
    EXPECT_EQ(SqlErrorOf(*pSecond), "table " + m_strTable + " already exists");
}

TEST_F(HandleTest, SecondHandleIsSilentWhenTheStatementToleratesTheTable) {
    const std::string strCreate = "CREATE TABLE IF NOT EXISTS " + m_strTable + " (x)";
    const auto pSecond = NewHandle(m_pDb, m_strTable, m_jDefinition, strCreate);
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(TakeSql(), (Lines{strCreate}));
}

TEST_F(HandleTest, HandleKeepsCopiesOfItsArguments) {
    std::string strName = UniqueTable();
    const std::string strTable = strName;
    Json::Value jDefinition = Definition(strTable, "id:int");
    std::string strCreate = "CREATE TABLE " + strTable + " (id)";
    VornJsonDbApi handle(m_pDb, strName, jDefinition, strCreate);
    Sql("INSERT INTO " + strTable + " VALUES (5)");
    strName = "elsewhere";
    jDefinition[strTable]["member"] = ParseJson("{\"other\":{\"cpptype\":\"string\"}}");
    strCreate = "nonsense";
    TakeSql();
    Json::Value jNoQuery;
    Json::Value jRows;
    EXPECT_EQ(handle.recList(jNoQuery, jRows), 0);
    EXPECT_EQ(Compact(jRows), R"([{"id":5}])");
    EXPECT_EQ(handle.tableCreate(), -1);
    EXPECT_EQ(TakeSql(),
              (Lines{"SELECT id FROM " + strTable + " ;", "CREATE TABLE " + strTable + " (id)"}));
}

TEST_F(HandleTest, ConstructionLeavesItsArgumentsAlone) {
    std::string strName = UniqueTable();
    const std::string strTable = strName;
    Json::Value jDefinition = Definition(strTable, "id:int");
    const Json::Value jBefore = jDefinition;
    std::string strCreate = "CREATE TABLE " + strTable + " (id)";
    const VornJsonDbApi handle(m_pDb, strName, jDefinition, strCreate);
    EXPECT_EQ(strName, strTable);
    EXPECT_EQ(jDefinition, jBefore);
    EXPECT_EQ(strCreate, "CREATE TABLE " + strTable + " (id)");
}

TEST_F(HandleTest, TableCreateGivesZeroWhateverNumberOfRowsChanged) {
    const std::string strSql = "INSERT INTO " + m_strTable + "(name) VALUES ('a'), ('b'), ('c')";
    const auto pHandle = NewHandle(m_pDb, m_strTable, m_jDefinition, strSql);
    EXPECT_EQ(pHandle->tableCreate(), 0);
    EXPECT_EQ(TakeLog(), Lines());
    EXPECT_EQ(Rows("SELECT count(*) FROM " + m_strTable), "6");
}

TEST_F(HandleTest, TableCreateFailureLogsItsTwoLinesAndNoConditionOfTheConstructor) {
    EXPECT_EQ(m_pHandle->tableCreate(), -1);
    const std::string strError = "table " + m_strTable + " already exists";
    Lines vecExpected = FailedCreate(strError, m_strCreate);
    vecExpected.pop_back();
    EXPECT_EQ(TakeLog(), vecExpected);
}

TEST_F(HandleTest, TableCreateSaysNothingOfAnErrorWithAnEmptyText) {
    FailNextExec({{SQLITE_ERROR, "", 0}});
    EXPECT_EQ(m_pHandle->tableCreate(), -1);
    EXPECT_EQ(TakeLog(), (Lines{Plain("i=0,errno=0, run sql failed, error=, sql=" + m_strCreate),
                                Located("create table failed, sql=" + m_strCreate)}));
}

TEST_F(HandleTest, TableCreateSucceedsAgainAfterTheTableIsDropped) {
    EXPECT_EQ(m_pHandle->tableCreate(), -1);
    Sql("DROP TABLE " + m_strTable);
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
    const auto pSecond = NewHandle(m_pDb, m_strTable, m_jDefinition, "SELECT 1");
    m_pHandle->setErrMsg("first");
    pSecond->setErrMsg("second");
    EXPECT_EQ(m_pHandle->getErrMsg(), "first");
    EXPECT_EQ(pSecond->getErrMsg(), "second");
}

TEST_F(HandleTest, DestroyedHandleLeavesTheConnectionToItsOwnerAndToOtherHandles) {
    auto pSecond = NewHandle(m_pDb, m_strTable, m_jDefinition, "SELECT 1");
    pSecond.reset();
    Sql("INSERT INTO " + m_strTable + " VALUES (1, 'a')");
    EXPECT_EQ(m_pHandle->runSqlEx("UPDATE " + m_strTable + " SET name = 'b'"), 1);
    EXPECT_EQ(Rows("SELECT * FROM " + m_strTable), "1|b");
    EXPECT_EQ(TakeLog(), Lines());
}
