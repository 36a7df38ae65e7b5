#include "Operand.h"

#include <iterator>
#include <utility>

#include "../src/base/JsonMember.h"
#include "Concat.h"

namespace vornjsondb {

namespace {

struct MisfitRow {
    Misfit eMisfit;
    FindingCode eCode;
    const char* szReason;
};
constexpr MisfitRow kMisfits[] = {
    {Misfit::kRange, FindingCode::kOutOfRange, "is beyond its range"},
    {Misfit::kNotANumber, FindingCode::kNotANumber, "is no number"},
    {Misfit::kInfinite, FindingCode::kNotANumber, "is or holds an infinity, which JSON cannot"},
    {Misfit::kDepth, FindingCode::kNestedTooDeep, "is nested too deep"},
    {Misfit::kKind, FindingCode::kWrongKind, "is no value of it"},
};

bool RefuseMisfit(Misfit eMisfit, std::string_view strOf, const Json::Value& jValue, Problem& Why) {
    const MisfitRow* pRow = std::begin(kMisfits);
    while (pRow->eMisfit != eMisfit) {
        ++pRow;
    }
    return Why.Tell(pRow->eCode, Concat({strOf, ": ", Shown(jValue), " ", pRow->szReason}));
}

ValueKind KindOf(const BoundValue& Value) {
    switch (Value.eKind) {
        case BoundValue::Kind::kNull:
            return ValueKind::kNull;
        case BoundValue::Kind::kText:
            return ValueKind::kText;
        default:
            return ValueKind::kNumber;
    }
}

}  // namespace

bool OperandReader::Read(const Place& Where, const Json::Value& jValue, Operand& Out,
                         Problem& Why) {
    return Where.strPath.empty() ? ReadColumn(m_Of.At(Where.nMember), jValue, Out, Why)
                                 : ReadJson(jValue, Out, Why);
}

bool OperandReader::ReadColumn(const Member& Of, const Json::Value& jValue, Operand& Out,
                               Problem& Why) {
    std::string strJson;
    const Misfit eMisfit = FitJson(*Of.pType, jValue, false, m_Codec, strJson, Out.Value);
    // mutate(hoisted): the value of what is refused is not used.
    if (eMisfit == Misfit::kNone) {
        // mutate(exchanged): a text is one wherever it is kept.
        if (!strJson.empty()) {
            Out.Value = Keep(std::move(strJson));
        }
        Out.eKind = KindOf(Out.Value);
        return true;
    }
    const std::string strMember = Concat({"member ", Quoted(Of.strName)});
    if (eMisfit == Misfit::kKind && Of.Kind() == BoundKind::kList) {
        return Why.Tell(FindingCode::kListMember,
                        Concat({strMember, " is a list, and ", Shown(jValue), " is none"}));
    }
    if (eMisfit == Misfit::kKind) {
        return Why.Tell(FindingCode::kWrongKind,
                        Concat({strMember, " is ", Expected(*Of.pType), ", not ", Shown(jValue)}));
    }
    return RefuseMisfit(eMisfit, strMember, jValue, Why);
}

bool OperandReader::ReadJson(const Json::Value& jValue, Operand& Out, Problem& Why) {
    static constexpr char kAnyJson[] = "Json::Value";
    // mutate(hoisted, exchanged): no value is of two kinds, and what follows gives its own.
    if (jValue.isNull()) {
        Out.eKind = ValueKind::kNull;  // mutate(dropped): a new one is of this kind.
        return true;
    }
    // mutate(exchanged): no value is of two kinds.
    if (jValue.isBool()) {
        Out.eKind = jValue.asBool() ? ValueKind::kTrue : ValueKind::kFalse;
        return true;
    }
    // mutate(hoisted, exchanged): no value is of two kinds, and what follows gives its own.
    if (jValue.isString()) {
        Out.eKind = ValueKind::kText;
        Out.Value = BoundText(BytesOf(jValue));
        if (Out.Value.strBytes.find('\0') != std::string_view::npos) {
            return Why.Tell(
                FindingCode::kNulInJson,
                Concat({"JSON: ", Shown(jValue), " holds a NUL byte, where SQLite may end it"}));
        }
        return true;
    }
    Out.eKind = jValue.isArray() ? ValueKind::kList
                                 : (jValue.isObject() ? ValueKind::kObject : ValueKind::kNumber);
    // mutate(hoisted): what follows gives its own.
    if (jValue.type() != Json::realValue && jValue.isInt64()) {
        Out.Value.eKind = BoundValue::Kind::kInteger;
        Out.Value.nValue = jValue.asInt64();
        return true;
    }
    std::string strJson;
    const MemberType& Any = FindMemberType(std::begin(kAnyJson), std::end(kAnyJson) - 1);
    const Misfit eMisfit = FitJson(Any, jValue, false, m_Codec, strJson, Out.Value);
    // mutate(exchanged): the value of what is refused is not used.
    if (eMisfit != Misfit::kNone) {
        return RefuseMisfit(eMisfit, "JSON", jValue, Why);
    }
    Out.Value = Keep(std::move(strJson));
    return true;
}

BoundValue OperandReader::Keep(std::string strText) {
    m_listTexts.push_front(std::move(strText));
    return BoundText(m_listTexts.front());
}

BoundValue BoundText(std::string_view strText) {
    BoundValue Text;
    Text.eKind = BoundValue::Kind::kText;
    Text.strBytes = strText;
    return Text;
}

}  // namespace vornjsondb
