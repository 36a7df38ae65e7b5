// JSON text that is stored as it came, against reading it and writing it again.

#include <random>

#include "../../src/base/JsonText.h"
#include "../../table/WrittenJson.h"
#include "TableFixture.h"

namespace vornjsondb {

namespace {

bool IsWritten(const std::string& strText) {
    return IsWrittenJson(strText.c_str(), strText.size());
}

// What the long way stores; "" for what is neither list nor object.
std::string Rewritten(const std::string& strText) {
    JsonCodec Codec;
    Json::Value jRead;
    const bool blRead = Codec.Read(strText.c_str(), strText.size(), jRead);
    return blRead && (jRead.isArray() || jRead.isObject()) ? Codec.Write(jRead) : "";
}

TEST(WrittenJson, WhatIsWrittenAgainAsItIs) {
    for (const std::string strText :
         {"[]", "{}", "[0]", "[-1]", "[123456789012345678]", "[-123456789012345678]", "[\"\"]",
          "[\"\xC3\xA9' % \x7F\"]", "[true,false,null]", "[[],{}]", "[[[[[[[[]]]]]]]]",
          R"({"":1,"A":2,"a":{"b":[]},"a!":3,"aa":"x","é":[]})"}) {
        EXPECT_TRUE(IsWritten(strText)) << strText;
        EXPECT_EQ(Rewritten(strText), strText);
    }
}

TEST(WrittenJson, WhatIsNoneOrIsWrittenDifferently) {
    for (const std::string strText : {"",
                                      "1",
                                      "\"a\"",
                                      "null",
                                      "[",
                                      "]",
                                      "{",
                                      "[1",
                                      "[1,",
                                      "[1,]",
                                      "[,1]",
                                      "[1]]",
                                      "[1] ",
                                      " [1]",
                                      "[ 1]",
                                      "[1}",
                                      "{1}",
                                      "{\"a\":1]",
                                      "[-]",
                                      "[-0]",
                                      "[01]",
                                      "[-01]",
                                      "[1.0]",
                                      "[1e2]",
                                      "[+1]",
                                      "[1234567890123456789]",
                                      "[-1234567890123456789]",
                                      "[\"a]",
                                      "[\"\\n\"]",
                                      "[\"\t\"]",
                                      "[tru]",
                                      "[truee]",
                                      "[nul",
                                      "[1//c\n]",
                                      "{\"a\"}",
                                      "{\"a\":}",
                                      "{\"a\":1,}",
                                      "{a:1}",
                                      "{\"a\" :1}",
                                      "{\"b\":1,\"a\":2}",
                                      "{\"aa\":1,\"a\":2}",
                                      "{\"a\":1,\"a\":1}",
                                      "{\"\":1,\"\":2}",
                                      "{\"a\":1",
                                      "{\"a\":1,\"b",
                                      "[[[[[[[[[]]]]]]]]]"}) {
        EXPECT_FALSE(IsWritten(strText)) << strText;
    }
    EXPECT_FALSE(IsWritten(std::string("[1\0]", 4)));
    EXPECT_FALSE(IsWritten(std::string("[]\0", 3)));
}

class Maker {
  public:
    explicit Maker(unsigned nSeed) : m_Random(nSeed) {}

    size_t Below(size_t nEnd) { return static_cast<size_t>(m_Random() % nEnd); }

    Json::Value Value(int nLevels) {
        static const char* const s_aszTexts[] = {"",    "a",        "b",   "aa",
                                                 "a b", "\xC3\xA9", "'\"", "\n"};
        switch (Below(nLevels > 0 ? 8 : 6)) {
            case 0:
                return {};
            case 1:
                return Below(2) == 0;
            case 2:
                return static_cast<Json::Int64>(m_Random() >> Below(64));
            case 3:
                return static_cast<double>(Below(100)) / 4;
            case 4:
            case 5:
                return s_aszTexts[Below(8)];
            case 6:
                return List(nLevels - 1);
            default:
                return Object(nLevels - 1);
        }
    }

    Json::Value List(int nLevels) {
        Json::Value jList(Json::arrayValue);
        for (size_t i = Below(4); i > 0; --i) {
            jList.append(Value(nLevels));
        }
        return jList;
    }

    Json::Value Object(int nLevels) {
        Json::Value jObject(Json::objectValue);
        for (size_t i = Below(4); i > 0; --i) {
            jObject[std::string(Below(3), static_cast<char>('a' + Below(3)))] = Value(nLevels);
        }
        return jObject;
    }

    // Some bytes exchanged, left out or doubled.
    std::string Mutated(std::string strText) {
        static const std::string s_strBytes = "[]{},:\"\\ \n/0-19.etfna";
        for (size_t i = Below(3); i > 0 && !strText.empty(); --i) {
            const size_t nAt = Below(strText.size());
            const std::string strByte(Below(3), s_strBytes[Below(s_strBytes.size())]);
            strText.replace(nAt, Below(2), strByte);
        }
        return strText;
    }

  private:
    std::mt19937_64 m_Random;
};

TEST(WrittenJson, RandomTextsAreStoredAsTheLongWayStoresThem) {
    int nWritten = 0;
    JsonCodec Codec;
    for (unsigned nSeed = 0; nSeed < 20000; ++nSeed) {
        Maker Make(nSeed);
        const Json::Value jValue = Make.Below(2) == 0 ? Make.List(3) : Make.Object(3);
        const std::string strText = Make.Mutated(Codec.Write(jValue));
        if (IsWritten(strText)) {
            ++nWritten;
            ASSERT_EQ(Rewritten(strText), strText) << nSeed;
        }
    }
    EXPECT_GT(nWritten, 5000);
    EXPECT_LT(nWritten, 15000);
}

}  // namespace

}  // namespace vornjsondb
