#include "Utf8.h"

#include <cstdint>
#include <cstdio>
#include <cstring>

namespace VORN_JSON_DB::Cli {

namespace {

struct Lead {
    unsigned char cLeast, cMost;              // of the first byte
    unsigned char cSecondLeast, cSecondMost;  // narrower than 80 to BF: no longer form of a shorter
    size_t nMore;                             // one, no surrogate, nothing beyond U+10FFFF
};

constexpr Lead kLeads[] = {
    {0xC2, 0xDF, 0x80, 0xBF, 1}, {0xE0, 0xE0, 0xA0, 0xBF, 2}, {0xE1, 0xEC, 0x80, 0xBF, 2},
    {0xED, 0xED, 0x80, 0x9F, 2}, {0xEE, 0xEF, 0x80, 0xBF, 2}, {0xF0, 0xF0, 0x90, 0xBF, 3},
    {0xF1, 0xF3, 0x80, 0xBF, 3}, {0xF4, 0xF4, 0x80, 0x8F, 3},
};

unsigned char At(std::string_view strBytes, size_t nOffset) {
    return nOffset < strBytes.size() ? static_cast<unsigned char>(strBytes[nOffset]) : 0;
}

// The length of the character of several bytes at the offset; 0: it is none.
size_t LengthAt(std::string_view strBytes, size_t nOffset) {
    const unsigned char cFirst = At(strBytes, nOffset);
    const unsigned char cSecond = At(strBytes, nOffset + 1);
    for (const Lead& Row : kLeads) {
        if (cFirst >= Row.cLeast && cFirst <= Row.cMost) {
            bool blGood = cSecond >= Row.cSecondLeast && cSecond <= Row.cSecondMost;
            for (size_t i = 2; i <= Row.nMore; ++i) {
                blGood = blGood && (At(strBytes, nOffset + i) & 0xC0) == 0x80;
            }
            return blGood ? Row.nMore + 1 : 0;
        }
    }
    return 0;
}

// How many of eight bytes, from the first on, are ASCII and not below cLeast. It may say less.
size_t PlainBytes(const char* pEight, unsigned char cLeast) {
    constexpr std::uint64_t kOnes = 0x0101010101010101U;
    std::uint64_t nEight = 0;
    std::memcpy(&nEight, pEight, sizeof nEight);
    // The top bit of each byte that is none of them, and maybe of bytes after the first such.
    const std::uint64_t nOther = (nEight | (nEight - cLeast * kOnes)) & (0x80 * kOnes);
    if (nOther == 0) {
        return sizeof nEight;
    }
    constexpr bool kFirstIsLowest = __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__;
    return kFirstIsLowest ? static_cast<size_t>(__builtin_ctzll(nOther)) / 8 : 0;
}

// The offset of the first byte that is no part of UTF-8, or ASCII below cLeast; npos: there is
// none.
size_t FindOther(std::string_view strBytes, unsigned char cLeast) {
    size_t i = 0;
    while (i < strBytes.size()) {
        const size_t nPlain =
            i + 8 <= strBytes.size() ? PlainBytes(strBytes.data() + i, cLeast) : 0;
        i += nPlain;
        if (nPlain == 8) {
            continue;
        }
        const auto cNext = static_cast<unsigned char>(strBytes[i]);
        const size_t nLength = cNext >= 0x80 ? LengthAt(strBytes, i) : cNext >= cLeast ? 1 : 0;
        if (nLength == 0) {
            return i;
        }
        i += nLength;
    }
    return std::string_view::npos;
}

}  // namespace

bool IsUtf8WithoutControls(std::string_view strBytes) {
    return FindOther(strBytes, ' ') == std::string_view::npos;
}

size_t FindNoUtf8(std::string_view strBytes) {
    return FindOther(strBytes, 0);
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
    static_cast<void>(std::snprintf(szText, sizeof szText,
                                    "byte 0x%02X is no UTF-8; convert the input with iconv",
                                    static_cast<unsigned>(At(strBytes, nOffset))));
    return szText;
}

}  // namespace VORN_JSON_DB::Cli
