// What few callers meet, and each only once.

#include "../../table/SqlWords.h"
#include "QueryFixture.h"

namespace VORN_JSON_DB {

namespace {

class EdgesTest : public QueryTest {
  protected:
    // Another table, by another definition, in place of the one that is open.
    void Meet(const std::string& strSql, const std::string& strEntry) {
        Run(strSql);
        m_Table = Table();
        EXPECT_EQ(Text(m_Table.Open(m_pDb, "item", Parse("{\"item\": " + strEntry + "}"))), "ok");
    }

    std::string Lint() {
        FindingList vecFindings;
        const Status Outcome = m_Table.Lint(vecFindings);
        return Outcome.Ok() ? Text(vecFindings) : Text(Outcome);
    }

    std::string NameOfLastRow() {
        std::string strName = "no row";
        const auto fnRow = [&](const Row& Each) {
            strName = Each.Text(0);
            return true;
        };
        EXPECT_EQ(Text(m_Table.ForEachRow(Query().Members({"name"}), fnRow)), "ok");
        return strName;
    }
};

TEST_F(EdgesTest, InterruptedReadingTellsItAndStops) {
    for (int i = 1; i <= 3; ++i) {
        EXPECT_EQ(Text(m_Table.Create(Parse("{\"id\": " + std::to_string(i) + "}"))), "ok");
    }
    const std::string strInterrupted =
        "interrupted: cannot read records of table \"doc\": interrupted";
    int nCalls = 0;
    const auto fnInterrupt = [&](const auto&) {
        ++nCalls;
        sqlite3_interrupt(m_pDb);
        return true;
    };
    EXPECT_EQ(Text(m_Table.ForEach(Query(), fnInterrupt)), strInterrupted);
    EXPECT_EQ(nCalls, 1);
    EXPECT_EQ(Text(m_Table.ForEachRow(Query(), fnInterrupt)), strInterrupted);
    EXPECT_EQ(nCalls, 2);
    EXPECT_EQ(Ids(Query().Sort("id")), "1,2,3");
}

TEST_F(EdgesTest, EmptyBlobIsReadAsAnEmptyText) {
    Run("INSERT INTO doc (id, name) VALUES (1, x'')");
    EXPECT_EQ(Get("1"), R"({"id":1,"name":""})");
    EXPECT_EQ(NameOfLastRow(), "");
}

TEST_F(EdgesTest, TextOfANullIsEmpty) {
    Run("INSERT INTO doc (id) VALUES (1)");
    EXPECT_EQ(NameOfLastRow(), "");
}

TEST_F(EdgesTest, UnsignedNumbersAreNumbers) {
    Json::Value jRecord;
    jRecord["id"] = 1U;
    jRecord["size"] = Json::UInt64{7};
    EXPECT_EQ(Text(m_Table.Create(jRecord)), "ok");
    EXPECT_EQ(Ids(Query().Where("size", 7U)), "1");
}

TEST_F(EdgesTest, DuplicateByADefaultOfTheTableHasNoValueToTell) {
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY, code TEXT DEFAULT 'x' UNIQUE)",
         R"({"key": "id", "member": {"id": {"cpptype": "int"}, "code": {"cpptype": "string"}}})");
    EXPECT_EQ(Text(m_Table.Create(Parse(R"({"id": 1})"))), "ok");
    EXPECT_EQ(Text(m_Table.Create(Parse(R"({"id": 2})"))),
              "duplicate: cannot save a record in table \"item\": UNIQUE constraint failed: "
              "item.code");
}

TEST_F(EdgesTest, NumericColumnsKeepWholeNumbers) {
    Meet("CREATE TABLE item (a NUMERIC, b TEXT)",
         R"({"member": {"a": {"cpptype": "int"}, "b": {"cpptype": "bool"}}})");
    EXPECT_EQ(Lint(),
              "other-affinity /item/member/b: member \"b\" of type \"bool\": its column, declared "
              "as \"TEXT\", has text affinity and changes what is stored");
}

// By its type the column makes a number of what looks like one: of 2024, and of the end of the
// prefix 2024-, which is 2024. with a point.
TEST_F(EdgesTest, TextsInAColumnOfNumbersAreOrderedAsTexts) {
    for (const char* szType : {"string", "any"}) {
        Meet("DROP TABLE IF EXISTS item; CREATE TABLE item (id INTEGER PRIMARY KEY, day DATETIME)",
             std::string(R"({"member": {"id": {"cpptype": "int"}, "day": {"cpptype": ")") + szType +
                 "\"}}}");
        Run("INSERT INTO item (day) VALUES ('2023-05-05'), ('2024-01-01'), ('2024-12-31 23:59'),"
            " ('2025-02-02'), (' +'), (NULL), (2024)");
        const auto fnIds = [this](Op eOp, const char* szOperand) {
            return Ids(Query().Where("day", eOp, Parse(szOperand)).Sort("id"));
        };
        EXPECT_EQ(fnIds(Op::kPrefix, "\"2024\""), "2,3");
        EXPECT_EQ(fnIds(Op::kPrefix, "\"2024-\""), "2,3");
        EXPECT_EQ(fnIds(Op::kGreaterOrEqual, "\"2024\""), "2,3,4");
        EXPECT_EQ(fnIds(Op::kGreater, "\"2024\""), "2,3,4");
        EXPECT_EQ(fnIds(Op::kLess, "\" 2024\""), "5");
        EXPECT_EQ(fnIds(Op::kLess, "\" -1\""), "5");
        EXPECT_EQ(fnIds(Op::kLess, "\"-1\""), "5");
        EXPECT_EQ(fnIds(Op::kLessOrEqual, "\"2024e+0\""), "1,2,3,5");
        EXPECT_EQ(fnIds(Op::kLess, "\"2024-01-02\""), "1,2,5");
        EXPECT_EQ(fnIds(Op::kBetween, R"(["2024", "2025"])"), "2,3");
        EXPECT_EQ(fnIds(Op::kBetween, R"(["2024-01-02", "2025"])"), "3");
        EXPECT_EQ(fnIds(Op::kBetween, R"(["2023-06", "2024-06"])"), "2");
        EXPECT_EQ(fnIds(Op::kEqual, "\"2024\""), "7");
    }
    EXPECT_EQ(Ids(Query().Where("day", Op::kLess, 2025)), "7");
}

// The other way round: a number that is compared with a column of texts would become one.
TEST_F(EdgesTest, NumbersInAColumnOfTextsAreNone) {
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY, a TEXT)",
         R"({"member": {"id": {"cpptype": "int"}, "a": {"cpptype": "int"}}})");
    Run("INSERT INTO item (a) VALUES (7), (12), ('x')");
    for (const Op eOp : {Op::kLess, Op::kGreater}) {
        EXPECT_EQ(Ids(Query().Where("a", eOp, 8)), "");
    }
    EXPECT_EQ(Ids(Query().Where("a", Op::kBetween, Parse("[1, 8]"))), "");
    EXPECT_EQ(Ids(Query().Where("a", 12)), "2");
    Plan Found;
    EXPECT_EQ(Text(m_Table.Explain(Query().Where("a", Op::kLess, 8), Found)), "ok");
    EXPECT_EQ(Found.strSql, R"(SELECT "item"."a", "item"."id" FROM "item" WHERE +"item"."a" < ?)");
}

// They are found as by "$eq", and left out as by "$ne".
TEST_F(EdgesTest, ListsFindTheNumbersInAColumnOfTexts) {
    const std::pair<const char*, const char*> kTypes[] = {{"int", "(7), (12), (-1)"},
                                                          {"any", "(7), (12), (-1)"},
                                                          {"double", "(7.0), (12.0), (-1.5)"}};
    for (const char* szColumn : {"TEXT", "TEXT UNIQUE", "VARCHAR COLLATE NOCASE"}) {
        for (const auto& Type : kTypes) {
            Meet(std::string("DROP TABLE IF EXISTS item;"
                             "CREATE TABLE item (id INTEGER PRIMARY KEY, a ") +
                     szColumn + ")",
                 std::string(R"({"member": {"id": {"cpptype": "int"}, "a": {"cpptype": ")") +
                     Type.first + "\"}}}");
            Run(std::string("INSERT INTO item (a) VALUES ") + Type.second);
            const Json::Value jValues = std::string(Type.first) == "double"
                                            ? Parse("[12.0, 7.0, null]")
                                            : Parse("[12, 7, null]");
            EXPECT_EQ(Ids(Query().Where("a", jValues[0U])), "2");
            EXPECT_EQ(Ids(Query().Where("a", Op::kIn, jValues).Sort("id")), "1,2");
            std::int64_t nRows = 0;
            EXPECT_EQ(Text(m_Table.Remove(Query().Where("a", Op::kNotIn, jValues), &nRows)), "ok");
            EXPECT_EQ(Rows("SELECT id FROM item ORDER BY id"), "1;2");
        }
    }
}

TEST_F(EdgesTest, OrderOfDatesKeepsItsIndex) {
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY, day DATE)",
         R"({"member": {"id": {"cpptype": "int"}, "day": {"cpptype": "string"}}})");
    EXPECT_EQ(Text(m_Table.CreateIndex({"day"}, false)), "ok");
    Plan Found;
    EXPECT_EQ(Text(m_Table.Explain(Query().Where("day", Op::kGreater, "2024-01-01"), Found)), "ok");
    EXPECT_EQ(
        Found.strSql,
        R"(SELECT "item"."day", "item"."id" FROM "item" WHERE ("item"."day" COLLATE BINARY > ?)"
        R"( AND "item"."day" COLLATE BINARY < x''))");
    EXPECT_EQ(Found.vecSteps, std::vector<std::string>{
                                  "SEARCH item USING COVERING INDEX item_day (day>? AND day<?)"});
}

// Below a place in JSON there is no column to convert.
TEST_F(EdgesTest, PlacesInsideOfAJsonColumnAreOrderedAsTheyAre) {
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY, j JSON)",
         R"({"member": {"id": {"cpptype": "int"}, "j": {"cpptype": "Json::Value"}}})");
    Run("INSERT INTO item (j) VALUES ('{\"a\":\"2024-01\"}'), ('{\"a\":2024}')");
    Plan Found;
    const Query Which = Query().Where("j.a", Op::kPrefix, "2024");
    EXPECT_EQ(Text(m_Table.Explain(Which, Found)), "ok");
    EXPECT_EQ(Found.strSql.find('+'), std::string::npos);
    EXPECT_EQ(Ids(Which), "1");
}

TEST_F(EdgesTest, KeyThatIsNotTheRowidTakesNull) {
    Meet("CREATE TABLE item (id INT PRIMARY KEY)",
         R"({"key": "id", "member": {"id": {"cpptype": "int", "notNull": true}}})");
    EXPECT_EQ(Lint(),
              "nullable-column /item/member/id: member \"id\" is \"notNull\", and its column takes "
              "NULL");
    Meet("DROP TABLE item; CREATE TABLE item (id INTEGER PRIMARY KEY)",
         R"({"key": "id", "member": {"id": {"cpptype": "int", "notNull": true}}})");
    EXPECT_EQ(Lint(), "");
}

// The comparison of the two defaults is the one statement that is longer than SQLite takes now.
TEST_F(EdgesTest, DefaultThatCannotBeComparedEndsTheComparison) {
    const std::string strLong = "'" + std::string(2000, 'x') + "'";
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY, note TEXT DEFAULT " + strLong + ")",
         R"({"key": "id", "member": {"id": {"cpptype": "int"},
             "note": {"cpptype": "string", "cppDefaultValue": "x"}, "other": {"cpptype": "int"}}})");
    const int nLength = sqlite3_limit(m_pDb, SQLITE_LIMIT_SQL_LENGTH, 2000);
    EXPECT_EQ(Lint(),
              "refused: cannot compare the definition with table \"item\": string or blob too big");
    FindingList vecBefore(1);
    vecBefore[0].strMessage = "what was told before";
    EXPECT_FALSE(m_Table.Lint(vecBefore).Ok());
    EXPECT_EQ(vecBefore.size(), 1U);
    EXPECT_EQ(vecBefore[0].strMessage, "what was told before");
    sqlite3_limit(m_pDb, SQLITE_LIMIT_SQL_LENGTH, nLength);
    EXPECT_EQ(
        Lint(),
        "other-default /item/member/note: member \"note\" has the default 'x', and its column " +
            strLong + "; missing-column /item/member/other: member \"other\" has no column");
}

TEST_F(EdgesTest, AllDifferencesAreToldInOneOrder) {
    Meet("CREATE TABLE item (id INTEGER PRIMARY KEY, NOTE INTEGER, more TEXT) WITHOUT ROWID",
         R"({"key": "id", "member": {"id": {"cpptype": "int"},
             "note": {"cpptype": "string", "notNull": true}}})");
    EXPECT_EQ(Lint(),
              "other-case /item/member/note: member \"note\" is the column \"NOTE\", which a "
              "VornJsonDbApi does not know by this name; other-affinity /item/member/note: member "
              "\"note\" of type \"string\": its column, declared as \"INTEGER\", has integer "
              "affinity and changes what is stored; nullable-column /item/member/note: member "
              "\"note\" is \"notNull\", and its column takes NULL; extra-column /item/member: "
              "column \"more\" is no member: a VornJsonDbApi cannot read back what it creates; "
              "without-rowid /item: the table has no rowid: a VornJsonDbApi cannot read back what "
              "it creates");
}

TEST_F(EdgesTest, ColumnDeclaredAsTwoTypesIsABooleanFirst) {
    Run("CREATE TABLE item (id INTEGER PRIMARY KEY, odd JSON_BOOL)");
    Table Item;
    EXPECT_EQ(Text(Item.Open(m_pDb, "item", Json::Value())), "ok");
    EXPECT_EQ(Text(Item.Definition()["item"]["member"]["odd"]), R"({"cpptype":"bool"})");
}

// "-m." could be the path "." into "-m", which is none, or "m." the other way round.
TEST_F(EdgesTest, SortTermIsWhatTheTableHas) {
    Meet(R"(CREATE TABLE item (id INTEGER PRIMARY KEY, "-m" TEXT, "m." TEXT))",
         R"({"key": "id", "member": {"id": {"cpptype": "int"}, "-m": {"cpptype": "Json::Value"},
             "m.": {"cpptype": "string"}}})");
    Run("INSERT INTO item VALUES (1, '1', 'a'), (2, '2', 'c'), (3, '3', 'b')");
    EXPECT_EQ(Ids(Query().Sort("-m.")), "2,3,1");
}

TEST_F(EdgesTest, EmptyNameIsNoNameOfSql) {
    EXPECT_EQ(Text(LintDefinition("t", Parse(R"({"t": {"member": {"": {"cpptype": "string",
                  "cppDefaultValue": "x"}}}})"))),
              "old-name /t/member/: member \"\": a VornJsonDbApi writes names as they stand, and "
              "SQL reads another thing");
}

TEST_F(EdgesTest, JsonOfALoaderMayBeForNoMemberAndMayBeAText) {
    Loader Into;
    EXPECT_EQ(Text(Into.Start(m_Table)), "ok");
    Into.SetInteger(Into.MemberIndex("id"), 1);
    Into.SetJson(Into.MemberIndex("json"), "\"x\"");
    Into.SetBoolean(Into.MemberIndex("done"), false);
    EXPECT_EQ(Text(Into.EndRecord()), "ok");
    EXPECT_EQ(Text(Into.Commit()), "ok");
    Into.SetJson(99, "1");
    EXPECT_EQ(Text(Into.EndRecord()),
              "refused: cannot load record 2 into table \"doc\": there is no member of number 99 "
              "[unknown-member ]");
    EXPECT_EQ(Rows("SELECT id, json, done FROM doc"), R"(1|"x"|0)");
}

TEST_F(EdgesTest, ConnectionThatMayOnlyReadSaysSo) {
    EXPECT_EQ(Create(R"({"id": 1, "name": "a"})"), R"({"id":1,"name":"a"})");
    Run("PRAGMA query_only = ON");
    const std::string strWhy = ": attempt to write a readonly database";
    const std::string strSave = "read-only: cannot save a record in table \"doc\"" + strWhy;
    EXPECT_EQ(Text(m_Table.Create(Parse(R"({"id": 2})"))), strSave);
    for (const OnDuplicate eMode :
         {OnDuplicate::kStop, OnDuplicate::kSkip, OnDuplicate::kReplace, OnDuplicate::kUpsert}) {
        EXPECT_EQ(Save(R"({"id": 1, "name": "b"})", eMode), strSave);
    }
    const Query One = Query().Where("id", 1);
    EXPECT_EQ(Text(m_Table.Update(One, Parse(R"({"name": "b"})"))),
              "read-only: cannot update records of table \"doc\"" + strWhy);
    EXPECT_EQ(Text(m_Table.Remove(One)),
              "read-only: cannot remove records from table \"doc\"" + strWhy);
    EXPECT_EQ(Text(m_Table.RemoveAll()),
              "read-only: cannot remove all records from table \"doc\"" + strWhy);
    EXPECT_EQ(Text(m_Table.CreateIndex({"name"}, false)),
              "read-only: cannot create an index on table \"doc\"" + strWhy);
    SyncReport Report;
    EXPECT_EQ(Text(m_Table.Sync(SyncMode::kChange, Report)),
              "read-only: cannot bring the definition into table \"doc\"" + strWhy);
    EXPECT_EQ(Text(m_Table.Sync(SyncMode::kLook, Report)), "ok");
    Loader Into;
    EXPECT_EQ(Text(Into.Start(m_Table)), "ok");
    EXPECT_EQ(
        Text(Into.Add(Parse(R"({"id": 2})"))),
        "read-only: cannot load record 1 into table \"doc\": cannot begin a transaction" + strWhy);
    Transaction All;
    EXPECT_EQ(Text(All.Begin(m_pDb)), "read-only: cannot begin a transaction" + strWhy);
    EXPECT_EQ(Text(All.Begin(m_pDb, Transaction::Mode::kDeferred)), "ok");
    EXPECT_EQ(Get("1"), R"({"id":1,"name":"a"})");
    EXPECT_EQ(Text(All.Commit()), "ok");
    EXPECT_EQ(Lint(), "");
}

// JsonCpp makes three bytes of a low surrogate, and no JSON of a high one that none follows.
TEST_F(EdgesTest, HalvesOfSurrogatePairsAreTexts) {
    const Json::Value jRecord =
        Parse(R"({"id": 1, "name": "a\udc00", "map": {"k\udfff": "\udc00"}, "tags": ["\udc01"]})");
    EXPECT_EQ(jRecord["name"].asString(), "a\xed\xb0\x80");
    Json::Value jStored;
    EXPECT_EQ(Text(m_Table.Create(jRecord, &jStored)), "ok");
    EXPECT_EQ(jStored, jRecord);
    EXPECT_EQ(Ids(Query().Where("name", jRecord["name"])), "1");
    EXPECT_EQ(Ids(Query().Where("map", jRecord["map"])), "1");
    EXPECT_EQ(Ids(Query().Where("map.k\xed\xbf\xbf", "\xed\xb0\x80")), "1");
    EXPECT_EQ(Ids(Query().Where("tags", Op::kContains, jRecord["tags"][0])), "1");
    Loader Into;
    EXPECT_EQ(Text(Into.Start(m_Table, {OnDuplicate::kUpsert})), "ok");
    Into.SetInteger(Into.MemberIndex("id"), 1);
    Into.SetJson(Into.MemberIndex("tags"), R"(["\udc02"])");
    EXPECT_EQ(Text(Into.EndRecord()), "ok");
    EXPECT_EQ(Text(Into.Commit()), "ok");
    EXPECT_EQ(Rows("SELECT tags FROM doc"), "[\"\xed\xb0\x82\"]");
    Into.SetJson(Into.MemberIndex("tags"), R"(["\ud800"])");
    EXPECT_EQ(Text(Into.EndRecord()),
              "refused: cannot load record 2 into table \"doc\": member \"tags\": "
              R"("[""\ud800""]" is no JSON [wrong-kind /tags])");
}

TEST_F(EdgesTest, WordsGoOnInUnderscoresDollarsAndOtherAlphabets) {
    for (const char* szSql : {"where_", "where$", "where\xc3\xa9", "$where", "9where"}) {
        EXPECT_FALSE(vornjsondb::HoldsWord(szSql, "WHERE")) << szSql;
    }
}

}  // namespace

}  // namespace VORN_JSON_DB
