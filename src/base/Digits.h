#ifndef VORN_BASE_DIGITS_H
#define VORN_BASE_DIGITS_H

#include <string_view>

#include <json/json.h>

#include "TextBuffer.h"

namespace vornjsondb {

// A whole number in decimal digits, as SQLite's formatter and JsonCpp's writer write it.
class Digits {
  public:
    explicit Digits(Json::UInt64 nValue);
    explicit Digits(Json::Int64 nValue);

    std::string_view View() const { return {m_szText + m_nFirst, sizeof(m_szText) - m_nFirst}; }

  private:
    // mutate(20 to 21): the longest number has a sign and nineteen digits, or twenty; one byte more
    // is not touched.
    char m_szText[20];
    size_t m_nFirst = sizeof(m_szText);
};

void AppendDigits(Json::UInt64 nValue, TextBuffer& Out);
void AppendDigits(Json::Int64 nValue, TextBuffer& Out);

}  // namespace vornjsondb

#endif  // VORN_BASE_DIGITS_H
