// Texts, numbers, and JSON values of any kind.

#include <limits>

#include "Generator.h"

namespace campaign {

namespace {

constexpr const char* kTexts[] = {"",
                                  "x",
                                  "y",
                                  "name",
                                  "O'Neil",
                                  "''",
                                  "1",
                                  "-7",
                                  "7abc",
                                  "null",
                                  "{\"a\":[1]}",
                                  "[1,2]",
                                  "{broken",
                                  "gr\xc3\xbc\xc3\x9f",
                                  "bad\xff\xc3",
                                  "tab\tline\nend",
                                  "\x01",
                                  "\\",
                                  "a \"quote\"",
                                  "UNIQUE constraint failed",
                                  "; drop table x; --"};
constexpr const char* kPercentTexts[] = {"100%% sure", "50% off", "%", "%%", "%%%%", "%d", "%n%s"};
constexpr Json::Int64 kNumbers[] = {0,
                                    1,
                                    2,
                                    3,
                                    4,
                                    5,
                                    -1,
                                    42,
                                    2147483647,
                                    2147483648,
                                    4294967295,
                                    -2147483649,
                                    9007199254740993,
                                    9223372036854775807,
                                    -9223372036854775807 - 1};
constexpr double kReals[] = {0.5,  1.0,   3.0,    -0.0, -2.25,
                             1e10, 1e300, -1e300, 0.1,  std::numeric_limits<double>::infinity()};

// JsonCpp reads 1,000 levels.
Json::Value Nested(Random& random) {
    static constexpr int kDepths[] = {998, 999, 1000, 1001, 1500};
    Json::Value jValue(Json::arrayValue);
    for (int i = random.Of(kDepths); i > 1; --i) {
        Json::Value jOuter(Json::arrayValue);
        jOuter.append(Json::Value()).swap(jValue);
        jValue.swap(jOuter);
    }
    return jValue;
}

}  // namespace

std::string Generator::Text() {
    if (m_random.OneIn(60)) {
        return std::string("cut\0here", 8);
    }
    if (m_random.OneIn(30)) {
        return std::string(static_cast<std::size_t>(m_random.Below(3000)), 'l');
    }
    return m_random.OneIn(12) ? m_random.Of(kPercentTexts) : m_random.Of(kTexts);
}

// Now and then such an array as no reader makes: with holes, which count as nulls.
Json::Value Generator::Array(int nDepth) {
    Json::Value jArray(Json::arrayValue);
    for (int i = m_random.Below(4); i > 0; --i) {
        jArray.append(AnyValue(nDepth + 1));
    }
    const Json::ArrayIndex nSize = jArray.size();
    switch (m_random.Below(12)) {
        case 0:
            jArray[nSize + 2] = AnyValue(nDepth + 1);
            break;
        case 1:
            jArray.resize(nSize + 2);
            break;
        case 2:
            jArray[nSize + 1];
            break;
        default:
            break;
    }
    return jArray;
}

Json::Value Generator::AnyValue(int nDepth) {
    Json::Value jValue;
    if (m_random.OneIn(300)) {
        return Nested(m_random);
    }
    if (m_random.OneIn(100)) {
        jValue = Text();
        jValue.setComment(std::string(m_random.OneIn(2) ? "/* so */" : "// so"),
                          m_random.OneIn(2) ? Json::commentBefore : Json::commentAfterOnSameLine);
        return jValue;
    }
    switch (m_random.Below(nDepth < 3 ? 9 : 6)) {
        case 0:
            return jValue;
        case 1:
            return m_random.OneIn(2);
        case 2:
            return m_random.Of(kNumbers);
        case 3:
            return m_random.Of(kReals);
        case 4:
            return static_cast<Json::UInt64>(m_random.Next());
        case 5:
            return Text();
        case 6:
        case 7:
            return Array(nDepth);
        default:
            jValue = Json::Value(Json::objectValue);
            for (int i = m_random.Below(4); i > 0; --i) {
                jValue[m_random.OneIn(3) ? Text() : MemberName()] = AnyValue(nDepth + 1);
            }
            return jValue;
    }
}

Json::Value Generator::Fitting(const std::string& strType) {
    if (strType == "string") {
        return Text();
    }
    if (strType == "bool") {
        return m_random.OneIn(2);
    }
    if (strType.compare(0, 6, "Json::") == 0) {
        const bool blArray = strType == "Json::arrayValue";
        if (m_random.OneIn(100)) {
            Json::Value jObject;
            jObject["deep"] = Nested(m_random);
            return blArray ? jObject["deep"] : jObject;
        }
        Json::Value jValue = blArray ? Array(0) : AnyValue();
        return blArray || jValue.isObject() ? jValue : Json::Value(Json::objectValue);
    }
    if (strType == "double" || strType == "float") {
        return m_random.Of(kReals);
    }
    if (m_random.OneIn(20)) {
        return static_cast<double>(m_random.Below(9));
    }
    return m_random.OneIn(5) ? m_random.Of(kNumbers) : static_cast<Json::Int64>(m_random.Below(9));
}

}  // namespace campaign
