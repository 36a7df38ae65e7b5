#include "JsonValues.h"

#include <cstring>
#include <string>

#include "HostileValue.h"

namespace fuzzhost {

namespace {

bool SameComments(const Json::Value& jLeft, const Json::Value& jRight) {
    for (int i = 0; i < Json::numberOfCommentPlacement; ++i) {
        const auto ePlace = static_cast<Json::CommentPlacement>(i);
        if (jLeft.getComment(ePlace) != jRight.getComment(ePlace)) {
            return false;
        }
    }
    return true;
}

// The elements that are there, and where they are.
bool SameChildren(const Json::Value& jLeft, const Json::Value& jRight) {
    Json::Value::const_iterator itRight = jRight.begin();
    for (Json::Value::const_iterator it = jLeft.begin(); it != jLeft.end(); ++it, ++itRight) {
        if (itRight == jRight.end() || it.index() != itRight.index() ||
            it.name() != itRight.name() || !Same(*it, *itRight)) {
            return false;
        }
    }
    return itRight == jRight.end();
}

}  // namespace

bool IsHostile(const uint8_t* pData, size_t nSize) {
    return nSize > 0 && pData[0] == 0;
}

bool TakeValue(const uint8_t* pData, size_t nSize, Json::Value& jOut) {
    if (IsHostile(pData, nSize)) {
        jOut = HostileValue(pData + 1, nSize - 1);
        return true;
    }
    return jsonhelpers::Parse(std::string(reinterpret_cast<const char*>(pData), nSize), jOut);
}

Json::Value WithoutHoles(const Json::Value& jValue) {
    if (!jValue.isArray() && !jValue.isObject()) {
        return jValue;
    }
    Json::Value jFilled(jValue.type());
    for (Json::ArrayIndex i = 0; jValue.isArray() && i < jValue.size(); ++i) {
        jFilled.append(WithoutHoles(jValue[i]));
    }
    for (Json::Value::const_iterator it = jValue.begin(); jValue.isObject() && it != jValue.end();
         ++it) {
        jFilled[it.name()] = WithoutHoles(*it);
    }
    return jFilled;
}

bool Same(const Json::Value& jLeft, const Json::Value& jRight) {
    if (jLeft.type() != jRight.type() || !SameComments(jLeft, jRight)) {
        return false;
    }
    switch (jLeft.type()) {
        case Json::realValue: {
            const double dLeft = jLeft.asDouble();
            const double dRight = jRight.asDouble();
            return std::memcmp(&dLeft, &dRight, sizeof(dLeft)) == 0;
        }
        case Json::arrayValue:
        case Json::objectValue:
            return SameChildren(jLeft, jRight);
        default:
            return jLeft == jRight;
    }
}

}  // namespace fuzzhost
