#include "Command.h"

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cstdio>
#include <cstring>
#include <iterator>
#include <system_error>

#include "../table/Nearest.h"
#include "JsonCells.h"
#include "input/LockWait.h"
#include "input/Utf8.h"

namespace VORN_JSON_DB::Cli {

namespace {

struct ExitRow {
    StatusCode eCode;
    int nExit;
    const char* szHint;  // what to do, where no finding tells
};

// kRefused is the caller's to say. What is not here is unexpected.
constexpr ExitRow kExits[] = {
    {StatusCode::kNotFound, kExitNotFound, ""},
    {StatusCode::kDuplicate, kExitDuplicate, ""},
    {StatusCode::kConstraint, kExitBadData, "; vornjsondb schema shows what the table demands"},
    {StatusCode::kLocked, kExitLocked, "; try again, or wait longer with --wait MS"},
    {StatusCode::kReadOnly, kExitIo, "; check the permissions of the file and of its folder"},
    {StatusCode::kDiskFull, kExitIo, "; free some space"},
    {StatusCode::kIoError, kExitIo, "; check the disk and the shell's limits"},
    {StatusCode::kCorrupt, kExitIo, "; restore it from a copy"},
    {StatusCode::kNotADatabase, kExitIo, "; name an SQLite database first"},
    {StatusCode::kInterrupted, kExitInterrupted, ""},
};

const ExitRow& RowOf(StatusCode eCode) {
    static constexpr ExitRow kOther = {StatusCode::kOk, kExitUnexpected, ""};
    const auto* const pFound = std::find_if(std::begin(kExits), std::end(kExits),
                                            [&](const auto& Row) { return Row.eCode == eCode; });
    return pFound == std::end(kExits) ? kOther : *pFound;
}

// What a finding advises is a call of the library: here is what to type instead.
struct RemedyRow {
    const char* szCode;
    const char* szRemedy;
};

constexpr RemedyRow kRemedies[] = {
    {"bad-members", "name members of the table, parted by commas"},
    {"bad-name", "rename it, or give a definition without it by --def"},
    {"bad-pattern", R"(put \ before a %, _ or \ that stands for itself)"},
    {"full-scan", "create one by vornjsondb index, where the table is or gets large"},
    {"hides-query-key", "give the member another name where a VornJsonDbApi reads the table"},
    {"key-not-unique", "vornjsondb sync adds a unique index"},
    {"missing-column", "vornjsondb sync adds it"},
    {"missing-unique", "vornjsondb sync adds a unique index"},
    {"no-condition", "give a condition; delete --all removes all records"},
    {"no-key", "name the key in a definition, given by --def; or insert --key MEMBER"},
    {"old-type", "use another type where a VornJsonDbApi works on the table"},
    {"other-affinity",
     "give the member a type that fits its column, or copy the rows into a new table"},
    {"unknown-member", "correct the name, or add the member by insert --add-members"},
    {"unknown-operator", "see vornjsondb list --help"},
    {"unknown-type", "see vornjsondb init --help"},
    {"wrong-operator", "$like and $prefix are for texts, $contains is for lists"},
};

// What SQLite says when it refuses something, and what to do then.
struct WordsRow {
    const char* szWords;
    const char* szHint;
};

constexpr WordsRow kWords[] = {
    {"no such column: ", "; vornjsondb sync adds the column"},
    {" has no column named ", "; vornjsondb sync adds the column"},
    {" already exists", "; drop or rename what is there, or take another database"},
    {" because it is a view",
     "; change the table that it reads, or give the view INSTEAD OF triggers"},
    {"views may not be indexed", "; create the index on the table that it reads"},
};

void CheckOutput(bool blWritten) {
    if (!blWritten) {
        Fail(kExitIo, std::string("standard output: cannot write: ") + std::strerror(errno) +
                          "; what was written so far is not all");
    }
}

void AppendEscaped(std::string& strLine, std::string_view strBytes) {
    constexpr char kDigits[] = "0123456789abcdef";
    for (const char c : strBytes) {
        const auto nByte = static_cast<unsigned char>(c);
        strLine += std::string("\\x") + kDigits[nByte >> 4U] + kDigits[nByte & 15U];
    }
}

// Names and values in a message may come from anywhere, and must not steer the terminal.
std::string OneLine(const std::string& strText) {
    std::string strLine;
    std::size_t nAt = 0;
    while (nAt < strText.size()) {
        std::int32_t nCode = 0;
        const std::size_t nLength = ReadCharacter(std::string_view(strText).substr(nAt), nCode);
        const std::string_view strOne = std::string_view(strText).substr(nAt, nLength);
        if (nCode == '\n' || nCode == '\r') {
            strLine += ' ';
        } else if (Steers(nCode)) {
            AppendEscaped(strLine, strOne);
        } else {
            strLine += strOne;
        }
        nAt += nLength;
    }
    return strLine;
}

}  // namespace

void Fail(int nExit, const std::string& strLine) {
    throw Error{nExit, OneLine(strLine), {}};
}

void FailInterrupted() {
    Fail(kExitInterrupted, "interrupted");
}

int ExitOf(StatusCode eCode, int nRefused) {
    return eCode == StatusCode::kRefused ? nRefused : RowOf(eCode).nExit;
}

std::string RemedyOf(const Finding& Found) {
    for (const RemedyRow& Row : kRemedies) {
        if (std::strcmp(Row.szCode, Found.szCode) == 0) {
            return Row.szRemedy;
        }
    }
    return Found.strRemedy;
}

const char* HintFor(StatusCode eCode, const std::string& strMessage) {
    for (const WordsRow& Row : kWords) {
        if (eCode == StatusCode::kRefused && strMessage.find(Row.szWords) != std::string::npos) {
            return Row.szHint;
        }
    }
    return RowOf(eCode).szHint;
}

std::string LineOf(const Status& Outcome) {
    for (const Finding& Found : Outcome.Findings()) {
        if (Found.eSeverity == Severity::kError && !Found.strRemedy.empty()) {
            return Outcome.Message() + "; " + RemedyOf(Found);
        }
    }
    const bool blLocked = Outcome.Code() == StatusCode::kLocked;
    return (blLocked ? WithWait(Outcome.Message()) : Outcome.Message()) +
           HintFor(Outcome.Code(), Outcome.Message());
}

void Check(const Status& Outcome, const std::string& strWhere, int nRefused) {
    if (!Outcome.Ok()) {
        throw Error{ExitOf(Outcome.Code(), nRefused), OneLine(strWhere + ": " + LineOf(Outcome)),
                    Outcome.Findings()};
    }
}

std::string NearestHint(const std::string& strWord, const std::vector<std::string>& vecNames,
                        const std::string& strElse) {
    const std::string strNearest = vornjsondb::Nearest(strWord, vecNames);
    return strNearest.empty() ? strElse : "; did you mean \"" + strNearest + "\"?";
}

std::vector<std::string> Context::WordsFrom(std::size_t nFirst) const {
    if (nFirst >= vecWords.size()) {
        return {};
    }
    return {vecWords.begin() + static_cast<std::ptrdiff_t>(nFirst), vecWords.end()};
}

std::string Context::Text(const char* szOption, const std::string& strDefault) const {
    const auto itOption = mapOptions.find(szOption);
    return itOption == mapOptions.end() ? strDefault : itOption->second.back();
}

std::vector<std::string> Context::List(const char* szOption) const {
    const auto itOption = mapOptions.find(szOption);
    return itOption == mapOptions.end() ? std::vector<std::string>() : itOption->second;
}

std::vector<std::string> Context::Names(const char* szOption) const {
    std::vector<std::string> vecNames;
    for (const std::string& strList : List(szOption)) {
        std::size_t nBegin = 0;
        while (nBegin <= strList.size()) {
            const std::size_t nEnd = std::min(strList.find(',', nBegin), strList.size());
            vecNames.push_back(strList.substr(nBegin, nEnd - nBegin));
            // "id, name" is natural to type.
            nBegin = std::max(
                nEnd + 1, std::min(strList.find_first_not_of(' ', nEnd + 1), strList.size() + 1));
        }
    }
    return vecNames;
}

std::int64_t Context::Whole(const char* szOption, std::int64_t nDefault) const {
    if (!Has(szOption)) {
        return nDefault;
    }
    const std::string strText = Text(szOption);
    std::int64_t nValue = 0;
    const auto Read = std::from_chars(strText.data(), strText.data() + strText.size(), nValue);
    if (Read.ec != std::errc() || Read.ptr != strText.data() + strText.size() || nValue < 0) {
        Fail(kExitUsage,
             std::string(szOption) + ": \"" + strText + "\" is no whole number; give one from 0");
    }
    return nValue;
}

int Context::WaitMs() const {
    constexpr std::int64_t kLongestMs = 24LL * 60 * 60 * 1000;
    return static_cast<int>(std::min(Whole("--wait", 5000), kLongestMs));
}

void Context::Say(const std::string& strLine) const {
    if (!Quiet()) {
        static_cast<void>(std::fprintf(stderr, "%s\n", OneLine(strLine).c_str()));
    }
}

void Context::Report(const std::string& strLine, const Json::Value& jResult) const {
    if (Json()) {
        Put(CompactJson(jResult) + "\n");
    } else {
        Say(strLine);
    }
}

void Put(const char* pBytes, std::size_t nBytes) {
    CheckOutput(std::fwrite(pBytes, 1, nBytes, stdout) == nBytes);
}

void Put(const std::string& strText) {
    Put(strText.data(), strText.size());
}

void FlushOutput() {
    CheckOutput(std::fflush(stdout) == 0);
}

}  // namespace VORN_JSON_DB::Cli
