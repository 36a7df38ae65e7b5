// The input is the text of one column, read back under each type that can be read.

#include <cstdlib>

#include "FuzzHost.h"
#include "JsonValues.h"

using namespace fuzzhost;

namespace {

// clang-format off
constexpr const char* kTypes[] = {
    "string", "int", "unsigned int", "long long", "unsigned long long", "bool",
    "Json::objectValue", "Json::arrayValue", "Json::Value", "double"};
// clang-format on
constexpr char kCreate[] =
    "CREATE TABLE t0(a); CREATE TABLE t1(a); CREATE TABLE t2(a); CREATE TABLE t3(a);"
    "CREATE TABLE t4(a); CREATE TABLE t5(a); CREATE TABLE t6(a); CREATE TABLE t7(a);"
    "CREATE TABLE t8(a); CREATE TABLE t9(a)";

void CheckValue(unsigned nType, const Json::Value& jValue, const char* szText) {
    if (nType == 0) {
        Require(jValue.isString() && std::string(szText) == jValue.asCString(), "a text is kept");
    } else if (nType <= 2) {
        const int nValue = static_cast<int>(std::strtol(szText, nullptr, 10));
        Require(jValue == Json::Value(nValue), "int by strtol");
    } else if (nType <= 4) {
        const Json::Int64 nValue = std::strtoll(szText, nullptr, 10);
        Require(jValue == Json::Value(nValue), "long long by strtoll");
    } else if (nType == 5) {
        Require(jValue == Json::Value(std::strtol(szText, nullptr, 10) == 1), "bool by strtol");
    } else {
        Require(Compact(jValue) == Compact(ReadLeniently(szText)), "JSON by its reader");
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* pData, size_t nSize) {
    if (nSize < 1 || nSize > kMaxInput) {
        return 0;
    }
    static Database s_Db(kCreate);
    const unsigned nType = pData[0] % 10U;
    const std::string strTable = "t" + std::to_string(nType);
    const std::string strText(reinterpret_cast<const char*>(pData) + 1, nSize - 1);
    s_Db.Run("INSERT INTO " + strTable + " VALUES(?1)", strText);
    Begin(s_Db);
    const std::string strMember = std::string("a:") + kTypes[nType];
    const auto pHandle = NewHandle(s_Db, strTable, Definition(strTable, strMember), "SELECT 1");
    Json::Value jNoQuery;
    Json::Value jRows;
    const int nResult = Call(s_Db, [&] { return pHandle->recList(jNoQuery, jRows); });
    Require(nResult == (nType < 9 ? 0 : -1), "the type alone decides");
    if (nResult == 0) {
        Require(jRows.size() == 1, "one row is one record");
        CheckValue(nType, jRows[0]["a"], strText.c_str());
    }
    Require(pHandle->runSqlEx("DELETE FROM " + strTable) == 1, "the handle works on");
    return 0;
}
