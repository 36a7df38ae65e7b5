// What SQLite and the system refuse.

#include <sys/types.h>

#include <cerrno>
#include <cstdio>

#include "QueryFixture.h"

namespace {

int g_nOldSqlite = 0;  // instead of the real version; 0: none
int g_nWriteError = 0;

ssize_t FailToWrite(int, const void*, size_t) {
    errno = g_nWriteError;
    return -1;
}

}  // namespace

// Found before the library's own.
extern "C" int sqlite3_libversion_number() {
    return g_nOldSqlite != 0 ? g_nOldSqlite : SQLITE_VERSION_NUMBER;
}

namespace VORN_JSON_DB {

namespace {

class FaultsTest : public TableTest {};

TEST_F(FaultsTest, TextThatIsTooLongIsNotBound) {
    Open(R"({"word": {"key": "word", "member": {"word": {"cpptype": "string"},
                                               "note": {"cpptype": "string"}, "size": {"cpptype": "int"}}}})");
    sqlite3_limit(m_pDb, SQLITE_LIMIT_LENGTH, 1000);
    Json::Value jRecord;
    jRecord["word"] = std::string(1001, 'x');
    const auto Refused = [](const char* szDo) {
        return "refused: cannot " + std::string(szDo) + " table \"word\": string or blob too big";
    };
    for (const OnDuplicate eMode :
         {OnDuplicate::kStop, OnDuplicate::kSkip, OnDuplicate::kReplace, OnDuplicate::kUpsert}) {
        EXPECT_EQ(Text(m_Table.Save(jRecord, eMode, nullptr)), Refused("save a record in"));
    }
    Json::Value jOut;
    EXPECT_EQ(Text(m_Table.Get(jRecord["word"], jOut)), Refused("get a record from"));
    const Query Same = Query().Where("word", jRecord["word"]);
    EXPECT_EQ(Text(m_Table.List(Same, jOut)), Refused("list records of"));
    bool blExists = true;
    EXPECT_EQ(Text(m_Table.Exists(Same, blExists)), Refused("look for records of"));
    EXPECT_TRUE(blExists);
    std::int64_t nRecords = 7;
    EXPECT_EQ(Text(m_Table.Count(Same, nRecords)), Refused("count records of"));
    EXPECT_EQ(nRecords, 7);
    EXPECT_EQ(Text(m_Table.Update(Same, Parse(R"({"size": 1})"))), Refused("update records of"));
    EXPECT_EQ(Text(m_Table.Update(Query().Where("size", 1), jRecord)),
              Refused("update records of"));
    EXPECT_EQ(Text(m_Table.Remove(Same)), Refused("remove records from"));
    EXPECT_EQ(Text(m_Table.Create(Parse(R"({"word": "a", "size": 1})"))), "ok");
    Json::Value jLonger = Parse(R"({"word": "a", "size": 2})");
    jLonger["note"] = jRecord["word"];
    EXPECT_EQ(Text(m_Table.Save(jLonger, OnDuplicate::kUpsert, nullptr)),
              Refused("save a record in"));
    EXPECT_EQ(Rows("SELECT size, word FROM word"), "1|a");
}

// SQLite calls the one error of writing for which it has no word of its own an I/O error.
TEST_F(FaultsTest, QuotaThatIsUsedUpIsAFullDisk) {
    const std::string strFile = testing::TempDir() + "quota";
    sqlite3* pDb = nullptr;
    EXPECT_EQ(sqlite3_open(strFile.c_str(), &pDb), SQLITE_OK);
    {
        Table Tasks;
        Options How;
        How.blCreateTable = true;
        EXPECT_EQ(Text(Tasks.Open(pDb, "task", Parse(kTasks), How)), "ok");
        sqlite3_vfs* const pVfs = sqlite3_vfs_find(nullptr);
        const char* const kWrites[] = {"write", "pwrite", "pwrite64"};
        const auto fnInstall = [&](sqlite3_syscall_ptr pfnWrite) {
            for (const char* szWrite : kWrites) {
                pVfs->xSetSystemCall(pVfs, szWrite, pfnWrite);
            }
        };
        const struct {
            int nError;
            const char* szCode;
        } kCases[] = {{EDQUOT, "disk-full"}, {EIO, "io-error"}};
        for (const auto& Case : kCases) {
            g_nWriteError = Case.nError;
            fnInstall(reinterpret_cast<sqlite3_syscall_ptr>(FailToWrite));
            const Status Outcome = Tasks.Create(Parse(R"({"id": 1})"));
            fnInstall(nullptr);
            EXPECT_EQ(Text(Outcome),
                      Case.szCode + std::string(": cannot save a record in table \"task\": "
                                                "disk I/O error"));
            EXPECT_EQ(Outcome.SqliteCode(), SQLITE_IOERR_WRITE);
            EXPECT_EQ(Outcome.SystemError(), Case.nError);
        }
        EXPECT_EQ(Text(Tasks.Create(Parse(R"({"id": 1})"))), "ok");
    }
    EXPECT_EQ(sqlite3_close(pDb), SQLITE_OK);
    std::remove(strFile.c_str());
}

TEST_F(FaultsTest, OldSqliteIsRefusedWhenATableIsOpened) {
    Run("CREATE TABLE task (id INTEGER PRIMARY KEY)");
    g_nOldSqlite = 3034001;
    const Status Outcome = m_Table.Open(m_pDb, "task", Json::Value());
    g_nOldSqlite = 0;
    EXPECT_EQ(Text(Outcome),
              "refused: cannot open table \"task\": SQLite 3.35 or later is needed, and this is " +
                  std::string(sqlite3_libversion()));
    EXPECT_EQ(m_Table.Connection(), nullptr);
}

TEST_F(FaultsTest, SavepointThatTheCallerReleasedCannotBeRolledBack) {
    Open();
    Run("BEGIN");
    Transaction Inner;
    EXPECT_EQ(Text(Inner.Begin(m_pDb)), "ok");
    Run("INSERT INTO task (id) VALUES (1); RELEASE vornjsondb");
    EXPECT_EQ(Text(Inner.Rollback()),
              "refused: cannot roll a transaction back: no such savepoint: vornjsondb");
    EXPECT_FALSE(Inner.IsOpen());
    Run("COMMIT");
    EXPECT_EQ(Rows("SELECT id FROM task"), "1");
}

}  // namespace

}  // namespace VORN_JSON_DB
