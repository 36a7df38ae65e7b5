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

std::vector<SqlWord> WordsOf(const std::string& strSql) {
    std::vector<SqlWord> vecWords;
    for (size_t nAt = 0, nEnd = 0; nAt < strSql.size(); nAt = nEnd) {
        nEnd = BehindEnclosure(strSql, nAt);
        if (nEnd > nAt) {
            if (strSql[nAt] != '-' && strSql[nAt] != '/') {
                // mutate(doubled): what is said twice has no other name.
                vecWords.push_back({strSql.substr(nAt + 1, nEnd - nAt - 2), true});
            }
            continue;
        }
        while (nEnd < strSql.size() && IsOfWord(strSql[nEnd])) {
            ++nEnd;
        }
        nEnd = std::max(nEnd, nAt + 1);
        if (std::isspace(static_cast<unsigned char>(strSql[nAt])) == 0) {
            vecWords.push_back({strSql.substr(nAt, nEnd - nAt), false});
        }
    }
    return vecWords;
}

bool HoldsWord(const std::string& strSql, const char* szWord) {
    const std::vector<SqlWord> vecWords = WordsOf(strSql);
    return std::any_of(vecWords.begin(), vecWords.end(), [szWord](const SqlWord& Word) {
        return !Word.blQuoted && sqlite3_stricmp(Word.strText.c_str(), szWord) == 0;
    });
}

std::vector<std::string> NamesIn(const std::string& strSql, const std::string& strTable,
                                 const std::string& strDatabase) {
    const std::vector<SqlWord> vecWords = WordsOf(strSql);
    // Before the first word and behind the last one there is none.
    const auto fnWord = [&](size_t nPlace) {
        return nPlace < vecWords.size() ? vecWords[nPlace].strText : std::string();
    };
    const auto fnIs = [&](size_t nPlace, const char* szName) {
        return sqlite3_stricmp(fnWord(nPlace).c_str(), szName) == 0;
    };
    const std::string strOwn = strDatabase + "." + strTable;
    std::vector<std::string> vecNames{strTable, strOwn};
    for (size_t i = 0; i < vecWords.size(); ++i) {
        // Of another database, or a column.
        const bool blOther = fnIs(i - 1, ".") && !fnIs(i - 2, strDatabase.c_str());
        // mutate(exchanged): both only look.
        if (fnIs(i, strTable.c_str()) && !blOther) {
            // mutate(doubled): a name counts once.
            vecNames.push_back(fnWord(fnIs(i + 1, "AS") ? i + 2 : i + 1));
        }
    }
    return vecNames;
}

}  // namespace vornjsondb
