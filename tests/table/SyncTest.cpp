// A definition beside the real table: what Lint tells, and what Sync adds.

#include <sys/wait.h>
#include <unistd.h>

#include <cstdio>

#include "FakeTime.h"
#include "QueryFixture.h"

namespace VORN_JSON_DB {

namespace {

class SyncTest : public TableTest {
  protected:
    // Makes a real table and opens it by a definition of other members.
    void Meet(const std::string& strSql, const std::string& strEntry) {
        Run(strSql);
        m_Table = Table();
        Options How;
        How.blCompatible = false;
        EXPECT_EQ(Text(m_Table.Open(m_pDb, "item", Parse("{\"item\": " + strEntry + "}"), How)),
                  "ok");
    }

    std::string Lint() {
        FindingList vecFindings;
        const Status Outcome = m_Table.Lint(vecFindings);
        return Outcome.Ok() ? Text(vecFindings) : Text(Outcome);
    }

    // The statements, each on a line, and the findings.
    std::string Sync(SyncMode eMode = SyncMode::kChange) {
        SyncReport Report;
        const Status Outcome = m_Table.Sync(eMode, Report);
        if (!Outcome.Ok()) {
            EXPECT_TRUE(Report.vecStatements.empty() && Report.vecFindings.empty());
            return Text(Outcome);
        }
        std::string strText;
        for (const std::string& strSql : Report.vecStatements) {
            strText += strSql + "\n";
        }
        return strText + Text(Report.vecFindings);
    }

    std::string Schema() { return Rows("SELECT sql FROM sqlite_schema ORDER BY rowid"); }
};

}  // namespace

TEST_F(SyncTest, TableMadeFromTheDefinitionFits) {
    Open(R"({"item": {"key": "id", "member": {"id": {"cpptype": "int", "notNull": true},
        "b": {"cpptype": "bool", "notNull": true, "cppDefaultValue": true},
        "r": {"cpptype": "double"}, "j": {"cpptype": "Json::Value"}, "x": {"cpptype": "any"},
        "u": {"cpptype": "string", "unique": true}}}})");
    EXPECT_EQ(Lint(), "");
    EXPECT_EQ(Sync(), "");
    Run("DROP TABLE item");
    Meet("CREATE TABLE item (a VARCHAR(5), b TEXT NOT NULL, c INTEGER, d, PRIMARY KEY (b, a))",
         R"({"key": ["a", "b"], "member": {"a": {"cpptype": "string"},
             "b": {"cpptype": "string", "notNull": true}, "c": {"cpptype": "bool"},
             "d": {"cpptype": "double"}}})");
    EXPECT_EQ(Lint(), "");
}

TEST_F(SyncTest, LintTellsEveryDifference) {
    Meet(
        "CREATE TABLE item (id INTEGER PRIMARY KEY, Name TEXT, size TEXT, rate NUMERIC, any ANY,"
        " code TEXT, extra INTEGER, needed TEXT NOT NULL, flag INTEGER)",
        R"({"key": "id", "member": {"id": {"cpptype": "int"}, "name": {"cpptype": "string"},
             "size": {"cpptype": "int"}, "rate": {"cpptype": "double"}, "any": {"cpptype": "any"},
             "code": {"cpptype": "string", "notNull": true, "unique": true},
             "added": {"cpptype": "string"}, "flag": {"cpptype": "bool"}}})");
    EXPECT_EQ(
        Lint(),
        "missing-column /item/member/added: member \"added\" has no column; "
        "other-affinity /item/member/any: member \"any\" of type \"any\": its column, declared as "
        "\"ANY\", has numeric affinity and changes what is stored; "
        "nullable-column /item/member/code: member \"code\" is \"notNull\", and its column takes "
        "NULL; "
        "other-case /item/member/name: member \"name\" is the column \"Name\", which a "
        "VornJsonDbApi does not know by this name; "
        "other-affinity /item/member/rate: member \"rate\" of type \"double\": its column, "
        "declared as \"NUMERIC\", has numeric affinity and changes what is stored; "
        "other-affinity /item/member/size: member \"size\" of type \"int\": its column, declared "
        "as \"TEXT\", has text affinity and changes what is stored; "
        "extra-column /item/member: column \"extra\" is no member: a VornJsonDbApi cannot read "
        "back what it creates; "
        "extra-column /item/member: column \"needed\" is no member: a VornJsonDbApi cannot read "
        "back what it creates, and no record can be created without its value; "
        "missing-unique /item/member/code: member \"code\" is \"unique\", and several rows can "
        "have one value");
}

// In a STRICT table ANY keeps all as it is, and no column is without a type.
TEST_F(SyncTest, StrictTableHasAnyForAnything) {
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY, a any) STRICT",
         R"({"key": "id", "member": {"id": {"cpptype": "int"}, "a": {"cpptype": "any"},
             "b": {"cpptype": "any", "cppDefaultValue": "007"}, "c": {"cpptype": "string"}}})");
    EXPECT_EQ(Lint(),
              "missing-column /item/member/b: member \"b\" has no column; "
              "missing-column /item/member/c: member \"c\" has no column");
    EXPECT_EQ(Sync(),
              "ALTER TABLE \"item\" ADD COLUMN \"b\" ANY DEFAULT '007'\n"
              "ALTER TABLE \"item\" ADD COLUMN \"c\" TEXT\n");
    EXPECT_EQ(Create(R"({"id": 1, "a": "007"})"), R"({"a":"007","b":"007","id":1})");
    EXPECT_EQ(Lint(), "");
    // The one that a name finds counts.
    Run("CREATE TEMP TABLE item (id INTEGER PRIMARY KEY, a ANY, b, c TEXT)");
    EXPECT_EQ(Lint(),
              "other-affinity /item/member/a: member \"a\" of type \"any\": its column, declared "
              "as \"ANY\", has numeric affinity and changes what is stored");
}

TEST_F(SyncTest, OtherColumnsOfAStrictTableConvert) {
    Meet("CREATE TABLE item (a ANY, b INTEGER) STRICT",
         R"({"member": {"a": {"cpptype": "any"}, "b": {"cpptype": "string"}}})");
    EXPECT_EQ(Lint(),
              "other-affinity /item/member/b: member \"b\" of type \"string\": its column, "
              "declared as \"INTEGER\", has integer affinity and changes what is stored");
}

// What is not there is not STRICT, either.
TEST_F(SyncTest, SqliteWithoutAListOfTablesHasNoStrictOnes) {
    Run("CREATE TEMP TABLE pragma_table_list (hides TEXT)");
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY)",
         R"({"key": "id", "member": {"id": {"cpptype": "int"}, "a": {"cpptype": "any"}}})");
    EXPECT_EQ(Sync(), "ALTER TABLE \"item\" ADD COLUMN \"a\"\n");
}

TEST_F(SyncTest, LintComparesDefaultsByTheirValues) {
    Meet(
        "CREATE TABLE item (id INTEGER PRIMARY KEY, a INTEGER DEFAULT 2, b INTEGER DEFAULT (1 - 1),"
        " c TEXT DEFAULT 'it''s', d TEXT DEFAULT 'none', e TEXT DEFAULT '{\"a\": 1}',"
        " f TEXT DEFAULT '[', g REAL DEFAULT 1, h TEXT, i TEXT DEFAULT 'x', j TEXT DEFAULT bare,"
        " k TEXT DEFAULT '[1]')",
        R"({"key": "id", "member": {"id": {"cpptype": "int"},
             "a": {"cpptype": "int", "cppDefaultValue": 3},
             "b": {"cpptype": "bool", "cppDefaultValue": false},
             "c": {"cpptype": "string", "cppDefaultValue": "it's"},
             "d": {"cpptype": "string", "cppDefaultValue": "some"},
             "e": {"cpptype": "Json::objectValue", "cppDefaultValue": {"a": 1}},
             "f": {"cpptype": "Json::arrayValue", "cppDefaultValue": []},
             "g": {"cpptype": "double", "cppDefaultValue": 1.0},
             "h": {"cpptype": "string", "cppDefaultValue": "x"},
             "i": {"cpptype": "string"},
             "j": {"cpptype": "string", "cppDefaultValue": "other"},
             "k": {"cpptype": "Json::arrayValue", "cppDefaultValue": [2]}}})");
    EXPECT_EQ(
        Lint(),
        "other-default /item/member/a: member \"a\" has the default 3, and its column 2; "
        "other-default /item/member/d: member \"d\" has the default 'some', and its column "
        "'none'; "
        "other-default /item/member/f: member \"f\" has the default '[]', and its column '['; "
        "other-default /item/member/k: member \"k\" has the default '[2]', and its column "
        "'[1]'");
}

// The schema may come with a hostile file, and SQLite lets it call less than a statement may.
TEST_F(SyncTest, LintCallsNothingThatADefaultCalls) {
    int nCalls = 0;
    const auto fnCount = [](sqlite3_context* pContext, int, sqlite3_value**) {
        ++*static_cast<int*>(sqlite3_user_data(pContext));
        sqlite3_result_int(pContext, 1);
    };
    ASSERT_EQ(
        sqlite3_create_function(m_pDb, "spy", 1, SQLITE_UTF8, &nCalls, fnCount, nullptr, nullptr),
        SQLITE_OK);
    Meet(
        "CREATE TABLE item (id INTEGER PRIMARY KEY, a INTEGER DEFAULT (spy(1)),"
        " b TEXT DEFAULT ('x' || spy(1)), c TEXT DEFAULT (/*'*/ spy(1) /*'*/),"
        " d TEXT DEFAULT ('it''s' || -spy(1)), e TEXT DEFAULT ('s(py') )",
        R"({"key": "id", "member": {"id": {"cpptype": "int"},
             "a": {"cpptype": "int", "cppDefaultValue": 3},
             "b": {"cpptype": "string", "cppDefaultValue": "b"},
             "c": {"cpptype": "string", "cppDefaultValue": "c"},
             "d": {"cpptype": "string", "cppDefaultValue": "d"},
             "e": {"cpptype": "string", "cppDefaultValue": "s(hy"}}})");
    EXPECT_EQ(Lint(),
              "other-default /item/member/e: member \"e\" has the default 's(hy', and its column "
              "'s(py'");
    EXPECT_EQ(nCalls, 0);
}

TEST_F(SyncTest, ViewIsToldFromATable) {
    Meet("CREATE TABLE behind (a INTEGER); CREATE VIEW Item AS SELECT a FROM behind",
         R"({"key": "a", "member": {"a": {"cpptype": "int", "notNull": true, "unique": true},
             "b": {"cpptype": "int"}}})");
    const std::string strExpected =
        "missing-column /item/member/b: member \"b\" has no column; view /item: \"item\" is a view";
    EXPECT_EQ(Lint(), strExpected);
    EXPECT_EQ(Sync(), strExpected);
    m_Table = Table();
    Meet("CREATE TEMP TABLE item (a INTEGER PRIMARY KEY)",
         R"({"key": "a", "member": {"a": {"cpptype": "int"}}})");
    EXPECT_EQ(Lint(), "");
}

TEST_F(SyncTest, TablesWithoutARowidAndWithoutAKey) {
    Meet("CREATE TABLE item (id TEXT PRIMARY KEY) WITHOUT ROWID",
         R"({"key": "id", "member": {"id": {"cpptype": "string"}}})");
    EXPECT_EQ(Lint(),
              "without-rowid /item: the table has no rowid: a VornJsonDbApi cannot read "
              "back what it creates");
    m_Table = Table();
    Run("DROP TABLE item");
    Meet(
        "CREATE TABLE item (a INTEGER, b TEXT, c TEXT);"
        "CREATE UNIQUE INDEX part ON item (a, b) WHERE c;"
        "CREATE UNIQUE INDEX expression ON item (a, c || b);"
        "CREATE INDEX plain ON item (a, b); INSERT INTO item VALUES (1, 'x', NULL)",
        R"({"key": ["b", "a"], "member": {"a": {"cpptype": "int"}, "b": {"cpptype": "string"},
            "c": {"cpptype": "string"}}})");
    EXPECT_EQ(Lint(), "key-not-unique /item/key: the table can hold several rows with one key");
    EXPECT_EQ(Create(R"({"a": 1, "b": "x"})"), R"({"a":1,"b":"x"})");
    EXPECT_EQ(Sync().substr(0, 10), "duplicate:");
    Run("DELETE FROM item WHERE rowid = 2");
    EXPECT_EQ(Sync(),
              "CREATE UNIQUE INDEX \"item_b_a\" ON \"item\" "
              "(\"b\" COLLATE BINARY, \"a\")\n");
    EXPECT_EQ(Lint(), "");
    EXPECT_EQ(Create(R"({"a": 1, "b": "x"})").substr(0, 10), "duplicate:");
}

TEST_F(SyncTest, AddsColumnsAndUniqueIndexes) {
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY); INSERT INTO item VALUES (1)",
         R"({"key": "id", "member": {"id": {"cpptype": "int"},
             "name": {"cpptype": "string", "cppDefaultValue": "it's", "notNull": true},
             "mail": {"cpptype": "string", "unique": true},
             "rate": {"cpptype": "double", "cppDefaultValue": 0.5},
             "tags": {"cpptype": "Json::arrayValue", "cppDefaultValue": ["a"]},
             "need": {"cpptype": "int", "notNull": true}}})");
    const std::string strBefore = Schema();
    const std::string strExpected =
        "ALTER TABLE \"item\" ADD COLUMN \"mail\" TEXT\n"
        "ALTER TABLE \"item\" ADD COLUMN \"name\" TEXT NOT NULL DEFAULT 'it''s'\n"
        "ALTER TABLE \"item\" ADD COLUMN \"need\" INTEGER\n"
        "ALTER TABLE \"item\" ADD COLUMN \"rate\" REAL DEFAULT 0.5\n"
        "ALTER TABLE \"item\" ADD COLUMN \"tags\" TEXT DEFAULT '[\"a\"]'\n"
        "CREATE UNIQUE INDEX \"item_mail\" ON \"item\" (\"mail\" COLLATE BINARY)\n"
        "nullable-column /item/member/need: member \"need\" is \"notNull\" without a default, so "
        "that its new column takes NULL";
    EXPECT_EQ(Sync(SyncMode::kLook), strExpected);
    EXPECT_EQ(Schema(), strBefore);
    EXPECT_EQ(Sync(), strExpected);
    EXPECT_EQ(Get("1"), R"({"id":1,"name":"it's","rate":0.5,"tags":["a"]})");
    EXPECT_EQ(Create(R"({"id": 2, "mail": "m", "need": 3})"),
              R"({"id":2,"mail":"m","name":"it's","need":3,"rate":0.5,"tags":["a"]})");
    EXPECT_EQ(Create(R"({"id": 3, "mail": "m"})").substr(0, 10), "duplicate:");
    EXPECT_EQ(Sync(),
              "nullable-column /item/member/need: member \"need\" is \"notNull\", and its "
              "column takes NULL");
}

TEST_F(SyncTest, KeyThatIsUniqueByItselfGetsOneIndex) {
    Meet("CREATE TABLE item (id INTEGER)",
         R"({"key": "id", "member": {"id": {"cpptype": "int", "unique": true}}})");
    EXPECT_EQ(Sync(), "CREATE UNIQUE INDEX \"item_id\" ON \"item\" (\"id\")\n");
    EXPECT_EQ(Sync(), "");
}

TEST_F(SyncTest, ColumnsThatAreNoMembersAreToldByWhatTheyNeed) {
    Meet(
        "CREATE TABLE item (id INTEGER PRIMARY KEY, a INT NOT NULL, b INT NOT NULL DEFAULT 1, c "
        "INT)",
        R"({"key": "id", "member": {"id": {"cpptype": "int"}}})");
    const std::string strTold = "\" is no member: a VornJsonDbApi cannot read back what it creates";
    EXPECT_EQ(Lint(), "extra-column /item/member: column \"a" + strTold +
                          ", and no record can be created without its value; "
                          "extra-column /item/member: column \"b" +
                          strTold + "; extra-column /item/member: column \"c" + strTold);
}

TEST_F(SyncTest, RowsThatClashChangeNothing) {
    Meet(
        "CREATE TABLE item (id INTEGER PRIMARY KEY, a TEXT);"
        "INSERT INTO item VALUES (1, 'x'), (2, 'x')",
        R"({"key": "id", "member": {"id": {"cpptype": "int"}, "b": {"cpptype": "int"},
             "a": {"cpptype": "string", "unique": true}}})");
    const std::string strBefore = Schema();
    EXPECT_EQ(Sync(),
              "duplicate: cannot bring the definition into table \"item\": UNIQUE constraint "
              "failed: item.a");
    EXPECT_EQ(Schema(), strBefore);
    EXPECT_EQ(sqlite3_get_autocommit(m_pDb), 1);
}

// A new row is not found by what was the rowid before and is another column now.
TEST_F(SyncTest, MemberMayGetTheNameOfTheRowid) {
    Run("CREATE TABLE item (id INTEGER PRIMARY KEY)");
    EXPECT_EQ("ok", Text(m_Table.Open(m_pDb, "item", Parse(R"({"item": {"key": "id", "member": {
        "id": {"cpptype": "int"}, "rowid": {"cpptype": "int"}}}})"))));
    SyncReport Report;
    EXPECT_EQ("ok", Text(m_Table.Sync(SyncMode::kChange, Report)));
    EXPECT_EQ(R"({"id":1,"rowid":2})", Create(R"({"id": 1, "rowid": 2})"));
    EXPECT_EQ(R"({"id":2,"rowid":1})", Create(R"({"id": 2, "rowid": 1})"));
}

TEST_F(SyncTest, KeyIsNotAdded) {
    Meet("CREATE TABLE item (a INTEGER); INSERT INTO item VALUES (1)",
         R"({"key": "id", "member": {"id": {"cpptype": "int"}, "a": {"cpptype": "int"}}})");
    const std::string strFinding =
        "missing-key-column /item/member/id: member \"id\" of the key has no column, and the rows "
        "that are there would get no key";
    EXPECT_EQ(Lint(), strFinding);
    EXPECT_EQ(Sync(), strFinding);
    EXPECT_EQ(Schema(), "CREATE TABLE item (a INTEGER)");
}

// An index of the same name is another one, and an index of the same columns is this one.
TEST_F(SyncTest, NamesOfIndexesAreFree) {
    Meet(
        "CREATE TABLE item (id INTEGER PRIMARY KEY, a TEXT, b TEXT, a_b TEXT, c TEXT);"
        "CREATE TABLE ITEM_a (x); CREATE UNIQUE INDEX other ON item (C);"
        "INSERT INTO item VALUES (1, 'x', 'y', 'z', 'w')",
        R"({"key": ["a", "b"], "member": {"id": {"cpptype": "int"}, "b": {"cpptype": "string"},
             "a": {"cpptype": "string", "unique": true}, "c": {"cpptype": "string", "unique": true},
             "a_b": {"cpptype": "string", "unique": true}}})");
    EXPECT_EQ(Sync(),
              "CREATE UNIQUE INDEX \"item_a_2\" ON \"item\" (\"a\" COLLATE BINARY)\n"
              "CREATE UNIQUE INDEX \"item_a_b\" ON \"item\" (\"a_b\" COLLATE BINARY)\n"
              "CREATE UNIQUE INDEX \"item_a_b_2\" ON \"item\" "
              "(\"a\" COLLATE BINARY, \"b\" COLLATE BINARY)\n");
    EXPECT_EQ(Lint(), "");
}

// KeyCollationTest has tables that are made with an index.
TEST_F(SyncTest, KeyGetsAnIndexThatComparesAsItsColumn) {
    Meet("CREATE TABLE item (name TEXT COLLATE NOCASE, size INT)",
         R"({"key": "name", "member": {"name": {"cpptype": "string"},
             "size": {"cpptype": "int"}}})");
    EXPECT_EQ(Lint(), "key-not-unique /item/key: the table can hold several rows with one key");
    EXPECT_EQ(Sync(), "CREATE UNIQUE INDEX \"item_name\" ON \"item\" (\"name\")\n");
    EXPECT_EQ(Lint(), "");
    EXPECT_EQ(Create(R"({"name": "ABC", "size": 1})"), R"({"name":"ABC","size":1})");
    EXPECT_EQ(Create(R"({"name": "abc"})"),
              "duplicate: cannot save a record in table \"item\": UNIQUE constraint failed: "
              "item.name (name = \"abc\")");
    EXPECT_EQ(Save(R"({"name": "abc", "size": 3})", OnDuplicate::kReplace),
              R"(replaced {"name":"ABC","size":3})");
}

// By what is no key a record is not looked for.
TEST_F(SyncTest, UniqueMemberIsUniqueAsItsColumnCompares) {
    constexpr char kByMail[] = R"({"member": {"mail": {"cpptype": "string", "unique": true}}})";
    const std::string strCreate = "CREATE TABLE item (mail TEXT COLLATE NOCASE, UNIQUE (mail";
    for (const char* szCollate : {" COLLATE BINARY", " COLLATE RTRIM"}) {
        Meet(strCreate + szCollate + "))", kByMail);
        EXPECT_EQ(Sync(), "CREATE UNIQUE INDEX \"item_mail\" ON \"item\" (\"mail\")\n");
        Run("DROP TABLE item");
    }
    for (const char* szCollate : {"", " COLLATE nocase", "), UNIQUE (mail COLLATE BINARY"}) {
        Meet(strCreate + szCollate + "))", kByMail);
        EXPECT_EQ(Sync(), "") << szCollate;
        Run("DROP TABLE item");
    }
    Meet("CREATE TABLE item (mail TEXT, UNIQUE (mail COLLATE NOCASE))", kByMail);
    EXPECT_EQ(Sync(), "");
}

TEST_F(SyncTest, TableOfAnAttachedDatabaseGrowsThere) {
    Meet(
        "ATTACH ':memory:' AS other; CREATE TABLE other.item (id INTEGER);"
        "INSERT INTO item VALUES (1); CREATE TABLE item_id (x)",
        R"({"key": "id", "member": {"id": {"cpptype": "int"},
             "a": {"cpptype": "int", "unique": true}}})");
    EXPECT_EQ(Sync(),
              "ALTER TABLE \"item\" ADD COLUMN \"a\" INTEGER\n"
              "CREATE UNIQUE INDEX \"other\".\"item_a\" ON \"item\" (\"a\")\n"
              "CREATE UNIQUE INDEX \"other\".\"item_id_2\" ON \"item\" (\"id\")\n");
    EXPECT_EQ(Sync(), "");
    EXPECT_EQ(Get("1"), R"({"id":1})");
}

TEST_F(SyncTest, GoesWithTheCallersTransaction) {
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY); INSERT INTO item VALUES (1)",
         R"({"key": "id", "member": {"id": {"cpptype": "int"}, "a": {"cpptype": "int"}}})");
    Run("BEGIN");
    EXPECT_EQ(Sync(), "ALTER TABLE \"item\" ADD COLUMN \"a\" INTEGER\n");
    EXPECT_EQ(Get("1"), R"({"id":1})");
    Run("ROLLBACK");
    EXPECT_EQ(Schema(), "CREATE TABLE item (id INTEGER PRIMARY KEY)");
}

TEST_F(SyncTest, WhatCannotBeDoneAtAll) {
    EXPECT_EQ(Lint(), "misuse: cannot compare the definition with: the table is not open");
    EXPECT_EQ(Sync(), "misuse: cannot bring the definition into: the table is not open");
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY); INSERT INTO item VALUES (1)",
         R"({"key": "id", "member": {"id": {"cpptype": "int"}}})");
    EXPECT_EQ(Text(m_Table.ForEach(Query(),
                                   [&](const Json::Value&) {
                                       EXPECT_EQ(Sync().substr(0, 7), "misuse:");
                                       EXPECT_EQ(Sync(SyncMode::kLook), "");
                                       EXPECT_EQ(Lint(), "");
                                       return true;
                                   })),
              "ok");
    Run("DROP TABLE item");
    EXPECT_EQ(Lint(),
              "not-found: cannot compare the definition with table \"item\": there is no "
              "such table");
    EXPECT_EQ(Sync(),
              "not-found: cannot bring the definition into table \"item\": there is no "
              "such table");
}

namespace {

constexpr char kGrown[] = R"({"item": {"key": "id", "member": {"id": {"cpptype": "int"},
    "a": {"cpptype": "int", "cppDefaultValue": 5, "unique": true}}}})";

class SyncOfFileTest : public testing::Test {
  protected:
    SyncOfFileTest() {
        std::remove(m_strFile.c_str());
        OpenDb(m_pDb);
        Run(m_pDb, "CREATE TABLE item (id INTEGER PRIMARY KEY); INSERT INTO item VALUES (1)");
    }
    ~SyncOfFileTest() override {
        EXPECT_EQ(sqlite3_close(m_pDb), SQLITE_OK);
        std::remove(m_strFile.c_str());
        std::remove((m_strFile + "-journal").c_str());
    }
    SyncOfFileTest(const SyncOfFileTest&) = delete;
    SyncOfFileTest& operator=(const SyncOfFileTest&) = delete;

    void OpenDb(sqlite3*& pDb) const {
        EXPECT_EQ(sqlite3_open(m_strFile.c_str(), &pDb), SQLITE_OK);
    }
    static void Run(sqlite3* pDb, const char* szSql) {
        EXPECT_EQ(sqlite3_exec(pDb, szSql, nullptr, nullptr, nullptr), SQLITE_OK)
            << sqlite3_errmsg(pDb);
    }

    // "ok <number of statements>", or what is wrong.
    static std::string SyncBy(sqlite3* pDb) {
        Table Of;
        SyncReport Report;
        Status Outcome = Of.Open(pDb, "item", Parse(kGrown));
        if (Outcome.Ok()) {
            Outcome = Of.Sync(SyncMode::kChange, Report);
        }
        return Text(Outcome) + " " + std::to_string(Report.vecStatements.size());
    }

    std::string m_strFile = testing::TempDir() + "sync-" +
                            testing::UnitTest::GetInstance()->current_test_info()->name();
    sqlite3* m_pDb = nullptr;
};

}  // namespace

// The other one adds the column while this one waits for the lock.
TEST_F(SyncOfFileTest, ReadsTheTableAgainOnceItHasTheLock) {
    sqlite3* pOther = nullptr;
    OpenDb(pOther);
    Run(pOther, "BEGIN IMMEDIATE; ALTER TABLE item ADD COLUMN A INTEGER DEFAULT 5");
    const FakeTime Time([&](int nPause) {
        if (nPause == 2) {
            Run(pOther, "CREATE UNIQUE INDEX other ON item (a); COMMIT");
        }
    });
    EXPECT_EQ(SyncBy(m_pDb), "ok 0");
    EXPECT_EQ(sqlite3_close(pOther), SQLITE_OK);
}

// All is done again, because a COMMIT that fails undoes it.
TEST_F(SyncOfFileTest, EachStatementIsToldOnceHoweverOftenItRan) {
    sqlite3* pOther = nullptr;
    OpenDb(pOther);
    Run(pOther, "BEGIN; SELECT * FROM item");
    const FakeTime Time([&](int nPause) {
        if (nPause == 2) {
            Run(pOther, "COMMIT");
        }
    });
    EXPECT_EQ(SyncBy(m_pDb), "ok 2");
    EXPECT_EQ(sqlite3_close(pOther), SQLITE_OK);
}

TEST_F(SyncOfFileTest, OfSeveralProcessesOneChangesTheTable) {
    std::vector<pid_t> vecChildren;
    for (int i = 0; i < 4; ++i) {
        const pid_t nChild = fork();
        ASSERT_GE(nChild, 0);
        if (nChild == 0) {
            sqlite3* pOwn = nullptr;
            OpenDb(pOwn);
            const std::string strResult = SyncBy(pOwn);
            _exit(strResult == "ok 2" ? 2 : strResult == "ok 0" ? 0 : 1);
        }
        vecChildren.push_back(nChild);
    }
    int nStatements = 0;
    for (const pid_t nChild : vecChildren) {
        int nStatus = 0;
        ASSERT_EQ(waitpid(nChild, &nStatus, 0), nChild);
        ASSERT_TRUE(WIFEXITED(nStatus));
        EXPECT_NE(WEXITSTATUS(nStatus), 1);
        nStatements += WEXITSTATUS(nStatus);
    }
    EXPECT_EQ(nStatements, 2);
    EXPECT_EQ(SyncBy(m_pDb), "ok 0");
}

}  // namespace VORN_JSON_DB
