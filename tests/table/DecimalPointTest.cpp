// A program in a locale with a decimal comma, beside a SQLite that reads fractions by it, or not.

#include "FakeLocale.h"
#include "QueryFixture.h"

namespace VORN_JSON_DB {

namespace {

class DecimalPointTest : public QueryTest {
  protected:
    DecimalPointTest() {
        Run(R"(INSERT INTO doc (id, map, tags, rate) VALUES (1, '{"a":1.5}', '[1.5]', 1.5))");
    }

    static std::string Refused(const std::string& strDo, const std::string& strPath) {
        return "refused: cannot " + strDo +
               " table \"doc\": this SQLite misreads fractions inside of JSON, for the program's "
               "locale has another decimal point [decimal-point " +
               strPath + "]";
    }

    std::string CountOf(const Query& Which) {
        std::int64_t nRows = 0;
        const Status Outcome = m_Table.Count(Which, nRows);
        return Outcome.Ok() ? std::to_string(nRows) : Text(Outcome);
    }

    std::string Anew() { return Text(m_Table.Open(m_pDb, "doc", Parse(kDocs))); }
};

}  // namespace

TEST_F(DecimalPointTest, WhatWouldNotBeFoundIsRefused) {
    const std::string strRefused = Refused("count records of", "/where");
    Json::Value jOld;
    std::int64_t nRows = 0;
    const FakeLocale Comma;
    EXPECT_EQ(CountOf(Query().Where("map.a", 1.5)), strRefused);
    EXPECT_EQ(CountOf(Query().Where(Condition::Not({"map.a", Op::kLess, 1.5}))), strRefused);
    EXPECT_EQ(CountOf(Query().Where("tags", Op::kContains, 1.5)), strRefused);
    EXPECT_EQ(CountOf(Query().Sort("-map.a")), strRefused);
    EXPECT_EQ(CountOf(Query().Where("map.a", 1.5).Where("tags", Op::kContains, 1.5).Sort("map.a")),
              strRefused);
    EXPECT_EQ(Text(m_Table.Update(Query().Where("map.a", 1.5), Parse(R"({"size": 1})"), &nRows)),
              Refused("update records of", "/where"));
    EXPECT_EQ(Text(m_Table.ToOldQuery(Query().Where("map.a", 1.5), OldCall::kRead, jOld)),
              Refused("write an old query for", "/where"));
}

TEST_F(DecimalPointTest, WhatLooksIntoNoJsonIsFree) {
    const FakeLocale Comma;
    EXPECT_EQ(CountOf(Query().Where("rate", 1.5).Where("map", Parse(R"({"a": 1.5})"))), "1");
    EXPECT_EQ(CountOf(Query().Where("rate", Op::kIn, Parse("[1.5, 2, 2.5]")).Sort("size")), "1");
}

TEST_F(DecimalPointTest, OperatorThatTheMemberCannotHaveReadsNone) {
    const FakeLocale Comma;
    EXPECT_EQ(CountOf(Query().Where("size", Op::kContains, 1)),
              "refused: cannot count records of table \"doc\": \"$contains\" is not for member "
              "\"size\" of type \"long long\" [wrong-operator /where/size/$contains]");
}

TEST_F(DecimalPointTest, IndexOnAPathIsRefused) {
    const FakeLocale Comma;
    EXPECT_EQ(Text(m_Table.CreateIndex({"size", "map.a"}, false)),
              Refused("create an index on", "/1"));
    EXPECT_EQ(Text(m_Table.CreateIndex({"rate"}, false)), "ok");
}

TEST_F(DecimalPointTest, TableWithAnIndexOnAPathIsNotOpened) {
    EXPECT_EQ(Text(m_Table.CreateIndex({"rate"}, false)), "ok");
    {
        const FakeLocale Comma;
        EXPECT_EQ(Anew(), "ok");
    }
    EXPECT_EQ(Text(m_Table.CreateIndex({"map.a"}, false)), "ok");
    {
        const FakeLocale Comma;
        EXPECT_EQ(Anew(), Refused("open", ""));
    }
    EXPECT_EQ(Anew(), "ok");
}

// The name finds the first database that has such a table; what another one holds is no matter.
TEST_F(DecimalPointTest, IndexIsFoundInWhicheverDatabaseAndLetterCase) {
    Run(R"(ATTACH ':memory:' AS "o'th""er"; ATTACH ':memory:' AS later;
           CREATE TABLE "o'th""er".far (id INTEGER PRIMARY KEY, map TEXT);
           CREATE INDEX "o'th""er".OnId ON far (id, map);
           CREATE TABLE later.far (map TEXT);
           CREATE INDEX later.OnMap ON far (json_extract(map, '$.a')))");
    const Json::Value jFar = Parse(R"({"FAR": {"member": {"id": {"cpptype": "int"}}}})");
    const FakeLocale Comma;
    EXPECT_EQ(Text(m_Table.Open(m_pDb, "FAR", jFar)), "ok");
    Run(R"(CREATE INDEX "o'th""er".OnMap ON far (json_extract(map, '$.a')))");
    EXPECT_EQ(
        Text(m_Table.Open(m_pDb, "FAR", jFar)),
        "refused: cannot open table \"FAR\": this SQLite misreads fractions inside of JSON, for "
        "the program's locale has another decimal point [decimal-point ]");
}

// What asks for the table's database is the longest text of all that Open runs.
TEST_F(DecimalPointTest, IndexesThatCannotBeReadAreNotTakenForNone) {
    const FakeLocale Comma;
    sqlite3_limit(m_pDb, SQLITE_LIMIT_SQL_LENGTH, 140);
    EXPECT_EQ(Anew(), "refused: cannot open table \"doc\": string or blob too big");
}

TEST_F(DecimalPointTest, LocaleThatSqliteDoesNotReadByIsFree) {
    const FakeLocale Comma(false);
    EXPECT_EQ(CountOf(Query().Where("map.a", 1.5)), "1");
    EXPECT_EQ(Text(m_Table.CreateIndex({"map.a"}, false)), "ok");
    EXPECT_EQ(Anew(), "ok");
}

}  // namespace VORN_JSON_DB
