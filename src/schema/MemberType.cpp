#include "MemberType.h"

#include <cstdlib>
#include <stdexcept>

#include <sqlite3.h>

#include "../base/Digits.h"
#include "../base/JsonMember.h"
#include "../base/JsonMemory.h"
#include "../base/JsonText.h"
#include "../base/SqlText.h"

namespace vornjsondb {

namespace {

#ifdef VORN_TYPES_WITHOUT_TREATMENTS

// A handle that binds values asks which treatments a type has, and calls none.
void NoRead(const char*, Json::Value&) {}
void NoAppend(const Json::Value&, TextBuffer&) {}

constexpr auto ReadText = NoRead, ReadInt = NoRead, ReadInt64 = NoRead, ReadBool = NoRead,
               ReadJson = NoRead;
constexpr auto AppendText = NoAppend, AppendJson = NoAppend, AppendSigned = NoAppend,
               AppendUnsigned = NoAppend, AppendFloat = NoAppend, AppendDouble = NoAppend;

#else

// ---- column text into a value ----

// Null, also for a column that comes twice.
Json::Value& Emptied(Json::Value& jOut) {
    // mutate(true, false, sunk, hoisted, != to ==): what is not released is only lost.
    if (jOut.type() != Json::nullValue) {
        // mutate(dropped): what is not released is only lost.
        jOut = Json::Value::nullSingleton();
    }
    return jOut;
}

void ReadText(const char* szText, Json::Value& jOut) {
    // mutate(doubled): it reads the same again.
    MakeInPlace(Emptied(jOut), [&] { return Json::Value(szText); });
}

constexpr int kUsualDigits = 9;  // fit 32 bits without a check

// What strtol or strtoll gives; it is asked only where the text is more than a few digits.
template <typename Number>
Number ReadNumber(const char* szText, Number (*pfnGeneral)(const char*, char**, int)) {
    Number nValue = 0;
    const char* p = szText;
    // mutate(dropped, false, >= to >, '0' to 'x', <= to <, < to <=, < to >): where it stops early,
    // the general function reads all.
    while (*p >= '0' && *p <= '9' && p - szText < kUsualDigits) {
        nValue = nValue * 10 + (*p - '0');
        ++p;
    }
    return *p == '\0' ? nValue : pfnGeneral(szText, nullptr, 10);
}

// By way of long, also for the unsigned types: out of range it is clamped where long has 32 bits
// and cut where it has 64. Stored data is read so everywhere.
// Pinned by RowValues.UnsignedIntAboveTheSignedMaximumGoesThroughTheSignedConversion.
void ReadInt(const char* szText, Json::Value& jOut) {
    // mutate(doubled): it reads the same again.
    MakeInPlace(Emptied(jOut), [&] {
        return Json::Value(static_cast<Json::Int>(ReadNumber(szText, std::strtol)));
    });
}

void ReadInt64(const char* szText, Json::Value& jOut) {
    // mutate(doubled): it reads the same again.
    MakeInPlace(Emptied(jOut), [&] {
        return Json::Value(static_cast<Json::Int64>(ReadNumber(szText, std::strtoll)));
    });
}

void ReadBool(const char* szText, Json::Value& jOut) {
    // mutate(doubled): it reads the same again.
    MakeInPlace(Emptied(jOut), [&] { return Json::Value(ReadNumber(szText, std::strtol) == 1); });
}

constexpr auto ReadJson = FromString;

// ---- value into a value list ----

void AppendText(const Json::Value& jValue, TextBuffer& Out) {
    if (jValue.isString()) {                    // mutate(false): a copy of it gives the same text.
        AppendQuoted(jValue.asCString(), Out);  // in place: it may be long
    } else {
        AppendQuoted(jValue.asString().c_str(), Out);
    }
}

void AppendJson(const Json::Value& jValue, TextBuffer& Out) {
    AppendQuoted(ToString(jValue).c_str(), Out);
}

// The value itself, which must lie below. JsonCpp takes the first number beyond a range for the
// last one in it, which would change sign.
const Json::Value& Below(double dFirstBeyond, const Json::Value& jValue) {
    if (jValue.type() == Json::realValue && jValue.asDouble() >= dFirstBeyond) {
        Json::throwLogicError("vornjsondb: the number is out of range");
    }
    return jValue;
}

void AppendSigned(const Json::Value& jValue, TextBuffer& Out) {
    AppendDigits(Below(9223372036854775808.0, jValue).asInt64(), Out);
}

void AppendUnsigned(const Json::Value& jValue, TextBuffer& Out) {
    AppendDigits(Below(18446744073709551616.0, jValue).asUInt64(), Out);
}

void AppendReal(double dValue, TextBuffer& Out) {
    const SqlText szText(sqlite3_mprintf("%f", dValue));
    if (!szText) {
        throw std::logic_error("vornjsondb: the SQL formatter gave no text");
    }
    Out.Append(szText.get());
}

void AppendFloat(const Json::Value& jValue, TextBuffer& Out) {
    AppendReal(static_cast<double>(jValue.asFloat()), Out);
}

void AppendDouble(const Json::Value& jValue, TextBuffer& Out) {
    AppendReal(jValue.asDouble(), Out);
}

#endif  // VORN_TYPES_WITHOUT_TREATMENTS

// ---- whether a value fits ----

template <bool (Json::Value::*pfnIs)() const>
bool Fits(const Json::Value& jValue) {
    return (jValue.*pfnIs)();
}

using Json::Value;
constexpr ConditionForm kText = ConditionForm::kQuotedText;
constexpr ConditionForm kJson = ConditionForm::kQuotedJson;
constexpr ConditionForm kFlag = ConditionForm::kBoolean;
constexpr ConditionForm kBare = ConditionForm::kBareText;

constexpr BoundForm kInt32 = {BoundKind::kInteger, BoundRange::kInt32};
constexpr BoundForm kUInt32 = {BoundKind::kInteger, BoundRange::kUInt32};
constexpr BoundForm kInt64 = {BoundKind::kInteger, BoundRange::kInt64};
constexpr BoundForm kUInt63 = {BoundKind::kInteger, BoundRange::kUInt63};
constexpr BoundForm kDouble = {BoundKind::kReal, BoundRange::kDouble};
constexpr BoundForm kFloat = {BoundKind::kReal, BoundRange::kFloat};
constexpr BoundForm kString = {BoundKind::kText, BoundRange::kNone};
constexpr BoundForm kBool = {BoundKind::kBoolean, BoundRange::kNone};
constexpr BoundForm kObject = {BoundKind::kObject, BoundRange::kNone};
constexpr BoundForm kList = {BoundKind::kList, BoundRange::kNone};
constexpr BoundForm kAnyJson = {BoundKind::kJson, BoundRange::kNone};
constexpr BoundForm kAny = {BoundKind::kAny, BoundRange::kNone};
constexpr BoundForm kNothing = {BoundKind::kNone, BoundRange::kNone};

// "any" is for handles that bind values: in all else it is treated as an unknown name.
// clang-format off
constexpr MemberType kMemberTypes[] = {
    {"string",             ReadText,   Fits<&Value::isString>,   AppendText,     "%Q",    kText, true,  kString},
    {"int",                ReadInt,    Fits<&Value::isIntegral>, AppendSigned,   "%lld",  kBare, false, kInt32},
    {"long long",          ReadInt64,  Fits<&Value::isIntegral>, AppendSigned,   "%lld",  kBare, false, kInt64},
    {"bool",               ReadBool,   Fits<&Value::isBool>,     AppendSigned,   "%lld",  kFlag, false, kBool},
    {"Json::objectValue",  ReadJson,   Fits<&Value::isObject>,   AppendJson,     "%Q",    kJson, false, kObject},
    {"Json::arrayValue",   ReadJson,   Fits<&Value::isArray>,    AppendJson,     "%Q",    kJson, false, kList},
    {"Json::Value",        ReadJson,   nullptr,                  nullptr,        nullptr, kJson, false, kAnyJson},
    {"unsigned int",       ReadInt,    nullptr,                  AppendUnsigned, "%llu",  kBare, false, kUInt32},
    {"unsigned long long", ReadInt64,  nullptr,                  AppendUnsigned, "%llu",  kBare, false, kUInt63},
    {"long",               nullptr,    nullptr,                  AppendSigned,   "%lld",  kBare, false, kInt64},
    {"unsigned long",      nullptr,    nullptr,                  AppendUnsigned, "%llu",  kBare, false, kUInt63},
    {"unsigned",           nullptr,    nullptr,                  AppendUnsigned, "%llu",  kBare, false, kUInt32},
    {"double",             nullptr,    nullptr,                  AppendDouble,   "%lf",   kBare, false, kDouble},
    {"float",              nullptr,    nullptr,                  AppendFloat,    "%f",    kBare, false, kFloat},
    {"uid_t",              nullptr,    Fits<&Value::isIntegral>, nullptr,        nullptr, kBare, false, kUInt32},
    {"time_t",             nullptr,    Fits<&Value::isIntegral>, nullptr,        nullptr, kBare, false, kInt64},
    {"any",                nullptr,    nullptr,                  nullptr,        nullptr, kBare, false, kAny},
};
constexpr MemberType kUnknownType =
    {"",                   nullptr,    nullptr,                  nullptr,        nullptr, kBare, false, kNothing};
// clang-format on

// The "cpptype" text of a member's entry; empty when there is none.
MemberName TypeText(const Json::Value& jDefinition) {
    MemberName Name = NameOf("");
    if (const Json::Value* pjName = FindMember(jDefinition, "cpptype")) {
        pjName->getString(&Name.pBegin, &Name.pEnd);
    }
    return Name;
}

}  // namespace

const MemberType& FindMemberType(const char* pBegin, const char* pEnd) {
    const MemberName Name{pBegin, pEnd};
    for (const MemberType& Type : kMemberTypes) {
        if (Name.Is(Type.szName)) {
            return Type;
        }
    }
    return kUnknownType;
}

const MemberType& TypeOfMember(const Json::Value& jDefinition) {
    const MemberName Name = TypeText(jDefinition);
    return FindMemberType(Name.pBegin, Name.pEnd);
}

const char* TypeName(const Json::Value& jDefinition) {
    return TypeText(jDefinition).pBegin;
}

}  // namespace vornjsondb
