// The table of subcommands: parsing, --help, completion and the manual are made from it.

#include "Commands.h"
#include "input/Insert.h"

namespace VORN_JSON_DB::Cli {

namespace {

const Option kWhere{"--where", "-w", "JSON", R"(conditions, such as {"size": {"$gte": 5}})"};
const Option kSort{"--sort", "-s", "MEMBERS", "parted by commas; -size is descending", true};
const Option kLimit{"--limit", "-l", "N", "at most so many records"};
const Option kOffset{"--offset", "-o", "N", "leave out so many records first"};
const Option kMembers{"--members", "-m", "MEMBERS", "only these, parted by commas", true};
const Option kFormat{"--format", "-f", "json|jsonl|csv|tsv|table",
                     "table is what a terminal gets, json a file or a pipe"};
const Option kShape{"--format", "-f", "json|jsonl|csv|tsv|table",
                    "table, unless this or --json says otherwise"};
const Option kNulls{"--nulls", "", "omit|keep",
                    "members that are NULL, in JSON: leave out or null"};
const Option kNoHeaders{"--no-headers", "", "", "no line with the members' names"};
const Option kDryRun{"--dry-run", "-n", "", "show what would be done, and change nothing"};

const char kConditionText[] =
    "member=value means equal; the value is text for a text member, else JSON. member:=JSON is\n"
    "JSON for every member: name:=null. All conditions must hold.\n"
    "Operators of --where: $eq $ne $lt $lte $gt $gte $between $in $nin $null, for texts $like\n"
    "$prefix, for lists $contains; $and $or $not combine conditions.\n";

const std::vector<Command> kCommands = {
    {"list",
     "List the records of a table",
     "DB TABLE [member=value]...",
     "vornjsondb list shop.db product size=5 --sort -price,name --limit 10\n"
     "vornjsondb list shop.db product --where '{\"name\": {\"$prefix\": \"a\"}}' --format "
     "csv\n",
     kConditionText,
     {kWhere, kSort, kLimit, kOffset, kMembers, kFormat, kNulls, kNoHeaders},
     RunList},
    {"get",
     "Show the record with a key",
     "DB TABLE KEY",
     "vornjsondb get shop.db product 17\n"
     "vornjsondb get shop.db price '{\"product\": 17, \"country\": \"FR\"}'\n",
     "A key of several members is a JSON object. Without such a record the exit code is 5.\n",
     {kMembers, kFormat, kNulls, kNoHeaders},
     RunGet},
    {"count",
     "Count the records of a table",
     "DB TABLE [member=value]...",
     "vornjsondb count shop.db product\n"
     "vornjsondb count shop.db product size=5\n",
     kConditionText,
     {kWhere},
     RunCount},
    {"tables",
     "List the tables of a database",
     "DB",
     "vornjsondb tables shop.db --counts\n",
     "",
     {{"--counts", "-c", "", "count the records, too"}, kShape, kNoHeaders},
     RunTables},
    {"schema",
     "Show how tables were created",
     "DB [TABLE]",
     "vornjsondb schema shop.db\n"
     "vornjsondb schema shop.db product --json > product.def\n",
     "With --json and a table it is the table's definition, as --def takes it.\n",
     {},
     RunSchema},
    {"update",
     "Set members of records",
     "DB TABLE [KEY]... member=value...",
     "vornjsondb update shop.db product 17 price=9.5 note:=null\n"
     "vornjsondb update shop.db product --where '{\"size\": 5}' price=9.5\n",
     "All records or none are changed. A key with an equals sign is selected by --where.\n",
     {kWhere},
     RunUpdate},
    {"delete",
     "Remove records",
     "DB TABLE [KEY]...",
     "vornjsondb delete shop.db product 17 18\n"
     "vornjsondb delete shop.db product --where '{\"size\": {\"$lt\": 5}}'\n"
     "vornjsondb delete shop.db product --all --yes\n",
     "All of them or none are removed.\n",
     {kWhere, {"--all", "", "", "every record"}, {"--yes", "-y", "", "--all is meant"}},
     RunDelete},
    {"upsert",
     "Insert a record, or change the one that has its key",
     "DB TABLE RECORD|member=value...",
     "vornjsondb upsert shop.db product id=17 name=tea price=9.5\n"
     "vornjsondb upsert shop.db product '{\"id\": 17, \"price\": 9.5}'\n",
     "Members that are not given stay as they are.\n",
     {},
     RunUpsert},
    {"insert",
     "Load records from files, into a table that is made if there is none",
     "DB TABLE FILE...",
     "vornjsondb insert shop.db product products.json --key id\n"
     "vornjsondb insert shop.db product new.csv --skip --errors bad.jsonl\n"
     "curl -s $URL | vornjsondb insert shop.db product - --upsert\n",
     "A file is a JSON list, an object with one such list, JSON Lines, CSV or TSV; - is\n"
     "standard input. A new table gets the types of all records: these are read twice, unless\n"
     "a file's first ones tell them.\n"
     "All records of a call are stored, or none: from 1 GiB on, or with --batch, the batches\n"
     "before a failure stay. A record whose key is there already is a failure, unless --skip,\n"
     "--replace or --upsert is given. Ctrl-C undoes the batch that is under way. A record has at\n"
     "most 16 MiB of text.\n",
     {{"--key", "-k", "MEMBERS", "what tells a record from all others", true},
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
       "show the definition and what makes or extends the table; change nothing"}},
     RunInsert},
    {"init",
     "Create a table",
     "DB TABLE [member:type]...",
     "vornjsondb init shop.db product id:int name:string price:double --key id\n"
     "vornjsondb init shop.db product --def product.def\n",
     "Types: string, bool, int, \"long long\", double, Json::Value and the others of a\n"
     "definition. The definition is kept in the database.\n",
     {{"--key", "-k", "MEMBERS", "what tells a record from all others", true},
      {"--not-null", "", "MEMBERS", "members that must not be NULL", true},
      {"--unique", "", "MEMBERS", "members whose values differ in all records", true},
      {"--default", "", "member=value", "the value of a new record that lacks it", true},
      kDryRun},
     RunInit},
    {"index",
     "List indexes, or create one",
     "DB TABLE [MEMBER]...",
     "vornjsondb index shop.db product\n"
     "vornjsondb index shop.db product size price\n",
     "",
     {{"--unique", "-u", "", "no two records may have the same values"}, kShape, kNoHeaders},
     RunIndex},
    {"explain",
     "Show SQL, plan and advice for a query",
     "DB TABLE [member=value]...",
     "vornjsondb explain shop.db product size=5 --sort name\n"
     "vornjsondb explain shop.db product --sql 'SELECT * FROM product WHERE size = 5'\n",
     kConditionText,
     {kWhere,
      kSort,
      kLimit,
      kOffset,
      kMembers,
      {"--sql", "", "STATEMENT", "explain this statement that reads the table"},
      {"--old", "", "", "show the query object for VornJsonDbApi"}},
     RunExplain},
    {"lint",
     "Look for mistakes in definitions and tables",
     "DB [TABLE]...",
     "vornjsondb lint shop.db\n"
     "vornjsondb lint shop.db product --def product.def\n",
     "With an error among the findings the exit code is 3.\n",
     {kShape, kNoHeaders},
     RunLint},
    {"sync",
     "Extend a table to its definition",
     "DB TABLE",
     "vornjsondb sync shop.db product --def product.def --dry-run\n"
     "vornjsondb sync shop.db product --def product.def\n",
     "Adds columns and unique indexes. Nothing is dropped or rebuilt.\n",
     {kDryRun},
     RunSync},
    {"doctor",
     "Check a database and see who holds it",
     "DB",
     "vornjsondb doctor shop.db\n",
     "With a fault found the exit code is 3. Locks are known on Linux only.\n",
     {kShape, kNoHeaders},
     RunDoctor},
    {"dump",
     "Write a table with all that belongs to it as JSON Lines",
     "DB TABLE",
     "vornjsondb dump shop.db product > product.dump\n",
     "Definition, indexes, triggers and every value, exact. Read back by load.\n",
     {},
     RunDump},
    {"load",
     "Create a table from what dump wrote",
     "DB [FILE]",
     "vornjsondb load other.db product.dump\n"
     "vornjsondb dump shop.db product | vornjsondb load other.db\n",
     "Whole or not at all. There must be no such table yet.\n",
     {},
     RunLoad},
    {"completion",
     "Write the completion script of a shell",
     "bash|zsh|fish|man",
     "mkdir -p ~/.local/share/bash-completion/completions ~/.config/fish/completions\n"
     "vornjsondb completion bash > ~/.local/share/bash-completion/completions/vornjsondb\n"
     "vornjsondb completion fish > ~/.config/fish/completions/vornjsondb.fish\n",
     "man writes the manual page.\n",
     {},
     RunCompletion},
};

}  // namespace

const std::vector<Command>& AllCommands() {
    return kCommands;
}

const char kOverviewExamples[] =
    "vornjsondb insert shop.db product products.json --key id\n"
    "vornjsondb list shop.db product size=5 --sort -price\n"
    "vornjsondb update shop.db product 17 price=9.5\n"
    "vornjsondb list shop.db product --format csv > products.csv\n";

const std::vector<ExitMeaning>& AllExits() {
    static const std::vector<ExitMeaning> vecExits = {
        {kExitFine, "done; an empty list is no failure"},
        {kExitUnexpected, "anything else, such as no memory"},
        {kExitUsage, "the command line is wrong"},
        {kExitBadData, "data, a definition or a database is not as it must be"},
        {kExitDuplicate, "a record or a table is there already"},
        {kExitNotFound, "there is no such record or table"},
        {kExitLocked, "another program held the database for too long"},
        {kExitIo, "a file cannot be opened, read or written, or is no database"},
        {kExitInterrupted, "stopped by Ctrl-C"},
    };
    return vecExits;
}

const std::vector<Option>& SharedOptions() {
    static const std::vector<Option> vecShared = {
        {"--def", "-d", "FILE", "the table's definition, instead of the one in the database"},
        {"--wait", "", "MS", "how long to wait for a locked database (5000)"},
        {"--json", "-j", "", "results for machines, on standard output"},
        {"--quiet", "-q", "", "no messages but errors"},
        {"--help", "-h", "", "show this"},
        {"--version", "-V", "", "show the version"},
    };
    return vecShared;
}

}  // namespace VORN_JSON_DB::Cli
