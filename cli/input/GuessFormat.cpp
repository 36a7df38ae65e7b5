// Telling formats apart by their first bytes.

#include <algorithm>
#include <cstring>

#include "Readers.h"

namespace VORN_JSON_DB::Cli {

namespace {

constexpr char kBlanks[] = " \t\r\n";
constexpr char kDelimiters[] = ",\t;|";

std::string_view WithoutMark(std::string_view strText) {
    return strText.substr(0, 3) == "\xEF\xBB\xBF" ? strText.substr(3) : strText;
}

// Whether brackets and quotes are closed at the end of the text; enough to tell a record on one
// line from the begin of one.
bool IsClosed(std::string_view strText) {
    int nOpen = 0;
    bool blQuoted = false;
    for (size_t i = 0; i < strText.size(); ++i) {
        const char c = strText[i];
        if (blQuoted) {
            i += c == '\\' ? 1 : 0;
            blQuoted = c != '"';
        } else {
            blQuoted = c == '"';
            nOpen += c == '{' || c == '[' ? 1 : 0;
            nOpen -= c == '}' || c == ']' ? 1 : 0;
        }
    }
    return nOpen == 0 && !blQuoted;
}

// An object: records on lines have one on the first line, and something on a later one.
Format OfObjects(std::string_view strFirst) {
    const size_t nLineEnd = strFirst.find('\n');
    const bool blMore = nLineEnd != std::string_view::npos &&
                        strFirst.find_first_not_of(kBlanks, nLineEnd) != std::string_view::npos;
    return blMore && IsClosed(strFirst.substr(0, nLineEnd)) ? Format::kJsonLines : Format::kJson;
}

// How many cells each row has with this delimiter; 0 if not all have the same. The last row may be
// cut and does not count, unless it is the only one.
size_t Columns(std::string_view strText, char cDelimiter) {
    size_t nAll = 0;
    size_t nCells = 1;
    size_t nBytes = 0;
    bool blQuoted = false;
    const auto fnSame = [&] {
        const bool blSame = nAll == 0 || nAll == nCells;
        nAll = nCells;
        nCells = 1;
        nBytes = 0;
        return blSame;
    };
    for (const char c : strText) {
        blQuoted = blQuoted != (c == '"');
        nCells += !blQuoted && c == cDelimiter ? 1 : 0;
        if (!blQuoted && (c == '\n' || c == '\r')) {
            if (nBytes > 0 && !fnSame()) {
                return 0;
            }
        } else {
            ++nBytes;
        }
    }
    return nAll == 0 ? nCells : nAll;
}

char GuessDelimiter(std::string_view strText) {
    if (HasDelimiterLine(strText)) {
        return strText[kDelimiterLine - 1];
    }
    size_t nMost = 1;
    char cBest = ',';
    for (const char* p = kDelimiters; *p != '\0'; ++p) {
        const size_t nColumns = Columns(strText, *p);
        if (nColumns > nMost) {
            nMost = nColumns;
            cBest = *p;
        }
    }
    if (nMost > 1) {
        return cBest;
    }
    // Ragged rows are reported by the reader: the header tells best what was meant.
    const std::string_view strHeader = strText.substr(0, strText.find_first_of("\r\n"));
    for (const char* p = kDelimiters; *p != '\0'; ++p) {
        if (Columns(strText, *p) == 0 && Columns(strHeader, *p) > nMost) {
            nMost = Columns(strHeader, *p);
            cBest = *p;
        }
    }
    return cBest;
}

}  // namespace

bool HasDelimiterLine(std::string_view strFirst) {
    const std::string_view strText = WithoutMark(strFirst);
    return strText.substr(0, 4) == "sep=" && strText.find_first_of("\r\n") == kDelimiterLine;
}

ReadOptions GuessFormat(std::string_view strFirst) {
    const std::string_view strText = WithoutMark(strFirst);
    const size_t nBegin = strText.find_first_not_of(kBlanks);
    const char cFirst = nBegin == std::string_view::npos ? '\0' : strText[nBegin];
    ReadOptions Guess;
    if (cFirst == '[') {
        Guess.eFormat = Format::kJson;
    } else if (cFirst == '{') {
        Guess.eFormat = OfObjects(strText.substr(nBegin));
    } else if (cFirst == '\0') {
        Guess.eFormat = Format::kJsonLines;  // blanks alone would be a header to CSV
    } else {
        Guess.eFormat = Format::kSeparated;
        Guess.cDelimiter = GuessDelimiter(strText);
    }
    return Guess;
}

std::string FormatText(const ReadOptions& How) {
    if (How.eFormat != Format::kSeparated) {
        return How.eFormat == Format::kJson ? "JSON" : "JSON Lines";
    }
    if (How.cDelimiter == '\t') {
        return "TSV";
    }
    return How.cDelimiter == ',' ? "CSV" : std::string("CSV with ") + How.cDelimiter;
}

}  // namespace VORN_JSON_DB::Cli
