// The input is a table definition. Every operation runs under it, on a table with three columns.

#include "FuzzHost.h"

using namespace fuzzhost;

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    Json::Value jDefinition;
    if (nSize > kMaxInput ||
        !Parse(std::string(reinterpret_cast<const char*>(pData), nSize), jDefinition)) {
        return 0;
    }
    static Database s_Db("CREATE TABLE t(a, b, c)");
    s_Db.Run("INSERT INTO t VALUES('x', 1, '{}'), (NULL, 'y', '[')");
    ForgetTypes();
    const std::string strBefore = Compact(jDefinition);
    const auto pHandle = NewHandle(s_Db, "t", jDefinition, "SELECT 1");

    Json::Value jRecord;
    jRecord["a"] = "text";
    jRecord["b"] = 7;
    jRecord["c"] = Json::Value(Json::objectValue);
    Json::Value jOut;
    Json::Value jRows;
    Json::Value jNoQuery;
    std::string strSql = ") VALUES (";
    Call(s_Db, [&] { return pHandle->checkJsonType(jRecord); });
    Call(s_Db, [&] { return pHandle->fillDefaultValue(jOut, false); });
    Call(s_Db, [&] { return pHandle->fillDefaultValue(jRecord, true); });
    Call(s_Db, [&] { return pHandle->SqlExpandMemberName(strSql, &jRecord); });
    Call(s_Db, [&] { return pHandle->SqlExpandMemberSymbol(strSql, jRecord); });
    const int nCreated = Call(s_Db, [&] { return pHandle->recCreate(jRecord, jOut); });
    Require(nCreated == 0 || nCreated == -1, "recCreate answers 0 or -1");
    Call(s_Db, [&] { return pHandle->recList(jNoQuery, jRows); });
    Call(s_Db, [&] { return pHandle->recUpdateByFilter(jRecord, jRecord); });
    Call(s_Db, [&] { return pHandle->recDelete(jRecord); });
    Require(Compact(jDefinition) == strBefore, "the definition is not changed");

    // Also the state that the next input starts from.
    Require(pHandle->runSqlEx("DELETE FROM t") >= 0, "the handle works on");
    return 0;
}
