#include "Readers.h"

#include <cstring>

namespace VORN_JSON_DB::Cli {

ReadOutcome ReadRecords(ByteSource& From, const ReadOptions& How, Sink& To) {
    ReadOutcome Result;
    if (!SkipByteOrderMark(From, Result.strReason)) {
        Result.eEnd = ReadOutcome::End::kFailed;
        Result.nLine = 1;
        return Result;
    }
    constexpr ReadOutcome (*kReaders[])(ByteSource&, const ReadOptions&, Sink&) = {
        ReadJson, ReadJsonLines, ReadSeparated};
    Result = kReaders[static_cast<size_t>(How.eFormat)](From, How, To);
    if (From.Error() != 0) {
        // A cut input says something else of what it lacks.
        Result.eEnd = ReadOutcome::End::kFailed;
        Result.nLine = 0;
        Result.strReason = std::strerror(From.Error());
    }
    return Result;
}

bool SkipByteOrderMark(ByteSource& From, std::string& strReason) {
    const std::string_view strFirst = From.Look();
    if (strFirst.substr(0, 2) == "\xFF\xFE" || strFirst.substr(0, 2) == "\xFE\xFF") {
        strReason = "the input is UTF-16; convert it with iconv -f UTF-16 -t UTF-8";
        return false;
    }
    if (strFirst.substr(0, 3) == "\xEF\xBB\xBF") {
        char szMark[3];
        From.Read(szMark, sizeof szMark);
    }
    return true;
}

}  // namespace VORN_JSON_DB::Cli
