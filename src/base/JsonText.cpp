#include "JsonText.h"

#include <cstring>
#include <memory>
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

std::unique_ptr<Json::CharReader> MakeReader() {
    Json::CharReaderBuilder Builder;
    Builder["collectComments"] = false;
    return std::unique_ptr<Json::CharReader>(Builder.newCharReader());
}

}  // namespace

// Writer and reader are dear to make and are used for every JSON column: one of each for the
// process, which is single-threaded here as everywhere. Never freed, like the type cache.

std::string ToString(const Json::Value& jValue) {
    std::string strText;
    if (WritePlainJson(jValue, strText)) {
        return strText;
    }
    static Json::StreamWriter& s_Writer = *MakeWriter().release();
    std::ostringstream Stream;
    // Without this a stream swallows std::bad_alloc and the text is silently cut.
    Stream.exceptions(std::ios::badbit | std::ios::failbit);
    s_Writer.write(jValue, &Stream);
    return Stream.str();
}

void FromString(const char* szText, Json::Value& jOut) {
    Json::Value jRead;
    if (ReadPlainJson(szText, jRead)) {
        jOut.swapPayload(jRead);
        return;
    }
    static Json::CharReader& s_Reader = *MakeReader().release();
    s_Reader.parse(szText, szText + std::strlen(szText), &jOut, nullptr);
}

}  // namespace vornjsondb
