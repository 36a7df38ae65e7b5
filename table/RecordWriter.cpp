#include "RecordWriter.h"

#include <string_view>
#include <utility>

#include "FindingCodes.h"

namespace vornjsondb {

namespace {

using Parts = Table::Parts;

// What INSERT does with a key that is there already.
enum class Clash { kFail, kNothing, kReplace };

std::string InsertSql(const Members& Of, const RecordValues& Values) {
    std::string strColumns;
    std::string strValues;
    for (size_t i = 0; i < Of.Size(); ++i) {
        if (Values.Has(i)) {
            strColumns += (strColumns.empty() ? " (" : ", ") + Of.At(i).strQuoted;
            strValues += strValues.empty() ? ") VALUES (?" : ", ?";
        }
    }
    return "INSERT INTO " + Of.QuotedTable() + strColumns + strValues + ")";
}

std::string KeyList(const Members& Of) {
    std::string strList;
    for (const size_t nMember : Of.Key()) {
        strList += (strList.empty() ? "(" : ", ") + Of.At(nMember).strQuoted;
    }
    return strList + ")";
}

std::string InsertSql(const Members& Of, const RecordValues& Values, Clash eClash) {
    std::string strSql = InsertSql(Of, Values);
    if (eClash == Clash::kFail) {
        return strSql;
    }
    strSql += " ON CONFLICT " + KeyList(Of) + " DO ";
    std::string strSet;
    for (const Member& Other : Of.All()) {
        // "excluded" holds the column's default where the record has no value.
        if (!Other.blKey && !Other.blGenerated) {
            strSet += (strSet.empty() ? "UPDATE SET " : ", ") + Other.strQuoted + "=excluded." +
                      Other.strQuoted;
        }
    }
    return strSql + (eClash == Clash::kReplace && !strSet.empty() ? strSet : "NOTHING");
}

// A record of nothing but its key changes nothing: "id" = "id" finds out whether it is there.
std::string UpdateSql(const Members& Of, const RecordValues& Values) {
    std::string strSet;
    for (size_t i = 0; i < Of.Size(); ++i) {
        if (Values.Has(i) && !Of.At(i).blKey) {
            strSet += (strSet.empty() ? "" : ", ") + Of.At(i).strQuoted + "=?";
        }
    }
    const std::string& strKey = Of.At(Of.Key()[0]).strQuoted;
    return "UPDATE " + Of.QuotedTable() + " SET " +
           (strSet.empty() ? strKey + "=" + strKey : strSet) + WhereKey(Of);
}

// Runs one statement to its end. nChanged: rows that it inserted or changed.
template <typename MakeSql, typename BindAll>
int Run(Parts& Into, char cVerb, const RecordValues& Values, MakeSql&& fnSql, BindAll&& fnBind,
        int& nChanged) {
    Statement Lent;
    int nResult = Into.Kept.Take(cVerb + Values.Given(), fnSql, Lent);
    if (nResult == SQLITE_OK) {
        nResult = fnBind(Lent.Get());
    }
    if (nResult == SQLITE_OK) {
        nResult = Lent.Finish();
    }
    nChanged = nResult == SQLITE_OK ? sqlite3_changes(Into.pDb) : 0;
    return nResult;
}

int Insert(Parts& Into, const RecordValues& Values, Clash eClash, int& nChanged) {
    static constexpr char kVerbs[] = {'I', 'N', 'R'};
    return Run(
        Into, kVerbs[static_cast<size_t>(eClash)], Values,
        [&] { return InsertSql(Into.Of, Values, eClash); },
        [&](sqlite3_stmt* pStatement) {
            int nNext = 1;
            return Values.BindGiven(pStatement, nNext, true);
        },
        nChanged);
}

int Update(Parts& Into, const RecordValues& Values, int& nChanged) {
    return Run(
        Into, 'U', Values, [&] { return UpdateSql(Into.Of, Values); },
        [&](sqlite3_stmt* pStatement) {
            int nNext = 1;
            const int nResult = Values.BindGiven(pStatement, nNext, false);
            return nResult == SQLITE_OK ? Values.BindKey(pStatement, nNext) : nResult;
        },
        nChanged);
}

std::string ShownValue(const BoundValue& Value) {
    switch (Value.eKind) {
        case BoundValue::Kind::kInteger:
            return std::to_string(Value.nValue);
        case BoundValue::Kind::kReal:
            return Shown(Json::Value(Value.dValue));
        case BoundValue::Kind::kText:
            return ShownText(Value.strBytes);
        case BoundValue::Kind::kBlob:
            return "a blob";
        default:
            return "null";
    }
}

// SQLite names the columns, "task.id, task.name"; the values are told beside them.
Status WithValues(const Parts& Into, const RecordValues& Values, const Status& Failed) {
    const std::string strBefore = Into.Of.Table() + ".";
    std::string strMore;
    const std::string& strMessage = Failed.Message();
    for (size_t i = 0; i < Into.Of.Size(); ++i) {
        const std::string strName = strBefore + Into.Of.At(i).strName;
        const size_t nFound = strMessage.rfind(strName);
        const char cAfter = nFound == std::string::npos ? 'x' : strMessage[nFound + strName.size()];
        if ((cAfter == '\0' || cAfter == ',') && Values.Has(i)) {
            strMore += (strMore.empty() ? " (" : ", ") + Into.Of.At(i).strName + " = " +
                       ShownValue(Values.At(i));
        }
    }
    return strMore.empty() ? Failed : Amended(Failed, Failed.Advice(), strMore + ")");
}

// The steps for each mode; the result is SQLite's.
int Write(Parts& Into, RecordValues& Values, OnDuplicate eOnDuplicate, Written& eWritten) {
    int nChanged = 0;
    const bool blStop = eOnDuplicate == OnDuplicate::kStop;
    int nResult = Insert(Into, Values, blStop ? Clash::kFail : Clash::kNothing, nChanged);
    eWritten = nChanged > 0 || blStop ? Written::kInserted : Written::kSkipped;
    if (nResult == SQLITE_OK && nChanged == 0 && eOnDuplicate == OnDuplicate::kReplace) {
        nResult = Insert(Into, Values, Clash::kReplace, nChanged);
        eWritten = Written::kReplaced;
    }
    return nResult;
}

}  // namespace

std::string WhereKey(const Members& Of) {
    std::string strWhere;
    for (const size_t nMember : Of.Key()) {
        strWhere += (strWhere.empty() ? " WHERE " : " AND ") + Of.At(nMember).strColumn + " = ?";
    }
    return strWhere;
}

// An upsert updates first: an INSERT would ask for all NOT NULL members even of a record that is
// there and needs none of them.
Status WriteRecord(Parts& Into, RecordValues& Values, OnDuplicate eOnDuplicate, const Doing& What,
                   Written& eWritten) {
    int nResult = SQLITE_OK;
    int nChanged = 0;
    if (eOnDuplicate == OnDuplicate::kUpsert) {
        nResult = Update(Into, Values, nChanged);
        eWritten = Written::kUpdated;
    }
    if (nResult == SQLITE_OK && nChanged == 0) {
        FindingList vecFindings;
        if (!Values.FillDefaults(vecFindings)) {
            return FromFindings(std::move(vecFindings), What);
        }
        const bool blUpsert = eOnDuplicate == OnDuplicate::kUpsert;
        nResult = Write(Into, Values, blUpsert ? OnDuplicate::kStop : eOnDuplicate, eWritten);
    }
    if (nResult == SQLITE_OK) {
        return {};
    }
    const Status Failed = FailBySqlite(Into.pDb, nResult, What);
    return Failed.Code() == StatusCode::kDuplicate ? WithValues(Into, Values, Failed) : Failed;
}

}  // namespace vornjsondb
