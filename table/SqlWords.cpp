#include "SqlWords.h"

#include <algorithm>
#include <cctype>

#include <sqlite3.h>

namespace vornjsondb {

namespace {

struct Enclosure {
    const char* szBegin;
    const char* szEnd;
};

constexpr Enclosure kEnclosures[] = {{"'", "'"}, {"\"", "\""}, {"`", "`"},
                                     {"[", "]"}, {"--", "\n"}, {"/*", "*/"}};

bool IsOfWord(char c) {
    const auto nByte = static_cast<unsigned char>(c);
    return std::isalnum(nByte) != 0 || c == '_' || c == '$' || nByte >= 0x80;
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

bool HoldsWord(const std::string& strSql, std::string_view strWord) {
    size_t nAt = 0;
    while (nAt < strSql.size()) {
        const size_t nBehind = BehindEnclosure(strSql, nAt);
        if (nBehind > nAt) {
            nAt = nBehind;
            continue;
        }
        size_t nEnd = nAt;
        while (nEnd < strSql.size() && IsOfWord(strSql[nEnd])) {
            ++nEnd;
        }
        if (nEnd - nAt == strWord.size() &&
            sqlite3_strnicmp(&strSql[nAt], strWord.data(), static_cast<int>(strWord.size())) == 0) {
            return true;
        }
        nAt = std::max(nEnd, nAt + 1);
    }
    return false;
}

}  // namespace vornjsondb
