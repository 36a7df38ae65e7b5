#include "InputFiles.h"

#include <algorithm>
#include <cstring>

#include "Interrupt.h"

namespace VORN_JSON_DB::Cli {

namespace {

struct FormatRow {
    const char* szName;
    Format eFormat;
    char cDelimiter;
};

constexpr FormatRow kFormats[] = {{"json", Format::kJson, ','},
                                  {"jsonl", Format::kJsonLines, ','},
                                  {"csv", Format::kSeparated, ','},
                                  {"tsv", Format::kSeparated, '\t'}};

ReadOptions Named(const std::string& strFormat) {
    ReadOptions How;
    for (const FormatRow& Row : kFormats) {
        if (strFormat == Row.szName) {
            How.eFormat = Row.eFormat;
            How.cDelimiter = Row.cDelimiter;
            return How;
        }
    }
    Fail(kExitUsage, "--format: there is no \"" + strFormat + "\"; json, jsonl, csv and tsv are");
}

ReadOptions OptionsFor(ByteSource& From, const Context& Call) {
    // A pipe is not waited for, when it is known what comes.
    ReadOptions How =
        Call.Has("--format") ? Named(Call.Text("--format")) : GuessFormat(From.Look());
    if (Call.Has("--delimiter")) {
        const std::string strDelimiter = Call.Text("--delimiter");
        if (strDelimiter.size() != 1 || strDelimiter.find_first_of("\"\r\n") == 0) {
            Fail(kExitUsage,
                 "--delimiter: it must be one ASCII character, and no quote or newline; for tabs "
                 "there is --format tsv");
        }
        How.eFormat = Format::kSeparated;
        How.cDelimiter = strDelimiter[0];
    }
    How.blQuotes = Call.Text("--quote") != "none";
    How.blHeader = !Call.Has("--no-header");
    How.blEmptyIsText = Call.Text("--empty") == "text";
    How.blKeepText = Call.Has("--errors");
    return How;
}

}  // namespace

void FailToRead(const ByteSource& Of) {
    if (Interrupt::Came()) {
        FailInterrupted();
    }
    Fail(kExitIo, Of.Name() + ": " + std::strerror(Of.Error()) + "; check name and permissions");
}

void FailAt(const std::string& strInput, std::int64_t nLine, const std::string& strReason,
            const char* szRemedy) {
    Fail(kExitBadData, strInput + ":" + std::to_string(nLine) + ": " + strReason +
                           (strReason.find("; ") == std::string::npos ? szRemedy : ""));
}

InputFiles::InputFiles(const Context& Call) {
    const std::vector<std::string> vecFiles = Call.WordsFrom(2);
    // Each would get some of its bytes.
    if (std::count(vecFiles.begin(), vecFiles.end(), "-") + (Call.Text("--def") == "-") > 1) {
        Fail(kExitUsage, "standard input is named more than once; give - once");
    }
    for (const std::string& strPath : vecFiles) {
        m_vecInputs.push_back(std::make_unique<Input>());
        Input& Now = *m_vecInputs.back();
        if (!Now.From.Open(strPath)) {
            FailToRead(Now.From);
        }
        Now.How = OptionsFor(Now.From, Call);
    }
}

bool InputFiles::ReadOne(Input& Now, Sink& To) {
    const ReadOutcome Result = ReadRecords(Now.From, Now.How, To);
    if (Now.From.Error() != 0) {
        FailToRead(Now.From);
    }
    if (Result.eEnd == ReadOutcome::End::kFailed) {
        FailAt(Now.From.Name(), Result.nLine, Result.strReason, "; correct the input");
    }
    Now.strListName = Result.strListName;
    return Result.eEnd == ReadOutcome::End::kDone;
}

bool InputFiles::Read(Sink& To, const Begin& fnBegin, bool blAgain) {
    for (const std::unique_ptr<Input>& pNow : m_vecInputs) {
        if (pNow->From.Error() != 0) {
            FailToRead(pNow->From);  // the first look failed
        }
        const bool blReady = m_blReadBefore ? pNow->From.Rewind() : !blAgain || pNow->From.Spool();
        if (!blReady && !Interrupt::Came()) {
            Fail(kExitIo, pNow->From.Name() + ": cannot copy it to read it twice: " +
                              std::strerror(pNow->From.Error()) +
                              "; set TMPDIR to a folder with space");
        }
        if (!blReady) {
            FailToRead(pNow->From);
        }
    }
    m_blReadBefore = true;
    for (const std::unique_ptr<Input>& pNow : m_vecInputs) {
        fnBegin(pNow->From.Name(), pNow->How.eFormat == Format::kSeparated);
        if (!ReadOne(*pNow, To)) {
            return false;
        }
    }
    return true;
}

std::int64_t InputFiles::AllBytes() const {
    std::int64_t nAll = 0;
    for (const std::unique_ptr<Input>& pNow : m_vecInputs) {
        if (pNow->From.Size() < 0) {
            return -1;
        }
        nAll += pNow->From.Size();
    }
    return nAll;
}

std::int64_t InputFiles::BytesRead() const {
    std::int64_t nAll = 0;
    for (const std::unique_ptr<Input>& pNow : m_vecInputs) {
        nAll += pNow->From.Taken();
    }
    return nAll;
}

std::string InputFiles::Formats() const {
    std::string strAll;
    for (const std::unique_ptr<Input>& pNow : m_vecInputs) {
        strAll += (strAll.empty() ? "" : ", ") + pNow->From.Name() + ": " + FormatText(pNow->How);
        if (!pNow->strListName.empty()) {
            strAll += ", the list \"" + pNow->strListName + "\"";
        }
    }
    return strAll;
}

}  // namespace VORN_JSON_DB::Cli
