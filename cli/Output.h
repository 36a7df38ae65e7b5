// Records on standard output, one after the other, in the formats of --format.

#ifndef VORNJSONDB_CLI_OUTPUT_H
#define VORNJSONDB_CLI_OUTPUT_H

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "Command.h"

namespace VORN_JSON_DB::Cli {

struct Cell {
    Row::Kind eKind = Row::Kind::kNull;
    std::int64_t nValue = 0;
    double dValue = 0;
    std::string_view strText;  // of texts, JSON and blobs; lives until the record is written
};

struct Column {
    std::string strName;
    bool blShowNull;  // in JSON; otherwise a member that is NULL is left out
};

class RecordOutput {
  public:
    virtual ~RecordOutput() = default;
    virtual void Begin(const std::vector<Column>& vecColumns) = 0;
    virtual void Record(const std::vector<Cell>& vecCells) = 0;
    virtual void End() = 0;
};

// The formats, each in a file of its own.
enum class JsonShape { kList, kLines, kOne };
std::unique_ptr<RecordOutput> JsonOutput(JsonShape eShape);
std::unique_ptr<RecordOutput> SeparatedOutput(char cBetween, bool blHeader);
std::unique_ptr<RecordOutput> TableOutput(bool blHeader);  // cut to the width of a terminal

// Writes what a query selects, as --format or --json asks for; else as a table to a terminal, and
// as JSON. Returns the number of records. blOne: there is one, or nothing is written.
std::int64_t WriteRecords(const Context& Call, Table& From, Query Which, bool blOne);

// Writes a list of flat objects, such as findings, with these members as columns.
void WriteObjects(const Context& Call, const Json::Value& jObjects,
                  const std::vector<std::string>& vecColumns);

// The text of a cell in formats that have no types.
void AppendPlain(std::string& strOut, const Cell& Value);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_OUTPUT_H
