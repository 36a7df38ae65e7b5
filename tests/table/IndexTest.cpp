// Indexes, and the plans that use them.

#include "../../table/PlanSteps.h"
#include "../../table/SqlWords.h"
#include "QueryFixture.h"

namespace VORN_JSON_DB {

namespace {

class IndexTest : public QueryTest {
  protected:
    std::string Index(const std::vector<std::string>& vecMembers, bool blUnique = false) {
        std::string strSql;
        const Status Outcome = m_Table.CreateIndex(vecMembers, blUnique, &strSql);
        return Outcome.Ok() ? strSql : Text(Outcome);
    }

    // The steps, a line each, as SQLite writes them from 3.36 on; then the findings.
    static std::string Lines(const Plan& Of) {
        std::string strText;
        for (const std::string& strStep : Of.vecSteps) {
            strText +=
                Replaced(Replaced(strStep, "SCAN TABLE ", "SCAN "), "SEARCH TABLE ", "SEARCH ") +
                "\n";
        }
        return strText + Text(Of.vecFindings);
    }

    std::string Explain(const Query& Which) {
        Plan Found;
        const Status Outcome = m_Table.Explain(Which, Found);
        return Outcome.Ok() ? Lines(Found) : Text(Outcome);
    }
    std::string ExplainWhere(const std::string& strWhere) {
        return Explain(Query(Parse("{\"where\": " + strWhere + "}")));
    }
    std::string ExplainSql(const std::string& strSql) {
        Plan Found;
        const Status Outcome = m_Table.ExplainSql(strSql, Found);
        return Outcome.Ok() ? Lines(Found) : Text(Outcome);
    }
    static std::string FullScan(const std::string& strMembers) {
        return "SCAN doc\nfull-scan /where: all records are looked at, which an index spares on " +
               strMembers;
    }
};

constexpr char kMayScan[] =
    "full-scan : all records are looked at; an index on what is compared may spare it";

}  // namespace

TEST_F(IndexTest, StatementHasTheTextOfConditions) {
    EXPECT_EQ(Index({"size"}), R"(CREATE INDEX "doc_size" ON "doc" ("size"))");
    EXPECT_EQ(Index({"name", "size"}),
              R"(CREATE INDEX "doc_name_size" ON "doc" ("name" COLLATE BINARY, "size"))");
    EXPECT_EQ(Index({"map.a.b"}, true),
              R"(CREATE UNIQUE INDEX "doc_map.a.b" ON "doc" )"
              R"((CASE WHEN json_valid("map") THEN json_extract("map", '$."a"."b"') END))");
    EXPECT_EQ(Rows("SELECT count(*) FROM sqlite_schema WHERE type = 'index'"), "3");
}

TEST_F(IndexTest, StatementNeedNotBeAskedFor) {
    EXPECT_EQ("ok", Text(m_Table.CreateIndex({"size"}, false)));
    EXPECT_EQ("doc_size", Rows("SELECT name FROM sqlite_schema WHERE type = 'index'"));
}

// What asks for the indexes is longer than SQLite takes now, and what would make one is not.
TEST_F(IndexTest, IndexesThatCannotBeReadAreNotMadeAnew) {
    sqlite3_limit(m_pDb, SQLITE_LIMIT_SQL_LENGTH, 200);
    EXPECT_EQ(Index({"size"}),
              "refused: cannot create an index on table \"doc\": string or blob too big");
    EXPECT_EQ(Rows("SELECT name FROM sqlite_schema WHERE type = 'index'"), "");
}

TEST_F(IndexTest, SameIndexIsMadeOnce) {
    const std::string strSql = Index({"name"});
    EXPECT_EQ(strSql, R"(CREATE INDEX "doc_name" ON "doc" ("name" COLLATE BINARY))");
    EXPECT_EQ(Index({"name"}), strSql);
    EXPECT_EQ(Index({"name"}, true),
              R"(CREATE UNIQUE INDEX "doc_name_2" ON "doc" ("name" COLLATE BINARY))");
    EXPECT_EQ(Index({"name"}), strSql);
    EXPECT_EQ(Rows("SELECT count(*) FROM sqlite_schema WHERE type = 'index'"), "2");
    Run("DROP INDEX doc_name; CREATE TABLE doc_name (a); CREATE TABLE doc_name_3 (a)");
    EXPECT_EQ(Index({"name"}), R"(CREATE INDEX "doc_name_4" ON "doc" ("name" COLLATE BINARY))");
}

// Conditions compare bytes, and so does an index for them; what is unique is told by the column.
TEST_F(IndexTest, UniqueIndexComparesAsItsColumn) {
    Run("DROP TABLE doc; CREATE TABLE doc (id INTEGER PRIMARY KEY, name TEXT COLLATE NOCASE)");
    EXPECT_EQ(Index({"name"}), R"(CREATE INDEX "doc_name" ON "doc" ("name" COLLATE BINARY))");
    const std::string strSql = Index({"name"}, true);
    EXPECT_EQ(strSql, R"(CREATE UNIQUE INDEX "doc_name_2" ON "doc" ("name"))");
    EXPECT_EQ(Index({"name"}, true), strSql);
    Run("INSERT INTO doc VALUES (1, 'a')");
    EXPECT_EQ(Create(R"({"id": 2, "name": "A"})").substr(0, 10), "duplicate:");
}

TEST_F(IndexTest, SameIndexOfATemporaryTableIsMadeOnce) {
    Run("CREATE TEMP TABLE doc (id INTEGER PRIMARY KEY, name TEXT)");
    const std::string strSql = Index({"name"});
    EXPECT_EQ(strSql, R"(CREATE INDEX "doc_name" ON "doc" ("name" COLLATE BINARY))");
    EXPECT_EQ(Index({"name"}), strSql);
    EXPECT_EQ(Rows("SELECT name FROM sqlite_temp_schema WHERE type = 'index'"), "doc_name");
}

// It goes where the table is, under a name that is free there, and is found there again.
TEST_F(IndexTest, TableOfAnAttachedDatabaseGetsItsIndexThere) {
    Run("DROP TABLE doc; ATTACH ':memory:' AS \"a \"\"b\"; ATTACH ':memory:' AS other;"
        "CREATE TABLE \"a \"\"b\".doc (id INTEGER PRIMARY KEY, name TEXT, size INT);"
        "CREATE TABLE other.doc (id INTEGER PRIMARY KEY, size INT);"
        "CREATE INDEX other.doc_size ON doc (size); CREATE TABLE t (x);"
        "CREATE UNIQUE INDEX doc_name ON t (x); CREATE TABLE other.doc_name_3 (x)");
    const std::string strSql = Index({"name"});
    EXPECT_EQ(strSql, R"(CREATE INDEX "a ""b"."doc_name_2" ON "doc" ("name" COLLATE BINARY))");
    EXPECT_EQ(Index({"name"}), strSql);
    EXPECT_EQ(Index({"name"}, true),
              R"(CREATE UNIQUE INDEX "a ""b"."doc_name_4" ON "doc" ("name" COLLATE BINARY))");
    EXPECT_EQ(Index({"size"}), R"(CREATE INDEX "a ""b"."doc_size_2" ON "doc" ("size"))");
    EXPECT_EQ(Rows("SELECT name FROM \"a \"\"b\".sqlite_schema WHERE type = 'index'"),
              "doc_name_2;doc_name_4;doc_size_2");
    EXPECT_EQ(Rows("SELECT name FROM sqlite_schema WHERE type = 'index'"), "doc_name");
    Run("DETACH other");
    EXPECT_EQ(Index({"name"}), strSql);
}

// What a statement says of another table of that name is no matter of this one.
TEST_F(IndexTest, ExplainSqlKnowsTheTableFromOthersOfItsName) {
    Run("ATTACH ':memory:' AS other; CREATE TABLE other.doc (id INTEGER PRIMARY KEY, size INT)");
    for (const char* szOfOther : {"SELECT * FROM other.doc WHERE size = 5",
                                  "SELECT * FROM \"Other\".doc AS o WHERE size = 5",
                                  "SELECT o.id FROM doc AS d, other.doc o WHERE d.id = 5"}) {
        EXPECT_EQ(ExplainSql(szOfOther).find("full-scan"), std::string::npos) << szOfOther;
    }
    for (const char* szOfThis :
         {"SELECT * FROM doc WHERE size = 5", "SELECT * FROM Main.doc WHERE size = 5",
          "SELECT * FROM main.doc AS d WHERE size = 5",
          "SELECT o.id FROM doc AS d, other.doc o WHERE o.id = d.size"}) {
        EXPECT_NE(ExplainSql(szOfThis).find("full-scan"), std::string::npos) << szOfThis;
    }
}

// In CREATE INDEX SQLite takes the name of no column for a text: one row would be all that such a
// unique index lets in.
TEST_F(IndexTest, ColumnThatIsNotThereIsNotIndexed) {
    Run("ALTER TABLE doc DROP COLUMN name; ALTER TABLE doc DROP COLUMN map");
    const std::string strRefused = "refused: cannot create an index on table \"doc\": ";
    EXPECT_EQ(Index({"name"}, true), strRefused + "no such column: doc.name");
    EXPECT_EQ(Index({"id", "map.a"}), strRefused + "no such column: doc.map");
    EXPECT_EQ(Rows("SELECT name FROM sqlite_schema WHERE type = 'index'"), "");
    Run("DROP TABLE doc");
    EXPECT_EQ(Index({"id"}), strRefused + "no such table: doc");
}

TEST_F(IndexTest, NameOfAnIndexIsNoneOfSqlitesOwn) {
    Open(R"({"SQLite": {"key": "id", "member": {"id": {"cpptype": "int"},
                                                "a": {"cpptype": "int"}}}})");
    const std::string strSql = Index({"a"});
    EXPECT_EQ(strSql, R"(CREATE INDEX "index_SQLite_a" ON "SQLite" ("a"))");
    EXPECT_EQ(Index({"a"}), strSql);
}

TEST_F(IndexTest, WhatCannotBeIndexed) {
    EXPECT_EQ(Index({}),
              "refused: cannot create an index on table \"doc\": the list names no member "
              "[bad-members ]");
    EXPECT_EQ(Index({"size", "nmae", "map.0"}),
              "refused: cannot create an index on table \"doc\": table \"doc\" has no member "
              "\"nmae\" (did you mean \"name\"?) [unknown-member /1] [number-in-path /2]");
    Run("INSERT INTO doc (id, size) VALUES (1, 5), (2, 5)");
    EXPECT_EQ(Index({"size"}, true),
              "duplicate: cannot create an index on table \"doc\": UNIQUE constraint failed: "
              "doc.size");
    Table Closed;
    EXPECT_EQ(Closed.CreateIndex({"a"}, false).Code(), StatusCode::kMisuse);
    EXPECT_EQ(Text(m_Table.ForEach(Query(),
                                   [&](const Json::Value&) {
                                       EXPECT_EQ(Index({"size"}).substr(0, 7), "misuse:");
                                       return true;
                                   })),
              "ok");
    Run("DROP TABLE doc");
    EXPECT_EQ(Index({"size"}),
              "refused: cannot create an index on table \"doc\": no such table: doc");
}

TEST_F(IndexTest, NoTermStandsTwice) {
    EXPECT_EQ(Index({"id", "size", "id", "map.a", "map", "map.b", "map.a"}),
              "refused: cannot create an index on table \"doc\": \"id\" is named twice "
              "[named-twice /2] [named-twice /6]");
}

TEST_F(IndexTest, UniqueIndexOnAPathIsKept) {
    EXPECT_EQ(Index({"map.a"}, true).substr(0, 19), "CREATE UNIQUE INDEX");
    EXPECT_EQ(Create(R"({"id": 1, "map": {"a": "x"}})"), R"({"id":1,"map":{"a":"x"}})");
    EXPECT_EQ(Create(R"({"id": 2, "map": {"a": "x"}})").substr(0, 10), "duplicate:");
    Run("INSERT INTO doc (id, map) VALUES (3, 'no JSON'), (4, 'no JSON')");
}

TEST_F(IndexTest, ExplainShowsStatementAndSteps) {
    Plan Found;
    EXPECT_EQ(Text(m_Table.Explain(
                  Parse(R"({"where": {"size": 5}, "sort": ["name"], "members": ["id"]})"), Found)),
              "ok");
    EXPECT_EQ(Found.strSql, R"(SELECT "doc"."id" FROM "doc" WHERE "doc"."size" IS ? )"
                            R"(ORDER BY "doc"."name" COLLATE BINARY, "doc"."id")");
    EXPECT_EQ(Lines(Found),
              "SCAN doc\nUSE TEMP B-TREE FOR ORDER BY\n"
              "full-scan /where: all records are looked at, which an index spares on "
              "\"size\"");
    EXPECT_EQ(Explain(Query()), "SCAN doc\n");
    EXPECT_EQ(ExplainWhere(R"({"id": 5})"), "SEARCH doc USING INTEGER PRIMARY KEY (rowid=?)\n");
    EXPECT_EQ(ExplainWhere(R"({"nmae": 5})"),
              "refused: cannot explain a query of table \"doc\": table \"doc\" has no member "
              "\"nmae\" (did you mean \"name\"?) [unknown-member /where/nmae]");
    Table Closed;
    EXPECT_EQ(Closed.Explain(Query(), Found).Code(), StatusCode::kMisuse);
    EXPECT_EQ(Closed.ExplainSql("SELECT 1", Found).Code(), StatusCode::kMisuse);
    Run("DROP TABLE doc");
    EXPECT_EQ(Explain(Query()),
              "refused: cannot explain a query of table \"doc\": no such table: "
              "doc");
}

// Where an index is advised, it is then used and the advice is gone.
TEST_F(IndexTest, AdvisedIndexIsUsed) {
    struct Case {
        const char* szWhere;
        const char* szMember;
    };
    const Case kCases[] = {
        {R"({"size": 5})", "size"},
        {R"({"size": null})", "size"},
        {R"({"name": {"$eq": "a"}})", "name"},
        {R"({"small": {"$lt": 5}})", "small"},
        {R"({"rate": {"$gte": 0.5}})", "rate"},
        {R"({"size": {"$between": [1, 2]}})", "size"},
        {R"({"name": {"$prefix": "a"}})", "name"},
        {R"({"done": true})", "done"},
        {R"({"size": {"$null": true}})", "size"},
        {R"({"any": "x"})", "any"},
        {R"({"any": 5})", "any"},
        {R"({"json": 5})", "json"},
        {R"({"tags": [1]})", "tags"},
        {R"({"map.a.b": 5})", "map.a.b"},
        {R"({"map.a": "x"})", "map.a"},
        {R"({"map.a": 0.1})", "map.a"},
        {R"({"map.a": null})", "map.a"},
        {R"({"map.a": {"$gt": 5}})", "map.a"},
        {R"({"map.a": {"$prefix": "x"}})", "map.a"},
        {R"({"tags[0]": "x"})", "tags[0]"},
    };
    for (const Case& Each : kCases) {
        const std::string strName = std::string("doc_") + Each.szMember;
        EXPECT_EQ(ExplainWhere(Each.szWhere), FullScan("\"" + std::string(Each.szMember) + "\""))
            << Each.szWhere;
        Index({Each.szMember});
        const std::string strPlan = ExplainWhere(Each.szWhere);
        EXPECT_EQ(strPlan.substr(0, strPlan.find(" (")), "SEARCH doc USING INDEX " + strName)
            << Each.szWhere << strPlan;
        EXPECT_EQ(strPlan.find("full-scan"), std::string::npos) << strPlan;
        Run("DROP INDEX \"" + strName + "\"");
    }
}

TEST_F(IndexTest, ListsAreFoundByAnIndex) {
    const std::string strList = "LIST SUBQUERY 1\n  SCAN json_each VIRTUAL TABLE INDEX 1:\n";
    EXPECT_EQ(ExplainWhere(R"({"size": {"$in": [1, 2]}})"),
              "SCAN doc\n" + strList + FullScan("\"size\"").substr(9));
    Index({"size"});
    Index({"name"});
    EXPECT_EQ(ExplainWhere(R"({"size": {"$in": [1, 2]}})"),
              "SEARCH doc USING INDEX doc_size (size=?)\n" + strList);
    EXPECT_EQ(ExplainWhere(R"({"$or": [{"size": 5}, {"name": "a"}]})"),
              "MULTI-INDEX OR\n"
              "  INDEX 1\n"
              "    SEARCH doc USING INDEX doc_size (size=?)\n"
              "  INDEX 2\n"
              "    SEARCH doc USING INDEX doc_name (name=?)\n");
}

TEST_F(IndexTest, AdviceNamesWhatEveryPartNeeds) {
    EXPECT_EQ(ExplainWhere(R"({"$or": [{"size": 5}, {"name": "a"}]})"),
              FullScan("\"size\", and one on \"name\""));
    EXPECT_EQ(ExplainWhere(R"({"size": {"$ne": 5}, "name": "a"})"), FullScan("\"name\""));
    EXPECT_EQ(ExplainWhere(R"({"$or": [{"size": 5}, {"rate": {"$ne": 1}}], "name": "a"})"),
              FullScan("\"name\""));
    EXPECT_EQ(ExplainWhere(R"({"$and": [{"$or": [{"size": 5}, {"name": {"$like": "a"}}]},
                                        {"rate": 1}]})"),
              FullScan("\"rate\""));
}

TEST_F(IndexTest, NoAdviceWhereNoIndexHelps) {
    for (const char* szWhere :
         {R"({"size": {"$ne": 5}})", R"({"size": {"$in": []}})", R"({"name": {"$like": "a%"}})",
          R"({"size": {"$null": false}})", R"({"$not": {"size": 5}})",
          R"({"$or": [{"size": 5}, {"size": {"$ne": 6}}]})", R"({"map.a": true})",
          R"({"tags[0]": false})", "{}"}) {
        EXPECT_EQ(ExplainWhere(szWhere), "SCAN doc\n") << szWhere;
    }
    for (const char* szWhere : {R"({"tags": {"$contains": 1}})", R"({"size": {"$nin": [5]}})"}) {
        const std::string strPlan = ExplainWhere(szWhere);
        EXPECT_EQ(strPlan.substr(0, 9), "SCAN doc\n");
        EXPECT_NE(strPlan.find("VIRTUAL TABLE INDEX"), std::string::npos) << strPlan;
        EXPECT_EQ(strPlan.find("full-scan"), std::string::npos) << strPlan;
    }
}

// A column that makes texts of numbers, or numbers of texts, has no index for their order.
TEST_F(IndexTest, AdviceKnowsWhatItsColumnConverts) {
    Run("DROP TABLE doc; CREATE TABLE doc (id INTEGER PRIMARY KEY, name NUMERIC, size TEXT,"
        " rate TEXT, done TEXT, small VARCHAR, tags INT, map INT, json INT, any TEXT COLLATE "
        "NOCASE)");
    m_Table = Table();
    EXPECT_EQ(Text(m_Table.Open(m_pDb, "doc", Parse(kDocs))), "ok");
    for (const char* szWhere :
         {R"({"size": {"$lt": 5}})", R"({"rate": {"$gte": 0.5}})", R"({"any": {"$gt": 5}})",
          R"({"small": {"$between": [1, 2]}})", R"({"name": {"$gt": "5"}})",
          R"({"name": {"$prefix": "1"}})", R"({"name": {"$between": ["1", "x"]}})"}) {
        EXPECT_EQ(ExplainWhere(szWhere), "SCAN doc\n") << szWhere;
    }
    struct Case {
        const char* szWhere;
        const char* szMember;
    };
    const Case kCases[] = {{R"({"size": 5})", "size"},
                           {R"({"any": {"$gt": "5"}})", "any"},
                           {R"({"any": 5})", "any"},
                           {R"({"any": {"$in": [5]}})", "any"},
                           {R"({"name": {"$gt": "x"}})", "name"},
                           {R"({"name": {"$prefix": "x"}})", "name"},
                           {R"({"map.a": {"$gt": 5}})", "map.a"},
                           {R"({"done": true})", "done"},
                           {R"({"tags": [1]})", "tags"},
                           {R"({"size": {"$in": [5]}})", "size"}};
    for (const Case& Each : kCases) {
        const std::string strAdvice = FullScan("\"" + std::string(Each.szMember) + "\"").substr(9);
        EXPECT_NE(ExplainWhere(Each.szWhere).find(strAdvice), std::string::npos) << Each.szWhere;
        const std::string strName = std::string("doc_") + Each.szMember;
        Index({Each.szMember});
        EXPECT_EQ(ExplainWhere(Each.szWhere).find("SEARCH doc USING INDEX " + strName), 0U)
            << Each.szWhere;
        Run("DROP INDEX \"" + strName + "\"");
    }
}

// What asks for the plan is a little longer than the statement, and than SQLite takes now.
TEST_F(IndexTest, PlanThatCannotBeReadIsAFailure) {
    const std::string strSql = "SELECT id, name, size FROM doc WHERE id = 5";
    sqlite3_limit(m_pDb, SQLITE_LIMIT_SQL_LENGTH, static_cast<int>(strSql.size()) + 2);
    Plan Found;
    EXPECT_EQ(Text(m_Table.ExplainSql(strSql, Found)),
              "refused: cannot explain a statement on table \"doc\": string or blob too big");
    EXPECT_EQ(Found.strSql, "");
}

TEST_F(IndexTest, ExplainSqlTakesOneStatement) {
    EXPECT_EQ(ExplainSql("SELECT * FROM doc WHERE id = 5"),
              "SEARCH doc USING INTEGER PRIMARY KEY (rowid=?)\n");
    EXPECT_EQ(ExplainSql("UPDATE doc SET size = 1 WHERE id = ? ; -- one"),
              "SEARCH doc USING INTEGER PRIMARY KEY (rowid=?)\n");
    EXPECT_EQ(ExplainSql("SELECT * FROM doc WHERE size = 5"), std::string("SCAN doc\n") + kMayScan);
    EXPECT_EQ(ExplainSql("SELECT * FROM doc"), "SCAN doc\n");
    EXPECT_EQ(ExplainSql("SELECT 'where' FROM doc -- where"), "SCAN doc\n");
    EXPECT_EQ(ExplainSql("SELECT 1 WHERE 1"), "SCAN CONSTANT ROW\n");
    EXPECT_EQ(ExplainSql("SELECT value FROM json_each('[1]') WHERE value = 1"),
              "SCAN json_each VIRTUAL TABLE INDEX 1:\n");
    EXPECT_EQ(ExplainSql("SELECT size FROM nosuch"),
              "refused: cannot explain a statement on table \"doc\": no such table: nosuch");
    const std::string strSeveral =
        "refused: cannot explain a statement on table \"doc\": more follows the first statement "
        "[not-one-statement ]";
    EXPECT_EQ(ExplainSql("SELECT 1; DROP TABLE doc"), strSeveral);
    EXPECT_EQ(ExplainSql("SELECT 1; nonsense"), strSeveral);
    EXPECT_EQ(ExplainSql(std::string("SELECT 1\0", 9)), strSeveral);
    for (const char* szSql : {"", " ", "-- nothing", ";"}) {
        EXPECT_EQ(ExplainSql(szSql),
                  "refused: cannot explain a statement on table \"doc\": the text holds no "
                  "statement [not-one-statement ]");
    }
    EXPECT_EQ(Rows("SELECT count(*) FROM doc"), "0");
}

TEST_F(IndexTest, ExplainSqlKnowsTheTableUnderAnyName) {
    Run("CREATE TABLE big (size INTEGER)");
    for (const char* szFrom :
         {"doc AS x", "doc x", "main.doc", "\"main\" . [doc] /* as y */ \"my doc\"", "Doc",
          "big, doc as\nbig2"}) {
        const std::string strPlan =
            ExplainSql(std::string("SELECT * FROM ") + szFrom + " WHERE name = 'a'");
        EXPECT_NE(strPlan.find(kMayScan), std::string::npos) << strPlan;
    }
    const std::string strUpdate = ExplainSql("UPDATE doc AS x SET size = 1 WHERE name = 'a'");
    EXPECT_EQ(strUpdate.find("SCAN x\n"), 0U) << strUpdate;
    EXPECT_NE(strUpdate.find(kMayScan), std::string::npos) << strUpdate;
    // Another table's scan is none of this one.
    for (const char* szSql : {"SELECT x.size FROM big AS x, doc WHERE doc.id = x.size",
                              "SELECT size AS doc FROM big AS x WHERE doc = 1"}) {
        const std::string strPlan = ExplainSql(szSql);
        EXPECT_EQ(strPlan.find("SCAN "), 0U) << strPlan;
        EXPECT_EQ(strPlan.find(kMayScan), std::string::npos) << strPlan;
    }
}

TEST_F(IndexTest, IndexThatSqliteMakesByItselfIsAdvised) {
    Run("CREATE TABLE big (x INTEGER);"
        "INSERT INTO big SELECT value FROM json_each('[1,2,3,4,5,6,7,8,9]')");
    const std::string strPlan = ExplainSql("SELECT * FROM big LEFT JOIN doc ON doc.size = big.x");
    EXPECT_NE(strPlan.find("USING AUTOMATIC"), std::string::npos) << strPlan;
    EXPECT_NE(strPlan.find(kMayScan), std::string::npos) << strPlan;
}

TEST(PlanStepsTest, StepsOfTheTableAsEachReleaseWritesThem) {
    for (const char* szStep : {"SCAN doc", "SCAN TABLE doc", "  SCAN doc", "SCAN doc AS d",
                               "SCAN TABLE doc LEFT-JOIN"}) {
        EXPECT_TRUE(vornjsondb::HasScan({"x", szStep}, {"doc"})) << szStep;
    }
    for (const char* szStep : {"SCAN docs", "SCAN TABLE docs", "SCAN doc USING INDEX i",
                               "SCAN TABLE doc USING COVERING "
                               "INDEX i",
                               "SCAN CONSTANT ROW", "SCAN json_each VIRTUAL TABLE INDEX 1:",
                               "SEARCH doc", "SCAN doc2"}) {
        EXPECT_FALSE(vornjsondb::HasScan({szStep}, {"doc"})) << szStep;
    }
    EXPECT_TRUE(vornjsondb::HasOwnIndex({"SEARCH TABLE doc USING AUTOMATIC COVERING INDEX (a=?)"},
                                        {"doc"}));
    EXPECT_TRUE(
        vornjsondb::HasOwnIndex({"SEARCH doc USING AUTOMATIC COVERING INDEX (a=?)"}, {"doc"}));
    EXPECT_FALSE(vornjsondb::HasOwnIndex({"SEARCH doc USING INDEX i (a=?)"}, {"doc"}));
    EXPECT_FALSE(
        vornjsondb::HasOwnIndex({"SEARCH docs USING AUTOMATIC COVERING INDEX (a=?)"}, {"doc"}));
}

TEST(SqlWordsTest, WordsOutsideOfQuotesAndComments) {
    for (const char* szSql :
         {"where", "SELECT 1 WHERE 1", "a\nWhere\nb", "'it''s' where", "(where)", "~where{",
          "--x\nwhere", "/* x */where/* y */", "[a]where"}) {
        EXPECT_TRUE(vornjsondb::HoldsWord(szSql, "WHERE")) << szSql;
    }
    for (const char* szSql : {"", "'where'", "\"where\"", "`where`", "[where]", "-- where",
                              "/* where", "wheres", "_where", "where1", "'it''s where'"}) {
        EXPECT_FALSE(vornjsondb::HoldsWord(szSql, "WHERE")) << szSql;
    }
}

}  // namespace VORN_JSON_DB
