#include "Operations.h"

namespace campaign {

struct Handle : VornJsonDbApi {
    using VornJsonDbApi::VornJsonDbApi;
};

namespace {

// ---- arguments ----------------------------------------------------------------------------------

void NoArguments(const Table&, Arguments&) {}

void NewRecord(const Table& table, Arguments& args) {
    args.jFirst = table.Record(9);
    args.jFirst["unknown"] = "passed over";
    args.jSecond = "replaced by a success";
}

// Without the defaults that creating fills.
void WholeRecord(const Table& table, Arguments& args) {
    args.jFirst = table.Record(9);
    for (const std::string& strMember : table.vecMembers) {
        const Json::Value& jMember = table.jDefinition[table.strName]["member"][strMember];
        if (!args.jFirst.isMember(strMember)) {
            args.jFirst[strMember] = jMember["cppDefaultValue"];
        }
    }
    args.strSecond = "INSERT INTO t (...) VALUES (";
}

void StoredRecord(const Table& table, Arguments& args) {
    WholeRecord(table, args);
    args.jFirst["id"] = 2;
}

void SameKey(const Table& table, Arguments& args) {
    args.jFirst = table.Record(2);
}

void WrongKind(const Table& table, Arguments& args) {
    args.jFirst = table.Record(9);
    args.jFirst["m01"] = 5;
}

void PercentRecord(const Table& table, Arguments& args) {
    WholeRecord(table, args);
    args.jFirst["m01"] = "100%% sure, this text goes through the formatter again and again";
}

void Query(const Table& table, Arguments& args) {
    args.jFirst["id"].append(3);
    args.jFirst["m01"] = table.Record(3)["m01"];
    args.jFirst["vornSqlWhereFilter"] = "id > 1 and m01 is not null";
    args.jFirst["sort_by"] = "a column name that is longer than a short string";
    args.jFirst["sort_direction"] = "desc";
    args.jFirst["limit"] = 3;
    args.jFirst["offset"] = 0;
    args.strSecond = "text so far";
}

void AllRows(const Table&, Arguments& args) {
    args.jFirst = Json::Value(Json::objectValue);
    args.jSecond.append("an element that was there before");
}

void OneRow(const Table&, Arguments& args) {
    args.jFirst = Json::Value(Json::objectValue);
    args.jSecond["id"] = "replaced by a success";
    args.jSecond["other"] = "kept";
}

void RefusedQuery(const Table&, Arguments& args) {
    args.jFirst["vornSqlWhereFilter"] = "this is no condition, and SQLite says so";
}

void Update(const Table& table, Arguments& args) {
    args.jFirst["id"] = 4;
    args.jSecond = table.Record(9);
    args.jSecond.removeMember("id");
    args.strFirst = "id between 4 and 4 or id > 1000000000000";
}

void UpdateToDuplicate(const Table& table, Arguments& args) {
    args.jFirst["id"] = 4;
    args.jSecond["m01"] = table.Record(2)["m01"];
}

void Values(const Table& table, Arguments& args) {
    args.vecValues = {table.Record(3)["m01"].asString()};
    args.strFirst = args.vecValues[0];
    args.jSecond["kept"] = "a member of the caller's object";
}

void RawText(const Table& table, Arguments& args) {
    args.strFirst = "UPDATE " + table.strName + " SET m01 = m01 || ' and more' WHERE id > 1;";
}

void RefusedText(const Table&, Arguments& args) {
    args.strFirst = "this is no statement, and SQLite says so in a text that is not short";
}

void TwoObjects(const Table& table, Arguments& args) {
    args.jFirst["id"] = 1;
    args.jFirst["other"] = "kept";
    args.jSecond = table.Record(7);
}

void LongText(const Table&, Arguments& args) {
    args.strFirst = "a message that no short string buffer holds, whatever its size may be";
}

void HandleParts(const Table& table, Arguments& args) {
    args.strFirst = table.strName;
    args.jFirst = table.jDefinition;
    args.strSecond = table.strCreate;
}

void FaultyDefinition(const Table& table, Arguments& args) {
    args.jFirst = table.jDefinition;
    args.jFirst[table.strName]["member"][table.vecMembers.back()]["cpptype"] = 5;
}

// ---- calls --------------------------------------------------------------------------------------

using Sub = Subject;
using Args = Arguments;

int Construct(Sub& s, Args& a) {
    const VornJsonDbApi handle(s.pDb, a.strFirst, a.jFirst, a.strSecond);
    return 0;
}

int SetMessage(Sub& s, Args& a) {
    s.pHandle->setErrMsg(a.strFirst);
    return 0;
}

int GetMessage(Sub& s, Args& a) {
    a.strSecond = s.pHandle->getErrMsg();
    return 0;
}

int LookUp(Sub& s, Args&) {
    Json::Value jDefinition = s.table.jDefinition;
    std::string strName = s.table.strName;
    const Json::Value& jType = VORN_JSON_DB::recType(jDefinition, strName);
    return jType.isObject() && jType.size() == s.table.vecMembers.size() ? 0 : -1;
}

int LookUpFaulty(Sub& s, Args& a) {
    std::string strName = s.table.strName;
    const Json::Value& jType = VORN_JSON_DB::recType(a.jFirst, strName);
    return jType.isObject() && jType.size() == s.table.vecMembers.size() ? 0 : -1;
}

// A definition that lacks columns of the table: the row is stored and cannot be read back.
int ListUnknownColumn(Sub& s, Args& a) {
    std::string strName = s.table.strName;
    Json::Value jDefinition;
    jDefinition[strName]["member"]["id"]["cpptype"] = "int";
    std::string strCreate = s.table.strCreate;
    VornJsonDbApi handle(s.pDb, strName, jDefinition, strCreate);
    return handle.recSave(a.jFirst, false);
}

int TimeText(Sub&, Args& a) {
    return VORN_JSON_DB::getTimeAfterNow(1, a.strSecond, 0) == -1 &&
                   VORN_JSON_DB::convert2ReadableTime(0, a.strSecond, 3) == 0
               ? 0
               : -1;
}

int TimeNumber(Sub&, Args&) {
    long nNow = 0;
    return VORN_JSON_DB::getTimeAfterNow(5, nNow);
}

const char* Key(const Sub& s) {
    return s.table.vecMembers[1].c_str();
}

int Match(Sub& s, Args& a) {
    std::string strField = Key(s);
    return s.pHandle->SqlMakeByMatchField(strField, a.jFirst["m01"], a.strSecond);
}

int List(Sub& s, Args& a) {
    Json::Value jList(Json::arrayValue);
    jList.append(a.jFirst["m01"]);
    return s.pHandle->SqlMakeByListField(Key(s), jList, a.strSecond);
}

int Conditions(Sub& s, Args& a) {
    return s.pHandle->SqlExpandMemberList(a.jFirst, a.strSecond, VORN_SQL_WHERE_TYPE_AND);
}

constexpr Reach kNoFiles = Reach::kNoFiles;
constexpr Reach kFiles = Reach::kFiles;
constexpr Reach kOpens = Reach::kOpens;
constexpr After kSame = After::kUnchanged;
constexpr After kPart = After::kPart;

}  // namespace

// clang-format off
const std::vector<Operation> kOperations = {
    {"constructor",               kOpens,   false, false, kSame, HandleParts,   Construct},
    {"tableCreate",               kFiles,   false, false, kSame, NoArguments,   [](Sub& s, Args&) { return s.pHandle->tableCreate(); }},
    {"setErrMsg",                 kNoFiles, false, false, kSame, LongText,      SetMessage},
    {"getErrMsg",                 kNoFiles, false, false, kSame, NoArguments,   GetMessage},
    {"runSqlEx",                  kFiles,   false, false, kSame, RawText,       [](Sub& s, Args& a) { return s.pHandle->runSqlEx(a.strFirst); }},
    {"runSqlEx, refused",         kFiles,   false, false, kSame, RefusedText,   [](Sub& s, Args& a) { return s.pHandle->runSqlEx(a.strFirst); }},
    {"checkJsonType",             kNoFiles, false, false, kSame, NewRecord,     [](Sub& s, Args& a) { return s.pHandle->checkJsonType(a.jFirst); }},
    {"checkJsonType, refused",    kNoFiles, false, false, kSame, WrongKind,     [](Sub& s, Args& a) { return s.pHandle->checkJsonType(a.jFirst); }},
    {"fillDefaultValue",          kNoFiles, false, false, kPart, NewRecord,     [](Sub& s, Args& a) { return s.pHandle->fillDefaultValue(a.jFirst, false); }},
    {"fillDefaultValue, strict",  kNoFiles, false, false, kSame, NewRecord,     [](Sub& s, Args& a) { return s.pHandle->fillDefaultValue(a.jFirst, true); }},
    {"SqlExpandMemberName",       kNoFiles, false, false, kPart, WholeRecord,   [](Sub& s, Args& a) { return s.pHandle->SqlExpandMemberName(a.strSecond, &a.jFirst); }},
    {"SqlExpandMemberSymbol",     kNoFiles, false, true,  kSame, WholeRecord,   [](Sub& s, Args& a) { return s.pHandle->SqlExpandMemberSymbol(a.strSecond, a.jFirst); }},
    {"SqlExpandMemberSymbol, %%", kNoFiles, false, true,  kSame, PercentRecord, [](Sub& s, Args& a) { return s.pHandle->SqlExpandMemberSymbol(a.strSecond, a.jFirst); }},
    {"SqlMakeByMatchField",       kNoFiles, false, false, kSame, Query,         Match},
    {"SqlMakeByListField",        kNoFiles, false, false, kSame, Query,         List},
    {"SqlExpandMemberList",       kNoFiles, false, false, kPart, Query,         Conditions},
    {"SqlFilterConditionFromJson", kNoFiles, false, false, kPart, Query,        [](Sub& s, Args& a) { return s.pHandle->SqlFilterConditionFromJson(a.jFirst, a.strSecond); }},
    {"recSave, create",           kFiles,   false, true,  kSame, WholeRecord,   [](Sub& s, Args& a) { return s.pHandle->recSave(a.jFirst, true); }},
    {"recSave, replace",          kFiles,   false, true,  kSame, StoredRecord,  [](Sub& s, Args& a) { return s.pHandle->recSave(a.jFirst, false); }},
    {"recSave, first use",        kFiles,   true,  true,  kSame, WholeRecord,   [](Sub& s, Args& a) { return s.pHandle->recSave(a.jFirst, true); }},
    {"recSave, column unknown",   kFiles,   true,  true,  kSame, StoredRecord,  ListUnknownColumn},
    {"recCreate",                 kFiles,   false, true,  kSame, NewRecord,     [](Sub& s, Args& a) { return s.pHandle->recCreate(a.jFirst, a.jSecond); }},
    {"recCreate, first use",      kFiles,   true,  true,  kSame, NewRecord,     [](Sub& s, Args& a) { return s.pHandle->recCreate(a.jFirst, a.jSecond); }},
    {"recCreate, same key",       kFiles,   false, true,  kSame, SameKey,       [](Sub& s, Args& a) { return s.pHandle->recCreate(a.jFirst, a.jSecond); }},
    {"recCreate, wrong kind",     kNoFiles, false, true,  kSame, WrongKind,     [](Sub& s, Args& a) { return s.pHandle->recCreate(a.jFirst, a.jSecond); }},
    {"recList",                   kFiles,   false, false, kPart, AllRows,       [](Sub& s, Args& a) { return s.pHandle->recList(a.jFirst, a.jSecond); }},
    {"recList, first use",        kFiles,   true,  false, kPart, AllRows,       [](Sub& s, Args& a) { return s.pHandle->recList(a.jFirst, a.jSecond); }},
    {"recList, query",            kFiles,   false, false, kPart, Query,         [](Sub& s, Args& a) { return s.pHandle->recList(a.jFirst, a.jSecond); }},
    {"recList, refused",          kFiles,   false, false, kPart, RefusedQuery,  [](Sub& s, Args& a) { return s.pHandle->recList(a.jFirst, a.jSecond); }},
    {"recGetOne",                 kFiles,   false, false, kPart, OneRow,        [](Sub& s, Args& a) { return s.pHandle->recGetOne(a.jFirst, a.jSecond); }},
    {"recUpdateByWhere",          kFiles,   false, false, kSame, Update,        [](Sub& s, Args& a) { return s.pHandle->recUpdateByWhere(a.jSecond, a.strFirst); }},
    {"recUpdateByFilter",         kFiles,   false, false, kSame, Update,        [](Sub& s, Args& a) { return s.pHandle->recUpdateByFilter(a.jFirst, a.jSecond); }},
    {"recUpdateByFilter, same key", kFiles,   false, false, kSame, UpdateToDuplicate, [](Sub& s, Args& a) { return s.pHandle->recUpdateByFilter(a.jFirst, a.jSecond); }},
    {"recDelete",                 kFiles,   false, false, kSame, Query,         [](Sub& s, Args& a) { return s.pHandle->recDelete(a.jFirst); }},
    {"recDeleteAll",              kFiles,   false, false, kSame, NoArguments,   [](Sub& s, Args&) { return s.pHandle->recDeleteAll(); }},
    {"recDeleteByArray",          kFiles,   false, false, kSame, Values,        [](Sub& s, Args& a) { return s.pHandle->recDeleteByArray(a.vecValues, Key(s)); }},
    {"recDeleteByArray, refused", kNoFiles, false, false, kSame, Values,        [](Sub& s, Args& a) { return s.pHandle->recDeleteByArray(a.vecValues, "a name that is no member of the table"); }},
    {"recDeleteByName",           kFiles,   false, false, kSame, Values,        [](Sub& s, Args& a) { return s.pHandle->recDeleteByName(a.strFirst, Key(s)); }},
    {"recDeleteByName, first use", kFiles,   true,  false, kSame, Values,        [](Sub& s, Args& a) { return s.pHandle->recDeleteByName(a.strFirst, Key(s)); }},
    {"VectorParamToJson",         kNoFiles, false, false, kPart, Values,        [](Sub& s, Args& a) { return s.pHandle->VectorParamToJson(a.vecValues, Key(s), a.jSecond); }},
    {"recType",                   kNoFiles, false, false, kSame, NoArguments,   LookUp},
    {"recType, first use",        kNoFiles, true,  false, kSame, NoArguments,   LookUp},
    {"recType, faulty",           kNoFiles, true,  false, kSame, FaultyDefinition, LookUpFaulty},
    {"jsonCopyMember",            kNoFiles, false, false, kPart, TwoObjects,    [](Sub&, Args& a) { return VORN_JSON_DB::jsonCopyMember(a.jFirst, a.jSecond, true); }},
    {"time text",                 kNoFiles, false, false, kPart, NoArguments,   TimeText},
    {"time number",               kNoFiles, false, false, kSame, NoArguments,   TimeNumber},
};
// clang-format on

void HandleEnd::operator()(Handle* pHandle) const {
    delete pHandle;
}

HandlePtr NewHandle(const Database& db, const Table& table) {
    // The constructor takes its arguments by reference.
    std::string strName = table.strName;
    Json::Value jDefinition = table.jDefinition;
    std::string strCreate = table.strCreate;
    return HandlePtr(new Handle(db.Get(), strName, jDefinition, strCreate));
}

void KnowTable(const Table& table) {
    std::string strName = table.strName;
    Json::Value jDefinition = table.jDefinition;
    VORN_JSON_DB::recType(jDefinition, strName);
}

bool CanList(Handle& handle) {
    Json::Value jQuery;
    Json::Value jRows;
    return handle.recList(jQuery, jRows) == 0;
}

std::string MessageSlot(const Handle& handle) {
    return const_cast<Handle&>(handle).getErrMsg();
}

const int kMostPauses = 500;

bool IsMemoryFailure(int nResult) {
    return nResult == -1;
}

bool IsFileFailure(int nResult) {
    return nResult == -1;
}

}  // namespace campaign
