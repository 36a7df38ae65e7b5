#include "JsonText.h"

#include <rapidjson/memorystream.h>
#include <rapidjson/reader.h>

namespace VORN_JSON_DB::Cli {

namespace {

// Numbers stay texts: one that no double holds is JSON as well.
constexpr unsigned kFlags = rapidjson::kParseValidateEncodingFlag |
                            rapidjson::kParseNumbersAsStringsFlag | rapidjson::kParseIterativeFlag;

}  // namespace

bool IsJson(std::string_view strText) {
    rapidjson::MemoryStream Stream(strText.data(), strText.size());
    rapidjson::BaseReaderHandler<> Nobody;
    rapidjson::Reader Reader;
    // A NUL byte looks like the end to the reader.
    return !Reader.Parse<kFlags>(Stream, Nobody).IsError() && Stream.Tell() == strText.size();
}

}  // namespace VORN_JSON_DB::Cli
