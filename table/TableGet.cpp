// Reading the record of one key.

#include <utility>

#include "../src/base/JsonMember.h"
#include "Concat.h"
#include "FindingCodes.h"
#include "RecordWriter.h"
#include "SelectSql.h"

namespace vornjsondb {

std::string SelectSql(const Members& Of, const std::vector<size_t>& vecColumns) {
    std::string strSql = "SELECT ";
    for (size_t i = 0; i < vecColumns.size(); ++i) {
        Append(strSql, {i == 0 ? "" : ", ", Of.At(vecColumns[i]).strColumn});
    }
    Append(strSql, {" FROM ", Of.QuotedTable()});
    return strSql;
}

std::string SelectOneSql(const Table::Parts& From, bool blByRowid) {
    std::string strSql = SelectSql(From.Of, From.WholeRow.Columns());
    if (blByRowid) {
        Append(strSql, {" WHERE ", From.Of.QuotedTable(), ".", From.strRowid, " = ?"});
    } else {
        strSql += WhereKey(From.Of);
    }
    return strSql;
}

Status FirstStep(Table::Parts& From, const Doing& What, std::string_view strShape,
                 Callable<std::string()> fnSql, Callable<int(sqlite3_stmt*)> fnBind,
                 Statement& Lent, int& nResult) {
    return Attempt(From.pDb, From.How.nWaitMs, [&]() -> Status {
        // mutate(dropped): the same follows, only that the statement of the try before is not kept.
        Lent = Statement();
        nResult = From.Kept.Take(strShape, fnSql, Lent);
        if (nResult == SQLITE_OK) {
            nResult = fnBind(Lent.Get());
        }
        if (nResult == SQLITE_OK) {
            nResult = Lent.Step();
        }
        const bool blRan = nResult == SQLITE_ROW || nResult == SQLITE_DONE;
        return blRan ? Status() : FailBySqlite(From.pDb, nResult, What);
    });
}

}  // namespace vornjsondb

namespace VORN_JSON_DB {

namespace {

using Parts = Table::Parts;

// The key's values, from the value of its only member or from an object.
bool TakeKey(Parts& Of, const Json::Value& jKey, FindingList& vecFindings) {
    const std::vector<size_t>& vecKey = Of.Of.Key();
    if (vecKey.size() == 1 &&
        vornjsondb::FindMember(jKey, Of.Of.At(vecKey[0]).strName) == nullptr) {
        Of.Wanted.SetJson(Of.Wanted.SlotOf(vecKey[0]), jKey, vecFindings);
    } else {
        Of.Wanted.Take(jKey, vecFindings);
    }
    return vecFindings.empty() && Of.Wanted.HasKey(vecFindings);
}

}  // namespace

Status Table::Get(const Json::Value& jKey, Json::Value& jRecord) {
    const auto fnGet = [&](Parts& From, const vornjsondb::Doing& What) -> Status {
        FindingList vecFindings;
        if (!TakeKey(From, jKey, vecFindings)) {
            return vornjsondb::FromFindings(std::move(vecFindings), What);
        }
        vornjsondb::Statement Lent;
        int nResult = SQLITE_OK;
        Status Outcome = vornjsondb::FirstStep(
            From, What, "key", [&] { return vornjsondb::SelectOneSql(From, false); },
            [&](sqlite3_stmt* pStatement) {
                int nNext = 1;
                return From.Wanted.BindKey(pStatement, nNext);
            },
            Lent, nResult);
        if (Outcome.Ok() && nResult == SQLITE_ROW) {
            Json::Value jFound = From.WholeRow.Read(Lent.Get(), From.Codec);
            jRecord.swapPayload(jFound);
        } else if (Outcome.Ok()) {
            return vornjsondb::Fail(
                StatusCode::kNotFound, What,
                vornjsondb::Concat({"no record has the key ", vornjsondb::Shown(jKey)}));
        }
        return Outcome;
    };
    return vornjsondb::Guarded(m_pParts.get(), "get a record from", false, fnGet);
}

}  // namespace VORN_JSON_DB
