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

using vornjsondb::FindingCode;
using vornjsondb::Misfit;
using Parts = Loader::Parts;

// What is wrong and belongs to no member.
constexpr size_t kUnknown = vornjsondb::Members::kNone - 1;
constexpr size_t kWhole = vornjsondb::Members::kNone;

Finding One(FindingCode eCode, std::string strPath, std::string strMessage) {
    FindingList vecFindings;
    Report(vecFindings, eCode, std::move(strPath), std::move(strMessage));
    return std::move(vecFindings[0]);
}

void SetUnknown(Parts& Of, int nMember) {
    if (!Of.Into.How.blIgnoreUnknown) {
        Of.mapWrong[kUnknown] = One(FindingCode::kUnknownMember, "",
                                    "there is no member of number " + std::to_string(nMember));
    }
}

// What was wrong with a member's last value counts no more, but what is wrong with this one.
void Judge(Parts& Of, size_t nPlace, Misfit eMisfit, const char* szShown) {
    const vornjsondb::Member& Into = Of.Into.Of.At(nPlace);
    Of.mapWrong.erase(nPlace);
    if (eMisfit != Misfit::kNone || Into.blGenerated) {
        std::string strShown = Shown(Of.Values.At(nPlace));
        if (szShown != nullptr) {
            strShown = szShown;
        }
        FindingList vecFindings;
        ReportMisfit(eMisfit, Into, strShown, vornjsondb::Below("", Into.strName), vecFindings);
        Of.mapWrong[nPlace] = std::move(vecFindings[0]);
    }
}

// Gives a member what fnFit makes of it; szShown shows it in messages where that does not. As short
// as it can be where nothing is wrong: this runs for every value of a million records.
template <typename Fit>
void Set(Parts* pOf, int nMember, Fit&& fnFit, const char* szShown = nullptr) {
    if (pOf == nullptr) {
        return;
    }
    const auto nPlace = static_cast<size_t>(nMember);
    if (nPlace >= pOf->vecBytes.size()) {
        SetUnknown(*pOf, nMember);
        return;
    }
    const vornjsondb::Member& Into = pOf->Into.Of.At(nPlace);
    const Misfit eMisfit = fnFit(*Into.pType, pOf->Values.Give(nPlace));
    if (eMisfit != Misfit::kNone || Into.blGenerated || !pOf->mapWrong.empty()) {
        Judge(*pOf, nPlace, eMisfit, szShown);
    }
}

// The member's own copy of what was passed.
std::string_view Copied(Parts& Of, int nMember, const char* pBytes, size_t nBytes) {
    return Of.vecBytes[static_cast<size_t>(nMember)].assign(pBytes, nBytes);
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

// Most texts are just as they will be stored, and need no reading.
bool SetWritten(Parts& Of, size_t nPlace, std::string_view strJson) {
    const vornjsondb::Member& Into = Of.Into.Of.At(nPlace);
    return vornjsondb::IsWrittenJson(strJson.data(), strJson.size()) && !Into.blGenerated &&
           FitWritten(*Into.pType, strJson, Of.Into.How.blCompatible, Of.Values.Give(nPlace)) ==
               Misfit::kNone;
}

bool Parse(Parts& Of, std::string_view strJson, Json::Value& jOut) {
    if (vornjsondb::ReadPlainJson(strJson.data(), strJson.size(), jOut)) {
        return true;
    }
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
    Set(m_pParts.get(), nMember, [](const auto&, vornjsondb::BoundValue& Out) {
        Out.eKind = vornjsondb::BoundValue::Kind::kNull;
        return Misfit::kNone;
    });
}

void Loader::SetBoolean(int nMember, bool blValue) {
    Set(
        m_pParts.get(), nMember,
        [blValue](const auto& Type, auto& Out) { return FitBoolean(Type, blValue, Out); },
        blValue ? "true" : "false");
}

void Loader::SetInteger(int nMember, std::int64_t nValue) {
    Set(m_pParts.get(), nMember, [&](const auto& Type, auto& Out) {
        return FitInteger(Type, nValue, m_pParts->Into.How.blCompatible, Out);
    });
}

void Loader::SetReal(int nMember, double dValue) {
    Set(m_pParts.get(), nMember, [&](const auto& Type, auto& Out) {
        return FitReal(Type, dValue, m_pParts->Into.How.blCompatible, Out);
    });
}

void Loader::SetText(int nMember, std::string_view strText) {
    Set(m_pParts.get(), nMember, [&](const auto& Type, auto& Out) {
        return FitText(Type, Copied(*m_pParts, nMember, strText.data(), strText.size()),
                       m_pParts->Into.How.blCompatible, Out);
    });
}

void Loader::SetBlob(int nMember, const void* pBytes, size_t nBytes) {
    Set(m_pParts.get(), nMember, [&](const auto& Type, auto& Out) {
        return FitBlob(Type, Copied(*m_pParts, nMember, static_cast<const char*>(pBytes), nBytes),
                       m_pParts->Into.How.blCompatible, Out);
    });
}

void Loader::SetJson(int nMember, std::string_view strJson) {
    const auto nPlace = static_cast<size_t>(nMember);
    if (!m_pParts || nPlace >= m_pParts->vecBytes.size()) {
        SetNull(nMember);  // which says what is wrong
        return;
    }
    m_pParts->mapWrong.erase(nPlace);
    // A NUL stands behind the copy.
    strJson = Copied(*m_pParts, nMember, strJson.data(), strJson.size());
    if (SetWritten(*m_pParts, nPlace, strJson)) {
        return;
    }
    const vornjsondb::Member& Into = m_pParts->Into.Of.At(nPlace);
    const std::string strPath = vornjsondb::Below("", Into.strName);
    FindingList vecFindings;
    try {
        Json::Value jValue;
        if (!Parse(*m_pParts, strJson, jValue)) {
            Report(
                vecFindings, FindingCode::kWrongKind, strPath,
                "member " + Into.strQuoted + ": " + vornjsondb::ShownText(strJson) + " is no JSON");
        } else if (jValue.isString() && !Into.IsJson()) {
            SetText(nMember, jValue.asString());
        } else {
            m_pParts->Values.SetJson(nPlace, jValue, vecFindings);
        }
    } catch (const Json::RuntimeError& Error) {
        // The one exception of JsonCpp's for two things.
        if (std::strstr(Error.what(), "stackLimit") == nullptr) {
            vornjsondb::ThrowBadAlloc();
        }
        Report(vecFindings, FindingCode::kTooDeep, strPath,
               "member " + Into.strQuoted + ": the JSON is nested too deeply");
    }
    if (!vecFindings.empty()) {
        m_pParts->mapWrong[nPlace] = std::move(vecFindings[0]);
    }
}

void Loader::Reject(std::string strReason) {
    if (m_pParts) {
        m_pParts->mapWrong[kWhole] = One(FindingCode::kRejected, "", std::move(strReason));
    }
}

}  // namespace VORN_JSON_DB
