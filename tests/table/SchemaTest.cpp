// What the table's own SQL makes of what is written: clauses and triggers that ignore a record,
// views, keys that the database fills in.

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

constexpr char kItems[] = R"({"item": {"key": "id", "member": {"id": {"cpptype": "int"},
    "name": {"cpptype": "string"}, "size": {"cpptype": "int"}}}})";

class SchemaTest : public TableTest {
  protected:
    void Meet(const std::string& strSql, const std::string& strDefinition = kItems) {
        Run(strSql);
        EXPECT_EQ(Text(m_Table.Open(m_pDb, "item", Parse(strDefinition))), "ok");
    }

    // A view whose triggers note what they do.
    void MeetView() {
        Meet(
            "CREATE TABLE base (id INTEGER PRIMARY KEY, name TEXT, size INT); CREATE TABLE log (a);"
            "CREATE VIEW item AS SELECT id, name, size FROM base;"
            "CREATE TRIGGER i INSTEAD OF INSERT ON item BEGIN INSERT INTO log VALUES ('insert');"
            " INSERT INTO base VALUES (new.id, new.name, new.size); END;"
            "CREATE TRIGGER u INSTEAD OF UPDATE ON item BEGIN INSERT INTO log VALUES ('update');"
            " UPDATE base SET name = new.name, size = new.size WHERE id = old.id; END;"
            "CREATE TRIGGER d INSTEAD OF DELETE ON item BEGIN DELETE FROM base WHERE id = old.id;"
            " END");
    }

    // Without asking for the stored row.
    std::string Put(const std::string& strRecord, OnDuplicate eOnDuplicate) {
        Written eWritten = Written::kReplaced;
        const Status Outcome = m_Table.Save(Parse(strRecord), eOnDuplicate, nullptr, &eWritten);
        return Text(Outcome) + (Outcome.Ok() && eWritten == Written::kSkipped ? " skipped" : "");
    }
};

constexpr char kIgnored[] =
    "constraint: cannot save a record in table \"item\": nothing was stored: a trigger or an ON "
    "CONFLICT clause of the table has ignored the record";

TEST_F(SchemaTest, RecordThatATriggerIgnoresIsNotStored) {
    Meet(
        "CREATE TABLE item (id INTEGER PRIMARY KEY, name TEXT, size INT);"
        "CREATE TRIGGER i BEFORE INSERT ON item WHEN new.size = 3 BEGIN SELECT RAISE(IGNORE); END;"
        "CREATE TRIGGER u BEFORE UPDATE ON item WHEN new.size = 4 BEGIN SELECT RAISE(IGNORE); END");
    EXPECT_EQ(Create(R"({"id": 1, "name": "a"})"), R"({"id":1,"name":"a"})");
    for (const OnDuplicate eMode :
         {OnDuplicate::kStop, OnDuplicate::kReplace, OnDuplicate::kUpsert}) {
        EXPECT_EQ(Save(R"({"id": 2, "size": 3})", eMode), kIgnored);
        EXPECT_EQ(Put(R"({"id": 2, "size": 3})", eMode), kIgnored);
    }
    EXPECT_EQ(Put(R"({"id": 2, "size": 3})", OnDuplicate::kSkip), "ok skipped");
    EXPECT_EQ(Save(R"({"id": 1, "size": 4})", OnDuplicate::kReplace), kIgnored);
    EXPECT_EQ(Save(R"({"id": 1, "size": 4})", OnDuplicate::kUpsert), kIgnored);
    EXPECT_EQ(Rows("SELECT * FROM item"), "1|a|NULL");
}

// It would be replaced or stored a second time.
TEST_F(SchemaTest, UpsertThatATriggerIgnoresInsertsNothing) {
    for (const char* szKey : {"PRIMARY KEY ON CONFLICT REPLACE", ""}) {
        Meet(std::string("DROP TABLE IF EXISTS item; CREATE TABLE item (id INT ") + szKey +
             ", name TEXT, size INT); INSERT INTO item VALUES (1, 'a', 2);"
             "CREATE TRIGGER u BEFORE UPDATE ON item BEGIN SELECT RAISE(IGNORE); END");
        EXPECT_EQ(Save(R"({"id": 1, "size": 4})", OnDuplicate::kUpsert), kIgnored);
        EXPECT_EQ(Rows("SELECT * FROM item"), "1|a|2");
    }
}

TEST_F(SchemaTest, RecordThatAClauseIgnoresIsNotStored) {
    Meet(
        "CREATE TABLE item (id INT PRIMARY KEY ON CONFLICT IGNORE,"
        " name TEXT UNIQUE ON CONFLICT IGNORE, size INT)");
    Create(R"({"id": 1, "name": "a"})");
    Create(R"({"id": 2, "name": "b"})");
    EXPECT_EQ(Create(R"({"id": 1, "name": "c"})"), kIgnored);
    EXPECT_EQ(Create(R"({"id": 3, "name": "a"})"), kIgnored);
    EXPECT_EQ(Save(R"({"id": 2, "name": "a"})", OnDuplicate::kUpsert), kIgnored);
    EXPECT_EQ(Rows("SELECT id, name FROM item"), "1|a;2|b");
}

TEST_F(SchemaTest, LoaderCountsWhatTheTableIgnoresAsBad) {
    Meet(
        "CREATE TABLE item (id INTEGER PRIMARY KEY, name TEXT, size INT);"
        "CREATE TRIGGER i BEFORE INSERT ON item WHEN new.size = 3 BEGIN SELECT RAISE(IGNORE); END");
    LoadOptions How;
    How.blGoOnAfterBad = true;
    Loader Into;
    EXPECT_EQ(Text(Into.Start(m_Table, How)), "ok");
    EXPECT_EQ(Text(Into.Add(Parse(R"({"id": 1})"))), "ok");
    EXPECT_EQ(Text(Into.Add(Parse(R"({"id": 2, "size": 3})"))),
              "constraint: cannot load record 2 into table \"item\": nothing was stored: a trigger "
              "or an ON CONFLICT clause of the table has ignored the record");
    EXPECT_EQ(Text(Into.Commit()), "ok");
    EXPECT_EQ(Into.Counts().nInserted, 1);
    EXPECT_EQ(Into.Counts().nFailed, 1);
    EXPECT_EQ(Rows("SELECT id FROM item"), "1");
}

constexpr char kFailing[] =
    "CREATE TABLE item (id INTEGER PRIMARY KEY, name TEXT UNIQUE ON CONFLICT FAIL, size INT);"
    "INSERT INTO item VALUES (1, 'a', 1), (2, 'b', 2), (3, 'c', 3);"
    "CREATE TEMP TRIGGER i AFTER INSERT ON item WHEN new.size = 9"
    " BEGIN SELECT RAISE(FAIL, 'nine'); END;"
    "CREATE TRIGGER d AFTER DELETE ON item WHEN old.size = 3"
    " BEGIN SELECT RAISE(FAIL, 'three'); END";

TEST_F(SchemaTest, WhatFailsHalfwayChangesNothing) {
    Meet(kFailing);
    std::int64_t nRows = 7;
    EXPECT_EQ(
        Text(m_Table.Update(Query().Where("id", Op::kGreater, 0), Parse(R"({"name": "x"})"),
                            &nRows)),
        "duplicate: cannot update records of table \"item\": UNIQUE constraint failed: item.name");
    EXPECT_EQ(Text(m_Table.Remove(Query().Where("id", Op::kGreater, 0), &nRows)),
              "constraint: cannot remove records from table \"item\": three");
    EXPECT_EQ(Text(m_Table.RemoveAll(&nRows)),
              "constraint: cannot remove all records from table \"item\": three");
    EXPECT_EQ(nRows, 7);
    EXPECT_EQ(Text(m_Table.Save(Parse(R"({"id": 4, "size": 9})"), OnDuplicate::kStop)),
              "constraint: cannot save a record in table \"item\": nine");
    EXPECT_EQ(Rows("SELECT * FROM item"), "1|a|1;2|b|2;3|c|3");
    EXPECT_EQ(Text(m_Table.Update(Query().Where("id", 1), Parse(R"({"name": "x"})"), &nRows)),
              "ok");
    EXPECT_EQ(nRows, 1);
}

TEST_F(SchemaTest, WhatFailsHalfwayInAnotherTableChangesNothing) {
    Meet(
        "CREATE TABLE log (half INT UNIQUE ON CONFLICT FAIL);"
        "CREATE TABLE item (id INTEGER PRIMARY KEY, name TEXT, size INT);"
        "INSERT INTO item VALUES (1, 'a', 1), (2, 'b', 2), (3, 'c', 3);"
        "CREATE TRIGGER u AFTER UPDATE ON item BEGIN INSERT INTO log VALUES (new.id / 2); END");
    EXPECT_EQ(
        Text(m_Table.Update(Query().Where("id", Op::kGreater, 0), Parse(R"({"name": "x"})"))),
        "duplicate: cannot update records of table \"item\": UNIQUE constraint failed: log.half");
    EXPECT_EQ(Rows("SELECT * FROM item"), "1|a|1;2|b|2;3|c|3");
    Meet(
        "DROP TRIGGER u; DROP TABLE log; PRAGMA foreign_keys = ON;"
        "CREATE TABLE part (id INT REFERENCES item(id) ON DELETE CASCADE);"
        "INSERT INTO part VALUES (1), (2); CREATE TRIGGER d AFTER DELETE ON part WHEN old.id = 2"
        " BEGIN SELECT RAISE(FAIL, 'two'); END");
    EXPECT_EQ(Text(m_Table.RemoveAll()),
              "constraint: cannot remove all records from table \"item\": two");
    EXPECT_EQ(Rows("SELECT id FROM item"), "1;2;3");
    EXPECT_EQ(Rows("SELECT id FROM part"), "1;2");
}

TEST_F(SchemaTest, BadRecordThatFailsHalfwayIsNotLoaded) {
    Meet(kFailing);
    LoadOptions How;
    How.blGoOnAfterBad = true;
    Loader Into;
    EXPECT_EQ(Text(Into.Start(m_Table, How)), "ok");
    EXPECT_EQ(Text(Into.Add(Parse(R"({"id": 4, "size": 9})"))),
              "constraint: cannot load record 1 into table \"item\": nine");
    EXPECT_EQ(Text(Into.Add(Parse(R"({"id": 5, "size": 5})"))), "ok");
    EXPECT_EQ(Text(Into.Commit()), "ok");
    EXPECT_EQ(Rows("SELECT id FROM item ORDER BY id"), "1;2;3;5");
}

// The key as it is stands for members that are not there.
TEST_F(SchemaTest, RecordOfNothingButItsKeyIsReplacedByItself) {
    Meet("CREATE TABLE item (id INT, name TEXT, PRIMARY KEY (id, name))",
         R"({"item": {"member": {"id": {"cpptype": "int"}, "name": {"cpptype": "string"}}}})");
    const char* szRecord = R"({"id": 1, "name": "a"})";
    EXPECT_EQ(Save(szRecord, OnDuplicate::kReplace), R"(inserted {"id":1,"name":"a"})");
    EXPECT_EQ(Save(szRecord, OnDuplicate::kReplace), R"(replaced {"id":1,"name":"a"})");
    EXPECT_EQ(Rows("SELECT id, name FROM item"), "1|a");
}

TEST_F(SchemaTest, ViewHandsOutWhatItsTriggersStored) {
    MeetView();
    EXPECT_EQ(Create(R"({"id": 1, "name": "a"})"), R"({"id":1,"name":"a"})");
    EXPECT_EQ(Put(R"({"name": "b"})", OnDuplicate::kStop), "ok");
    EXPECT_EQ(Create(R"({"name": "c"})"),
              "not-found: cannot save a record in table \"item\": the row cannot be told from "
              "others: it has no rowid, and the record no key");
    EXPECT_EQ(Rows("SELECT id, name FROM base"), "1|a;2|b");
    std::int64_t nRows = -1;
    EXPECT_EQ(Text(m_Table.Update(Query().Where("id", 1), Parse(R"({"size": 5})"), &nRows)), "ok");
    EXPECT_EQ(nRows, 0);
    EXPECT_EQ(Text(m_Table.Remove(Query().Where("id", 2))), "ok");
    EXPECT_EQ(Rows("SELECT * FROM base"), "1|a|5");
}

TEST_F(SchemaTest, UpsertOfAViewUpdatesOrInserts) {
    MeetView();
    EXPECT_EQ(Save(R"({"id": 1, "name": "a"})", OnDuplicate::kUpsert),
              R"(inserted {"id":1,"name":"a"})");
    EXPECT_EQ(Save(R"({"id": 1, "size": 2})", OnDuplicate::kUpsert),
              R"(updated {"id":1,"name":"a","size":2})");
    EXPECT_EQ(Rows("SELECT a FROM log"), "insert;update");
    EXPECT_EQ(Save(R"({"id": 1, "size": 2})", OnDuplicate::kReplace),
              "refused: cannot save a record in table \"item\": cannot UPSERT a view");
}

TEST_F(SchemaTest, ViewOfAnotherDatabaseIsOneToo) {
    Meet(
        "ATTACH ':memory:' AS other; CREATE TABLE other.base (id INTEGER PRIMARY KEY, name, size);"
        "CREATE VIEW other.item AS SELECT id, name, size FROM base;"
        "CREATE TRIGGER other.i INSTEAD OF INSERT ON item BEGIN"
        " INSERT INTO base VALUES (new.id, new.name, new.size); END");
    EXPECT_TRUE(m_Table.IsView());
    EXPECT_EQ(Create(R"({"id": 1, "name": "a"})"), R"({"id":1,"name":"a"})");
}

// What is learned when it is opened is not learned again, and SQLite counts nothing of a view.
TEST_F(SchemaTest, TableThatHasBecomeAViewSaysSoWhereItIsChanged) {
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY, name TEXT, size INT)");
    Create(R"({"id": 1, "name": "a"})");
    Run("ALTER TABLE item RENAME TO base; CREATE VIEW item AS SELECT * FROM base");
    const auto Says = [](const char* szDo, const char* szWhy) {
        return "refused: cannot " + std::string(szDo) + " table \"item\": " + szWhy;
    };
    const char* const kNoTrigger = "cannot modify item because it is a view";
    EXPECT_EQ(Create(R"({"id": 2})"), Says("save a record in", kNoTrigger));
    EXPECT_EQ(Text(m_Table.RemoveAll()), Says("remove all records from", kNoTrigger));
    Run("CREATE TABLE log (a);"
        "CREATE TRIGGER i INSTEAD OF INSERT ON item BEGIN"
        " INSERT INTO base VALUES (new.id, new.name, new.size); END;"
        "CREATE TRIGGER u INSTEAD OF UPDATE ON item BEGIN INSERT INTO log VALUES (new.id); END;"
        "CREATE TRIGGER d INSTEAD OF DELETE ON item BEGIN INSERT INTO log VALUES (old.id); END");
    const auto Misuse = [](const char* szDo) {
        return "misuse: cannot " + std::string(szDo) +
               " table \"item\": it has become a view, whose triggers may have done something: "
               "open it anew";
    };
    EXPECT_EQ(Create(R"({"id": 2})"), Misuse("save a record in"));
    EXPECT_EQ(Save(R"({"id": 1, "size": 2})", OnDuplicate::kUpsert), Misuse("save a record in"));
    for (const OnDuplicate eMode : {OnDuplicate::kSkip, OnDuplicate::kReplace}) {
        EXPECT_EQ(Save(R"({"id": 1})", eMode), Says("save a record in", "cannot UPSERT a view"));
    }
    EXPECT_EQ(Rows("SELECT * FROM base"), "1|a|NULL");
    EXPECT_EQ(Rows("SELECT * FROM log"), "");
    // A single statement is done when it is known.
    EXPECT_EQ(Put(R"({"id": 3})", OnDuplicate::kStop), Misuse("save a record in"));
    std::int64_t nRows = 7;
    EXPECT_EQ(Text(m_Table.Update(Query().Where("id", 1), Parse(R"({"size": 5})"), &nRows)),
              Misuse("update records of"));
    EXPECT_EQ(Text(m_Table.Remove(Query().Where("id", 1), &nRows)), Misuse("remove records from"));
    EXPECT_EQ(Text(m_Table.RemoveAll(&nRows)), Misuse("remove all records from"));
    EXPECT_EQ(nRows, 7);
    EXPECT_EQ(Text(m_Table.CreateIndex({"size"}, false)),
              "refused: cannot create an index on table \"item\": views may not be indexed");
    SyncReport Report;
    EXPECT_EQ(Text(m_Table.Sync(SyncMode::kChange, Report)), "ok");
    EXPECT_STREQ(Report.vecFindings[0].szCode, "view");
    // What reads has what the view has.
    EXPECT_EQ(Get("1"), R"({"id":1,"name":"a"})");
    std::int64_t nRecords = 0;
    EXPECT_EQ(Text(m_Table.Count(Query(), nRecords)), "ok");
    EXPECT_EQ(nRecords, 2);
}

TEST_F(SchemaTest, TableSaysWhetherItIsAView) {
    EXPECT_FALSE(m_Table.IsView());
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY)");
    EXPECT_FALSE(m_Table.IsView());
    Meet("CREATE TEMP VIEW Item AS SELECT 1 AS id");
    EXPECT_TRUE(m_Table.IsView());
    Meet("DROP VIEW item");
    EXPECT_FALSE(m_Table.IsView());
}

TEST_F(SchemaTest, KeyThatTheDatabaseFillsInIsNotReadBackWithoutARowid) {
    Meet("CREATE TABLE item (id INT PRIMARY KEY DEFAULT 7, name TEXT, size INT) WITHOUT ROWID");
    EXPECT_EQ(Create(R"({"id": 1, "name": "a"})"), R"({"id":1,"name":"a"})");
    EXPECT_EQ(Create(R"({"name": "b"})"),
              "not-found: cannot save a record in table \"item\": the row cannot be told from "
              "others: it has no rowid, and the record no key");
    EXPECT_EQ(Rows("SELECT id FROM item"), "1");
    EXPECT_EQ(Put(R"({"name": "b"})", OnDuplicate::kStop), "ok");
    EXPECT_EQ(Rows("SELECT id FROM item"), "1;7");
}

TEST_F(SchemaTest, TableWithoutAKeyThatIsKnownHandsOutNoOtherRow) {
    Meet(
        "CREATE TABLE item (id INT PRIMARY KEY DEFAULT 7, name TEXT) WITHOUT ROWID;"
        "INSERT INTO item VALUES (1, 'a')",
        R"({"item": {"member": {"name": {"cpptype": "string"}}}})");
    EXPECT_EQ(Create(R"({"name": "b"})"),
              "not-found: cannot save a record in table \"item\": the row cannot be told from "
              "others: it has no rowid, and the record no key");
}

}  // namespace

}  // namespace VORN_JSON_DB
