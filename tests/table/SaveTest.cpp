#include <vector>

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

using SaveTest = TableTest;

TEST_F(SaveTest, CreateHandsTheStoredRowBack) {
    Open();
    EXPECT_EQ(R"({"done":false,"id":1,"name":"a","tags":[1,"x"]})",
              Create(R"({"name": "a", "tags": [1, "x"]})"));
    EXPECT_EQ("1|a|NULL|0|[1,\"x\"]", Rows("SELECT id, name, size, done, tags FROM task"));
}

TEST_F(SaveTest, DuplicateTellsMemberAndValue) {
    Open();
    Create(R"({"id": 7, "name": "a"})");
    EXPECT_EQ(
        "duplicate: cannot save a record in table \"task\": UNIQUE constraint failed: task.id "
        "(id = 7)",
        Create(R"({"id": 7, "name": "b"})"));
    EXPECT_EQ("7|a", Rows("SELECT id, name FROM task"));
}

TEST_F(SaveTest, SkipHandsOutWhatIsThere) {
    Open();
    Create(R"({"id": 7, "name": "a"})");
    EXPECT_EQ(R"(skipped {"done":false,"id":7,"name":"a"})",
              Save(R"({"id": 7, "name": "b"})", OnDuplicate::kSkip));
    EXPECT_EQ(R"(inserted {"done":false,"id":8,"name":"b"})",
              Save(R"({"id": 8, "name": "b"})", OnDuplicate::kSkip));
}

TEST_F(SaveTest, ReplaceGivesAbsentMembersTheirDefaults) {
    Open();
    Create(R"({"id": 7, "name": "a", "done": true, "size": 3})");
    EXPECT_EQ(R"(replaced {"done":false,"id":7,"name":"b"})",
              Save(R"({"id": 7, "name": "b"})", OnDuplicate::kReplace));
    EXPECT_EQ(R"(inserted {"done":false,"id":8,"name":"b"})",
              Save(R"({"id": 8, "name": "b"})", OnDuplicate::kReplace));
}

TEST_F(SaveTest, UpsertChangesGivenMembersAlone) {
    Open();
    Create(R"({"id": 7, "name": "a", "done": true, "size": 3})");
    EXPECT_EQ(R"(updated {"done":true,"id":7,"name":"b","size":3})",
              Save(R"({"id": 7, "name": "b"})", OnDuplicate::kUpsert));
    EXPECT_EQ(R"(updated {"done":true,"id":7,"name":"b","size":3})",
              Save(R"({"id": 7})", OnDuplicate::kUpsert));
    EXPECT_EQ(R"(inserted {"done":false,"id":8,"name":"c"})",
              Save(R"({"id": 8, "name": "c"})", OnDuplicate::kUpsert));
}

TEST_F(SaveTest, UpsertOfAStoredRecordNeedsNoOtherMembers) {
    Open(R"({"t": {"key": "k", "member": {"k": {"cpptype": "string"},
             "a": {"cpptype": "string", "notNull": true}, "b": {"cpptype": "int"}}}})");
    Create(R"({"k": "x", "a": "1", "b": 1})");
    EXPECT_EQ(R"(updated {"a":"1","b":2,"k":"x"})",
              Save(R"({"k": "x", "b": 2})", OnDuplicate::kUpsert));
}

TEST_F(SaveTest, ReplaceLeavesARowAloneThatHasAnotherUniqueValue) {
    Open(R"({"t": {"key": "k", "member": {"k": {"cpptype": "int"},
             "mail": {"cpptype": "string", "unique": true}}}})");
    Create(R"({"k": 1, "mail": "a"})");
    Create(R"({"k": 2, "mail": "b"})");
    EXPECT_EQ(
        "duplicate: cannot save a record in table \"t\": UNIQUE constraint failed: t.mail "
        "(mail = \"a\")",
        Save(R"({"k": 2, "mail": "a"})", OnDuplicate::kReplace));
    EXPECT_EQ("1|a;2|b", Rows("SELECT k, mail FROM t ORDER BY k"));
}

TEST_F(SaveTest, UnknownMemberIsRefusedWithTheNearestName) {
    Open();
    EXPECT_EQ(
        "refused: cannot save a record in table \"task\": there is no member \"nmae\" (did you "
        "mean \"name\"?) [unknown-member /nmae]",
        Create(R"({"nmae": "a"})"));
}

// A name that differs in one byte, wherever, is another one, and so is a longer and a shorter one.
TEST_F(SaveTest, NamesAreToldApartByEachOfTheirBytes) {
    for (size_t nBytes = 1; nBytes <= 12; ++nBytes) {
        const std::string strName(nBytes, 'm');
        const std::string strTable = "t" + std::to_string(nBytes);
        Open(R"({")" + strTable + R"(": {"member": {")" + strName +
             R"(": {"cpptype": "int"}, "other": {"cpptype": "int"}}}})");
        std::vector<std::string> vecOthers{strName.substr(1), strName + "m"};
        for (size_t i = 0; i < nBytes; ++i) {
            for (const char c : {'l', 'n'}) {
                vecOthers.push_back(strName);
                vecOthers.back()[i] = c;
            }
        }
        for (const std::string& strOther : vecOthers) {
            Json::Value jRecord;
            jRecord[strOther] = 1;
            const Status Outcome = m_Table.Create(jRecord);
            ASSERT_EQ(Outcome.Findings().size(), 1u) << strOther;
            EXPECT_EQ(Outcome.Findings()[0].szCode, std::string("unknown-member"));
            EXPECT_EQ(Outcome.Findings()[0].strPath, "/" + strOther);
        }
        const std::string strRecord = R"({")" + strName + R"(":7})";
        EXPECT_EQ(Create(strRecord), strRecord);
        m_Table = Table();
    }
}

TEST_F(SaveTest, RecordThatIsNoneIsRefused) {
    Open();
    for (const char* szRecord : {"[]", "{}", "null", "5"}) {
        const std::string strText = Create(szRecord);
        EXPECT_NE(std::string::npos, strText.find("[not-a-record ]")) << strText;
    }
    EXPECT_EQ(
        "refused: cannot save a record in table \"task\": a list of 0 is no record: an object with "
        "members is expected [not-a-record ]",
        Create("[]"));
}

TEST_F(SaveTest, AllFaultsOfARecordAreTold) {
    Open();
    EXPECT_EQ(
        "refused: cannot save a record in table \"task\": there is no member \"a\" "
        "[unknown-member /a] [wrong-kind /id] [wrong-kind /tags] [unknown-member /z~1]",
        Create(R"({"a": 1, "id": "1", "tags": {}, "z/": 1})"));
    EXPECT_EQ("0", Rows("SELECT count(*) FROM task"));
}

TEST_F(SaveTest, UnknownMembersCanBeLeftOut) {
    Options How;
    How.blIgnoreUnknown = true;
    Open(kTasks, How);
    EXPECT_EQ(R"({"done":false,"id":1,"name":"a"})", Create(R"({"a": 1, "name": "a", "zzz": []})"));
    EXPECT_EQ(Create(R"({"a": 1})"),
              "refused: cannot save a record in table \"task\": the record has no members "
              "[not-a-record ]");
    EXPECT_EQ(Text(m_Table.Update(Query().Where("id", 1), Parse(R"({"a": 1})"))),
              "refused: cannot update records of table \"task\": the record has no members "
              "[not-a-record ]");
    EXPECT_EQ(Save(R"({"a": 1})", OnDuplicate::kUpsert),
              "refused: cannot save a record in table \"task\": the record has no members "
              "[not-a-record ]");
}

TEST_F(SaveTest, DefaultThatDoesNotFitIsRefusedWhenItIsNeeded) {
    Open(R"({"t": {"key": "id", "member": {"id": {"cpptype": "int"},
             "a": {"cpptype": "int", "cppDefaultValue": "x"}}}})");
    EXPECT_EQ(R"({"a":1,"id":1})", Create(R"({"id": 1, "a": 1})"));
    EXPECT_EQ(
        "refused: cannot save a record in table \"t\": member \"a\": \"x\" is another kind of "
        "value: expected is a whole number from -2147483648 to 2147483647 [wrong-kind /a]",
        Create(R"({"id": 2})"));
    EXPECT_EQ(R"(updated {"a":1,"id":1})", Save(R"({"id": 1})", OnDuplicate::kUpsert));
}

TEST_F(SaveTest, SavingNeedsTheKey) {
    Open();
    for (const OnDuplicate eMode :
         {OnDuplicate::kSkip, OnDuplicate::kReplace, OnDuplicate::kUpsert}) {
        EXPECT_EQ(
            "refused: cannot save a record in table \"task\": the key's member \"id\" has no value "
            "[missing-key /id]",
            Save(R"({"name": "a"})", eMode));
        EXPECT_EQ(
            "refused: cannot save a record in table \"task\": the key's member \"id\" has no value "
            "[missing-key /id]",
            Save(R"({"name": "a", "id": null})", eMode));
    }
    EXPECT_EQ(R"(inserted {"done":false,"id":1,"name":"a"})",
              Save(R"({"name": "a"})", OnDuplicate::kStop));
}

TEST_F(SaveTest, DuplicateTellsEveryMemberOfTheKey) {
    Options How;
    How.blCompatible = false;
    Open(R"({"k": {"key": ["i", "r", "t", "n"], "member": {"i": {"cpptype": "int"},
        "r": {"cpptype": "double"}, "t": {"cpptype": "string"}, "n": {"cpptype": "any"},
        "nn": {"cpptype": "int"}}}})",
         How);
    const std::string strRecord = R"({"i": 1, "r": 0.5, "t": "x", "n": "y", "nn": 1})";
    Create(strRecord);
    EXPECT_EQ(
        "duplicate: cannot save a record in table \"k\": UNIQUE constraint failed: k.i, k.r, k.t, "
        "k.n (i = 1, n = \"y\", r = 0.5, t = \"x\")",
        Create(strRecord));
}

TEST_F(SaveTest, TriggersBeforeAnInsertRunOnceForWhatReplaces) {
    Open();
    Run("CREATE TABLE log (id); CREATE TRIGGER t BEFORE INSERT ON task "
        "BEGIN INSERT INTO log VALUES (new.id); END");
    EXPECT_EQ(R"(inserted {"done":false,"id":1,"name":"a"})",
              Save(R"({"id": 1, "name": "a"})", OnDuplicate::kReplace));
    EXPECT_EQ(R"(replaced {"done":false,"id":1,"name":"b"})",
              Save(R"({"id": 1, "name": "b"})", OnDuplicate::kReplace));
    EXPECT_EQ("1;1", Rows("SELECT id FROM log"));
}

TEST_F(SaveTest, TriggersAreSeenInTheStoredRow) {
    Open();
    Run("CREATE TRIGGER t AFTER INSERT ON task BEGIN "
        "UPDATE task SET name = name || '!' WHERE id = new.id; END");
    EXPECT_EQ(R"({"done":false,"id":1,"name":"a!"})", Create(R"({"name": "a"})"));
}

TEST_F(SaveTest, RowThatATriggerRemovesIsNotFoundAndNothingIsStored) {
    Open();
    Run("CREATE TABLE log (a); CREATE TRIGGER t AFTER INSERT ON task BEGIN "
        "INSERT INTO log VALUES (1); DELETE FROM task; END");
    EXPECT_EQ(
        "not-found: cannot save a record in table \"task\": the row is gone once it is written",
        Create(R"({"name": "a"})"));
    EXPECT_EQ("0", Rows("SELECT count(*) FROM log"));
}

TEST_F(SaveTest, ConstraintsAreNoDuplicates) {
    Options How;
    How.strSqlCreate =
        "CREATE TABLE task (id INTEGER PRIMARY KEY, name TEXT NOT NULL, size INT CHECK (size > 0), "
        "done, tags)";
    Open(kTasks, How);
    for (const OnDuplicate eMode :
         {OnDuplicate::kStop, OnDuplicate::kSkip, OnDuplicate::kReplace, OnDuplicate::kUpsert}) {
        EXPECT_EQ(
            "constraint: cannot save a record in table \"task\": NOT NULL constraint failed: "
            "task.name",
            Save(R"({"id": 1})", eMode));
        EXPECT_EQ(
            "constraint: cannot save a record in table \"task\": CHECK constraint failed: size > 0",
            Save(R"({"id": 1, "name": "a", "size": 0})", eMode));
    }
    EXPECT_EQ("0", Rows("SELECT count(*) FROM task"));
}

TEST_F(SaveTest, WithoutAStoredRowNothingIsReadBack) {
    Open();
    const Json::Value jRecord = Parse(R"({"id": 1, "name": "a"})");
    EXPECT_EQ("ok", Text(m_Table.Create(jRecord)));
    EXPECT_EQ("ok", Text(m_Table.Save(jRecord, OnDuplicate::kSkip)));
    EXPECT_EQ("ok", Text(m_Table.Save(jRecord, OnDuplicate::kReplace)));
    EXPECT_EQ("ok", Text(m_Table.Save(jRecord, OnDuplicate::kUpsert)));
    EXPECT_EQ("1|a|0", Rows("SELECT id, name, done FROM task"));
}

TEST_F(SaveTest, InputMayBeTheOutput) {
    Open();
    Json::Value jRecord = Parse(R"({"name": "a"})");
    EXPECT_EQ("ok", Text(m_Table.Create(jRecord, &jRecord)));
    EXPECT_EQ(R"({"done":false,"id":1,"name":"a"})", Text(jRecord));
    EXPECT_EQ("duplicate", std::string(m_Table.Create(jRecord, &jRecord).CodeName()));
    EXPECT_EQ(R"({"done":false,"id":1,"name":"a"})", Text(jRecord));
}

TEST_F(SaveTest, FailureInsideOfATransactionLeavesTheRestOfIt) {
    Open();
    Transaction All;
    EXPECT_EQ("ok", Text(All.Begin(m_pDb)));
    Create(R"({"id": 1, "name": "a"})");
    Create(R"({"id": 1, "name": "b"})");
    Create(R"({"id": 2, "name": "c"})");
    EXPECT_EQ("ok", Text(All.Commit()));
    EXPECT_EQ("1|a;2|c", Rows("SELECT id, name FROM task ORDER BY id"));
}

TEST_F(SaveTest, TableWithoutRowidReadsBackByItsKey) {
    Options How;
    How.strSqlCreate = "CREATE TABLE w (k TEXT PRIMARY KEY, v INT) WITHOUT ROWID";
    Open(R"({"w": {"member": {"k": {"cpptype": "string"}, "v": {"cpptype": "int"}}}})", How);
    EXPECT_EQ(R"({"k":"a","v":1})", Create(R"({"k": "a", "v": 1})"));
    EXPECT_EQ(R"({"k":"a","v":1})", Get(R"("a")"));
}

TEST_F(SaveTest, ColumnCalledRowidIsNotTheRowid) {
    Options How;
    How.strSqlCreate = "CREATE TABLE r (rowid TEXT, oid INT)";
    Open(R"({"r": {"member": {"rowid": {"cpptype": "string"}, "oid": {"cpptype": "int"}}}})", How);
    EXPECT_EQ(R"({"oid":5,"rowid":"a"})", Create(R"({"rowid": "a", "oid": 5})"));
}

// A trigger on the key has nothing to do with a change of other members.
TEST_F(SaveTest, NumberOfNoModeIsRefused) {
    Open();
    for (const int nMode : {-1, 4, 99}) {
        const auto eMode = static_cast<OnDuplicate>(nMode);
        EXPECT_EQ(Text(m_Table.Save(Parse(R"({"id": 1})"), eMode)),
                  "misuse: cannot save a record in table \"task\": there is no OnDuplicate of this "
                  "number");
        Loader Load;
        EXPECT_EQ(Text(Load.Start(m_Table, {eMode})),
                  "misuse: cannot load records into table \"task\": there is no OnDuplicate of "
                  "this number");
        EXPECT_EQ(Text(Load.Commit()), "misuse: cannot load records: the loader is not started");
    }
    EXPECT_EQ(Rows("SELECT * FROM task"), "");
}

TEST_F(SaveTest, KeyThatTheTableHandsOutFitsItsMember) {
    Open();
    EXPECT_EQ(Create(R"({"id": 2147483646})"), R"({"done":false,"id":2147483646})");
    EXPECT_EQ(Create(R"({"name": "last"})"), R"({"done":false,"id":2147483647,"name":"last"})");
    const std::string strOut =
        "refused: cannot save a record in table \"task\": member \"id\": 2147483648, which the "
        "table "
        "hands out, is out of range: expected is a whole number from -2147483648 to 2147483647 "
        "[out-of-range /id]";
    EXPECT_EQ(Create(R"({"name": "beyond"})"), strOut);
    EXPECT_EQ(Create(R"({"id": null, "name": "beyond"})"), strOut);
    EXPECT_EQ(Text(m_Table.Create(Parse(R"({"name": "beyond"})"))), strOut);
    Run("BEGIN; UPDATE task SET name = 'x'");
    EXPECT_EQ(Text(m_Table.Create(Parse(R"({"name": "beyond"})"))), strOut);
    Run("COMMIT");
    EXPECT_EQ(Rows("SELECT id, name FROM task"), "2147483646|x;2147483647|x");
}

TEST_F(SaveTest, KeyBeyondItsMemberEndsALoad) {
    Open();
    LoadOptions How;
    How.blGoOnAfterBad = true;
    Loader Load;
    EXPECT_EQ(Text(Load.Start(m_Table, How)), "ok");
    EXPECT_EQ(Text(Load.Add(Parse(R"({"id": 2147483647})"))), "ok");
    const std::string strOut =
        "refused: cannot load record 2 into table \"task\": member \"id\": 2147483648, which the "
        "table hands out, is out of range: expected is a whole number from -2147483648 to "
        "2147483647 [out-of-range /id]";
    EXPECT_EQ(Text(Load.Add(Parse(R"({"name": "beyond"})"))), strOut);
    EXPECT_EQ(Text(Load.Commit()), strOut);
    EXPECT_EQ(Rows("SELECT * FROM task"), "");
}

// By which others may refer to it.
TEST_F(SaveTest, ReplacedRecordKeepsItsRowid) {
    Options How;
    How.strSqlCreate = "CREATE TABLE t (id INTEGER PRIMARY KEY, mail TEXT UNIQUE, size INT)";
    for (const char* szType : {"int", "long long"}) {
        Run("DROP TABLE IF EXISTS t");
        Open(std::string(R"({"t": {"key": "mail", "member": {"id": {"cpptype": ")") + szType +
                 R"("}, "mail": {"cpptype": "string"}, "size": {"cpptype": "int"}}}})",
             How);
        Create(R"({"id": 5, "mail": "a", "size": 1})");
        Create(R"({"id": 7, "mail": "b", "size": 1})");
        EXPECT_EQ(Save(R"({"mail": "a"})", OnDuplicate::kReplace),
                  R"(replaced {"id":5,"mail":"a"})");
        EXPECT_EQ(Save(R"({"id": 6, "mail": "a"})", OnDuplicate::kReplace),
                  R"(replaced {"id":6,"mail":"a"})");
        EXPECT_EQ(Save(R"({"mail": "c"})", OnDuplicate::kReplace),
                  R"(inserted {"id":8,"mail":"c"})");
        EXPECT_EQ(Rows("SELECT * FROM t"), "6|a|NULL;7|b|1;8|c|NULL");
    }
}

// The rowid that was handed out last is another table's.
TEST_F(SaveTest, RecordThatIsThereIsHandedNoKey) {
    Options How;
    How.strSqlCreate =
        "CREATE TABLE t (id INTEGER PRIMARY KEY, mail TEXT UNIQUE, size INT);"
        "CREATE TABLE other (id INTEGER PRIMARY KEY)";
    Open(R"({"t": {"key": "mail", "member": {"id": {"cpptype": "int"},
             "mail": {"cpptype": "string"}, "size": {"cpptype": "int"}}}})",
         How);
    Create(R"({"id": 1, "mail": "a", "size": 1})");
    Run("INSERT INTO other VALUES (1099511627776)");
    EXPECT_EQ(Save(R"({"mail": "a", "size": 2})", OnDuplicate::kSkip),
              R"(skipped {"id":1,"mail":"a","size":1})");
    EXPECT_EQ(Save(R"({"mail": "a", "size": 3})", OnDuplicate::kUpsert),
              R"(updated {"id":1,"mail":"a","size":3})");
    EXPECT_EQ(Save(R"({"mail": "a", "size": 4})", OnDuplicate::kReplace),
              R"(replaced {"id":1,"mail":"a","size":4})");
    LoadOptions Upsert;
    Upsert.eOnDuplicate = OnDuplicate::kUpsert;
    Loader Load;
    EXPECT_EQ(Text(Load.Start(m_Table, Upsert)), "ok");
    EXPECT_EQ(Text(Load.Add(Parse(R"({"mail": "a", "size": 5})"))), "ok");
    EXPECT_EQ(Text(Load.Add(Parse(R"({"mail": "b", "size": 6})"))), "ok");
    EXPECT_EQ(Text(Load.Commit()), "ok");
    EXPECT_EQ(Rows("SELECT * FROM t"), "1|a|5;2|b|6");
}

// A column of whole numbers that is the key is the rowid, whatever its member is.
TEST_F(SaveTest, KeyThatTheTableHandsOutIsNoFlag) {
    Open(
        R"({"t": {"key": "on", "member": {"name": {"cpptype": "string"}, "on": {"cpptype": "bool"}}}})");
    EXPECT_EQ(Create(R"({"name": "a"})"),
              "refused: cannot save a record in table \"t\": member \"on\": 1, which the table "
              "hands out, is another kind of value: expected is true or false [wrong-kind /on]");
    EXPECT_EQ(Create(R"({"name": "b", "on": true})"), R"({"name":"b","on":true})");
    EXPECT_EQ(Rows("SELECT * FROM t"), "b|1");
}

// The rowid is another number there.
TEST_F(SaveTest, RowidThatIsNotTheKeyMayBeGreater) {
    Options How;
    How.strSqlCreate = "CREATE TABLE t (id INT, name TEXT)";
    Open(R"({"t": {"key": "id", "member": {"id": {"cpptype": "int"},
        "name": {"cpptype": "string"}}}})",
         How);
    Run("INSERT INTO t (rowid) VALUES (3000000000)");
    EXPECT_EQ(Create(R"({"name": "a"})"), R"({"name":"a"})");
    How.strSqlCreate = "CREATE TABLE d (id INTEGER PRIMARY KEY)";
    How.blCompatible = false;
    Open(R"({"d": {"member": {"id": {"cpptype": "double"}}}})", How);
    Run("INSERT INTO d VALUES (3000000000)");
    EXPECT_EQ(Create(R"({"id": null})"), R"({"id":3000000001.0})");
}

TEST_F(SaveTest, UpsertLeavesTheKeyAlone) {
    Open();
    Run("INSERT INTO task (id, name) VALUES (1, 'a');"
        "CREATE TRIGGER t BEFORE UPDATE OF id ON task BEGIN SELECT RAISE(ABORT, 'key'); END");
    EXPECT_EQ(Save(R"({"id": 1, "name": "b"})", OnDuplicate::kUpsert),
              R"(updated {"done":false,"id":1,"name":"b"})");
}

}  // namespace

}  // namespace VORN_JSON_DB
