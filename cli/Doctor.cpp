// doctor: is the database sound, and who holds it.

#include <sys/stat.h>

#include <filesystem>
#include <fstream>
#include <sstream>

#include "Commands.h"
#include "Database.h"
#include "Output.h"
#include "Sql.h"

namespace VORN_JSON_DB::Cli {

namespace {

// A key of a form that SQLite cannot check is an error of it.
std::string BrokenKeys(sqlite3* pDb) {
    try {
        const std::vector<std::string> vecFound = Texts(pDb, "PRAGMA foreign_key_check");
        return vecFound.empty() ? "ok" : "broken in table \"" + vecFound[0] + "\"";
    } catch (const Error& Failed) {
        if (Failed.nExit != kExitUnexpected) {
            throw;
        }
        return sqlite3_errmsg(pDb);
    }
}

std::string Pragma(sqlite3* pDb, const std::string& strPragma) {
    const std::vector<std::string> vecFound = Texts(pDb, "PRAGMA " + strPragma);
    return vecFound.empty() ? "" : vecFound[0];
}

// The bytes that SQLite locks: in the database file, and in the -shm file beside it. Locks of a
// process that touch are one to the system, so the first row that has room for a lock counts.
struct LockRow {
    const char* szFile;
    long long nFirst, nLast;
    const char* szMeaning;
};
constexpr LockRow kLocks[] = {
    {"", 1073741824, 1073741824, "is about to write"},
    {"", 1073741825, 1073741825, "writes"},
    {"", 1073741826, 1073742335, "reads"},
    {"", 1073741824, 1073742335, "writes, and nobody else may read"},
    {"-shm", 120, 120, "writes"},
    {"-shm", 121, 121, "makes a checkpoint"},
    {"-shm", 122, 122, "recovers"},
    {"-shm", 123, 127, "reads"},
    {"-shm", 120, 127, "writes"},
};

std::string ProcessName(const std::string& strPid) {
    std::ifstream File("/proc/" + strPid + "/comm");
    std::string strName;
    std::getline(File, strName);
    return strName.empty() ? "unknown" : strName;
}

// A process may hold several locks, and stands in one row.
void AddMeaning(const std::string& strProcess, const std::string& strMeaning, Json::Value& jRows) {
    for (Json::Value& jRow : jRows) {
        std::string strResult = jRow["result"].asString();
        if (strResult.compare(0, strProcess.size(), strProcess) == 0) {
            if (strResult.find(strMeaning, strProcess.size()) == std::string::npos) {
                jRow["result"] = strResult.append(", ").append(strMeaning);
            }
            return;
        }
    }
    Json::Value jRow;
    jRow["check"] = "lock";
    jRow["result"] = strProcess + " " + strMeaning;
    jRows.append(std::move(jRow));
}

// "1: POSIX  ADVISORY  WRITE 123 08:01:4567 1073741825 1073741825". The own look at the file is
// over, so that this process is not among them.
void AppendLocks(const std::string& strFile, const char* szSuffix, Json::Value& jRows) {
    struct stat Is {};
    if (stat((strFile + szSuffix).c_str(), &Is) != 0) {
        return;
    }
    std::ifstream Locks("/proc/locks");
    for (std::string strLine; std::getline(Locks, strLine);) {
        std::istringstream Words(strLine);
        std::string strNumber, strClass, strKind, strMode, strPid, strPlace;
        long long nFirst = -1, nLast = -1;
        Words >> strNumber >> strClass >> strKind >> strMode >> strPid >> strPlace >> nFirst >>
            nLast;
        const std::size_t nColon = strPlace.rfind(':');
        if (nColon == std::string::npos ||
            strPlace.substr(nColon + 1) != std::to_string(Is.st_ino)) {
            continue;
        }
        for (const LockRow& Row : kLocks) {
            if (std::string(Row.szFile) == szSuffix && nFirst >= Row.nFirst && nLast <= Row.nLast) {
                AddMeaning("process " + strPid + " (" + ProcessName(strPid) + ")", Row.szMeaning,
                           jRows);
                break;
            }
        }
    }
}

}  // namespace

int RunDoctor(Context& Call) {
    Json::Value jRows(Json::arrayValue);
    const auto Add = [&jRows](const char* szCheck, const std::string& strResult) {
        Json::Value jRow;
        jRow["check"] = szCheck;
        jRow["result"] = strResult;
        jRows.append(std::move(jRow));
    };
    bool blSound = false;
    Error Locked{kExitFine, "", {}};
    try {
        const Database pDb = OpenDatabase(Call, Access::kRead);
        const std::string strIntegrity = Pragma(pDb.get(), "integrity_check(1)");
        const std::string strForeign = BrokenKeys(pDb.get());
        blSound = strIntegrity == "ok" && strForeign == "ok";
        Add("integrity", strIntegrity);
        Add("foreign keys", strForeign);
        Add("journal mode", Pragma(pDb.get(), "journal_mode"));
        Add("encoding", Pragma(pDb.get(), "encoding"));
        Add("pages", Pragma(pDb.get(), "page_count"));
        Add("free pages", Pragma(pDb.get(), "freelist_count"));
    } catch (const Error& Failed) {
        if (Failed.nExit != kExitLocked) {
            throw;
        }
        Locked = Failed;  // by whom is what is asked for
    }
    // SQLite has it beside the file that a symbolic link leads to.
    std::error_code Failed;
    const std::string strFile = std::filesystem::canonical(Call.Db(), Failed);
    AppendLocks(strFile, "", jRows);
    AppendLocks(strFile, "-shm", jRows);
    WriteObjects(Call, jRows, {"check", "result"});
    if (Locked.nExit != kExitFine) {
        throw Error(Locked);
    }
    return blSound ? kExitFine : kExitBadData;
}

}  // namespace VORN_JSON_DB::Cli
