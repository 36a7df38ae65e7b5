#include "Readers.h"

#include <algorithm>
#include <cstring>

namespace VORN_JSON_DB::Cli {

namespace {

// How the first bytes are in an encoding of several bytes a character: a mark, or without one a
// character of ASCII. Z is a byte of zero, x one that is not.
struct EncodingRow {
    const char* szBegin;
    const char* szName;
};

constexpr EncodingRow kEncodings[] = {
    {"\xFF\xFEZZ", "UTF-32"}, {"ZZ\xFE\xFF", "UTF-32"}, {"\xFF\xFE", "UTF-16"},
    {"\xFE\xFF", "UTF-16"},   {"xZZZ", "UTF-32LE"},     {"ZZZx", "UTF-32BE"},
    {"xZ", "UTF-16LE"},       {"Zx", "UTF-16BE"},
};

bool BeginsLike(std::string_view strText, std::string_view strBegin) {
    return strText.size() >= strBegin.size() &&
           std::equal(strBegin.begin(), strBegin.end(), strText.begin(),
                      [](char cBegin, char cText) {
                          return cBegin == 'x'   ? cText != '\0'
                                 : cBegin == 'Z' ? cText == '\0'
                                                 : cText == cBegin;
                      });
}

const char* WideEncoding(std::string_view strText) {
    for (const EncodingRow& Row : kEncodings) {
        if (BeginsLike(strText, Row.szBegin)) {
            return Row.szName;
        }
    }
    return nullptr;
}

// Takes the byte order mark off. False with strReason for text that is not UTF-8.
bool SkipByteOrderMark(ByteSource& From, std::string& strReason) {
    const std::string_view strFirst = From.Look();
    if (const char* const szEncoding = WideEncoding(strFirst)) {
        strReason = std::string("the input is ") + szEncoding + "; convert it with iconv -f " +
                    szEncoding + " -t UTF-8";
        return false;
    }
    if (strFirst.substr(0, 3) == "\xEF\xBB\xBF") {
        char szMark[3];
        From.Read(szMark, sizeof szMark);
    }
    return true;
}

}  // namespace

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

}  // namespace VORN_JSON_DB::Cli
