// The first byte selects the table and the operation, the rest is the record, as JSON text or as a
// hostile value: created, inserted or replaced.

#include "FuzzHost.h"
#include "JsonValues.h"

using namespace fuzzhost;

namespace {

constexpr const char* kTables[] = {"t", "u", "v"};
constexpr const char* kMembers[] = {
    "a:string,b:int,c:long long,d:bool,e:Json::objectValue,f:Json::arrayValue,z:string",
    "a:unsigned int,b:unsigned long long,c:string,d:Json::Value,e:string,f:string,z:string",
    "a:long,b:unsigned long,c:unsigned,d:double,e:float,f:uid_t,z:nonsense",
};

// The stored text is what was given, up to the first NUL; told apart from the percent sign's rules.
void CheckStored(Database& Db, unsigned nTable, const Json::Value& jGiven) {
    if (Compact(jGiven).find('%') != std::string::npos) {
        return;
    }
    const std::string strFrom = std::string(" FROM ") + kTables[nTable];
    if (jGiven["z"].isString()) {
        Require(Db.Run("SELECT z" + strFrom) == jGiven["z"].asCString(), "a text is stored");
    }
    for (const char* szName : {"e", "f"}) {
        const Json::Value& jPart = jGiven[szName];
        if (nTable == 0 && (jPart.isArray() || jPart.isObject())) {
            Require(Db.Run(std::string("SELECT ") + szName + strFrom) == Compact(jPart),
                    "JSON is stored whole");
        }
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    Json::Value jRecord;
    if (nSize < 2 || nSize > kMaxInput || !TakeValue(pData + 1, nSize - 1, jRecord)) {
        return 0;
    }
    static Database s_Db(
        "CREATE TABLE t(a, b, c, d, e, f, z TEXT); CREATE TABLE u(a, b, c, d, e, f, z TEXT);"
        "CREATE TABLE v(a, b, c, d, e, f, z TEXT)");
    const unsigned nTable = pData[0] % 3U;
    const unsigned nOperation = pData[0] / 3U % 3U;
    const std::string strTable = kTables[nTable];
    Begin(s_Db);
    const auto pHandle =
        NewHandle(s_Db, strTable, Definition(strTable, kMembers[nTable]), "SELECT 1");

    Json::Value jInOut = jRecord;
    Json::Value jOut = "before";
    const int nResult = Call(s_Db, [&] {
        return nOperation == 0 ? pHandle->recCreate(jInOut, jOut)
                               : pHandle->recSave(jInOut, nOperation == 1);
    });
    Require(nResult == 0 || nResult == -1, "the answer is 0 or -1");
    Require(!s_Db.Refused(), "a value never becomes a statement");
    if (nResult == 0) {
        Require(s_Db.Run("SELECT count(*) FROM " + strTable) == "1", "one record makes one row");
        CheckStored(s_Db, nTable, jRecord);
    } else {
        Require(jOut == "before", "a failure leaves the output");
    }
    Require((nResult == 0 && nOperation != 0) || Same(jInOut, jRecord), "the input is left alone");
    Require(pHandle->runSqlEx("DELETE FROM " + strTable) <= 1, "no second row was written");
    return 0;
}
