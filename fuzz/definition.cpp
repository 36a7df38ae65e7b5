// The input is a table definition, as JSON text or as a hostile value. Every operation runs under
// it, on a table with three columns, and again after the host has written into what the library
// knows of the table.

#include <functional>
#include <vector>

#include "FuzzHost.h"
#include "JsonValues.h"

using namespace fuzzhost;

namespace {

// What the operations are called with.
struct Arguments {
    Arguments() {
        jRecord["a"] = "text";
        jRecord["b"] = 7;
        jRecord["c"] = Json::Value(Json::objectValue);
    }

    Json::Value jRecord;
    Json::Value jOut;
    Json::Value jRows;
    Json::Value jNoQuery;
    std::string strSql = ") VALUES (";
};

std::vector<std::function<int()>> Operations(VornJsonDbApi& Handle, Arguments& Given) {
    return {
        [&] { return Handle.checkJsonType(Given.jRecord); },
        [&] { return Handle.fillDefaultValue(Given.jOut, false); },
        [&] { return Handle.fillDefaultValue(Given.jRecord, true); },
        [&] { return Handle.SqlExpandMemberName(Given.strSql, &Given.jRecord); },
        [&] { return Handle.SqlExpandMemberSymbol(Given.strSql, Given.jRecord); },
        [&] { return Handle.recCreate(Given.jRecord, Given.jOut); },
        [&] { return Handle.recList(Given.jNoQuery, Given.jRows); },
        [&] { return Handle.recUpdateByFilter(Given.jRecord, Given.jRecord); },
        [&] { return Handle.recDelete(Given.jRecord); },
    };
}

// A definition without members is refused anew, and logged whole, by each operation, which then
// does the same whatever the definition holds: so one of them, nOne, is enough.
void Run(Database& Db, VornJsonDbApi& Handle, Arguments& Given, bool blKnown, size_t nOne) {
    const std::vector<std::function<int()>> vecOperations = Operations(Handle, Given);
    for (size_t i = 0; i < vecOperations.size(); ++i) {
        if (blKnown || i == nOne % vecOperations.size()) {
            Require(Call(Db, vecOperations[i]) >= -1, "no answer below -1");
        }
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    Json::Value jDefinition;
    if (nSize > kMaxInput || !TakeValue(pData, nSize, jDefinition)) {
        return 0;
    }
    static Database s_Db("CREATE TABLE t(a, b, c)");
    s_Db.Run("INSERT INTO t VALUES('x', 1, '{}'), (NULL, 'y', '[')");
    Begin(s_Db);
    const Json::Value jBefore = jDefinition;
    const auto pHandle = NewHandle(s_Db, "t", jDefinition, "SELECT 1");
    std::string strTable = "t";
    Json::Value& jKnown = VORN_JSON_DB::recType(jDefinition, strTable);
    Arguments Given;
    Run(s_Db, *pHandle, Given, jKnown.isObject(), nSize);
    Require(Same(jDefinition, jBefore), "the definition is not changed");

    const std::string strRows = Compact(Given.jRows);
    if (jKnown.isObject() && nSize % 4 == 0) {
        static_cast<void>(jKnown["nosuch"]);
        jKnown["b"] = jDefinition;
        Arguments GivenNext;
        Run(s_Db, *pHandle, GivenNext, true, 0);
    }
    ForgetTables();
    Require(Compact(Given.jRows) == strRows, "records outlive what is known of their table");

    // Also the state that the next input starts from.
    Require(pHandle->runSqlEx("DELETE FROM t") >= 0, "the handle works on");
    return 0;
}
