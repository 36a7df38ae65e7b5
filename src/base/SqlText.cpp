#include "SqlText.h"

#include <cstring>

namespace vornjsondb {

void AppendQuoted(const char* szText, TextBuffer& Out) {
    Out.Append('\'');
    while (const char* pQuote = std::strchr(szText, '\'')) {
        Out.Append({szText, static_cast<size_t>(pQuote + 1 - szText)}).Append('\'');
        szText = pQuote + 1;
    }
    Out.Append(szText).Append('\'');
}

}  // namespace vornjsondb
