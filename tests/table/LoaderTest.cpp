// Many records: what is stored, what is counted, and what is not there after a failure.

#include <cmath>

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

class LoaderTest : public TableTest {
  protected:
    LoaderTest() { Open(); }

    LoadOptions With(OnDuplicate eOnDuplicate, bool blGoOn = false, std::int64_t nRows = 10000) {
        LoadOptions How;
        How.eOnDuplicate = eOnDuplicate;
        How.blGoOnAfterBad = blGoOn;
        How.nRowsPerTransaction = nRows;
        return How;
    }

    // A table g, whose member "twice" is generated.
    void OpenGenerated() {
        Options How;
        How.strSqlCreate = "CREATE TABLE g (id INTEGER PRIMARY KEY, twice INTEGER AS (2 * id))";
        Open(
            R"({"g": {"key": "id", "member": {"id": {"cpptype": "int"}, "twice": {"cpptype": "int"}}}})",
            How);
    }

    // What became of each record.
    std::string Add(Loader& Into, const std::vector<std::string>& vecRecords) {
        std::string strAll;
        for (const std::string& strRecord : vecRecords) {
            strAll += (strAll.empty() ? "" : "\n") + Text(Into.Add(Parse(strRecord)));
        }
        return strAll;
    }

    // records, inserted, replaced, skipped, failed, committed
    static std::string Counts(const Loader& Of) {
        const LoadCounts& Now = Of.Counts();
        std::string strAll;
        for (const std::int64_t n : {Now.nRecords, Now.nInserted, Now.nReplaced, Now.nSkipped,
                                     Now.nFailed, Now.nCommitted}) {
            strAll += (strAll.empty() ? "" : " ") + std::to_string(n);
        }
        return strAll;
    }

    std::string Stored() { return Rows("SELECT id, name, size, done, tags FROM task ORDER BY id"); }

    bool IsInTransaction() const { return sqlite3_get_autocommit(m_pDb) == 0; }
};

TEST_F(LoaderTest, RecordsOfAnyShapeAreStoredWithTheirDefaults) {
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    EXPECT_EQ("ok\nok\nok\nok\nok",
              Add(Into, {R"({"id": 1, "name": "a", "size": 1})",
                         R"({"id": 2, "name": "b", "size": 2})", R"({"id": 3, "tags": [1, "x"]})",
                         R"({"id": 4, "name": "c", "size": null})", R"({"done": true})"}));
    EXPECT_EQ("5 5 0 0 0 0", Counts(Into));
    EXPECT_TRUE(IsInTransaction());
    EXPECT_EQ("ok", Text(Into.Commit()));
    EXPECT_EQ("5 5 0 0 0 5", Counts(Into));
    EXPECT_FALSE(IsInTransaction());
    EXPECT_EQ(
        "1|a|1|0|NULL;2|b|2|0|NULL;3|NULL|NULL|0|[1,\"x\"];4|c|NULL|0|NULL;5|NULL|NULL|1|NULL",
        Stored());
}

TEST_F(LoaderTest, MembersAreSetInAnyOrderAndTheLastValueCounts) {
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    const int nId = Into.MemberIndex("id");
    const int nName = Into.MemberIndex("name");
    const int nSize = Into.MemberIndex("size");
    const int nDone = Into.MemberIndex("done");
    const int nTags = Into.MemberIndex("tags");
    EXPECT_EQ("id", m_Table.Members()[static_cast<size_t>(nId)]);
    EXPECT_EQ(-1, Into.MemberIndex("nmae"));
    std::string strName = "first";
    Into.SetText(nName, strName);
    strName = "gone ";
    Into.SetJson(nTags, "[ 1, {\"a\": \"\\u00e9\"} ]");
    Into.SetInteger(nId, 7);
    Into.SetText(nSize, "no number");
    Into.SetInteger(nSize, 5);
    Into.SetBoolean(nDone, true);
    EXPECT_EQ("ok", Text(Into.EndRecord()));
    Into.SetNull(nName);
    Into.SetInteger(nId, 8);
    Into.SetReal(nSize, 6.0);
    EXPECT_EQ("ok", Text(Into.EndRecord()));
    Into.SetJson(nId, "9");
    Into.SetJson(nName, "\"b\"");
    EXPECT_EQ("ok", Text(Into.EndRecord()));
    EXPECT_EQ("ok", Text(Into.Commit()));
    EXPECT_EQ("7|first|5|1|[1,{\"a\":\"\xc3\xa9\"}];8|NULL|6|0|NULL;9|b|NULL|0|NULL", Stored());
}

TEST_F(LoaderTest, WhatDoesNotFitIsToldWithTheNumberOfTheRecord) {
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table, With(OnDuplicate::kStop, true))));
    const int nId = Into.MemberIndex("id");
    const int nName = Into.MemberIndex("name");
    const int nTags = Into.MemberIndex("tags");
    const auto End = [&] { return Text(Into.EndRecord()); };
    const std::string strCannot = "refused: cannot load record ";
    EXPECT_EQ(strCannot + "1 into table \"task\": the record has no members [not-a-record ]",
              End());
    Into.SetInteger(nId, 1LL << 40);
    Into.SetText(nTags, "[1]");
    EXPECT_EQ(
        strCannot +
            "2 into table \"task\": member \"id\": 1099511627776 is out of range: expected is "
            "a whole number from -2147483648 to 2147483647 [out-of-range /id] [wrong-kind "
            "/tags]",
        End());
    Into.SetText(nName, std::string_view("a\0b", 3));
    EXPECT_EQ(strCannot + "3 into table \"task\": member \"name\": \"a" + std::string(1, '\0') +
                  "b\" could not be read back by a VornJsonDbApi, although it is a text "
                  "[old-cannot-read /name]",
              End());
    Into.SetReal(nId, std::nan(""));
    EXPECT_EQ(strCannot +
                  "4 into table \"task\": member \"id\": NaN is or holds NaN: expected is a whole "
                  "number from -2147483648 to 2147483647 [not-a-number /id]",
              End());
    Into.SetJson(nTags, "[1] x");
    EXPECT_EQ(strCannot +
                  "5 into table \"task\": member \"tags\": \"[1] x\" is no JSON "
                  "[wrong-kind /tags]",
              End());
    Into.SetJson(nTags, "{}");
    EXPECT_EQ(strCannot +
                  "6 into table \"task\": member \"tags\": an object of 0 is another kind "
                  "of value: expected is a list [wrong-kind /tags]",
              End());
    Into.SetJson(nTags, std::string(1001, '[') + std::string(1001, ']'));
    EXPECT_EQ(strCannot +
                  "7 into table \"task\": member \"tags\": the JSON is nested too deeply "
                  "[too-deep /tags]",
              End());
    Into.SetBlob(nName, "ab", 2);
    EXPECT_EQ(strCannot +
                  "8 into table \"task\": member \"name\": a blob is another kind of value: "
                  "expected is a text [wrong-kind /name]",
              End());
    Into.SetBoolean(nId, true);
    EXPECT_EQ(strCannot +
                  "9 into table \"task\": member \"id\": true is another kind of value: "
                  "expected is a whole number from -2147483648 to 2147483647 "
                  "[wrong-kind /id]",
              End());
    Into.SetInteger(nId, 1);
    Into.SetInteger(-1, 1);
    EXPECT_EQ(strCannot +
                  "10 into table \"task\": there is no member of number -1 "
                  "[unknown-member ]",
              End());
    Into.SetInteger(nId, 1);
    Into.Reject("line 11 ends in a quote");
    EXPECT_EQ(strCannot + "11 into table \"task\": line 11 ends in a quote [rejected ]", End());
    EXPECT_EQ(strCannot +
                  "12 into table \"task\": there is no member \"nmae\" (did you mean "
                  "\"name\"?) [unknown-member /nmae]",
              Add(Into, {R"({"id": 1, "nmae": "a"})"}));
    Into.SetInteger(nId, 1);
    EXPECT_EQ("ok", End());
    EXPECT_EQ("13 1 0 0 12 0", Counts(Into));
    EXPECT_EQ("ok", Text(Into.Commit()));
    EXPECT_EQ("1|NULL|NULL|0|NULL", Stored());
}

TEST_F(LoaderTest, NumbersOfNoMemberAreNothingWhereUnknownMembersAreIgnored) {
    Options How;
    How.blIgnoreUnknown = true;
    Open(kTasks, How);
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    Into.SetInteger(Into.MemberIndex("id"), 1);
    Into.SetText(Into.MemberIndex("nmae"), "a");
    EXPECT_EQ("ok", Text(Into.EndRecord()));
    EXPECT_EQ("ok", Add(Into, {R"({"id": 2, "nmae": "a"})"}));
}

TEST_F(LoaderTest, DuplicateIsStoppedSkippedReplacedOrChanged) {
    struct Case {
        OnDuplicate eOnDuplicate;
        const char* szOutcome;
        const char* szCounts;
        const char* szStored;
    };
    const Case kCases[] = {
        {OnDuplicate::kStop,
         "ok\nduplicate: cannot load record 2 into table \"task\": UNIQUE constraint failed: "
         "task.id "
         "(id = 1)\nok",
         "3 2 0 0 1 0", "1|a|5|1|NULL;2|c|NULL|0|NULL"},
        {OnDuplicate::kSkip, "ok\nok\nok", "3 1 0 2 0 0", "1|a|5|1|NULL;2|c|NULL|0|NULL"},
        {OnDuplicate::kReplace, "ok\nok\nok", "3 1 2 0 0 0", "1|b|NULL|0|NULL;2|c|NULL|0|NULL"},
        {OnDuplicate::kUpsert, "ok\nok\nok", "3 1 2 0 0 0", "1|b|5|1|NULL;2|c|NULL|0|NULL"},
    };
    for (const Case& Each : kCases) {
        Run("DELETE FROM task");
        const bool blStop = Each.eOnDuplicate == OnDuplicate::kStop;
        Run(blStop ? "SELECT 1" : "INSERT INTO task (id, name, size, done) VALUES (1, 'a', 5, 1)");
        Loader Into;
        EXPECT_EQ("ok", Text(Into.Start(m_Table, With(Each.eOnDuplicate, true))));
        EXPECT_EQ(Each.szOutcome,
                  Add(Into, {blStop ? R"({"id": 1, "name": "a", "size": 5, "done": true})"
                                    : R"({"id": 1, "name": "b"})",
                             R"({"id": 1, "name": "b"})", R"({"id": 2, "name": "c"})"}));
        EXPECT_EQ(Each.szCounts, Counts(Into));
        EXPECT_EQ("ok", Text(Into.Commit()));
        EXPECT_EQ(Each.szStored, Stored());
    }
}

TEST_F(LoaderTest, ModesOtherThanStopNeedTheKey) {
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table, With(OnDuplicate::kUpsert, true))));
    EXPECT_EQ(
        "refused: cannot load record 1 into table \"task\": the key's member \"id\" has no "
        "value [missing-key /id]",
        Add(Into, {R"({"name": "a"})"}));
    EXPECT_EQ(
        "refused: cannot load record 2 into table \"task\": the record has no members "
        "[not-a-record ]",
        Text(Into.EndRecord()));
    Run("CREATE TABLE keyless (a INTEGER)");
    Table Keyless;
    EXPECT_EQ("ok", Text(Keyless.Open(m_pDb, "keyless", Json::Value())));
    Loader Other;
    EXPECT_EQ(
        "refused: cannot load records into table \"keyless\": the table has no key that "
        "tells records apart [no-key ]",
        Text(Other.Start(Keyless, With(OnDuplicate::kSkip))));
    EXPECT_EQ("ok", Text(Other.Start(Keyless)));
    EXPECT_EQ("ok", Add(Other, {R"({"a": 1})"}));
}

TEST_F(LoaderTest, FirstBadRecordEndsTheLoadUnlessToldOtherwise) {
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table, With(OnDuplicate::kStop, false, 2))));
    const std::string strBad =
        "duplicate: cannot load record 4 into table \"task\": UNIQUE constraint failed: task.id "
        "(id = 1)";
    EXPECT_EQ("ok\nok\nok\n" + strBad + "\n" + strBad,
              Add(Into, {R"({"id": 1})", R"({"id": 2})", R"({"id": 3})", R"({"id": 1})",
                         R"({"id": 5})"}));
    EXPECT_EQ(strBad, Text(Into.EndRecord()));
    EXPECT_EQ(strBad, Text(Into.Commit()));
    EXPECT_EQ("4 2 0 0 1 2", Counts(Into));
    EXPECT_FALSE(IsInTransaction());
    EXPECT_EQ("1|NULL|NULL|0|NULL;2|NULL|NULL|0|NULL", Stored());
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    EXPECT_EQ("ok", Add(Into, {R"({"id": 5})"}));
}

TEST_F(LoaderTest, EachSoManyRowsAreCommittedOrAll) {
    {
        Loader Into;
        EXPECT_EQ("ok", Text(Into.Start(m_Table, With(OnDuplicate::kStop, false, 3))));
        EXPECT_EQ("ok\nok\nok\nok",
                  Add(Into, {R"({"id": 1})", R"({"id": 2})", R"({"id": 3})", R"({"id": 4})"}));
        EXPECT_EQ("4 4 0 0 0 3", Counts(Into));
    }
    EXPECT_EQ("1;2;3", Rows("SELECT id FROM task"));
    {
        Loader Into;
        EXPECT_EQ("ok", Text(Into.Start(m_Table, With(OnDuplicate::kStop, false, 0))));
        EXPECT_EQ("ok\nok", Add(Into, {R"({"id": 4})", R"({"id": 5})"}));
        EXPECT_EQ("2 2 0 0 0 0", Counts(Into));
    }
    EXPECT_EQ("1;2;3", Rows("SELECT id FROM task"));
}

TEST_F(LoaderTest, InTheCallersTransactionAllIsOneSavepoint) {
    Run("BEGIN; INSERT INTO task (id) VALUES (1)");
    {
        Loader Into;
        EXPECT_EQ("ok", Text(Into.Start(m_Table, With(OnDuplicate::kStop, false, 1))));
        EXPECT_EQ("ok\nok", Add(Into, {R"({"id": 2})", R"({"id": 3})"}));
        EXPECT_EQ("2 2 0 0 0 0", Counts(Into));
    }
    EXPECT_EQ("1", Rows("SELECT id FROM task"));
    {
        Loader Into;
        EXPECT_EQ("ok", Text(Into.Start(m_Table)));
        EXPECT_EQ("ok", Add(Into, {R"({"id": 2})"}));
        EXPECT_EQ("ok", Text(Into.Commit()));
        EXPECT_EQ("1 1 0 0 0 1", Counts(Into));
        EXPECT_EQ(
            "duplicate: cannot load record 2 into table \"task\": UNIQUE constraint failed: "
            "task.id (id = 2)",
            Add(Into, {R"({"id": 2})"}));
    }
    EXPECT_TRUE(IsInTransaction());
    Run("COMMIT");
    EXPECT_EQ("1;2", Rows("SELECT id FROM task"));
}

TEST_F(LoaderTest, TransactionThatATriggerOrTheCallerEndsEndsTheLoad) {
    Run("CREATE TRIGGER t BEFORE INSERT ON task WHEN new.id = 2 BEGIN SELECT raise(ROLLBACK, 'no "
        "two'); END");
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table, With(OnDuplicate::kStop, true))));
    const std::string strGone =
        "constraint: cannot load record 2 into table \"task\": no two; the transaction is undone";
    EXPECT_EQ("ok\n" + strGone + "\n" + strGone,
              Add(Into, {R"({"id": 1})", R"({"id": 2})", R"({"id": 3})"}));
    EXPECT_EQ("2 0 0 0 1 0", Counts(Into));
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    EXPECT_EQ("ok", Add(Into, {R"({"id": 1})"}));
    Run("ROLLBACK");
    EXPECT_EQ(
        "misuse: cannot load record 2 into table \"task\": its transaction was ended by "
        "others",
        Add(Into, {R"({"id": 3})"}));
    EXPECT_EQ("", Stored());
    Run("BEGIN");
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    EXPECT_EQ(
        "constraint: cannot load record 1 into table \"task\": no two; the transaction is undone",
        Add(Into, {R"({"id": 2})"}));
    EXPECT_NE(0, sqlite3_get_autocommit(m_pDb));
}

TEST_F(LoaderTest, RecordsOfTheTableCanBeWrittenAndReadBetween) {
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    EXPECT_EQ("ok", Add(Into, {R"({"id": 1})"}));
    EXPECT_EQ(R"({"done":false,"id":2})", Create(R"({"id": 2})"));
    EXPECT_EQ(R"({"done":false,"id":1})", Get("1"));
    EXPECT_EQ("ok", Add(Into, {R"({"id": 3})"}));
    EXPECT_EQ("ok", Text(Into.Commit()));
    EXPECT_EQ("1;2;3", Rows("SELECT id FROM task"));
}

TEST_F(LoaderTest, CallbackThatReadsCannotLoad) {
    Create(R"({"id": 1})");
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    Into.SetInteger(Into.MemberIndex("id"), 2);
    const std::string strMisuse =
        "misuse: cannot load records into table \"task\": a callback is reading from it";
    EXPECT_EQ("ok", Text(m_Table.ForEach(Query(), [&](const Json::Value& jRecord) {
                  EXPECT_EQ(strMisuse, Text(Into.Add(jRecord)));
                  EXPECT_EQ(strMisuse, Text(Into.EndRecord()));
                  EXPECT_EQ(strMisuse, Text(Into.Commit()));
                  Loader Other;
                  EXPECT_EQ(strMisuse, Text(Other.Start(m_Table)));
                  return true;
              })));
    EXPECT_EQ("ok", Text(Into.EndRecord()));
    EXPECT_EQ("1 1 0 0 0 0", Counts(Into));
}

TEST_F(LoaderTest, WithoutAStartNothingHappens) {
    Loader Into;
    const std::string strMisuse = "misuse: cannot load records: the loader is not started";
    EXPECT_EQ(-1, Into.MemberIndex("id"));
    Into.SetInteger(0, 1);
    Into.SetJson(0, "1");
    Into.Reject("x");
    EXPECT_EQ(strMisuse, Text(Into.EndRecord()));
    EXPECT_EQ(strMisuse, Text(Into.Add(Parse("{}"))));
    EXPECT_EQ(strMisuse, Text(Into.Commit()));
    EXPECT_EQ("0 0 0 0 0 0", Counts(Into));
    Table Closed;
    for (const OnDuplicate eMode : {OnDuplicate::kStop, OnDuplicate::kSkip}) {
        EXPECT_EQ("misuse: cannot load records into: the table is not open",
                  Text(Into.Start(Closed, {eMode})));
    }
}

TEST_F(LoaderTest, CommitWithoutARecordDoesNothing) {
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    EXPECT_EQ("ok", Text(Into.Commit()));
    EXPECT_EQ("0 0 0 0 0 0", Counts(Into));
}

TEST_F(LoaderTest, NullForAGeneratedMemberIsRefusedToo) {
    OpenGenerated();
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table, With(OnDuplicate::kStop, true))));
    Into.SetInteger(Into.MemberIndex("id"), 1);
    Into.SetNull(Into.MemberIndex("twice"));
    EXPECT_EQ(
        "refused: cannot load record 1 into table \"g\": member \"twice\" is computed by the "
        "table [generated /twice]",
        Text(Into.EndRecord()));
}

TEST_F(LoaderTest, KeyOfTwoMembersIsFoundByBoth) {
    Open(
        R"({"pair": {"key": ["b", "a"], "member": {"a": {"cpptype": "int"}, "b": {"cpptype": "int"},
                                                   "n": {"cpptype": "int"}}}})");
    Loader Into;
    for (const OnDuplicate eMode : {OnDuplicate::kReplace, OnDuplicate::kSkip}) {
        EXPECT_EQ("ok", Text(Into.Start(m_Table, With(eMode, false))));
        EXPECT_EQ("ok\nok", Add(Into, {R"({"a": 1, "b": 2, "n": 3})", R"({"a": 2, "b": 1})"}));
        EXPECT_EQ("ok", Text(Into.Commit()));
    }
    EXPECT_EQ("2 0 0 2 0 2", Counts(Into));
    EXPECT_EQ("1|2|3;2|1|NULL", Rows("SELECT a, b, n FROM pair ORDER BY a"));
    EXPECT_EQ(
        "duplicate: cannot save a record in table \"pair\": UNIQUE constraint failed: pair.b, "
        "pair.a (a = 1, b = 2)",
        Create(R"({"a": 1, "b": 2})"));
}

TEST_F(LoaderTest, GeneratedMembersAreNotWritten) {
    OpenGenerated();
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table, With(OnDuplicate::kReplace, true))));
    Into.SetInteger(Into.MemberIndex("id"), 1);
    Into.SetInteger(Into.MemberIndex("twice"), 2);
    EXPECT_EQ(
        "refused: cannot load record 1 into table \"g\": member \"twice\" is computed by the "
        "table [generated /twice]",
        Text(Into.EndRecord()));
    EXPECT_EQ("ok", Add(Into, {R"({"id": 1})"}));
    EXPECT_EQ("ok", Text(Into.Commit()));
    EXPECT_EQ("1|2", Rows("SELECT * FROM g"));
}

TEST_F(LoaderTest, BytesOfAnyKindAreStoredAsTheyAre) {
    Options How;
    How.blCompatible = false;
    Open(R"({"b": {"key": "id", "member": {"id": {"cpptype": "int"}, "any": {"cpptype": "any"},
             "text": {"cpptype": "string"}}}})",
         How);
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table)));
    const int nAny = Into.MemberIndex("any");
    const int nText = Into.MemberIndex("text");
    Into.SetBlob(nAny, "a\0\xff", 3);
    Into.SetText(nText, std::string_view("%n'\0\xff", 5));
    EXPECT_EQ("ok", Text(Into.EndRecord()));
    Into.SetBlob(nAny, nullptr, 0);
    Into.SetText(nText, {});
    EXPECT_EQ("ok", Text(Into.EndRecord()));
    const std::string strLong(1 << 20, 'x');
    Into.SetReal(nAny, 0.5);
    Into.SetText(nText, strLong);
    EXPECT_EQ("ok", Text(Into.EndRecord()));
    EXPECT_EQ("ok", Text(Into.Commit()));
    EXPECT_EQ("1|blob|6100FF|text|256E2700FF;2|blob||text|;3|real|302E35|text|" +
                  Rows("SELECT hex(text) FROM b WHERE id = 3"),
              Rows("SELECT id, typeof(any), hex(any), typeof(text), hex(text) FROM b"));
    EXPECT_EQ("1048576", Rows("SELECT length(text) FROM b WHERE id = 3"));
}

// A member's texts lie in one place, one after the other: nothing of the last one is left.
TEST_F(LoaderTest, ShortTextFollowsALongOneAndALongOneAShort) {
    Open(
        R"({"t": {"key": "id", "member": {"id": {"cpptype": "int"}, "list": {"cpptype": "Json::arrayValue"},
             "text": {"cpptype": "string"}}}})");
    Loader Into;
    EXPECT_EQ(Text(Into.Start(m_Table)), "ok");
    const int nList = Into.MemberIndex("list");
    const int nText = Into.MemberIndex("text");
    for (const size_t nLength : {3U, 400U, 2U, 0U, 40U}) {
        Into.SetText(nText, std::string(nLength, 'x') + "!");
        Into.SetText(nText, std::string(nLength, 'y'));
        Into.SetJson(nList, "[\"" + std::string(nLength, 'z') + "\"]");
        EXPECT_EQ(Text(Into.EndRecord()), "ok");
    }
    EXPECT_EQ(Text(Into.Add(Parse(R"({"list": [2.5], "text": "of a value"})"))), "ok");
    Into.SetText(nText, "between");
    Into.SetJson(nList, "[ 0.5 ]");
    EXPECT_EQ(Text(Into.EndRecord()), "ok");
    EXPECT_EQ(Text(Into.Commit()), "ok");
    EXPECT_EQ(Rows("SELECT length(CAST(text AS BLOB)), trim(text, 'y'), length(list), trim(list, "
                   "'[\"z]') FROM t"),
              "3||7|;400||404|;2||6|;0||4|;40||44|;10|of a value|5|2.5;7|between|5|0.5");
}

TEST_F(LoaderTest, FullDiskEndsTheLoad) {
    Run("PRAGMA max_page_count = 10");
    Loader Into;
    EXPECT_EQ("ok", Text(Into.Start(m_Table, With(OnDuplicate::kStop, true))));
    EXPECT_EQ("ok", Add(Into, {R"({"id": 1})"}));
    EXPECT_EQ("ok", Text(Into.Commit()));
    EXPECT_EQ("ok", Add(Into, {R"({"id": 2})"}));
    Into.SetText(Into.MemberIndex("name"), std::string(100000, 'x'));
    EXPECT_EQ(
        "disk-full: cannot load record 3 into table \"task\": database or disk is full; the "
        "transaction is undone",
        Text(Into.EndRecord()));
    EXPECT_EQ("3 1 0 0 0 1", Counts(Into));
    EXPECT_EQ("1", Rows("SELECT id FROM task"));
}

// The others look only when the transaction ends.
TEST_F(LoaderTest, CommitThatFailsUndoesWhatItWouldHaveStored) {
    Run("PRAGMA foreign_keys = ON; CREATE TABLE child (id INTEGER PRIMARY KEY, "
        "of INTEGER REFERENCES task (id) DEFERRABLE INITIALLY DEFERRED)");
    Table Child;
    EXPECT_EQ("ok", Text(Child.Open(m_pDb, "child", Json::Value())));
    {
        Loader Into;
        EXPECT_EQ("ok", Text(Into.Start(Child)));
        EXPECT_EQ("ok", Add(Into, {R"({"id": 1, "of": 1})"}));
        EXPECT_EQ(
            "constraint: cannot load records into table \"child\": cannot commit a transaction: "
            "FOREIGN KEY constraint failed",
            Text(Into.Commit()));
        EXPECT_EQ("1 0 0 0 0 0", Counts(Into));
        EXPECT_EQ("ok", Text(Into.Start(Child, With(OnDuplicate::kStop, true, 1))));
        EXPECT_EQ(
            "constraint: cannot load records into table \"child\": cannot commit a transaction: "
            "FOREIGN KEY constraint failed",
            Add(Into, {R"({"id": 1, "of": 1})"}));
    }
    EXPECT_FALSE(IsInTransaction());
    EXPECT_EQ("", Rows("SELECT id FROM child"));
}

}  // namespace

}  // namespace VORN_JSON_DB
