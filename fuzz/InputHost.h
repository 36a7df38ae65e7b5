// What the fuzz targets of the command's readers share: an input in memory, what a reader tells of
// it, and the promises that every reader must keep.

#ifndef VORNJSONDB_FUZZ_INPUTHOST_H
#define VORNJSONDB_FUZZ_INPUTHOST_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include <json/json.h>

#include "../cli/input/Readers.h"

namespace fuzzhost {

// A value as a reader gave it; jValue is the JSON that it stands for, where JsonCpp can hold it.
struct ReadCell {
    std::string strName;
    VORN_JSON_DB::Cli::Value::Kind eKind;
    std::string strText;
    Json::Value jValue;
};

struct ReadRecord {
    bool blBad = false;
    std::string strReason;
    std::int64_t nLine = 0;
    std::string strText;
    std::vector<ReadCell> vecCells;
};

struct ReadInput {
    std::vector<ReadRecord> vecRecords;
    VORN_JSON_DB::Cli::ReadOutcome Outcome;
};

// The first byte of an input has options, and the second says how far before the end of the
// reader's first block the text begins. 0: in the block's begin.
constexpr size_t kOptionBytes = 2;

// Reads a text as bytes of a file behind nBefore line feeds, which belong to no record.
ReadInput Read(const std::string& strText, size_t nBefore,
               const VORN_JSON_DB::Cli::ReadOptions& How);

// Reads a text alone and once more so that it lies across two blocks, which must give the same.
// What was read keeps the promises of all readers.
ReadInput ReadTwice(const std::string& strText, unsigned nShift,
                    const VORN_JSON_DB::Cli::ReadOptions& How);

// Whether a text is strict JSON, except for names that come twice and for depth.
bool ParseStrictly(const std::string& strText, Json::Value& jOut);

// Whether a record holds what JSON says of it. Numbers that JsonCpp cannot hold are not compared.
bool IsRecord(const ReadRecord& Found, const Json::Value& jExpected);

}  // namespace fuzzhost

#endif  // VORNJSONDB_FUZZ_INPUTHOST_H
