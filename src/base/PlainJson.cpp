#include "PlainJson.h"

#include <cstring>

#include "Digits.h"
#include "JsonMember.h"

namespace vornjsondb {

namespace {

constexpr int kMaxLevels = 8;
constexpr int kMaxDigits = 18;  // fits 64 bits without a check

// Reads one text. Values are returned and not written through a reference: so each is made where it
// stays. What is returned once the text has turned out not to be plain is of no use.
class PlainReader {
  public:
    explicit PlainReader(const char* szText) : m_pNext(szText) {}

    Json::Value ReadValue(int nLevel) {
        switch (*m_pNext) {
            case '"':
                return ReadText();
            case '[':
                return ReadArray(nLevel + 1);
            case '{':
                return ReadObject(nLevel + 1);
            case 't':
                return ReadWord("true", true);
            case 'f':
                return ReadWord("false", false);
            case 'n':
                return ReadWord("null", Json::Value());
            default:
                return ReadInteger();
        }
    }

    // Whether the text was plain as far as pEnd, which is where it ended.
    bool IsPlainUpTo(const char* pEnd) const { return m_blPlain && m_pNext == pEnd; }

  private:
    bool Skip(char c) {
        if (*m_pNext != c) {
            return false;
        }
        ++m_pNext;
        return true;
    }

    // As Skip, for what must be there.
    void Expect(char c) {
        if (!Skip(c)) {
            m_blPlain = false;
        }
    }

    Json::Value NotPlain() {
        m_blPlain = false;
        return {};
    }

    Json::Value ReadWord(const char* szWord, Json::Value jMeaning) {
        const size_t nLength = std::strlen(szWord);
        if (std::strncmp(m_pNext, szWord, nLength) != 0) {
            return NotPlain();
        }
        m_pNext += nLength;
        return jMeaning;
    }

    Json::Value ReadInteger() {
        const bool blNegative = Skip('-');
        const char* pFirst = m_pNext;
        Json::Int64 nValue = 0;
        while (*m_pNext >= '0' && *m_pNext <= '9' && m_pNext - pFirst < kMaxDigits) {
            nValue = nValue * 10 + (*m_pNext - '0');
            ++m_pNext;
        }
        const bool blLeadingZero = *pFirst == '0' && m_pNext - pFirst > 1;
        if (m_pNext == pFirst || blLeadingZero) {
            return NotPlain();
        }
        // What may continue a number instead of ending it is refused by the caller, which expects
        // a separator.
        return blNegative ? -nValue : nValue;
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

    Json::Value ReadText() {
        const char* pBegin = nullptr;
        return SkipText(pBegin) ? Json::Value(pBegin, m_pNext - 1) : NotPlain();
    }

    Json::Value ReadArray(int nLevel) {
        Json::Value jArray(Json::arrayValue);
        ++m_pNext;
        m_blPlain = nLevel <= kMaxLevels;
        if (Skip(']')) {
            return jArray;
        }
        while (m_blPlain) {
            jArray.append(ReadValue(nLevel));
            if (!Skip(',')) {
                Expect(']');
                break;
            }
        }
        return jArray;
    }

    Json::Value ReadObject(int nLevel) {
        Json::Value jObject(Json::objectValue);
        ++m_pNext;
        m_blPlain = nLevel <= kMaxLevels;
        if (Skip('}')) {
            return jObject;
        }
        while (m_blPlain) {  // mutate(true): what is read on is thrown away.
            const char* pName = nullptr;
            if (*m_pNext != '"' || !SkipText(pName)) {
                m_blPlain = false;
                break;
            }
            Json::Value& jMember = MakeMember(jObject, MemberName{pName, m_pNext - 1});
            Expect(':');
            if (m_blPlain) {
                jMember = ReadValue(nLevel);
            }
            if (!Skip(',')) {
                Expect('}');
                break;
            }
        }
        return jObject;
    }

    const char* m_pNext;
    bool m_blPlain = true;
};

bool WriteText(const char* pBegin, const char* pEnd, TextBuffer& Out) {
    // mutate(exchanged): behind a text that is not plain Out is in any state.
    for (const char* p = pBegin; p != pEnd; ++p) {
        const auto c = static_cast<unsigned char>(*p);
        // Small letters, and all that are none of ASCII's, are known by the first of these.
        if (c <= '\\' && (c == '\\' || c == '"' || c < 0x20)) {
            return false;
        }
    }
    Out.Append('"').Append({pBegin, static_cast<size_t>(pEnd - pBegin)}).Append('"');
    return true;
}

bool WriteValue(const Json::Value& jValue, int nLevel, TextBuffer& Out);

bool WriteArray(const Json::Value& jArray, int nLevel, TextBuffer& Out) {
    Out.Append('[');
    Json::ArrayIndex nStored = 0;
    const Json::Value::const_iterator itEnd = jArray.end();
    for (Json::Value::const_iterator it = jArray.begin(); it != itEnd; ++it) {
        if (nStored++ > 0) {
            Out.Append(',');
        }
        if (!WriteValue(*it, nLevel, Out)) {
            return false;
        }
    }
    Out.Append(']');
    return nStored == jArray.size();
}

bool WriteObject(const Json::Value& jObject, int nLevel, TextBuffer& Out) {
    char cBefore = '{';
    const Json::Value::const_iterator itEnd = jObject.end();
    for (Json::Value::const_iterator it = jObject.begin(); it != itEnd; ++it) {
        Out.Append(cBefore);
        cBefore = ',';
        const MemberName Name = NameOf(it);
        if (!WriteText(Name.pBegin, Name.pEnd, Out)) {
            return false;
        }
        Out.Append(':');
        if (!WriteValue(*it, nLevel, Out)) {
            return false;
        }
    }
    Out.Append(jObject.empty() ? "{}" : "}");
    return true;
}

bool WriteValue(const Json::Value& jValue, int nLevel, TextBuffer& Out) {
    if (nLevel > kMaxLevels) {
        return false;
    }
    switch (jValue.type()) {
        case Json::nullValue:
            Out.Append("null");
            return true;
        case Json::booleanValue:
            Out.Append(jValue.asBool() ? "true" : "false");
            return true;
        case Json::intValue:
            AppendDigits(jValue.asInt64(), Out);
            return true;
        case Json::stringValue: {
            const char* pBegin = nullptr;
            const char* pEnd = nullptr;
            jValue.getString(&pBegin, &pEnd);
            return WriteText(pBegin, pEnd, Out);
        }
        case Json::arrayValue:
            return WriteArray(jValue, nLevel + 1, Out);
        case Json::objectValue:
            return WriteObject(jValue, nLevel + 1, Out);
        default:
            return false;
    }
}

}  // namespace

bool ReadPlainJson(const char* szText, size_t nLength, Json::Value& jOut) {
    PlainReader Reader(szText);
    Json::Value jRead = Reader.ReadValue(0);
    if (!Reader.IsPlainUpTo(szText + nLength)) {
        return false;
    }
    jOut.swapPayload(jRead);
    return true;
}

bool WritePlainJson(const Json::Value& jValue, TextBuffer& Out) {
    return WriteValue(jValue, 0, Out);
}

}  // namespace vornjsondb
