// Reading what a query selects.

#include <utility>

#include "Concat.h"
#include "FindingCodes.h"
#include "QueryPlan.h"
#include "SelectSql.h"
#include "TableParts.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::Callable;
using vornjsondb::Doing;
using vornjsondb::FailBySqlite;
using vornjsondb::QueryPlan;
using vornjsondb::QueryUse;
using vornjsondb::Statement;
using Parts = Table::Parts;

// Goes through the rows that a query selects until fnRow, called with the statement, returns false.
Status Select(Parts& From, const Query& Which, const Doing& What,
              Callable<bool(sqlite3_stmt*, const std::vector<size_t>&)> fnRow) {
    FindingList vecFindings;
    QueryPlan Plan(From.Of, From.Codec);
    Plan.Resolve(Which, QueryUse::kRead, vecFindings);
    Status Outcome = vornjsondb::FromFindings(std::move(vecFindings), What);
    if (!Outcome.Ok()) {
        return Outcome;
    }
    Statement Lent;
    int nResult = SQLITE_OK;
    const std::vector<size_t>& vecColumns = Plan.Columns(From.WholeRow.Columns());
    const auto fnSql = [&] {
        std::string strSql = vornjsondb::SelectSql(From.Of, vecColumns);
        Plan.AppendWhere(strSql);
        Plan.AppendTail(strSql);
        return strSql;
    };
    Status Begun = vornjsondb::FirstStep(
        From, What, Plan.ShapeFor('L'), fnSql,
        [&](sqlite3_stmt* pStatement) { return Plan.Bind(pStatement, 1); }, Lent, nResult);
    // mutate(exchanged): what did not begin has no row.
    if (!Begun.Ok()) {
        return Begun;
    }
    while (nResult == SQLITE_ROW) {
        if (!fnRow(Lent.Get(), vecColumns)) {
            return Outcome;
        }
        nResult = Lent.Step();
    }
    return nResult == SQLITE_DONE ? Outcome : FailBySqlite(From.pDb, nResult, What);
}

// The same with records. fnRecord may take the record.
Status SelectRecords(Parts& From, const Query& Which, const Doing& What,
                     Callable<bool(Json::Value&)> fnRecord) {
    std::unique_ptr<vornjsondb::RowReader> pSome;
    const auto fnRow = [&](sqlite3_stmt* pStatement, const std::vector<size_t>& vecColumns) {
        const bool blAll = &vecColumns == &From.WholeRow.Columns();
        // mutate(hoisted, sunk): each new one reads alike.
        if (!blAll && !pSome) {
            pSome = std::make_unique<vornjsondb::RowReader>(From.Of, vecColumns, From.How.eNulls);
        }
        Json::Value jRecord = (blAll ? From.WholeRow : *pSome).Read(pStatement, From.Codec);
        return fnRecord(jRecord);
    };
    return Select(From, Which, What, fnRow);
}

// One number that SQLite computes from a query: "count(*)" or "1".
Status Compute(Parts& From, const Query& Which, const Doing& What, bool blExists,
               std::int64_t& nOut) {
    FindingList vecFindings;
    QueryPlan Plan(From.Of, From.Codec);
    Plan.Resolve(Which, QueryUse::kCount, vecFindings);
    Status Outcome = vornjsondb::FromFindings(std::move(vecFindings), What);
    if (!Outcome.Ok()) {
        return Outcome;
    }
    const auto fnSql = [&] {
        std::string strRows;
        Plan.AppendWhere(strRows);
        Plan.AppendTail(strRows);
        const bool blPaged = Which.nLimit >= 0 || Which.nOffset > 0;
        const bool blInner = blExists || blPaged;
        return vornjsondb::Concat({blExists  ? "SELECT EXISTS (SELECT 1"
                                   : blPaged ? "SELECT count(*) FROM (SELECT 1"
                                             : "SELECT count(*)",
                                   " FROM ", From.Of.QuotedTable(), strRows, blInner ? ")" : ""});
    };
    Statement Lent;
    int nResult = SQLITE_OK;
    Status Begun = vornjsondb::FirstStep(
        From, What, Plan.ShapeFor(blExists ? 'E' : 'C'), fnSql,
        [&](sqlite3_stmt* pStatement) { return Plan.Bind(pStatement, 1); }, Lent, nResult);
    if (!Begun.Ok()) {
        return Begun;
    }
    nOut = sqlite3_column_int64(Lent.Get(), 0);
    return Outcome;
}

// Counts a callback that is running, also when it throws.
class Reading {
  public:
    explicit Reading(int& nReading) : m_nReading(nReading) { ++m_nReading; }
    Reading(const Reading&) = delete;
    Reading& operator=(const Reading&) = delete;
    ~Reading() { --m_nReading; }

  private:
    int& m_nReading;
};

}  // namespace

Status Table::First(const Query& Which, Json::Value& jRecord) {
    constexpr char kDo[] = "get a record from";
    Status Outcome = vornjsondb::CheckState(m_pParts.get(), kDo, false);
    if (!Outcome.Ok()) {
        return Outcome;
    }
    bool blFound = false;
    Outcome = SelectRecords(*m_pParts, Which, m_pParts->Do(kDo), [&](Json::Value& jFound) {
        jRecord.swapPayload(jFound);
        blFound = true;
        return false;
    });
    return !Outcome.Ok() || blFound ? Outcome
                                    : vornjsondb::Fail(StatusCode::kNotFound, m_pParts->Do(kDo),
                                                       "the query selects none");
}

Status Table::List(const Query& Which, Json::Value& jRecords) {
    constexpr char kDo[] = "list records of";
    Status Outcome = vornjsondb::CheckState(m_pParts.get(), kDo, false);
    if (!Outcome.Ok()) {
        return Outcome;
    }
    Json::Value jList(Json::arrayValue);
    Outcome = SelectRecords(*m_pParts, Which, m_pParts->Do(kDo), [&](Json::Value& jRecord) {
        jList.append(std::move(jRecord));
        return true;
    });
    if (Outcome.Ok()) {
        jRecords.swapPayload(jList);
    }
    return Outcome;
}

Status Table::Count(const Query& Which, std::int64_t& nRecords) {
    constexpr char kDo[] = "count records of";
    Status Outcome = vornjsondb::CheckState(m_pParts.get(), kDo, false);
    return Outcome.Ok() ? Compute(*m_pParts, Which, m_pParts->Do(kDo), false, nRecords) : Outcome;
}

Status Table::Exists(const Query& Which, bool& blExists) {
    constexpr char kDo[] = "look for records of";
    Status Outcome = vornjsondb::CheckState(m_pParts.get(), kDo, false);
    std::int64_t nFound = 0;
    if (Outcome.Ok()) {
        Outcome = Compute(*m_pParts, Which, m_pParts->Do(kDo), true, nFound);
    }
    if (Outcome.Ok()) {
        blExists = nFound != 0;
    }
    return Outcome;
}

Status Table::ForEach(const Query& Which, const std::function<bool(const Json::Value&)>& fnRecord) {
    constexpr char kDo[] = "read records of";
    Status Outcome = vornjsondb::CheckState(m_pParts.get(), kDo, false);
    if (!Outcome.Ok()) {
        return Outcome;
    }
    const Reading Now(m_pParts->nReading);
    return SelectRecords(*m_pParts, Which, m_pParts->Do(kDo),
                         [&](const Json::Value& jRecord) { return fnRecord(jRecord); });
}

Status Table::ForEachRow(const Query& Which, const std::function<bool(const Row&)>& fnRow) {
    constexpr char kDo[] = "read records of";
    Status Outcome = vornjsondb::CheckState(m_pParts.get(), kDo, false);
    if (!Outcome.Ok()) {
        return Outcome;
    }
    const Reading Now(m_pParts->nReading);
    return Select(*m_pParts, Which, m_pParts->Do(kDo),
                  [&](sqlite3_stmt* pStatement, const std::vector<size_t>& vecColumns) {
                      const Row::Source From{pStatement, m_pParts->Of, vecColumns};
                      return fnRow(Row(From));
                  });
}

}  // namespace VORN_JSON_DB
