// What the process keeps about tables, asked directly.

#include <memory>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <json/json.h>

#include "../../src/schema/KnownTables.h"

namespace {

using vornjsondb::KnownTable;
using vornjsondb::KnownTables;
using vornjsondb::RowTemplate;

Json::Value TypesOf(const std::vector<const char*>& vecNames) {
    Json::Value jTypes(Json::objectValue);
    for (const char* szName : vecNames) {
        jTypes[szName]["cpptype"] = "int";
    }
    return jTypes;
}

// The shape of a row: the names of its columns, as SQLite hands them over.
class Shape {
  public:
    explicit Shape(std::vector<std::string> vecNames) : m_vecNames(std::move(vecNames)) {
        for (std::string& strName : m_vecNames) {
            m_vecTexts.push_back(&strName[0]);
        }
        m_vecTexts.push_back(nullptr);
    }

    const RowTemplate* TemplateIn(KnownTable& Table) {
        return Table.TemplateFor(static_cast<int>(m_vecNames.size()), m_vecTexts.data());
    }

  private:
    std::vector<std::string> m_vecNames;
    std::vector<char*> m_vecTexts;
};

TEST(KnownTablesTest, ForgottenTableIsNotFoundAndOthersAreStillLearned) {
    KnownTables Tables;
    Tables.FindOrAdd("a").jTypes = TypesOf({"x"});
    EXPECT_NE(Tables.Find("a"), nullptr);
    Tables.Forget();
    EXPECT_EQ(Tables.Find("a"), nullptr);
    EXPECT_TRUE(Tables.AllTypes().isNull());
    Tables.FindOrAdd("b").jTypes = TypesOf({"y"});
    EXPECT_EQ(Tables.Find("a"), nullptr);
    ASSERT_NE(Tables.Find("b"), nullptr);
    EXPECT_EQ(Tables.AllTypes().getMemberNames(), Json::Value::Members{"b"});
}

TEST(KnownTablesTest, TablesAskedForInTurnsAreToldApart) {
    KnownTables Tables;
    KnownTable& First = Tables.FindOrAdd("a");
    KnownTable& Second = Tables.FindOrAdd("b");
    EXPECT_NE(&First, &Second);
    for (int i = 0; i < 2; ++i) {
        EXPECT_EQ(Tables.Find("a"), &First);
        EXPECT_EQ(Tables.Find("b"), &Second);
        EXPECT_EQ(Tables.Find("c"), nullptr);
    }
}

TEST(KnownTablesTest, ShapesInTurnsKeepTheirTemplates) {
    KnownTable Table("t");
    Table.jTypes = TypesOf({"x", "y"});
    Shape Both({"x", "y"});
    Shape Turned({"y", "x"});
    Shape One({"x"});
    const RowTemplate* pBoth = Both.TemplateIn(Table);
    const RowTemplate* pTurned = Turned.TemplateIn(Table);
    const RowTemplate* pOne = One.TemplateIn(Table);
    ASSERT_NE(pBoth, nullptr);
    ASSERT_NE(pTurned, nullptr);
    ASSERT_NE(pOne, nullptr);
    EXPECT_NE(pBoth, pTurned);
    for (int i = 0; i < 2; ++i) {
        EXPECT_EQ(Both.TemplateIn(Table), pBoth);
        EXPECT_EQ(One.TemplateIn(Table), pOne);
        EXPECT_EQ(Turned.TemplateIn(Table), pTurned);
    }
}

// As often as each of the sixteen columns may be left out, and no shape more.
TEST(KnownTablesTest, SixteenShapesAreKeptAndStayInUse) {
    KnownTable Table("t");
    std::vector<std::string> vecNames;
    std::vector<std::unique_ptr<Shape>> vecShapes;
    Table.jTypes = Json::Value(Json::objectValue);
    for (int i = 0; i < 17; ++i) {
        vecNames.push_back("c" + std::to_string(i));
        Table.jTypes[vecNames.back()]["cpptype"] = "int";
    }
    for (int i = 0; i < 17; ++i) {
        vecShapes.push_back(std::make_unique<Shape>(
            std::vector<std::string>(vecNames.begin(), vecNames.begin() + i + 1)));
    }
    std::vector<const RowTemplate*> vecTemplates;
    for (int i = 0; i < 16; ++i) {
        vecTemplates.push_back(vecShapes[i]->TemplateIn(Table));
        EXPECT_NE(vecTemplates.back(), nullptr) << i;
    }
    EXPECT_EQ(vecShapes[16]->TemplateIn(Table), nullptr);
    for (int i = 0; i < 16; ++i) {
        EXPECT_EQ(vecShapes[i]->TemplateIn(Table), vecTemplates[i]) << i;
    }
}

TEST(KnownTablesTest, TypesAreLookedUpOnceAndTemplatesGoWithThem) {
    KnownTable Table("t");
    Table.jTypes = TypesOf({"x"});
    Shape One({"x"});
    const auto* pTypes = &Table.Types();
    EXPECT_EQ(&Table.Types(), pTypes);
    EXPECT_NE(One.TemplateIn(Table), nullptr);
    Table.jTypes = "no object";
    EXPECT_EQ(Table.Types().Members().size(), 0U);
    EXPECT_EQ(One.TemplateIn(Table), nullptr);
    Table.jTypes = TypesOf({"x"});
    EXPECT_NE(One.TemplateIn(Table), nullptr);
}

TEST(KnownTablesTest, NameIsKeptOnce) {
    KnownTables Tables;
    const char* szKept = Tables.KeptName("x");
    EXPECT_STREQ(szKept, "x");
    EXPECT_STREQ(Tables.KeptName("y"), "y");
    EXPECT_EQ(Tables.KeptName(std::string("x").c_str()), szKept);
    Tables.Forget();
    EXPECT_EQ(Tables.KeptName("x"), szKept);
}

TEST(KnownTablesTest, ColumnIsReadOnceItsMemberIsAdded) {
    KnownTable Table("t");
    Table.jTypes = TypesOf({"x"});
    Shape Both({"x", "y"});
    EXPECT_EQ(Both.TemplateIn(Table), nullptr);
    Table.jTypes["y"]["cpptype"] = "int";
    EXPECT_NE(Both.TemplateIn(Table), nullptr);
}

}  // namespace
