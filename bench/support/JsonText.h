// JSON text by JsonCpp: one reader and one writer, made once.

#ifndef VORN_BENCH_SUPPORT_JSON_TEXT_H
#define VORN_BENCH_SUPPORT_JSON_TEXT_H

#include <memory>
#include <sstream>
#include <string>

#include <json/json.h>

#include "Bench.h"

namespace bench {

class JsonText {
  public:
    JsonText() {
        Json::StreamWriterBuilder Writer;
        Writer["indentation"] = "";
        Writer["emitUTF8"] = true;
        m_pWriter.reset(Writer.newStreamWriter());
        Json::CharReaderBuilder Reader;
        Reader["collectComments"] = false;
        m_pReader.reset(Reader.newCharReader());
    }

    std::string Write(const Json::Value& jValue) {
        m_Stream.str("");
        m_pWriter->write(jValue, &m_Stream);
        return m_Stream.str();
    }

    void Read(const char* pBegin, const char* pEnd, Json::Value& jOut) {
        Require(m_pReader->parse(pBegin, pEnd, &jOut, nullptr), "JSON text of a peer");
    }

    void Read(const std::string& strText, Json::Value& jOut) {
        Read(strText.data(), strText.data() + strText.length(), jOut);
    }

  private:
    std::unique_ptr<Json::StreamWriter> m_pWriter;
    std::unique_ptr<Json::CharReader> m_pReader;
    std::ostringstream m_Stream;
};

}  // namespace bench

#endif  // VORN_BENCH_SUPPORT_JSON_TEXT_H
