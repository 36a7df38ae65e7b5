// Keys whose unique index compares texts in another way than their column does.

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

constexpr char kByName[] = R"({"item": {"key": "name", "member": {"name": {"cpptype": "string"},
    "size": {"cpptype": "int"}}}})";

class KeyCollationTest : public TableTest {
  protected:
    void Meet(const std::string& strSql, const std::string& strDefinition = kByName) {
        m_Table = Table();
        Run("DROP TABLE IF EXISTS item; CREATE TABLE item " + strSql);
        ASSERT_EQ(Text(m_Table.Open(m_pDb, "item", Parse(strDefinition))), "ok") << strSql;
    }

    // What Lint finds and Sync would run.
    std::string Compared() {
        FindingList vecFindings;
        EXPECT_EQ(Text(m_Table.Lint(vecFindings)), "ok");
        SyncReport Report;
        EXPECT_EQ(Text(m_Table.Sync(SyncMode::kLook, Report)), "ok");
        std::string strAll;
        for (const Finding& Each : vecFindings) {
            strAll += Each.szCode;
        }
        for (const std::string& strSql : Report.vecStatements) {
            strAll += strSql;
        }
        return strAll;
    }
};

constexpr char kDuplicate[] =
    "duplicate: cannot save a record in table \"item\": UNIQUE constraint failed: item.name (name "
    "= \"abc\")";
constexpr char kNoSuch[] =
    "not-found: cannot get a record from table \"item\": no record has the key \"abc\"";

// Of two rows, so that the one that is written is not the last one that was inserted.
TEST_F(KeyCollationTest, LetterCaseThatTheIndexDoesNotTellApartIsTheSameKey) {
    for (const char* szSql :
         {"(name TEXT, size INTEGER); CREATE UNIQUE INDEX item_u ON item (name COLLATE NOCASE)",
          "(name TEXT, size INTEGER, UNIQUE (name COLLATE NOCASE))",
          "(name TEXT, size INTEGER, PRIMARY KEY (name COLLATE NOCASE))",
          "(name TEXT, size INTEGER, PRIMARY KEY (name COLLATE NOCASE)) WITHOUT ROWID",
          "(name TEXT COLLATE NOCASE PRIMARY KEY, size INTEGER)",
          "(name TEXT COLLATE NOCASE PRIMARY KEY, size INTEGER) WITHOUT ROWID"}) {
        Meet(szSql);
        EXPECT_EQ(Create(R"({"name": "ABC", "size": 1})"), R"({"name":"ABC","size":1})") << szSql;
        EXPECT_EQ(Create(R"({"name": "b", "size": 9})"), R"({"name":"b","size":9})");
        EXPECT_EQ(Get(R"("abc")"), R"({"name":"ABC","size":1})") << szSql;
        EXPECT_EQ(Create(R"({"name": "abc"})"), kDuplicate) << szSql;
        EXPECT_EQ(Save(R"({"name": "abc", "size": 2})", OnDuplicate::kSkip),
                  R"(skipped {"name":"ABC","size":1})");
        EXPECT_EQ(Save(R"({"name": "abc", "size": 3})", OnDuplicate::kReplace),
                  R"(replaced {"name":"ABC","size":3})")
            << szSql;
        EXPECT_EQ(Save(R"({"name": "abc", "size": 4})", OnDuplicate::kUpsert),
                  R"(updated {"name":"ABC","size":4})");
        EXPECT_EQ(Rows("SELECT * FROM item"), "ABC|4;b|9");
    }
}

TEST_F(KeyCollationTest, LetterCaseThatTheIndexTellsApartIsAnotherKey) {
    for (const char* szSql :
         {"(name TEXT COLLATE NOCASE, size INTEGER, PRIMARY KEY (name COLLATE BINARY))",
          "(name TEXT COLLATE NOCASE, size INTEGER, UNIQUE (name COLLATE BINARY))",
          "(name TEXT COLLATE NOCASE, size INTEGER, UNIQUE (name COLLATE RTRIM))"}) {
        Meet(szSql);
        EXPECT_EQ(Create(R"({"name": "ABC", "size": 1})"), R"({"name":"ABC","size":1})") << szSql;
        EXPECT_EQ(Get(R"("abc")"), kNoSuch);
        EXPECT_EQ(Save(R"({"name": "abc", "size": 2})", OnDuplicate::kReplace),
                  R"(inserted {"name":"abc","size":2})");
        EXPECT_EQ(Save(R"({"name": "abc", "size": 3})", OnDuplicate::kReplace),
                  R"(replaced {"name":"abc","size":3})");
        EXPECT_EQ(Save(R"({"name": "abc", "size": 4})", OnDuplicate::kSkip),
                  R"(skipped {"name":"abc","size":3})");
        EXPECT_EQ(Save(R"({"name": "abc", "size": 5})", OnDuplicate::kUpsert),
                  R"(updated {"name":"abc","size":5})");
        EXPECT_EQ(Save(R"({"name": "Abc", "size": 6})", OnDuplicate::kUpsert),
                  R"(inserted {"name":"Abc","size":6})");
        EXPECT_EQ(Rows("SELECT * FROM item ORDER BY size"), "ABC|1;abc|5;Abc|6") << szSql;
        EXPECT_EQ(Compared(), "");
    }
}

TEST_F(KeyCollationTest, OfSeveralIndexesTheOneCountsThatComparesAsTheColumn) {
    for (const char* szSql :
         {"(name TEXT PRIMARY KEY, size INTEGER, UNIQUE (name COLLATE NOCASE))",
          "(name TEXT, size INTEGER, UNIQUE (name COLLATE NOCASE), PRIMARY KEY (name))",
          "(name TEXT PRIMARY KEY, size INTEGER);"
          "CREATE UNIQUE INDEX item_u ON item (name COLLATE NOCASE)"}) {
        Meet(szSql);
        EXPECT_EQ(Create(R"({"name": "ABC", "size": 1})"), R"({"name":"ABC","size":1})");
        EXPECT_EQ(Get(R"("abc")"), kNoSuch) << szSql;
        for (const OnDuplicate eMode : {OnDuplicate::kStop, OnDuplicate::kSkip,
                                        OnDuplicate::kReplace, OnDuplicate::kUpsert}) {
            EXPECT_EQ(Save(R"({"name": "abc", "size": 2})", eMode), kDuplicate) << szSql;
        }
        EXPECT_EQ(Save(R"({"name": "ABC", "size": 3})", OnDuplicate::kReplace),
                  R"(replaced {"name":"ABC","size":3})");
    }
    for (const char* szSql :
         {"(name TEXT COLLATE NOCASE, size INTEGER, UNIQUE (name), UNIQUE (name COLLATE BINARY))",
          "(name TEXT COLLATE NOCASE, size INTEGER, UNIQUE (name COLLATE BINARY), UNIQUE "
          "(name))"}) {
        Meet(szSql);
        EXPECT_EQ(Create(R"({"name": "ABC", "size": 1})"), R"({"name":"ABC","size":1})");
        EXPECT_EQ(Get(R"("abc")"), R"({"name":"ABC","size":1})") << szSql;
        for (const char* szRecord :
             {R"({"name": "abc", "size": 2})", R"({"name": "ABC", "size": 2})"}) {
            EXPECT_EQ(Save(szRecord, OnDuplicate::kReplace), R"(replaced {"name":"ABC","size":2})")
                << szSql;
        }
        EXPECT_EQ(Compared(), "");
    }
}

// A key of several members, in another order than the index has them.
TEST_F(KeyCollationTest, EachMemberOfTheKeyComparesAsItsPartOfTheIndex) {
    Meet("(a TEXT, b TEXT, c INTEGER); CREATE UNIQUE INDEX item_u ON item (B COLLATE NOCASE, a)",
         R"({"item": {"key": ["a", "b"], "member": {"a": {"cpptype": "string"},
             "b": {"cpptype": "string"}, "c": {"cpptype": "int"}}}})");
    EXPECT_EQ(Create(R"({"a": "x", "b": "Y", "c": 1})"), R"({"a":"x","b":"Y","c":1})");
    EXPECT_EQ(Save(R"({"a": "x", "b": "y", "c": 2})", OnDuplicate::kReplace),
              R"(replaced {"a":"x","b":"Y","c":2})");
    EXPECT_EQ(Save(R"({"a": "X", "b": "y", "c": 3})", OnDuplicate::kReplace),
              R"(inserted {"a":"X","b":"y","c":3})");
    EXPECT_EQ(Get(R"({"a": "x", "b": "y"})"), R"({"a":"x","b":"Y","c":2})");
}

// What keeps no two keys apart, or is about more than the key, does not count.
TEST_F(KeyCollationTest, WithoutAUniqueIndexOnItAKeyComparesAsItsColumn) {
    Meet(
        "(name TEXT, size INTEGER); CREATE INDEX item_i ON item (name COLLATE NOCASE);"
        "CREATE UNIQUE INDEX item_p ON item (name COLLATE NOCASE) WHERE size > 100;"
        "CREATE UNIQUE INDEX item_e ON item (size || name);"
        "CREATE UNIQUE INDEX item_s ON item (size, name COLLATE NOCASE)");
    EXPECT_EQ(Save(R"({"name": "ABC", "size": 1})", OnDuplicate::kUpsert),
              R"(inserted {"name":"ABC","size":1})");
    EXPECT_EQ(Get(R"("abc")"), kNoSuch);
    EXPECT_EQ(Save(R"({"name": "abc", "size": 2})", OnDuplicate::kUpsert),
              R"(inserted {"name":"abc","size":2})");
    EXPECT_EQ(Compared(),
              "key-not-uniqueCREATE UNIQUE INDEX \"item_name\" ON \"item\" "
              "(\"name\" COLLATE BINARY)");
}

// Two columns, as the key has, but one of them is not of the key's.
TEST_F(KeyCollationTest, AnIndexThatNamesOneColumnTwiceIsNotOnAKeyOfTwo) {
    Meet("(a TEXT, b TEXT); CREATE UNIQUE INDEX item_u ON item (a COLLATE NOCASE, a COLLATE RTRIM)",
         R"({"item": {"key": ["a", "b"], "member": {"a": {"cpptype": "string"},
             "b": {"cpptype": "string"}}}})");
    EXPECT_EQ(Create(R"({"a": "X", "b": "y"})"), R"({"a":"X","b":"y"})");
    EXPECT_EQ(Get(R"({"a": "X", "b": "y"})"), R"({"a":"X","b":"y"})");
    EXPECT_EQ(Get(R"({"a": "x", "b": "y"})").substr(0, 9), "not-found");
}

TEST_F(KeyCollationTest, OfIndexesThatAllCompareInOtherWaysTheNewestCounts) {
    for (const char* szOther : {"NOCASE", "BINARY"}) {
        Meet(std::string("(name TEXT COLLATE ") + (*szOther == 'N' ? "BINARY" : "NOCASE") +
             ", size INTEGER); CREATE UNIQUE INDEX item_o ON item (name COLLATE " + szOther +
             "); CREATE UNIQUE INDEX item_n ON item (name COLLATE RTRIM)");
        EXPECT_EQ(Create(R"({"name": "ABC", "size": 1})"), R"({"name":"ABC","size":1})");
        EXPECT_EQ(Get(R"("ABC ")"), R"({"name":"ABC","size":1})") << szOther;
        EXPECT_EQ(Get(R"("abc")"), kNoSuch) << szOther;
    }
}

TEST_F(KeyCollationTest, LoaderCountsByTheIndex) {
    const struct {
        OnDuplicate eMode;
        const char* szCounts;
        const char* szRows;
    } kCases[] = {{OnDuplicate::kSkip, "2 0 1", "ABC|1;b|3"},
                  {OnDuplicate::kReplace, "2 1 0", "ABC|2;b|3"},
                  {OnDuplicate::kUpsert, "2 1 0", "ABC|2;b|3"}};
    for (const auto& Case : kCases) {
        Meet("(name TEXT, size INTEGER, UNIQUE (name COLLATE NOCASE))");
        LoadOptions How;
        How.eOnDuplicate = Case.eMode;
        Loader Into;
        EXPECT_EQ(Text(Into.Start(m_Table, How)), "ok");
        for (const char* szRecord :
             {R"({"name": "ABC", "size": 1})", R"({"name": "abc", "size": 2})",
              R"({"name": "b", "size": 3})"}) {
            EXPECT_EQ(Text(Into.Add(Parse(szRecord))), "ok");
        }
        EXPECT_EQ(Text(Into.Commit()), "ok");
        const LoadCounts& Now = Into.Counts();
        EXPECT_EQ(std::to_string(Now.nInserted) + " " + std::to_string(Now.nReplaced) + " " +
                      std::to_string(Now.nSkipped),
                  Case.szCounts);
        EXPECT_EQ(Rows("SELECT * FROM item"), Case.szRows);
    }
}

}  // namespace

}  // namespace VORN_JSON_DB
