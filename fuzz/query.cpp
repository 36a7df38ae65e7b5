// The first byte selects the operation, the rest is its query object, as JSON text or as a hostile
// value; an update finds its values under "set".

#include "FuzzHost.h"
#include "JsonValues.h"

using namespace fuzzhost;

namespace {

constexpr char kMembers[] =
    "a:string,b:int,c:bool,d:Json::objectValue,e:double,f:Json::arrayValue,limit:string";
constexpr char kRows[] =
    "INSERT INTO t VALUES('x', 1, 1, '{}', NULL, '[]', ''), ('it''s', 2, 0, '{', NULL, '[1]', "
    "NULL)";

int Operate(VornJsonDbApi& Handle, unsigned nOperation, Json::Value& jQuery) {
    Json::Value jOut;
    Json::Value jSet = jQuery.isObject() ? jQuery["set"] : Json::Value();
    std::string strText = jQuery.isObject() && jQuery["a"].isString() ? jQuery["a"].asString() : "";
    std::vector<std::string> vecText(2, strText);
    switch (nOperation % 8) {
        case 0:
            return Handle.recList(jQuery, jOut);
        case 1:
            return Handle.recGetOne(jQuery, jOut);
        case 2:
            return Handle.recUpdateByFilter(jQuery, jSet);
        case 3:
            return Handle.recUpdateByWhere(jQuery, strText);
        case 4:
            return Handle.recDelete(jQuery, false);
        case 5:
            return Handle.recDeleteByName(strText, "a");
        case 6:
            return Handle.recDeleteByArray(vecText, "a");
        default:
            return Handle.SqlExpandMemberList(jQuery, strText, static_cast<int>(nOperation / 8));
    }
}

// A hole in an array is a null, wherever it stands.
void CheckHoles(Database& Db, VornJsonDbApi& Handle, const Json::Value& jQuery, int nJoin) {
    Json::Value jGiven = jQuery;
    Json::Value jFilled = WithoutHoles(jQuery);
    std::string strGiven;
    std::string strFilled;
    const int nGiven =
        Call(Db, [&] { return Handle.SqlExpandMemberList(jGiven, strGiven, nJoin); });
    const int nFilled =
        Call(Db, [&] { return Handle.SqlExpandMemberList(jFilled, strFilled, nJoin); });
    Require(nGiven == nFilled && strGiven == strFilled, "a hole in a condition is a null");
    Require(Same(jGiven, jQuery), "a condition leaves the query alone");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    Json::Value jQuery;
    if (nSize < 2 || nSize > kMaxInput || !TakeValue(pData + 1, nSize - 1, jQuery)) {
        return 0;
    }
    static Database s_Db("CREATE TABLE t(a, b, c, d, e, f, \"limit\")");
    static const Json::Value s_jDefinition = Definition("t", kMembers);
    s_Db.Run(kRows);
    Begin(s_Db);
    const auto pHandle = NewHandle(s_Db, "t", s_jDefinition, "SELECT 1");
    if (IsHostile(pData + 1, nSize - 1)) {
        CheckHoles(s_Db, *pHandle, jQuery, pData[0] % 3);
    }
    const int nResult = Call(s_Db, [&] { return Operate(*pHandle, pData[0], jQuery); });
    Require(nResult >= -1, "no answer below -1");
    Require(pHandle->runSqlEx("DELETE FROM t") >= 0, "the handle works on");
    return 0;
}
