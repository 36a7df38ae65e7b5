#include "PlainJson.h"

#include <cstring>
#include <utility>

#include "JsonMember.h"

namespace vornjsondb {

namespace {

constexpr int kMaxLevels = 8;
constexpr int kMaxDigits = 18;  // fits 64 bits without a check

class PlainJson {
  public:
    explicit PlainJson(const char* szText) : m_pNext(szText) {}

    bool ReadWhole(const char* pEnd, Json::Value& jOut) {
        return ReadValue(jOut, 0) && m_pNext == pEnd;
    }

  private:
    bool Skip(char c) {
        if (*m_pNext != c) {
            return false;
        }
        ++m_pNext;
        return true;
    }

    bool ReadValue(Json::Value& jOut, int nLevel) {
        switch (*m_pNext) {
            case '"':
                return ReadText(jOut);
            case '[':
                return nLevel < kMaxLevels && ReadArray(jOut, nLevel + 1);
            case '{':
                return nLevel < kMaxLevels && ReadObject(jOut, nLevel + 1);
            case 't':
                return ReadWord("true", jOut, true);
            case 'f':
                return ReadWord("false", jOut, false);
            case 'n':
                return ReadWord("null", jOut, Json::Value());
            default:
                return ReadInteger(jOut);
        }
    }

    bool ReadWord(const char* szWord, Json::Value& jOut, Json::Value jMeaning) {
        const size_t nLength = std::strlen(szWord);
        if (std::strncmp(m_pNext, szWord, nLength) != 0) {
            return false;
        }
        m_pNext += nLength;
        jOut.swapPayload(jMeaning);
        return true;
    }

    bool ReadInteger(Json::Value& jOut) {
        const bool blNegative = Skip('-');
        const char* pFirst = m_pNext;
        Json::Int64 nValue = 0;
        while (*m_pNext >= '0' && *m_pNext <= '9' && m_pNext - pFirst < kMaxDigits) {
            nValue = nValue * 10 + (*m_pNext - '0');
            ++m_pNext;
        }
        const bool blLeadingZero = *pFirst == '0' && m_pNext - pFirst > 1;
        if (m_pNext == pFirst || blLeadingZero) {
            return false;
        }
        // What may continue a number instead of ending it is refused by the caller, which expects
        // a separator.
        Json::Value jNumber(blNegative ? -nValue : nValue);
        jOut.swapPayload(jNumber);
        return true;
    }

    // Moves over a quoted text without escapes; pBegin is set to what stands between the quotes.
    bool SkipText(const char*& pBegin) {
        pBegin = ++m_pNext;
        while (*m_pNext != '"') {
            if (*m_pNext == '\\' || static_cast<unsigned char>(*m_pNext) < 0x20) {
                return false;
            }
            ++m_pNext;
        }
        ++m_pNext;
        return true;
    }

    bool ReadText(Json::Value& jOut) {
        const char* pBegin = nullptr;
        if (!SkipText(pBegin)) {
            return false;
        }
        Json::Value jText(pBegin, m_pNext - 1);
        jOut.swapPayload(jText);
        return true;
    }

    bool ReadArray(Json::Value& jOut, int nLevel) {
        Json::Value jArray(Json::arrayValue);
        jOut.swapPayload(jArray);
        ++m_pNext;
        if (Skip(']')) {
            return true;
        }
        do {
            Json::Value jElement;
            if (!ReadValue(jElement, nLevel)) {
                return false;
            }
            jOut.append(std::move(jElement));
        } while (Skip(','));
        return Skip(']');
    }

    bool ReadObject(Json::Value& jOut, int nLevel) {
        Json::Value jObject(Json::objectValue);
        jOut.swapPayload(jObject);
        ++m_pNext;
        if (Skip('}')) {
            return true;
        }
        do {
            const char* pName = nullptr;
            if (*m_pNext != '"' || !SkipText(pName)) {
                return false;
            }
            Json::Value& jMember = *jOut.demand(pName, m_pNext - 1);
            if (!Skip(':') || !ReadValue(jMember, nLevel)) {
                return false;
            }
        } while (Skip(','));
        return Skip('}');
    }

    const char* m_pNext;
};

bool WriteText(const char* pBegin, const char* pEnd, std::string& strOut) {
    for (const char* p = pBegin; p != pEnd; ++p) {
        if (*p == '"' || *p == '\\' || static_cast<unsigned char>(*p) < 0x20) {
            return false;
        }
    }
    strOut.append(1, '"').append(pBegin, pEnd).append(1, '"');
    return true;
}

bool WriteValue(const Json::Value& jValue, int nLevel, std::string& strOut);

bool WriteArray(const Json::Value& jArray, int nLevel, std::string& strOut) {
    strOut += '[';
    Json::ArrayIndex nNext = 0;
    const Json::Value::const_iterator itEnd = jArray.end();
    for (Json::Value::const_iterator it = jArray.begin(); it != itEnd; ++it) {
        if (it.index() != nNext) {
            return false;
        }
        if (nNext++ > 0) {
            strOut += ',';
        }
        if (!WriteValue(*it, nLevel, strOut)) {
            return false;
        }
    }
    strOut += ']';
    return true;
}

bool WriteObject(const Json::Value& jObject, int nLevel, std::string& strOut) {
    char cBefore = '{';
    const Json::Value::const_iterator itEnd = jObject.end();
    for (Json::Value::const_iterator it = jObject.begin(); it != itEnd; ++it) {
        strOut += cBefore;
        cBefore = ',';
        const MemberName Name = NameOf(it);
        if (!WriteText(Name.pBegin, Name.pEnd, strOut)) {
            return false;
        }
        strOut += ':';
        if (!WriteValue(*it, nLevel, strOut)) {
            return false;
        }
    }
    strOut += jObject.empty() ? "{}" : "}";
    return true;
}

bool WriteValue(const Json::Value& jValue, int nLevel, std::string& strOut) {
    switch (jValue.type()) {
        case Json::nullValue:
            strOut += "null";
            return true;
        case Json::booleanValue:
            strOut += jValue.asBool() ? "true" : "false";
            return true;
        case Json::intValue:
            strOut += std::to_string(jValue.asInt64());
            return true;
        case Json::stringValue: {
            const char* pBegin = nullptr;
            const char* pEnd = nullptr;
            jValue.getString(&pBegin, &pEnd);
            return WriteText(pBegin, pEnd, strOut);
        }
        case Json::arrayValue:
            return nLevel < kMaxLevels && WriteArray(jValue, nLevel + 1, strOut);
        case Json::objectValue:
            return nLevel < kMaxLevels && WriteObject(jValue, nLevel + 1, strOut);
        default:
            return false;
    }
}

}  // namespace

bool ReadPlainJson(const char* szText, size_t nLength, Json::Value& jOut) {
    return PlainJson(szText).ReadWhole(szText + nLength, jOut);
}

bool WritePlainJson(const Json::Value& jValue, std::string& strOut) {
    return WriteValue(jValue, 0, strOut);
}

}  // namespace vornjsondb
