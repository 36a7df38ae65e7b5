// completion: what shells offer for a word that is being typed. Their scripts ask the command
// itself, so that they never run what a table is called as if it were theirs.

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <cstring>

#include "Commands.h"
#include "Database.h"
#include "Parse.h"
#include "Tables.h"

namespace VORN_JSON_DB::Cli {

namespace {

// Each candidate is a line: the word, a tab, and its help. Where there is none the shell offers
// files. Bash neither takes quotes off the words that it hands over nor quotes what it is offered.
constexpr char kBash[] =
    R"sh(_vornjsondb() {
    mapfile -t COMPREPLY < <(vornjsondb --complete-bash "${COMP_WORDS[@]:1:COMP_CWORD}" 2>/dev/null)
}
complete -o default -F _vornjsondb vornjsondb
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

// What a word means that was typed into bash, and the quote that is open at its end, or 0.
std::string Unquoted(const std::string& strTyped, char& cQuote) {
    std::string strWord;
    cQuote = '\0';
    for (std::size_t nAt = 0; nAt < strTyped.size(); ++nAt) {
        const char c = strTyped[nAt];
        const char cNext = nAt + 1 < strTyped.size() ? strTyped[nAt + 1] : '\0';
        const bool blEscape =
            c == '\\' && (cQuote == '\0' || (cQuote == '"' && std::strchr("$`\"\\", cNext)));
        if (blEscape && cNext != '\0') {
            strWord += strTyped[++nAt];
        } else if (c == cQuote) {
            cQuote = '\0';
        } else if (cQuote == '\0' && (c == '"' || c == '\'')) {
            cQuote = c;
        } else {
            strWord += c;
        }
    }
    return strWord;
}

// The word as bash has to read it, behind the quote that is open.
std::string QuotedForBash(const std::string& strWord, char cQuote) {
    std::string strQuoted;
    for (const char c : strWord) {
        const bool blPlain = static_cast<unsigned char>(c) >= 0x80 ||
                             std::isalnum(static_cast<unsigned char>(c)) != 0 ||
                             std::strchr("_-./,@%+", c) != nullptr;
        if (cQuote == '\'') {
            strQuoted += c == '\'' ? R"('\'')" : std::string(1, c);
        } else {
            const bool blEscape = cQuote == '"' ? std::strchr("$`\"\\", c) != nullptr : !blPlain;
            strQuoted += blEscape ? "\\" : "";
            strQuoted += c;
        }
    }
    return strQuoted;
}

bool HasControls(const std::string& strWord) {
    return std::any_of(strWord.begin(), strWord.end(), [](unsigned char c) { return c < ' '; });
}

class Offers {
  public:
    explicit Offers(std::string strTyped) : m_strTyped(std::move(strTyped)) {}
    Offers(std::string strTyped, char cQuote)
        : m_strTyped(std::move(strTyped)), m_blBash(true), m_cQuote(cQuote) {}

    const std::string& Typed() const { return m_strTyped; }

    // A word with a newline or a tab cannot stand in a line of its own.
    void Add(const std::string& strWord, const char* szHelp = "") const {
        if (strWord.compare(0, m_strTyped.size(), m_strTyped) != 0 || HasControls(strWord)) {
            return;
        }
        Put(m_blBash ? QuotedForBash(strWord, m_cQuote) + "\n" : strWord + "\t" + szHelp + "\n");
    }

  private:
    const std::string m_strTyped;
    const bool m_blBash = false;
    const char m_cQuote = '\0';
};

// The shell would do it before the command is called.
std::string WithHome(const std::string& strFile) {
    const char* const szHome = std::getenv("HOME");
    return strFile.compare(0, 2, "~/") == 0 && szHome != nullptr ? szHome + strFile.substr(1)
                                                                 : strFile;
}

void OfferTables(const std::string& strDb, const Offers& To) {
    Context Call;
    Call.vecWords = {WithHome(strDb)};
    Call.mapOptions["--wait"] = {"0"};
    try {
        for (const std::string& strName : TableNames(OpenDatabase(Call, Access::kRead).get())) {
            To.Add(strName);
        }
    } catch (const Error&) {
        // Then none is offered.
    }
}

void Offer(const std::vector<std::string>& vecWords, const Offers& To) {
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
    } else if (To.Typed().compare(0, 1, "-") == 0) {
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

}  // namespace

void PutCandidates(std::vector<std::string> vecWords, bool blBash) {
    char cQuote = '\0';
    for (std::string& strWord : vecWords) {
        strWord = blBash ? Unquoted(strWord, cQuote) : strWord;
    }
    const std::string strTyped = vecWords.empty() ? "" : vecWords.back();
    Offer(vecWords, blBash ? Offers(strTyped, cQuote) : Offers(strTyped));
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
