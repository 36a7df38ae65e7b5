#include "WrittenJson.h"

#include <cstring>
#include <string_view>

#include "../src/base/PlainJson.h"

namespace vornjsondb {

namespace {

constexpr int kMostLevels = 8;
constexpr int kMostDigits = 18;  // what fits 64 bits in any case

// Each returns where the text goes on behind what begins at p, or nullptr if it is something else.
// The NUL at the end is none of the characters that a text can go on with.

const char* BehindText(const char* p) {
    if (*p != '"') {
        return nullptr;
    }
    unsigned char c = 0;
    do {
        c = static_cast<unsigned char>(*++p);
        // Small letters, and all that are none of ASCII's, are known by the first of these.
    } while (c > '\\' || (c > '"' && c < '\\') || c == ' ' || c == '!');
    return c == '"' ? p + 1 : nullptr;
}

const char* BehindWord(const char* p, std::string_view strWord) {
    return std::strncmp(p, strWord.data(), strWord.size()) == 0 ? p + strWord.size() : nullptr;
}

// -0 is read as 0, and 01 is none.
const char* BehindInteger(const char* p) {
    // mutate(exchanged): in any order.
    if (*p == '0') {
        return p + 1;
    }
    const char* const pFirst = *p == '-' ? p + 1 : p;
    for (p = pFirst; *p >= '0' && *p <= '9' && p - pFirst <= kMostDigits;) {
        ++p;
    }
    // mutate(exchanged): all only look.
    return p != pFirst && *pFirst != '0' && p - pFirst <= kMostDigits ? p : nullptr;
}

const char* BehindValue(const char* p, int nLevel);

// With names that each are greater than the one before.
const char* BehindObject(const char* p, int nLevel) {
    std::string_view strBefore;
    bool blFirst = true;
    do {
        const char* const pName = p + 2;
        p = BehindText(p + 1);
        if (p == nullptr || *p != ':') {
            return nullptr;
        }
        const std::string_view strName(pName, static_cast<size_t>(p - 1 - pName));
        if (!blFirst && strName <= strBefore) {
            return nullptr;
        }
        strBefore = strName;
        blFirst = false;
        p = BehindValue(p + 1, nLevel);
    } while (p != nullptr && *p == ',');
    return p != nullptr && *p == '}' ? p + 1 : nullptr;
}

const char* BehindList(const char* p, int nLevel) {
    do {
        p = BehindValue(p + 1, nLevel);
    } while (p != nullptr && *p == ',');
    return p != nullptr && *p == ']' ? p + 1 : nullptr;
}

// Apart: what is not nested then needs no place on the stack.
__attribute__((noinline)) const char* BehindNested(const char* p, int nLevel) {
    const bool blObject = *p == '{';
    if (nLevel > kMostLevels) {
        return nullptr;
    }
    if (p[1] == (blObject ? '}' : ']')) {
        return p + 2;
    }
    return blObject ? BehindObject(p, nLevel) : BehindList(p, nLevel);
}

const char* BehindValue(const char* p, int nLevel) {
    switch (*p) {
        case '"':
            return BehindText(p);
        case '[':
        case '{':
            return BehindNested(p, nLevel + 1);
        case 't':
            return BehindWord(p, "true");
        case 'f':
            return BehindWord(p, "false");
        case 'n':
            return BehindWord(p, "null");
        default:
            return BehindInteger(p);
    }
}

}  // namespace

bool IsWrittenJson(const char* szText, size_t nLength) {
    return (*szText == '[' || *szText == '{') && BehindValue(szText, 0) == szText + nLength;
}

bool WritePlainText(const Json::Value& jValue, std::string& strOut) {
    TextBuffer Text;
    const bool blPlain = WritePlainJson(jValue, Text);
    if (blPlain) {
        strOut.assign(Text.View());
    }
    return blPlain;
}

}  // namespace vornjsondb
