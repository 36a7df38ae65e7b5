#include "Utf8.h"

#include <utf8proc.h>

#include <cstdint>
#include <cstdio>
#include <cstring>

namespace VORN_JSON_DB::Cli {

namespace {

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
        std::int32_t nCode = 0;
        const size_t nLength = ReadCharacter(strBytes.substr(i), nCode);
        if (nCode < cLeast) {
            return i;
        }
        i += nLength;
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
