// completion: scripts for shells and the manual page, made from the table of subcommands.

#include "Commands.h"
#include "Parse.h"

namespace VORN_JSON_DB::Cli {

namespace {

std::string CommandNames() {
    std::string strNames;
    for (const Command& Row : AllCommands()) {
        strNames += (strNames.empty() ? "" : " ") + std::string(Row.szName);
    }
    return strNames;
}

std::string OptionNames(const Command& Of) {
    std::string strNames;
    for (const Option& Row : OptionsOf(Of)) {
        strNames += (strNames.empty() ? "" : " ") + std::string(Row.szName);
    }
    return strNames;
}

std::string Joined(const std::vector<std::string>& vecWords) {
    std::string strWords;
    for (const std::string& strWord : vecWords) {
        strWords += (strWords.empty() ? "" : " ") + strWord;
    }
    return strWords;
}

// The third word is a table; the command itself knows which there are.
void PutBash() {
    Put("_vornjsondb() {\n"
        "    local word=${COMP_WORDS[COMP_CWORD]} before=${COMP_WORDS[COMP_CWORD-1]} words=\n"
        "    COMPREPLY=()\n"
        "    if ((COMP_CWORD == 1)); then\n"
        "        words='" +
        CommandNames() +
        " --help --version'\n"
        "        COMPREPLY=($(compgen -W \"$words\" -- \"$word\"))\n"
        "        return\n"
        "    fi\n"
        "    case $before in\n");
    std::map<std::string, std::string> mapChoices;
    for (const Command& Of : AllCommands()) {
        for (const Option& Row : Of.vecOptions) {
            if (!Choices(Row).empty()) {
                mapChoices[Row.szName] = Joined(Choices(Row));
            }
        }
    }
    for (const auto& [strName, strChoices] : mapChoices) {
        Put("        " + strName + ") words='" + strChoices + "' ;;\n");
    }
    Put("    esac\n"
        "    if [[ -z $words && $word == -* ]]; then\n"
        "        case ${COMP_WORDS[1]} in\n");
    for (const Command& Of : AllCommands()) {
        Put("            " + std::string(Of.szName) + ") words='" + OptionNames(Of) + "' ;;\n");
    }
    Put("        esac\n"
        "    fi\n"
        "    if [[ -z $words && ${COMP_WORDS[1]} == completion ]]; then\n"
        "        words='bash zsh fish man'\n"
        "    elif [[ -z $words ]] && ((COMP_CWORD == 3)) && [[ -r ${COMP_WORDS[2]} ]]; then\n"
        "        words=$(vornjsondb tables \"${COMP_WORDS[2]}\" --format csv --no-headers "
        "2>/dev/null)\n"
        "    fi\n"
        "    if [[ -n $words ]]; then\n"
        "        COMPREPLY=($(compgen -W \"$words\" -- \"$word\"))\n"
        "    else\n"
        "        COMPREPLY=($(compgen -f -- \"$word\"))\n"
        "    fi\n"
        "}\n"
        "complete -o filenames -F _vornjsondb vornjsondb\n");
}

// zsh runs the script of bash, which is the same words.
void PutZsh() {
    Put("#compdef vornjsondb\n"
        "autoload -U +X bashcompinit && bashcompinit\n");
    PutBash();
}

std::string FishQuoted(const std::string& strText) {
    std::string strQuoted = "'";
    for (const char c : strText) {
        strQuoted += c == '\'' || c == '\\' ? std::string("\\") + c : std::string(1, c);
    }
    return strQuoted + "'";
}

void PutFish() {
    for (const Command& Of : AllCommands()) {
        const std::string strName = Of.szName;
        Put("complete -c vornjsondb -n __fish_use_subcommand -f -a " + strName + " -d " +
            FishQuoted(Of.szHelp) + "\n");
        for (const Option& Row : OptionsOf(Of)) {
            std::string strLine = "complete -c vornjsondb -n '__fish_seen_subcommand_from " +
                                  strName + "' -l " + (Row.szName + 2);
            strLine += *Row.szShort == '\0' ? "" : std::string(" -s ") + (Row.szShort + 1);
            strLine += *Row.szValue == '\0' ? "" : " -r";
            if (!Choices(Row).empty()) {
                strLine += " -f -a " + FishQuoted(Joined(Choices(Row)));
            }
            Put(strLine + " -d " + FishQuoted(Row.szHelp) + "\n");
        }
    }
    Put("complete -c vornjsondb -n '__fish_seen_subcommand_from completion' -f -a "
        "'bash zsh fish man'\n");
}

// A text of the manual: a backslash or a leading point would be a request to its formatter.
std::string Manual(const std::string& strText) {
    std::string strOut;
    for (const char c : strText) {
        const bool blLineBegins = strOut.empty() || strOut.back() == '\n';
        strOut += blLineBegins && (c == '.' || c == '\'') ? "\\&" : "";
        strOut += c == '\\' ? "\\e" : c == '-' ? "\\-" : std::string(1, c);
    }
    return strOut;
}

void PutManualOptions(const std::vector<Option>& vecOptions) {
    Put(".Bl -tag -width Ds\n");
    for (const Option& Row : vecOptions) {
        Put(".It ");
        Put(*Row.szShort == '\0' ? "" : std::string("Fl ") + (Row.szShort + 1) + " , ");
        Put("Fl " + Manual(Row.szName + 1) + (*Row.szValue == '\0' ? "" : " Ar ") + Row.szValue +
            "\n" + Manual(Row.szHelp) + "\n");
    }
    Put(".El\n");
}

void PutManual() {
    Put(".Dd November 21, 2026\n.Dt VORNJSONDB 1\n.Os\n"
        ".Sh NAME\n.Nm vornjsondb\n.Nd JSON records in SQLite tables\n"
        ".Sh SYNOPSIS\n.Nm\n.Ar SUBCOMMAND DB\n.Op Ar TABLE\n.Op Ar ...\n"
        ".Sh DESCRIPTION\nReads, changes and describes the records of any SQLite database.\n"
        "Options of every subcommand:\n");
    PutManualOptions(SharedOptions());
    for (const Command& Of : AllCommands()) {
        Put(".Ss " + std::string(Of.szName) + "\n" + Manual(Of.szHelp) +
            ".\n.Bd -literal\nvornjsondb " + Manual(std::string(Of.szName) + " " + Of.szWords) +
            "\n\n" + Manual(Of.szExamples) + ".Ed\n");
        if (*Of.szText != '\0') {
            Put(".Bd -literal\n" + Manual(Of.szText) + ".Ed\n");
        }
        if (!Of.vecOptions.empty()) {
            PutManualOptions(Of.vecOptions);
        }
    }
    Put(".Sh ENVIRONMENT\n.Bl -tag -width Ds\n"
        ".It Ev COLUMNS\nThe width of tables, where the terminal does not tell.\n"
        ".It Ev NO_COLOR\nIf set and not empty, there are no colours.\n.El\n"
        ".Sh FILES\nA database keeps definitions in its table\n.Ql vornjsondb_definition .\n"
        ".Sh EXIT STATUS\n"
        "0 fine, 1 unexpected, 2 usage, 3 bad data, 4 duplicate, 5 not found, 6 locked,\n"
        "7 input or output, 130 interrupted.\n"
        ".Sh SEE ALSO\n.Xr sqlite3 1\n");
}

}  // namespace

int RunCompletion(Context& Call) {
    struct Row {
        const char* szName;
        void (*pfnPut)();
    };
    constexpr Row kRows[] = {
        {"bash", PutBash}, {"zsh", PutZsh}, {"fish", PutFish}, {"man", PutManual}};
    for (const Row& Of : kRows) {
        if (Call.vecWords[0] == Of.szName) {
            Of.pfnPut();
            return kExitFine;
        }
    }
    Fail(kExitUsage,
         "\"" + Call.vecWords[0] + "\" is no shell known here; take bash, zsh, fish or man");
}

}  // namespace VORN_JSON_DB::Cli
