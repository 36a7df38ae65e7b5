#include <cmath>

#include "../src/base/Digits.h"
#include "Concat.h"
#include "Operand.h"

namespace vornjsondb {

namespace {

constexpr Json::ArrayIndex kMostValues = 100000;

// Up to here a real is a whole number exactly when its integer equals it.
constexpr double kTwoTo53 = 9007199254740992.0;

// How many bytes the UTF-8 character at the beginning has; 0: it is none.
size_t CharacterBytes(std::string_view strText) {
    const auto At = [&strText](size_t i) {
        return i < strText.size() ? static_cast<unsigned char>(strText[i]) : 0U;
    };
    const unsigned nFirst = At(0);
    const size_t nBytes = nFirst < 0x80   ? 1
                          : nFirst < 0xc2 ? 0
                          : nFirst < 0xe0 ? 2
                          : nFirst < 0xf0 ? 3
                          : nFirst < 0xf5 ? 4
                                          : 0;
    for (size_t i = 1; i < nBytes; ++i) {
        if ((At(i) & 0xc0U) != 0x80) {
            return 0;
        }
    }
    // Overlong forms, surrogates, beyond the last character.
    const unsigned nSecond = At(1);
    const bool blBad = (nFirst == 0xe0 && nSecond < 0xa0) || (nFirst == 0xed && nSecond > 0x9f) ||
                       (nFirst == 0xf0 && nSecond < 0x90) || (nFirst == 0xf4 && nSecond > 0x8f);
    return blBad ? 0 : nBytes;
}

void AppendJsonText(std::string_view strText, std::string& strJson) {
    static constexpr char kHex[] = "0123456789abcdef";
    strJson += '"';
    for (const char c : strText) {
        const auto nByte = static_cast<unsigned char>(c);
        if (nByte < 0x20) {
            strJson += "\\u00";
            strJson += kHex[nByte >> 4U];
            strJson += kHex[nByte & 15U];
        } else {
            strJson += c == '"' || c == '\\' ? "\\" : "";
            strJson += c;
        }
    }
    strJson += '"';
}

// Appends the value; false: JSON text would not carry it exactly.
bool AppendExact(const Operand& Each, std::string& strJson) {
    const BoundValue& Value = Each.Value;
    switch (Value.eKind) {
        case BoundValue::Kind::kInteger:
            strJson += Digits(Json::Int64{Value.nValue}).View();
            return true;
        case BoundValue::Kind::kReal: {
            const bool blWhole =
                std::fabs(Value.dValue) <= kTwoTo53 && std::trunc(Value.dValue) == Value.dValue;
            if (blWhole) {
                strJson += Digits(static_cast<Json::Int64>(Value.dValue)).View();
            }
            return blWhole;
        }
        default:
            // mutate(exchanged): what is appended is taken away again.
            if (Each.eKind == ValueKind::kNumber || !IsPlainText(Value.strBytes)) {
                return false;
            }
            AppendJsonText(Value.strBytes, strJson);
            return true;
    }
}

void Add(const Operand& Each, bool blOneByOne, ListOperand::OneKind& Into) {
    // mutate(exchanged): to look changes nothing.
    if (Each.Value.eKind == BoundValue::Kind::kNull) {
        Into.blBare = true;
        return;
    }
    const size_t nBefore = Into.strJson.size();
    Into.strJson += nBefore == 0 ? '[' : ',';
    // mutate(exchanged): what is appended is taken away again.
    if (blOneByOne || !AppendExact(Each, Into.strJson)) {
        // mutate(exchanged): in any order.
        Into.strJson.resize(nBefore);
        Into.vecValues.push_back(Each.Value);
    }
}

}  // namespace

bool ReadList(const Place& Where, const Json::Value& jList, bool blOneByOne, OperandReader& Reader,
              ListOperand& Out, Problem& Why) {
    if (jList.size() > kMostValues) {
        return Why.Tell(FindingCode::kTooManyValues,
                        Concat({"a list may have 100000 values, not ", DigitsOf(jList.size())}));
    }
    for (Json::ArrayIndex i = 0; i < jList.size(); ++i) {
        Operand Each;
        // mutate(hoisted): where nothing is wrong nobody asks for the place.
        if (!Reader.Read(Where, jList[i], Each, Why)) {
            Why.strStep = Concat({"/", DigitsOf(i)});
            return false;
        }
        Add(Each, blOneByOne, Out.Kinds[static_cast<size_t>(Each.eKind)]);
    }
    for (ListOperand::OneKind& Kind : Out.Kinds) {
        Kind.strJson += Kind.strJson.empty() ? "" : "]";
    }
    return true;
}

bool IsPlainText(std::string_view strText) {
    while (!strText.empty()) {
        const size_t nBytes = strText[0] == '\0' ? 0 : CharacterBytes(strText);
        // mutate(exchanged): of no bytes none are removed.
        if (nBytes == 0) {
            return false;
        }
        strText.remove_prefix(nBytes);
    }
    return true;
}

}  // namespace vornjsondb
