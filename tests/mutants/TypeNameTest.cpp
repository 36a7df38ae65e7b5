// Type names that begin like a known one.
#include "../support/TableFixture.h"

using namespace testhost;

namespace {

using TypeName = DbTest;

TEST_F(TypeName, KnownNameFollowedByNulBytesIsUnknown) {
    for (size_t nNuls = 1; nNuls <= 64; ++nNuls) {
        const std::string strTable = UniqueTable();
        Json::Value jDefinition;
        jDefinition[strTable]["member"]["a"]["cpptype"] = "int" + std::string(nNuls, '\0');
        const auto pHandle =
            NewHandle(m_pDb, strTable, jDefinition, "CREATE TABLE " + strTable + " (a)");
        Json::Value jRecord;
        jRecord["a"] = 1;
        EXPECT_EQ(pHandle->checkJsonType(jRecord), -1) << nNuls;
        EXPECT_EQ(TakeLog(), std::vector<std::string>{Located("type not found!!, key=a")}) << nNuls;
    }
}

TEST_F(TypeName, BeginningOfAKnownNameIsUnknown) {
    for (const char* szName :
         {"", "in", "lon", "long lon", "Json::", "Json::Valu", "bo", "unsigned lon"}) {
        const std::string strTable = UniqueTable();
        const auto pHandle =
            NewHandle(m_pDb, strTable, Definition(strTable, std::string("a:") + szName),
                      "CREATE TABLE " + strTable + " (a)");
        Json::Value jRecord;
        jRecord["a"] = 1;
        EXPECT_EQ(pHandle->checkJsonType(jRecord), -1) << szName;
        EXPECT_EQ(TakeLog(), std::vector<std::string>{Located("type not found!!, key=a")})
            << szName;
    }
}

}  // namespace
