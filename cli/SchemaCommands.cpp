// What a database holds and how: tables, schema, init, index, explain, lint, sync.

#include <algorithm>

#include "../table/FindingCodes.h"
#include "Commands.h"
#include "Conditions.h"
#include "Database.h"
#include "Definitions.h"
#include "JsonCells.h"
#include "Output.h"
#include "Sql.h"
#include "Tables.h"
#include "input/NewDefinition.h"

namespace VORN_JSON_DB::Cli {

namespace {

constexpr const char* kSeverities[] = {"note", "warning", "error"};

void AppendFindings(const FindingList& vecFindings, const std::string& strTable,
                    Json::Value& jFindings) {
    if (jFindings.isNull()) {
        jFindings = Json::Value(Json::arrayValue);
    }
    for (const Finding& Found : vecFindings) {
        Json::Value& jFinding = jFindings.append(Json::Value());
        jFinding["table"] = strTable;
        jFinding["severity"] = kSeverities[static_cast<int>(Found.eSeverity)];
        jFinding["code"] = Found.szCode;
        jFinding["path"] = Found.strPath;
        jFinding["message"] = Found.strMessage;
        jFinding["remedy"] = RemedyOf(Found);
    }
}

void PutFindings(const FindingList& vecFindings) {
    for (const Finding& Found : vecFindings) {
        const std::string strRemedy = RemedyOf(Found);
        Put(std::string(kSeverities[static_cast<int>(Found.eSeverity)]) + ": " + Found.strMessage +
            (strRemedy.empty() ? "" : "; " + strRemedy) + "\n");
    }
}

// All statements of one table, or of the database.
std::vector<std::string> CreateStatements(sqlite3* pDb, const std::string& strTable) {
    return Texts(pDb,
                 "SELECT sql FROM sqlite_master WHERE sql IS NOT NULL AND (?1 = '' OR tbl_name = "
                 "?1 COLLATE NOCASE) ORDER BY tbl_name, type <> 'table', name",
                 strTable);
}

// Of "size:int" words, whose names go to vecNames.
Json::Value MembersFromWords(const Context& Call, std::vector<std::string>& vecNames) {
    Json::Value jMembers(Json::objectValue);
    for (const std::string& strWord : Call.WordsFrom(2)) {
        const std::size_t nColon = strWord.find(':');
        if (nColon == std::string::npos || nColon == 0) {
            Fail(kExitUsage, "\"" + strWord + "\" is no member; write member:type");
        }
        const std::string strName = strWord.substr(0, nColon);
        if (!IsUtf8(strName)) {
            Fail(kExitUsage, "\"" + strName + "\": the name is no UTF-8; take another");
        }
        if (jMembers.isMember(strName)) {
            Fail(kExitUsage, "the member \"" + strName + "\" is there twice; name it once");
        }
        jMembers[strName]["cpptype"] = strWord.substr(nColon + 1);
        vecNames.push_back(strName);
    }
    return jMembers;
}

// What keeps a table from being opened is a finding like others, and not the end.
FindingList FindingsOf(const Context& Call) {
    FindingList vecFindings;
    try {
        OpenTable Open(Call, Access::kRead, KnownDefinition);
        Check(Open.Records.Lint(vecFindings), Call.Db());
    } catch (const Error& Failed) {
        if (Failed.vecFindings.empty()) {
            throw;
        }
        vecFindings = Failed.vecFindings;
    }
    return vecFindings;
}

// Another program has dropped or renamed their tables.
void AppendLeftOver(sqlite3* pDb, Json::Value& jFindings) {
    for (const std::string& strTable : LeftOverDefinitions(pDb)) {
        const Finding Found = {
            Severity::kWarning, "left-over", vornjsondb::Below("", strTable),
            "a definition of table \"" + strTable + "\" is kept, but the table is gone",
            "it is replaced when the table is made anew; a table that was renamed gets one by "
            "vornjsondb sync --def"};
        AppendFindings({Found}, strTable, jFindings);
    }
}

}  // namespace

int RunTables(Context& Call) {
    const Database pDb = OpenDatabase(Call, Access::kRead);
    Json::Value jTables(Json::arrayValue);
    for (const std::string& strName : TableNames(pDb.get())) {
        Json::Value jTable;
        jTable["table"] = strName;
        if (Call.Has("--counts")) {
            const Statement pCount = Prepare(pDb.get(), "SELECT count(*) FROM " + Quoted(strName));
            Step(pCount.get());
            jTable["records"] = Json::Int64(sqlite3_column_int64(pCount.get(), 0));
        }
        jTables.append(std::move(jTable));
    }
    std::vector<std::string> vecColumns = {"table", "records"};
    vecColumns.resize(Call.Has("--counts") ? 2 : 1);
    WriteObjects(Call, jTables, vecColumns);
    return kExitFine;
}

int RunSchema(Context& Call) {
    const bool blOne = Call.vecWords.size() > 1;
    if (blOne && Call.Json()) {
        Put(CompactJson(OpenTable(Call, Access::kRead).Records.Definition()) + "\n");
        return kExitFine;
    }
    const Database pDb = OpenDatabase(Call, Access::kRead);
    if (blOne && !TableExists(pDb.get(), Call.TableName())) {
        FailNoTable(Call, pDb.get());
    }
    const std::vector<std::string> vecStatements =
        CreateStatements(pDb.get(), blOne ? Call.TableName() : "");
    if (Call.Json()) {
        Put(CompactJson(Strings(vecStatements)) + "\n");
        return kExitFine;
    }
    for (const std::string& strStatement : vecStatements) {
        Put(strStatement + ";\n");
    }
    return kExitFine;
}

namespace {

void ShowNewTable(const Context& Call, const Json::Value& jDefinition, const std::string& strSql) {
    if (Call.Json()) {
        Json::Value jShown;
        jShown["definition"] = jDefinition;
        jShown["create"] = strSql;
        Put(CompactJson(jShown) + "\n");
    } else {
        Put(CompactJson(jDefinition) + "\n" + strSql + ";\n");
    }
}

}  // namespace

int RunInit(Context& Call) {
    const bool blFile = Call.Has("--def");
    if (blFile == (Call.vecWords.size() > 2)) {
        Fail(kExitUsage, "init takes member:type words or --def FILE; give one of them");
    }
    CheckNewName(Call.TableName());
    std::vector<std::string> vecColumns;
    const Json::Value jDefinition = blFile
                                        ? KnownDefinition(Call, nullptr, Call.TableName())
                                        : NewDefinition(Call, MembersFromWords(Call, vecColumns));
    std::string strSql;
    Check(CreateStatement(Call.TableName(), jDefinition, strSql, vecColumns), Call.Db(),
          kExitBadData);
    CheckDefaults(Call.TableName(), jDefinition);
    if (Call.Has("--dry-run")) {
        ShowNewTable(Call, jDefinition, strSql);
        return kExitFine;
    }
    const Database pDb = OpenDatabase(Call, Access::kCreate);
    CheckEncoding(Call, pDb.get());
    Transaction All;
    BeginChange(Call, pDb.get(), All);
    CheckFree(Call, pDb.get(), Call.TableName(), "extend it with vornjsondb sync");
    Run(pDb.get(), strSql);
    KeepDefinition(pDb.get(), Call.TableName(), jDefinition);
    Check(All.Commit(), Call.Db());
    Json::Value jResult;
    jResult["created"] = Call.TableName();
    Call.Report("created table \"" + Call.TableName() + "\"", jResult);
    return kExitFine;
}

int RunIndex(Context& Call) {
    const std::vector<std::string> vecMembers = Call.WordsFrom(2);
    OpenTable Open(Call, vecMembers.empty() ? Access::kRead : Access::kChange);
    if (!vecMembers.empty()) {
        std::string strSql;
        const std::size_t nBefore = CreateStatements(Open.pDb.get(), Call.TableName()).size();
        Check(Open.Records.CreateIndex(vecMembers, Call.Has("--unique"), &strSql), Call.Db());
        const bool blMade = CreateStatements(Open.pDb.get(), Call.TableName()).size() != nBefore;
        Json::Value jResult;
        jResult["sql"] = strSql;
        Call.Report((blMade ? "" : "there already: ") + strSql, jResult);
        return kExitFine;
    }
    const Statement pLook =
        Prepare(Open.pDb.get(), "SELECT name, \"unique\" FROM pragma_index_list(?1) ORDER BY name",
                Call.TableName());
    Json::Value jIndexes(Json::arrayValue);
    while (Step(pLook.get())) {
        Json::Value jIndex;
        jIndex["index"] = ColumnText(pLook.get(), 0);
        jIndex["unique"] = sqlite3_column_int(pLook.get(), 1) != 0;
        jIndex["members"] = Strings(
            Texts(Open.pDb.get(),
                  "SELECT coalesce(name, '(expression)') FROM pragma_index_info(?1) ORDER BY seqno",
                  jIndex["index"].asString()));
        jIndexes.append(std::move(jIndex));
    }
    WriteObjects(Call, jIndexes, {"index", "unique", "members"});
    return kExitFine;
}

int RunExplain(Context& Call) {
    OpenTable Open(Call, Access::kRead);
    const Query Which = ParseQuery(Call, Open.Records, Call.WordsFrom(2));
    if (Call.Has("--old")) {
        Json::Value jOldQuery;
        Check(Open.Records.ToOldQuery(Which, OldCall::kRead, jOldQuery), Call.Db());
        Put(CompactJson(jOldQuery) + "\n");
        return kExitFine;
    }
    Plan Found;
    if (Call.Has("--sql")) {
        Check(Open.Records.ExplainSql(Call.Text("--sql"), Found), Call.Db());
    } else {
        Check(Open.Records.Explain(Which, Found), Call.Db());
    }
    if (Call.Json()) {
        Json::Value jPlan;
        jPlan["sql"] = Found.strSql;
        jPlan["steps"] = Strings(Found.vecSteps);
        AppendFindings(Found.vecFindings, Call.TableName(), jPlan["findings"]);
        Put(CompactJson(jPlan) + "\n");
        return kExitFine;
    }
    Put(Found.strSql + "\n");
    for (const std::string& strStep : Found.vecSteps) {
        Put("  " + strStep + "\n");
    }
    PutFindings(Found.vecFindings);
    return kExitFine;
}

namespace {

int ExitBy(const Json::Value& jFindings) {
    const bool blError =
        std::any_of(jFindings.begin(), jFindings.end(),
                    [](const Json::Value& jFinding) { return jFinding["severity"] == "error"; });
    return blError ? kExitBadData : kExitFine;
}

}  // namespace

int RunLint(Context& Call) {
    std::vector<std::string> vecTables = Call.WordsFrom(1);
    Json::Value jFindings(Json::arrayValue);
    if (vecTables.empty()) {
        const Database pDb = OpenDatabase(Call, Access::kRead);
        vecTables = TableNames(pDb.get());
        AppendLeftOver(pDb.get(), jFindings);
    }
    for (const std::string& strTable : vecTables) {
        Call.vecWords.resize(1);
        Call.vecWords.push_back(strTable);
        AppendFindings(FindingsOf(Call), strTable, jFindings);
    }
    if (jFindings.empty() && !Call.Json()) {
        Call.Say("no findings");
    } else {
        WriteObjects(Call, jFindings, {"table", "severity", "code", "path", "message", "remedy"});
    }
    return ExitBy(jFindings);
}

int RunSync(Context& Call) {
    const bool blLook = Call.Has("--dry-run");
    OpenTable Open(Call, blLook ? Access::kRead : Access::kChange, KnownDefinition);
    SyncReport Done;
    Transaction All;
    if (!blLook) {
        BeginChange(Call, Open.pDb.get(), All);
    }
    Check(Open.Records.Sync(blLook ? SyncMode::kLook : SyncMode::kChange, Done), Call.Db(),
          kExitBadData);
    if (!blLook) {
        if (Call.Has("--def")) {
            KeepDefinition(Open.pDb.get(), Call.TableName(), Open.Records.Definition());
        }
        Check(All.Commit(), Call.Db());
    }
    Json::Value jDone;
    jDone["statements"] = Strings(Done.vecStatements);
    AppendFindings(Done.vecFindings, Call.TableName(), jDone["findings"]);
    const int nExit = ExitBy(jDone["findings"]);
    if (Call.Json()) {
        Put(CompactJson(jDone) + "\n");
        return nExit;
    }
    for (const std::string& strStatement : Done.vecStatements) {
        Put(strStatement + ";\n");
    }
    PutFindings(Done.vecFindings);
    if (Done.vecStatements.empty() && nExit == kExitFine) {
        Call.Say("nothing to do");
    }
    return nExit;
}

}  // namespace VORN_JSON_DB::Cli
