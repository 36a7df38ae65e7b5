#include "RecordValues.h"

#include <algorithm>
#include <utility>

#include "../src/base/JsonMember.h"
#include "Concat.h"
#include "FindingCodes.h"
#include "Nearest.h"
#include "WrittenJson.h"

namespace vornjsondb {

namespace {

// mutate(any): a text is stored wherever it is kept.
constexpr size_t kShortText = 64;

using Slot = RecordValues::Slot;

// A short text goes where the last one of its length is bound, which is cheaper than to bind it.
bool TakeText(RecordValues& Into, Slot& Of, const Json::Value& jText) {
    const char* pBegin = nullptr;
    const char* pEnd = nullptr;
    // mutate(true): the longer way gives the same.
    if (!jText.getString(&pBegin, &pEnd)) {
        return false;
    }
    const std::string_view strText(pBegin, static_cast<size_t>(pEnd - pBegin));
    const bool blFits = Into.FitsText(Of, strText);
    // mutate(true, sunk): the longer way gives the same.
    if (blFits) {
        // mutate(any): a text is stored wherever it is kept.
        const bool blCopy =
            strText.size() == Of.Value.strBytes.size() && strText.size() <= kShortText;
        Into.GiveText(Of, blCopy ? RecordValues::Copied(Of, strText) : strText);
    }
    return blFits;
}

// Plain JSON is written without a look before.
bool TakeTree(RecordValues& Into, Slot& Of, const Json::Value& jTree) {
    const bool blPlain = WritePlainText(jTree, Of.strBytes);
    // mutate(true, hoisted, sunk): the longer way gives the same.
    if (blPlain) {
        Into.GiveText(Of, Of.strBytes);
    }
    return blPlain;
}

// Takes a value of the member's own kind that fits, as most do: in a few steps, for SetJson gives
// the same for every value.
bool TakeJson(RecordValues& Into, Slot& Of, const Json::Value& jValue) {
    switch (Of.eKind) {
        case BoundKind::kText:
            return TakeText(Into, Of, jValue);
        case BoundKind::kInteger:
            return jValue.type() == Json::intValue && Into.TakeInteger(Of, jValue.asInt64());
        case BoundKind::kBoolean: {
            const bool blFits = jValue.type() == Json::booleanValue;
            if (blFits) {
                Into.GiveInteger(Of, jValue.asBool() ? 1 : 0);
            }
            return blFits;
        }
        case BoundKind::kList:
        case BoundKind::kObject: {
            const auto eTree = Of.eKind == BoundKind::kList ? Json::arrayValue : Json::objectValue;
            // mutate(exchanged): the longer way gives the same.
            return jValue.type() == eTree && TakeTree(Into, Of, jValue);
        }
        default:
            return false;
    }
}

}  // namespace

RecordValues::RecordValues(const Members& Of, JsonCodec& Codec, bool blCompatible,
                           bool blIgnoreUnknown)
    : m_Of(Of),
      m_Codec(Codec),
      m_blCompatible(blCompatible),
      m_blIgnoreUnknown(blIgnoreUnknown),
      m_vecSlots(Of.Size()),
      m_strGiven(Of.Size(), '0') {
    for (size_t i = 0; i < Of.Size(); ++i) {
        // mutate(doubled): a default is given once.
        Prepare(i);
    }
}

void RecordValues::Prepare(size_t nMember) {
    const Member& Of = m_Of.At(nMember);
    const Range& Fits = RangeOf(*Of.pType);
    Slot& Into = m_vecSlots[nMember];
    Into.pMember = &Of;
    Into.pGiven = &m_strGiven[nMember];
    if (!m_blCompatible || Of.pType->pfnRead != nullptr) {
        // mutate(dropped): the longer way gives the same.
        Into.eKind = Of.Kind();
    }
    if (Of.blGenerated) {
        RefuseAlways(nMember);
    }
    // mutate(dropped): the longer way gives the same.
    Into.nLeast = Fits.nLeast;
    // mutate(dropped): the longer way gives the same.
    Into.nMost = m_blCompatible ? Fits.nMostRead : Fits.nMost;
    if (Of.pjDefault != nullptr) {
        // mutate(doubled): a default is given once.
        m_vecDefaults.push_back(nMember);
    }
}

void RecordValues::ForgetAll() {
    std::fill(m_strGiven.begin(), m_strGiven.end(), '0');
    m_blEmpty = true;
}

bool RecordValues::Take(const Json::Value& jRecord, FindingList& vecFindings) {
    Clear();
    Json::ArrayIndex nLeft = jRecord.isObject() ? jRecord.size() : 0;
    if (nLeft == 0) {
        Report(vecFindings, FindingCode::kNotARecord, "",
               Concat({Shown(jRecord), " is no record: an object with members is expected"}));
        return false;
    }
    // Records and definition are sorted alike: one step a member.
    Slot* pNext = m_vecSlots.data();
    const Slot* const pEnd = pNext + m_vecSlots.size();
    for (Json::Value::const_iterator it = jRecord.begin(); nLeft > 0; --nLeft, ++it) {
        const std::string_view strName = NameOf(it).View();
        bool blIsNext = false;
        while (pNext != pEnd && !(blIsNext = pNext->pMember->strName == strName) &&
               pNext->pMember->strName < strName) {
            ++pNext;
        }
        if (blIsNext) {
            Slot& Of = *pNext++;
            // mutate(true, hoisted, sunk): the longer way gives the same.
            if (!TakeJson(*this, Of, *it)) {
                SetJson(Of, *it, vecFindings);
            }
        } else if (!m_blIgnoreUnknown) {
            RefuseUnknown(strName, vecFindings);
        }
    }
    return vecFindings.empty();
}

void RecordValues::SetJson(Slot& Of, const Json::Value& jValue, FindingList& vecFindings) {
    BoundValue Made;
    const Misfit eMisfit =
        FitJson(*Of.pMember->pType, jValue, m_blCompatible, m_Codec, Of.strBytes, Made);
    Mark(Of);
    // mutate(true, hoisted, sunk): what is bound may be bound again.
    if (!Of.Value.IsBoundAs(Made)) {
        Of.blBound = false;
        Of.Value = Made;
    }
    if (eMisfit != Misfit::kNone || Of.blComputed) {
        Refuse(*Of.pMember, eMisfit, jValue, vecFindings);
    }
}

void RecordValues::Refuse(const Member& Into, Misfit eMisfit, const Json::Value& jValue,
                          FindingList& vecFindings) const {
    ReportMisfit(eMisfit, Into, Shown(jValue), Below("", Into.strName), vecFindings);
}

void RecordValues::RefuseUnknown(std::string_view strUnknown, FindingList& vecFindings) const {
    if (vecFindings.size() == kMostFindings) {
        return;
    }
    const std::string strName(strUnknown);
    Report(vecFindings, FindingCode::kUnknownMember, Below("", strName),
           Concat({"there is no member ", ShownText(strName), Suggestion(strName, m_Of.Names())}));
}

void RecordValues::Grow(std::string& strOwn, size_t nBytes) {
    strOwn.resize(nBytes);
}

bool RecordValues::FillDefaults(FindingList& vecFindings) {
    for (const size_t nMember : m_vecDefaults) {
        // The real table may compute what the definition has a default for.
        // mutate(exchanged): both only look.
        if (!Has(nMember) && !m_Of.At(nMember).blGenerated) {
            SetJson(m_vecSlots[nMember], *m_Of.At(nMember).pjDefault, vecFindings);
        }
    }
    return vecFindings.empty();
}

bool RecordValues::HasKey(FindingList& vecFindings) const {
    // mutate(exchanged): only one of the two finds anything.
    if (m_Of.Key().empty()) {
        Report(vecFindings, FindingCode::kNoKey, "", kNoKeyText);
    }
    for (const size_t nMember : m_Of.Key()) {
        const Member& Of = m_Of.At(nMember);
        // mutate(exchanged): both only look.
        if (!Has(nMember) || At(nMember).eKind == BoundValue::Kind::kNull) {
            const bool blComputed = m_vecSlots[nMember].blComputed;
            Report(
                vecFindings, FindingCode::kMissingKey, Below("", Of.strName),
                Concat({"the key's member ", Of.strQuoted,
                        blComputed ? " is computed by the table, and no record can bring its value"
                                   : " has no value"}));
        }
    }
    return vecFindings.empty();
}

int RecordValues::BindGiven(sqlite3_stmt* pStatement, int& nNext, bool blKeyToo, bool blAgain) {
    int nParameter = nNext;
    for (Slot& Each : m_vecSlots) {
        if (*Each.pGiven == '1' && (blKeyToo || !Each.pMember->blKey)) {
            if (!blAgain || !Each.blBound) {
                const int nResult = Each.Value.Bind(pStatement, nParameter);
                if (nResult != SQLITE_OK) {
                    return nResult;
                }
                Each.blBound = true;
            }
            ++nParameter;
        }
    }
    nNext = nParameter;
    return SQLITE_OK;
}

int RecordValues::BindKey(sqlite3_stmt* pStatement, int& nNext) const {
    for (const size_t nMember : m_Of.Key()) {
        const int nResult = At(nMember).Bind(pStatement, nNext++);
        if (nResult != SQLITE_OK) {
            return nResult;
        }
    }
    return SQLITE_OK;
}

void ReportMisfit(Misfit eMisfit, const Member& Into, const std::string& strShown,
                  std::string_view strPath, FindingList& vecFindings) {
    struct MisfitRow {
        Misfit eMisfit;
        FindingCode eCode;
        const char* szReason;
    };
    static constexpr MisfitRow kRows[] = {
        {Misfit::kKind, FindingCode::kWrongKind, " is another kind of value: expected is "},
        {Misfit::kRange, FindingCode::kOutOfRange, " is out of range: expected is "},
        {Misfit::kNotANumber, FindingCode::kNotANumber, " is or holds NaN: expected is "},
        {Misfit::kInfinite, FindingCode::kNotANumber, " is or holds an infinity: expected is "},
        {Misfit::kDepth, FindingCode::kTooDeep,
         " is nested too deeply to be read back: expected is "},
        {Misfit::kUnreadable, FindingCode::kOldCannotRead,
         " could not be read back by a VornJsonDbApi, although it is "},
    };
    if (eMisfit == Misfit::kNone) {
        Report(vecFindings, FindingCode::kGenerated, strPath,
               Concat({"member ", Into.strQuoted, " is computed by the table"}));
        return;
    }
    const MisfitRow* pRow = kRows;
    while (pRow->eMisfit != eMisfit) {
        ++pRow;
    }
    Report(
        vecFindings, pRow->eCode, strPath,
        Concat({"member ", Into.strQuoted, ": ", strShown, pRow->szReason, Expected(*Into.pType)}));
}

}  // namespace vornjsondb
