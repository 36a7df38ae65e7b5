// The operations of VORN_JSON_DB::Table, Loader and Transaction.

#include <VornJsonDbTable.h>

#include "../support/Operations.h"

namespace campaign {

namespace db = VORN_JSON_DB;

struct Handle {
    db::Table table;
};

namespace {

// ---- arguments ----------------------------------------------------------------------------------

Json::Value DefinitionWithKey(const Table& table) {
    Json::Value jDefinition = table.jDefinition;
    jDefinition[table.strName]["key"] = "id";
    return jDefinition;
}

void NoArguments(const Table&, Arguments&) {}

void NewRecord(const Table& table, Arguments& args) {
    args.jFirst = table.Record(9);
    args.jSecond = "replaced by a success";
}

void StoredKey(const Table& table, Arguments& args) {
    args.jFirst = table.Record(9);
    args.jFirst["id"] = 2;
    args.jSecond = "replaced by a success";
}

void WrongKind(const Table& table, Arguments& args) {
    args.jFirst = table.Record(9);
    args.jFirst["m01"] = 5;
}

void Key(const Table&, Arguments& args) {
    args.jFirst = 3;
    args.jSecond = "replaced by a success";
}

void Condition(const Table& table, Arguments& args) {
    args.jFirst["where"]["id"]["$in"] = FromText("[3, 4, 5]");
    args.jFirst["where"]["m01"]["$ne"] = table.Record(3)["m01"];
    args.jFirst["where"]["$or"] = FromText(R"([{"id": {"$gt": 4}}, {"m01": {"$like": "%4-1"}}])");
    args.jSecond = table.Record(9);
    args.jSecond.removeMember("id");
    args.jSecond.removeMember("m01");
}

void Page(const Table& table, Arguments& args) {
    Condition(table, args);
    args.jFirst["sort"].append("-m01");
    args.jFirst["limit"] = 1;
    args.jFirst["offset"] = 0;
    args.jFirst["members"].append("m01");
    args.jSecond = "replaced by a success";
}

void ToDuplicate(const Table& table, Arguments& args) {
    args.jFirst["where"]["id"]["$gt"] = 3;
    args.jSecond["m01"] = table.Record(2)["m01"];
}

void FaultyQuery(const Table&, Arguments& args) {
    args.jFirst["where"]["no member of the table, and so refused"] = 1;
}

void ManyRecords(const Table& table, Arguments& args) {
    for (const int nKey : {2, 9, 10, 11}) {
        args.jFirst.append(table.Record(nKey));
    }
    args.jFirst[0]["m01"] = "a text that no other record has";
}

void OldQuery(const Table& table, Arguments& args) {
    Condition(table, args);
    args.jSecond = "replaced by a success";
}

// ---- calls --------------------------------------------------------------------------------------

using Sub = Subject;
using Args = Arguments;

// The codes as results: 0 or more for success, the code below.
int Result(const db::Status& status, std::int64_t nSuccess = 0) {
    return status.Ok() ? static_cast<int>(nSuccess) : -static_cast<int>(status.Code());
}

constexpr int Code(db::StatusCode eCode) {
    return -static_cast<int>(eCode);
}

db::Options Patience() {
    db::Options options;
    options.nWaitMs = 10;
    return options;
}

int Open(Sub& s, Args&) {
    db::Table table;
    return Result(table.Open(s.pDb, s.table.strName, DefinitionWithKey(s.table), Patience()));
}

int OpenNew(Sub& s, Args&) {
    Json::Value jDefinition;
    jDefinition["made"] = DefinitionWithKey(s.table)[s.table.strName];
    db::Options options = Patience();
    options.blCreateTable = true;
    db::Table table;
    return Result(table.Open(s.pDb, "made", jDefinition, options));
}

int OpenUndefined(Sub& s, Args&) {
    db::Table table;
    return Result(table.Open(s.pDb, s.table.strName, Json::Value(), Patience()));
}

template <db::OnDuplicate eOnDuplicate>
int Save(Sub& s, Args& a) {
    db::Written eWritten = db::Written::kSkipped;
    const db::Status status = s.pHandle->table.Save(a.jFirst, eOnDuplicate, &a.jSecond, &eWritten);
    return Result(status, static_cast<int>(eWritten));
}

template <db::OnDuplicate eOnDuplicate>
int SaveUnread(Sub& s, Args& a) {
    return Result(s.pHandle->table.Save(a.jFirst, eOnDuplicate));
}

int Count(Sub& s, Args& a) {
    std::int64_t nRecords = -1;
    const db::Status status = s.pHandle->table.Count(a.jFirst, nRecords);
    return Result(status, nRecords);
}

int Exists(Sub& s, Args& a) {
    bool blExists = false;
    const db::Status status = s.pHandle->table.Exists(a.jFirst, blExists);
    return Result(status, blExists ? 1 : 0);
}

int ForEach(Sub& s, Args& a) {
    int nRecords = 0;
    const db::Status status = s.pHandle->table.ForEach(a.jFirst, [&](const Json::Value&) {
        ++nRecords;
        return true;
    });
    return Result(status, nRecords);
}

int Update(Sub& s, Args& a) {
    std::int64_t nRows = -1;
    const db::Status status = s.pHandle->table.Update(a.jFirst, a.jSecond, &nRows);
    return Result(status, nRows);
}

int Remove(Sub& s, Args& a) {
    std::int64_t nRows = -1;
    const db::Status status = s.pHandle->table.Remove(a.jFirst, &nRows);
    return Result(status, nRows);
}

int RemoveAll(Sub& s, Args&) {
    std::int64_t nRows = -1;
    const db::Status status = s.pHandle->table.RemoveAll(&nRows);
    return Result(status, nRows);
}

// The first failure, or the number of records.
int Load(Sub& s, Args& a, db::OnDuplicate eOnDuplicate) {
    db::LoadOptions options;
    options.eOnDuplicate = eOnDuplicate;
    db::Loader loader;
    db::Status status = loader.Start(s.pHandle->table, options);
    for (Json::ArrayIndex i = 0; status.Ok() && i < a.jFirst.size(); ++i) {
        status = loader.Add(a.jFirst[i]);
    }
    if (status.Ok()) {
        status = loader.Commit();
    }
    return Result(status, loader.Counts().nCommitted);
}

int LoadBySetters(Sub& s, Args& a) {
    db::Loader loader;
    db::Status status = loader.Start(s.pHandle->table);
    for (const int nKey : {20, 21, 22}) {
        loader.SetInteger(loader.MemberIndex("id"), nKey);
        loader.SetText(loader.MemberIndex("m01"),
                       a.jFirst["m01"].asString() + std::to_string(nKey));
        if (status.Ok()) {
            status = loader.EndRecord();
        }
    }
    if (status.Ok()) {
        status = loader.Commit();
    }
    return Result(status, loader.Counts().nCommitted);
}

// Two changes and one that is taken back, as one.
int Several(Sub& s, Args& a) {
    db::Transaction whole;
    db::Status status = whole.Begin(s.pDb, db::Transaction::Mode::kImmediate, 10);
    if (status.Ok()) {
        status = s.pHandle->table.Create(a.jFirst);
    }
    if (status.Ok()) {
        db::Transaction part;
        status = part.Begin(s.pDb);
        if (status.Ok()) {
            status = s.pHandle->table.RemoveAll();
        }
        if (status.Ok()) {
            status = part.Rollback();
        }
    }
    if (status.Ok()) {
        Json::Value jFive;
        jFive["where"]["id"] = 5;
        status = s.pHandle->table.Remove(jFive);
    }
    if (status.Ok()) {
        status = whole.Commit();
    }
    return Result(status);
}

constexpr Reach kNoFiles = Reach::kNoFiles;
constexpr Reach kFiles = Reach::kFiles;
constexpr Reach kOpens = Reach::kOpens;
constexpr After kSame = After::kUnchanged;

}  // namespace

// clang-format off
const std::vector<Operation> kOperations = {
    {"Open",                      kOpens,   false, false, kSame, NoArguments,  Open},
    {"Open, creates",             kOpens,   false, false, kSame, NoArguments,  OpenNew},
    {"Open, without definition",  kOpens,   false, false, kSame, NoArguments,  OpenUndefined},
    {"Create",                    kFiles,   false, false, kSame, NewRecord,    Save<db::OnDuplicate::kStop>},
    {"Create, first use",         kFiles,   true,  false, kSame, NewRecord,    Save<db::OnDuplicate::kStop>},
    {"Create, unread",            kFiles,   false, false, kSame, NewRecord,    SaveUnread<db::OnDuplicate::kStop>},
    {"Create, same key",          kFiles,   false, false, kSame, StoredKey,    Save<db::OnDuplicate::kStop>},
    {"Create, wrong kind",        kNoFiles, false, false, kSame, WrongKind,    Save<db::OnDuplicate::kStop>},
    {"Save, skip",                kFiles,   false, false, kSame, StoredKey,    Save<db::OnDuplicate::kSkip>},
    {"Save, replace",             kFiles,   false, false, kSame, StoredKey,    Save<db::OnDuplicate::kReplace>},
    {"Save, replace, new",        kFiles,   false, false, kSame, NewRecord,    Save<db::OnDuplicate::kReplace>},
    {"Save, upsert",              kFiles,   false, false, kSame, StoredKey,    Save<db::OnDuplicate::kUpsert>},
    {"Save, upsert, unread",      kFiles,   false, false, kSame, StoredKey,    SaveUnread<db::OnDuplicate::kUpsert>},
    {"Get",                       kFiles,   false, false, kSame, Key,          [](Sub& s, Args& a) { return Result(s.pHandle->table.Get(a.jFirst, a.jSecond)); }},
    {"First",                     kFiles,   false, false, kSame, Page,         [](Sub& s, Args& a) { return Result(s.pHandle->table.First(a.jFirst, a.jSecond)); }},
    {"List",                      kFiles,   false, false, kSame, OldQuery,     [](Sub& s, Args& a) { return Result(s.pHandle->table.List(a.jFirst, a.jSecond)); }},
    {"List, first use",           kFiles,   true,  false, kSame, OldQuery,     [](Sub& s, Args& a) { return Result(s.pHandle->table.List(a.jFirst, a.jSecond)); }},
    {"List, page",                kFiles,   false, false, kSame, Page,         [](Sub& s, Args& a) { return Result(s.pHandle->table.List(a.jFirst, a.jSecond)); }},
    {"List, refused",             kNoFiles, false, false, kSame, FaultyQuery,  [](Sub& s, Args& a) { return Result(s.pHandle->table.List(a.jFirst, a.jSecond)); }},
    {"ForEach",                   kFiles,   false, false, kSame, OldQuery,     ForEach},
    {"Count",                     kFiles,   false, false, kSame, Condition,    Count},
    {"Exists",                    kFiles,   false, false, kSame, Condition,    Exists},
    {"Update",                    kFiles,   false, false, kSame, Condition,    Update},
    {"Update, same value",        kFiles,   false, false, kSame, ToDuplicate,  Update},
    {"Remove",                    kFiles,   false, false, kSame, Condition,    Remove},
    {"RemoveAll",                 kFiles,   false, false, kSame, NoArguments,  RemoveAll},
    {"ToOldQuery",                kNoFiles, false, false, kSame, OldQuery,     [](Sub& s, Args& a) { return Result(s.pHandle->table.ToOldQuery(a.jFirst, db::OldCall::kChange, a.jSecond)); }},
    {"Loader, stop",              kFiles,   false, false, kSame, ManyRecords,  [](Sub& s, Args& a) { return Load(s, a, db::OnDuplicate::kStop); }},
    {"Loader, skip",              kFiles,   false, false, kSame, ManyRecords,  [](Sub& s, Args& a) { return Load(s, a, db::OnDuplicate::kSkip); }},
    {"Loader, replace",           kFiles,   false, false, kSame, ManyRecords,  [](Sub& s, Args& a) { return Load(s, a, db::OnDuplicate::kReplace); }},
    {"Loader, upsert",            kFiles,   false, false, kSame, ManyRecords,  [](Sub& s, Args& a) { return Load(s, a, db::OnDuplicate::kUpsert); }},
    {"Loader, setters",           kFiles,   false, false, kSame, NewRecord,    LoadBySetters},
    {"Transaction",               kFiles,   false, false, kSame, NewRecord,    Several},
};
// clang-format on

void HandleEnd::operator()(Handle* pHandle) const {
    delete pHandle;
}

HandlePtr NewHandle(const Database& db, const Table& table) {
    db.Run(table.strCreate);
    HandlePtr pHandle(new Handle);
    const db::Status status =
        pHandle->table.Open(db.Get(), table.strName, DefinitionWithKey(table), Patience());
    Expect(status.Ok(), [&] { return "cannot open: " + status.Message(); });
    return pHandle;
}

void KnowTable(const Table&) {}  // nothing is kept for the process

bool CanList(Handle& handle) {
    Json::Value jRecords;
    return handle.table.List(db::Query(), jRecords).Ok();
}

std::string MessageSlot(const Handle&) {
    return "";
}

const int kMostPauses = 4;  // of 1, 2, 4 and 3 ms

bool IsMemoryFailure(int nResult) {
    return nResult == Code(db::StatusCode::kNoMemory);
}

bool IsFileFailure(int nResult) {
    for (const db::StatusCode eCode :
         {db::StatusCode::kIoError, db::StatusCode::kDiskFull, db::StatusCode::kLocked}) {
        if (nResult == Code(eCode)) {
            return true;
        }
    }
    return false;
}

}  // namespace campaign
