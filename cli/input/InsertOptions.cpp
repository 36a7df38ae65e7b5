// From the words of a call to the options of an insert.

#include "Insert.h"

namespace VORN_JSON_DB::Cli {

namespace {

struct FlagRow {
    const char* szName;
    OnDuplicate eMode;
};

constexpr FlagRow kModes[] = {{"--skip", OnDuplicate::kSkip},
                              {"--replace", OnDuplicate::kReplace},
                              {"--upsert", OnDuplicate::kUpsert}};

OnDuplicate ModeOf(const Context& Call) {
    OnDuplicate eMode = OnDuplicate::kStop;
    for (const FlagRow& Row : kModes) {
        if (Call.Has(Row.szName) && eMode != OnDuplicate::kStop) {
            Fail(kExitUsage, "--skip, --replace and --upsert exclude each other; give one");
        }
        eMode = Call.Has(Row.szName) ? Row.eMode : eMode;
    }
    return eMode;
}

std::vector<std::pair<std::string, std::string>> Pairs(const Context& Call, const char* szOption) {
    std::vector<std::pair<std::string, std::string>> vecPairs;
    for (const std::string& strPair : Call.List(szOption)) {
        const size_t nEqual = strPair.find('=');
        if (nEqual == std::string::npos || nEqual == 0) {
            Fail(kExitUsage,
                 std::string(szOption) + ": \"" + strPair + "\" is not of the form MEMBER=VALUE");
        }
        vecPairs.emplace_back(strPair.substr(0, nEqual), strPair.substr(nEqual + 1));
    }
    return vecPairs;
}

}  // namespace

std::vector<Option> InsertOptionRows() {
    return {
        {"--key", "-k", "MEMBERS", "what tells a record from all others", true},
        {"--not-null", "", "MEMBERS", "members of a new table that must have a value", true},
        {"--default", "", "MEMBER=VALUE", "what a new table gives where a member is missing", true},
        {"--type", "", "MEMBER=TYPE", "a type for a new table, instead of the one seen", true},
        {"--skip", "", "", "leave a record as it is whose key is there"},
        {"--replace", "", "", "replace it, members that are missing getting their defaults"},
        {"--upsert", "", "", "change the members of it that are given"},
        {"--add-members", "", "", "add columns for members that the table lacks"},
        {"--format", "-f", "json|jsonl|csv|tsv", "of the input, instead of the one it looks like"},
        {"--delimiter", "", "CHARACTER", "between the cells of CSV"},
        {"--quote", "", "double|none", "whether quotes around cells of CSV are taken off"},
        {"--no-header", "", "", "CSV without names: the members are c1, c2 and so on"},
        {"--empty", "", "null|text", "what a bare empty cell of CSV is (null)"},
        {"--batch", "", "N", "commit after each N records; 0: all or nothing"},
        {"--errors", "", "FILE", "write bad records there, and go on without them"},
        {"--dry-run", "-n", "",
         "show the definition and what makes or extends the table; change nothing"},
    };
}

InsertOptions InsertOptionsOf(const Context& Call) {
    InsertOptions How;
    How.vecFiles = Call.WordsFrom(2);
    How.strFormat = Call.Text("--format");
    How.strDelimiter = Call.Text("--delimiter");
    How.blQuotes = Call.Text("--quote") != "none";
    How.blHeader = !Call.Has("--no-header");
    How.blEmptyIsText = Call.Text("--empty") == "text";
    How.vecKey = Call.Names("--key");
    How.vecNotNull = Call.Names("--not-null");
    How.vecDefaults = Pairs(Call, "--default");
    How.vecTypes = Pairs(Call, "--type");
    How.eOnDuplicate = ModeOf(Call);
    How.blDryRun = Call.Has("--dry-run");
    How.blAddMembers = Call.Has("--add-members");
    How.nBatch = Call.Whole("--batch", -1);
    How.strErrors = Call.Text("--errors");
    return How;
}

int RunInsert(Context& Call) {
    return RunInsert(Call, InsertOptionsOf(Call));
}

}  // namespace VORN_JSON_DB::Cli
