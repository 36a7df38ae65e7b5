#include "JsonText.h"

#include <rapidjson/memorystream.h>
#include <rapidjson/reader.h>

namespace VORN_JSON_DB::Cli {

namespace {

// Numbers stay texts: one that no double holds is JSON as well.
constexpr unsigned kFlags = rapidjson::kParseValidateEncodingFlag |
                            rapidjson::kParseNumbersAsStringsFlag | rapidjson::kParseIterativeFlag;

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

bool IsJson(std::string_view strText) {
    rapidjson::MemoryStream Stream(strText.data(), strText.size());
    rapidjson::BaseReaderHandler<> Nobody;
    rapidjson::Reader Reader;
    // A NUL byte looks like the end to the reader.
    return !Reader.Parse<kFlags>(Stream, Nobody).IsError() && Stream.Tell() == strText.size();
}

}  // namespace VORN_JSON_DB::Cli
