#include "Utf8.h"

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

bool IsAllAscii(const char* pEight) {
    unsigned long long nEight = 0;
    std::memcpy(&nEight, pEight, sizeof nEight);
    return (nEight & 0x8080808080808080ULL) == 0;
}

// All of eight bytes lie between the blank and the last of ASCII.
bool IsAllPrintable(const char* pEight) {
    unsigned long long nEight = 0;
    std::memcpy(&nEight, pEight, sizeof nEight);
    return ((nEight | (nEight - 0x2020202020202020ULL)) & 0x8080808080808080ULL) == 0;
}

}  // namespace

bool IsUtf8WithoutControls(std::string_view strBytes) {
    size_t i = 0;
    while (i < strBytes.size()) {
        const auto cNext = static_cast<unsigned char>(strBytes[i]);
        if (i + 8 <= strBytes.size() && IsAllPrintable(strBytes.data() + i)) {
            i += 8;
        } else if (cNext < 0x80) {
            if (cNext < ' ') {
                return false;
            }
            ++i;
        } else {
            const size_t nLength = LengthAt(strBytes, i);
            if (nLength == 0) {
                return false;
            }
            i += nLength;
        }
    }
    return true;
}

size_t FindNoUtf8(std::string_view strBytes) {
    size_t i = 0;
    while (i < strBytes.size()) {
        if (i + 8 <= strBytes.size() && IsAllAscii(strBytes.data() + i)) {
            i += 8;
        } else if (static_cast<unsigned char>(strBytes[i]) < 0x80) {
            ++i;
        } else {
            const size_t nLength = LengthAt(strBytes, i);
            if (nLength == 0) {
                return i;
            }
            i += nLength;
        }
    }
    return std::string_view::npos;
}

std::string NoUtf8Text(std::string_view strBytes, size_t nOffset) {
    char szText[64];
    std::snprintf(szText, sizeof szText, "byte 0x%02X is no UTF-8; convert the input with iconv",
                  static_cast<unsigned>(At(strBytes, nOffset)));
    return szText;
}

}  // namespace VORN_JSON_DB::Cli
