#include "JsonQuote.h"

namespace VORN_JSON_DB::Cli {

namespace {

void AppendEscape(unsigned char c, std::string& strInto) {
    const char* const szShort = "\"\"\\\\\bb\ff\nn\rr\tt";
    for (const char* pPair = szShort; *pPair != '\0'; pPair += 2) {
        if (static_cast<unsigned char>(*pPair) == c) {
            strInto += '\\';
            strInto += pPair[1];
            return;
        }
    }
    const char* const szHex = "0123456789abcdef";
    strInto += "\\u00";
    strInto += szHex[c >> 4];
    strInto += szHex[c & 15];
}

}  // namespace

void AppendQuoted(std::string_view strText, std::string& strInto) {
    strInto += '"';
    size_t nDone = 0;
    for (size_t i = 0; i < strText.size(); ++i) {
        const auto c = static_cast<unsigned char>(strText[i]);
        if (c < ' ' || c == '"' || c == '\\') {
            strInto += strText.substr(nDone, i - nDone);
            AppendEscape(c, strInto);
            nDone = i + 1;
        }
    }
    strInto += strText.substr(nDone);
    strInto += '"';
}

}  // namespace VORN_JSON_DB::Cli
