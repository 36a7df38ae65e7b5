#include "Utf8.h"

#include <utf8proc.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>

#include "EightBytes.h"

namespace VORN_JSON_DB::Cli {

namespace {

// How many bytes at the begin are whole characters of one or two bytes, none of them below cLeast.
size_t ShortCharacters(std::string_view strBytes, unsigned char cLeast) {
    EightBytes nOpen = 0;  // the mark of a first byte that ends a character begun before
    EightBytes nWrong = 0;
    size_t i = 0;
    for (; i < strBytes.size(); i += sizeof(EightBytes)) {
        const EightBytes nBytes = LoadUpToEight({strBytes.data() + i, strBytes.size() - i});
        const EightBytes nHigh = nBytes & kAllMarks;
        const EightBytes nBegin = nHigh & (nBytes << 1);  // 11......
        const EightBytes nFollow = nHigh ^ nBegin;        // 10......
        // 111..... begins a longer one, and 1100000. stands for a character of one byte.
        const EightBytes nOther = nBegin & (nBytes << 2 | ~((nBytes & Each(0x1E)) + Each(0x7E)));
        const EightBytes nAlone = nFollow ^ (nBegin << 8 | nOpen);
        nWrong = nOther | nAlone | MarkBelow(nBytes, cLeast);
        if (nWrong != 0) {
            i += BeforeMark(nWrong);
            break;
        }
        nOpen = nBegin >> 56;
    }
    i = std::min(i, strBytes.size());
    const bool blHalf = i > 0 && static_cast<unsigned char>(strBytes[i - 1]) >= 0xC0;
    return blHalf ? i - 1 : i;
}

// The offset of the first byte that is no part of UTF-8, or ASCII below cLeast; npos: there is
// none.
size_t FindOther(std::string_view strBytes, unsigned char cLeast) {
    size_t i = ShortCharacters(strBytes, cLeast);
    while (i < strBytes.size()) {
        std::int32_t nCode = 0;
        const size_t nLength = ReadCharacter(strBytes.substr(i), nCode);
        if (nCode < cLeast) {
            return i;
        }
        i += nLength;
        // Longer ones mostly stand together.
        if (i < strBytes.size() && static_cast<unsigned char>(strBytes[i]) < 0xE0) {
            i += ShortCharacters(strBytes.substr(i), cLeast);
        }
    }
    return std::string_view::npos;
}

}  // namespace

size_t ReadCharacter(std::string_view strBytes, std::int32_t& nCode) {
    nCode = -1;
    const utf8proc_ssize_t nLength =
        utf8proc_iterate(reinterpret_cast<const utf8proc_uint8_t*>(strBytes.data()),
                         static_cast<utf8proc_ssize_t>(strBytes.size()), &nCode);
    return nLength > 0 ? static_cast<size_t>(nLength) : 1;
}

bool IsUtf8WithoutControls(std::string_view strBytes) {
    return FindOther(strBytes, ' ') == std::string_view::npos;
}

size_t FindNoUtf8(std::string_view strBytes) {
    return FindOther(strBytes, 0);
}

bool Steers(std::int32_t nCode) {
    const bool blControl = nCode < ' ' || (nCode >= 0x7F && nCode < 0xA0);
    const bool blMark = nCode == 0x61C || (nCode >= 0x200E && nCode <= 0x200F) ||
                        (nCode >= 0x2028 && nCode <= 0x202E) ||
                        (nCode >= 0x2066 && nCode <= 0x2069);
    return blControl || blMark;
}

std::string WithoutBadBytes(std::string_view strBytes) {
    std::string strText;
    for (size_t i = FindNoUtf8(strBytes); i != std::string_view::npos; i = FindNoUtf8(strBytes)) {
        strText += strBytes.substr(0, i);
        strText += "\xEF\xBF\xBD";
        strBytes.remove_prefix(i + 1);
    }
    return strText += strBytes;
}

std::string NoUtf8Text(std::string_view strBytes, size_t nOffset) {
    char szText[64];
    static_cast<void>(std::snprintf(
        szText, sizeof szText, "byte 0x%02X is no UTF-8; convert the input with iconv",
        static_cast<unsigned>(static_cast<unsigned char>(strBytes[nOffset]))));
    return szText;
}

}  // namespace VORN_JSON_DB::Cli
