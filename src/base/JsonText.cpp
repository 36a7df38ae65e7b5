#include "JsonText.h"

#include <algorithm>
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

// How many brackets are open at once; what looks like one inside a quoted text is left out.
size_t DeepestLevel(const char* pText, const char* pEnd) {
    size_t nOpen = 0;
    size_t nDeepest = 0;
    bool blQuoted = false;
    for (; pText != pEnd; ++pText) {
        if (blQuoted && *pText == '\\' && pText + 1 != pEnd) {
            ++pText;
        } else if (*pText == '"') {
            blQuoted = !blQuoted;
        } else if (!blQuoted && (*pText == '[' || *pText == '{')) {
            nDeepest = std::max(nDeepest, ++nOpen);
        } else if (!blQuoted && (*pText == ']' || *pText == '}') && nOpen > 0) {
            --nOpen;
        }
    }
    return nDeepest;
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
        m_nMaxLevels = Builder["stackLimit"].asUInt();
        m_pReader.reset(Builder.newCharReader());
    }
    const char* pEnd = szText + nLength;
    try {
        return m_pReader->parse(szText, pEnd, &jOut, nullptr);
    } catch (const Json::RuntimeError&) {
        // The same exception tells of too many levels and of a malloc that gave nothing.
        if (DeepestLevel(szText, pEnd) < m_nMaxLevels) {
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
