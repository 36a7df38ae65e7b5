// update, delete, upsert: records by key and by query.

#include <set>

#include "../src/schema/MemberType.h"
#include "Commands.h"
#include "Conditions.h"
#include "Database.h"
#include "JsonFile.h"
#include "Replacements.h"
#include "Tables.h"
#include "input/Numbers.h"

namespace VORN_JSON_DB::Cli {

namespace {

std::string Records(std::int64_t nRecords) {
    return std::to_string(nRecords) + (nRecords == 1 ? " record" : " records");
}

int ReportCount(const Context& Call, const char* szDone, std::int64_t nRecords,
                std::int64_t nGone = 0) {
    Json::Value jResult;
    jResult[szDone] = Json::Int64(nRecords);
    if (nGone > 0) {
        jResult["gone"] = Json::Int64(nGone);
    }
    Call.Report(std::string(szDone) + " " + Records(nRecords) + GoneText(nGone), jResult);
    return kExitFine;
}

// Runs a change and counts its records. SQLite does not count what the triggers of a view do: there
// all that are found count.
template <typename Change>
Status Counted(OpenTable& Open, const Query& Which, std::int64_t& nRecords,
               const Change& fnChange) {
    std::int64_t nFound = 0;
    if (Open.Records.IsView()) {
        Status Looked = Open.Records.Count(Which, nFound);
        if (!Looked.Ok()) {
            return Looked;
        }
    }
    Status Changed = fnChange();
    nRecords += nFound;
    return Changed;
}

[[noreturn]] void FailUnchanged(const Context& Call, Table& Of, const Query& Which,
                                const std::string& strKey) {
    bool blThere = false;
    Check(Of.Exists(Which, blThere), Call.Db());
    const std::string strTable = Call.Db() + ": table \"" + Call.TableName() + "\" ";
    if (blThere) {
        Fail(kExitBadData, strTable + "ignores the change of the record with the key \"" + strKey +
                               "\", by a trigger or an ON CONFLICT clause; nothing was changed; "
                               "vornjsondb schema shows them");
    }
    Fail(kExitNotFound,
         strTable + "has no record with the key \"" + strKey + "\"; nothing was changed");
}

// Runs a change for each key; a key that is not there is an Error.
template <typename Change>
std::int64_t ForKeys(const Context& Call, OpenTable& Open, const std::vector<std::string>& vecKeys,
                     const Change& fnChange) {
    std::int64_t nRecords = 0;
    std::set<Json::Value> setDone;  // a record whose key is given twice is one record
    for (const std::string& strKey : vecKeys) {
        const Json::Value jKey = ParseKey(Open.Records, strKey);
        if (!setDone.insert(jKey).second) {
            continue;
        }
        std::int64_t nChanged = 0;
        const Query Which = KeyQuery(Open.Records, jKey);
        Check(fnChange(Which, nChanged), Call.Db());
        if (nChanged == 0) {
            FailUnchanged(Call, Open.Records, Which, strKey);
        }
        nRecords += nChanged;
    }
    return nRecords;
}

void SplitWords(const Context& Call, std::vector<std::string>& vecKeys,
                std::vector<std::string>& vecAssignments) {
    for (const std::string& strWord : Call.WordsFrom(2)) {
        const bool blObject = strWord.compare(0, 1, "{") == 0;
        (IsAssignment(strWord) && !blObject ? vecAssignments : vecKeys).push_back(strWord);
    }
}

// Bytes, as list shows and insert takes them, would become a text; texts may become numbers.
void CheckStorable(const Table& Of, const Json::Value& jMembers) {
    const Json::Value& jTypes = Of.Definition()[Of.Name()]["member"];
    const std::vector<std::string> vecNumbers = NumberColumns(Of.Connection(), Of.Name());
    for (auto itMember = jMembers.begin(); itMember != jMembers.end(); ++itMember) {
        const Json::Value& jType = jTypes[itMember.name()]["cpptype"];
        const bool blMarked =
            itMember->isObject() && (itMember->isMember("$base64") || itMember->isMember("$text") ||
                                     itMember->isMember("$real"));
        if (blMarked && jType == "any") {
            Fail(kExitUsage, "member \"" + itMember.name() +
                                 "\": bytes are written by insert alone; give it the record on "
                                 "standard input, with --upsert");
        }
        const bool blInteger = vornjsondb::TypeOfMember(jTypes[itMember.name()]).Bound.eKind ==
                               vornjsondb::BoundKind::kInteger;
        if (blInteger && itMember->type() == Json::realValue &&
            MayBeRounded(itMember->asDouble())) {
            Fail(kExitBadData, RoundedText(itMember.name()));
        }
        if (itMember->type() == Json::uintValue && !itMember->isInt64() && jType != "double") {
            Fail(kExitUsage, "member \"" + itMember.name() + "\": " + itMember->asString() +
                                 " has more than 63 bits; write it as a text, in quotes");
        }
        if (itMember->isString() && (jType == "any" || jType == "string") &&
            HasName(vecNumbers, itMember.name()) && IsNumberToSqlite(itMember->asString())) {
            Fail(kExitBadData, NumberColumnText(itMember.name(), itMember->asString()));
        }
    }
}

}  // namespace

int RunUpdate(Context& Call) {
    std::vector<std::string> vecKeys;
    std::vector<std::string> vecAssignments;
    SplitWords(Call, vecKeys, vecAssignments);
    if (vecKeys.empty() != Call.Has("--where")) {
        Fail(kExitUsage, "update takes keys or --where; give one of them");
    }
    if (vecAssignments.empty()) {
        Fail(kExitUsage, "update sets nothing; add member=value");
    }
    OpenTable Open(Call, Access::kChange);
    const Json::Value jMembers = ParseAssignments(Open.Records, vecAssignments);
    CheckStorable(Open.Records, jMembers);
    const auto Change = [&](const Query& Which, std::int64_t& nRows) {
        return Counted(Open, Which, nRows,
                       [&] { return Open.Records.Update(Which, jMembers, &nRows); });
    };
    Transaction All;
    BeginChange(Call, Open.pDb.get(), All);
    const Replacements Others(Open.pDb.get(), Open.Records.Name());
    std::int64_t nRecords = 0;
    if (vecKeys.empty()) {
        Check(Change(ParseQuery(Call, Open.Records, {}), nRecords), Call.Db());
    } else {
        nRecords = ForKeys(Call, Open, vecKeys, Change);
    }
    const std::int64_t nGone = Others.Gone(0);
    Check(All.Commit(), Call.Db());
    return ReportCount(Call, "updated", nRecords, nGone);
}

int RunDelete(Context& Call) {
    const std::vector<std::string> vecKeys = Call.WordsFrom(2);
    const int nWays =
        (vecKeys.empty() ? 0 : 1) + (Call.Has("--where") ? 1 : 0) + (Call.Has("--all") ? 1 : 0);
    if (nWays != 1) {
        Fail(kExitUsage, "delete takes keys, --where or --all; give one of them");
    }
    if (Call.Has("--all") && !Call.Has("--yes")) {
        Fail(kExitUsage, "delete --all removes every record; add --yes if that is meant");
    }
    OpenTable Open(Call, Access::kChange);
    Transaction All;
    BeginChange(Call, Open.pDb.get(), All);
    std::int64_t nRecords = 0;
    const auto Change = [&Open](const Query& Which, std::int64_t& nRows) {
        return Counted(Open, Which, nRows, [&] { return Open.Records.Remove(Which, &nRows); });
    };
    if (Call.Has("--all")) {
        Check(Counted(Open, Query(), nRecords, [&] { return Open.Records.RemoveAll(&nRecords); }),
              Call.Db());
    } else if (Call.Has("--where")) {
        Check(Change(ParseQuery(Call, Open.Records, {}), nRecords), Call.Db());
    } else {
        nRecords = ForKeys(Call, Open, vecKeys, Change);
    }
    Check(All.Commit(), Call.Db());
    return ReportCount(Call, "deleted", nRecords);
}

int RunUpsert(Context& Call) {
    OpenTable Open(Call, Access::kChange);
    Json::Value jRecord;
    if (Call.vecWords.size() == 3 && Call.vecWords[2].compare(0, 1, "{") == 0) {
        jRecord = ParseJson(Call.vecWords[2], "record", kExitUsage);
    } else {
        jRecord = ParseAssignments(Open.Records, Call.WordsFrom(2));
    }
    CheckStorable(Open.Records, jRecord);
    Transaction All;
    BeginChange(Call, Open.pDb.get(), All);
    const Replacements Others(Open.pDb.get(), Open.Records.Name());
    Written eWritten{};
    Check(Open.Records.Save(jRecord, OnDuplicate::kUpsert, nullptr, &eWritten), Call.Db(),
          kExitBadData);
    const bool blInserted = eWritten == Written::kInserted;
    const std::int64_t nGone = Others.Gone(blInserted ? 1 : 0);
    Check(All.Commit(), Call.Db());
    return ReportCount(Call, blInserted ? "inserted" : "updated", 1, nGone);
}

}  // namespace VORN_JSON_DB::Cli
