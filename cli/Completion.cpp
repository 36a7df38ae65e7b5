// completion: what shells offer for a word that is being typed. Their scripts ask the command
// itself, so that they never run what a table is called as if it were theirs.

#include "Commands.h"
#include "Database.h"
#include "Parse.h"

namespace VORN_JSON_DB::Cli {

namespace {

// Words are handed over as they are, and each candidate is a line: the word, a tab, and its help.
// Where there is none the shell offers files.
constexpr char kBash[] =
    R"sh(_vornjsondb() {
    local word=${COMP_WORDS[COMP_CWORD]}
    mapfile -t COMPREPLY < <(vornjsondb --complete "${COMP_WORDS[@]:1:COMP_CWORD}" 2>/dev/null | cut -f 1)
    if ((${#COMPREPLY[@]} == 0)); then
        mapfile -t COMPREPLY < <(compgen -f -- "$word")
    fi
}
complete -o filenames -F _vornjsondb vornjsondb
)sh";

// What is read from the function path is the function's body at first, so that it calls what it
// made.
constexpr char kZsh[] =
    R"sh(#compdef vornjsondb
_vornjsondb() {
    local -a found=(${(f)"$(vornjsondb --complete "${(@Q)words[2,CURRENT]}" 2>/dev/null)"})
    found=(${found//:/\\:})
    found=(${found//$'\t'/:})
    if ((${#found})); then
        _describe word found
    else
        _files
    fi
}
if [[ $funcstack[1] == _vornjsondb ]]; then
    _vornjsondb "$@"
else
    compdef _vornjsondb vornjsondb
fi
)sh";

constexpr char kFish[] =
    R"sh(function __vornjsondb_complete
    set -l words (commandline -opc) (string unescape -- (commandline -ct))
    set -l found (vornjsondb --complete $words[2..-1] 2>/dev/null)
    if test (count $found) -gt 0
        printf '%s\n' $found
    else
        __fish_complete_path (commandline -ct)
    end
end
complete -c vornjsondb -f -a '(__vornjsondb_complete)'
)sh";

struct PageRow {
    const char* szName;
    const char* szScript;  // null: the manual
};

constexpr PageRow kPages[] = {{"bash", kBash}, {"zsh", kZsh}, {"fish", kFish}, {"man", nullptr}};

class Offers {
  public:
    explicit Offers(std::string strTyped) : m_strTyped(std::move(strTyped)) {}

    void Add(const std::string& strWord, const char* szHelp = "") const {
        if (strWord.compare(0, m_strTyped.size(), m_strTyped) == 0) {
            Put(strWord + "\t" + szHelp + "\n");
        }
    }

  private:
    const std::string m_strTyped;
};

void OfferTables(const std::string& strDb, const Offers& To) {
    Context Call;
    Call.vecWords = {strDb};
    Call.mapOptions["--wait"] = {"0"};
    try {
        for (const std::string& strName : TableNames(OpenDatabase(Call, Access::kRead).get())) {
            To.Add(strName);
        }
    } catch (const Error&) {
        // Then none is offered.
    }
}

}  // namespace

void PutCandidates(const std::vector<std::string>& vecWords) {
    const std::string strTyped = vecWords.empty() ? "" : vecWords.back();
    const Offers To(strTyped);
    if (vecWords.size() < 2) {
        for (const Command& Row : AllCommands()) {
            To.Add(Row.szName, Row.szHelp);
        }
        To.Add("--help", "show what there is");
        To.Add("--version", "show the version");
        return;
    }
    const Command* const pOf = FindCommand(vecWords[0]);
    if (pOf == nullptr) {
        return;
    }
    const std::vector<Option> vecOptions = OptionsOf(*pOf);
    const Option* const pBefore = FindOption(vecOptions, vecWords[vecWords.size() - 2]);
    if (pBefore != nullptr && *pBefore->szValue != '\0') {
        for (const std::string& strChoice : Choices(pBefore->szValue)) {
            To.Add(strChoice);
        }
    } else if (strTyped.compare(0, 1, "-") == 0) {
        for (const Option& Row : vecOptions) {
            To.Add(Row.szName, Row.szHelp);
        }
    } else if (vecWords.size() == 2) {
        for (const std::string& strChoice : Choices(pOf->szWords)) {
            To.Add(strChoice);
        }
    } else if (vecWords.size() == 3 && std::string(pOf->szWords).find("TABLE") <= 4) {
        OfferTables(vecWords[1], To);
    }
}

int RunCompletion(Context& Call) {
    for (const PageRow& Row : kPages) {
        if (Call.vecWords[0] == Row.szName) {
            Row.szScript == nullptr ? PutManual() : Put(Row.szScript);
            return kExitFine;
        }
    }
    Fail(kExitUsage,
         "\"" + Call.vecWords[0] + "\" is no shell known here; take bash, zsh, fish or man");
}

}  // namespace VORN_JSON_DB::Cli
