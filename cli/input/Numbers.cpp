#include "Numbers.h"

#include <charconv>
#include <cmath>
#include <cstdlib>
#include <string>

namespace VORN_JSON_DB::Cli {

namespace {

template <typename Number>
bool Converts(std::string_view strNumber, Number& Into) {
    const char* const pEnd = strNumber.data() + strNumber.size();
    const auto Result = std::from_chars(strNumber.data(), pEnd, Into);
    return Result.ec == std::errc() && Result.ptr == pEnd;
}

bool IsDigit(char c) {
    return c >= '0' && c <= '9';
}

size_t SkipDigits(std::string_view strText, size_t i) {
    while (i < strText.size() && IsDigit(strText[i])) {
        ++i;
    }
    return i;
}

// The length of -?(0|[1-9][0-9]*) at the text's begin; 0: there is none.
size_t IntegerLength(std::string_view strText) {
    const size_t nSign = strText.substr(0, 1) == "-" ? 1 : 0;
    const size_t nEnd = SkipDigits(strText, nSign);
    const bool blZeroFirst = nEnd > nSign + 1 && strText[nSign] == '0';
    return nEnd == nSign || blZeroFirst ? 0 : nEnd;
}

// Whether all of it is ([eE][+-]?[0-9]+)?
bool IsPower(std::string_view strText) {
    if (strText.empty() || (strText[0] != 'e' && strText[0] != 'E')) {
        return strText.empty();
    }
    const bool blSign = strText.size() > 1 && (strText[1] == '+' || strText[1] == '-');
    const size_t nDigits = blSign ? 2 : 1;
    return nDigits < strText.size() && SkipDigits(strText, nDigits) == strText.size();
}

// Whether all of it is \.[0-9]+([eE][+-]?[0-9]+)?
bool IsFraction(std::string_view strText) {
    const size_t nEnd = strText.substr(0, 1) == "." ? SkipDigits(strText, 1) : 0;
    return nEnd > 1 && IsPower(strText.substr(nEnd));
}

}  // namespace

bool ToReal(std::string_view strNumber, double& dReal) {
    if (strNumber == "1e999" || strNumber == "-1e999") {
        dReal = strNumber[0] == '-' ? -HUGE_VAL : HUGE_VAL;
        return true;
    }
    return Converts(strNumber, dReal);
}

Value JsonNumber(std::string_view strNumber) {
    Value Found;
    Found.strText = strNumber;
    if (Converts(strNumber, Found.nInteger) && strNumber != "-0") {
        Found.eKind = Value::Kind::kInteger;
    } else {
        const bool blWhole =
            strNumber != "-0" && strNumber.find_first_of(".eE") == std::string_view::npos;
        Found.eKind =
            !blWhole && ToReal(strNumber, Found.dReal) ? Value::Kind::kReal : Value::Kind::kWide;
    }
    return Found;
}

Value CellNumber(std::string_view strCell) {
    Value Found;
    Found.eKind = Value::Kind::kText;
    Found.strText = strCell;
    const size_t nInteger = IntegerLength(strCell);
    if (nInteger == 0 || strCell == "-0") {
        return Found;
    }
    if (nInteger == strCell.size()) {
        const bool blFits = Converts(strCell, Found.nInteger);
        Found.eKind = blFits ? Value::Kind::kInteger : Value::Kind::kWide;
    } else if (IsFraction(strCell.substr(nInteger)) && ToReal(strCell, Found.dReal)) {
        Found.eKind = Value::Kind::kReal;
    }
    return Found;
}

bool IsJsonNumber(std::string_view strText) {
    const size_t nInteger = IntegerLength(strText);
    const std::string_view strRest = strText.substr(nInteger);
    return nInteger > 0 && (IsPower(strRest) || IsFraction(strRest));
}

bool MayBeRounded(double dReal) {
    return std::fabs(dReal) >= static_cast<double>(kMostExact) && std::fabs(dReal) < 0x1p63;
}

bool IsTooWide(std::string_view strNumber) {
    std::int64_t nSigned = 0;
    std::uint64_t nUnsigned = 0;
    return !strNumber.empty() && IntegerLength(strNumber) == strNumber.size() &&
           !Converts(strNumber, nSigned) && !Converts(strNumber, nUnsigned);
}

// Blanks around it, a plus and a point at either end do not matter.
bool IsNumberToSqlite(std::string_view strText) {
    constexpr char kBlanks[] = " \t\n\v\f\r";
    const size_t nBegin = strText.find_first_not_of(kBlanks);
    if (nBegin == std::string_view::npos) {
        return false;
    }
    const size_t nEnd = strText.find_last_not_of(kBlanks) + 1;
    const std::string strNumber(strText.substr(nBegin, nEnd - nBegin));
    char* pRead = nullptr;
    static_cast<void>(std::strtod(strNumber.c_str(), &pRead));
    // The words for infinity and the hexadecimal numbers of C are texts to SQLite.
    return pRead == strNumber.data() + strNumber.size() &&
           strNumber.find_first_not_of("+-.0123456789eE") == std::string::npos;
}

}  // namespace VORN_JSON_DB::Cli
