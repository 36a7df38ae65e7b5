// Queries for the old handle: the text that they become, and that it means the same there.

#include <VornJsonDbApi.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <random>

#include "QueryFixture.h"

namespace VORN_JSON_DB {

namespace {

// The old handle knows a table by its name for the life of the process. A member whose name means
// something else in its queries can be asked for all the same.
constexpr char kOldDocs[] = R"({"olddoc": {"key": "id", "member": {
    "id": {"cpptype": "int"}, "name": {"cpptype": "string"}, "size": {"cpptype": "long long"},
    "done": {"cpptype": "bool"}, "sort_by": {"cpptype": "string"}, "map": {"cpptype": "Json::objectValue"}}}})";

class OldQuery : public TableTest {
  protected:
    OldQuery() {
        Open(kOldDocs);
        std::string strName = "olddoc";
        std::string strCreate = "SELECT 1";
        Json::Value jDefinition = Parse(kOldDocs);
        m_pOld = std::make_unique<VornJsonDbApi>(m_pDb, strName, jDefinition, strCreate);
        for (
            const char* szRecord :
            {R"({"id": 1, "name": "b", "size": 10, "done": true, "sort_by": "x", "map": {"a": 0.1}})",
             R"({"id": 2, "name": "a", "size": 20, "done": false, "sort_by": "y", "map": {"a": 1}})",
             R"({"id": 3, "name": null, "size": null, "done": null, "sort_by": null, "map": null})",
             R"({"id": 4, "name": "100%", "size": 10, "done": true, "sort_by": "", "map": {}})"}) {
            EXPECT_EQ("ok", Text(m_Table.Create(Parse(szRecord))));
        }
    }

    // The filter, names of columns without the table's; or what is wrong.
    std::string Filter(const std::string& strQuery, OldCall eCall = OldCall::kRead) {
        Json::Value jOld;
        const Status Outcome = m_Table.ToOldQuery(Parse(strQuery), eCall, jOld);
        if (!Outcome.Ok()) {
            return Text(Outcome);
        }
        const bool blFilter = jOld.size() == 1 && jOld.isMember("vornSqlWhereFilter");
        return blFilter ? Replaced(jOld["vornSqlWhereFilter"].asString(), "\"olddoc\".", "")
                        : Text(jOld);
    }

    std::string Ids(const std::string& strQuery) {
        Json::Value jOld, jRecords(Json::arrayValue);
        EXPECT_EQ("ok", Text(m_Table.ToOldQuery(Parse(strQuery), OldCall::kRead, jOld)));
        EXPECT_EQ(0, m_pOld->recList(jOld, jRecords)) << Text(jOld);
        std::string strIds;
        for (const Json::Value& jRecord : jRecords) {
            strIds += Text(jRecord["id"]);
        }
        return strIds;
    }

    std::unique_ptr<VornJsonDbApi> m_pOld;
};

}  // namespace

TEST_F(OldQuery, ValuesAreLiterals) {
    struct Case {
        const char* szWhere;
        const char* szFilter;
    };
    const Case kCases[] = {
        {R"({"id": 5})", R"("id" IS 5)"},
        {R"({"size": -9223372036854775808})", R"("size" IS -9223372036854775808)"},
        {R"({"name": null})", R"("name" COLLATE BINARY IS NULL)"},
        {R"({"name": "it's"})", R"("name" COLLATE BINARY IS 'it''s')"},
        {R"({"name": "100% -- /* \" ?"})", R"("name" COLLATE BINARY IS '100% -- /* " ?')"},
        {R"({"name": "\u00e9"})", "\"name\" COLLATE BINARY IS '\xc3\xa9'"},
        {R"({"name": "a\u0000b"})", R"("name" COLLATE BINARY IS +CAST(x'610062' AS TEXT))"},
        {R"({"done": true})", R"("done" IS 1)"},
        {R"({"map": {"a": "'"}})", R"("map" COLLATE BINARY IS '{"a":"''"}')"},
        {R"({"id": {"$in": [1, 2, null]}})", R"(("id" IS NULL OR "id" IN (1,2)))"},
        {R"({"name": {"$nin": ["a", "b"]}})",
         R"(("name" COLLATE BINARY IN ('a','b')) IS NOT TRUE)"},
        {R"({"id": {"$in": []}})", R"(("id" IN ()))"},
        {R"({"name": {"$like": "a\\%%"}})",
         R"(("name" LIKE 'a\%%'||'' ESCAPE '\' AND typeof("name") = 'text'))"},
        {R"({"name": {"$prefix": ""}})",
         R"(("name" COLLATE BINARY >= '' AND "name" COLLATE BINARY < x''))"},
        {R"({"map.a": 0.1})",
         R"((CASE WHEN json_valid("map") THEN json_extract("map", '$."a"') END IS )"
         R"(+CAST('0.10000000000000001' AS REAL) AND CASE WHEN json_valid("map") THEN )"
         R"(json_type("map", '$."a"') END IN ('integer', 'real')))"},
    };
    for (const Case& Each : kCases) {
        EXPECT_EQ(Each.szFilter, Filter(std::string("{\"where\": ") + Each.szWhere + "}"));
    }
    EXPECT_EQ("\"name\" COLLATE BINARY IS +CAST(x'ff' AS TEXT)", [this] {
        Json::Value jOld;
        EXPECT_EQ("ok",
                  Text(m_Table.ToOldQuery(Query().Where("name", "\xff"), OldCall::kRead, jOld)));
        return Replaced(jOld["vornSqlWhereFilter"].asString(), "\"olddoc\".", "");
    }());
}

TEST_F(OldQuery, SortingAndPagingCloseTheParenthesisAndCommentTheRest) {
    EXPECT_EQ("{}", Filter("{}"));
    EXPECT_EQ(R"(1) ORDER BY "name" COLLATE BINARY, "id" --)", Filter(R"({"sort": ["name"]})"));
    EXPECT_EQ(R"("size" IS 10) ORDER BY "size" DESC, "id" LIMIT 2 OFFSET 1 --)",
              Filter(R"({"where": {"size": 10}, "sort": ["-size"], "limit": 2, "offset": 1})"));
    EXPECT_EQ(R"(1) ORDER BY "id" LIMIT -1 OFFSET 3 --)", Filter(R"({"offset": 3})"));
    EXPECT_EQ("1234", Ids("{}"));
    EXPECT_EQ("3421", Ids(R"({"sort": ["name"]})"));
    EXPECT_EQ("2143", Ids(R"({"sort": ["-size"]})"));
    EXPECT_EQ("14", Ids(R"({"where": {"size": 10}, "sort": ["-size"]})"));
    EXPECT_EQ("4", Ids(R"({"where": {"size": 10}, "limit": 1, "offset": 1})"));
    EXPECT_EQ("34", Ids(R"({"offset": 2})"));
}

TEST_F(OldQuery, TheOldHandleSelectsTheSame) {
    EXPECT_EQ("3", Ids(R"({"where": {"name": null}})"));
    EXPECT_EQ("234", Ids(R"({"where": {"name": {"$ne": "b"}}})"));
    EXPECT_EQ("4", Ids(R"({"where": {"name": "100%"}})"));
    EXPECT_EQ("1", Ids(R"({"where": {"sort_by": "x"}})"));
    EXPECT_EQ("1", Ids(R"({"where": {"map.a": 0.1}})"));
    EXPECT_EQ("12", Ids(R"({"where": {"$or": [{"name": "a"}, {"map.a": {"$lt": 1}}]}})"));
    Json::Value jOld, jOne;
    EXPECT_EQ("ok", Text(m_Table.ToOldQuery(Parse(R"({"sort": ["name"], "offset": 1, "limit": 1})"),
                                            OldCall::kRead, jOld)));
    EXPECT_EQ(1, m_pOld->recGetOne(jOld, jOne));
    EXPECT_EQ("4", Text(jOne["id"]));
}

TEST_F(OldQuery, ChangesReachTheSame) {
    Json::Value jOld;
    Json::Value jNew = Parse(R"({"name": "new' %d"})");
    EXPECT_EQ("ok", Text(m_Table.ToOldQuery(Parse(R"({"where": {"size": {"$ne": 10}}})"),
                                            OldCall::kChange, jOld)));
    EXPECT_EQ(0, m_pOld->recUpdateByFilter(jOld, jNew));
    EXPECT_EQ("1|b;2|new' %d;3|new' %d;4|100%", Rows("SELECT id, name FROM olddoc"));
    EXPECT_EQ(2, m_pOld->recDelete(jOld));
    EXPECT_EQ("1;4", Rows("SELECT id FROM olddoc"));
    EXPECT_EQ(
        "refused: cannot write an old query for table \"olddoc\": a change reaches all records "
        "that the conditions select, in no order [paged-change ]",
        Filter(R"({"where": {"id": 1}, "sort": ["id"]})", OldCall::kChange));
    EXPECT_EQ(
        "refused: cannot write an old query for table \"olddoc\": the query has no condition "
        "and would reach every record [no-condition /where]",
        Filter("{}", OldCall::kChange));
    EXPECT_EQ("ok [empty-nin /where/id/$nin]",
              Text(m_Table.ToOldQuery(Parse(R"({"where": {"id": {"$nin": []}}})"), OldCall::kChange,
                                      jOld)));
}

TEST_F(OldQuery, WhatIsRefusedLeavesTheOutputAlone) {
    Json::Value jOld = "as it was";
    EXPECT_EQ(
        "refused: cannot write an old query for table \"olddoc\": table \"olddoc\" has no "
        "member \"nmae\" (did you mean \"name\"?) [unknown-member /where/nmae]",
        Text(m_Table.ToOldQuery(Parse(R"({"where": {"nmae": 1}})"), OldCall::kRead, jOld)));
    EXPECT_EQ("\"as it was\"", Text(jOld));
    Table Closed;
    EXPECT_EQ(StatusCode::kMisuse, Closed.ToOldQuery(Query(), OldCall::kRead, jOld).Code());
}

// The old handle's statements are nested deeper than a Table's.
TEST_F(OldQuery, AsDeepAsTheOldHandleCanRun) {
    Condition Made("id", 1);
    Json::Value jOld, jRecords(Json::arrayValue);
    Json::Value jNew = Parse(R"({"size": 3})");
    int nLevels = 0;
    Status Outcome;
    for (; Outcome.Ok() && nLevels < 1000; ++nLevels) {
        Made = nLevels % 2 == 0 ? Condition::All({Made, Condition("size", 10)})
                                : Condition::Any({Made, Condition("size", 11)});
        Outcome = m_Table.ToOldQuery(Query().Where(Made), OldCall::kChange, jOld);
        if (Outcome.Ok()) {
            EXPECT_EQ(0, m_pOld->recList(jOld, jRecords));
            EXPECT_EQ(0, m_pOld->recUpdateByFilter(jOld, jNew));
        }
    }
    EXPECT_LT(80, nLevels);
    EXPECT_STREQ("nested-too-deep", Outcome.Findings()[0].szCode);
}

TEST_F(TableTest, RealsAreExactInTheOldHandlesText) {
    Open(
        R"({"r": {"key": "id", "member": {"id": {"cpptype": "int"}, "rate": {"cpptype": "double"}}}})",
        [] {
            Options How;
            How.blCompatible = false;
            return How;
        }());
    std::vector<double> vecReals{0.0,
                                 -0.0,
                                 1.0,
                                 -1.0,
                                 0.1,
                                 1.0 / 3,
                                 1e300,
                                 5e-324,
                                 -5e-324,
                                 2.2250738585072014e-308,
                                 1.7976931348623157e308,
                                 9007199254740993.0,
                                 9223372036854775808.0,
                                 4611686018427387904.0,
                                 std::numeric_limits<double>::infinity(),
                                 -std::numeric_limits<double>::infinity()};
    std::mt19937_64 Random(1);
    for (int i = 0; i < 300; ++i) {
        const std::uint64_t nBits = Random();
        double dValue = 0;
        std::memcpy(&dValue, &nBits, sizeof(dValue));
        vecReals.push_back(std::isnan(dValue) ? 0.7 : dValue);
    }
    for (const double dReal : vecReals) {
        Json::Value jRecord, jOld;
        jRecord["rate"] = dReal;
        ASSERT_EQ("ok", Text(m_Table.Create(jRecord)));
        ASSERT_EQ("ok",
                  Text(m_Table.ToOldQuery(Query().Where("rate", dReal), OldCall::kRead, jOld)));
        const std::string strFilter = jOld["vornSqlWhereFilter"].asString();
        EXPECT_EQ("1", Rows("SELECT max(id) = (SELECT max(id) FROM r) FROM r WHERE ( " + strFilter +
                            "  )"))
            << strFilter;
        EXPECT_EQ("1", Rows("SELECT count(DISTINCT rate) FROM r WHERE ( " + strFilter + "  )"));
    }
    Json::Value jOld;
    EXPECT_EQ("ok", Text(m_Table.ToOldQuery(Query().Where("rate", 0.75), OldCall::kRead, jOld)));
    EXPECT_EQ(R"("r"."rate" IS (CAST(3 AS REAL)/4))", jOld["vornSqlWhereFilter"].asString());
    EXPECT_EQ("ok", Text(m_Table.ToOldQuery(Query().Where("rate", -6), OldCall::kRead, jOld)));
    EXPECT_EQ(R"("r"."rate" IS (CAST(-3 AS REAL)*2))", jOld["vornSqlWhereFilter"].asString());
    EXPECT_EQ("ok", Text(m_Table.ToOldQuery(Query().Where("rate", 5), OldCall::kRead, jOld)));
    EXPECT_EQ(R"("r"."rate" IS (CAST(5 AS REAL)/1))", jOld["vornSqlWhereFilter"].asString());
}

// A CAST has an affinity: with it, numbers would be compared as texts.
TEST_F(TableTest, TextsThatAreNotPlainHaveNoAffinityInTheOldHandlesText) {
    Options How;
    How.blCompatible = false;
    How.strSqlCreate = "CREATE TABLE a (id INTEGER PRIMARY KEY, any)";
    Open(R"({"a": {"key": "id", "member": {"id": {"cpptype": "int"}, "any": {"cpptype": "any"}}}})",
         How);
    Run("INSERT INTO a VALUES (1, 5), (2, '5'), (3, '9'), (4, 9)");
    Json::Value jOld;
    const std::string strNul("5\0", 2);
    EXPECT_EQ("ok", Text(m_Table.ToOldQuery(Query().Where("any", Op::kGreater, strNul),
                                            OldCall::kRead, jOld)));
    EXPECT_EQ("3",
              Rows("SELECT id FROM a WHERE ( " + jOld["vornSqlWhereFilter"].asString() + "  )"));
}

}  // namespace VORN_JSON_DB
