#include "JsonCells.h"

#include <charconv>
#include <cmath>

#include "input/JsonText.h"
#include "input/Sink.h"
#include "input/Utf8.h"

namespace VORN_JSON_DB::Cli {

namespace {

const char kBase64[] = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789+/";

}  // namespace

void AppendInteger(std::string& strOut, std::int64_t nValue) {
    char szDigits[24];
    strOut.append(szDigits, std::to_chars(szDigits, szDigits + sizeof szDigits, nValue).ptr);
}

void AppendReal(std::string& strOut, double dValue) {
    if (std::isinf(dValue)) {
        strOut += dValue > 0 ? "1e999" : "-1e999";
        return;
    }
    char szDigits[32];
    const char* const pEnd = std::to_chars(szDigits, szDigits + sizeof szDigits, dValue).ptr;
    const std::string_view strDigits(szDigits, static_cast<std::size_t>(pEnd - szDigits));
    strOut += strDigits;
    if (strDigits.find_first_of(".en") == std::string_view::npos) {
        strOut += ".0";
    }
}

void AppendJsonString(std::string& strOut, std::string_view strText) {
    AppendQuoted(WithoutBadBytes(strText), strOut);
}

void AppendJson(std::string& strOut, std::string_view strJson) {
    bool blInText = false;
    for (std::size_t nAt = 0; nAt < strJson.size(); ++nAt) {
        const char c = strJson[nAt];
        if (c == '\n' || c == '\r') {
            strOut += ' ';
            continue;
        }
        strOut += c;
        if (c == '"') {
            blInText = !blInText;
        } else if (blInText && c == '\\' && nAt + 1 < strJson.size()) {
            strOut += strJson[++nAt];
        }
    }
}

void AppendBase64(std::string& strOut, std::string_view strBytes) {
    for (std::size_t nAt = 0; nAt < strBytes.size(); nAt += 3) {
        std::uint32_t nBits = 0;
        for (std::size_t nByte = nAt; nByte < nAt + 3; ++nByte) {
            const bool blThere = nByte < strBytes.size();
            nBits = nBits << 8 | (blThere ? static_cast<unsigned char>(strBytes[nByte]) : 0U);
        }
        const std::size_t nThere = strBytes.size() - nAt;
        strOut += kBase64[nBits >> 18];
        strOut += kBase64[nBits >> 12 & 63];
        strOut += nThere > 1 ? kBase64[nBits >> 6 & 63] : '=';
        strOut += nThere > 2 ? kBase64[nBits & 63] : '=';
    }
}

std::string FromBase64(const std::string& strText, bool& blRight) {
    std::string strBytes;
    std::uint32_t nBits = 0;
    int nCount = 0;
    const std::size_t nDigits = strText.find_last_not_of('=') + 1;
    blRight = strText.size() % 4 == 0 && strText.size() - nDigits <= 2;
    for (std::size_t nAt = 0; nAt < nDigits && blRight; ++nAt) {
        const std::size_t nDigit = std::string_view(kBase64).find(strText[nAt]);
        blRight = nDigit != std::string_view::npos;
        nBits = nBits << 6 | static_cast<std::uint32_t>(nDigit & 63);
        nCount += 6;
        if (nCount >= 8) {
            nCount -= 8;
            strBytes += static_cast<char>(nBits >> nCount & 255);
        }
    }
    return strBytes;
}

void AppendBlob(std::string& strOut, std::string_view strBytes) {
    strOut += kBlobBegin;
    AppendBase64(strOut, strBytes);
    strOut += "\"}";
}

void AppendExactText(std::string& strOut, std::string_view strText) {
    if (IsUtf8(strText)) {
        return AppendQuoted(strText, strOut);
    }
    strOut += kTextBegin;
    AppendBase64(strOut, strText);
    strOut += "\"}";
}

void AppendExactReal(std::string& strOut, double dValue) {
    if (std::isinf(dValue)) {
        strOut += dValue > 0 ? kInfinity : kMinusInfinity;
    } else {
        AppendReal(strOut, dValue);
    }
}

bool IsUtf8(std::string_view strText) {
    return FindNoUtf8(strText) == std::string_view::npos;
}

namespace {

void AppendValue(std::string& strOut, const Json::Value& jValue) {
    const char* szBetween = "";
    switch (jValue.type()) {
        case Json::realValue:
            return AppendReal(strOut, jValue.asDouble());
        case Json::stringValue:
            return AppendJsonString(strOut, jValue.asString());
        case Json::arrayValue:
            strOut += '[';
            for (const Json::Value& jItem : jValue) {
                strOut += szBetween;
                AppendValue(strOut, jItem);
                szBetween = ",";
            }
            strOut += ']';
            return;
        case Json::objectValue:
            strOut += '{';
            for (auto it = jValue.begin(); it != jValue.end(); ++it) {
                strOut += szBetween;
                AppendJsonString(strOut, it.name());
                strOut += ':';
                AppendValue(strOut, *it);
                szBetween = ",";
            }
            strOut += '}';
            return;
        default:
            strOut += jValue.isNull() ? "null" : jValue.asString();
    }
}

}  // namespace

Json::Value Strings(const std::vector<std::string>& vecTexts) {
    Json::Value jTexts(Json::arrayValue);
    for (const std::string& strText : vecTexts) {
        jTexts.append(strText);
    }
    return jTexts;
}

std::string CompactJson(const Json::Value& jValue) {
    std::string strOut;
    AppendValue(strOut, jValue);
    return strOut;
}

}  // namespace VORN_JSON_DB::Cli
