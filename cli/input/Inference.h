// Which types the members of all records have together.

#ifndef VORNJSONDB_CLI_INPUT_INFERENCE_H
#define VORNJSONDB_CLI_INPUT_INFERENCE_H

#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include <json/json.h>

#include "Sink.h"

namespace VORN_JSON_DB::Cli {

class Inference : public Sink {
  public:
    // Of several inputs; cells of CSV are texts that may be numbers.
    void BeginInput(bool blCells);

    void NewMember(std::string_view strName) override;
    void Take(size_t nMember, const Value& Given) override;
    bool EndRecord(const Place& Where) override;
    bool BadRecord(const Place& Where, const std::string& strReason) override;

    std::int64_t Records() const { return m_nRecords; }

    // As "member" of a definition has them: {"id": {"cpptype": "long long"}}.
    Json::Value Members() const;

    // Whether each member had a value that is not null.
    bool AllHaveValues() const;

    // In the order in which they were first seen.
    std::vector<std::string> Names() const;

    // What a person should know of the choice, a line each.
    std::vector<std::string> Notes() const;

  private:
    struct Seen {
        std::string strName;
        unsigned nKinds = 0;       // bits
        std::int64_t nValues = 0;  // nulls, too
    };
    struct Now {
        size_t nSeen;
        unsigned nKinds;
    };

    std::vector<Seen> m_vecSeen;
    std::map<std::string, size_t, std::less<>> m_mapSeen;
    std::vector<size_t> m_vecInput;  // the input's members in m_vecSeen
    std::vector<Now> m_vecNow;       // of the record, which may yet turn out bad
    std::int64_t m_nRecords = 0;
    bool m_blCells = false;
    bool m_blOnlyCells = true;
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_INFERENCE_H
