// Whole inserts: what is stored, what is said, and what a failure leaves.

#include <unistd.h>

#include <csignal>
#include <fstream>
#include <map>
#include <memory>
#include <sstream>
#include <thread>

#include <gtest/gtest.h>
#include <sqlite3.h>

#include "../../../cli/input/Insert.h"
#include "../../../cli/input/Progress.h"
#include "PrintedRecords.h"

namespace VORN_JSON_DB::Cli {

namespace {

class Insert : public testing::Test {
  protected:
    Insert() { std::remove(m_strDb.c_str()); }
    ~Insert() override { std::remove(m_strDb.c_str()); }

    // What was said, the exit code in front.
    std::string RunFile(const std::string& strPath, const std::vector<std::string>& vecOptions) {
        Context Call;
        Call.vecWords = {m_strDb, "t", strPath};
        for (const std::string& strOption : vecOptions) {
            const size_t nEqual = strOption.find('=');
            std::vector<std::string>& vecValues = Call.mapOptions[strOption.substr(0, nEqual)];
            if (nEqual != std::string::npos) {
                vecValues.push_back(strOption.substr(nEqual + 1));
            }
        }
        testing::internal::CaptureStderr();
        int nExit = 0;
        std::string strError;
        try {
            nExit = RunInsert(Call);
        } catch (const Error& Failed) {
            nExit = Failed.nExit;
            strError = Failed.strLine;
        }
        return std::to_string(nExit) + " " + testing::internal::GetCapturedStderr() + strError;
    }

    // The same, with the file called F.
    std::string Run(const std::string& strText, const std::vector<std::string>& vecOptions = {}) {
        const InputFile File(strText);
        std::string strSaid = RunFile(File.Path(), vecOptions);
        for (size_t i = strSaid.find(File.Path()); i != std::string::npos;
             i = strSaid.find(File.Path())) {
            strSaid.replace(i, File.Path().size(), "F");
        }
        for (size_t i = strSaid.find(m_strDb); i != std::string::npos; i = strSaid.find(m_strDb)) {
            strSaid.replace(i, m_strDb.size(), "DB");
        }
        return strSaid;
    }

    void Sql(const std::string& strSql) {
        sqlite3* pDb = nullptr;
        sqlite3_open(m_strDb.c_str(), &pDb);
        EXPECT_EQ(sqlite3_exec(pDb, strSql.c_str(), nullptr, nullptr, nullptr), SQLITE_OK)
            << sqlite3_errmsg(pDb);
        sqlite3_close(pDb);
    }

    // Columns as SQL writes them: "1|'a'|NULL;2|..."
    std::string Rows(const std::string& strQuery = "SELECT * FROM t ORDER BY rowid") {
        sqlite3* pDb = nullptr;
        sqlite3_open(m_strDb.c_str(), &pDb);
        sqlite3_stmt* pStatement = nullptr;
        std::string strRows;
        if (sqlite3_prepare_v2(pDb, strQuery.c_str(), -1, &pStatement, nullptr) != SQLITE_OK) {
            strRows = sqlite3_errmsg(pDb);
        }
        while (pStatement != nullptr && sqlite3_step(pStatement) == SQLITE_ROW) {
            strRows += strRows.empty() ? "" : ";";
            for (int i = 0; i < sqlite3_column_count(pStatement); ++i) {
                strRows += (i > 0 ? "|" : "") + Shown(pStatement, i);
            }
        }
        sqlite3_finalize(pStatement);
        sqlite3_close(pDb);
        return strRows;
    }

    std::string Definition() { return Rows("SELECT definition FROM vornjsondb_definition"); }

    const std::string m_strDb = testing::TempDir() + "insert-" + std::to_string(getpid()) + ".db";

  private:
    static std::string Shown(sqlite3_stmt* pStatement, int nColumn) {
        const int nType = sqlite3_column_type(pStatement, nColumn);
        if (nType == SQLITE_NULL) {
            return "NULL";
        }
        const auto* const pText = sqlite3_column_text(pStatement, nColumn);
        const std::string strText(reinterpret_cast<const char*>(pText),
                                  static_cast<size_t>(sqlite3_column_bytes(pStatement, nColumn)));
        return nType == SQLITE_TEXT ? "'" + strText + "'" : strText;
    }
};

constexpr char kTwo[] =
    "{\"id\":1,\"n\":\"O'Neil %s\",\"t\":[1, \"x\"],\"r\":1.5,\"b\":true}\n"
    "{\"id\":2,\"n\":null,\"r\":2}\n";

TEST_F(Insert, ANewTableHasTheTypesOfAllRecords) {
    EXPECT_EQ(Run(kTwo, {"--key=id"}),
              "0 2 inserted, 0 replaced, 0 skipped, 0 failed (F: JSON Lines)\n");
    EXPECT_EQ(Rows(), "1|'O'Neil %s'|'[1,\"x\"]'|1.5|1;2|NULL|NULL|2.0|NULL");
}

TEST_F(Insert, TheDefinitionIsKept) {
    Run(kTwo, {"--key=id", "--not-null=r", "--default=b=false", "--default=n=5", "--type=r=any"});
    EXPECT_EQ(Definition(),
              "'{\"t\":{\"key\":\"id\",\"member\":{\"b\":{\"cppDefaultValue\":false,\"cpptype\":"
              "\"bool\"},\"id\":{\"cpptype\":\"long long\"},\"n\":{\"cppDefaultValue\":\"5\","
              "\"cpptype\":\"string\",\"nullSeen\":true},\"r\":{\"cpptype\":\"any\",\"notNull\":"
              "true},\"t\":{\"cpptype\":\"Json::arrayValue\"}}}}'");
    EXPECT_EQ(Rows("SELECT b, typeof(r), r FROM t"), "1|'real'|1.5;0|'integer'|2");
}

TEST_F(Insert, ADryRunChangesNothing) {
    testing::internal::CaptureStdout();
    EXPECT_EQ(Run("id,n\n1,007\n", {"--dry-run", "--key=id"}), "0 ");
    FlushOutput();
    const std::string strShown = testing::internal::GetCapturedStdout();
    EXPECT_EQ(strShown.substr(strShown.rfind("CREATE")),
              "CREATE TABLE IF NOT EXISTS \"t\" (\"id\" INTEGER PRIMARY KEY, \"n\" TEXT);\n");
    EXPECT_NE(access(m_strDb.c_str(), F_OK), 0);
}

TEST_F(Insert, ADuplicateStopsAndNothingIsStored) {
    EXPECT_EQ(Run("id\n1\n2\n1\n", {"--key=id"}),
              "4 F:4: cannot load record 3 into table \"t\": UNIQUE constraint failed: t.id (id = "
              "1); --skip, --replace or --upsert tells what to do with it (nothing is stored)");
    EXPECT_NE(access(m_strDb.c_str(), F_OK), 0);
    Sql("CREATE TABLE other (a)");
    Run("id\n1\n1\n", {"--key=id"});
    EXPECT_EQ(Rows("SELECT name FROM sqlite_master"), "'other'");
}

TEST_F(Insert, DuplicatesAreSkippedReplacedOrChanged) {
    Sql("CREATE TABLE t (id INTEGER PRIMARY KEY, a TEXT DEFAULT 'd', b TEXT NOT NULL)");
    const std::string strFirst = "{\"id\":1,\"a\":\"x\",\"b\":\"y\"}\n{\"id\":2,\"b\":\"z\"}\n";
    EXPECT_EQ(Run(strFirst), "0 2 inserted, 0 replaced, 0 skipped, 0 failed (F: JSON Lines)\n");
    EXPECT_EQ(Run("[{\"id\":1,\"b\":\"n\"},{\"id\":3,\"b\":\"n\"}]", {"--skip"}),
              "0 1 inserted, 0 replaced, 1 skipped, 0 failed (F: JSON)\n");
    EXPECT_EQ(Rows(), "1|'x'|'y';2|'d'|'z';3|'d'|'n'");
    EXPECT_EQ(Run("[{\"id\":1,\"b\":\"u\"},{\"id\":2,\"a\":\"u\"}]", {"--upsert"}),
              "0 0 inserted, 2 replaced, 0 skipped, 0 failed (F: JSON)\n");
    EXPECT_EQ(Rows(), "1|'x'|'u';2|'u'|'z';3|'d'|'n'");
    EXPECT_EQ(Run("[{\"id\":1,\"b\":\"r\"},{\"id\":4,\"b\":\"r\"}]", {"--replace"}),
              "0 1 inserted, 1 replaced, 0 skipped, 0 failed (F: JSON)\n");
    EXPECT_EQ(Rows(), "1|'d'|'r';2|'u'|'z';3|'d'|'n';4|'d'|'r'");
    // Skipping is for keys alone.
    EXPECT_EQ(Run("[{\"id\":5,\"a\":\"x\"}]", {"--skip"}),
              "3 F:1: cannot load record 1 into table \"t\": NOT NULL constraint failed: t.b; "
              "vornjsondb schema shows what the table demands (nothing is stored)");
}

TEST_F(Insert, UnknownMembersAreBadOrAdded) {
    Run("[{\"a\":1}]");
    const std::string strMore = "[{\"a\":2},{\"a\":3,\"c\":\"x\"}]";
    EXPECT_EQ(Run(strMore),
              "3 F:1: the table has no member \"c\"; --add-members adds it (nothing is stored)");
    EXPECT_EQ(Run(strMore, {"--add-members"}),
              "0 2 inserted, 0 replaced, 0 skipped, 0 failed (F: JSON)\n");
    EXPECT_EQ(Rows(), "1|NULL;2|NULL;3|'x'");
    EXPECT_EQ(Definition(),
              "'{\"t\":{\"member\":{\"a\":{\"cpptype\":\"long long\"},\"c\":{\"cpptype\":"
              "\"string\"}}}}'");
}

TEST_F(Insert, BadRecordsGoToTheirFile) {
    const InputFile Errors("");
    EXPECT_EQ(Run("{\"a\":1}\n{\"a\":2,\"a\":2}\n{x\xE9}\n{\"a\":3}\n",
                  {"--errors=" + Errors.Path(), "--key=a"}),
              "3 2 inserted, 0 replaced, 0 skipped, 2 failed (F: JSON Lines)\n");
    EXPECT_EQ(Rows(), "1;3");
    std::ifstream File(Errors.Path());
    std::string strFirst;
    std::string strSecond;
    std::getline(File, strFirst);
    std::getline(File, strSecond);
    EXPECT_EQ(strFirst.substr(strFirst.find("\"line\"")),
              "\"line\":2,\"record\":2,\"reason\":\"the member \\\"a\\\" is there twice\","
              "\"text\":\"{\\\"a\\\":2,\\\"a\\\":2}\"}");
    EXPECT_EQ(strSecond.substr(strSecond.find("\"line\"")),
              "\"line\":3,\"record\":3,\"reason\":\"a member's name in quotes is missing\","
              "\"text\":\"{x\xEF\xBF\xBD}\"}");
}

TEST_F(Insert, BatchesBeforeAFailureStay) {
    EXPECT_EQ(Run("a\n1\n2\n3\n4\n5\nx,y\n", {"--batch=2", "--type=a=int", "--errors=/dev/null"}),
              "3 5 inserted, 0 replaced, 0 skipped, 1 failed (F: CSV)\n");
    EXPECT_EQ(Run("a\n6\n7\n8\nx\n", {"--batch=2"}),
              "3 F:5: cannot load record 4 into table \"t\": member \"a\": \"x\" is another "
              "kind of value: expected is a whole number from -2147483648 to 2147483647; pass a "
              "value of the member's type: none is converted (the first 2 records are dealt with "
              "and stay)");
    EXPECT_EQ(Rows(), "1;2;3;4;5;6;7");
}

TEST_F(Insert, AnInterruptEndsAtABatchsBorder) {
    Run("a\n1\n");
    int anPipe[2];
    ASSERT_EQ(pipe(anPipe), 0);
    const std::string strPath = "/dev/fd/" + std::to_string(anPipe[0]);
    const pthread_t Reader = pthread_self();
    std::thread Writer([&] {
        EXPECT_EQ(write(anPipe[1], "a\n2\n3\n4\n", 8), 8);
        while (Rows() != "1;2;3") {
            std::this_thread::yield();
        }
        pthread_kill(Reader, SIGINT);
    });
    EXPECT_EQ(RunFile(strPath, {"--batch=2", "--format=csv"}),
              "130 interrupted (the first 2 records are dealt with and stay)");
    Writer.join();
    close(anPipe[0]);
    close(anPipe[1]);
    EXPECT_EQ(Rows(), "1;2;3");
}

TEST_F(Insert, WhatDoesNotFitTogetherIsRefused) {
    EXPECT_EQ(Run("[]"),
              "3 F: JSON: there are no records to make a table from (nothing is stored)");
    EXPECT_EQ(Run("[{\"name\":1}]", {"--key=nmae"}),
              "2 --key: there is no member \"nmae\"; did you mean \"name\"? (nothing is stored)");
    EXPECT_EQ(Run("[{\"a\":1}]", {"--skip"}),
              "2 DB: --skip, --replace and --upsert need a key, and table \"t\" has none; name it "
              "with --key MEMBER (nothing is stored)");
    std::string strWide = "{";
    for (int i = 0; i < 2001; ++i) {
        strWide += (i > 0 ? ",\"m" : "\"m") + std::to_string(i) + "\":1";
    }
    EXPECT_EQ(Run("[" + strWide + "}]"),
              "3 the records have 2001 different members, and a table has at most 2000 columns "
              "(nothing is stored)");
    EXPECT_NE(access(m_strDb.c_str(), F_OK), 0);
}

TEST_F(Insert, NumbersOfCellsAreNeverConvertedBySqlite) {
    Run("a,b,c\n0.1,007,9007199254740993\n-2.5,x,-1\n1e5,y,2\n", {"--type=a=double"});
    EXPECT_EQ(Rows("SELECT a, typeof(a), b, c FROM t"),
              "0.1|'real'|'007'|9007199254740993;-2.5|'real'|'x'|-1;100000.0|'real'|'y'|2");
}

Json::Value ReadJsonFile(const std::string& strPath) {
    std::ifstream File(strPath);
    Json::Value jAll;
    File >> jAll;
    return jAll;
}

// The languages of the world, most of which lack some member.
TEST_F(Insert, ARealFileComesBackRecordByRecord) {
    const std::string strPath = "/usr/share/iso-codes/json/iso_639-3.json";
    ASSERT_EQ(access(strPath.c_str(), R_OK), 0) << "package iso-codes";
    EXPECT_EQ(RunFile(strPath, {"--key=alpha_3"}),
              "0 7910 inserted, 0 replaced, 0 skipped, 0 failed (" + strPath +
                  ": JSON, the list \"639-3\")\n");
    sqlite3* pDb = nullptr;
    ASSERT_EQ(sqlite3_open(m_strDb.c_str(), &pDb), SQLITE_OK);
    Json::Value jStored;
    {
        Table All;
        EXPECT_EQ(All.Open(pDb, "t", Json::Value()).Message(), "");
        EXPECT_EQ(All.List(Query(), jStored).Message(), "");
    }
    sqlite3_close(pDb);
    std::map<std::string, Json::Value> mapWanted;
    const Json::Value jFile = ReadJsonFile(strPath);
    for (const Json::Value& jRecord : jFile["639-3"]) {
        mapWanted[jRecord["alpha_3"].asString()] = jRecord;
    }
    ASSERT_EQ(jStored.size(), mapWanted.size());
    for (const Json::Value& jRecord : jStored) {
        EXPECT_EQ(jRecord, mapWanted[jRecord["alpha_3"].asString()]);
    }
}

TEST(ProgressLine, TellsPartRateAndRemainingTime) {
    EXPECT_EQ(Progress::Line("inserting", 1234567, 45, 100, 312000.7, 5),
              "inserting [#########...........] 45 %  1,234,567 records  312,000/s  0:11 left");
    EXPECT_EQ(Progress::Line("inserting", 10, 98000000, -1, 5, 0),
              "inserting 98 MB  10 records  5/s");
    EXPECT_EQ(Progress::Line("inserting", 10, 120, 100, 5, 10),
              "inserting [####################] 100 %  10 records  5/s  0:00 left");
}

}  // namespace

}  // namespace VORN_JSON_DB::Cli
