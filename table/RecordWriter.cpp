#include "RecordWriter.h"

#include <string_view>
#include <utility>

#include "Concat.h"
#include "FindingCodes.h"
#include "RealTable.h"

namespace vornjsondb {

namespace {

std::string InsertSql(const Members& Of, const RecordValues& Values) {
    std::string strColumns;
    std::string strValues;
    for (size_t i = 0; i < Of.Size(); ++i) {
        if (Values.Has(i)) {
            Append(strColumns, {strColumns.empty() ? " (" : ", ", Of.At(i).strQuoted});
            strValues += strValues.empty() ? ") VALUES (?" : ", ?";
        }
    }
    return Concat({"INSERT INTO ", Of.QuotedTable(), strColumns, strValues, ")"});
}

std::string KeyList(const Members& Of) {
    std::string strList;
    for (const size_t nMember : Of.Key()) {
        Append(strList,
               {strList.empty() ? "(" : ", ", Of.At(nMember).strQuoted, Of.At(nMember).strCollate});
    }
    strList += ')';
    return strList;
}

// Or the key as it is, so that SQLite tells whether there is such a record.
std::string SetOrKey(const Members& Of, const std::string& strSet) {
    const std::string& strKey = Of.At(Of.Key()[0]).strQuoted;
    return strSet.empty() ? Concat({strKey, "=", strKey}) : strSet;
}

// What the INSERT does with a key that is there already: all other members anew, or nothing. The
// table would hand out another rowid, and what refers to the row would lose it.
std::string OnConflict(const Members& Of, const RecordValues& Values, bool blReplace) {
    const std::string strHead = Concat({" ON CONFLICT ", KeyList(Of), " DO "});
    if (!blReplace) {
        return Concat({strHead, "NOTHING"});
    }
    std::string strSet;
    for (size_t i = 0; i < Of.Size(); ++i) {
        const Member& Other = Of.At(i);
        // "excluded" holds the column's default where the record has no value.
        if (!Other.blKey && !Other.blGenerated && (!Other.blRowid || Values.Has(i))) {
            // mutate(doubled): a column may be set twice.
            Append(strSet,
                   {strSet.empty() ? "" : ", ", Other.strQuoted, "=excluded.", Other.strQuoted});
        }
    }
    return Concat({strHead, "UPDATE SET ", SetOrKey(Of, strSet)});
}

std::string UpdateSql(const Members& Of, const RecordValues& Values) {
    std::string strSet;
    for (size_t i = 0; i < Of.Size(); ++i) {
        if (Values.Has(i) && !Of.At(i).blKey) {  // mutate(exchanged): both only look.
            Append(strSet, {strSet.empty() ? "" : ", ", Of.At(i).strQuoted, "=?"});
        }
    }
    return Concat({"UPDATE ", Of.QuotedTable(), " SET ", SetOrKey(Of, strSet), WhereKey(Of)});
}

}  // namespace

void CheckEmpty(const RecordValues& Values, FindingList& vecFindings) {
    if (vecFindings.empty() && Values.IsEmpty()) {
        Report(vecFindings, FindingCode::kNotARecord, "", "the record has no members");
    }
}

Status CheckMode(OnDuplicate eOnDuplicate, const Doing& What) {
    const bool blMode =
        static_cast<size_t>(eOnDuplicate) <= static_cast<size_t>(OnDuplicate::kUpsert);
    return blMode ? Status()
                  : Fail(VORN_JSON_DB::StatusCode::kMisuse, What,
                         "there is no OnDuplicate of this number");
}

Status CheckTable(const Table::Parts& Of, const Doing& What) {
    bool blView = false;
    const int nResult = Of.blView ? SQLITE_OK : IsView(Of.pDb, Of.Of.Table(), blView);
    if (!blView) {
        return FromSqlite(Of.pDb, nResult, What);
    }
    return Fail(StatusCode::kMisuse, What,
                "it has become a view, whose triggers may have done something: open it anew");
}

std::string WhereKey(const Members& Of) {
    std::string strWhere;
    for (const size_t nMember : Of.Key()) {
        Append(strWhere, {strWhere.empty() ? " WHERE " : " AND ", Of.At(nMember).strColumn,
                          Of.At(nMember).strCollate, " = ?"});
    }
    return strWhere;
}

std::string RecordWriter::Sql(Verb eVerb) const {
    switch (eVerb) {
        case Verb::kInsert:
            return InsertSql(m_Into.Of, m_Values);
        case Verb::kInsertNew:
        case Verb::kReplace:
            return Concat({InsertSql(m_Into.Of, m_Values),
                           OnConflict(m_Into.Of, m_Values, eVerb == Verb::kReplace)});
        case Verb::kUpdate:
            return UpdateSql(m_Into.Of, m_Values);
        default:
            return Concat({"SELECT 1 FROM ", m_Into.Of.QuotedTable(), WhereKey(m_Into.Of)});
    }
}

// The statement for the members of this record, in the place of the last one.
int RecordWriter::Take(Verb eVerb, Statement& Held) {
    Held = Statement();
    return m_Into.Kept.Take(
        Concat({LetterOf(eVerb), m_Values.Given()}), [&] { return Sql(eVerb); }, Held);
}

// Runs one statement to its end. nRows, 0 before: how many it found or changed.
int RecordWriter::Run(Verb eVerb, int& nRows) {
    Statement& Held = m_aHeld[static_cast<size_t>(eVerb)];
    const bool blHeld = Held.IsFor(m_Values.Given());
    int nResult = blHeld ? SQLITE_OK : Take(eVerb, Held);
    int nNext = 1;
    // mutate(sunk): what is bound may be bound again.
    if (nResult == SQLITE_OK && eVerb != Verb::kFind) {
        const bool blAgain = blHeld && m_pBound == &Held;
        nResult = m_Values.BindGiven(Held.Get(), nNext, eVerb != Verb::kUpdate, blAgain);
        // mutate(dropped): what is bound may be bound again.
        m_pBound = nResult == SQLITE_OK ? &Held : nullptr;
    }
    if (nResult == SQLITE_OK && (eVerb == Verb::kFind || eVerb == Verb::kUpdate)) {
        nResult = m_Values.BindKey(Held.Get(), nNext);
    }
    if (nResult == SQLITE_OK) {
        nResult = Held.Finish(&nRows);
    }
    if (nResult == SQLITE_OK && eVerb != Verb::kFind) {
        nRows = sqlite3_changes(m_Into.pDb);
    }
    return nResult;
}

// What replaces looks first, to tell which it was. So does an upsert: an INSERT would ask for all
// NOT NULL members even of a record that is there and needs none of them, and of an UPDATE that a
// trigger has ignored SQLite counts as much as of one that finds nothing.
Status RecordWriter::Write(OnDuplicate eOnDuplicate, const Doing& What, Written& eWritten) {
    struct Mode {
        bool blLooks;
        Verb eNew, eThere;
        Written eFound;
    };
    static constexpr Mode kModes[] = {
        {false, Verb::kInsert, Verb::kInsert, Written::kInserted},
        {false, Verb::kInsertNew, Verb::kInsertNew, Written::kSkipped},
        {true, Verb::kReplace, Verb::kReplace, Written::kReplaced},
        {true, Verb::kInsert, Verb::kUpdate, Written::kUpdated}};
    const Mode& Now = kModes[static_cast<size_t>(eOnDuplicate)];
    int nFound = 0;
    int nChanged = 0;
    int nResult = Now.blLooks ? Run(Verb::kFind, nFound) : SQLITE_OK;
    const Verb eVerb = nFound > 0 ? Now.eThere : Now.eNew;
    if (nResult == SQLITE_OK && eVerb != Verb::kUpdate && m_Values.HasDefaults()) {
        FindingList vecFindings;
        if (!m_Values.FillDefaults(vecFindings)) {
            return FromFindings(std::move(vecFindings), What);
        }
    }
    if (nResult == SQLITE_OK) {
        nResult = Run(eVerb, nChanged);
    }
    const bool blSkipped = eVerb == Verb::kInsertNew && nChanged == 0;
    // mutate(exchanged): after a failure nobody asks for it.
    eWritten = nFound > 0 || blSkipped ? Now.eFound : Written::kInserted;
    if (nResult == SQLITE_OK && nChanged == 0 && !blSkipped && !m_Into.blView) {
        Status Still = CheckTable(m_Into, What);
        return Still.Ok() ? Fail(StatusCode::kConstraint, What,
                                 "nothing was stored: a trigger or an ON CONFLICT clause of the "
                                 "table has ignored the record")
                          : Still;
    }
    if (nResult == SQLITE_OK) {
        // What is there already has got its rowid from another statement than the last one.
        // mutate(exchanged): both only look.
        const bool blHandedOut = eWritten == Written::kInserted && m_Into.HandsOut(m_Values);
        return blHandedOut ? CheckRowid(What) : Status();
    }
    const Status Failed = FailBySqlite(m_Into.pDb, nResult, What);
    return Failed.Code() == StatusCode::kDuplicate ? WithValues(Failed) : Failed;
}

// No key that SQLite hands out is one that the member could not be given.
Status RecordWriter::CheckRowid(const Doing& What) {
    // mutate(exchanged): both only look.
    const Member& Key = m_Into.Of.At(m_Into.nHandedOut);
    const std::int64_t nRowid = sqlite3_last_insert_rowid(m_Into.pDb);
    BoundValue Value;
    FindingList vecFindings;
    const Misfit eMisfit = FitInteger(*Key.pType, nRowid, m_Into.How.blCompatible, Value);
    if (eMisfit != Misfit::kNone) {
        m_blStored = true;
        ReportMisfit(eMisfit, Key, Concat({DigitsOf(nRowid), ", which the table hands out,"}),
                     Below("", Key.strName), vecFindings);
    }
    return FromFindings(std::move(vecFindings), What);
}

// SQLite names the columns, "task.id, task.name"; the values are told beside them.
Status RecordWriter::WithValues(const Status& Failed) const {
    const Members& Of = m_Into.Of;
    const std::string& strMessage = Failed.Message();
    std::string strMore;
    for (size_t i = 0; i < Of.Size(); ++i) {
        const std::string strName = Concat({Of.Table(), ".", Of.At(i).strName});
        const size_t nFound = std::string_view(strMessage).rfind(strName);
        const char cAfter = nFound == std::string::npos ? 'x' : strMessage[nFound + strName.size()];
        if ((cAfter == '\0' || cAfter == ',') && m_Values.Has(i)) {
            Append(strMore,
                   {strMore.empty() ? " (" : ", ", Of.At(i).strName, " = ", Shown(m_Values.At(i))});
        }
    }
    strMore += strMore.empty() ? "" : ")";
    return Amended(Failed, Failed.Advice(), strMore);
}

}  // namespace vornjsondb
