#include "Database.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "Sql.h"
#include "Tables.h"
#include "input/ByteSource.h"
#include "input/LockWait.h"

namespace VORN_JSON_DB::Cli {

namespace {

constexpr int kFlags[] = {SQLITE_OPEN_READONLY, SQLITE_OPEN_READWRITE,
                          SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE};

std::string FolderOf(const std::string& strFile) {
    const std::size_t nSlash = strFile.rfind('/');
    return nSlash == std::string::npos ? "." : strFile.substr(0, nSlash + 1);
}

// Bytes 18 and 19 of a database tell its journal: 2 is a WAL.
bool HasWal(const std::string& strFile) {
    ByteSource File;
    char szHeader[20];
    return File.Open(strFile) && File.Read(szHeader, sizeof szHeader) == sizeof szHeader &&
           szHeader[18] == 2;
}

// Reading it as it stands would miss what others write meanwhile, so that a copy is the way.
void CheckFolderOfWal(const std::string& strFile, sqlite3* pDb) {
    const std::string strFolder = FolderOf(sqlite3_db_filename(pDb, nullptr));
    if (access(strFolder.c_str(), W_OK) != 0 && HasWal(strFile)) {
        Fail(kExitIo, strFile +
                          ": it is in WAL mode, in which SQLite writes beside the file even "
                          "to read it, and its folder cannot be written to: " +
                          std::strerror(errno) + "; copy it, with " + strFile +
                          "-wal if there is one, to a folder that can be");
    }
}

bool IsEmpty(const std::string& strFile) {
    struct stat Now {};
    return stat(strFile.c_str(), &Now) == 0 && Now.st_size == 0;
}

// Under a lock that nobody has beside it: another program may be about to store something.
void RemoveEmpty(sqlite3* pDb) {
    // What a symbolic link leads to, which itself stays.
    const std::string strFile = sqlite3_db_filename(pDb, nullptr);
    if (!IsEmpty(strFile)) {
        return;
    }
    sqlite3_busy_timeout(pDb, 0);
    // A full disk has no room for a journal.
    const int nLocked =
        sqlite3_exec(pDb, "PRAGMA journal_mode = off; BEGIN EXCLUSIVE", nullptr, nullptr, nullptr);
    if (nLocked == SQLITE_OK && IsEmpty(strFile)) {
        unlink(strFile.c_str());
    }
}

void CheckFile(const std::string& strFile, Access eAccess) {
    // SQLite takes these for databases that end with the call, and all that it stored; or for
    // another file than the one that is looked at here.
    if (strFile.empty() || strFile == ":memory:" || strFile.compare(0, 5, "file:") == 0) {
        Fail(kExitUsage, "\"" + strFile + "\" names no file; name the file of a database");
    }
    struct stat Found {};
    if (stat(strFile.c_str(), &Found) != 0 && errno == ENOENT && eAccess == Access::kCreate) {
        if (access(FolderOf(strFile).c_str(), W_OK | X_OK) != 0) {
            Fail(kExitIo, strFile + ": " + std::strerror(errno) + "; check the folder");
        }
        return;
    }
    if (access(strFile.c_str(), eAccess == Access::kRead ? R_OK : R_OK | W_OK) != 0) {
        const int nError = errno;
        Fail(kExitIo, strFile + ": " + std::strerror(nError) +
                          (nError == ENOENT ? "; check the name, or make it with init or insert"
                                            : "; check its permissions"));
    }
    // What is written to a device is gone, and a pipe that nobody writes to is waited for.
    if (!S_ISREG(Found.st_mode)) {
        Fail(kExitIo,
             strFile + ": it is a folder, a pipe or a device; name the file of a database");
    }
}

int Look(sqlite3* pDb) {
    return sqlite3_exec(pDb, "SELECT 1 FROM sqlite_master LIMIT 1", nullptr, nullptr, nullptr);
}

}  // namespace

void CloseDatabase::operator()(sqlite3* pDb) const {
    if (blMade) {
        RemoveEmpty(pDb);
    }
    sqlite3_close_v2(pDb);
}

Database OpenDatabase(const Context& Call, Access eAccess) {
    const std::string& strFile = Call.Db();
    NameDatabase(strFile);
    CheckFile(strFile, eAccess);
    const bool blNew = access(strFile.c_str(), F_OK) != 0;
    sqlite3* pDb = nullptr;
    const int nResult =
        sqlite3_open_v2(strFile.c_str(), &pDb, kFlags[static_cast<int>(eAccess)], nullptr);
    Database pOwner(pDb, CloseDatabase{blNew && nResult == SQLITE_OK});
    if (nResult != SQLITE_OK) {
        Fail(kExitIo, strFile + ": " + sqlite3_errstr(nResult) + "; check the folder");
    }
    sqlite3_extended_result_codes(pDb, 1);
    WaitForLocks(pDb, Call.WaitMs());
    // SQLite looks into the file no sooner than now.
    int nLooked = Look(pDb);
    if (nLooked == SQLITE_READONLY_ROLLBACK) {
        // A killed program left changes half done; who only reads can neither read past nor undo
        // them.
        OpenDatabase(Call, Access::kChange);
        nLooked = Look(pDb);
    }
    if (nLooked != SQLITE_OK) {
        const int nPrimary = nLooked & 0xFF;
        if (nPrimary == SQLITE_CANTOPEN || nPrimary == SQLITE_READONLY) {
            CheckFolderOfWal(strFile, pDb);
        }
        FailBySqlite(pDb, strFile);
    }
    return pOwner;
}

void CheckInPlace(const Context& Call, sqlite3* pDb) {
    int nMoved = 0;
    sqlite3_file_control(pDb, nullptr, SQLITE_FCNTL_HAS_MOVED, &nMoved);
    if (nMoved != 0) {
        Fail(kExitIo, Call.Db() + ": another program has removed or replaced the file; try again");
    }
}

void CheckEncoding(const Context& Call, sqlite3* pDb) {
    const std::string strEncoding = Texts(pDb, "PRAGMA encoding").at(0);
    if (strEncoding != "UTF-8") {
        Fail(kExitBadData, Call.Db() + ": its texts are in " + strEncoding +
                               ", not in UTF-8; copy its tables by vornjsondb dump " + Call.Db() +
                               " TABLE | vornjsondb load COPY");
    }
}

void BeginChange(const Context& Call, sqlite3* pDb, Transaction& All) {
    const Status Begun = All.Begin(pDb, Transaction::Mode::kImmediate, kWaitedBySqlite);
    CheckInPlace(Call, pDb);
    Check(Begun, Call.Db());
}

std::string NameForSqlite(const std::string& strTable, Access eAccess) {
    if (!SameName(strTable, "sqlite_schema") && !SameName(strTable, "sqlite_master")) {
        return strTable;
    }
    if (eAccess != Access::kRead) {
        Fail(kExitUsage, "table \"" + strTable +
                             "\" is SQLite's own and can only be read; tables are changed by init, "
                             "sync and index");
    }
    return "sqlite_master";
}

Options HowToOpen() {
    Options How;
    How.blCompatible = false;
    How.nWaitMs = kWaitedBySqlite;
    return How;
}

OpenTable::OpenTable(const Context& Call, Access eAccess, Definition pfnDefinition)
    : pDb(OpenDatabase(Call, eAccess)) {
    CheckEncoding(Call, pDb.get());
    const std::string strTable = NameForSqlite(Call.TableName(), eAccess);
    const Json::Value jDefinition = pfnDefinition(Call, pDb.get(), strTable);
    const Status Opened = Records.Open(pDb.get(), strTable, jDefinition, HowToOpen());
    if (Opened.Code() == StatusCode::kNotFound) {
        FailNoTable(Call, pDb.get());
    }
    Check(Opened, Call.Db(), kExitBadData);
}

}  // namespace VORN_JSON_DB::Cli
