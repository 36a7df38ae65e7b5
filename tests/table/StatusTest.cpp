#include <cerrno>

#include "../../table/Failure.h"
#include "../../table/FindingCodes.h"
#include "../../table/Nearest.h"
#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Doing;
using vornjsondb::FindingCode;

TEST(StatusTest, SuccessHoldsNothing) {
    const Status Fine;
    EXPECT_TRUE(Fine.Ok());
    EXPECT_EQ(StatusCode::kOk, Fine.Code());
    EXPECT_EQ("", Fine.Message());
    EXPECT_TRUE(Fine.Findings().empty());
    EXPECT_EQ(0, Fine.SqliteCode());
    EXPECT_EQ(0, Fine.SystemError());
    EXPECT_EQ(Retry::kNever, Fine.Advice());
}

TEST(StatusTest, AFailureThatIsToldAnewKeepsAllElse) {
    auto pDetails = std::make_shared<Status::Details>();
    pDetails->eCode = StatusCode::kIoError;
    pDetails->eRetry = Retry::kCall;
    pDetails->nSqliteCode = SQLITE_IOERR_WRITE;
    pDetails->nSystemError = ENOSPC;
    pDetails->strMessage = "reason";
    Report(pDetails->vecFindings, FindingCode::kRejected, "/a", "finding");
    const Status Step(std::move(pDetails));
    const std::string strTable = "t";
    const struct {
        Status Told;
        Retry eRetry;
        const char* szText;
    } kCases[] = {
        {vornjsondb::Within(Doing{"do", &strTable}, Step), Retry::kCall,
         "io-error: cannot do table \"t\": reason [rejected /a]"},
        {vornjsondb::Amended(Step, Retry::kTransaction, "; more"), Retry::kTransaction,
         "io-error: reason; more [rejected /a]"},
    };
    for (const auto& Each : kCases) {
        EXPECT_EQ(Each.szText, Text(Each.Told));
        EXPECT_EQ(Each.eRetry, Each.Told.Advice());
        EXPECT_EQ(SQLITE_IOERR_WRITE, Each.Told.SqliteCode());
        EXPECT_EQ(ENOSPC, Each.Told.SystemError());
    }
}

class SqliteFailure : public TableTest {
  protected:
    // Code and advice for a result of SQLite that is not the connection's last.
    std::string Map(int nResult) {
        const Status Failed = vornjsondb::FailBySqlite(m_pDb, nResult, Doing{"do", nullptr});
        EXPECT_EQ(nResult, Failed.SqliteCode());
        static const char* const kAdvice[] = {"", " call", " transaction"};
        return Failed.CodeName() + std::string(kAdvice[static_cast<size_t>(Failed.Advice())]);
    }
};

TEST_F(SqliteFailure, CodesOfSqliteBecomeFew) {
    const struct {
        int nResult;
        const char* szExpected;
    } kCases[] = {
        {SQLITE_CONSTRAINT_PRIMARYKEY, "duplicate"},
        {SQLITE_CONSTRAINT_UNIQUE, "duplicate"},
        {SQLITE_CONSTRAINT_ROWID, "duplicate"},
        {SQLITE_CONSTRAINT, "constraint"},
        {SQLITE_CONSTRAINT_CHECK, "constraint"},
        {SQLITE_CONSTRAINT_FOREIGNKEY, "constraint"},
        {SQLITE_CONSTRAINT_NOTNULL, "constraint"},
        {SQLITE_CONSTRAINT_TRIGGER, "constraint"},
        {3091, "constraint"},
        {SQLITE_MISMATCH, "constraint"},
        {SQLITE_BUSY, "locked call"},
        {SQLITE_BUSY_RECOVERY, "locked call"},
        {SQLITE_BUSY_SNAPSHOT, "locked call"},
        {SQLITE_LOCKED, "locked"},
        {SQLITE_LOCKED_SHAREDCACHE, "locked call"},
        {SQLITE_PROTOCOL, "locked call"},
        {SQLITE_SCHEMA, "locked"},
        {SQLITE_READONLY, "read-only"},
        {SQLITE_READONLY_DBMOVED, "read-only"},
        {SQLITE_FULL, "disk-full"},
        {SQLITE_IOERR, "io-error"},
        {SQLITE_IOERR_FSYNC, "io-error"},
        {SQLITE_IOERR_WRITE, "io-error"},
        {SQLITE_CANTOPEN, "io-error"},
        {SQLITE_PERM, "io-error"},
        {SQLITE_NOLFS, "io-error"},
        {SQLITE_CORRUPT, "corrupt"},
        {SQLITE_CORRUPT_INDEX, "corrupt"},
        {8202, "corrupt"},
        {8458, "corrupt"},
        {SQLITE_NOTADB, "not-a-database"},
        {SQLITE_INTERRUPT, "interrupted"},
        {SQLITE_ABORT, "interrupted"},
        {SQLITE_ABORT_ROLLBACK, "interrupted"},
        {SQLITE_NOMEM, "no-memory"},
        {SQLITE_IOERR_NOMEM, "no-memory"},
        {SQLITE_MISUSE, "misuse"},
        {SQLITE_RANGE, "misuse"},
        {SQLITE_INTERNAL, "misuse"},
        {SQLITE_TOOBIG, "refused"},
        {SQLITE_AUTH, "refused"},
        {SQLITE_ERROR, "refused"},
    };
    for (const auto& Each : kCases) {
        EXPECT_EQ(Each.szExpected, Map(Each.nResult)) << Each.nResult;
    }
    Run("BEGIN");
    EXPECT_EQ("locked transaction", Map(SQLITE_BUSY));
    Run("COMMIT");
}

TEST(FindingsTest, WarningsComeWithSuccess) {
    Finding Warning = vornjsondb::RowOf(FindingCode::kNoKey);
    Warning.eSeverity = Severity::kWarning;
    const Status Fine = vornjsondb::FromFindings({Warning}, Doing{"do", nullptr});
    EXPECT_TRUE(Fine.Ok());
    EXPECT_EQ("", Fine.Message());
    EXPECT_EQ("ok [no-key ]", Text(Fine));
    Finding Error = vornjsondb::RowOf(FindingCode::kNotARecord);
    Error.strMessage = "it is none";
    const std::string strTable = "t\"";
    const Status Refused = vornjsondb::FromFindings({Warning, Error}, Doing{"do", &strTable});
    EXPECT_EQ("refused: cannot do table \"t\"\"\": it is none [no-key ] [not-a-record ]",
              Text(Refused));
}

TEST(FindingsTest, ValuesAreShownShort) {
    EXPECT_EQ("null", vornjsondb::Shown(Parse("null")));
    EXPECT_EQ("true", vornjsondb::Shown(Parse("true")));
    EXPECT_EQ("-5", vornjsondb::Shown(Parse("-5")));
    EXPECT_EQ("18446744073709551615", vornjsondb::Shown(Parse("18446744073709551615")));
    EXPECT_EQ("0.5", vornjsondb::Shown(Parse("0.5")));
    EXPECT_EQ("a list of 2", vornjsondb::Shown(Parse("[1, 2]")));
    EXPECT_EQ("an object of 1", vornjsondb::Shown(Parse(R"({"a": 1})")));
    EXPECT_EQ("\"" + std::string(60, 'x') + "\"", vornjsondb::ShownText(std::string(60, 'x')));
    EXPECT_EQ("\"" + std::string(60, 'x') + "\"...", vornjsondb::ShownText(std::string(61, 'x')));
    EXPECT_EQ("\"" + std::string(59, 'x') + "\"...",
              vornjsondb::ShownText(std::string(59, 'x') + "\xc3\xa4"));
    EXPECT_EQ("\"\"...", vornjsondb::ShownText(std::string(61, '\x80')));
}

TEST(FindingsTest, PathsAreJsonPointers) {
    EXPECT_EQ("/a~1b~0c", vornjsondb::Below("", "a/b~c"));
    EXPECT_EQ("/a/b", vornjsondb::Below("/a", "b"));
}

TEST(NearestTest, SlipsAreUnderstood) {
    const std::vector<std::string> vecNames = {"name", "size", "address", "id", "x"};
    const struct {
        const char* szTyped;
        const char* szMeant;
    } kCases[] = {
        {"nmae", "name"},
        {"nam", "name"},
        {"naame", "name"},
        {"nane", "name"},
        {"NAME", "name"},
        {"adress", "address"},
        {"adresses", "address"},
        {"si", ""},
        {"colour", ""},
        {"", ""},
        {"ix", "id"},
        {"y", ""},
        {"addres_line", ""},
    };
    for (const auto& Each : kCases) {
        EXPECT_EQ(Each.szMeant, vornjsondb::Nearest(Each.szTyped, vecNames)) << Each.szTyped;
    }
    EXPECT_EQ("", vornjsondb::Nearest(std::string(65, 'x'), {std::string(65, 'x')}));
    EXPECT_EQ("", vornjsondb::Nearest("zzzzab", {"yyyyba"}));
    EXPECT_EQ("", vornjsondb::Nearest("xyzmore", {"bmore"}));
    EXPECT_EQ("", vornjsondb::Nearest("12ba", {"34ab"}));
    EXPECT_EQ(" (did you mean \"size\"?)", vornjsondb::Suggestion("szie", vecNames));
    EXPECT_EQ("", vornjsondb::Suggestion("colour", vecNames));
}

}  // namespace

}  // namespace VORN_JSON_DB
