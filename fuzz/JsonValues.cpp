#include "JsonValues.h"

#include <cstring>
#include <memory>
#include <sstream>

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

// The strict JSON of an input; false when it is none.
bool Parse(const std::string& strText, Json::Value& jOut) {
    static const std::unique_ptr<Json::CharReader> s_pReader = [] {
        Json::CharReaderBuilder Builder;
        Json::CharReaderBuilder::strictMode(&Builder.settings_);
        Builder["strictRoot"] = false;
        // Twin keys stop the reader in strict mode, and are worth a try here.
        Builder["rejectDupKeys"] = false;
        return std::unique_ptr<Json::CharReader>(Builder.newCharReader());
    }();
    try {
        return s_pReader->parse(strText.data(), strText.data() + strText.size(), &jOut, nullptr);
    } catch (const Json::Exception&) {
        return false;
    }
}

}  // namespace

Json::Value ReadLeniently(const char* szText) {
    static const std::unique_ptr<Json::CharReader> s_pReader = [] {
        Json::CharReaderBuilder Builder;
        Builder["collectComments"] = false;
        return std::unique_ptr<Json::CharReader>(Builder.newCharReader());
    }();
    Json::Value jResult;
    try {
        s_pReader->parse(szText, szText + std::strlen(szText), &jResult, nullptr);
    } catch (const Json::RuntimeError&) {
        // Nested too deep: what was read up to there stays.
    }
    return jResult;
}

std::string Compact(const Json::Value& jValue) {
    static const std::unique_ptr<Json::StreamWriter> s_pWriter = [] {
        Json::StreamWriterBuilder Builder;
        Builder["indentation"] = "";
        Builder["commentStyle"] = "None";
        Builder["emitUTF8"] = true;
        return std::unique_ptr<Json::StreamWriter>(Builder.newStreamWriter());
    }();
    std::ostringstream Stream;
    s_pWriter->write(jValue, &Stream);
    return Stream.str();
}

Json::Value Definition(const std::string& strTable, const std::string& strMembers) {
    Json::Value jDefinition;
    std::istringstream Stream(strMembers);
    for (std::string strOne; std::getline(Stream, strOne, ',');) {
        // The type may hold colons, a name does not.
        const size_t nColon = strOne.find(':');
        jDefinition[strTable]["member"][strOne.substr(0, nColon)]["cpptype"] =
            strOne.substr(nColon + 1);
    }
    return jDefinition;
}

bool IsHostile(const uint8_t* pData, size_t nSize) {
    return nSize > 0 && pData[0] == 0;
}

bool TakeValue(const uint8_t* pData, size_t nSize, Json::Value& jOut) {
    if (IsHostile(pData, nSize)) {
        jOut = HostileValue(pData + 1, nSize - 1);
        return true;
    }
    return Parse(std::string(reinterpret_cast<const char*>(pData), nSize), jOut);
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
