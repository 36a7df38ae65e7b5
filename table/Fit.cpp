#include "Fit.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "../src/base/JsonMember.h"
#include "../src/base/JsonMemory.h"
#include "Concat.h"
#include "FindingCodes.h"
#include "WrittenJson.h"

namespace vornjsondb {

namespace {

constexpr double kTwoTo63 = 9223372036854775808.0;

// In the order of BoundRange.
constexpr Range kRanges[] = {
    {0, 0, 0, 0},
    {INT32_MIN, INT32_MAX, INT32_MAX, 0},
    {0, UINT32_MAX, INT32_MAX, 0},
    {INT64_MIN, INT64_MAX, INT64_MAX, 0},
    {0, INT64_MAX, INT64_MAX, 0},
    {0, 0, 0, std::numeric_limits<double>::max()},
    {0, 0, 0, static_cast<double>(std::numeric_limits<float>::max())},
};

// Levels that every release of JsonCpp reads; how many more depends on the release.
constexpr size_t kSureLevels = 128;

size_t ReaderLevels() {
    Json::CharReaderBuilder Builder;
    return static_cast<size_t>(Builder["stackLimit"].asInt64());
}

unsigned CheckReal(double dValue) {
    if (std::isnan(dValue)) {
        return BitOf(Misfit::kNotANumber);
    }
    return std::isinf(dValue) ? BitOf(Misfit::kInfinite) : 0;
}

unsigned CheckTree(const Json::Value& jValue, size_t nLevelsLeft) {
    if (nLevelsLeft == 0) {
        return BitOf(Misfit::kDepth);
    }
    // mutate(exchanged): what has no members has an end, too.
    if (!jValue.isArray() && !jValue.isObject()) {
        return jValue.type() == Json::realValue ? CheckReal(jValue.asDouble()) : 0;
    }
    const Json::Value::const_iterator itEnd = jValue.end();
    unsigned nFound = 0;
    for (Json::Value::const_iterator it = jValue.begin(); it != itEnd; ++it) {
        nFound |= CheckTree(*it, nLevelsLeft - 1);
    }
    return nFound;
}

// Whether a member of that type takes JSON that begins so.
bool TakesJson(const MemberType& Type, char cFirst) {
    const BoundKind eKind = Type.Bound.eKind;
    return eKind == BoundKind::kJson || (eKind == BoundKind::kObject && cFirst == '{') ||
           (eKind == BoundKind::kList && cFirst == '[');
}

Misfit Readable(const MemberType& Type, bool blCompatible) {
    return blCompatible && Type.pfnRead == nullptr ? Misfit::kUnreadable : Misfit::kNone;
}

// A whole number beyond 63 bits, which SQLite has no integers for: at most a real that equals it.
Misfit FitHuge(const MemberType& Type, std::uint64_t nValue, bool blCompatible, BoundValue& Out) {
    const double dValue = static_cast<double>(nValue);
    const bool blExact = dValue < 2 * kTwoTo63 && static_cast<std::uint64_t>(dValue) == nValue;
    const bool blReal = Type.Bound.eKind == BoundKind::kReal || Type.Bound.eKind == BoundKind::kAny;
    return blReal && !blExact ? Misfit::kRange : FitReal(Type, dValue, blCompatible, Out);
}

// Plain values are written without a look before: they have few levels and no fractions.
Misfit FitTree(const MemberType& Type, const Json::Value& jValue, bool blCompatible,
               JsonCodec& Codec, std::string& strJson, BoundValue& Out) try {
    const char cOther = jValue.isObject() ? '{' : '"';
    // mutate(exchanged): the text of what does not fit is not used.
    if (!TakesJson(Type, jValue.isArray() ? '[' : cOther)) {
        return Misfit::kKind;
    }
    // mutate(sunk): both write the same.
    if (!WritePlainText(jValue, strJson)) {
        const unsigned nFound = MisfitsIn(jValue);
        // mutate(exchanged): the text of what does not fit is not used.
        for (const Misfit eEach : {Misfit::kNotANumber, Misfit::kInfinite, Misfit::kDepth}) {
            if ((nFound & BitOf(eEach)) != 0) {
                return eEach;
            }
        }
        strJson = Codec.Write(jValue);
    }
    Out.SetText(strJson);
    return Readable(Type, blCompatible);
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

}  // namespace

const Range& RangeOf(const MemberType& Type) {
    return kRanges[static_cast<size_t>(Type.Bound.eRange)];
}

bool BoundValue::IsBoundAs(const BoundValue& Other) const {
    switch (eKind) {
        case Kind::kNull:
            return Other.eKind == Kind::kNull;
        case Kind::kInteger:
            return Other.IsInteger(nValue);
        case Kind::kText:
            return Other.IsTextAt(strBytes);
        default:
            return false;
    }
}

int BoundValue::Bind(sqlite3_stmt* pStatement, int nParameter) const {
    switch (eKind) {
        case Kind::kInteger:
            return sqlite3_bind_int64(pStatement, nParameter, nValue);
        case Kind::kReal:
            return sqlite3_bind_double(pStatement, nParameter, dValue);
        case Kind::kText:
            // A null pointer would bind NULL.
            return sqlite3_bind_text64(pStatement, nParameter,
                                       strBytes.empty() ? "" : strBytes.data(), strBytes.size(),
                                       SQLITE_STATIC, SQLITE_UTF8);
        case Kind::kBlob:
            return sqlite3_bind_blob64(pStatement, nParameter,
                                       strBytes.empty() ? "" : strBytes.data(), strBytes.size(),
                                       SQLITE_STATIC);
        default:
            return sqlite3_bind_null(pStatement, nParameter);
    }
}

Misfit FitBoolean(const MemberType& Type, bool blValue, BoundValue& Out) {
    Out.SetInteger(blValue ? 1 : 0);
    return Type.Bound.eKind == BoundKind::kBoolean ? Misfit::kNone : Misfit::kKind;
}

Misfit FitInteger(const MemberType& Type, std::int64_t nValue, bool blCompatible, BoundValue& Out) {
    const BoundForm& Form = Type.Bound;
    // mutate(hoisted, exchanged): what follows gives its own.
    if (Form.eKind == BoundKind::kReal) {
        Out.eKind = BoundValue::Kind::kReal;
        Out.dValue = static_cast<double>(nValue);
        const bool blExact =
            Out.dValue < kTwoTo63 && static_cast<std::int64_t>(Out.dValue) == nValue;
        return blExact ? Readable(Type, blCompatible) : Misfit::kRange;
    }
    Out.SetInteger(nValue);
    if (Form.eKind == BoundKind::kAny) {
        return Readable(Type, blCompatible);
    }
    if (Form.eKind != BoundKind::kInteger) {
        return Misfit::kKind;
    }
    const Range& Of = RangeOf(Type);
    if (nValue < Of.nLeast || nValue > Of.nMost) {
        return Misfit::kRange;
    }
    return blCompatible && nValue > Of.nMostRead ? Misfit::kUnreadable
                                                 : Readable(Type, blCompatible);
}

Misfit FitReal(const MemberType& Type, double dValue, bool blCompatible, BoundValue& Out) {
    const BoundForm& Form = Type.Bound;
    Out.eKind = BoundValue::Kind::kReal;
    Out.dValue = dValue;
    if (std::isnan(dValue)) {
        return Misfit::kNotANumber;
    }
    if (Form.eKind == BoundKind::kInteger) {
        // A whole number is one, however it is written.
        const bool blWhole = std::trunc(dValue) == dValue;
        if (blWhole && (dValue < -kTwoTo63 || dValue >= kTwoTo63)) {
            return Misfit::kRange;
        }
        return blWhole ? FitInteger(Type, static_cast<std::int64_t>(dValue), blCompatible, Out)
                       : Misfit::kKind;
    }
    if (Form.eKind != BoundKind::kReal && Form.eKind != BoundKind::kAny) {
        return Misfit::kKind;
    }
    // mutate(exchanged): all only look.
    const bool blBeyond = Form.eKind == BoundKind::kReal && std::isfinite(dValue) &&
                          std::fabs(dValue) > RangeOf(Type).dMost;
    return blBeyond ? Misfit::kRange : Readable(Type, blCompatible);
}

Misfit FitText(const MemberType& Type, std::string_view strValue, bool blCompatible,
               BoundValue& Out) {
    const BoundKind eKind = Type.Bound.eKind;
    Out.SetText(strValue);
    if (eKind != BoundKind::kText && eKind != BoundKind::kAny) {
        return Misfit::kKind;
    }
    const bool blCut = blCompatible && strValue.find('\0') != std::string_view::npos;
    return blCut ? Misfit::kUnreadable : Readable(Type, blCompatible);
}

Misfit FitBlob(const MemberType& Type, std::string_view strBytes, bool blCompatible,
               BoundValue& Out) {
    Out.eKind = BoundValue::Kind::kBlob;
    Out.strBytes = strBytes;
    return Type.Bound.eKind == BoundKind::kAny ? Readable(Type, blCompatible) : Misfit::kKind;
}

Misfit FitJson(const MemberType& Type, const Json::Value& jValue, bool blCompatible,
               JsonCodec& Codec, std::string& strJson, BoundValue& Out) {
    // mutate(hoisted): what follows gives its own.
    if (jValue.isNull()) {
        Out.eKind = BoundValue::Kind::kNull;  // mutate(dropped): a new one is of this kind.
        return Misfit::kNone;
    }
    if (Type.Bound.eKind == BoundKind::kJson) {
        return FitTree(Type, jValue, blCompatible, Codec, strJson, Out);
    }
    switch (jValue.type()) {
        case Json::booleanValue:
            return FitBoolean(Type, jValue.asBool(), Out);
        case Json::intValue:
            return FitInteger(Type, jValue.asInt64(), blCompatible, Out);
        case Json::uintValue:
            return jValue.isInt64() ? FitInteger(Type, jValue.asInt64(), blCompatible, Out)
                                    : FitHuge(Type, jValue.asUInt64(), blCompatible, Out);
        case Json::realValue:
            return FitReal(Type, jValue.asDouble(), blCompatible, Out);
        case Json::stringValue:
            return FitText(Type, BytesOf(jValue), blCompatible, Out);
        default:
            return FitTree(Type, jValue, blCompatible, Codec, strJson, Out);
    }
}

unsigned MisfitsIn(const Json::Value& jTree) {
    const unsigned nFound = CheckTree(jTree, kSureLevels);
    return (nFound & BitOf(Misfit::kDepth)) == 0 ? nFound : CheckTree(jTree, ReaderLevels());
}

std::string Shown(const BoundValue& Value) {
    switch (Value.eKind) {
        case BoundValue::Kind::kInteger:
            return DigitsOf(Value.nValue);
        case BoundValue::Kind::kReal:
            return Shown(Json::Value(Value.dValue));
        case BoundValue::Kind::kText:
            return ShownText(Value.strBytes);
        case BoundValue::Kind::kBlob:
            return "a blob";
        default:
            return "null";
    }
}

std::string Expected(const MemberType& Type) {
    const Range& Of = RangeOf(Type);
    switch (Type.Bound.eKind) {
        case BoundKind::kText:
            return "a text";
        case BoundKind::kBoolean:
            return "true or false";
        case BoundKind::kInteger:
            return Concat(
                {"a whole number from ", DigitsOf(Of.nLeast), " to ", DigitsOf(Of.nMost)});
        case BoundKind::kReal:
            return "a number";
        case BoundKind::kObject:
            return "an object";
        case BoundKind::kList:
            return "a list";
        case BoundKind::kJson:
            return "any JSON";
        default:
            return "a text or a number";
    }
}

}  // namespace vornjsondb
