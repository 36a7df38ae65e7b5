// The only file that knows the parser of command lines, which takes long to compile.

#include "Parse.h"

#include <CLI/CLI.hpp>
#include <cstring>
#include <sstream>

namespace VORN_JSON_DB::Cli {

namespace {

// The parser takes a word in brackets apart, and "-5" for an option. A mark in front hides both
// from it, and is taken off again from what it hands out.
constexpr char kMark = '\x01';

std::string Marked(const std::string& strWord) {
    const bool blNumber = strWord.size() > 1 && strWord[0] == '-' &&
                          std::strchr("0123456789.", strWord[1]) != nullptr;
    const bool blOther = !strWord.empty() && (strWord[0] == '[' || strWord[0] == kMark);
    return blNumber || blOther ? kMark + strWord : strWord;
}

std::vector<std::string> Unmarked(std::vector<std::string> vecWords) {
    for (std::string& strWord : vecWords) {
        if (!strWord.empty() && strWord[0] == kMark) {
            strWord.erase(0, 1);
        }
    }
    return vecWords;
}

[[noreturn]] void FailUsage(const std::string& strWhat, const std::string& strHint,
                            const Command* pOf = nullptr) {
    const std::string strName = pOf == nullptr ? "" : std::string(" ") + pOf->szName;
    Fail(kExitUsage,
         strWhat + (strHint.empty() ? "; see vornjsondb" + strName + " --help" : strHint));
}

std::string Padded(std::string strText, std::size_t nWidth) {
    strText.resize(std::max(nWidth, strText.size() + 2), ' ');
    return strText;
}

void PutOptions(const std::vector<Option>& vecOptions) {
    for (const Option& Row : vecOptions) {
        const bool blShort = *Row.szShort != '\0';
        std::string strName = blShort ? std::string(Row.szShort) + ", " : "    ";
        strName += std::string(Row.szName) + (*Row.szValue == '\0' ? "" : " ") + Row.szValue;
        Put("  " + Padded(strName, 28) + Row.szHelp + "\n");
    }
}

// Every line of a text with two blanks in front.
void PutIndented(const char* szText) {
    std::istringstream Lines(szText);
    for (std::string strLine; std::getline(Lines, strLine);) {
        Put("  " + strLine + "\n");
    }
}

void PutHelp(const Command& Of) {
    Put("Examples\n");
    PutIndented(Of.szExamples);
    Put(std::string("\nUsage\n  vornjsondb ") + Of.szName + " " + Of.szWords + " [OPTION]...\n\n");
    Put(std::string(Of.szHelp) + ".\n" + Of.szText + "\nOptions\n");
    PutOptions(OptionsOf(Of));
}

void PutOverview() {
    Put("Examples\n");
    PutIndented(kOverviewExamples);
    Put("\nUsage\n  vornjsondb SUBCOMMAND DB [TABLE] ... [OPTION]...\n\n"
        "JSON records in SQLite tables, of any database.\n\nSubcommands\n");
    for (const Command& Row : AllCommands()) {
        Put("  " + Padded(Row.szName, 12) + Row.szHelp + "\n");
    }
    Put("\nOptions of every subcommand\n");
    PutOptions(SharedOptions());
    Put("\nvornjsondb SUBCOMMAND --help has the rest; so has vornjsondb(1).\n");
}

// Takes the subcommand's name out of the words; options may stand before it.
const Command* TakeCommand(std::vector<std::string>& vecWords) {
    for (std::size_t nAt = 0; nAt < vecWords.size(); ++nAt) {
        const std::string strWord = vecWords[nAt];
        if (strWord.empty() || strWord[0] != '-') {
            vecWords.erase(vecWords.begin() + static_cast<std::ptrdiff_t>(nAt));
            const Command* const pFound = FindCommand(strWord);
            if (pFound == nullptr) {
                std::vector<std::string> vecNames;
                for (const Command& Row : AllCommands()) {
                    vecNames.emplace_back(Row.szName);
                }
                FailUsage("unknown subcommand \"" + strWord + "\"",
                          NearestHint(strWord, vecNames, ""));
            }
            return pFound;
        }
        const Option* const pOption = FindOption(SharedOptions(), strWord);
        nAt += pOption != nullptr && *pOption->szValue != '\0' ? 1U : 0U;
    }
    return nullptr;
}

void CheckChoice(const Option& Of, const std::vector<std::string>& vecValues) {
    const std::vector<std::string> vecChoices = Choices(Of.szValue);
    for (const std::string& strValue : vecValues) {
        if (!vecChoices.empty() &&
            std::find(vecChoices.begin(), vecChoices.end(), strValue) == vecChoices.end()) {
            Fail(kExitUsage, std::string(Of.szName) + ": unknown value \"" + strValue +
                                 "\"; it is one of " + Of.szValue);
        }
    }
}

void CheckOptionName(const std::string& strWord, const Command& Of) {
    std::vector<std::string> vecNames;
    for (const Option& Row : OptionsOf(Of)) {
        vecNames.emplace_back(Row.szName);
    }
    const std::string strName = strWord.substr(0, strWord.find('='));
    // The rest of a name is forgotten more often than it is mistyped.
    const bool blLong = strName.compare(0, 2, "--") == 0;
    const auto itBegun = std::find_if(vecNames.begin(), vecNames.end(), [&](const auto& strEach) {
        return strName.size() > 3 && strEach.compare(0, strName.size(), strName) == 0;
    });
    const std::string strElse = std::string("; see vornjsondb ") + Of.szName +
                                " --help, and put -- before words that begin with a dash";
    FailUsage("unknown option \"" + strName + "\" of " + Of.szName,
              itBegun != vecNames.end() ? "; did you mean \"" + *itBegun + "\"?"
              : blLong                  ? NearestHint(strName, vecNames, strElse)
                                        : strElse);
}

// The names of Command::szWords say how many words there may be.
void CheckWords(const Context& Call) {
    std::istringstream Names(Call.pCommand->szWords);
    std::size_t nMost = 0;
    for (std::string strName; Names >> strName; ++nMost) {
        if (strName[0] != '[' && Call.vecWords.size() <= nMost) {
            FailUsage(std::string(Call.pCommand->szName) + " lacks " + strName,
                      std::string("; usage: vornjsondb ") + Call.pCommand->szName + " " +
                          Call.pCommand->szWords);
        }
        if (strName.find("...") != std::string::npos) {
            return;
        }
    }
    if (Call.vecWords.size() > nMost) {
        FailUsage("\"" + Call.vecWords[nMost] + "\" is one word too many",
                  std::string("; usage: vornjsondb ") + Call.pCommand->szName + " " +
                      Call.pCommand->szWords);
    }
}

void ParseWords(std::vector<std::string> vecWords, Context& Call) {
    CLI::App App;
    App.set_help_flag("");
    App.allow_extras();
    std::vector<std::pair<Option, CLI::Option*>> vecMade;
    for (const Option& Row : OptionsOf(*Call.pCommand)) {
        const std::string strName =
            std::string(Row.szName) + (*Row.szShort == '\0' ? "" : ",") + Row.szShort;
        CLI::Option* const pMade =
            *Row.szValue == '\0' ? App.add_flag(strName) : App.add_option(strName);
        if (*Row.szValue != '\0') {
            pMade->take_all()->allow_extra_args(false);
        }
        vecMade.emplace_back(Row, pMade);
    }
    CLI::Option* const pWords = App.add_option("WORDS")->expected(-1)->take_all();
    std::reverse(vecWords.begin(), vecWords.end());
    App.parse(std::move(vecWords));
    for (const std::string& strWord : App.remaining()) {
        if (strWord.size() > 1 && strWord[0] == '-' && strWord != "--") {
            CheckOptionName(strWord, *Call.pCommand);
        }
    }
    Call.vecWords = Unmarked(pWords->results());
    for (const auto& [Row, pMade] : vecMade) {
        if (pMade->count() > 0) {
            Call.mapOptions[Row.szName] = Unmarked(pMade->results());
            if (*Row.szValue != '\0' && !Row.blRepeat && pMade->count() > 1) {
                FailUsage(std::string(Row.szName) + " is given more than once", "; give it once");
            }
            CheckChoice(Row, Call.mapOptions[Row.szName]);
        }
    }
}

}  // namespace

const Command* FindCommand(const std::string& strName) {
    for (const Command& Row : AllCommands()) {
        if (strName == Row.szName) {
            return &Row;
        }
    }
    return nullptr;
}

const Option* FindOption(const std::vector<Option>& vecOptions, const std::string& strName) {
    for (const Option& Row : vecOptions) {
        if (strName == Row.szName || strName == Row.szShort) {
            return &Row;
        }
    }
    return nullptr;
}

std::vector<Option> OptionsOf(const Command& Of) {
    std::vector<Option> vecOptions = Of.vecOptions;
    vecOptions.insert(vecOptions.end(), SharedOptions().begin(), SharedOptions().end());
    return vecOptions;
}

std::vector<std::string> Choices(const char* szValue) {
    std::vector<std::string> vecChoices;
    if (std::strchr(szValue, '|') != nullptr) {
        std::istringstream Values(szValue);
        for (std::string strValue; std::getline(Values, strValue, '|');) {
            vecChoices.push_back(strValue);
        }
    }
    return vecChoices;
}

bool Parse(int nArguments, char** pszArguments, Context& Call) {
    const std::string strFirst = nArguments > 1 ? pszArguments[1] : "";
    if (strFirst == "--complete" || strFirst == "--complete-bash") {
        PutCandidates({pszArguments + 2, pszArguments + nArguments}, strFirst == "--complete-bash");
        return false;
    }
    std::vector<std::string> vecWords;
    for (int nAt = 1; nAt < nArguments; ++nAt) {
        vecWords.push_back(Marked(pszArguments[nAt]));
    }
    if (strFirst == "help") {
        vecWords.erase(vecWords.begin());
        const Command* const pOf = TakeCommand(vecWords);
        if (pOf != nullptr) {
            PutHelp(*pOf);
        } else {
            PutOverview();
        }
        return false;
    }
    Call.pCommand = TakeCommand(vecWords);
    const auto Asked = [&vecWords](const char* szLong, const char* szShort) {
        return std::any_of(vecWords.begin(), vecWords.end(), [&](const std::string& strWord) {
            return strWord == szLong || strWord == szShort;
        });
    };
    if (Call.pCommand == nullptr && Asked("--version", "-V")) {
        Put("vornjsondb " VORNJSONDB_VERSION " (SQLite " + std::string(sqlite3_libversion()) +
            ")\n");
        return false;
    }
    if (Call.pCommand == nullptr && Asked("--help", "-h")) {
        PutOverview();
        return false;
    }
    if (Call.pCommand == nullptr) {
        FailUsage(vecWords.empty() || FindOption(SharedOptions(), vecWords[0]) != nullptr
                      ? "there is no subcommand"
                      : "there is no subcommand, and no option \"" + vecWords[0] + "\"",
                  "");
    }
    try {
        ParseWords(std::move(vecWords), Call);
    } catch (const CLI::ArgumentMismatch& Failed) {
        // "--sql: 1 required ..."
        const std::string strText = Failed.what();
        FailUsage(strText.substr(0, strText.find(':')) + " lacks its value", "", Call.pCommand);
    } catch (const CLI::ParseError& Failed) {
        FailUsage(Failed.what(), "", Call.pCommand);
    }
    if (Call.Has("--help")) {
        PutHelp(*Call.pCommand);
        return false;
    }
    if (Call.Has("--version")) {
        Put("vornjsondb " VORNJSONDB_VERSION "\n");
        return false;
    }
    CheckWords(Call);
    return true;
}

}  // namespace VORN_JSON_DB::Cli
