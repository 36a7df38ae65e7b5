#include "JsonHelpers.h"

#include <sstream>

namespace jsonhelpers {

bool Parse(const std::string& strText, Json::Value& jOut) {
    static const std::unique_ptr<Json::CharReader> s_pReader = [] {
        Json::CharReaderBuilder builder;
        Json::CharReaderBuilder::strictMode(&builder.settings_);
        builder["strictRoot"] = false;
        builder["rejectDupKeys"] = false;
        return std::unique_ptr<Json::CharReader>(builder.newCharReader());
    }();
    try {
        return s_pReader->parse(strText.data(), strText.data() + strText.size(), &jOut, nullptr);
    } catch (const Json::Exception&) {
        return false;
    }
}

Json::Value ReadLeniently(const std::string& strText) {
    static const std::unique_ptr<Json::CharReader> s_pReader = [] {
        Json::CharReaderBuilder builder;
        builder["collectComments"] = false;
        return std::unique_ptr<Json::CharReader>(builder.newCharReader());
    }();
    Json::Value jRead;
    try {
        s_pReader->parse(strText.data(), strText.data() + strText.size(), &jRead, nullptr);
    } catch (const Json::RuntimeError&) {
        // Too many levels: what was read up to there stays.
    }
    return jRead;
}

std::string Compact(const Json::Value& jValue) {
    static const std::unique_ptr<Json::StreamWriter> s_pWriter = [] {
        Json::StreamWriterBuilder builder;
        builder["indentation"] = "";
        builder["commentStyle"] = "None";
        builder["emitUTF8"] = true;
        return std::unique_ptr<Json::StreamWriter>(builder.newStreamWriter());
    }();
    std::ostringstream stream;
    s_pWriter->write(jValue, &stream);
    return stream.str();
}

std::string KindsOf(const Json::Value& jValue) {
    std::string strKinds = std::to_string(jValue.type());
    for (const Json::Value& jChild : jValue) {
        strKinds += "(" + KindsOf(jChild) + ")";
    }
    return strKinds;
}

Json::Value Definition(const std::string& strTable, const std::string& strMembers) {
    Json::Value jDefinition(Json::objectValue);
    Json::Value& jMember = jDefinition[strTable]["member"] = Json::Value(Json::objectValue);
    std::istringstream stream(strMembers);
    for (std::string strOne; std::getline(stream, strOne, ',');) {
        // A type may hold colons, a name does not.
        const size_t nColon = strOne.find(':');
        jMember[strOne.substr(0, nColon)]["cpptype"] = strOne.substr(nColon + 1);
    }
    return jDefinition;
}

std::unique_ptr<VornJsonDbApi> NewHandle(sqlite3* pDb, std::string strName, Json::Value jTableDef,
                                         std::string strSqlCreate) {
    return std::make_unique<VornJsonDbApi>(pDb, strName, jTableDef, strSqlCreate);
}

}  // namespace jsonhelpers
