#include "JsonText.h"

#include <cstring>
#include <sstream>

#include "JsonMemory.h"
#include "PlainJson.h"

namespace vornjsondb {

namespace {

Json::StreamWriter* NewWriter() {
    Json::StreamWriterBuilder Builder;
    Builder.settings_["indentation"] = "";
    Builder.settings_["commentStyle"] = "None";
    Builder.settings_["emitUTF8"] = true;
    return Builder.newStreamWriter();
}

Json::CharReader* NewReader() {
    Json::CharReaderBuilder Builder;
    Builder.settings_["collectComments"] = false;
    return Builder.newCharReader();
}

// JsonCpp reports by one exception that there are too many levels and that a malloc gave nothing.
bool IsTooDeep(const Json::RuntimeError& Error) {
    // mutate(cut): a part of the word is found, too.
    return std::strstr(Error.what(), "stackLimit") != nullptr;
}

// Never freed: a host's own statics may use the library when this one's would be gone.
JsonCodec& ProcessCodec() {
    static JsonCodec& s_Codec = *new JsonCodec;
    return s_Codec;
}

}  // namespace

std::string JsonCodec::Write(const Json::Value& jValue) {
    TextBuffer Text;
    if (WritePlainJson(jValue, Text)) {  // mutate(false): the longer way gives the same.
        return std::string(Text.View());
    }
    std::ostringstream Stream;
    // Without this a stream swallows std::bad_alloc and the text is silently cut.
    Stream.exceptions(std::ios::badbit | std::ios::failbit);
    if (!m_pWriter) {
        m_pWriter.reset(NewWriter());
    }
    m_pWriter->write(jValue, &Stream);
    return Stream.str();
}

bool JsonCodec::Read(const char* szText, size_t nLength, Json::Value& jOut) {
    // mutate(false, exchanged): the longer way gives the same.
    if (ReadPlainJson(szText, nLength, jOut)) {
        return true;
    }
    try {
        // mutate(true, sunk, hoisted): one that is made for each text reads the same.
        if (!m_pReader) {
            m_pReader.reset(NewReader());
        }
        return m_pReader->parse(szText, szText + nLength, &jOut, nullptr);
    } catch (const Json::RuntimeError& Error) {
        if (!IsTooDeep(Error)) {
            ThrowBadAlloc();
        }
        return false;
    }
}

std::string ToString(const Json::Value& jValue) {
    return ProcessCodec().Write(jValue);
}

void FromString(const char* szText, Json::Value& jOut) {
    ProcessCodec().Read(szText, std::strlen(szText), jOut);
}

}  // namespace vornjsondb
