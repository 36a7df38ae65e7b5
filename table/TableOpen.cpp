// A Table's life: opening, and what is the same for all of its operations.

#include <limits>
#include <numeric>
#include <utility>

#include "Attempt.h"
#include "Concat.h"
#include "CreateStatement.h"
#include "DecimalPoint.h"
#include "FindingCodes.h"
#include "LeafSql.h"
#include "RealTable.h"
#include "TableParts.h"

static_assert(SQLITE_VERSION_NUMBER >= 3035000, "vornjsondb-table needs SQLite 3.35 or later");

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Doing;
using vornjsondb::FailBySqlite;
using vornjsondb::OwnStatement;
using vornjsondb::RealTable;

std::vector<size_t> AllColumns(const vornjsondb::Members& Of) {
    std::vector<size_t> vecAll(Of.Size());
    // mutate(doubled): the same numbers once more.
    std::iota(vecAll.begin(), vecAll.end(), size_t{0});
    return vecAll;
}

// Texts of a UTF-16 database would not come back byte by byte.
Status CheckEncoding(sqlite3* pDb, const Doing& What) {
    OwnStatement pStatement;
    int nResult = vornjsondb::Prepare(pDb, "PRAGMA encoding", pStatement);
    if (nResult == SQLITE_OK) {
        nResult = sqlite3_step(pStatement.get());
    }
    if (nResult != SQLITE_ROW) {
        return FailBySqlite(pDb, nResult, What);
    }
    const std::string strEncoding = vornjsondb::TextColumn(pStatement, 0);
    if (std::string_view(strEncoding) != "UTF-8") {
        return vornjsondb::Fail(
            StatusCode::kRefused, What,
            vornjsondb::Concat({"the database is ", strEncoding, ", not UTF-8"}));
    }
    return {};
}

// Runs the statement that makes the table, and reads what it made. The caller's may make another
// one, which is undone. The reason is taken before what was begun is undone.
Status CreateReal(Table::Parts& Into, const Doing& What, RealTable& Real) {
    vornjsondb::Whole All(Into.pDb, Into.Kept);
    int nResult = All.Begin();
    if (nResult == SQLITE_OK) {
        nResult = sqlite3_exec(Into.pDb, Into.How.strSqlCreate.c_str(), nullptr, nullptr, nullptr);
    }
    if (nResult == SQLITE_OK) {
        nResult = vornjsondb::ReadRealTable(Into.pDb, Into.Of.Table(), Real);
    }
    if (nResult == SQLITE_OK && !Real.vecColumns.empty()) {
        nResult = All.Keep();
    }
    return vornjsondb::FromSqlite(Into.pDb, nResult, What);
}

// Whether a statement on the table may end halfway: by ON CONFLICT FAIL and RAISE(FAIL), its own or
// those of a table that its triggers and foreign keys change. A name with these letters costs a
// savepoint and nothing else.
constexpr char kFails[] =
    "type IN ('table', 'trigger') AND instr(lower(sql), 'fail') AND (tbl_name = ?1 COLLATE NOCASE"
    " OR EXISTS (SELECT 1 FROM Here WHERE tbl_name = ?1 COLLATE NOCASE AND type = 'trigger'"
    " OR instr(lower(sql), 'references')))";

// Whatever is written into an index on a place in JSON is wrong for every other program.
Status CheckIndexes(const Table::Parts& Of, const Doing& What) {
    bool blJson = false;
    const int nResult = vornjsondb::IsInSchema(
        Of.pDb, Of.Of.Table(),
        "tbl_name = ?1 COLLATE NOCASE AND type = 'index' AND instr(sql, 'json_')", blJson);
    if (nResult != SQLITE_OK) {
        return FailBySqlite(Of.pDb, nResult, What);
    }
    FindingList vecFindings;
    if (blJson) {
        vornjsondb::CheckFractions("", vecFindings);
    }
    return vornjsondb::FromFindings(std::move(vecFindings), What);
}

bool HasTextKey(const vornjsondb::Members& Of) {
    bool blText = false;
    for (const size_t nMember : Of.Key()) {
        blText = blText || IsOrderedAsText(Of.At(nMember));
    }
    return blText;
}

bool IsNarrow(const vornjsondb::Member& Of) {
    return vornjsondb::RangeOf(*Of.pType).nMostRead < std::numeric_limits<std::int64_t>::max();
}

}  // namespace

Table::Parts::Parts(sqlite3* pDbOpen, const std::string& strTable, const Json::Value& jDefinition,
                    const Options& HowToOpen, FindingList& vecFindings)
    : pDb(pDbOpen),
      How(HowToOpen),
      Of(strTable, jDefinition, vecFindings),
      Kept(pDbOpen, HowToOpen.nStatements),
      WholeRow(Of, AllColumns(Of), HowToOpen.eNulls),
      Values(Of, Codec, HowToOpen.blCompatible, HowToOpen.blIgnoreUnknown),
      Wanted(Of, Codec, false, false) {}

Status Table::Parts::Meet() {
    const Doing What = Do("open");
    Status Outcome = CheckEncoding(pDb, What);
    if (!Outcome.Ok()) {
        return Outcome;
    }
    RealTable Real;
    const int nResult = vornjsondb::ReadRealTable(pDb, Of.Table(), Real);
    const bool blCreate = How.blCreateTable || !How.strSqlCreate.empty();
    // mutate(hoisted): who creates nothing does not ask for the SQL.
    if (nResult == SQLITE_OK && Real.vecColumns.empty() && blCreate) {
        if (How.strSqlCreate.empty()) {
            How.strSqlCreate = vornjsondb::CreateTableSql(Of, {});
        }
        Outcome = CreateReal(*this, What, Real);
        if (!Outcome.Ok()) {
            return Outcome;
        }
    }
    if (nResult != SQLITE_OK) {
        return FailBySqlite(pDb, nResult, What);
    }
    // mutate(exchanged): of no columns nothing is learned.
    if (Real.vecColumns.empty()) {
        return vornjsondb::Fail(StatusCode::kNotFound, What, "there is no such table");
    }
    Learn(Real);
    if (vornjsondb::MisreadsFractions()) {
        Outcome = CheckIndexes(*this, What);
    }
    // mutate(exchanged): nobody asks for what was learned of a table that is not opened.
    if (!Outcome.Ok()) {
        return Outcome;
    }
    int nLearned = HasTextKey(Of) ? vornjsondb::LearnCollations(pDb, Of) : SQLITE_OK;
    if (nLearned == SQLITE_OK) {
        nLearned = vornjsondb::IsInSchema(pDb, Of.Table(), kFails, blFails);
    }
    return FromSqlite(pDb, nLearned, What);
}

void Table::Parts::Learn(const RealTable& Real) {
    // A member of that name has no column yet, but Sync may add one.
    strRowid =
        Of.FindColumn(Real.strRowid) == vornjsondb::Members::kNone ? Real.strRowid : std::string();
    // mutate(exchanged): in any order.
    blView = Real.blView;
    if (Of.Key().empty()) {
        // mutate(doubled): the same key once more.
        Of.SetKey(Real.vecKey);
    }
    // mutate(exchanged): in any order.
    for (const size_t nMember : Of.Key()) {
        vornjsondb::AddText(vecKeyNames, Of.At(nMember).strName);
    }
    for (const vornjsondb::RealColumn& Column : Real.vecColumns) {
        const size_t nMember = Of.FindColumn(Column.strName);
        if (nMember == vornjsondb::Members::kNone) {
            continue;
        }
        // mutate(exchanged): in any order.
        Of.SetAffinity(nMember, vornjsondb::AffinityOf(Column.strType));
        // mutate(exchanged): in any order.
        if (Column.blGenerated) {
            // mutate(exchanged): in any order.
            Of.SetGenerated(nMember);
            Values.RefuseAlways(nMember);
        }
        if (IsRowid(Real, Column)) {
            // mutate(exchanged): in any order.
            Of.SetRowid(nMember);
            nHandedOut = IsNarrow(Of.At(nMember)) ? nMember : nHandedOut;
        }
    }
}

Table::Table() = default;
Table::~Table() = default;
Table::Table(Table&& From) noexcept = default;
Table& Table::operator=(Table&& From) noexcept = default;

Status Table::Open(sqlite3* pDb, const std::string& strName, const Json::Value& jDefinition,
                   const Options& How) {
    if (m_pParts) {
        Status State = vornjsondb::CheckState(m_pParts.get(), "open anew", true);
        if (!State.Ok()) {
            return State;
        }
    }
    // The arguments may be parts of what it was before.
    const std::shared_ptr<Parts> pBefore = std::move(m_pParts);
    const Doing What{"open", &strName};
    // mutate(exchanged): it only looks.
    if (pDb == nullptr) {
        return vornjsondb::Fail(StatusCode::kMisuse, What, "there is no connection");
    }
    Status Version =
        vornjsondb::CheckVersion(sqlite3_libversion_number(), sqlite3_libversion(), What);
    if (!Version.Ok()) {
        return Version;
    }
    return vornjsondb::Attempt(pDb, How.nWaitMs, [&]() -> Status {
        Json::Value jMade;
        if (jDefinition.isNull()) {
            Status Outcome = DefinitionOf(pDb, strName, jMade);
            if (!Outcome.Ok()) {
                return Outcome;
            }
        }
        FindingList vecFindings;
        auto pParts = std::make_shared<Parts>(
            pDb, strName, jDefinition.isNull() ? jMade : jDefinition, How, vecFindings);
        Status Outcome = vornjsondb::FromFindings(std::move(vecFindings), What);
        if (Outcome.Ok()) {
            Outcome = pParts->Meet();
        }
        if (Outcome.Ok()) {
            m_pParts = std::move(pParts);
        }
        return Outcome;
    });
}

const std::string& Table::Name() const {
    return m_pParts ? m_pParts->Of.Table() : vornjsondb::None<std::string>();
}

const Json::Value& Table::Definition() const {
    return m_pParts ? m_pParts->Of.Definition() : Json::Value::nullSingleton();
}

const std::vector<std::string>& Table::Members() const {
    return m_pParts ? m_pParts->Of.Names() : vornjsondb::None<std::vector<std::string>>();
}

const std::vector<std::string>& Table::KeyMembers() const {
    return m_pParts ? m_pParts->vecKeyNames : vornjsondb::None<std::vector<std::string>>();
}

bool Table::IsView() const {
    return m_pParts && m_pParts->blView;
}

sqlite3* Table::Connection() const {
    return m_pParts ? m_pParts->pDb : nullptr;
}

}  // namespace VORN_JSON_DB

namespace vornjsondb {

Status CheckVersion(int nVersion, const char* szVersion, const Doing& What) {
    constexpr int kOldest = 3035000;
    if (nVersion < kOldest) {
        return Fail(StatusCode::kRefused, What,
                    Concat({"SQLite 3.35 or later is needed, and this is ", szVersion}));
    }
    return {};
}

namespace {

const char* WhyNot(const Table::Parts* pParts, bool blChange) {
    if (pParts == nullptr) {
        return "the table is not open";
    }
    if (pParts->pRunning != nullptr) {
        return "another call on it has not returned";
    }
    return blChange && pParts->nReading > 0 ? "a callback is reading from it" : nullptr;
}

}  // namespace

Status CheckState(const Table::Parts* pParts, const char* szDo, bool blChange) {
    const char* const szWhy = WhyNot(pParts, blChange);
    if (szWhy == nullptr) {
        return {};
    }
    const Doing What = pParts == nullptr ? Doing{szDo, nullptr} : pParts->Do(szDo);
    return Fail(StatusCode::kMisuse, What, szWhy);
}

Status Guarded(Table::Parts* pParts, const char* szDo, bool blChange,
               Callable<Status(Table::Parts&, const Doing&)> fnCall) {
    if (WhyNot(pParts, blChange) != nullptr) {
        return CheckState(pParts, szDo, blChange);
    }
    const Running Now(*pParts, pParts);
    return fnCall(*pParts, pParts->Do(szDo));
}

}  // namespace vornjsondb
