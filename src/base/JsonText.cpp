#include "JsonText.h"

#include <cstring>
#include <new>
#include <sstream>

#include "PlainJson.h"

namespace vornjsondb {

namespace {

std::unique_ptr<Json::StreamWriter> MakeWriter() {
    Json::StreamWriterBuilder Builder;
    Builder["indentation"] = "";
    Builder["commentStyle"] = "None";
    Builder["emitUTF8"] = true;
    return std::unique_ptr<Json::StreamWriter>(Builder.newStreamWriter());
}

// JsonCpp reports by one exception that there are too many levels and that a malloc gave nothing.
bool IsTooDeep(const Json::RuntimeError& Error) {
    return std::strstr(Error.what(), "stackLimit") != nullptr;
}

// Never freed: a host's own statics may use the library when this one's would be gone.
JsonCodec& ProcessCodec() {
    static JsonCodec& s_Codec = *new JsonCodec;
    return s_Codec;
}

}  // namespace

std::string JsonCodec::Write(const Json::Value& jValue) {
    std::string strText;
    if (WritePlainJson(jValue, strText)) {
        return strText;
    }
    if (!m_pWriter) {
        m_pWriter = MakeWriter();
    }
    std::ostringstream Stream;
    // Without this a stream swallows std::bad_alloc and the text is silently cut.
    Stream.exceptions(std::ios::badbit | std::ios::failbit);
    m_pWriter->write(jValue, &Stream);
    return Stream.str();
}

bool JsonCodec::Read(const char* szText, size_t nLength, Json::Value& jOut) {
    Json::Value jRead;
    if (ReadPlainJson(szText, nLength, jRead)) {
        jOut.swapPayload(jRead);
        return true;
    }
    if (!m_pReader) {
        Json::CharReaderBuilder Builder;
        Builder["collectComments"] = false;
        m_pReader.reset(Builder.newCharReader());
    }
    try {
        return m_pReader->parse(szText, szText + nLength, &jOut, nullptr);
    } catch (const Json::RuntimeError& Error) {
        if (!IsTooDeep(Error)) {
            throw std::bad_alloc();
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
