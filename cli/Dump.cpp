// dump and load: one table as JSON Lines, exact. The first line describes the table, each further
// one is a row as a list, and the last one has a count and a checksum, so that a cut file is found.

#include <cstdio>
#include <limits>

#include "Commands.h"
#include "Database.h"
#include "Definitions.h"
#include "JsonCells.h"
#include "JsonFile.h"
#include "Sql.h"
#include "Tables.h"
#include "input/ByteSource.h"
#include "input/DumpRow.h"
#include "input/InputFiles.h"
#include "input/Interrupt.h"
#include "input/LineBuffer.h"
#include "input/LockWait.h"

namespace VORN_JSON_DB::Cli {

namespace {

const char kStreamFormat[] = "vornjsondb-dump";
constexpr int kVersion = 1;

// FNV-1a: against accidents, not against people.
class Checksum {
  public:
    void Add(std::string_view strLine) {
        for (const char c : strLine) {
            m_nHash = (m_nHash ^ static_cast<unsigned char>(c)) * 1099511628211U;
        }
    }
    std::string Text() const {
        char szHex[17];
        static_cast<void>(std::snprintf(szHex, sizeof szHex, "%016llx",
                                        static_cast<unsigned long long>(m_nHash)));
        return szHex;
    }

  private:
    std::uint64_t m_nHash = 14695981039346656037U;
};

// A name by which the table's rowid can be read; empty when there is none.
std::string RowidName(sqlite3* pDb, const std::string& strTable) {
    const std::vector<std::string> vecColumns =
        Texts(pDb, "SELECT name FROM pragma_table_xinfo(?1)", strTable);
    for (const char* const szName : {"rowid", "_rowid_", "oid"}) {
        const std::string strSql = "SELECT " + std::string(szName) + " FROM " + Quoted(strTable);
        sqlite3_stmt* pStatement = nullptr;
        sqlite3_prepare_v2(pDb, strSql.c_str(), -1, &pStatement, nullptr);
        const Statement pOwner(pStatement);
        if (!HasName(vecColumns, szName) && pStatement != nullptr) {
            return szName;
        }
    }
    return "";
}

void AppendColumn(std::string& strOut, sqlite3_stmt* pRow, int nColumn) {
    const auto Bytes = [&] {
        const void* const pBytes = sqlite3_column_blob(pRow, nColumn);
        const auto nBytes = static_cast<std::size_t>(sqlite3_column_bytes(pRow, nColumn));
        return std::string_view(static_cast<const char*>(pBytes), nBytes);
    };
    switch (sqlite3_column_type(pRow, nColumn)) {
        case SQLITE_INTEGER:
            return AppendInteger(strOut, sqlite3_column_int64(pRow, nColumn));
        case SQLITE_FLOAT:
            return AppendExactReal(strOut, sqlite3_column_double(pRow, nColumn));
        case SQLITE_TEXT:
            sqlite3_column_text(pRow, nColumn);  // from now on UTF-8, whatever the database has
            return AppendExactText(strOut, Bytes());
        case SQLITE_BLOB:
            return AppendBlob(strOut, Bytes());
        default:
            strOut += "null";
    }
}

std::string QuotedColumns(const Json::Value& jHeader) {
    std::string strNames;
    for (const Json::Value& jColumn : jHeader["columns"]) {
        strNames += (strNames.empty() ? "" : ", ") + Quoted(jColumn.asString());
    }
    return strNames;
}

struct Described {
    Json::Value jHeader;
    std::string strSelect;
};

Described Describe(const Context& Call, sqlite3* pDb) {
    const std::vector<std::string> vecFound = Texts(
        pDb,
        "SELECT name FROM sqlite_master WHERE type = 'table' AND name = ?1 COLLATE NOCASE AND "
        "sql NOT LIKE 'CREATE VIRTUAL %' AND name NOT LIKE 'sqlite\\_%' ESCAPE '\\'",
        Call.TableName());
    if (vecFound.empty()) {
        Fail(kExitNotFound, Call.Db() + ": there is no table \"" + Call.TableName() +
                                "\" that can be dumped; see vornjsondb tables");
    }
    const std::string& strTable = vecFound[0];
    Described Found;
    Json::Value& jHeader = Found.jHeader;
    jHeader["format"] = kStreamFormat;
    jHeader["version"] = kVersion;
    jHeader["table"] = strTable;
    const Json::Value jDefinition = KnownDefinition(Call, pDb, strTable);
    if (!jDefinition.isNull()) {
        jHeader["definition"] = jDefinition;
    }
    jHeader["statements"] = Strings(
        Texts(pDb,
              "SELECT sql FROM sqlite_master WHERE tbl_name = ?1 AND sql IS NOT NULL ORDER BY "
              "type <> 'table', type, name",
              strTable));
    for (const Json::Value& jSql : jHeader["statements"]) {
        if (!IsUtf8(jSql.asString())) {
            Fail(kExitBadData,
                 Call.Db() + ": what creates table \"" + strTable +
                     "\" is no UTF-8, which a dump cannot hold; rename what is in it");
        }
    }
    std::vector<std::string> vecColumns = Texts(
        pDb, "SELECT name FROM pragma_table_xinfo(?1) WHERE hidden = 0 ORDER BY cid", strTable);
    const std::string strRowid = RowidName(pDb, strTable);
    // SQLite reads no more columns at a time than a table may have.
    const int nMost = sqlite3_limit(pDb, SQLITE_LIMIT_COLUMN, -1);
    if (!strRowid.empty() && vecColumns.size() < static_cast<std::size_t>(nMost)) {
        vecColumns.insert(vecColumns.begin(), strRowid);
    }
    jHeader["columns"] = Strings(vecColumns);
    if (TableExists(pDb, "sqlite_sequence")) {
        const Statement pCounter =
            Prepare(pDb, "SELECT seq FROM sqlite_sequence WHERE name = ?1", strTable);
        if (Step(pCounter.get())) {
            jHeader["sequence"] = Json::Int64(sqlite3_column_int64(pCounter.get(), 0));
        }
    }
    Found.strSelect = "SELECT " + QuotedColumns(jHeader) + " FROM " + Quoted(strTable);
    return Found;
}

// Lines with their numbers, from a file or standard input.
class LineReader {
  public:
    explicit LineReader(const std::string& strFile)
        : m_Lines(m_File, std::numeric_limits<std::size_t>::max()) {
        if (!m_File.Open(strFile)) {
            FailToRead(m_File);
        }
    }

    bool Next() {
        const bool blThere = m_Lines.Next();
        if (Interrupt::Came() || m_File.Error() != 0) {
            FailToRead(m_File);
        }
        m_nLine += 1;
        return blThere;
    }

    std::string_view Line() { return {m_Lines.Begin(), m_Lines.Size()}; }
    std::string Place() const { return m_File.Name() + ":" + std::to_string(m_nLine); }
    Json::Value Parsed() { return ParseJson(std::string(Line()), Place()); }
    void BindTo(sqlite3_stmt* pRow) {
        const std::string strWrong = BindRow(m_Lines, pRow);
        if (!strWrong.empty()) {
            FailHere(strWrong);
        }
    }

    [[noreturn]] void FailHere(const std::string& strWhat) const {
        Fail(kExitBadData, Place() + ": " + strWhat + "; dump the table again");
    }

  private:
    ByteSource m_File;
    LineBuffer m_Lines;
    std::int64_t m_nLine = 0;
};

Statement PrepareInsert(sqlite3* pDb, const Json::Value& jHeader) {
    std::string strMarks;
    for (Json::ArrayIndex nAt = 0; nAt < jHeader["columns"].size(); ++nAt) {
        strMarks += nAt == 0 ? "?" : ", ?";
    }
    return Prepare(pDb, "INSERT INTO " + Quoted(jHeader["table"].asString()) + " (" +
                            QuotedColumns(jHeader) + ") VALUES (" + strMarks + ")");
}

void CheckHeader(const LineReader& From, const Json::Value& jHeader) {
    const bool blDump = jHeader.isObject() && jHeader["format"] == kStreamFormat &&
                        jHeader["table"].isString() && jHeader["columns"].isArray() &&
                        jHeader["statements"].isArray() && !jHeader["statements"].empty();
    if (!blDump) {
        From.FailHere("this is no dump");
    }
    if (jHeader["version"] != kVersion) {
        From.FailHere("version " + CompactJson(jHeader["version"]) + " is not known here");
    }
    const Json::Value jKept = jHeader.get("definition", Json::Value());
    if (!jKept.isNull() && !jKept.isObject()) {
        From.FailHere("the definition is no object");
    }
    if (jHeader.isMember("sequence") && !jHeader["sequence"].isInt64()) {
        From.FailHere("the counter is no number");
    }
    for (const Json::Value& jColumn : jHeader["columns"]) {
        if (!jColumn.isString()) {
            From.FailHere("a column has no name");
        }
    }
    for (const Json::Value& jSql : jHeader["statements"]) {
        if (!jSql.isString() || jSql.asString().compare(0, 7, "CREATE ") != 0) {
            From.FailHere("a statement creates nothing");
        }
    }
}

// Dumps one after another are not loaded in part without a word.
void CheckEnd(LineReader& From) {
    while (From.Next()) {
        if (!From.Line().empty()) {
            Fail(
                kExitBadData,
                From.Place() + ": something follows the dump of a table; load each dump by itself");
        }
    }
}

void CheckLast(LineReader& From, std::int64_t nRows, const Checksum& Sum) {
    const Json::Value jLast = From.Parsed();
    if (jLast["rows"] != Json::Int64(nRows) || jLast["checksum"] != Sum.Text()) {
        From.FailHere("count or checksum differ from what is above");
    }
    CheckEnd(From);
}

std::int64_t LoadRows(LineReader& From, sqlite3* pDb, const Json::Value& jHeader) {
    const Statement pInsert = PrepareInsert(pDb, jHeader);
    Checksum Sum;
    Sum.Add(From.Line());  // the header
    for (std::int64_t nRows = 0; From.Next(); ++nRows) {
        if (From.Line().substr(0, 1) == "{") {
            CheckLast(From, nRows, Sum);
            return nRows;
        }
        Sum.Add(From.Line());
        From.BindTo(pInsert.get());
        Step(pInsert.get());
        sqlite3_reset(pInsert.get());
    }
    From.FailHere("the end is missing");
}

// The counter of AUTOINCREMENT may be ahead of the greatest rowid.
void SetSequence(sqlite3* pDb, const Json::Value& jHeader) {
    const std::string strTable = jHeader["table"].asString();
    const Statement pDelete = Prepare(pDb, "DELETE FROM sqlite_sequence WHERE name = ?1", strTable);
    const Statement pInsert = Prepare(pDb, "INSERT INTO sqlite_sequence VALUES (?1, ?2)", strTable);
    sqlite3_bind_int64(pInsert.get(), 2, jHeader["sequence"].asInt64());
    Step(pDelete.get());
    Step(pInsert.get());
}

}  // namespace

int RunDump(Context& Call) {
    const Database pDb = OpenDatabase(Call, Access::kRead);
    // Description and rows are of one moment.
    Transaction All;
    Check(All.Begin(pDb.get(), Transaction::Mode::kDeferred, kWaitedBySqlite), Call.Db());
    const Described Found = Describe(Call, pDb.get());
    const Statement pRow = Prepare(pDb.get(), Found.strSelect);
    Checksum Sum;
    std::int64_t nRows = 0;
    std::string strLine = CompactJson(Found.jHeader);
    Sum.Add(strLine);
    Put(strLine + "\n");
    while (Step(pRow.get())) {
        strLine = '[';
        for (int nColumn = 0; nColumn < sqlite3_column_count(pRow.get()); ++nColumn) {
            strLine += nColumn == 0 ? "" : ",";
            AppendColumn(strLine, pRow.get(), nColumn);
        }
        strLine += ']';
        Sum.Add(strLine);
        Put(strLine + "\n");
        ++nRows;
    }
    Put("{\"rows\":" + std::to_string(nRows) + R"(,"checksum":")" + Sum.Text() + "\"}\n");
    return kExitFine;
}

namespace {

int Load(const Context& Call) {
    LineReader From(Call.vecWords.size() > 1 ? Call.vecWords[1] : "-");
    if (!From.Next()) {
        From.FailHere("it is empty");
    }
    const Json::Value jHeader = From.Parsed();
    CheckHeader(From, jHeader);
    const std::string strTable = jHeader["table"].asString();
    const Database pDb = OpenDatabase(Call, Access::kCreate);
    Transaction All;
    BeginChange(Call, pDb.get(), All);
    CheckFree(Call, pDb.get(), strTable, "load into another database");
    Run(pDb.get(), jHeader["statements"][0].asString());
    const std::int64_t nRows = LoadRows(From, pDb.get(), jHeader);
    for (Json::ArrayIndex nAt = 1; nAt < jHeader["statements"].size(); ++nAt) {
        Run(pDb.get(), jHeader["statements"][nAt].asString());
    }
    if (jHeader.isMember("sequence")) {
        SetSequence(pDb.get(), jHeader);
    }
    if (jHeader.isMember("definition")) {
        KeepDefinition(pDb.get(), strTable, jHeader["definition"]);
    }
    Check(All.Commit(), Call.Db());
    Json::Value jResult;
    jResult["loaded"] = Json::Int64(nRows);
    Call.Report("loaded " + std::to_string(nRows) + (nRows == 1 ? " row" : " rows") +
                    " into table \"" + strTable + "\"",
                jResult);
    return kExitFine;
}

}  // namespace

int RunLoad(Context& Call) {
    const Interrupt Guard;
    try {
        return Load(Call);
    } catch (Error& Failed) {
        Failed.strLine += Failed.nExit == kExitInterrupted ? " (nothing is stored)" : "";
        if (Failed.nExit == kExitUnexpected) {
            Failed.nExit = kExitBadData;
            Failed.strLine += "; dump the table again, or load it where SQLite knows all of this";
        }
        throw;
    }
}

}  // namespace VORN_JSON_DB::Cli
