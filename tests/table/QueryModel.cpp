#include "QueryModel.h"

#include <algorithm>
#include <cstdint>

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

// A value as conditions see it. In this order values of different kinds are sorted.
struct Seen {
    enum class Kind { kNull, kNumber, kText };
    Kind eKind = Kind::kNull;
    std::string strJsonKind;  // inside of JSON: what else must be equal
    bool blReal = false;
    std::int64_t nValue = 0;
    double dValue = 0;
    std::string strText;
};

Seen OfText(const std::string& strText) {
    Seen Out;
    Out.eKind = Seen::Kind::kText;
    Out.strText = strText;
    return Out;
}

Seen OfNumber(const Json::Value& jValue, bool blReal) {
    Seen Out;
    Out.eKind = Seen::Kind::kNumber;
    Out.blReal = blReal || !jValue.isInt64() || jValue.type() == Json::realValue;
    if (Out.blReal) {
        Out.dValue = jValue.asDouble();
    } else {
        Out.nValue = jValue.asInt64();
    }
    return Out;
}

Seen OfColumn(const std::string& strType, const Json::Value& jValue) {
    if (jValue.isNull()) {
        return Seen();
    }
    if (strType.compare(0, 6, "Json::") == 0) {
        return OfText(Text(jValue));
    }
    if (jValue.isBool()) {
        return OfNumber(Json::Value(jValue.asBool() ? 1 : 0), false);
    }
    return jValue.isString() ? OfText(jValue.asString())
                             : OfNumber(jValue, strType == "double" || strType == "float");
}

Seen OfJson(const Json::Value& jValue) {
    Seen Out;
    if (jValue.isNull()) {
        return Out;
    }
    if (jValue.isBool()) {
        Out = OfNumber(Json::Value(jValue.asBool() ? 1 : 0), false);
        Out.strJsonKind = "flag";
    } else if (jValue.isString()) {
        Out = OfText(jValue.asString());
        Out.strJsonKind = "text";
    } else if (jValue.isNumeric()) {
        Out = OfNumber(jValue, false);
        Out.strJsonKind = "number";
    } else {
        Out = OfText(Text(jValue));
        Out.strJsonKind = jValue.isArray() ? "list" : "object";
    }
    return Out;
}

int CompareMixed(std::int64_t nLeft, double dRight) {
    if (dRight >= 9223372036854775808.0) {
        return -1;
    }
    if (dRight < -9223372036854775808.0) {
        return 1;
    }
    const auto nWhole = static_cast<std::int64_t>(dRight);
    if (nLeft != nWhole) {
        return nLeft < nWhole ? -1 : 1;
    }
    const double dRest = dRight - static_cast<double>(nWhole);
    return dRest > 0 ? -1 : (dRest < 0 ? 1 : 0);
}

template <typename Value>
int CompareValues(const Value& Left, const Value& Right) {
    return Left < Right ? -1 : (Right < Left ? 1 : 0);
}

int Compare(const Seen& Left, const Seen& Right) {
    if (Left.eKind != Right.eKind || Left.eKind == Seen::Kind::kNull) {
        return CompareValues(Left.eKind, Right.eKind);
    }
    if (Left.eKind == Seen::Kind::kText) {
        return CompareValues(Left.strText, Right.strText);
    }
    if (Left.blReal && Right.blReal) {
        return CompareValues(Left.dValue, Right.dValue);
    }
    if (!Left.blReal && !Right.blReal) {
        return CompareValues(Left.nValue, Right.nValue);
    }
    return Left.blReal ? -CompareMixed(Right.nValue, Left.dValue)
                       : CompareMixed(Left.nValue, Right.dValue);
}

bool Comparable(const Seen& Left, const Seen& Right) {
    return Left.eKind == Right.eKind && Left.strJsonKind == Right.strJsonKind;
}

bool Equal(const Seen& Left, const Seen& Right) {
    return Comparable(Left, Right) && Compare(Left, Right) == 0;
}

// Characters as SQLite's LIKE reads them: up to the first NUL, ASCII letters as small ones, and one
// character for all that are no UTF-8.
std::vector<unsigned> Characters(const std::string& strText) {
    std::vector<unsigned> vecCharacters;
    const std::string strCut = strText.c_str();
    for (size_t i = 0; i < strCut.size();) {
        auto nCharacter = static_cast<unsigned>(static_cast<unsigned char>(strCut[i++]));
        if (nCharacter >= 0xc0) {
            nCharacter &= nCharacter < 0xe0 ? 0x1fU : (nCharacter < 0xf0 ? 0x0fU : 0x07U);
            for (; i < strCut.size() && (static_cast<unsigned char>(strCut[i]) & 0xc0U) == 0x80;
                 ++i) {
                nCharacter = (nCharacter << 6U) + (static_cast<unsigned char>(strCut[i]) & 0x3fU);
            }
            if (nCharacter < 0x80 || (nCharacter & 0xfffff800U) == 0xd800 ||
                (nCharacter & 0xfffffffeU) == 0xfffe) {
                nCharacter = 0xfffd;
            }
        } else if (nCharacter >= 'A' && nCharacter <= 'Z') {
            nCharacter += 'a' - 'A';
        }
        vecCharacters.push_back(nCharacter);
    }
    return vecCharacters;
}

bool Like(const std::vector<unsigned>& vecPattern, size_t nPattern,
          const std::vector<unsigned>& vecText, size_t nText) {
    if (nPattern == vecPattern.size()) {
        return nText == vecText.size();
    }
    if (vecPattern[nPattern] == '%') {
        return Like(vecPattern, nPattern + 1, vecText, nText) ||
               (nText < vecText.size() && Like(vecPattern, nPattern, vecText, nText + 1));
    }
    if (nText == vecText.size()) {
        return false;
    }
    if (vecPattern[nPattern] == '_') {
        return Like(vecPattern, nPattern + 1, vecText, nText + 1);
    }
    const size_t nEscape = vecPattern[nPattern] == '\\' ? 1 : 0;
    return vecPattern[nPattern + nEscape] == vecText[nText] &&
           Like(vecPattern, nPattern + nEscape + 1, vecText, nText + 1);
}

// What a path leads to; null for nothing.
Json::Value Follow(const Json::Value& jFrom, const std::string& strSteps) {
    Json::Value jNow = jFrom;
    for (size_t i = 0; i < strSteps.size();) {
        const size_t nEnd = std::min(strSteps.find_first_of(".[", i + 1), strSteps.size());
        const std::string strStep = strSteps.substr(i + 1, nEnd - i - 1);
        if (strSteps[i] == '.') {
            jNow = jNow.isObject() && jNow.isMember(strStep) ? Json::Value(jNow[strStep])
                                                             : Json::Value();
        } else {
            const auto nIndex = static_cast<Json::ArrayIndex>(std::stoul(strStep));
            jNow =
                jNow.isArray() && nIndex < jNow.size() ? Json::Value(jNow[nIndex]) : Json::Value();
        }
        i = nEnd;
    }
    return jNow;
}

struct Found {
    Json::Value jValue;
    std::string strType;  // empty: inside of JSON

    Seen See(const Json::Value& jOf) const {
        return strType.empty() ? OfJson(jOf) : OfColumn(strType, jOf);
    }
};

// Where the member's name ends in that of a place; npos: there is no such member.
size_t EndOfMember(const QueryModel& Model, const std::string& strName) {
    size_t nEnd = strName.size();
    while (nEnd != std::string::npos && Model.mapTypes.count(strName.substr(0, nEnd)) == 0) {
        nEnd = nEnd > 0 ? strName.find_last_of(".[", nEnd - 1) : std::string::npos;
    }
    return nEnd;
}

Found Find(const QueryModel& Model, const std::string& strName, const Json::Value& jRecord) {
    const size_t nEnd = EndOfMember(Model, strName);
    const std::string strMember = strName.substr(0, nEnd);
    if (nEnd == strName.size()) {
        return Found{jRecord[strMember], Model.mapTypes.at(strMember)};
    }
    return Found{Follow(jRecord[strMember], strName.substr(nEnd)), ""};
}

bool HoldsOne(const std::string& strOp, const Json::Value& jOperand, const Found& What) {
    const Seen Value = What.See(What.jValue);
    const auto EqualsIt = [&](const Json::Value& jOne) { return Equal(Value, What.See(jOne)); };
    const auto IsIn = [&] { return std::any_of(jOperand.begin(), jOperand.end(), EqualsIt); };
    if (strOp == "$eq" || strOp == "$ne") {
        return EqualsIt(jOperand) == (strOp == "$eq");
    }
    if (strOp == "$in" || strOp == "$nin") {
        return IsIn() == (strOp == "$in");
    }
    if (strOp == "$null") {
        return What.jValue.isNull() == jOperand.asBool();
    }
    if (strOp == "$contains") {
        return What.jValue.isArray() &&
               std::any_of(What.jValue.begin(), What.jValue.end(), [&](const Json::Value& jOne) {
                   return Equal(OfJson(jOne), OfJson(jOperand));
               });
    }
    if (strOp == "$like" || strOp == "$prefix") {
        const bool blText = Comparable(Value, What.See(jOperand)) && What.jValue.isString();
        const std::string strOperand = jOperand.asString();
        return blText &&
               (strOp == "$like" ? Like(Characters(strOperand), 0, Characters(Value.strText), 0)
                                 : Value.strText.compare(0, strOperand.size(), strOperand) == 0);
    }
    if (strOp == "$between") {
        return HoldsOne("$gte", jOperand[0], What) && HoldsOne("$lte", jOperand[1], What);
    }
    const Seen Operand = What.See(jOperand);
    if (!Comparable(Value, Operand)) {
        return false;
    }
    const int nOrder = Compare(Value, Operand);
    return strOp == "$lt"
               ? nOrder < 0
               : (strOp == "$lte" ? nOrder <= 0 : (strOp == "$gt" ? nOrder > 0 : nOrder >= 0));
}

bool HoldAll(const Json::Value& jOperators, const Found& What) {
    for (const std::string& strOp : jOperators.getMemberNames()) {
        const Json::Value& jOperand = jOperators[strOp];
        if (strOp == "$not" ? HoldAll(jOperand, What) : !HoldsOne(strOp, jOperand, What)) {
            return false;
        }
    }
    return true;
}

}  // namespace

bool QueryModel::Holds(const Json::Value& jWhere, const Json::Value& jRecord) const {
    const auto HoldsIt = [&](const Json::Value& jOne) { return Holds(jOne, jRecord); };
    for (const std::string& strKey : jWhere.getMemberNames()) {
        const Json::Value& jValue = jWhere[strKey];
        bool blHolds = false;
        if (strKey == "$and") {
            blHolds = std::all_of(jValue.begin(), jValue.end(), HoldsIt);
        } else if (strKey == "$or") {
            blHolds = std::any_of(jValue.begin(), jValue.end(), HoldsIt);
        } else if (strKey == "$not") {
            blHolds = !HoldsIt(jValue);
        } else {
            const bool blOperators = jValue.isObject() && !jValue.empty() &&
                                     jValue.getMemberNames()[0].compare(0, 1, "$") == 0;
            const Found What = Find(*this, strKey, jRecord);
            blHolds = blOperators ? HoldAll(jValue, What) : HoldsOne("$eq", jValue, What);
        }
        if (!blHolds) {
            return false;
        }
    }
    return true;
}

std::vector<int> QueryModel::Select(const Json::Value& jQuery) const {
    std::vector<Json::Value> vecFound;
    std::copy_if(vecRecords.begin(), vecRecords.end(), std::back_inserter(vecFound),
                 [&](const Json::Value& jRecord) { return Holds(jQuery["where"], jRecord); });
    const auto IsBefore = [&](const Json::Value& jLeft, const Json::Value& jRight) {
        for (const Json::Value& jTerm : jQuery["sort"]) {
            const std::string strTerm = jTerm.asString();
            const bool blDescending = EndOfMember(*this, strTerm) == std::string::npos;
            const Found Left = Find(*this, strTerm.substr(blDescending ? 1 : 0), jLeft);
            const Found Right = Find(*this, strTerm.substr(blDescending ? 1 : 0), jRight);
            const int nOrder = Compare(Left.See(Left.jValue), Right.See(Right.jValue));
            if (nOrder != 0) {
                return (nOrder < 0) != blDescending;
            }
        }
        return jLeft["id"].asInt() < jRight["id"].asInt();
    };
    std::sort(vecFound.begin(), vecFound.end(), IsBefore);
    std::vector<int> vecIds;
    for (const Json::Value& jRecord : vecFound) {
        vecIds.push_back(jRecord["id"].asInt());
    }
    const size_t nOffset = std::min<size_t>(jQuery.get("offset", 0).asUInt(), vecIds.size());
    vecIds.erase(vecIds.begin(), vecIds.begin() + static_cast<std::ptrdiff_t>(nOffset));
    vecIds.resize(std::min<size_t>(vecIds.size(), jQuery.get("limit", 1000000).asUInt()));
    return vecIds;
}

}  // namespace VORN_JSON_DB
