#include "FindingCodes.h"

#include <cstring>
#include <utility>

#include "Concat.h"

namespace vornjsondb {

namespace {

constexpr char kFindingTexts[] = VORN_FINDING_CODES(VORN_FINDING_TEXTS);
constexpr std::uint8_t kFindingSeverities[] = {VORN_FINDING_CODES(VORN_FINDING_SEVERITY)};

struct RefusalRow {
    const char* szWords;
    FindingCode eCode;
    const char* szMessage;
};

constexpr RefusalRow kRefusals[] = {
    {"parser stack overflow", FindingCode::kNestedTooDeep,
     "the conditions are nested deeper than this SQLite takes"},
    {"Expression tree is too large", FindingCode::kNestedTooDeep,
     "the conditions are nested deeper than this SQLite takes"},
    {"too many SQL variables", FindingCode::kTooManyValues,
     "the query has more values than this SQLite binds"},
};

constexpr size_t kShownBytes = 60;

// The text's first bytes, not ending inside of a UTF-8 character.
std::string_view Cut(std::string_view strText) {
    size_t nEnd = kShownBytes;
    while (nEnd > 0 && (static_cast<unsigned char>(strText[nEnd]) & 0xc0) == 0x80) {
        --nEnd;
    }
    return strText.substr(0, nEnd);
}

}  // namespace

Finding RowOf(FindingCode eCode) {
    return RowAt(static_cast<size_t>(eCode), kFindingTexts, kFindingSeverities);
}

Finding RowAt(size_t nRow, const char* szTexts, const std::uint8_t* pSeverities) {
    const auto Next = [](const char* szText) { return szText + std::strlen(szText) + 1; };
    for (size_t i = 0; i < nRow; ++i) {
        szTexts = Next(Next(szTexts));
    }
    return Finding{static_cast<Severity>(pSeverities[nRow]), szTexts, "", "", Next(szTexts)};
}

void Report(FindingList& vecFindings, FindingCode eCode, std::string_view strPath,
            std::string_view strMessage) {
    Report(vecFindings, RowOf(eCode), strPath, strMessage);
}

void Report(FindingList& vecFindings, Finding Row, std::string_view strPath,
            std::string_view strMessage) {
    if (vecFindings.size() < kMostFindings) {
        Row.strPath = strPath;
        Row.strMessage = strMessage;
        vecFindings.push_back(std::move(Row));
    }
}

void ReportAll(const FindingList& vecOthers, FindingList& vecFindings) {
    for (const Finding& Other : vecOthers) {
        Report(vecFindings, Other, Other.strPath, Other.strMessage);
    }
}

void ReportNoDefinition(const std::string& strTable, FindingList& vecFindings) {
    Report(vecFindings, FindingCode::kNoDefinition, Below("", strTable),
           Concat({"the definition names no members of table ", Quoted(strTable)}));
}

void ReportRefusal(const std::string& strWords, FindingList& vecFindings) {
    for (const RefusalRow& Row : kRefusals) {
        if (std::strstr(strWords.c_str(), Row.szWords) != nullptr) {
            Report(vecFindings, Row.eCode, "/where", Row.szMessage);
        }
    }
}

std::string Below(const std::string& strPath, std::string_view strStep) {
    std::string strBelow = strPath + '/';
    for (const char c : strStep) {
        if (c == '~') {
            strBelow += "~0";
        } else if (c == '/') {
            strBelow += "~1";
        } else {
            strBelow += c;
        }
    }
    return strBelow;
}

std::string Shown(const Json::Value& jValue) {
    switch (jValue.type()) {
        case Json::arrayValue:
            return Concat({"a list of ", DigitsOf(jValue.size())});
        case Json::objectValue:
            return Concat({"an object of ", DigitsOf(jValue.size())});
        case Json::stringValue:
            return ShownText(BytesOf(jValue));
        case Json::realValue: {
            char szDigits[32];
            sqlite3_snprintf(sizeof szDigits, szDigits, "%!.17g", jValue.asDouble());
            return szDigits;
        }
        case Json::nullValue:
            return "null";
        default:
            return jValue.asString();
    }
}

std::string ShownText(std::string_view strText) {
    const bool blLong = strText.size() > kShownBytes;
    std::string strShown = Quoted(blLong ? Cut(strText) : strText);
    strShown += blLong ? "..." : "";
    return strShown;
}

std::string_view BytesOf(const Json::Value& jText) {
    const char* pBegin = nullptr;
    const char* pEnd = nullptr;
    jText.getString(&pBegin, &pEnd);
    return {pBegin, static_cast<size_t>(pEnd - pBegin)};
}

std::string Quoted(std::string_view strName) {
    return Enclosed(strName, '"');
}

std::string Enclosed(std::string_view strText, char cQuote) {
    std::string strEnclosed(1, cQuote);
    for (const char c : strText) {
        strEnclosed.append(c == cQuote ? 2 : 1, c);
    }
    strEnclosed += cQuote;
    return strEnclosed;
}

}  // namespace vornjsondb
