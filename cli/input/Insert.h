// Files of records into a table, which is made if there is none.

#ifndef VORNJSONDB_CLI_INPUT_INSERT_H
#define VORNJSONDB_CLI_INPUT_INSERT_H

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "../Command.h"

namespace VORN_JSON_DB::Cli {

struct InsertOptions {
    std::vector<std::string> vecFiles;  // "-" is standard input

    std::string strFormat;     // "json", "jsonl", "csv", "tsv"; empty: as the input looks
    std::string strDelimiter;  // one character; empty: as the format says
    bool blQuotes = true;
    bool blHeader = true;
    bool blEmptyIsText = false;  // bare empty cells of CSV

    // For a table that is made.
    std::vector<std::string> vecKey;
    std::vector<std::string> vecNotNull;
    std::vector<std::pair<std::string, std::string>> vecDefaults;  // member and value
    std::vector<std::pair<std::string, std::string>> vecTypes;     // member and "cpptype"

    OnDuplicate eOnDuplicate = OnDuplicate::kStop;
    bool blDryRun = false;
    bool blAddMembers = false;

    // Records in a transaction. 0: all; below: all, unless the input is very large.
    std::int64_t nBatch = -1;
    std::string strErrors;  // the file that bad records go to, instead of ending it all
};

// The options of a call of "insert", and what its row in the table of subcommands lists.
InsertOptions InsertOptionsOf(const Context& Call);
std::vector<Option> InsertOptionRows();

// The subcommand.
int RunInsert(Context& Call);

// An exit code, or an Error. Without a batch that was committed nothing is stored after an Error.
int RunInsert(Context& Call, const InsertOptions& How);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_INSERT_H
