#include "Digits.h"

namespace vornjsondb {

Digits::Digits(Json::UInt64 nValue) {
    do {
        m_szText[--m_nFirst] = static_cast<char>('0' + nValue % 10);
        nValue /= 10;
    } while (nValue != 0);
}

// Negated without a sign: the lowest number has no positive counterpart.
// mutate(< to <=): zero is its own counterpart.
Digits::Digits(Json::Int64 nValue)
    : Digits(nValue < 0 ? 0 - static_cast<Json::UInt64>(nValue)
                        : static_cast<Json::UInt64>(nValue)) {
    if (nValue < 0) {
        m_szText[--m_nFirst] = '-';
    }
}

void AppendDigits(Json::UInt64 nValue, TextBuffer& Out) {
    Out.Append(Digits(nValue).View());
}

void AppendDigits(Json::Int64 nValue, TextBuffer& Out) {
    Out.Append(Digits(nValue).View());
}

}  // namespace vornjsondb
