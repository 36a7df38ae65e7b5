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

constexpr size_t kShortText = 64;

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

void RecordValues::Clear() {
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
    const std::string* const pNames = m_Of.Names().data();
    const size_t nNames = m_Of.Names().size();
    size_t nNext = 0;
    for (Json::Value::const_iterator it = jRecord.begin(); nLeft > 0; --nLeft, ++it) {
        const std::string_view strName = NameOf(it).View();
        bool blIsNext = false;
        while (nNext < nNames && !(blIsNext = pNames[nNext] == strName) &&
               pNames[nNext] < strName) {
            ++nNext;
        }
        if (blIsNext) {
            SetJson(nNext++, *it, vecFindings);
        } else if (!m_blIgnoreUnknown) {
            RefuseUnknown(std::string(strName), vecFindings);
        }
    }
    return vecFindings.empty();
}

void RecordValues::SetJson(size_t nMember, const Json::Value& jValue, FindingList& vecFindings) {
    bool blTaken = false;
    // mutate(exchanged): the longer way gives the same.
    switch (jValue.type()) {
        case Json::stringValue:
            blTaken = TakeText(nMember, BytesOf(jValue));
            break;
        case Json::intValue:
            // mutate(dropped): the longer way gives the same.
            blTaken = TakeInteger(nMember, jValue.asInt64());
            break;
        case Json::booleanValue:
            // mutate(dropped): the longer way gives the same.
            blTaken = TakeBoolean(nMember, jValue.asBool());
            break;
        case Json::arrayValue:
            // mutate(dropped): the longer way gives the same.
            blTaken = TakeTree(nMember, jValue, BoundKind::kList);
            break;
        case Json::objectValue:
            // mutate(dropped): the longer way gives the same.
            blTaken = TakeTree(nMember, jValue, BoundKind::kObject);
            break;
        default:
            break;
    }
    // mutate(hoisted, sunk): the longer way gives the same.
    if (!blTaken) {
        LookAtJson(nMember, jValue, vecFindings);
    }
}

// A short text goes where the last one of its length is bound, which is cheaper than to bind it.
bool RecordValues::TakeText(size_t nMember, std::string_view strText) {
    const bool blFits = FitsText(nMember, strText);
    if (blFits) {
        // mutate(any): a text is stored wherever it is kept.
        const bool blCopy =
            strText.size() == At(nMember).strBytes.size() && strText.size() <= kShortText;
        GiveText(nMember, blCopy ? Copied(nMember, strText) : strText);
    }
    return blFits;
}

// Plain JSON is written without a look before.
bool RecordValues::TakeTree(size_t nMember, const Json::Value& jValue, BoundKind eKind) {
    Slot& Of = m_vecSlots[nMember];
    if (Of.eKind != eKind) {
        return false;
    }
    const bool blPlain = WritePlainText(jValue, Of.strBytes);
    if (blPlain) {
        GiveText(nMember, Of.strBytes);
    }
    return blPlain;
}

void RecordValues::LookAtJson(size_t nMember, const Json::Value& jValue, FindingList& vecFindings) {
    const Member& Into = m_Of.At(nMember);
    const Misfit eMisfit = FitJson(*Into.pType, jValue, m_blCompatible, m_Codec,
                                   m_vecSlots[nMember].strBytes, Give(nMember));
    if (eMisfit != Misfit::kNone || m_vecSlots[nMember].blComputed) {
        Refuse(Into, eMisfit, jValue, vecFindings);
    }
}

void RecordValues::Refuse(const Member& Into, Misfit eMisfit, const Json::Value& jValue,
                          FindingList& vecFindings) const {
    ReportMisfit(eMisfit, Into, Shown(jValue), Below("", Into.strName), vecFindings);
}

void RecordValues::RefuseUnknown(const std::string& strName, FindingList& vecFindings) const {
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
            SetJson(nMember, *m_Of.At(nMember).pjDefault, vecFindings);
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
    const char* pGiven = m_strGiven.data();
    const Member* pMember = m_Of.All().data();
    int nParameter = nNext;
    for (Slot& Each : m_vecSlots) {
        if (*pGiven == '1' && (blKeyToo || !pMember->blKey)) {
            if (!blAgain || !Each.blBound) {
                const int nResult = Each.Value.Bind(pStatement, nParameter);
                if (nResult != SQLITE_OK) {
                    return nResult;
                }
                Each.blBound = true;
            }
            ++nParameter;
        }
        ++pGiven;
        ++pMember;
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
