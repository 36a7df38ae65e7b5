// A text looked at in steps of eight bytes, on any processor. What is found of a byte is a mark:
// the byte's top bit.

#ifndef VORNJSONDB_CLI_INPUT_EIGHT_BYTES_H
#define VORNJSONDB_CLI_INPUT_EIGHT_BYTES_H

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>

namespace VORN_JSON_DB::Cli {

using EightBytes = std::uint64_t;

constexpr EightBytes Each(unsigned char c) {
    return c * EightBytes{0x0101010101010101U};
}

constexpr EightBytes kAllMarks = Each(0x80);

// The first byte is the lowest, whatever the processor's order.
inline EightBytes LoadEight(const char* pBytes) {
    EightBytes nBytes = 0;
    std::memcpy(&nBytes, pBytes, sizeof nBytes);
    return __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__ ? nBytes : __builtin_bswap64(nBytes);
}

// Those that are there, and blanks behind them.
inline EightBytes LoadUpToEight(std::string_view strBytes) {
    if (strBytes.size() >= sizeof(EightBytes)) {
        return LoadEight(strBytes.data());
    }
    char acBytes[] = {' ', ' ', ' ', ' ', ' ', ' ', ' ', ' '};
    std::memcpy(acBytes, strBytes.data(), strBytes.size());
    return LoadEight(acBytes);
}

// The bytes below c, which is at most 0x80. The first mark is right; there may be wrong ones behind
// it.
constexpr EightBytes MarkBelow(EightBytes nBytes, unsigned char c) {
    return (nBytes - Each(c)) & ~nBytes & kAllMarks;
}

// The bytes that are c, in the same way.
constexpr EightBytes MarkEqual(EightBytes nBytes, unsigned char c) {
    return MarkBelow(nBytes ^ Each(c), 1);
}

// How many bytes come before the first mark.
inline size_t BeforeMark(EightBytes nMarks) {
    return static_cast<size_t>(__builtin_ctzll(nMarks)) / 8;
}

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_EIGHT_BYTES_H
