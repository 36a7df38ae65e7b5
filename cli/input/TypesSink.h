#ifndef VORNJSONDB_CLI_INPUT_TYPES_SINK_H
#define VORNJSONDB_CLI_INPUT_TYPES_SINK_H

#include <cstdint>
#include <functional>
#include <string>
#include <utility>

#include "Inference.h"
#include "InputFiles.h"

namespace VORN_JSON_DB::Cli {

// The first look at all records. Bad ones are an Error unless they are to be left out later.
class TypesSink : public Inference {
  public:
    TypesSink(bool blGoOn, std::function<bool(std::int64_t)> fnAfter)
        : m_blGoOn(blGoOn), m_fnAfter(std::move(fnAfter)) {}

    void Begin(const std::string& strName, bool blCells) {
        m_strInput = strName;
        BeginInput(blCells);
    }

    bool EndRecord(const Place& Where) override {
        return Inference::EndRecord(Where) && m_fnAfter(Records());
    }

    bool BadRecord(const Place& Where, const std::string& strReason) override {
        if (!m_blGoOn) {
            FailAt(m_strInput, Where.nLine, strReason, kLeaveOut);
        }
        return Inference::BadRecord(Where, strReason);
    }

  private:
    const bool m_blGoOn;
    const std::function<bool(std::int64_t)> m_fnAfter;
    std::string m_strInput;
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_TYPES_SINK_H
