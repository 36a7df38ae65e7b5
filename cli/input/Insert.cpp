#include "Insert.h"

#include <unistd.h>

#include <algorithm>
#include <memory>
#include <optional>

#include "../Database.h"
#include "../Definitions.h"
#include "../JsonCells.h"
#include "../Replacements.h"
#include "../Sql.h"
#include "../Tables.h"
#include "InputFiles.h"
#include "Interrupt.h"
#include "LoaderSink.h"
#include "NewDefinition.h"
#include "Progress.h"
#include "TypesSink.h"

namespace VORN_JSON_DB::Cli {

namespace {

// More than this is not undone as one: the undoing takes as long as the work.
constexpr std::int64_t kMostAtOnce = std::int64_t{1} << 30;
constexpr std::int64_t kLargeBatch = 100000;

// The first so many records mostly tell the types of all, which spares reading the input twice. It
// is no more than a guess: all records are looked at while they are stored, and where they tell
// otherwise it is done again, with what they tell together.
constexpr std::int64_t kLookedAt = 1000;
struct WrongGuess {};

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

std::string Pretty(const Json::Value& jValue) {
    Json::StreamWriterBuilder Builder;
    Builder["indentation"] = "  ";
    return Json::writeString(Builder, jValue);
}

bool ExitMayBeTypes(int nExit) {
    return nExit != kExitInterrupted && nExit != kExitLocked && nExit != kExitIo;
}

class Import {
  public:
    // blMayGuess: WrongGuess may be thrown, and nothing has happened then.
    Import(Context& Call, bool blMayGuess)
        : m_Call(Call),
          m_eOnDuplicate(ModeOf(Call)),
          m_Files(Call),
          m_strTable(NameForSqlite(Call.TableName(), Access::kChange)),
          m_blMayGuess(blMayGuess) {}

    int Run();

  private:
    void OpenFile();
    void FindDefinition();
    void LearnTypes();
    bool MayGuess() const;
    void CheckGuess();
    std::string CreateSql() const;
    std::vector<std::string> Statements();
    int ShowDryRun();
    void CheckColumns() const;
    void Prepare();
    void CheckKey();
    void Load();
    void BeginBatch();
    bool AfterRecord();
    void CommitBatch();
    void NoteNulls();
    void Keep();
    int Finish();
    std::string WhatIsStored() const;

    Context& m_Call;
    const OnDuplicate m_eOnDuplicate;
    InputFiles m_Files;
    const std::string m_strTable;
    const bool m_blMayGuess;
    bool m_blGuessed = false;
    Inference m_AllSeen;  // while records are stored into a table that was guessed
    Database m_pDb;
    bool m_blTableThere = false;
    bool m_blKept = false;    // the database keeps the definition, or will
    bool m_blToKeep = false;  // it is not there yet as it is
    bool m_blAdded = false;   // the table lacks members of the definition
    Json::Value m_jDefinition;
    std::vector<std::string> m_vecColumns;  // of a table that is made: as the records have them
    Json::Value m_jOwnKey;  // of the definition, where --key gives another for this call
    std::vector<std::string> m_vecNotes;
    std::int64_t m_nBatch = 0;
    std::int64_t m_nStored = 0;            // records that a commit has dealt with
    std::optional<Replacements> m_Others;  // of the transaction that is under way
    std::int64_t m_nInserted = 0;          // before it
    std::int64_t m_nGone = 0;
    // In this order: each works on what is above it.
    Transaction m_All;
    Table m_Table;
    Loader m_Into;
    std::unique_ptr<Progress> m_pProgress;
    std::unique_ptr<ErrorFile> m_pErrors;
    std::unique_ptr<LoaderSink> m_pSink;
};

int Import::Run() {
    try {
        OpenFile();
        FindDefinition();
        if (m_Call.Has("--dry-run")) {
            return ShowDryRun();
        }
        Load();
        return Finish();
    } catch (Error& Failed) {
        m_pProgress.reset();
        // Other types might do with what is bad data to these.
        if (m_blGuessed && ExitMayBeTypes(Failed.nExit)) {
            throw WrongGuess();
        }
        // A file that cannot be opened says enough.
        const bool blOpen = m_pDb != nullptr || Failed.nExit == kExitInterrupted;
        if (blOpen && !m_Call.Has("--dry-run")) {
            Failed.strLine += WhatIsStored();
        }
        throw;
    }
}

std::string Import::WhatIsStored() const {
    return m_nStored == 0 ? " (nothing is stored)"
                          : " (the first " + std::to_string(m_nStored) +
                                " records are dealt with "
                                "and stay)";
}

// What only looks makes no file.
void Import::OpenFile() {
    if (m_Call.Has("--dry-run") && access(m_Call.Db().c_str(), F_OK) != 0) {
        sqlite3* pDb = nullptr;
        sqlite3_open(":memory:", &pDb);
        m_pDb.reset(pDb);
        return;
    }
    m_pDb = OpenDatabase(m_Call, m_Call.Has("--dry-run") ? Access::kRead : Access::kCreate);
}

void Import::FindDefinition() {
    CheckEncoding(m_Call, m_pDb.get());
    m_blTableThere = TableExists(m_pDb.get(), m_strTable);
    if (!m_blTableThere) {
        CheckNewName(m_strTable);
        CheckFree(m_Call, m_pDb.get(), m_strTable, "");
    }
    m_jDefinition = CurrentDefinition(m_Call, m_pDb.get(), m_strTable);
    m_blKept = !m_jDefinition.isNull();
    m_blToKeep = m_Call.Has("--def");
    const Json::Value jTable =
        m_blKept ? m_jDefinition[m_strTable] : Json::Value(Json::objectValue);
    if (!jTable.isObject() || !jTable.get("member", Json::objectValue).isObject()) {
        Fail(kExitBadData, m_Call.Db() + ": the definition of table \"" + m_strTable +
                               R"(" is no object with an object "member"; give one by --def FILE)");
    }
    if (m_blTableThere && !m_blKept) {
        Check(DefinitionOf(m_pDb.get(), m_strTable, m_jDefinition), m_Call.Db());
    }
    const bool blForNew =
        m_Call.Has("--not-null") || m_Call.Has("--default") || m_Call.Has("--type");
    if (m_blTableThere && blForNew) {
        Fail(kExitUsage, "--not-null, --default and --type are for tables that are made, and \"" +
                             m_strTable + "\" is there");
    }
    if (m_Call.Has("--key") && !m_jDefinition.isNull()) {
        Json::Value& jKey = m_jDefinition[m_strTable]["key"];
        m_jOwnKey = jKey;
        jKey = Strings(m_Call.Names("--key"));
    }
    if (m_jDefinition.isNull() || m_Call.Has("--add-members")) {
        LearnTypes();
    }
    CheckColumns();
}

// What is committed in parts cannot be done again, nor can what is read no second time by name.
bool Import::MayGuess() const {
    const std::vector<std::string> vecFiles = m_Call.WordsFrom(2);
    const bool blFiles = std::count(vecFiles.begin(), vecFiles.end(), "-") == 0 &&
                         m_Files.AllBytes() >= 0 && m_Files.AllBytes() <= kMostAtOnce;
    return m_blMayGuess && blFiles && m_jDefinition.isNull() && !m_Call.Has("--batch") &&
           !m_Call.Has("--errors") && !m_Call.Has("--dry-run");
}

void Import::LearnTypes() {
    const std::int64_t nMost = MayGuess() ? kLookedAt : -1;
    TypesSink Seen(m_Call.Has("--errors"), [this, nMost](std::int64_t nRecords) {
        m_pProgress->Tick(nRecords, m_Files.BytesRead());
        return !Interrupt::Came() && nRecords != nMost;
    });
    m_pProgress = std::make_unique<Progress>("reading types", m_Files.AllBytes(), m_Call.Quiet());
    const bool blDone = m_Files.Read(
        Seen, [&](const std::string& strName, bool blCells) { Seen.Begin(strName, blCells); },
        true);
    m_pProgress.reset();
    if (Interrupt::Came()) {
        FailInterrupted();
    }
    m_blGuessed = !blDone;
    if (m_blGuessed && !Seen.AllHaveValues()) {
        throw WrongGuess();
    }
    m_vecNotes = Seen.Notes();
    if (!m_jDefinition.isNull()) {
        m_blAdded = AddSeenMembers(m_strTable, Seen, m_jDefinition);
        m_blToKeep = m_blToKeep || m_blAdded;
        return;
    }
    if (Seen.Records() == 0) {
        Fail(kExitBadData, m_Files.Formats() + ": there are no records to make a table from");
    }
    m_jDefinition = NewDefinition(m_Call, Seen.Members());
    m_vecColumns = Seen.Names();
    if (m_jDefinition[m_strTable]["member"].empty()) {
        Fail(kExitBadData, m_Files.Formats() + ": no record has a member to make a table from");
    }
    m_blToKeep = true;
}

void Import::CheckGuess() {
    NoteNulls();
    if (NewDefinition(m_Call, m_AllSeen.Members()) != m_jDefinition ||
        m_AllSeen.Names() != m_vecColumns) {
        throw WrongGuess();
    }
    m_vecNotes = m_AllSeen.Notes();
}

void Import::CheckColumns() const {
    const Json::ArrayIndex nMembers = m_jDefinition[m_strTable]["member"].size();
    const int nMost = sqlite3_limit(m_pDb.get(), SQLITE_LIMIT_COLUMN, -1);
    if (nMembers > static_cast<unsigned>(nMost)) {
        Fail(kExitBadData, "the records have " + std::to_string(nMembers) +
                               " different members, and a table has at most " +
                               std::to_string(nMost) + " columns");
    }
}

std::string Import::CreateSql() const {
    std::string strSql;
    Check(CreateStatement(m_strTable, m_jDefinition, strSql, m_vecColumns), m_Call.Db(),
          kExitBadData);
    CheckDefaults(m_strTable, m_jDefinition);
    return strSql;
}

// What would make the table, or extend the one that is there.
std::vector<std::string> Import::Statements() {
    if (!m_blTableThere) {
        return {CreateSql()};
    }
    SyncReport Report;
    if (m_blAdded) {
        Check(m_Table.Open(m_pDb.get(), m_strTable, m_jDefinition, HowToOpen()), m_Call.Db(),
              kExitBadData);
        Check(m_Table.Sync(SyncMode::kLook, Report), m_Call.Db());
    }
    return Report.vecStatements;
}

int Import::ShowDryRun() {
    const std::vector<std::string> vecStatements = Statements();
    if (m_Call.Json()) {
        Json::Value jShown;
        jShown["definition"] = m_jDefinition;
        if (m_blTableThere) {
            jShown["alter"] = Strings(vecStatements);
        } else {
            jShown["create"] = vecStatements[0];
        }
        Put(Pretty(jShown) + "\n");
    } else {
        Put(Pretty(m_jDefinition) + "\n");
        for (const std::string& strSql : vecStatements) {
            Put(strSql + ";\n");
        }
    }
    for (const std::string& strNote : m_vecNotes) {
        m_Call.Say(strNote);
    }
    return kExitFine;
}

// The table, its definition and the first records come to be at once.
void Import::Prepare() {
    Options How = HowToOpen();
    BeginChange(m_Call, m_pDb.get(), m_All);
    if (!m_blTableThere && TableExists(m_pDb.get(), m_strTable)) {
        Fail(kExitDuplicate, m_Call.Db() + ": another program has just made the table \"" +
                                 m_strTable + "\"; try again, into that table");
    }
    if (!m_blTableThere) {
        How.strSqlCreate = CreateSql();
    }
    // The names come from the records.
    Check(m_Table.Open(m_pDb.get(), m_strTable, m_jDefinition, How), m_Call.Db(), kExitBadData);
    if (m_blAdded) {
        SyncReport Report;
        Check(m_Table.Sync(SyncMode::kChange, Report), m_Call.Db());
        Check(m_Table.Open(m_pDb.get(), m_strTable, m_jDefinition, How), m_Call.Db());
    }
    if (m_eOnDuplicate != OnDuplicate::kStop && m_Table.KeyMembers().empty()) {
        Fail(kExitUsage, m_Call.Db() + ": --skip, --replace and --upsert need a key, and table \"" +
                             m_strTable + "\" has none; name it with --key MEMBER");
    }
    CheckKey();
    if (m_blToKeep) {
        Keep();
        m_blKept = true;
    }
    LoadOptions HowToLoad;
    HowToLoad.eOnDuplicate = m_eOnDuplicate;
    HowToLoad.nRowsPerTransaction = 0;
    HowToLoad.blGoOnAfterBad = m_Call.Has("--errors");
    Check(m_Into.Start(m_Table, HowToLoad), m_Call.Db());
    m_Others.emplace(m_pDb.get(), m_strTable);
}

// SQLite finds a record by its key only where no two can have the same, and else looks at all.
void Import::CheckKey() {
    FindingList vecFindings;
    if (m_eOnDuplicate != OnDuplicate::kStop) {
        Check(m_Table.Lint(vecFindings), m_Call.Db());
    }
    std::string strWords;
    for (const std::string& strMember : m_Table.KeyMembers()) {
        strWords += " " + strMember;
    }
    for (const Finding& Found : vecFindings) {
        if (std::string_view("key-not-unique") == Found.szCode) {
            const std::string strLine = m_Call.Db() + ": " + Found.strMessage +
                                        "; make it so by vornjsondb index " + m_Call.Db() + " " +
                                        m_strTable + strWords + " --unique";
            if (m_eOnDuplicate != OnDuplicate::kUpsert) {
                Fail(kExitBadData, strLine);
            }
            m_Call.Say(strLine + ", which spares looking at all records for each");
        }
    }
}

void Import::Load() {
    const std::int64_t nBytes = m_Files.AllBytes();
    const bool blLarge = !m_Call.Has("--batch") && nBytes > kMostAtOnce;
    m_nBatch = blLarge ? kLargeBatch : m_Call.Whole("--batch", 0);
    if (blLarge) {
        m_Call.Say("more than 1 GiB: committing after each " + std::to_string(kLargeBatch) +
                   " records; --batch 0 makes it all or nothing");
    }
    if (m_Call.Has("--errors")) {
        std::vector<std::string> vecNeeded = m_Call.WordsFrom(2);
        vecNeeded.push_back(m_Call.Text("--def"));
        for (const char* const szSuffix : {"", "-journal", "-wal", "-shm"}) {
            vecNeeded.push_back(m_Call.Db() + szSuffix);
        }
        m_pErrors = std::make_unique<ErrorFile>(m_Call.Text("--errors"), vecNeeded);
    }
    Prepare();
    const bool blMode = m_eOnDuplicate != OnDuplicate::kStop;
    m_pSink = std::make_unique<LoaderSink>(
        m_Table, m_Into, m_pErrors.get(), m_blGuessed ? &m_AllSeen : nullptr, blMode,
        [this] { BeginBatch(); }, [this] { return AfterRecord(); });
    // Nobody is kept from writing while the first record is waited for.
    if (m_nBatch > 0 && m_blTableThere && !m_blToKeep) {
        CommitBatch();
    }
    m_pProgress = std::make_unique<Progress>("inserting", nBytes, m_Call.Quiet());
    const auto fnBegin = [this](const std::string& strName, bool blCells) {
        m_pSink->BeginInput(strName, blCells);
    };
    if (!m_Files.Read(*m_pSink, fnBegin, false)) {
        FailInterrupted();
    }
    if (m_blGuessed) {
        CheckGuess();
    }
    CommitBatch();
    m_pProgress.reset();
}

// No sooner than there is something to store: a pipe may be silent for long.
void Import::BeginBatch() {
    if (!m_All.IsOpen()) {
        BeginChange(m_Call, m_pDb.get(), m_All);
        m_Others.emplace(m_pDb.get(), m_strTable);
    }
}

bool Import::AfterRecord() {
    const std::int64_t nRecords = m_Into.Counts().nRecords;
    m_pProgress->Tick(nRecords, m_Files.BytesRead());
    if (m_nBatch > 0 && nRecords - m_nStored >= m_nBatch) {
        CommitBatch();
    }
    return !Interrupt::Came();
}

void Import::CommitBatch() {
    if (m_pErrors) {
        m_pErrors->Write();
    }
    // It is not where all were bad.
    if (m_All.IsOpen()) {
        NoteNulls();
        CheckInPlace(m_Call, m_pDb.get());
        const std::int64_t nInserted = m_Into.Counts().nInserted;
        m_nGone += m_Others->Gone(nInserted - m_nInserted);
        m_nInserted = nInserted;
        m_Others.reset();
        Check(m_Into.Commit(), m_Call.Db());
        Check(m_All.Commit(), m_Call.Db());
    }
    m_nStored = m_Into.Counts().nRecords;
}

void Import::Keep() {
    Json::Value jKept = m_jDefinition;
    if (m_blTableThere && m_Call.Has("--key")) {
        jKept[m_strTable].removeMember("key");
        if (!m_jOwnKey.isNull()) {
            jKept[m_strTable]["key"] = m_jOwnKey;
        }
    }
    KeepDefinition(m_pDb.get(), m_strTable, jKept);
}

// Nulls that came into a table that was there are to come back as null.
void Import::NoteNulls() {
    bool blNew = false;
    Json::Value& jMembers = m_jDefinition[m_strTable]["member"];
    for (size_t i = 0; i < m_Table.Members().size(); ++i) {
        Json::Value& jMember = jMembers[m_Table.Members()[i]];
        if (m_pSink->NullsGiven()[i] && !jMember.isMember("nullSeen")) {
            jMember["nullSeen"] = true;
            blNew = true;
        }
    }
    if (blNew && m_blKept) {
        Keep();
    }
}

int Import::Finish() {
    const LoadCounts& Counts = m_Into.Counts();
    const struct {
        const char* szName;
        std::int64_t nCount;
    } aCounts[] = {{"inserted", Counts.nInserted},
                   {"replaced", Counts.nReplaced},
                   {"skipped", Counts.nSkipped},
                   {"failed", Counts.nFailed}};
    std::string strLine;
    Json::Value jCounts;
    for (const auto& Each : aCounts) {
        strLine += (strLine.empty() ? "" : ", ") + std::to_string(Each.nCount) + " " + Each.szName;
        jCounts[Each.szName] = Json::Int64{Each.nCount};
    }
    for (const std::string& strNote : m_vecNotes) {
        m_Call.Say(strNote);
    }
    if (m_nGone > 0) {
        jCounts["gone"] = Json::Int64{m_nGone};
    }
    m_Call.Report(strLine + " (" + m_Files.Formats() + ")" + GoneText(m_nGone), jCounts);
    return Counts.nFailed > 0 ? kExitBadData : kExitFine;
}

}  // namespace

int RunInsert(Context& Call) {
    const Interrupt Guard;
    try {
        return Import(Call, true).Run();
    } catch (const WrongGuess&) {
        return Import(Call, false).Run();
    }
}

}  // namespace VORN_JSON_DB::Cli
