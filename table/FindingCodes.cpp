#include "FindingCodes.h"

#include <utility>

#include "Concat.h"

namespace vornjsondb {

namespace {

struct FindingRow {
    const char* szCode;
    Severity eSeverity;
    const char* szRemedy;
};

constexpr FindingRow kFindingRows[] = {
#define VORN_FINDING_ROW(kConstant, szCode, kSeverity, szRemedy) \
    {szCode, Severity::kSeverity, szRemedy},
    VORN_FINDING_CODES(VORN_FINDING_ROW)
#undef VORN_FINDING_ROW
};

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
    const FindingRow& Row = kFindingRows[static_cast<size_t>(eCode)];
    return Finding{Row.eSeverity, Row.szCode, "", "", Row.szRemedy};
}

void Report(FindingList& vecFindings, FindingCode eCode, std::string strPath,
            std::string strMessage) {
    if (vecFindings.size() >= kMostFindings) {
        return;
    }
    Finding Found = RowOf(eCode);
    Found.strPath = std::move(strPath);
    Found.strMessage = std::move(strMessage);
    vecFindings.push_back(std::move(Found));
}

void ReportNoDefinition(const std::string& strTable, FindingList& vecFindings) {
    Report(vecFindings, FindingCode::kNoDefinition, Below("", strTable),
           Concat({"the definition names no members of table ", Quoted(strTable)}));
}

void ReportRefusal(const std::string& strWords, FindingList& vecFindings) {
    for (const RefusalRow& Row : kRefusals) {
        if (strWords.find(Row.szWords) != std::string::npos) {
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
            return Concat({"a list of ", std::to_string(jValue.size())});
        case Json::objectValue:
            return Concat({"an object of ", std::to_string(jValue.size())});
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
    return Quoted(blLong ? Cut(strText) : strText).append(blLong ? "..." : "");
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
    return strEnclosed += cQuote;
}

}  // namespace vornjsondb
