// A Table's life: opening, and what is the same for all of its operations.

#include <cstring>
#include <utility>

#include "Attempt.h"
#include "Concat.h"
#include "CreateStatement.h"
#include "FindingCodes.h"
#include "RealTable.h"
#include "TableParts.h"

static_assert(SQLITE_VERSION_NUMBER >= 3035000, "vornjsondb-table needs SQLite 3.35 or later");

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Doing;
using vornjsondb::FailBySqlite;
using vornjsondb::OwnStatement;
using vornjsondb::RealTable;

const std::vector<std::string>& NoNames() {
    static const std::vector<std::string> s_vecNone;
    return s_vecNone;
}

std::vector<size_t> AllColumns(const vornjsondb::Members& Of) {
    std::vector<size_t> vecAll;
    for (size_t i = 0; i < Of.Size(); ++i) {
        vecAll.push_back(i);
    }
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
    const auto* pEncoding = sqlite3_column_text(pStatement.get(), 0);
    const char* szEncoding = reinterpret_cast<const char*>(pEncoding);
    if (szEncoding != nullptr && std::strcmp(szEncoding, "UTF-8") != 0) {
        return vornjsondb::Fail(
            StatusCode::kRefused, What,
            vornjsondb::Concat({"the database is ", szEncoding, ", not UTF-8"}));
    }
    return {};
}

Status RunWhole(Table::Parts& Into, const std::string& strSql, const Doing& What) {
    vornjsondb::Whole All(Into.pDb, Into.Kept);
    int nResult = All.Begin();
    if (nResult == SQLITE_OK) {
        nResult = sqlite3_exec(Into.pDb, strSql.c_str(), nullptr, nullptr, nullptr);
    }
    if (nResult == SQLITE_OK) {
        nResult = All.Keep();
    }
    return nResult == SQLITE_OK ? Status() : FailBySqlite(Into.pDb, nResult, What);
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
    int nResult = vornjsondb::ReadRealTable(pDb, Of.Table(), Real);
    const bool blCreate = How.blCreateTable || !How.strSqlCreate.empty();
    if (nResult == SQLITE_OK && Real.vecColumns.empty() && blCreate) {
        const std::string strSql =
            How.strSqlCreate.empty() ? vornjsondb::CreateTableSql(Of) : How.strSqlCreate;
        Outcome = RunWhole(*this, strSql, What);
        if (!Outcome.Ok()) {
            return Outcome;
        }
        nResult = vornjsondb::ReadRealTable(pDb, Of.Table(), Real);
    }
    if (nResult != SQLITE_OK) {
        return FailBySqlite(pDb, nResult, What);
    }
    if (Real.vecColumns.empty()) {
        return vornjsondb::Fail(StatusCode::kNotFound, What, "there is no such table");
    }
    Learn(Real);
    return {};
}

void Table::Parts::Learn(const RealTable& Real) {
    strRowid = Real.strRowid;
    if (Of.Key().empty()) {
        Of.SetKey(Real.vecKey);
    }
    for (const size_t nMember : Of.Key()) {
        vecKeyNames.push_back(Of.At(nMember).strName);
    }
    for (const vornjsondb::RealColumn& Column : Real.vecColumns) {
        const size_t nMember = Of.FindColumn(Column.strName);
        if (Column.blGenerated && nMember != vornjsondb::Members::kNone) {
            Of.SetGenerated(nMember);
        }
    }
}

Table::Table() = default;
Table::~Table() = default;
Table::Table(Table&& From) noexcept = default;
Table& Table::operator=(Table&& From) noexcept = default;

Status Table::Open(sqlite3* pDb, const std::string& strName, const Json::Value& jDefinition,
                   const Options& How) {
    m_pParts.reset();
    const Doing What{"open", &strName};
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
        auto pParts = std::make_unique<Parts>(
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
    static const std::string s_strNone;
    return m_pParts ? m_pParts->Of.Table() : s_strNone;
}

const Json::Value& Table::Definition() const {
    return m_pParts ? m_pParts->Of.Definition() : Json::Value::nullSingleton();
}

const std::vector<std::string>& Table::Members() const {
    return m_pParts ? m_pParts->Of.Names() : NoNames();
}

const std::vector<std::string>& Table::KeyMembers() const {
    return m_pParts ? m_pParts->vecKeyNames : NoNames();
}

sqlite3* Table::Connection() const {
    return m_pParts ? m_pParts->pDb : nullptr;
}

}  // namespace VORN_JSON_DB

namespace vornjsondb {

Status CheckVersion(int nVersion, const char* szVersion, const Doing& What) {
    constexpr int kOldest = 3035000;
    return nVersion >= kOldest
               ? Status()
               : Fail(StatusCode::kRefused, What,
                      vornjsondb::Concat(
                          {"SQLite 3.35 or later is needed, and this is ", szVersion}));
}

Status CheckState(const Table::Parts* pParts, const char* szDo, bool blChange) {
    if (pParts == nullptr) {
        return Fail(StatusCode::kMisuse, Doing{szDo, nullptr}, "the table is not open");
    }
    if (blChange && pParts->nReading > 0) {
        return Fail(StatusCode::kMisuse, pParts->Do(szDo), "a callback is reading from it");
    }
    return {};
}

}  // namespace vornjsondb
