#include "Operators.h"

#include <iterator>
#include <vector>

#include "Concat.h"
#include "Nearest.h"

namespace vornjsondb {

namespace {

using VORN_JSON_DB::Op;

constexpr unsigned kEvery = ~0U;
constexpr unsigned kTexts = BitOf(BoundKind::kText) | BitOf(BoundKind::kAny) | kPathBit;
constexpr unsigned kOrdered = kTexts | BitOf(BoundKind::kInteger) | BitOf(BoundKind::kReal);
constexpr unsigned kLists = BitOf(BoundKind::kList) | BitOf(BoundKind::kJson) | kPathBit;

// In the order of Op.
// clang-format off
constexpr Operator kOperators[] = {
    {Op::kEqual,          "$eq",       OperandForm::kValue,   kEvery,   " IS ",     nullptr, nullptr},
    {Op::kNotEqual,       "$ne",       OperandForm::kValue,   kEvery,   " IS NOT ", nullptr, nullptr},
    {Op::kLess,           "$lt",       OperandForm::kOrdered, kOrdered, " < ",      nullptr, " >= ''"},
    {Op::kLessOrEqual,    "$lte",      OperandForm::kOrdered, kOrdered, " <= ",     nullptr, " >= ''"},
    {Op::kGreater,        "$gt",       OperandForm::kOrdered, kOrdered, " > ",      " < ''", " < x''"},
    {Op::kGreaterOrEqual, "$gte",      OperandForm::kOrdered, kOrdered, " >= ",     " < ''", " < x''"},
    {Op::kBetween,        "$between",  OperandForm::kPair,    kOrdered, "",         nullptr, nullptr},
    {Op::kIn,             "$in",       OperandForm::kList,    kEvery,   "",         nullptr, nullptr},
    {Op::kNotIn,          "$nin",      OperandForm::kList,    kEvery,   "",         nullptr, nullptr},
    {Op::kLike,           "$like",     OperandForm::kText,    kTexts,   "",         nullptr, nullptr},
    {Op::kPrefix,         "$prefix",   OperandForm::kText,    kTexts,   "",         nullptr, nullptr},
    {Op::kNull,           "$null",     OperandForm::kFlag,    kEvery,   "",         nullptr, nullptr},
    {Op::kContains,       "$contains", OperandForm::kElement, kLists,   "",         nullptr, nullptr},
};
// clang-format on

constexpr bool AreInOrder() {
    for (size_t i = 0; i < std::size(kOperators); ++i) {
        if (static_cast<size_t>(kOperators[i].eOp) != i) {
            return false;
        }
    }
    return std::size(kOperators) == static_cast<size_t>(Op::kContains) + 1;
}
static_assert(AreInOrder(), "RowOf takes the operator for the row's number");

// What people know from elsewhere.
constexpr const char* kForeign[][2] = {
    {"$regex", "$like\" or \"$prefix"},
    {"$exists", "$null"},
    {"$elemMatch", "$contains"},
    {"$all", "$contains"},
    {"$nor", "$not"},
    {"$startsWith", "$prefix"},
};

}  // namespace

bool IsOperator(Op eOp) {
    return static_cast<size_t>(eOp) < std::size(kOperators);
}

const Operator& RowOf(Op eOp) {
    return kOperators[static_cast<size_t>(eOp)];
}

const Operator* FindOperator(std::string_view strName) {
    for (const Operator& Row : kOperators) {
        if (strName == Row.szName) {
            return &Row;
        }
    }
    return nullptr;
}

std::string OperatorSuggestion(std::string_view strName) {
    for (const auto& szPair : kForeign) {
        if (strName == szPair[0]) {
            return Concat({" (did you mean \"", szPair[1], "\"?)"});
        }
    }
    std::vector<std::string> vecNames;
    for (const char* szName : {"$and", "$or", "$not"}) {
        AddText(vecNames, szName);
    }
    for (const Operator& Row : kOperators) {
        AddText(vecNames, Row.szName);
    }
    return Suggestion(strName, vecNames);
}

const char* Expected(OperandForm eForm) {
    switch (eForm) {
        case OperandForm::kOrdered:
            return "a text or a number";
        case OperandForm::kPair:
            return "a list of two texts or of two numbers";
        case OperandForm::kList:
            return "a list of values";
        case OperandForm::kText:
            return "a text";
        default:
            return "true or false";
    }
}

}  // namespace vornjsondb
