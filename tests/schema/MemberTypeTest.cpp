// The treatments of the type table, called directly.

#include <string>

#include <gtest/gtest.h>
#include <json/json.h>

#include "../../src/base/SqlText.h"
#include "../../src/schema/MemberType.h"

namespace {

const vornjsondb::MemberType& TypeNamed(const char* szName) {
    return vornjsondb::FindMemberType(szName, szName + std::string(szName).length());
}

TEST(MemberTypeTest, RefusedNumberLeavesTheTextAsItWas) {
    for (const char* szName : {"int", "unsigned int"}) {
        std::string strText = "before";
        EXPECT_THROW(TypeNamed(szName).pfnAppend(Json::Value(18446744073709551616.0), strText),
                     Json::LogicError);
        EXPECT_EQ(strText, "before") << szName;
    }
}

// JsonCpp itself takes these two for the last number in range.
TEST(MemberTypeTest, FirstNumberBeyondARangeLeavesTheTextAsItWas) {
    std::string strText = "before";
    EXPECT_THROW(TypeNamed("int").pfnAppend(Json::Value(9223372036854775808.0), strText),
                 Json::LogicError);
    EXPECT_EQ(strText, "before");
}

TEST(MemberTypeTest, TextsOfSqliteAreFreed) {
    const sqlite3_int64 nBefore = sqlite3_memory_used();
    {
        const vornjsondb::SqlText szText(sqlite3_mprintf("%s", "text"));
        EXPECT_GT(sqlite3_memory_used(), nBefore);
    }
    EXPECT_EQ(sqlite3_memory_used(), nBefore);
    std::string strText;
    TypeNamed("double").pfnAppend(Json::Value(1.5), strText);
    EXPECT_EQ(strText, "1.500000");
    EXPECT_EQ(sqlite3_memory_used(), nBefore);
}

}  // namespace
