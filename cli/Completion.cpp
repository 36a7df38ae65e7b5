// completion: scripts for shells, made from the table of subcommands as the manual is.

#include "Commands.h"
#include "Manual.h"
#include "Parse.h"

namespace VORN_JSON_DB::Cli {

namespace {

constexpr char kShells[] = "bash zsh fish man";

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
        Put("        ");
        Put(strName);
        Put(") words='");
        Put(strChoices);
        Put("' ;;\n");
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
        "        words='" +
        std::string(kShells) +
        "'\n"
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

// Within single quotes, in a part that square brackets enclose.
std::string ZshHelp(const char* szText) {
    std::string strOut;
    for (const char* pAt = szText; *pAt != '\0'; ++pAt) {
        strOut += *pAt == '[' || *pAt == ']' ? "\\" : "";
        strOut += *pAt == '\'' ? "'\\''" : std::string(1, *pAt);
    }
    return strOut;
}

// One word for _arguments: names, help, and what the value may be.
std::string ZshOption(const Option& Of) {
    std::string strValue;
    if (!Choices(Of).empty()) {
        strValue = ":value:(" + Joined(Choices(Of)) + ")";
    } else if (*Of.szValue != '\0') {
        strValue = ":" + std::string(Of.szValue) + ":_files";
    }
    const std::string strNames =
        *Of.szShort == '\0' ? Of.szName : "'{" + std::string(Of.szShort) + "," + Of.szName + "}'";
    return "'" + std::string(Of.blRepeat ? "*" : "") + strNames + "[" + ZshHelp(Of.szHelp) + "]" +
           strValue + "'";
}

std::string ZshWords(const Command& Of) {
    const std::string strWords = Of.szWords;
    if (strWords.compare(0, 2, "DB") != 0) {
        return "'1:shell:(" + std::string(kShells) + ")'";
    }
    const bool blTable = strWords.find("TABLE") != std::string::npos;
    return std::string("'1:database:_files'") + (blTable ? " '2:table:_vornjsondb_tables'" : "") +
           " '*:word:_files'";
}

// What is read from the function path is the function's body at first, so that it calls what it
// made.
void PutZsh() {
    Put("#compdef vornjsondb\n"
        "_vornjsondb_tables() {\n"
        "    local -a tables=(${(f)\"$(vornjsondb tables ${(Q)words[2]} --format csv --no-headers "
        "2>/dev/null)\"})\n"
        "    compadd -a tables\n"
        "}\n"
        "_vornjsondb() {\n"
        "    local -a subcommands=(\n");
    for (const Command& Of : AllCommands()) {
        Put("        '" + std::string(Of.szName) + ":" + ZshHelp(Of.szHelp) + "'\n");
    }
    Put("    )\n"
        "    if ((CURRENT == 2)); then\n"
        "        _describe subcommand subcommands\n"
        "        return\n"
        "    fi\n"
        "    shift words\n"
        "    ((CURRENT--))\n"
        "    case $words[1] in\n");
    for (const Command& Of : AllCommands()) {
        Put("        " + std::string(Of.szName) + ") _arguments");
        for (const Option& Row : OptionsOf(Of)) {
            Put(" \\\n            " + ZshOption(Row));
        }
        Put(std::string(" \\\n            ") + ZshWords(Of) + " ;;\n");
    }
    Put("    esac\n"
        "}\n"
        "if [[ $funcstack[1] == _vornjsondb ]]; then\n"
        "    _vornjsondb \"$@\"\n"
        "else\n"
        "    compdef _vornjsondb vornjsondb\n"
        "fi\n");
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
    Put("complete -c vornjsondb -n '__fish_seen_subcommand_from completion' -f -a '" +
        std::string(kShells) +
        "'\n"
        "complete -c vornjsondb -n 'test (count (commandline -opc)) -eq 3' -f -a '(vornjsondb "
        "tables (commandline -opc)[3] --format csv --no-headers 2>/dev/null)'\n");
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
