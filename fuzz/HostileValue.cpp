#include "HostileValue.h"

#include <algorithm>
#include <cstring>
#include <iterator>
#include <limits>
#include <string>
#include <utility>

namespace fuzzhost {

namespace {

// Deeper than JsonCpp's reader goes, which is 1000 levels; far from the end of the stack.
constexpr int kMaxLevels = 1200;
// An array is written out up to its last element, so that a far one only costs time.
constexpr unsigned kMaxElements = 8;
constexpr unsigned kMaxIndex = 40;

// The names and the types that the targets' tables have, what a definition and a query are made
// of, and texts with a meaning in SQL, in a format or in JSON.
// clang-format off
constexpr const char* kWords[] = {
    "a", "b", "c", "d", "e", "f", "z", "limit", "t", "member", "cpptype", "cppDefaultValue",
    "string", "int", "unsigned int", "long long", "unsigned long long", "bool", "double", "long",
    "Json::objectValue", "Json::arrayValue", "Json::Value", "time_t", "set", "vornSqlWhereFilter",
    "sort_by", "sort_direction", "desc", "offset", "", "x", "it's", "100%", "100%%", "%s", "%n",
    "b = 1", "null", "0x1", "\"", "\\", "\x01", "\x7f", "gr\xc3\xbc\xc3\x9f", "\xc3", "\xff\xfe",
    "\xed\xa0\x80", "where", "sort", "members", "$and", "$or", "$not", "$eq", "$ne", "$lt", "$lte",
    "$gt", "$gte", "$in", "$nin", "$between", "$like", "$prefix", "$null", "$contains", "d.a.b[0]",
    "t[1]", "-a"};

constexpr double kReals[] = {
    0.0, -0.0, 1.0, -3.0, 0.5, 1e15, 1e16, 1e17, 1e300, -1e300, 5e-324, 2147483648.0,
    9007199254740993.0, 9223372036854775807.0, -9223372036854775808.0, 18446744073709551616.0,
    std::numeric_limits<double>::infinity(), -std::numeric_limits<double>::infinity(),
    std::numeric_limits<double>::quiet_NaN()};

// clang-format on

// Levels on both sides of where the library's fast writer gives up, and, for few inputs, because
// they take a hundred times as long, of where JsonCpp's reader does.
constexpr unsigned kFewLevels = 12;
constexpr unsigned kFarByte = 255;
constexpr int kFarLevels[] = {998, 999, 1000, 1001};

template <typename Element, size_t nCount>
const Element& OneOf(const Element (&aTable)[nCount], unsigned nIndex) {
    return aTable[nIndex % nCount];
}

class Maker {
  public:
    Maker(const uint8_t* pData, size_t nSize) : m_pNext(pData), m_pEnd(pData + nSize) {}

    // A byte for the kind, then what the kind takes.
    Json::Value Make() {
        if (m_nLevel >= kMaxLevels) {
            return Json::Value();
        }
        ++m_nLevel;
        Json::Value jMade = (this->*OneOf(kKinds, Byte()))();
        --m_nLevel;
        return jMade;
    }

  private:
    // Behind the last byte there are zeros without end.
    unsigned Byte() { return m_pNext == m_pEnd ? 0U : *m_pNext++; }

    template <typename Number>
    Number Bits() {
        Number nMade = {};
        unsigned char aBytes[sizeof(nMade)];
        std::generate(std::begin(aBytes), std::end(aBytes),
                      [this] { return static_cast<unsigned char>(Byte()); });
        std::memcpy(&nMade, aBytes, sizeof(nMade));
        return nMade;
    }

    // A byte below 128 is a word's number, another one the count of bytes that follow, plus 128.
    std::string Text() {
        const unsigned nFirst = Byte();
        if (nFirst < 128) {
            return OneOf(kWords, nFirst);
        }
        const size_t nLeft = static_cast<size_t>(m_pEnd - m_pNext);
        const size_t nLength = std::min<size_t>(nFirst - 128, nLeft);
        std::string strMade(reinterpret_cast<const char*>(m_pNext), nLength);
        m_pNext += nLength;
        return strMade;
    }

    Json::Value MakeNull() { return Json::Value(); }
    Json::Value MakeFlag() { return Json::Value(Byte() % 2 == 1); }
    Json::Value MakeSmall() { return Json::Value(static_cast<int>(Byte()) - 128); }
    Json::Value MakeSigned() { return Json::Value(Bits<Json::Int64>()); }
    Json::Value MakeUnsigned() { return Json::Value(Bits<Json::UInt64>()); }
    Json::Value MakeReal() { return Json::Value(Bits<double>()); }
    Json::Value MakeKnownReal() { return Json::Value(OneOf(kReals, Byte())); }
    Json::Value MakeText() { return Json::Value(Text()); }

    // The value points at the text instead of copying it.
    Json::Value MakeStaticText() { return Json::Value(Json::StaticString(OneOf(kWords, Byte()))); }

    Json::Value MakeList() {
        Json::Value jList(Json::arrayValue);
        for (unsigned n = Byte() % kMaxElements; n > 0; --n) {
            jList.append(Make());
        }
        return jList;
    }

    Json::Value MakeListByIndex() {
        Json::Value jList(Json::arrayValue);
        for (unsigned n = Byte() % kMaxElements; n > 0; --n) {
            const unsigned nIndex = Byte() % kMaxIndex;
            jList[nIndex] = Make();
        }
        return jList;
    }

    // Reading makes an element, too, and leaves holes before it.
    Json::Value MakeListReadPastItsEnd() {
        Json::Value jList = MakeList();
        static_cast<void>(jList[Byte() % kMaxIndex]);
        return jList;
    }

    // Longer only: some releases of JsonCpp cannot cut a list with holes.
    Json::Value MakeResizedList() {
        Json::Value jList = MakeListByIndex();
        jList.resize(std::max(jList.size(), Byte() % kMaxIndex));
        return jList;
    }

    Json::Value MakeObject() {
        Json::Value jObject(Json::objectValue);
        for (unsigned n = Byte() % kMaxElements; n > 0; --n) {
            const std::string strName = Text();
            jObject[strName] = Make();
        }
        return jObject;
    }

    // Names that are not copied.
    Json::Value MakeStaticObject() {
        Json::Value jObject(Json::objectValue);
        for (unsigned n = Byte() % kMaxElements; n > 0; --n) {
            const char* szName = OneOf(kWords, Byte());
            jObject[Json::StaticString(szName)] = Make();
        }
        return jObject;
    }

    Json::Value MakeDeep() {
        const unsigned nFirst = Byte();
        const int nWanted =
            nFirst == kFarByte ? OneOf(kFarLevels, Byte()) : static_cast<int>(nFirst % kFewLevels);
        const int nDepth = std::min(nWanted, kMaxLevels - m_nLevel);
        const bool blObject = Byte() % 2 == 1;
        m_nLevel += nDepth;
        Json::Value jInner = Make();
        m_nLevel -= nDepth;
        for (int i = 0; i < nDepth; ++i) {
            Json::Value jOuter;
            (blObject ? jOuter["a"] : jOuter[0]).swap(jInner);
            jInner.swap(jOuter);
        }
        return jInner;
    }

    // A comment has to begin with a slash; what it says is not looked at.
    Json::Value MakeCommented() {
        const auto ePlace = static_cast<Json::CommentPlacement>(Byte() % 3);
        const std::string strComment = "//" + Text();
        Json::Value jMade = Make();
        jMade.setComment(strComment, ePlace);
        return jMade;
    }

    static constexpr Json::Value (Maker::*kKinds[])() = {
        &Maker::MakeNull,        &Maker::MakeFlag,        &Maker::MakeSmall,
        &Maker::MakeSigned,      &Maker::MakeUnsigned,    &Maker::MakeReal,
        &Maker::MakeKnownReal,   &Maker::MakeText,        &Maker::MakeStaticText,
        &Maker::MakeList,        &Maker::MakeListByIndex, &Maker::MakeListReadPastItsEnd,
        &Maker::MakeResizedList, &Maker::MakeObject,      &Maker::MakeStaticObject,
        &Maker::MakeDeep,        &Maker::MakeCommented};

    const uint8_t* m_pNext;
    const uint8_t* m_pEnd;
    int m_nLevel = 0;
};

}  // namespace

Json::Value HostileValue(const uint8_t* pData, size_t nSize) {
    return Maker(pData, nSize).Make();
}

}  // namespace fuzzhost
