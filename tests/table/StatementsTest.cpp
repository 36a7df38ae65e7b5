#include "../../table/Statements.h"
#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Statement;
using vornjsondb::Statements;

class StatementsTest : public TableTest {
  protected:
    // Takes, counts whether it was prepared for it, and gives back.
    std::string Use(Statements& Kept, const std::string& strShape) {
        bool blPrepared = false;
        Statement Lent;
        EXPECT_EQ(SQLITE_OK, Take(Kept, strShape, Lent, blPrepared));
        EXPECT_EQ(SQLITE_ROW, Lent.Step());
        return (blPrepared ? "new " : "kept ") +
               std::string(reinterpret_cast<const char*>(sqlite3_column_text(Lent.Get(), 0)));
    }

    static int Take(Statements& Kept, const std::string& strShape, Statement& Lent,
                    bool& blPrepared) {
        return Kept.Take(
            strShape,
            [&] {
                blPrepared = true;
                return "SELECT '" + strShape + "', ?1";
            },
            Lent);
    }
};

TEST_F(StatementsTest, LastUsedAreKept) {
    Statements Kept(m_pDb, 2);
    EXPECT_EQ("new a", Use(Kept, "a"));
    EXPECT_EQ("new b", Use(Kept, "b"));
    EXPECT_EQ("kept a", Use(Kept, "a"));
    EXPECT_EQ("new c", Use(Kept, "c"));
    EXPECT_EQ("kept a", Use(Kept, "a"));
    EXPECT_EQ("new b", Use(Kept, "b"));
}

TEST_F(StatementsTest, OneThatIsUsedAgainAndAgainLeavesTheOthersTheirPlace) {
    Statements Kept(m_pDb, 2);
    EXPECT_EQ(Use(Kept, "a"), "new a");
    EXPECT_EQ(Use(Kept, "b"), "new b");
    EXPECT_EQ(Use(Kept, "a"), "kept a");
    EXPECT_EQ(Use(Kept, "a"), "kept a");
    EXPECT_EQ(Use(Kept, "b"), "kept b");
}

TEST_F(StatementsTest, AssignedStatementIsKeptUnderItsShape) {
    Statements Kept(m_pDb, 2);
    {
        Statement First;
        bool blPrepared = false;
        EXPECT_EQ(Take(Kept, "a", First, blPrepared), SQLITE_OK);
        Statement Assigned;
        Assigned = std::move(First);
    }
    EXPECT_EQ(Use(Kept, "a"), "kept a");
}

TEST_F(StatementsTest, NoneOrManyMayBeKept) {
    Statements None(m_pDb, 0);
    EXPECT_EQ("new a", Use(None, "a"));
    EXPECT_EQ("new a", Use(None, "a"));
    Statements Many(m_pDb, static_cast<size_t>(-1));
    EXPECT_EQ("new a", Use(Many, "a"));
    EXPECT_EQ("kept a", Use(Many, "a"));
}

TEST_F(StatementsTest, StatementOnLoanIsNotLentTwice) {
    Statements Kept(m_pDb, 2);
    Statement First;
    Statement Second;
    bool blPrepared = false;
    EXPECT_EQ(SQLITE_OK, Take(Kept, "a", First, blPrepared));
    EXPECT_EQ(SQLITE_OK, Take(Kept, "a", Second, blPrepared));
    EXPECT_NE(First.Get(), Second.Get());
}

TEST_F(StatementsTest, StatementComesBackClean) {
    Statements Kept(m_pDb, 2);
    {
        Statement Lent;
        bool blPrepared = false;
        EXPECT_EQ(SQLITE_OK, Take(Kept, "a", Lent, blPrepared));
        EXPECT_EQ(SQLITE_OK, sqlite3_bind_int(Lent.Get(), 1, 5));
        EXPECT_EQ(SQLITE_ROW, Lent.Step());
        EXPECT_NE(nullptr, sqlite3_next_stmt(m_pDb, nullptr));
        EXPECT_EQ(1, sqlite3_stmt_busy(sqlite3_next_stmt(m_pDb, nullptr)));
    }
    EXPECT_EQ(0, sqlite3_stmt_busy(sqlite3_next_stmt(m_pDb, nullptr)));
    Statement Lent;
    bool blPrepared = false;
    EXPECT_EQ(SQLITE_OK, Take(Kept, "a", Lent, blPrepared));
    EXPECT_EQ(SQLITE_ROW, Lent.Step());
    EXPECT_EQ(SQLITE_NULL, sqlite3_column_type(Lent.Get(), 1));
    EXPECT_FALSE(blPrepared);
}

TEST_F(StatementsTest, FailedPrepareLendsNothing) {
    Statements Kept(m_pDb, 2);
    Statement Lent;
    EXPECT_EQ(SQLITE_ERROR, Kept.Take(
                                "x", [] { return std::string("nonsense"); }, Lent));
    EXPECT_EQ(nullptr, Lent.Get());
}

TEST_F(StatementsTest, FinishCountsTheRows) {
    Statements Kept(m_pDb, 2);
    Statement Lent;
    EXPECT_EQ(Kept.Take(
                  "x", [] { return std::string("VALUES (1), (2), (3)"); }, Lent),
              SQLITE_OK);
    int nRows = 0;
    EXPECT_EQ(Lent.Finish(&nRows), SQLITE_OK);
    EXPECT_EQ(nRows, 3);
}

TEST_F(StatementsTest, FinishTellsTheFirstFailure) {
    Run("CREATE TABLE t (a UNIQUE)");
    Statements Kept(m_pDb, 2);
    Statement Lent;
    EXPECT_EQ(SQLITE_OK,
              Kept.Take(
                  "x", [] { return std::string("INSERT INTO t VALUES (1) RETURNING a"); }, Lent));
    EXPECT_EQ(SQLITE_OK, Lent.Finish());
    EXPECT_EQ(SQLITE_CONSTRAINT, Lent.Finish());
    Statement Moved(std::move(Lent));
    EXPECT_EQ(nullptr, Lent.Get());  // NOLINT(bugprone-use-after-move): empty is what it must be
    EXPECT_NE(nullptr, Moved.Get());
}

}  // namespace

}  // namespace VORN_JSON_DB
