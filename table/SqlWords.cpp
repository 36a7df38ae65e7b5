#include "SqlWords.h"

#include <algorithm>

namespace vornjsondb {

namespace {

struct Enclosure {
    const char* szBegin;
    const char* szEnd;
};

constexpr Enclosure kEnclosures[] = {{"'", "'"}, {"\"", "\""}, {"`", "`"},
                                     {"[", "]"}, {"--", "\n"}, {"/*", "*/"}};

char Upper(char c) {
    return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
}

bool IsOfWord(char c) {
    return (Upper(c) >= 'A' && Upper(c) <= 'Z') || (c >= '0' && c <= '9') || c == '_' || c == '$' ||
           static_cast<unsigned char>(c) >= 0x80;
}

// Behind a quoted text or a comment that begins at nAt; nAt itself where none does. A doubled
// quote is the end of one text and the beginning of another.
size_t BehindEnclosure(const std::string& strSql, size_t nAt) {
    for (const Enclosure& Each : kEnclosures) {
        const std::string strBegin = Each.szBegin;
        if (strSql.compare(nAt, strBegin.size(), strBegin) == 0) {
            const std::string strEnd = Each.szEnd;
            const size_t nEnd = strSql.find(strEnd, nAt + strBegin.size());
            return nEnd == std::string::npos ? strSql.size() : nEnd + strEnd.size();
        }
    }
    return nAt;
}

}  // namespace

bool HoldsWord(const std::string& strSql, const std::string& strWord) {
    size_t nAt = 0;
    while (nAt < strSql.size()) {
        const size_t nBehind = BehindEnclosure(strSql, nAt);
        const auto itBegin = strSql.begin() + static_cast<std::ptrdiff_t>(nAt);
        const auto itEnd = std::find_if_not(itBegin, strSql.end(), IsOfWord);
        if (nBehind > nAt) {
            nAt = nBehind;
        } else if (itEnd == itBegin) {
            ++nAt;
        } else {
            const auto fnSame = [](char cLeft, char cRight) { return Upper(cLeft) == cRight; };
            if (std::equal(itBegin, itEnd, strWord.begin(), strWord.end(), fnSame)) {
                return true;
            }
            nAt = static_cast<size_t>(itEnd - strSql.begin());
        }
    }
    return false;
}

}  // namespace vornjsondb
