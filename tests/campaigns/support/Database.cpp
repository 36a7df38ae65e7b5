#include <dirent.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sstream>

#include "Campaign.h"

namespace campaign {

Database::Database(const std::string& strPath, const char* szVfs) {
    const int nStatus =
        sqlite3_open_v2(strPath.c_str(), &m_pDb, SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE, szVfs);
    Expect(nStatus == SQLITE_OK, [&] { return "cannot open " + strPath; });
}

Database::~Database() {
    // A statement that was left open would make this fail.
    const int nStatus = sqlite3_close(m_pDb);
    Expect(nStatus != SQLITE_BUSY, [] { return std::string("a statement was left open"); });
}

void Database::Run(const std::string& strSql) const {
    char* szError = nullptr;
    const int nStatus = sqlite3_exec(m_pDb, strSql.c_str(), nullptr, nullptr, &szError);
    Expect(nStatus == SQLITE_OK,
           [&] { return strSql + ": " + (szError == nullptr ? "no text" : szError); });
    sqlite3_free(szError);
}

namespace {

std::string Literal(sqlite3_stmt* pStatement, int nColumn) {
    if (sqlite3_column_type(pStatement, nColumn) == SQLITE_NULL) {
        return "NULL";
    }
    const bool blText = sqlite3_column_type(pStatement, nColumn) == SQLITE_TEXT;
    const char* pText = reinterpret_cast<const char*>(sqlite3_column_text(pStatement, nColumn));
    const int nBytes = sqlite3_column_bytes(pStatement, nColumn);
    const std::string strText(pText, static_cast<std::size_t>(nBytes));
    return blText ? "'" + strText + "'" : strText;
}

}  // namespace

std::string Database::Rows(const std::string& strSql) const {
    sqlite3_stmt* pStatement = nullptr;
    std::string strRows;
    int nStatus = sqlite3_prepare_v2(m_pDb, strSql.c_str(), -1, &pStatement, nullptr);
    while (nStatus == SQLITE_OK || nStatus == SQLITE_ROW) {
        nStatus = sqlite3_step(pStatement);
        for (int i = 0; nStatus == SQLITE_ROW && i < sqlite3_column_count(pStatement); ++i) {
            strRows += (i > 0 ? "|" : "") + Literal(pStatement, i);
        }
        strRows += nStatus == SQLITE_ROW ? "\n" : "";
    }
    if (nStatus != SQLITE_DONE) {
        strRows += std::string("error: ") + sqlite3_errmsg(m_pDb);
    }
    sqlite3_finalize(pStatement);
    return strRows;
}

// ---- files --------------------------------------------------------------------------------------

namespace {

class Folder {
  public:
    Folder() : m_nOwner(getpid()) {
        const char* szTmp = std::getenv("TMPDIR");
        m_strPath = std::string(szTmp == nullptr ? "/tmp" : szTmp) + "/vornjsondb-XXXXXX";
        if (mkdtemp(m_strPath.data()) == nullptr) {
            std::perror("mkdtemp");
            std::exit(2);
        }
    }
    ~Folder() {
        if (getpid() != m_nOwner) {
            return;
        }
        if (DIR* pFolder = opendir(m_strPath.c_str())) {
            while (const dirent* pEntry = readdir(pFolder)) {
                unlink((m_strPath + "/" + pEntry->d_name).c_str());
            }
            closedir(pFolder);
        }
        rmdir(m_strPath.c_str());
    }
    Folder(const Folder&) = delete;
    Folder& operator=(const Folder&) = delete;

    pid_t m_nOwner;
    std::string m_strPath;
};

}  // namespace

const std::string& TempFolder() {
    static const Folder s_folder;
    return s_folder.m_strPath;
}

void RemoveDatabase(const std::string& strPath) {
    for (const char* szTail : {"", "-journal", "-wal", "-shm"}) {
        unlink((strPath + szTail).c_str());
    }
}

std::string ReadFile(const std::string& strPath) {
    const std::ifstream stream(strPath, std::ios::binary);
    std::ostringstream bytes;
    bytes << stream.rdbuf();
    return bytes.str();
}

void WriteFile(const std::string& strPath, const std::string& strBytes) {
    std::ofstream(strPath, std::ios::binary | std::ios::trunc) << strBytes;
}

}  // namespace campaign
