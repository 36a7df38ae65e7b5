// Reads records of any format from bytes, in memory that does not grow with the input.

#ifndef VORNJSONDB_CLI_INPUT_READERS_H
#define VORNJSONDB_CLI_INPUT_READERS_H

#include <cstdint>
#include <string>

#include "ByteSource.h"
#include "Sink.h"

namespace VORN_JSON_DB::Cli {

enum class Format {
    kJson,       // a list; a list under the one member of an object; objects one after another
    kJsonLines,  // an object on each line, so that reading goes on after a bad one
    kSeparated   // CSV, TSV
};

struct ReadOptions {
    Format eFormat = Format::kJson;
    char cDelimiter = ',';
    bool blQuotes = true;        // false: a quote is a character like others
    bool blHeader = true;        // false: the members are c1, c2 and so on
    bool blEmptyIsText = false;  // a bare empty cell is the empty text and not null
    bool blKeepText = false;     // fills Place::strText
};

// How reading ended.
struct ReadOutcome {
    enum class End {
        kDone,
        kStopped,  // the sink wanted no more
        kFailed    // for strReason in line nLine, after which there is no way to go on
    };
    End eEnd = End::kDone;
    std::int64_t nLine = 0;  // 0: none in particular
    std::string strReason;
    std::string strListName;  // the member of the top-level object whose list was read
};

// No record may be longer: it has to be in memory as a whole.
constexpr std::size_t kMostRecordBytes = std::size_t{16} << 20;

// Of a JSON text.
constexpr int kMostLevels = 1000;

ReadOutcome ReadRecords(ByteSource& From, const ReadOptions& How, Sink& To);

// One for each format, of which the one above calls the right one.
ReadOutcome ReadJson(ByteSource& From, const ReadOptions& How, Sink& To);
ReadOutcome ReadJsonLines(ByteSource& From, const ReadOptions& How, Sink& To);
ReadOutcome ReadSeparated(ByteSource& From, const ReadOptions& How, Sink& To);

// What the first bytes look like.
ReadOptions GuessFormat(std::string_view strFirst);

// Whether they are a line "sep=;", with which a spreadsheet is told the delimiter.
bool HasDelimiterLine(std::string_view strFirst);
constexpr std::size_t kDelimiterLine = 5;  // its length

// "JSON Lines", "CSV with ;"
std::string FormatText(const ReadOptions& How);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_READERS_H
