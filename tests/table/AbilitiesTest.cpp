// What AbilitiesOf says of every type name, beside what the handles really do.

#include <VornJsonDbApi.h>

#include "OldHandleFixture.h"

namespace VORN_JSON_DB {

namespace {

struct TypeCase {
    const char* szType;
    std::vector<const char*> vecValues;
};

const std::vector<TypeCase>& AllTypes() {
    static const std::vector<TypeCase> s_vecTypes{
        {"string", {R"("x")", R"("")", R"("it's 5%")"}},
        {"int", {"5", "-2147483648", "2147483647"}},
        {"long long", {"5", "9223372036854775807"}},
        {"bool", {"true", "false"}},
        {"Json::objectValue", {R"({"a":[1,"'"]})", "{}"}},
        {"Json::arrayValue", {R"([1,"x"])", R"(["x"])", "[]"}},
        {"Json::Value", {R"({"a":1})", "5", R"("x")", "true"}},
        {"unsigned int", {"5", "2147483647"}},
        {"unsigned long long", {"5", "9223372036854775807"}},
        {"long", {"5", "-5"}},
        {"unsigned long", {"5"}},
        {"unsigned", {"5"}},
        {"double", {"0.5", "0.1"}},
        {"float", {"0.5"}},
        {"uid_t", {"5"}},
        {"time_t", {"1700000000"}},
        {"any", {"5", R"("x")", "0.5"}},
    };
    return s_vecTypes;
}

std::string Letters(const Abilities& Some) {
    return std::string(Some.blCreate ? "c" : "-") + (Some.blRead ? "r" : "-") +
           (Some.blUpdate ? "u" : "-") + (Some.blQuery ? "q" : "-");
}

class AbilitiesTest : public OldHandleTest {
  protected:
    static Json::Value Record(int nId, const Json::Value& jValue) {
        Json::Value jRecord;
        jRecord["id"] = nId;
        if (!jValue.isNull()) {
            jRecord["m"] = jValue;
        }
        return jRecord;
    }

    static Json::Value Only(const char* szMember, const Json::Value& jValue) {
        Json::Value jObject;
        jObject[szMember] = jValue;
        return jObject;
    }

    void Clear() { Run("DELETE FROM " + m_strName); }

    // How the column of a row compares with that of the row that a Table stored.
    bool IsStored() {
        return Rows("SELECT count(DISTINCT typeof(m) || quote(m)), count(m) FROM " + m_strName) ==
               "1|2";
    }

    void StoreByTable(int nId, const Json::Value& jValue) {
        Options How;
        How.blCompatible = false;
        Table Into;
        EXPECT_EQ(Text(Into.Open(m_pDb, m_strName, m_jDefinition, How)), "ok");
        EXPECT_EQ(Text(Into.Create(Record(nId, jValue))), "ok");
    }

    Abilities OldDoes(const Json::Value& jValue) {
        Abilities Does{};
        StoreByTable(1, jValue);
        Does.blCreate =
            OldCreate(Record(2, jValue)) == "0 " + Text(Record(2, jValue)) && IsStored();
        Clear();

        StoreByTable(1, jValue);
        Does.blRead = OldList(Only("id", 1), "m") == Text(jValue);
        Clear();

        StoreByTable(1, jValue);
        Run("INSERT INTO " + m_strName + " (id) VALUES (2)");
        Json::Value jFilter = Only("id", 2), jNew = Only("m", jValue);
        Does.blUpdate = m_pOld->recUpdateByFilter(jFilter, jNew) == 0 && IsStored();
        Clear();

        StoreByTable(1, jValue);
        Run("INSERT INTO " + m_strName + " (id) VALUES (2)");
        Json::Value jQuery = Only("m", jValue);
        Does.blQuery = m_pOld->recDelete(jQuery) == 1 && Rows("SELECT id FROM " + m_strName) == "2";
        Clear();
        return Does;
    }

    Abilities NewDoes(const Json::Value& jValue, bool blCompatible) {
        Options How;
        How.blCompatible = blCompatible;
        Table Of;
        EXPECT_EQ(Text(Of.Open(m_pDb, m_strName, m_jDefinition, How)), "ok");
        Abilities Does{};
        Does.blCreate = Of.Create(Record(1, jValue)).Ok();
        Clear();

        StoreByTable(1, jValue);
        Json::Value jFound;
        Does.blRead = Of.First(Query(), jFound).Ok() && Text(jFound["m"]) == Text(jValue);

        Run("INSERT INTO " + m_strName + " (id) VALUES (2)");
        std::int64_t nRows = 0;
        Query Second;
        Second.Where("id", 2);
        Does.blUpdate = Of.Update(Second, Only("m", jValue), &nRows).Ok() && IsStored();
        Run("UPDATE " + m_strName + " SET m = NULL WHERE id = 2");

        Query ByValue;
        ByValue.Where("m", jValue);
        Does.blQuery = Of.Count(ByValue, nRows).Ok() && nRows == 1;
        Clear();
        return Does;
    }

    static void KeepCommon(Abilities& Common, const Abilities& Does) {
        Common.blCreate = Common.blCreate && Does.blCreate;
        Common.blRead = Common.blRead && Does.blRead;
        Common.blUpdate = Common.blUpdate && Does.blUpdate;
        Common.blQuery = Common.blQuery && Does.blQuery;
    }
};

}  // namespace

TEST_F(AbilitiesTest, SaysOfEveryTypeWhatTheHandlesDo) {
    std::string strMatrix;
    for (const TypeCase& Case : AllTypes()) {
        Describe(std::string(R"({"id": {"cpptype": "int"}, "m": {"cpptype": ")") + Case.szType +
                 "\"}}");
        const MemberAbilities Said = AbilitiesOf(m_strName, m_jDefinition)[1];
        Abilities Old{true, true, true, true}, Compatible = Old, New = Old;
        for (const char* szValue : Case.vecValues) {
            const Json::Value jValue = Parse(szValue);
            KeepCommon(Old, OldDoes(jValue));
            KeepCommon(Compatible, NewDoes(jValue, true));
            KeepCommon(New, NewDoes(jValue, false));
        }
        EXPECT_EQ(Letters(Said.Old), Letters(Old)) << Case.szType;
        EXPECT_EQ(Letters(Said.Compatible), Letters(Compatible)) << Case.szType;
        EXPECT_EQ(Letters(Said.New), Letters(New)) << Case.szType;
        EXPECT_EQ(Said.strMember, "m");
        EXPECT_EQ(Said.strType, Case.szType);
        strMatrix += std::string(Case.szType) + " " + Letters(Said.Old) + " " +
                     Letters(Said.Compatible) + " " + Letters(Said.New) + "\n";
    }
    EXPECT_EQ(strMatrix,
              "string cruq cruq cruq\n"
              "int cruq cruq cruq\n"
              "long long cruq cruq cruq\n"
              "bool cruq cruq cruq\n"
              "Json::objectValue cruq cruq cruq\n"
              "Json::arrayValue cr-- cruq cruq\n"
              "Json::Value -r-q cruq cruq\n"
              "unsigned int -r-q cruq cruq\n"
              "unsigned long long -r-q cruq cruq\n"
              "long ---q -r-q cruq\n"
              "unsigned long ---q -r-q cruq\n"
              "unsigned ---q -r-q cruq\n"
              "double ---q -r-q cruq\n"
              "float ---q -r-q cruq\n"
              "uid_t --uq -r-q cruq\n"
              "time_t --uq -r-q cruq\n"
              "any ---- -r-q cruq\n");
}

TEST_F(AbilitiesTest, UnknownTypesCanNothing) {
    const auto vecOf = AbilitiesOf("t", Parse(R"({"t": {"member": {"m": {"cpptype": "text"},
        "n": {}, "s": {"cpptype": "string"}}}})"));
    ASSERT_EQ(vecOf.size(), 3U);
    EXPECT_EQ(vecOf[0].strType, "text");
    EXPECT_EQ(Letters(vecOf[0].Old) + Letters(vecOf[0].Compatible) + Letters(vecOf[0].New),
              "------------");
    EXPECT_EQ(vecOf[1].strType, "");
    EXPECT_EQ(Letters(vecOf[1].Old) + Letters(vecOf[1].Compatible) + Letters(vecOf[1].New),
              "------------");
    EXPECT_EQ(Letters(vecOf[2].Old) + Letters(vecOf[2].Compatible) + Letters(vecOf[2].New),
              "cruqcruqcruq");
    EXPECT_TRUE(AbilitiesOf("u", Parse(R"({"t": {"member": {}}})")).empty());
    EXPECT_TRUE(AbilitiesOf("u", Json::Value()).empty());
}

// An old handle lists all columns by their names, and writes and compares those that it is given.
TEST_F(AbilitiesTest, NameThatIsAWordOfSqlSpoilsListsOfTheWholeTable) {
    Describe(R"({"id": {"cpptype": "int"}, "order": {"cpptype": "int", "cppDefaultValue": 1},
                 "z": {"cpptype": "int"}})");
    const auto vecOf = AbilitiesOf(m_strName, m_jDefinition);
    EXPECT_EQ(Letters(vecOf[0].Old), "c-uq");
    EXPECT_EQ(Letters(vecOf[1].Old), "----");
    EXPECT_EQ(Letters(vecOf[1].New), "cruq");
    Run("INSERT INTO " + m_strName + " VALUES (1, 2, 3)");
    EXPECT_EQ(OldList(Only("id", 1)), "-1");
    Json::Value jFilter = Only("id", 1), jNew = Only("z", 4), jOrder = Only("order", 4);
    EXPECT_EQ(m_pOld->recUpdateByFilter(jFilter, jNew), 0);
    EXPECT_EQ(m_pOld->recUpdateByFilter(jFilter, jOrder), -1);
    EXPECT_EQ(m_pOld->recDelete(jOrder), -1);
    EXPECT_EQ(AllRows(), "1|2|4");
    EXPECT_EQ(m_pOld->recDelete(jFilter), 1);
    const auto vecBadTable =
        AbilitiesOf("select", Parse(R"({"select": {"member": {"a": {"cpptype": "int"}}}})"));
    EXPECT_EQ(Letters(vecBadTable[0].Old), "----");
    const auto vecBadName =
        AbilitiesOf("t", Parse(R"({"t": {"member": {"$a": {"cpptype": "int"}}}})"));
    EXPECT_EQ(Letters(vecBadName[0].Old) + Letters(vecBadName[0].New), "--------");
}

}  // namespace VORN_JSON_DB
