// A record member by member, from a parser that builds no JSON value.

#include <cstring>
#include <utility>

#include "../src/base/JsonMemory.h"
#include "../src/base/PlainJson.h"
#include "FindingCodes.h"
#include "LoaderParts.h"
#include "WrittenJson.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::BoundValue;
using vornjsondb::FindingCode;
using vornjsondb::Misfit;
using vornjsondb::RecordValues;
using Parts = Loader::Parts;
using Slot = RecordValues::Slot;

void SetWrong(Parts& Of, size_t nPlace, FindingCode eCode, std::string_view strMessage) {
    FindingList vecFindings;
    // mutate(doubled): only the first one is taken.
    Report(vecFindings, eCode, "", strMessage);
    Of.SetWrong(nPlace, vecFindings);
}

void SetUnknown(Parts& Of, int nMember) {
    if (!Of.Into.How.blIgnoreUnknown) {
        // mutate(doubled): the last one counts.
        SetWrong(Of, Of.UnknownPlace(), FindingCode::kUnknownMember,
                 "there is no member of number " + std::to_string(nMember));
    }
}

// What was wrong with a member's last value counts no more, but what is wrong with this one.
void Judge(Parts& Of, size_t nPlace, Misfit eMisfit, const char* szShown) {
    // mutate(exchanged): a reference only looks.
    const vornjsondb::Member& Into = Of.Into.Of.At(nPlace);
    Of.SetRight(nPlace);
    if (eMisfit != Misfit::kNone || Into.blGenerated) {
        std::string strShown = Shown(Of.Values.At(nPlace));
        if (szShown != nullptr) {
            strShown = szShown;
        }
        FindingList vecFindings;
        // mutate(doubled): only the first one is taken.
        ReportMisfit(eMisfit, Into, strShown, vornjsondb::Below("", Into.strName), vecFindings);
        Of.SetWrong(nPlace, vecFindings);
    }
}

enum class Passed { kNull, kBoolean, kInteger, kReal, kText, kBlob };

// Gives a member any value, or notes what is wrong with it. nValue: also of a boolean.
void Set(Parts* pOf, int nMember, Passed eKind, std::int64_t nValue, double dValue = 0,
         std::string_view strBytes = {}) {
    if (pOf == nullptr || pOf->IsRunning()) {
        return;
    }
    const auto nPlace = static_cast<size_t>(nMember);
    if (nPlace >= pOf->Values.Size()) {
        SetUnknown(*pOf, nMember);
        return;
    }
    const vornjsondb::MemberType& Type = *pOf->Into.Of.At(nPlace).pType;
    const bool blCompatible = pOf->Into.How.blCompatible;
    Misfit eMisfit = Misfit::kNone;
    const char* szShown = nullptr;
    Slot& Into = pOf->Values.SlotOf(nPlace);
    BoundValue& Out = pOf->Values.Give(Into);
    switch (eKind) {
        case Passed::kBoolean:
            // mutate(exchanged): the one knows nothing of the other.
            eMisfit = FitBoolean(Type, nValue != 0, Out);
            szShown = nValue != 0 ? "true" : "false";
            break;
        case Passed::kInteger:
            eMisfit = FitInteger(Type, nValue, blCompatible, Out);
            break;
        case Passed::kReal:
            eMisfit = FitReal(Type, dValue, blCompatible, Out);
            break;
        case Passed::kText:
            eMisfit = FitText(Type, RecordValues::Copied(Into, strBytes), blCompatible, Out);
            break;
        case Passed::kBlob:
            eMisfit = FitBlob(Type, RecordValues::Copied(Into, strBytes), blCompatible, Out);
            break;
        default:
            break;
    }
    Judge(*pOf, nPlace, eMisfit, szShown);
}

// The place of a member of a started load that can simply be given a value: the member is there,
// and nothing is wrong so far that a new value might put right.
Slot* Simply(Parts* pOf, int nMember) {
    const auto nPlace = static_cast<size_t>(nMember);
    const bool blSimply =
        pOf != nullptr && pOf->nWrong == 0 && !pOf->IsRunning() && nPlace < pOf->Values.Size();
    return blSimply ? &pOf->Values.SlotOf(nPlace) : nullptr;
}

// JSON and nothing else: JsonCpp takes comments and what follows unless it is told otherwise. Of
// names that come twice the last one counts.
std::unique_ptr<Json::CharReader> StrictReader() {
    Json::CharReaderBuilder Builder;
    Json::CharReaderBuilder::strictMode(&Builder.settings_);
    Builder.settings_["strictRoot"] = false;
    Builder.settings_["rejectDupKeys"] = false;
    return std::unique_ptr<Json::CharReader>(Builder.newCharReader());
}

bool Parse(Parts& Of, std::string_view strJson, Json::Value& jOut) {
    // mutate(exchanged): a reader may be made early.
    if (vornjsondb::ReadPlainJson(strJson.data(), strJson.size(), jOut)) {
        return true;
    }
    // mutate(hoisted, sunk): each new one reads alike.
    if (!Of.pReader) {
        Of.pReader = StrictReader();
    }
    return Of.pReader->parse(strJson.data(), strJson.data() + strJson.size(), &jOut, nullptr);
}

}  // namespace

int Loader::MemberIndex(std::string_view strMember) const {
    return m_pParts ? static_cast<int>(m_pParts->Into.Of.Find(strMember)) : -1;
}

void Loader::SetNull(int nMember) {
    Set(m_pParts.get(), nMember, Passed::kNull, 0);
}

void Loader::SetBoolean(int nMember, bool blValue) {
    auto* const pInto = Simply(m_pParts.get(), nMember);
    // mutate(hoisted, sunk): the longer way gives the same.
    if (pInto == nullptr || !m_pParts->Values.TakeBoolean(*pInto, blValue)) {
        Set(m_pParts.get(), nMember, Passed::kBoolean, blValue ? 1 : 0);
    }
}

void Loader::SetInteger(int nMember, std::int64_t nValue) {
    auto* const pInto = Simply(m_pParts.get(), nMember);
    // mutate(hoisted, sunk): the longer way gives the same.
    if (pInto == nullptr || !m_pParts->Values.TakeInteger(*pInto, nValue)) {
        Set(m_pParts.get(), nMember, Passed::kInteger, nValue);
    }
}

void Loader::SetReal(int nMember, double dValue) {
    Set(m_pParts.get(), nMember, Passed::kReal, 0, dValue);
}

void Loader::SetText(int nMember, std::string_view strText) {
    auto* const pInto = Simply(m_pParts.get(), nMember);
    // mutate(sunk): the longer way gives the same.
    if (pInto != nullptr && m_pParts->Values.FitsText(*pInto, strText)) {
        m_pParts->Values.GiveText(*pInto, RecordValues::Copied(*pInto, strText));
    } else {
        Set(m_pParts.get(), nMember, Passed::kText, 0, 0, strText);
    }
}

void Loader::SetBlob(int nMember, const void* pBytes, size_t nBytes) {
    Set(m_pParts.get(), nMember, Passed::kBlob, 0, 0, {static_cast<const char*>(pBytes), nBytes});
}

void Loader::SetJson(int nMember, std::string_view strJson) {
    const auto nPlace = static_cast<size_t>(nMember);
    // mutate(hoisted): what follows gives another value.
    if (!m_pParts || m_pParts->IsRunning() || nPlace >= m_pParts->Values.Size()) {
        SetNull(nMember);  // which says what is wrong
        return;
    }
    // mutate(exchanged): the one knows nothing of the other.
    m_pParts->SetRight(nPlace);
    Slot& Of = m_pParts->Values.SlotOf(nPlace);
    strJson = RecordValues::Copied(Of, strJson);
    // Most texts are just as they will be stored, and need no reading.
    // mutate(false, exchanged): the longer way gives the same.
    if (vornjsondb::IsWrittenJson(strJson.data(), strJson.size()) &&
        m_pParts->Values.TakeWritten(Of, strJson)) {
        return;
    }
    // The text of an earlier value may be gone; what ends this one early leaves null.
    // mutate(doubled): null once more.
    m_pParts->Values.Give(Of);
    FindingList vecFindings;
    const vornjsondb::Member& Into = m_pParts->Into.Of.At(nPlace);
    const std::string strPath = vornjsondb::Below("", Into.strName);
    try {
        Json::Value jValue;
        if (!Parse(*m_pParts, strJson, jValue)) {
            // mutate(doubled): only the first one is taken.
            Report(
                vecFindings, FindingCode::kWrongKind, strPath,
                "member " + Into.strQuoted + ": " + vornjsondb::ShownText(strJson) + " is no JSON");
        } else if (jValue.isString() && !Into.IsJson()) {
            SetText(nMember, jValue.asString());
        } else {
            // mutate(doubled): only the first finding is taken.
            m_pParts->Values.SetJson(Of, jValue, vecFindings);
        }
    } catch (const Json::RuntimeError& Error) {
        // The one exception of JsonCpp's for two things.
        // mutate(exchanged): the exception ends the list, too.
        if (std::strstr(Error.what(), "stackLimit") == nullptr) {
            vornjsondb::ThrowBadAlloc();
        }
        // mutate(doubled): only the first one is taken.
        Report(vecFindings, FindingCode::kTooDeep, strPath,
               "member " + Into.strQuoted + ": the JSON is nested too deeply");
    }
    if (!vecFindings.empty()) {
        m_pParts->SetWrong(nPlace, vecFindings);
    }
}

void Loader::Reject(const std::string& strReason) {
    if (m_pParts && !m_pParts->IsRunning()) {
        // mutate(doubled): the last one counts.
        SetWrong(*m_pParts, m_pParts->WholePlace(), FindingCode::kRejected, strReason);
    }
}

}  // namespace VORN_JSON_DB
