// list, get, count.

#include "Commands.h"
#include "Conditions.h"
#include "Database.h"
#include "Output.h"

namespace VORN_JSON_DB::Cli {

int RunList(Context& Call) {
    OpenTable Open(Call, Access::kRead);
    const Query Which = ParseQuery(Call, Open.Records, Call.WordsFrom(2));
    WriteRecords(Call, Open.Records, Which, false);
    return kExitFine;
}

int RunGet(Context& Call) {
    OpenTable Open(Call, Access::kRead);
    Query Which = KeyQuery(Open.Records, ParseKey(Open.Records, Call.vecWords[2]));
    TakeMembers(Call, Which);
    if (WriteRecords(Call, Open.Records, Which, true) == 0) {
        Fail(kExitNotFound, Call.Db() + ": table \"" + Call.TableName() +
                                "\" has no record with the key \"" + Call.vecWords[2] + "\"");
    }
    return kExitFine;
}

int RunCount(Context& Call) {
    OpenTable Open(Call, Access::kRead);
    std::int64_t nRecords = 0;
    Check(Open.Records.Count(ParseQuery(Call, Open.Records, Call.WordsFrom(2)), nRecords),
          Call.Db());
    Put(std::to_string(nRecords) + "\n");
    return kExitFine;
}

}  // namespace VORN_JSON_DB::Cli
