// What all subcommands share: the table that describes them, the words and options of one call,
// messages, and the errors that end it.

#ifndef VORNJSONDB_CLI_COMMAND_H
#define VORNJSONDB_CLI_COMMAND_H

#include <VornJsonDbTable.h>

#include <cstdint>
#include <map>
#include <string>
#include <vector>

namespace VORN_JSON_DB::Cli {

// Exit codes. Part of the interface: scripts branch on them.
enum Exit : int {
    kExitFine = 0,
    kExitUnexpected = 1,
    kExitUsage = 2,
    kExitBadData = 3,
    kExitDuplicate = 4,
    kExitNotFound = 5,
    kExitLocked = 6,
    kExitIo = 7,
    kExitInterrupted = 130
};

struct ExitMeaning {
    Exit nExit;
    const char* szMeaning;
};
const std::vector<ExitMeaning>& AllExits();

// Thrown to end a subcommand; main prints "error: " and the line, which says what is wrong, where,
// and after a semicolon what to do.
struct Error {
    int nExit;
    std::string strLine;
    FindingList vecFindings;  // of a Status that the line stands for
};

[[noreturn]] void Fail(int nExit, const std::string& strLine);
[[noreturn]] void FailInterrupted();  // by Ctrl-C

// Throws what a failed Status stands for: "WHERE: message; remedy". What kRefused is depends on who
// wrote the arguments: a person at the shell (usage) or the data (kExitBadData).
void Check(const Status& Outcome, const std::string& strWhere, int nRefused = kExitUsage);
int ExitOf(StatusCode eCode, int nRefused = kExitUsage);
std::string LineOf(const Status& Outcome);
std::string RemedyOf(const Finding& Found);
// "; what to do", or nothing.
const char* HintFor(StatusCode eCode, const std::string& strMessage);

// "; did you mean "NAME"?" for the nearest of vecNames, or strElse where none is near.
std::string NearestHint(const std::string& strWord, const std::vector<std::string>& vecNames,
                        const std::string& strElse);

struct Option {
    const char* szName;     // "--limit"
    const char* szShort;    // "-l", or ""
    const char* szValue;    // "N"; "" for a flag; "a|b|c" for a choice
    const char* szHelp;     // one line
    bool blRepeat = false;  // may be given several times
};

struct Context;

// One row of the table that parsing, help, completion and the manual are made from.
struct Command {
    const char* szName;
    const char* szHelp;      // one line, without a full stop
    const char* szWords;     // "DB TABLE [KEY]...": in brackets may be absent, with dots may repeat
    const char* szExamples;  // whole lines
    const char* szText;      // what a user must know beyond that; shown after the examples
    std::vector<Option> vecOptions;  // without those of every subcommand
    int (*pfnRun)(Context& Call);
};

const std::vector<Command>& AllCommands();
extern const char kOverviewExamples[];  // of the command as a whole
const std::vector<Option>& SharedOptions();

// One call. The words follow Command::szWords; options are found by their long names.
struct Context {
    const Command* pCommand = nullptr;
    std::vector<std::string> vecWords;
    std::map<std::string, std::vector<std::string>> mapOptions;

    const std::string& Db() const { return vecWords.at(0); }
    const std::string& TableName() const { return vecWords.at(1); }
    std::vector<std::string> WordsFrom(std::size_t nFirst) const;

    bool Has(const char* szOption) const { return mapOptions.count(szOption) != 0; }
    std::string Text(const char* szOption, const std::string& strDefault = "") const;
    std::vector<std::string> List(const char* szOption) const;  // as often as given
    std::vector<std::string> Names(
        const char* szOption) const;  // the same; commas part them, and blanks
    std::int64_t Whole(const char* szOption, std::int64_t nDefault) const;  // usage error, if none

    bool Quiet() const { return Has("--quiet"); }
    bool Json() const { return Has("--json"); }
    int WaitMs() const;

    // A line to standard error, unless --quiet.
    void Say(const std::string& strLine) const;
    // The same for a result that --json wants on standard output: {"updated": 3}.
    void Report(const std::string& strLine, const Json::Value& jResult) const;
};

// Writes to standard output, which is buffered; a write that fails is an Error.
void Put(const char* pBytes, std::size_t nBytes);
void Put(const std::string& strText);
void FlushOutput();

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_COMMAND_H
