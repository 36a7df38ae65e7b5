// Changing and removing what a query selects.

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

class ChangeTest : public TableTest {
  protected:
    ChangeTest() {
        Open();
        Run("INSERT INTO task (id, name, size, done, tags) VALUES (1, 'b', 10, 1, '[1]'), "
            "(2, 'a', NULL, 0, NULL), (3, NULL, 30, NULL, '[]')");
    }

    // How many rows were changed, and what is stored; or why nothing was.
    std::string Update(const std::string& strWhere, const std::string& strMembers) {
        std::int64_t nRows = -1;
        const Status Outcome =
            m_Table.Update(Parse("{\"where\": " + strWhere + "}"), Parse(strMembers), &nRows);
        return Told(Outcome, nRows);
    }
    std::string Remove(const std::string& strQuery) {
        std::int64_t nRows = -1;
        const Status Outcome = m_Table.Remove(Parse(strQuery), &nRows);
        return Told(Outcome, nRows);
    }
    std::string Told(const Status& Outcome, std::int64_t nRows) {
        EXPECT_EQ(Outcome.Ok(), nRows >= 0);
        return Outcome.Ok() ? std::to_string(nRows) + ": " + Stored() : Text(Outcome);
    }
    std::string Stored() { return Rows("SELECT id, name, size, done, tags FROM task ORDER BY id"); }
};

TEST_F(ChangeTest, UpdateSetsTheGivenMembersOfAllThatAreSelected) {
    EXPECT_EQ("2: 1|c|10|0|[1];2|c|NULL|0|NULL;3|NULL|30|NULL|[]",
              Update(R"({"name": {"$ne": null}})", R"({"name": "c", "done": false})"));
    EXPECT_EQ("1: 1|NULL|10|0|[];2|c|NULL|0|NULL;3|NULL|30|NULL|[]",
              Update(R"({"id": 1})", R"({"name": null, "tags": []})"));
    EXPECT_EQ("0: 1|NULL|10|0|[];2|c|NULL|0|NULL;3|NULL|30|NULL|[]",
              Update(R"({"id": 4})", R"({"size": 1})"));
    EXPECT_EQ("1: 1|NULL|10|0|[];2|c|NULL|0|NULL;4|NULL|30|NULL|[]",
              Update(R"({"id": 3})", R"({"id": 4})"));
    EXPECT_EQ("ok", Text(m_Table.Update(Query().Where("id", 4), Parse(R"({"size": 5})"))));
    EXPECT_EQ("5", Rows("SELECT size FROM task WHERE id = 4"));
}

TEST_F(ChangeTest, UpdateIsRefusedBeforeAnythingRuns) {
    const std::string strBefore = Stored();
    const std::string strCannot = "refused: cannot update records of table \"task\": ";
    EXPECT_EQ(strCannot +
                  "member \"size\": \"5\" is another kind of value: expected is a whole "
                  "number from -9223372036854775808 to 9223372036854775807 "
                  "[wrong-kind /size]",
              Update(R"({"id": 1})", R"({"size": "5"})"));
    EXPECT_EQ(strCannot +
                  "there is no member \"sise\" (did you mean \"size\"?) "
                  "[unknown-member /sise]",
              Update(R"({"id": 1})", R"({"sise": 5, "name": "x"})"));
    EXPECT_EQ(strCannot +
                  "an object of 0 is no record: an object with members is expected "
                  "[not-a-record ]",
              Update(R"({"id": 1})", "{}"));
    EXPECT_EQ(strCannot +
                  "the query has no condition and would reach every record "
                  "[no-condition /where]",
              Update("{}", R"({"size": 5})"));
    EXPECT_EQ(strCannot +
                  "a change reaches all records that the conditions select, in no order "
                  "[paged-change ]",
              Text(m_Table.Update(Query().Where("id", 1).Limit(1), Parse(R"({"size": 5})"))));
    EXPECT_EQ(strCannot +
                  "table \"task\" has no member \"nmae\" (did you mean \"name\"?) "
                  "[unknown-member /where/nmae] [wrong-kind /done]",
              Update(R"({"nmae": 1})", R"({"done": 5})"));
    EXPECT_EQ(strBefore, Stored());
}

TEST_F(ChangeTest, UpdateThatFailsHalfwayChangesNothing) {
    const std::string strBefore = Stored();
    EXPECT_EQ(
        "duplicate: cannot update records of table \"task\": UNIQUE constraint failed: "
        "task.id",
        Update(R"({"id": {"$gt": 1}})", R"({"id": 7})"));
    EXPECT_EQ(strBefore, Stored());
    Run("CREATE TRIGGER t BEFORE UPDATE ON task WHEN new.id = 3 BEGIN SELECT raise(ABORT, 'not "
        "three'); END");
    EXPECT_EQ("constraint: cannot update records of table \"task\": not three",
              Update(R"({"id": {"$gt": 0}})", R"({"size": 7})"));
    EXPECT_EQ(strBefore, Stored());
}

TEST_F(ChangeTest, RemoveTakesWhatIsSelectedAndNoMore) {
    EXPECT_EQ("0: 1|b|10|1|[1];2|a|NULL|0|NULL;3|NULL|30|NULL|[]",
              Remove(R"({"where": {"id": {"$in": []}}})"));
    EXPECT_EQ("1: 1|b|10|1|[1];3|NULL|30|NULL|[]", Remove(R"({"where": {"size": null}})"));
    EXPECT_EQ(
        "refused: cannot remove records from table \"task\": the query has no condition and "
        "would reach every record [no-condition /where]",
        Remove("{}"));
    EXPECT_EQ(
        "refused: cannot remove records from table \"task\": a change reaches all records "
        "that the conditions select, in no order [paged-change ]",
        Remove(R"({"where": {"id": 1}, "sort": ["id"]})"));
    EXPECT_EQ("ok [empty-nin /where/id/$nin]",
              Text(m_Table.Remove(Parse(R"({"where": {"id": {"$nin": []}}})"))));
    EXPECT_EQ("", Stored());
}

TEST_F(ChangeTest, RemoveAllReachesThisTableAlone) {
    Run("CREATE TABLE other (a); INSERT INTO other VALUES (1)");
    std::int64_t nRows = -1;
    EXPECT_EQ("ok", Text(m_Table.RemoveAll(&nRows)));
    EXPECT_EQ(3, nRows);
    EXPECT_EQ("ok", Text(m_Table.RemoveAll(&nRows)));
    EXPECT_EQ(0, nRows);
    EXPECT_EQ("1", Rows("SELECT a FROM other"));
}

TEST_F(ChangeTest, ForeignKeysHold) {
    Run("PRAGMA foreign_keys = ON; CREATE TABLE child (task INTEGER REFERENCES task (id));"
        "INSERT INTO child VALUES (2)");
    EXPECT_EQ(
        "constraint: cannot remove records from table \"task\": FOREIGN KEY constraint failed",
        Remove(R"({"where": {"id": {"$gt": 0}}})"));
    EXPECT_EQ(
        "constraint: cannot remove all records from table \"task\": FOREIGN KEY constraint "
        "failed",
        Text(m_Table.RemoveAll()));
    EXPECT_EQ("3", Rows("SELECT count(*) FROM task"));
}

TEST_F(ChangeTest, ClosedTableIsMisuse) {
    Table Closed;
    EXPECT_EQ("misuse: cannot update records of: the table is not open",
              Text(Closed.Update(Query(), Json::Value())));
    EXPECT_EQ(StatusCode::kMisuse, Closed.Remove(Query()).Code());
    EXPECT_EQ(StatusCode::kMisuse, Closed.RemoveAll().Code());
}

}  // namespace

}  // namespace VORN_JSON_DB
