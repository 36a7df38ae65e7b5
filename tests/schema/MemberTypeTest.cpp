// The treatments of the type table, called directly.

#include <string>
#include <utility>

#include <gtest/gtest.h>
#include <json/json.h>

#include "../../src/base/SqlText.h"
#include "../../src/schema/MemberType.h"

namespace {

using vornjsondb::TextBuffer;

const vornjsondb::MemberType& TypeNamed(const char* szName) {
    return vornjsondb::FindMemberType(szName, szName + std::string(szName).length());
}

TEST(MemberTypeTest, RefusedNumberLeavesTheTextAsItWas) {
    for (const char* szName : {"int", "unsigned int"}) {
        TextBuffer Text;
        Text.Append("before");
        EXPECT_THROW(TypeNamed(szName).pfnAppend(Json::Value(18446744073709551616.0), Text),
                     Json::LogicError);
        EXPECT_EQ(Text.View(), "before") << szName;
    }
}

// JsonCpp itself takes these two for the last number in range.
TEST(MemberTypeTest, FirstNumberBeyondARangeLeavesTheTextAsItWas) {
    TextBuffer Text;
    Text.Append("before");
    EXPECT_THROW(TypeNamed("int").pfnAppend(Json::Value(9223372036854775808.0), Text),
                 Json::LogicError);
    EXPECT_EQ(Text.View(), "before");
}

std::string ExceptionOf(const char* szType, const Json::Value& jValue) {
    TextBuffer Text;
    try {
        TypeNamed(szType).pfnAppend(jValue, Text);
    } catch (const std::exception& Error) {
        return Error.what();
    }
    return "none";
}

TEST(MemberTypeTest, ExceptionsSayWhatIsWrong) {
    EXPECT_EQ(ExceptionOf("int", Json::Value(9223372036854775808.0)),
              "vornjsondb: the number is out of range");
    sqlite3_hard_heap_limit64(1);
    const std::string strNoMemory = ExceptionOf("double", Json::Value(1e300));
    sqlite3_hard_heap_limit64(0);
    sqlite3_soft_heap_limit64(0);
    EXPECT_EQ(strNoMemory, "vornjsondb: the SQL formatter gave no text");
}

TEST(MemberTypeTest, SpecifiersAreThoseOfTheFormatter) {
    const std::pair<const char*, const char*> aExpected[] = {
        {"string", "%Q"},
        {"int", "%lld"},
        {"long long", "%lld"},
        {"bool", "%lld"},
        {"Json::objectValue", "%Q"},
        {"Json::arrayValue", "%Q"},
        {"unsigned int", "%llu"},
        {"unsigned long long", "%llu"},
        {"long", "%lld"},
        {"unsigned long", "%llu"},
        {"unsigned", "%llu"},
        {"double", "%lf"},
        {"float", "%f"},
    };
    for (const auto& Each : aExpected) {
        EXPECT_STREQ(TypeNamed(Each.first).szSpecifier, Each.second) << Each.first;
    }
}

TEST(MemberTypeTest, BoundFormOfEachTypeIsComplete) {
    using vornjsondb::BoundKind;
    using vornjsondb::BoundRange;
    const std::pair<const char*, vornjsondb::BoundForm> aExpected[] = {
        {"string", {BoundKind::kText, BoundRange::kNone}},
        {"int", {BoundKind::kInteger, BoundRange::kInt32}},
        {"long long", {BoundKind::kInteger, BoundRange::kInt64}},
        {"bool", {BoundKind::kBoolean, BoundRange::kNone}},
        {"Json::objectValue", {BoundKind::kObject, BoundRange::kNone}},
        {"Json::arrayValue", {BoundKind::kList, BoundRange::kNone}},
        {"Json::Value", {BoundKind::kJson, BoundRange::kNone}},
        {"unsigned int", {BoundKind::kInteger, BoundRange::kUInt32}},
        {"unsigned long long", {BoundKind::kInteger, BoundRange::kUInt63}},
        {"long", {BoundKind::kInteger, BoundRange::kInt64}},
        {"unsigned long", {BoundKind::kInteger, BoundRange::kUInt63}},
        {"unsigned", {BoundKind::kInteger, BoundRange::kUInt32}},
        {"double", {BoundKind::kReal, BoundRange::kDouble}},
        {"float", {BoundKind::kReal, BoundRange::kFloat}},
        {"uid_t", {BoundKind::kInteger, BoundRange::kUInt32}},
        {"time_t", {BoundKind::kInteger, BoundRange::kInt64}},
        {"any", {BoundKind::kAny, BoundRange::kNone}},
        {"no such type", {BoundKind::kNone, BoundRange::kNone}},
    };
    for (const auto& Each : aExpected) {
        const vornjsondb::BoundForm& Bound = TypeNamed(Each.first).Bound;
        EXPECT_EQ(Bound.eKind, Each.second.eKind) << Each.first;
        EXPECT_EQ(Bound.eRange, Each.second.eRange) << Each.first;
    }
}

TEST(MemberTypeTest, TextsOfSqliteAreFreed) {
    const sqlite3_int64 nBefore = sqlite3_memory_used();
    {
        const vornjsondb::SqlText szText(sqlite3_mprintf("%s", "text"));
        EXPECT_GT(sqlite3_memory_used(), nBefore);
    }
    EXPECT_EQ(sqlite3_memory_used(), nBefore);
    TextBuffer Text;
    TypeNamed("double").pfnAppend(Json::Value(1.5), Text);
    EXPECT_EQ(Text.View(), "1.500000");
    EXPECT_EQ(sqlite3_memory_used(), nBefore);
}

}  // namespace
