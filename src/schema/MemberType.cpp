#include "MemberType.h"

#include <cstdlib>
#include <cstring>

#include <sqlite3.h>

#include "../base/JsonMember.h"
#include "../base/JsonText.h"

namespace vornjsondb {

namespace {

// ---- column text into a value ----

// Swaps the payload alone: half the cost of an assignment, which also moves comments and offsets
// that a column never has.
void Set(Json::Value& jOut, Json::Value&& jValue) {
    jOut.swapPayload(jValue);
}

void ReadText(const char* szText, Json::Value& jOut) {
    Set(jOut, Json::Value(szText));
}

constexpr int kUsualDigits = 9;  // fit 32 bits without a check

// What strtol or strtoll gives; it is asked only where the text is more than a few digits.
template <typename Number>
Number ReadNumber(const char* szText, Number (*pfnGeneral)(const char*, char**, int)) {
    Number nValue = 0;
    const char* p = szText;
    while (*p >= '0' && *p <= '9' && p - szText < kUsualDigits) {
        nValue = nValue * 10 + (*p - '0');
        ++p;
    }
    return *p == '\0' ? nValue : pfnGeneral(szText, nullptr, 10);
}

// By way of long, also for the unsigned types: out of range it is clamped where long has 32 bits
// and cut where it has 64. Stored data is read so everywhere.
// Pinned by RowsTest.UnsignedIntAboveTheSignedMaximumGoesThroughTheSignedConversion.
void ReadInt(const char* szText, Json::Value& jOut) {
    Set(jOut, static_cast<Json::Int>(ReadNumber(szText, std::strtol)));
}

void ReadInt64(const char* szText, Json::Value& jOut) {
    Set(jOut, static_cast<Json::Int64>(ReadNumber(szText, std::strtoll)));
}

void ReadBool(const char* szText, Json::Value& jOut) {
    Set(jOut, ReadNumber(szText, std::strtol) == 1);
}

// ---- value into a value list ----

char* FormatText(const char* szFormat, const Json::Value& jValue) {
    if (!jValue.isString()) {
        return sqlite3_mprintf(szFormat, jValue.asString().c_str());
    }
    // Handed over in place: it may be long. "%Q" goes through a text byte by byte to double its
    // quotes; without any, "'%s'" gives the same at a fraction of the cost.
    const char* szText = jValue.asCString();
    const bool blPlain = std::strcmp(szFormat, "%Q") == 0 && std::strchr(szText, '\'') == nullptr;
    return sqlite3_mprintf(blPlain ? "'%s'" : szFormat, szText);
}

char* FormatJson(const char* szFormat, const Json::Value& jValue) {
    return sqlite3_mprintf(szFormat, ToString(jValue).c_str());
}

// JsonCpp takes the first number beyond a range for the last one in it, which would change sign.
void RefuseFrom(double dFirstBeyond, const Json::Value& jValue) {
    if (jValue.type() == Json::realValue && jValue.asDouble() >= dFirstBeyond) {
        Json::throwLogicError("vornjsondb: the number is out of range");
    }
}

char* FormatSigned(const char* szFormat, const Json::Value& jValue) {
    RefuseFrom(9223372036854775808.0, jValue);
    return sqlite3_mprintf(szFormat, static_cast<sqlite3_int64>(jValue.asInt64()));
}

char* FormatUnsigned(const char* szFormat, const Json::Value& jValue) {
    RefuseFrom(18446744073709551616.0, jValue);
    return sqlite3_mprintf(szFormat, static_cast<sqlite3_uint64>(jValue.asUInt64()));
}

char* FormatFloat(const char* szFormat, const Json::Value& jValue) {
    return sqlite3_mprintf(szFormat, static_cast<double>(jValue.asFloat()));
}

char* FormatDouble(const char* szFormat, const Json::Value& jValue) {
    return sqlite3_mprintf(szFormat, jValue.asDouble());
}

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

// clang-format off
constexpr MemberType kMemberTypes[] = {
    {"string",             ReadText,   Fits<&Value::isString>,   "%Q",    FormatText,     kText},
    {"int",                ReadInt,    Fits<&Value::isIntegral>, "%lld",  FormatSigned,   kBare},
    {"long long",          ReadInt64,  Fits<&Value::isIntegral>, "%lld",  FormatSigned,   kBare},
    {"bool",               ReadBool,   Fits<&Value::isBool>,     "%lld",  FormatSigned,   kFlag},
    {"Json::objectValue",  FromString, Fits<&Value::isObject>,   "%Q",    FormatJson,     kJson},
    {"Json::arrayValue",   FromString, Fits<&Value::isArray>,    "%Q",    FormatJson,     kJson},
    {"Json::Value",        FromString, nullptr,                  nullptr, nullptr,        kJson},
    {"unsigned int",       ReadInt,    nullptr,                  "%llu",  FormatUnsigned, kBare},
    {"unsigned long long", ReadInt64,  nullptr,                  "%llu",  FormatUnsigned, kBare},
    {"long",               nullptr,    nullptr,                  "%lld",  FormatSigned,   kBare},
    {"unsigned long",      nullptr,    nullptr,                  "%llu",  FormatUnsigned, kBare},
    {"unsigned",           nullptr,    nullptr,                  "%llu",  FormatUnsigned, kBare},
    {"double",             nullptr,    nullptr,                  "%lf",   FormatDouble,   kBare},
    {"float",              nullptr,    nullptr,                  "%f",    FormatFloat,    kBare},
    {"uid_t",              nullptr,    Fits<&Value::isIntegral>, nullptr, nullptr,        kBare},
    {"time_t",             nullptr,    Fits<&Value::isIntegral>, nullptr, nullptr,        kBare},
};
constexpr MemberType kUnknownType =
    {"",                   nullptr,    nullptr,                  nullptr, nullptr,        kBare};
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

bool ReadColumn(const MemberType& Type, const char* szText, Json::Value& jOut) {
    if (Type.pfnRead == nullptr) {
        return false;
    }
    try {
        Type.pfnRead(szText, jOut);
    } catch (const Json::Exception&) {
        return false;
    }
    return true;
}

}  // namespace vornjsondb
