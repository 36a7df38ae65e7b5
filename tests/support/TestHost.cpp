#include "TestHost.h"

#include <sys/types.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <memory>

#include "../../src/schema/KnownTables.h"
#include "Recorder.h"

namespace testhost {
namespace {

int AppendRow(void* pArg, int nColumns, char** aszValues, char**) {
    std::string& strRows = *static_cast<std::string*>(pArg);
    if (!strRows.empty()) {
        strRows += '\n';
    }
    for (int i = 0; i < nColumns; ++i) {
        strRows += i > 0 ? "|" : "";
        strRows += aszValues[i] == nullptr ? "NULL" : aszValues[i];
    }
    return 0;
}

// A directory of this process alone; a forked child that ends early must not remove it.
class TempDirectory {
  public:
    TempDirectory() : m_nOwner(::getpid()) {
        std::string strPattern =
            (std::filesystem::temp_directory_path() / "vornjsondb-XXXXXX").string();
        if (::mkdtemp(strPattern.data()) == nullptr) {
            std::perror("cannot create a temporary directory");
            std::abort();
        }
        m_path = strPattern;
    }
    ~TempDirectory() {
        if (::getpid() == m_nOwner) {
            std::error_code error;
            std::filesystem::remove_all(m_path, error);
        }
    }
    TempDirectory(const TempDirectory&) = delete;
    TempDirectory& operator=(const TempDirectory&) = delete;

    std::string File(const std::string& strName) const { return (m_path / strName).string(); }

  private:
    pid_t m_nOwner;
    std::filesystem::path m_path;
};

}  // namespace

// A failed test shows it: its own messages are in it, too.
bool IsCapturedTextShown() {
    return ::testing::Test::HasFailure();
}

void ForgetTables() {
    vornjsondb::KnownTables::OfProcess().Forget();
}

void ResetHost() {
    ForgetTables();
    ResetExits();
    errno = 0;
}

int BareExec(sqlite3* pDb, const std::string& strSql, std::string* pstrError) {
    char* szError = nullptr;
    const int nResult = RealExec(pDb, strSql.c_str(), nullptr, nullptr, &szError);
    if (pstrError != nullptr) {
        *pstrError = szError == nullptr ? "" : szError;
    }
    sqlite3_free(szError);
    return nResult;
}

std::string BareRows(sqlite3* pDb, const std::string& strSql) {
    std::string strRows;
    char* szError = nullptr;
    const int nResult = RealExec(pDb, strSql.c_str(), AppendRow, &strRows, &szError);
    EXPECT_EQ(nResult, SQLITE_OK) << strSql << ": " << (szError == nullptr ? "" : szError);
    sqlite3_free(szError);
    return strRows;
}

Json::Value ParseJson(const std::string& strText) {
    Json::Value jValue;
    EXPECT_TRUE(jsonhelpers::Parse(strText, jValue)) << strText;
    return jValue;
}

std::string TempFile(const char* szStem) {
    static const TempDirectory directory;
    static int nFiles = 0;
    return directory.File(std::string(szStem) + "-" + std::to_string(++nFiles));
}

}  // namespace testhost
