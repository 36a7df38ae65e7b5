#include "Digits.h"

#include <iterator>

namespace vornjsondb {

void AppendDigits(Json::UInt64 nValue, std::string& strOut) {
    // mutate(20 to 21): the largest number has twenty; one byte more is not touched.
    char szDigits[20];
    char* const pEnd = std::end(szDigits);
    char* pFirst = pEnd;
    do {
        *--pFirst = static_cast<char>('0' + nValue % 10);
        nValue /= 10;
    } while (nValue != 0);
    strOut.append(pFirst, static_cast<size_t>(pEnd - pFirst));
}

void AppendDigits(Json::Int64 nValue, std::string& strOut) {
    const auto nBits = static_cast<Json::UInt64>(nValue);
    if (nValue < 0) {
        strOut += '-';
    }
    // Negated without a sign: the lowest number has no positive counterpart.
    // mutate(< to <=): zero is its own counterpart.
    AppendDigits(nValue < 0 ? 0 - nBits : nBits, strOut);
}

}  // namespace vornjsondb
