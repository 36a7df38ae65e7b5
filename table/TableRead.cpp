// Reading what a query selects.

#include <optional>
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
    std::optional<vornjsondb::RowReader> Some;
    const auto fnRow = [&](sqlite3_stmt* pStatement, const std::vector<size_t>& vecColumns) {
        const bool blAll = &vecColumns == &From.WholeRow.Columns();
        // mutate(hoisted, sunk): each new one reads alike.
        if (!blAll && !Some) {
            // mutate(doubled): each new one reads alike.
            Some.emplace(From.Of, vecColumns, From.How.eNulls);
        }
        Json::Value jRecord = (blAll ? From.WholeRow : *Some).Read(pStatement, From.Codec);
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

Status NoCallback(const Doing& What) {
    return vornjsondb::Fail(StatusCode::kMisuse, What, "there is no callback");
}

// A callback of the caller's that is running, also when it throws. Until it returns the call does
// nothing, and others may.
class Callback {
  public:
    explicit Callback(Parts& From) : m_From(From) {
        m_From.pRunning = nullptr;
        ++m_From.nReading;
    }
    Callback(const Callback&) = delete;
    Callback& operator=(const Callback&) = delete;
    ~Callback() {
        --m_From.nReading;
        m_From.pRunning = &m_From;
    }

  private:
    Parts& m_From;
};

}  // namespace

Status Table::First(const Query& Which, Json::Value& jRecord) {
    const auto fnFirst = [&](Parts& From, const Doing& What) {
        bool blFound = false;
        Status Outcome = SelectRecords(From, Which, What, [&](Json::Value& jFound) {
            jRecord.swapPayload(jFound);
            blFound = true;
            return false;
        });
        return !Outcome.Ok() || blFound
                   ? Outcome
                   : vornjsondb::Fail(StatusCode::kNotFound, What, "the query selects none");
    };
    return vornjsondb::Guarded(m_pParts.get(), "get a record from", false, fnFirst);
}

Status Table::List(const Query& Which, Json::Value& jRecords) {
    const auto fnList = [&](Parts& From, const Doing& What) {
        Json::Value jList(Json::arrayValue);
        Status Outcome = SelectRecords(From, Which, What, [&](Json::Value& jRecord) {
            jList.append(std::move(jRecord));
            return true;
        });
        if (Outcome.Ok()) {
            jRecords.swapPayload(jList);
        }
        return Outcome;
    };
    return vornjsondb::Guarded(m_pParts.get(), "list records of", false, fnList);
}

Status Table::Count(const Query& Which, std::int64_t& nRecords) {
    const auto fnCount = [&](Parts& From, const Doing& What) {
        return Compute(From, Which, What, false, nRecords);
    };
    return vornjsondb::Guarded(m_pParts.get(), "count records of", false, fnCount);
}

Status Table::Exists(const Query& Which, bool& blExists) {
    std::int64_t nFound = 0;
    const auto fnExists = [&](Parts& From, const Doing& What) {
        return Compute(From, Which, What, true, nFound);
    };
    Status Outcome = vornjsondb::Guarded(m_pParts.get(), "look for records of", false, fnExists);
    if (Outcome.Ok()) {
        blExists = nFound != 0;
    }
    return Outcome;
}

Status Table::ForEach(const Query& Which, const std::function<bool(const Json::Value&)>& fnRecord) {
    const std::shared_ptr<Parts> pOwn = m_pParts;          // the callback may destroy the Table
    const std::vector<Condition> vecOwn = Which.vecWhere;  // and change the query, of whose values
                                                           // SQLite has no copies
    const auto fnRead = [&](Parts& From, const Doing& What) {
        const auto fnEach = [&](const Json::Value& jRecord) {
            const Callback Now(From);
            return fnRecord(jRecord);
        };
        return fnRecord ? SelectRecords(From, Which, What, fnEach) : NoCallback(What);
    };
    return vornjsondb::Guarded(pOwn.get(), "read records of", false, fnRead);
}

Status Table::ForEachRow(const Query& Which, const std::function<bool(const Row&)>& fnRow) {
    const std::shared_ptr<Parts> pOwn = m_pParts;          // the callback may destroy the Table
    const std::vector<Condition> vecOwn = Which.vecWhere;  // and change the query, of whose values
                                                           // SQLite has no copies
    const auto fnRead = [&](Parts& From, const Doing& What) {
        const auto fnEach = [&](sqlite3_stmt* pStatement, const std::vector<size_t>& vecColumns) {
            const Row::Source Source{pStatement, From.Of, vecColumns};
            const Callback Now(From);
            return fnRow(Row(Source));
        };
        return fnRow ? Select(From, Which, What, fnEach) : NoCallback(What);
    };
    return vornjsondb::Guarded(pOwn.get(), "read records of", false, fnRead);
}

}  // namespace VORN_JSON_DB
