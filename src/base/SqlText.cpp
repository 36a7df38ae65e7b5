#include "SqlText.h"

#include <cstring>

namespace vornjsondb {

void AppendQuoted(const char* szText, std::string& strOut) {
    strOut += '\'';
    while (const char* pQuote = std::strchr(szText, '\'')) {
        strOut.append(szText, static_cast<size_t>(pQuote + 1 - szText)) += '\'';
        szText = pQuote + 1;
    }
    strOut.append(szText) += '\'';
}

}  // namespace vornjsondb
