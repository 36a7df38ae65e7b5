// The command and the old handle work on one table: whoever made it, the other reads and changes
// it.

#include <VornJsonDbApi.h>

#include <unistd.h>

#include <cstdio>
#include <fstream>
#include <memory>
#include <string>

#include <gtest/gtest.h>
#include <json/json.h>
#include <sqlite3.h>

namespace {

// Of the kinds that the old handle stores and reads: it refuses fractions.
const char kProducts[] =
    R"([{"active":true,"id":1,"name":"l'été","size":9007199254740993,"tags":["a",{"b":null}]},
 {"id":2,"name":"","size":-1},
 {"active":false,"id":3,"name":"漢字","size":0,"tags":[]}])";

Json::Value Parsed(const std::string& strText) {
    Json::Value jValue;
    const std::unique_ptr<Json::CharReader> pReader(Json::CharReaderBuilder().newCharReader());
    EXPECT_TRUE(pReader->parse(strText.data(), strText.data() + strText.size(), &jValue, nullptr))
        << strText;
    return jValue;
}

class OldHandle : public testing::Test {
  protected:
    OldHandle() {
        char szFolder[] = "/tmp/vornjsondb-XXXXXX";
        m_strFolder = mkdtemp(szFolder);
        std::ofstream(m_strFolder + "/products.json") << kProducts;
        sqlite3_open((m_strFolder + "/shop.db").c_str(), &m_pDb);
    }
    ~OldHandle() override {
        sqlite3_close(m_pDb);
        for (const char* const szFile : {"/products.json", "/goods.def", "/shop.db", ""}) {
            std::remove((m_strFolder + szFile).c_str());
        }
    }

    // What the command prints, messages included.
    std::string Run(const std::string& strWords) {
        const std::string strCall =
            "cd " + m_strFolder + " && " VORNJSONDB_COMMAND_FILE " " + strWords + " 2>&1";
        std::FILE* const pPipe = popen(strCall.c_str(), "r");
        std::string strPrinted;
        char szBlock[4096];
        while (const std::size_t nRead = std::fread(szBlock, 1, sizeof szBlock, pPipe)) {
            strPrinted.append(szBlock, nRead);
        }
        pclose(pPipe);
        return strPrinted;
    }

    // Definitions are kept by the table's name as long as the process lives: each test has its own.
    std::unique_ptr<VornJsonDbApi> Handle(std::string strName, Json::Value jDefinition,
                                          std::string strCreate) {
        return std::make_unique<VornJsonDbApi>(m_pDb, strName, jDefinition, strCreate);
    }

    static Json::Value All(VornJsonDbApi& Of) {
        Json::Value jAll(Json::objectValue);
        Json::Value jRecords;
        EXPECT_EQ(Of.recList(jAll, jRecords), 0);
        return jRecords;
    }

    std::string m_strFolder;
    sqlite3* m_pDb = nullptr;
};

TEST_F(OldHandle, ReadsAndChangesATableOfTheCommand) {
    EXPECT_EQ(Run("insert shop.db product products.json --key id --quiet"), "");
    const Json::Value jDefinition = Parsed(Run("schema shop.db product --json"));
    const auto pOld =
        Handle("product", jDefinition, "CREATE TABLE IF NOT EXISTS product (id INTEGER)");
    EXPECT_EQ(All(*pOld), Parsed(kProducts));

    Json::Value jNew = Parsed(R"({"active":true,"id":4,"name":"new","size":7,"tags":["x"]})");
    Json::Value jStored;
    EXPECT_EQ(pOld->recCreate(jNew, jStored), 0);
    EXPECT_EQ(jStored, jNew);
    Json::Value jAgain;
    EXPECT_EQ(pOld->recCreate(jNew, jAgain), -1);
    EXPECT_EQ(pOld->getErrMsg(), "DUPLICATE_PRIMARY_KEY");
    EXPECT_EQ(Run("get shop.db product 4"),
              R"({"active":true,"id":4,"name":"new","size":7,"tags":["x"]})"
              "\n");
}

TEST_F(OldHandle, MadeATableForTheCommand) {
    const Json::Value jDefinition = Parsed(R"({"goods": {"member": {
        "active": {"cpptype": "bool"}, "id": {"cpptype": "int"}, "name": {"cpptype": "string"},
        "size": {"cpptype": "long long"}, "tags": {"cpptype": "Json::arrayValue"}}}})");
    const auto pOld = Handle("goods", jDefinition,
                             "CREATE TABLE goods (active INTEGER, id INTEGER PRIMARY KEY, "
                             "name TEXT, size INTEGER, tags TEXT)");
    for (Json::Value jRecord : Parsed(kProducts)) {
        jRecord["active"] = jRecord["active"].isBool() && jRecord["active"].asBool();
        jRecord["tags"] =
            jRecord["tags"].isArray() ? jRecord["tags"] : Json::Value(Json::arrayValue);
        Json::Value jStored;
        EXPECT_EQ(pOld->recCreate(jRecord, jStored), 0);
        EXPECT_EQ(jStored, jRecord);
    }
    std::ofstream(m_strFolder + "/goods.def") << jDefinition;

    EXPECT_EQ(Parsed(Run("list shop.db goods --def goods.def")), All(*pOld));
    // Without a definition the columns tell: a boolean is a number, a list its text.
    EXPECT_EQ(Run("get shop.db goods 1"),
              R"({"active":1,"id":1,"name":"l'été","size":9007199254740993,)"
              R"("tags":"[\"a\",{\"b\":null}]"})"
              "\n");
    EXPECT_EQ(Run("update shop.db goods 2 'name=it'\\''s' active=true 'tags=[1]' --def goods.def"),
              "updated 1 record\n");
    EXPECT_EQ(All(*pOld)[1],
              Parsed(R"({"active":true,"id":2,"name":"it's","size":-1,"tags":[1]})"));
    EXPECT_EQ(Run("delete shop.db goods 1 3"), "deleted 2 records\n");
    EXPECT_EQ(All(*pOld).size(), 1U);
}

}  // namespace
