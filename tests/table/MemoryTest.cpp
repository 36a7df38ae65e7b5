// Every call while one of its allocations fails. Under AddressSanitizer, which brings its own
// malloc, this is left out.

#ifndef __SANITIZE_ADDRESS__

#include <climits>
#include <cstdlib>
#include <functional>
#include <new>
#include <utility>

#include "QueryFixture.h"

extern "C" void* __libc_malloc(size_t nBytes);

namespace {

// 0: never. Counts down to the one allocation that fails.
int g_nMallocsUntilFailure = 0;
bool g_blMallocFailed = false;

}  // namespace

extern "C" void* malloc(size_t nBytes) {
    if (g_nMallocsUntilFailure > 0 && --g_nMallocsUntilFailure == 0) {
        g_blMallocFailed = true;
        return nullptr;
    }
    return __libc_malloc(nBytes);
}

// By way of malloc also where the system's own does something else, as under valgrind.
void* operator new(size_t nBytes) {
    if (void* pMemory = malloc(nBytes)) {
        return pMemory;
    }
    throw std::bad_alloc();
}
void operator delete(void* pMemory) noexcept {
    free(pMemory);
}
void operator delete(void* pMemory, size_t) noexcept {
    free(pMemory);
}

namespace VORN_JSON_DB {

namespace {

// As a key, a text that the short buffers of strings do not hold.
constexpr char kLongName[] = "a name that is longer than what a string holds by itself";

class TableMemoryTest : public TableTest {
  protected:
    using Call = std::function<std::string(Table&)>;

    // SQLite's small blocks come from malloc, too, and each statement is prepared anew.
    TableMemoryTest() {
        sqlite3_db_config(m_pDb, SQLITE_DBCONFIG_LOOKASIDE, nullptr, 0, 0);
        m_How.nStatements = 0;
        m_How.strSqlCreate =
            "CREATE TABLE task (id INTEGER PRIMARY KEY, name, size INTEGER, done, tags TEXT)";
        Open(kTasks, m_How);
        Restore();
    }

    // The name of the first is a number, which SQLite makes a text of when it is read.
    void Restore() {
        Run("DROP INDEX IF EXISTS task_name_size; DROP TABLE IF EXISTS fresh; DELETE FROM task; "
            "INSERT INTO task VALUES (1, 12.5, 7, 0, '[1, \"two\"]'),"
            " (2, 'a name that is longer than what a string holds by itself', NULL, 1, NULL)");
    }

    // The outcome as text, for which there is memory again.
    static std::string End(const Status& Outcome) {
        g_nMallocsUntilFailure = 0;
        return Text(Outcome);
    }

    // Runs the call while each of its allocations fails in turn, until none does. What comes out
    // each time is what comes out in the end, "no-memory" or std::bad_alloc; and of a call that
    // gave one of these the rows are as they were.
    void Try(const Call& fnCall) {
        const std::string strWanted = fnCall(m_Table);
        EXPECT_EQ(0U, strWanted.find("ok")) << strWanted;
        Restore();
        const std::string strBefore = Rows("SELECT * FROM task");
        int nFailed = 0;
        bool blUntouched = false;
        for (int nAt = 1; !blUntouched && nAt < 20000; ++nAt) {
            std::string strGot = "std::bad_alloc";
            g_blMallocFailed = false;
            g_nMallocsUntilFailure = nAt;
            try {
                strGot = fnCall(m_Table);
            } catch (const std::bad_alloc&) {
                g_nMallocsUntilFailure = 0;
            }
            blUntouched = !g_blMallocFailed;
            if (strGot != strWanted) {
                ++nFailed;
                EXPECT_TRUE(strGot == "std::bad_alloc" || strGot.compare(0, 9, "no-memory") == 0)
                    << "allocation " << nAt << ": " << strGot;
                EXPECT_EQ(strBefore, Rows("SELECT * FROM task")) << "allocation " << nAt;
            } else {
                Restore();
            }
            EXPECT_NE(0, sqlite3_get_autocommit(m_pDb));
        }
        EXPECT_TRUE(blUntouched);
        EXPECT_GT(nFailed, 0);
    }

    Options m_How;
    const Query m_Long = Query().Where("name", kLongName);
    const Json::Value m_jRecord = Parse(
        R"({"id": 3, "name": "a name that is longer than what a string holds by itself",
            "tags": [1, "a text that is longer than what a string holds by itself"]})");
};

TEST_F(TableMemoryTest, WhatWritesOneRecord) {
    for (const OnDuplicate eMode :
         {OnDuplicate::kStop, OnDuplicate::kSkip, OnDuplicate::kReplace, OnDuplicate::kUpsert}) {
        Try([&](Table& Into) {
            Json::Value jStored;
            return End(Into.Save(m_jRecord, eMode, &jStored));
        });
    }
    Json::Value jThere = m_jRecord;
    jThere["id"] = 2;
    Try([&](Table& Into) {
        Json::Value jStored;
        return End(Into.Save(jThere, OnDuplicate::kUpsert, &jStored)).append(Text(jStored));
    });
    Try([&](Table& Into) { return End(Into.Create(m_jRecord)); });
}

// So deep that the reader is asked how many levels it takes.
TEST_F(TableMemoryTest, WhatWritesManyLevels) {
    Json::Value jDeep;
    for (int i = 0; i < 130; ++i) {
        Json::Value jOuter(Json::arrayValue);
        jOuter.append(jDeep);
        jDeep = jOuter;
    }
    Json::Value jRecord;
    jRecord["tags"] = jDeep;
    Try([&](Table& Into) { return End(Into.Create(jRecord)); });
}

TEST_F(TableMemoryTest, WhatReads) {
    const Query Some = Query(Parse(R"({"where": {"name": {"$ne": "x"}, "tags[0]": {"$in":
        [1, null, "a text that is longer than what a string holds by itself"]}},
        "sort": ["-name"], "limit": 5, "members": ["name", "tags"]})"));
    Try([&](Table& From) {
        Json::Value jRecord;
        return End(From.Get(1, jRecord)).append(Text(jRecord));
    });
    Try([&](Table& From) {
        Json::Value jRecord;
        return End(From.First(m_Long, jRecord)).append(Text(jRecord));
    });
    Try([&](Table& From) {
        Json::Value jRecords;
        return End(From.List(Query(), jRecords)).append(Text(jRecords));
    });
    Try([&](Table& From) {
        Json::Value jRecords;
        return End(From.List(Some, jRecords)).append(Text(jRecords));
    });
    Try([&](Table& From) {
        std::string strNames;
        const Status Outcome = From.ForEach(Some, [&](const Json::Value& jRecord) {
            strNames += jRecord["name"].isString() ? "s" : "n";
            return true;
        });
        return End(Outcome).append(strNames);
    });
    Try([&](Table& From) {
        std::string strNames;
        const Status Outcome = From.ForEachRow(Query(), [&](const Row& Each) {
            strNames += Each.Text(2);
            return true;
        });
        return End(Outcome).append(strNames);
    });
    Try([&](Table& From) {
        std::int64_t nRecords = 0;
        return End(From.Count(Some, nRecords)).append(std::to_string(nRecords));
    });
    Try([&](Table& From) {
        bool blExists = false;
        return End(From.Exists(Some, blExists)).append(std::to_string(static_cast<int>(blExists)));
    });
}

TEST_F(TableMemoryTest, WhatChangesByAQuery) {
    const Json::Value jSize = Parse(R"({"size": 5})");
    Try([&](Table& Into) {
        std::int64_t nRows = 0;
        return End(Into.Update(m_Long, jSize, &nRows)).append(std::to_string(nRows));
    });
    Try([&](Table& Into) { return End(Into.Remove(m_Long)); });
    Try([&](Table& Into) { return End(Into.RemoveAll()); });
    const Json::Value jQuery = Parse(
        R"({"where": {"$or": [{"name": "a text that is longer than what a string holds by itself"},
                              {"tags": ["and one more, so that the value is copied, too"]}]}})");
    Try([&](Table& Into) { return End(Into.Remove(Query(jQuery))); });
}

TEST_F(TableMemoryTest, WhatExplainsAndCompares) {
    Try([this](Table& With) {
        Plan Found;
        return End(With.Explain(m_Long, Found))
            .append(Found.strSql)
            .append(Text(Found.vecFindings));
    });
    Try([](Table& With) {
        Plan Found;
        return End(With.ExplainSql("SELECT 1 FROM task AS one WHERE name = 1", Found))
            .append(Text(Found.vecFindings));
    });
    Try([](Table& With) {
        FindingList vecFindings;
        return End(With.Lint(vecFindings)).append(Text(vecFindings));
    });
    const Query LongBySize = Query(m_Long).Sort("size");
    Try([&](Table& With) {
        Json::Value jOld;
        return End(With.ToOldQuery(LongBySize, OldCall::kRead, jOld)).append(Text(jOld));
    });
    Try([this](Table&) {
        Json::Value jDefinition;
        return End(DefinitionOf(m_pDb, "task", jDefinition)).append(Text(jDefinition));
    });
    const Json::Value jDefinition = Parse(kTasks);
    Try([&](Table&) {
        const FindingList vecFindings = LintDefinition("task", jDefinition);
        return End({}).append(Text(vecFindings));
    });
    Try([&](Table&) {
        const FindingList vecFindings = LintOldRecord("task", jDefinition, m_jRecord);
        return End({}).append(Text(vecFindings));
    });
    Try([&](Table&) {
        const FindingList vecFindings = LintOldQuery("task", jDefinition, m_jRecord);
        return End({}).append(Text(vecFindings));
    });
}

TEST_F(TableMemoryTest, WhatMakesIndexesAndColumns) {
    Try([](Table& Into) {
        std::string strSql;
        const Status Outcome = Into.CreateIndex({"name", "size"}, false, &strSql);
        return End(Outcome).append(strSql);
    });
    Json::Value jWider = Parse(kTasks);
    jWider["task"]["member"]["more"]["cpptype"] = "string";
    jWider["task"]["member"]["more"]["unique"] = true;
    Try([&](Table&) {
        Table Wider;
        SyncReport Found;
        Transaction Undone;
        Status Outcome = Wider.Open(m_pDb, "task", jWider);
        if (Outcome.Ok()) {
            Outcome = Wider.Sync(SyncMode::kLook, Found);
        }
        if (Outcome.Ok()) {
            Outcome = Undone.Begin(m_pDb);
        }
        if (Outcome.Ok()) {
            Outcome = Wider.Sync(SyncMode::kChange, Found);
        }
        return End(Outcome).append(Text(Found.vecFindings));
    });
}

TEST_F(TableMemoryTest, WhatOpensAndCreates) {
    Options How;
    How.blCreateTable = true;
    const Json::Value jDefinition = Parse(R"({"fresh": {"key": ["id", "name"], "member":
        {"id": {"cpptype": "int"}, "name": {"cpptype": "string", "cppDefaultValue": "x"}}}})");
    Try([&](Table&) {
        Table Fresh;
        const Status Outcome = Fresh.Open(m_pDb, "fresh", jDefinition, How);
        return End(Outcome);
    });
    Try([this](Table&) {
        Table Other;
        return End(Other.Open(m_pDb, "task", Json::Value::nullSingleton()))
            .append(Text(Other.Definition()));
    });
}

TEST_F(TableMemoryTest, WhatLoads) {
    Try([&](Table& Into) {
        Loader Many;
        Status Outcome = Many.Start(Into);
        if (Outcome.Ok()) {
            Outcome = Many.Add(m_jRecord);
        }
        if (Outcome.Ok()) {
            Many.SetInteger(Many.MemberIndex("id"), 4);
            Many.SetText(Many.MemberIndex("name"), kLongName);
            Many.SetJson(Many.MemberIndex("tags"), R"([ "a", 15, "and what is longer", [] ])");
            Outcome = Many.EndRecord();
        }
        return End(Outcome.Ok() ? Many.Commit() : Outcome);
    });
}

// The text of the earlier list lies where the new one is copied to.
TEST_F(TableMemoryTest, ValueThatEndsInBadAllocLeavesNullAndNoPartOfAnEarlierOne) {
    int nThrown = 0;
    std::string strStored;
    for (int nAt = 1; strStored != "[\"b\",15]" && nAt < 1000; ++nAt) {
        Loader Many;
        ASSERT_TRUE(Many.Start(m_Table).Ok());
        Many.SetInteger(Many.MemberIndex("id"), 3);
        const int nTags = Many.MemberIndex("tags");
        Many.SetJson(nTags, R"(["an earlier list"])");
        bool blThrown = false;
        g_nMallocsUntilFailure = nAt;
        try {
            Many.SetJson(nTags, R"([ "b", 15 ])");
        } catch (const std::bad_alloc&) {
            blThrown = true;
        }
        g_nMallocsUntilFailure = 0;
        EXPECT_EQ("ok", Text(Many.EndRecord()));
        strStored = Rows("SELECT tags FROM task WHERE id = 3");
        if (blThrown) {
            ++nThrown;
            EXPECT_EQ("NULL", strStored) << "allocation " << nAt;
        }
    }
    EXPECT_GT(nThrown, 0);
}

// The text is too long for the memory that is kept of the record before.
TEST_F(TableMemoryTest, TextOfAnyThatEndsInBadAllocLeavesNull) {
    Table Any;
    Options How;
    How.blCompatible = false;
    Run("CREATE TABLE one (y)");
    ASSERT_EQ("ok",
              Text(Any.Open(m_pDb, "one",
                            Parse(R"({"one": {"member": {"y": {"cpptype": "any"}}}})"), How)));
    Loader Many;
    ASSERT_EQ("ok", Text(Many.Start(Any)));
    Many.SetText(0, "a first text");
    ASSERT_EQ("ok", Text(Many.EndRecord()));
    g_nMallocsUntilFailure = 1;
    EXPECT_THROW(Many.SetText(0, std::string_view(kLongName)), std::bad_alloc);
    g_nMallocsUntilFailure = 0;
    EXPECT_EQ("ok", Text(Many.EndRecord()));
    EXPECT_EQ("a first text;NULL", Rows("SELECT y FROM one"));
}

TEST_F(TableMemoryTest, RecordThatRanOutOfMemoryLeavesNothingToTheNext) {
    int nThrown = 0;
    bool blUntouched = false;
    for (int nAt = 1; !blUntouched && nAt < 20000; ++nAt) {
        Restore();
        Loader Into;
        EXPECT_EQ("ok", Text(Into.Start(m_Table)));
        Into.SetInteger(Into.MemberIndex("id"), 3);
        Into.SetText(Into.MemberIndex("name"), kLongName);
        g_blMallocFailed = false;
        g_nMallocsUntilFailure = nAt;
        try {
            End(Into.EndRecord());
        } catch (const std::bad_alloc&) {
            g_nMallocsUntilFailure = 0;
            ++nThrown;
            Into.SetInteger(Into.MemberIndex("id"), 4);
            EXPECT_EQ("ok", Text(Into.EndRecord()));
            EXPECT_EQ("4|NULL", Rows("SELECT id, name FROM task WHERE id > 2")) << nAt;
        }
        blUntouched = !g_blMallocFailed;
    }
    EXPECT_TRUE(blUntouched);
    EXPECT_GT(nThrown, 0);
}

// No nearest name is looked for that nobody is told.
TEST_F(TableMemoryTest, UnknownNamesBeyondTheLastFindingTakeNothing) {
    const auto fnCount = [&](int nMembers) {
        Json::Value jRecord;
        for (int i = 0; i < nMembers; ++i) {
            jRecord["name" + std::to_string(1000 + i)] = i;
        }
        g_nMallocsUntilFailure = INT_MAX;
        const Status Outcome = m_Table.Create(jRecord);
        const int nMallocs = INT_MAX - std::exchange(g_nMallocsUntilFailure, 0);
        EXPECT_EQ(100U, Outcome.Findings().size());
        return nMallocs;
    };
    EXPECT_EQ(fnCount(100), fnCount(1000));
}

TEST_F(TableMemoryTest, WhatSpansCalls) {
    Try([&](Table& Into) {
        Transaction Outer;
        Status Outcome = Outer.Begin(m_pDb);
        if (Outcome.Ok()) {
            Transaction Inner;
            Outcome = Inner.Begin(m_pDb);
            if (Outcome.Ok()) {
                Outcome = Into.Create(m_jRecord);
            }
            if (Outcome.Ok()) {
                Outcome = Inner.Rollback();
            }
        }
        return End(Outcome.Ok() ? Outer.Commit() : Outcome);
    });
}

}  // namespace

}  // namespace VORN_JSON_DB

#endif
