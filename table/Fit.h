// A value as it will be stored, or why it cannot be.

#ifndef VORN_TABLE_FIT_H
#define VORN_TABLE_FIT_H

#include <cstdint>
#include <string>
#include <string_view>

#include <json/json.h>
#include <sqlite3.h>

#include "../src/base/JsonText.h"
#include "../src/schema/MemberType.h"

namespace vornjsondb {

// What a statement takes. Texts are not copied: they must live until the statement is reset.
struct BoundValue {
    enum class Kind { kNull, kInteger, kReal, kText, kBlob };
    Kind eKind = Kind::kNull;
    std::int64_t nValue = 0;
    double dValue = 0;
    std::string_view strBytes;

    void SetInteger(std::int64_t nInteger) {
        eKind = Kind::kInteger;
        nValue = nInteger;
    }
    void SetText(std::string_view strText) {
        eKind = Kind::kText;
        strBytes = strText;
    }

    bool IsInteger(std::int64_t nInteger) const {
        return eKind == Kind::kInteger && nValue == nInteger;
    }

    // Whether it is a text that stands there, with as many bytes.
    bool IsTextAt(std::string_view strText) const {
        return eKind == Kind::kText && strBytes.data() == strText.data() &&
               strBytes.size() == strText.size();
    }

    // Whether a statement that has this one bound needs the other one no more. False says nothing.
    bool IsBoundAs(const BoundValue& Other) const;

    int Bind(sqlite3_stmt* pStatement, int nParameter) const;  // SQLite's result
};

// The numbers of a type; nMostRead is the greatest that an old handle gives back.
struct Range {
    std::int64_t nLeast, nMost, nMostRead;
    double dMost;  // of reals, and its negative the least
};
const Range& RangeOf(const MemberType& Type);

enum class Misfit {
    kNone,
    kKind,        // another kind of value
    kRange,       // a number beyond the type's range
    kNotANumber,  // NaN, for which SQLite would store NULL
    kInfinite,    // an infinity inside of JSON, whose text its reader does not take
    kUnreadable,  // by an old handle
    kDepth        // JSON that its reader would refuse
};

// Each makes Out of a value, for a member of that type, also where it does not fit. blCompatible:
// what an old handle could not read back does not fit.
Misfit FitBoolean(const MemberType& Type, bool blValue, BoundValue& Out);
Misfit FitInteger(const MemberType& Type, std::int64_t nValue, bool blCompatible, BoundValue& Out);
Misfit FitReal(const MemberType& Type, double dValue, bool blCompatible, BoundValue& Out);
Misfit FitText(const MemberType& Type, std::string_view strValue, bool blCompatible,
               BoundValue& Out);
Misfit FitBlob(const MemberType& Type, std::string_view strBytes, bool blCompatible,
               BoundValue& Out);

// For every kind of value, null included. strJson keeps the text of a JSON member.
Misfit FitJson(const MemberType& Type, const Json::Value& jValue, bool blCompatible,
               JsonCodec& Codec, std::string& strJson, BoundValue& Out);

// A bit for each: all that no JSON text can hold, or no reader gives back, anywhere in the value.
constexpr unsigned BitOf(Misfit eMisfit) {
    return 1U << static_cast<unsigned>(eMisfit);
}
unsigned MisfitsIn(const Json::Value& jTree);

// The value as messages show it.
std::string Shown(const BoundValue& Value);

// "a text", "a whole number from 0 to 4294967295": what a type takes, for messages.
std::string Expected(const MemberType& Type);

}  // namespace vornjsondb

#endif  // VORN_TABLE_FIT_H
