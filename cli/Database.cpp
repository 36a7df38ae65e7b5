#include "Database.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <sstream>

#include "../table/Affinity.h"
#include "../table/Failure.h"
#include "JsonCells.h"
#include "input/ByteSource.h"
#include "input/LockWait.h"

namespace VORN_JSON_DB::Cli {

namespace {

const char kKeptTable[] = "vornjsondb_definition";
const char kTablesAndViews[] = "SELECT name FROM sqlite_master WHERE type IN ('table', 'view')";

constexpr int kFlags[] = {SQLITE_OPEN_READONLY, SQLITE_OPEN_READWRITE,
                          SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE};

std::string FolderOf(const std::string& strFile) {
    const std::size_t nSlash = strFile.rfind('/');
    return nSlash == std::string::npos ? "." : strFile.substr(0, nSlash + 1);
}

// As it was typed: SQLite itself knows the whole path.
std::string g_strOpened = "database";

[[noreturn]] void FailBySqlite(sqlite3* pDb, const std::string& strWhere) {
    std::string strLine = strWhere + ": " + sqlite3_errmsg(pDb);
    const StatusCode eCode =
        vornjsondb::FailBySqlite(pDb, sqlite3_extended_errcode(pDb), {"", nullptr}).Code();
    if (eCode == StatusCode::kLocked) {
        strLine = WithWait(std::move(strLine));
    }
    Fail(ExitOf(eCode, kExitUnexpected), strLine + HintFor(eCode));
}

// Bytes 18 and 19 of a database tell its journal: 2 is a WAL.
bool HasWal(const std::string& strFile) {
    ByteSource File;
    char szHeader[20];
    return File.Open(strFile) && File.Read(szHeader, sizeof szHeader) == sizeof szHeader &&
           szHeader[18] == 2;
}

// Reading it as it stands would miss what others write meanwhile, so that a copy is the way.
void CheckFolderOfWal(const std::string& strFile) {
    const std::string strFolder = FolderOf(strFile);
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
void RemoveEmpty(sqlite3* pDb, const std::string& strFile) {
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
    if (eAccess == Access::kCreate && access(strFile.c_str(), F_OK) != 0 && errno == ENOENT) {
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
}

int Look(sqlite3* pDb) {
    return sqlite3_exec(pDb, "SELECT 1 FROM sqlite_master LIMIT 1", nullptr, nullptr, nullptr);
}

bool SameName(const std::string& strLeft, const std::string& strRight) {
    return sqlite3_stricmp(strLeft.c_str(), strRight.c_str()) == 0;
}

// Members without a column go; columns that are no member come, but those that can be none.
void GoByColumns(const Json::Value& jColumns, Json::Value& jTable) {
    const std::vector<std::string> vecColumns = jColumns.getMemberNames();
    const std::vector<std::string> vecMembers = jTable["member"].getMemberNames();
    for (const std::string& strMember : vecMembers) {
        if (!HasName(vecColumns, strMember)) {
            jTable["member"].removeMember(strMember);
        }
    }
    for (const std::string& strColumn : vecColumns) {
        if (!HasName(vecMembers, strColumn) && strColumn.compare(0, 1, "$") != 0) {
            jTable["member"][strColumn] = jColumns[strColumn];
        }
    }
    // Without all of its members there is none; that of the real table counts.
    const Json::Value jKey = jTable.get("key", Json::Value());
    const auto fnGone = [&jTable](const Json::Value& jName) {
        return jName.isString() && !jTable["member"].isMember(jName.asString());
    };
    if (fnGone(jKey) || (jKey.isArray() && std::any_of(jKey.begin(), jKey.end(), fnGone))) {
        jTable.removeMember("key");
    }
}

}  // namespace

namespace {

Json::Value ParseKept(const Context& Call, const std::string& strTable,
                      const std::string& strText) {
    try {
        return ParseJson(strText, Call.Db() + ": the kept definition of \"" + strTable + "\"");
    } catch (Error& Failed) {
        Failed.strLine += "; give one by --def FILE, which vornjsondb sync keeps in its place";
        throw;
    }
}

}  // namespace

void CloseDatabase::operator()(sqlite3* pDb) const {
    if (!strMade.empty()) {
        RemoveEmpty(pDb, strMade);
    }
    sqlite3_close_v2(pDb);
}

Database OpenDatabase(const Context& Call, Access eAccess) {
    const std::string& strFile = Call.Db();
    g_strOpened = strFile;
    CheckFile(strFile, eAccess);
    const bool blNew = access(strFile.c_str(), F_OK) != 0;
    sqlite3* pDb = nullptr;
    const int nResult =
        sqlite3_open_v2(strFile.c_str(), &pDb, kFlags[static_cast<int>(eAccess)], nullptr);
    Database pOwner(pDb, CloseDatabase{blNew ? strFile : ""});
    if (nResult != SQLITE_OK) {
        Fail(kExitIo, strFile + ": " + sqlite3_errstr(nResult) + "; is it a file?");
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
            CheckFolderOfWal(strFile);
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

std::string ReadFile(const std::string& strFile) {
    ByteSource From;
    std::string strText;
    char szBlock[16384];
    From.Open(strFile);
    while (const std::size_t nRead = From.Read(szBlock, sizeof szBlock)) {
        strText.append(szBlock, nRead);
    }
    if (From.Error() != 0) {
        Fail(kExitIo, strFile + ": " + std::strerror(From.Error()) + "; check the name");
    }
    return strText;
}

namespace {

// The reader knows infinite numbers by their name only.
std::string WithInfinity(const std::string& strText) {
    constexpr char kTooGreat[] = "1e999";
    std::string strOut;
    bool blInText = false;
    for (std::size_t nAt = 0; nAt < strText.size(); ++nAt) {
        const char c = strText[nAt];
        const bool blAlone = nAt == 0 || std::strchr(" \t\n\r:,[-", strText[nAt - 1]) != nullptr;
        if (!blInText && blAlone && strText.compare(nAt, 5, kTooGreat) == 0) {
            strOut += "Infinity";
            nAt += 4;
            continue;
        }
        strOut += c;
        blInText = blInText != (c == '"');
        if (blInText && c == '\\' && nAt + 1 < strText.size()) {
            strOut += strText[++nAt];
        }
    }
    return strOut;
}

}  // namespace

Json::Value ParseJson(const std::string& strText, const std::string& strWhere, int nExit) {
    Json::CharReaderBuilder Builder;
    Json::CharReaderBuilder::strictMode(&Builder.settings_);
    Builder["strictRoot"] = false;
    const std::string strRead = WithInfinity(strText);
    Builder["allowSpecialFloats"] = strRead.size() != strText.size();
    Json::Value jValue;
    std::string strErrors;
    bool blParsed = false;
    try {
        const std::unique_ptr<Json::CharReader> pReader(Builder.newCharReader());
        blParsed =
            pReader->parse(strRead.data(), strRead.data() + strRead.size(), &jValue, &strErrors);
    } catch (const Json::Exception& Failed) {
        strErrors = Failed.what();
    }
    if (!blParsed) {
        // "* Line 1, Column 2\n  Missing ...\n"
        std::istringstream Lines(strErrors.substr(strErrors.compare(0, 2, "* ") == 0 ? 2 : 0));
        std::string strPlace;
        std::string strReason;
        std::getline(Lines, strPlace);
        std::getline(Lines, strReason);
        strReason.erase(0, strReason.find_first_not_of(' '));
        Fail(nExit, strWhere + ": " + strPlace + (strReason.empty() ? "" : ": " + strReason) +
                        "; it must be JSON");
    }
    return jValue;
}

Statement Prepare(sqlite3* pDb, const std::string& strSql) {
    sqlite3_stmt* pStatement = nullptr;
    if (sqlite3_prepare_v2(pDb, strSql.c_str(), static_cast<int>(strSql.size()) + 1, &pStatement,
                           nullptr) != SQLITE_OK) {
        FailBySqlite(pDb, g_strOpened);
    }
    return Statement(pStatement);
}

Statement Prepare(sqlite3* pDb, const std::string& strSql, const std::string& strText) {
    Statement pStatement = Prepare(pDb, strSql);
    sqlite3_bind_text(pStatement.get(), 1, strText.c_str(), -1, SQLITE_TRANSIENT);
    return pStatement;
}

std::vector<std::string> Texts(sqlite3* pDb, const std::string& strSql,
                               const std::string& strText) {
    const Statement pLook = Prepare(pDb, strSql, strText);
    std::vector<std::string> vecTexts;
    while (Step(pLook.get())) {
        vecTexts.push_back(ColumnText(pLook.get(), 0));
    }
    return vecTexts;
}

bool Step(sqlite3_stmt* pStatement) {
    const int nResult = sqlite3_step(pStatement);
    if (nResult != SQLITE_ROW && nResult != SQLITE_DONE) {
        FailBySqlite(sqlite3_db_handle(pStatement), g_strOpened);
    }
    return nResult == SQLITE_ROW;
}

void Run(sqlite3* pDb, const std::string& strSql) {
    const Statement pStatement = Prepare(pDb, strSql);
    while (Step(pStatement.get())) {
    }
}

std::string ColumnText(sqlite3_stmt* pStatement, int nColumn) {
    // As UTF-8, whatever the database has.
    const void* const pBytes = sqlite3_column_text(pStatement, nColumn);
    const auto nBytes = static_cast<std::size_t>(sqlite3_column_bytes(pStatement, nColumn));
    return pBytes == nullptr ? "" : std::string(static_cast<const char*>(pBytes), nBytes);
}

std::string Quoted(const std::string& strName) {
    std::string strQuoted = "\"";
    for (const char c : strName) {
        strQuoted += c == '"' ? "\"\"" : std::string(1, c);
    }
    return strQuoted + "\"";
}

std::vector<std::string> TableNames(sqlite3* pDb) {
    return Texts(pDb,
                 "SELECT name FROM sqlite_master WHERE type = 'table' AND name NOT LIKE "
                 "'sqlite\\_%' ESCAPE '\\' AND name <> 'vornjsondb_definition' ORDER BY name");
}

bool TableExists(sqlite3* pDb, const std::string& strTable) {
    return HasName(Texts(pDb, kTablesAndViews), strTable);
}

void FailNoTable(const Context& Call, sqlite3* pDb) {
    const std::string strHint = NearestHint(Call.TableName(), Texts(pDb, kTablesAndViews));
    Fail(kExitNotFound, Call.Db() + ": there is no table \"" + Call.TableName() + "\"" +
                            (strHint.empty() ? "; see vornjsondb tables" : strHint));
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

bool HasName(const std::vector<std::string>& vecNames, const std::string& strName) {
    return std::any_of(vecNames.begin(), vecNames.end(),
                       [&](const std::string& strEach) { return SameName(strEach, strName); });
}

std::vector<std::string> AnyColumns(sqlite3* pDb, const std::string& strTable) {
    // A SQLite that knows no such pragma knows no STRICT table, either.
    const Statement pList = Prepare(pDb, "PRAGMA main.table_list(" + Quoted(strTable) + ")");
    const bool blStrict = Step(pList.get()) && sqlite3_column_int(pList.get(), 5) != 0;
    if (!blStrict) {
        return {};
    }
    return Texts(pDb, "SELECT name FROM pragma_table_info(?1) WHERE type = 'ANY' COLLATE NOCASE",
                 strTable);
}

std::vector<std::string> NumberColumns(sqlite3* pDb, const std::string& strTable) {
    using vornjsondb::Affinity;
    const std::vector<std::string> vecAny = AnyColumns(pDb, strTable);
    const Statement pLook = Prepare(pDb, "SELECT name, type FROM pragma_table_info(?1)", strTable);
    std::vector<std::string> vecNames;
    while (Step(pLook.get())) {
        const std::string strName = ColumnText(pLook.get(), 0);
        const Affinity eAffinity = vornjsondb::AffinityOf(ColumnText(pLook.get(), 1));
        if (eAffinity != Affinity::kNone && eAffinity != Affinity::kText &&
            !HasName(vecAny, strName)) {
            vecNames.push_back(strName);
        }
    }
    return vecNames;
}

std::string NumberColumnText(const std::string& strColumn, std::string_view strText) {
    return "member \"" + strColumn + "\": its column would turn the text \"" +
           std::string(strText) + "\" into a number: give a number, or make the column TEXT";
}

void CheckNewName(const std::string& strTable) {
    if (strTable.empty()) {
        Fail(kExitUsage, "the name of the new table is empty; give it one");
    }
    if (sqlite3_strnicmp(strTable.c_str(), "sqlite_", 7) == 0) {
        Fail(kExitUsage,
             "\"" + strTable + "\": names that begin with sqlite_ are SQLite's own; take another");
    }
}

void CheckDefaults(const std::string& strTable, const Json::Value& jDefinition) {
    for (const Finding& Found : LintDefinition(strTable, jDefinition)) {
        if (std::strcmp(Found.szCode, "bad-default") == 0) {
            Fail(kExitBadData, "default of table \"" + strTable + "\": " + Found.strMessage +
                                   "; give one that the type can hold");
        }
    }
}

Json::Value KnownDefinition(const Context& Call, sqlite3* pDb, const std::string& strTable) {
    const std::string strFile = Call.Text("--def");
    if (!strFile.empty()) {
        Json::Value jDefinition = ParseJson(ReadFile(strFile), strFile);
        if (!jDefinition.isObject() || !jDefinition.isMember(strTable)) {
            Fail(kExitBadData, strFile + ": it holds no definition of \"" + strTable +
                                   "\"; it must be an object with that member");
        }
        return jDefinition;
    }
    // One that outlived its table says nothing about the next one of that name.
    if (!TableExists(pDb, kKeptTable) || !TableExists(pDb, strTable)) {
        return {};
    }
    const Statement pLook = Prepare(pDb,
                                    std::string("SELECT name, definition FROM ") + kKeptTable +
                                        " WHERE name = ?1 COLLATE NOCASE",
                                    strTable);
    if (!Step(pLook.get())) {
        return {};
    }
    const Json::Value jKept = ParseKept(Call, strTable, ColumnText(pLook.get(), 1));
    // To SQLite a table is the same in any letter case.
    const std::string strKept = ColumnText(pLook.get(), 0);
    Json::Value jDefinition;
    jDefinition[strTable] =
        jKept.isObject() && jKept.isMember(strKept) ? jKept[strKept] : Json::Value();
    return jDefinition;
}

Json::Value CurrentDefinition(const Context& Call, sqlite3* pDb, const std::string& strTable) {
    Json::Value jDefinition = KnownDefinition(Call, pDb, strTable);
    Json::Value jReal;
    const bool blKept = !jDefinition.isNull() && !Call.Has("--def") &&
                        jDefinition[strTable].isObject() &&
                        jDefinition[strTable]["member"].isObject();
    if (blKept && DefinitionOf(pDb, strTable, jReal).Ok()) {
        GoByColumns(jReal[strTable]["member"], jDefinition[strTable]);
    }
    return jDefinition;
}

std::vector<std::string> LeftOverDefinitions(sqlite3* pDb) {
    if (!TableExists(pDb, kKeptTable)) {
        return {};
    }
    return Texts(pDb, std::string("SELECT name FROM ") + kKeptTable + " k WHERE NOT EXISTS (" +
                          kTablesAndViews + " AND name = k.name COLLATE NOCASE) ORDER BY name");
}

void KeepDefinition(sqlite3* pDb, const std::string& strTable, const Json::Value& jDefinition) {
    Run(pDb, std::string("CREATE TABLE IF NOT EXISTS ") + kKeptTable +
                 " (name TEXT PRIMARY KEY NOT NULL, definition TEXT NOT NULL)");
    const Statement pDelete =
        Prepare(pDb, std::string("DELETE FROM ") + kKeptTable + " WHERE name = ?1 COLLATE NOCASE",
                strTable);
    const Statement pWrite =
        Prepare(pDb, std::string("INSERT INTO ") + kKeptTable + " VALUES (?1, ?2)", strTable);
    Json::Value jKept;
    jKept[strTable] = jDefinition[strTable];
    const std::string strText = CompactJson(jKept);
    sqlite3_bind_text(pWrite.get(), 2, strText.c_str(), -1, SQLITE_TRANSIENT);
    Step(pDelete.get());
    Step(pWrite.get());
}

Replacements::Replacements(sqlite3* pDb, const std::string& strTable) {
    const bool blReplaces =
        !Texts(pDb,
               "SELECT 1 FROM sqlite_master WHERE type = 'table' AND name = ?1 COLLATE NOCASE AND "
               "sql LIKE '%CONFLICT%REPLACE%'",
               strTable)
             .empty();
    if (blReplaces) {
        m_pCount = Prepare(pDb, "SELECT count(*) FROM " + Quoted(strTable));
        m_nBefore = Count();
    }
}

std::int64_t Replacements::Count() const {
    sqlite3_reset(m_pCount.get());
    Step(m_pCount.get());
    const std::int64_t nCount = sqlite3_column_int64(m_pCount.get(), 0);
    sqlite3_reset(m_pCount.get());
    return nCount;
}

std::int64_t Replacements::Gone(std::int64_t nInserted) const {
    return m_pCount ? std::max<std::int64_t>(0, m_nBefore + nInserted - Count()) : 0;
}

std::string GoneText(std::int64_t nGone) {
    return nGone == 0 ? ""
                      : "; " + std::to_string(nGone) +
                            (nGone == 1 ? " other record is" : " other records are") +
                            " gone, by the table's own ON CONFLICT REPLACE";
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
