// The SQL of queries, and what SQLite makes of it.

#include <algorithm>
#include <regex>

#include "QueryFixture.h"

namespace VORN_JSON_DB {

using vornjsondb::Members;
using vornjsondb::QueryPlan;

namespace {

class ConditionSql : public QueryTest {
  protected:
    // SQLite's plan for a query, line by line.
    std::string Steps(const std::string& strQuery) {
        FindingList vecFindings;
        const Members Of("doc", Parse(kDocs), vecFindings);
        vornjsondb::JsonCodec Codec;
        QueryPlan Plan(Of, Codec);
        const Query Which(Parse(strQuery));
        Plan.Resolve(Which, QueryUse::kRead, vecFindings);
        EXPECT_EQ("", Text(vecFindings));
        std::string strSql = "EXPLAIN QUERY PLAN SELECT * FROM doc";
        Plan.AppendWhere(strSql);
        Plan.AppendTail(strSql);
        sqlite3_stmt* pStatement = nullptr;
        EXPECT_EQ(SQLITE_OK, sqlite3_prepare_v2(m_pDb, strSql.c_str(), -1, &pStatement, nullptr))
            << sqlite3_errmsg(m_pDb);
        std::string strSteps;
        while (sqlite3_step(pStatement) == SQLITE_ROW) {
            strSteps += strSteps.empty() ? "" : "; ";
            strSteps += reinterpret_cast<const char*>(sqlite3_column_text(pStatement, 3));
        }
        sqlite3_finalize(pStatement);
        return strSteps;
    }

    // How many KiB SQLite needs at most while it counts what the condition selects.
    sqlite3_int64 Kilobytes(const Condition& What) {
        sqlite3_memory_highwater(1);
        const sqlite3_int64 nBefore = sqlite3_memory_used();
        std::int64_t nRecords = 0;
        EXPECT_EQ("ok", Text(m_Table.Count(Query().Where(What), nRecords)));
        return (sqlite3_memory_highwater(0) - nBefore) / 1024;
    }
};

Condition AllOrAny(bool blAll, std::vector<Condition> vecParts) {
    return blAll ? Condition::All(std::move(vecParts)) : Condition::Any(std::move(vecParts));
}

// Groups of all and of any in turns.
Condition Tree(const std::vector<Condition>& vecLeaves, size_t nFan, bool blAll) {
    if (vecLeaves.size() == 1) {
        return vecLeaves[0];
    }
    std::vector<Condition> vecParts;
    for (size_t i = 0; i < nFan; ++i) {
        const auto itBegin =
            vecLeaves.begin() + static_cast<std::ptrdiff_t>(i * vecLeaves.size() / nFan);
        const auto itEnd =
            vecLeaves.begin() + static_cast<std::ptrdiff_t>((i + 1) * vecLeaves.size() / nFan);
        if (itBegin != itEnd) {
            vecParts.push_back(Tree({itBegin, itEnd}, nFan, !blAll));
        }
    }
    return AllOrAny(blAll, std::move(vecParts));
}

// One group in the other, each with another part.
Condition Comb(int nLevels, const Condition& Other) {
    Condition Made("id", 1);
    for (int i = 0; i < nLevels; ++i) {
        Made = AllOrAny(i % 2 == 0, {Other, Made});
    }
    return Made;
}

Json::Value Pair(int nLeast, int nMost) {
    Json::Value jPair(Json::arrayValue);
    jPair.append(nLeast);
    jPair.append(nMost);
    return jPair;
}

std::vector<Condition> Leaves(const char* szMember, Op eOp, const Json::Value& jOperand, size_t n) {
    return std::vector<Condition>(n, Condition(szMember, eOp, jOperand));
}

}  // namespace

TEST_F(ConditionSql, OperatorsOnColumns) {
    struct Case {
        const char* szWhere;
        const char* szSql;
    };
    const Case kCases[] = {
        {R"({"id": 5})", R"("id" IS ?)"},
        {R"({"id": null})", R"("id" IS ?)"},
        {R"({"name": "a"})", R"("name" COLLATE BINARY IS ?)"},
        {R"({"done": true})", R"("done" IS ?)"},
        {R"({"map": {"a": 1}})", R"("map" COLLATE BINARY IS ?)"},
        {R"({"map": {}})", R"("map" COLLATE BINARY IS ?)"},
        {R"({"tags": []})", R"("tags" COLLATE BINARY IS ?)"},
        {R"({"any": 5})", R"("any" COLLATE BINARY IS ?)"},
        {R"({"any": "a"})", R"("any" COLLATE BINARY IS ?)"},
        {R"({"id": {"$eq": 5}})", R"("id" IS ?)"},
        {R"({"id": {"$ne": 5}})", R"("id" IS NOT ?)"},
        {R"({"id": {"$ne": null}})", R"("id" IS NOT ?)"},
        {R"({"id": {"$lt": 5}})", R"("id" < ?)"},
        {R"({"id": {"$lte": 5}})", R"("id" <= ?)"},
        {R"({"id": {"$gt": 5}})", R"(("id" > ? AND "id" < ''))"},
        {R"({"id": {"$gte": 5}})", R"(("id" >= ? AND "id" < ''))"},
        {R"({"name": {"$lt": "a"}})",
         R"(("name" COLLATE BINARY < ? AND "name" COLLATE BINARY >= ''))"},
        {R"({"name": {"$lte": "a"}})",
         R"(("name" COLLATE BINARY <= ? AND "name" COLLATE BINARY >= ''))"},
        {R"({"name": {"$gt": "a"}})",
         R"(("name" COLLATE BINARY > ? AND "name" COLLATE BINARY < x''))"},
        {R"({"name": {"$gte": "a"}})",
         R"(("name" COLLATE BINARY >= ? AND "name" COLLATE BINARY < x''))"},
        {R"({"id": {"$between": [1, 2]}})", R"("id" BETWEEN ? AND ?)"},
        {R"({"name": {"$between": ["a", "b"]}})", R"("name" COLLATE BINARY BETWEEN ? AND ?)"},
        {R"({"id": {"$in": []}})", R"(("id" IN ()))"},
        {R"({"id": {"$nin": []}})", R"(("id" IN ()) IS NOT TRUE)"},
        {R"({"id": {"$in": [1]}})", R"(("id" IN (SELECT value FROM json_each(?))))"},
        {R"({"id": {"$in": [null]}})", R"(("id" IS NULL))"},
        {R"({"id": {"$nin": [1, null]}})",
         R"(("id" IS NULL OR "id" IN (SELECT value FROM json_each(?))) IS NOT TRUE)"},
        {R"({"rate": {"$in": [1, 0.5, 2.5]}})",
         R"(("rate" IN (SELECT value FROM json_each(?)) OR "rate" IN (?,?)))"},
        {R"({"any": {"$in": [1, "a"]}})",
         R"(("any" COLLATE BINARY IN (SELECT value FROM json_each(?)) OR )"
         R"("any" COLLATE BINARY IN (SELECT value FROM json_each(?))))"},
        {R"({"name": {"$like": "a%"}})",
         R"(("name" LIKE ?||'' ESCAPE '\' AND typeof("name") = 'text'))"},
        {R"({"name": {"$prefix": "a"}})",
         R"(("name" COLLATE BINARY >= ? AND "name" COLLATE BINARY < ?))"},
        {R"({"id": {"$null": true}})", R"("id" IS NULL)"},
        {R"({"name": {"$null": false}})", R"("name" IS NOT NULL)"},
        {R"({"id": {"$not": {"$eq": 5}}})", R"(("id" IS ?) IS NOT TRUE)"},
    };
    for (const Case& Each : kCases) {
        EXPECT_EQ(Each.szSql, Where(Each.szWhere)) << Each.szWhere;
    }
}

TEST_F(ConditionSql, PlacesInsideOfJsonAreGuardedAndOfOneKind) {
    const std::string strValue =
        R"(CASE WHEN json_valid("map") THEN json_extract("map", '$."a"."it''s"[0]') END)";
    const std::string strKind =
        R"(CASE WHEN json_valid("map") THEN json_type("map", '$."a"."it''s"[0]') END)";
    const auto At = [](const std::string& strOperators) {
        return Where("{\"map.a.it's[0]\": " + strOperators + "}");
    };
    EXPECT_EQ("(" + strValue + " IS ? AND " + strKind + " = 'text')", At("\"x\""));
    EXPECT_EQ("(" + strValue + " IS ? AND " + strKind + " IN ('integer', 'real'))", At("5"));
    EXPECT_EQ("(" + strValue + " IS +CAST(? AS REAL) AND " + strKind + " IN ('integer', 'real'))",
              At("0.5"));
    EXPECT_EQ("(" + strValue + " IS ? AND " + strKind + " = 'object')", At("{\"b\": 1}"));
    EXPECT_EQ("(" + strValue + " IS ? AND " + strKind + " = 'array')", At("[1]"));
    EXPECT_EQ(strKind + " = 'true'", At("true"));
    EXPECT_EQ(strKind + " = 'false'", At("false"));
    EXPECT_EQ(strValue + " IS NULL", At("null"));
    EXPECT_EQ("(" + strValue + " IS NULL) IS NOT TRUE", At("{\"$ne\": null}"));
    EXPECT_EQ("((" + strValue + " IS ? AND " + strKind + " = 'text')) IS NOT TRUE",
              At("{\"$ne\": \"x\"}"));
    EXPECT_EQ("(" + strValue + " > ? AND " + strKind + " IN ('integer', 'real'))",
              At("{\"$gt\": 5}"));
    EXPECT_EQ("(" + strValue + " BETWEEN ? AND +CAST(? AS REAL) AND " + strKind +
                  " IN ('integer', 'real'))",
              At("{\"$between\": [1, 2.5]}"));
    EXPECT_EQ("(" + strValue + " LIKE ?||'' ESCAPE '\\' AND " + strKind + " = 'text')",
              At("{\"$like\": \"a\"}"));
    EXPECT_EQ("(" + strValue + " >= ? AND " + strValue + " < ? AND " + strKind + " = 'text')",
              At("{\"$prefix\": \"a\"}"));
    EXPECT_EQ("(" + strValue + " IS NULL OR (" + strValue +
                  " IN (SELECT value FROM json_each(?)) AND " + strKind + " = 'text') OR " +
                  strKind + " = 'true')",
              At("{\"$in\": [true, \"a\", null]}"));
    EXPECT_EQ(strValue + " IS NOT NULL", At("{\"$null\": false}"));
}

TEST_F(ConditionSql, ElementsAreThoseOfAList) {
    EXPECT_EQ(R"(EXISTS (SELECT 1 FROM json_each(CASE WHEN json_valid("tags") THEN CASE )"
              R"(json_type("tags") WHEN 'array' THEN "tags" END END) AS "doc[]" WHERE )"
              R"("doc[]".value IS ? AND "doc[]".type = 'text'))",
              Where(R"({"tags": {"$contains": "a"}})"));
    EXPECT_EQ(R"(EXISTS (SELECT 1 FROM json_each(CASE WHEN json_valid("json") THEN CASE )"
              R"(json_type("json", '$."a"') WHEN 'array' THEN "json" END END, '$."a"') AS "doc[]" )"
              R"(WHERE "doc[]".type = 'null'))",
              Where(R"({"json.a": {"$contains": null}})"));
}

TEST_F(ConditionSql, ValuesStandInTheOrderOfTheirQuestionMarks) {
    const auto Shown = [](const char* szWhere) {
        return Sql(
            Query(Parse(std::string("{\"limit\": 7, \"offset\": 8, \"where\": ") + szWhere + "}")),
            QueryUse::kCount, WriteShown);
    };
    EXPECT_EQ(R"( WHERE "id" IS {1} AND "name" COLLATE BINARY IS {'a'} AND "rate" IS {real 2.0})"
              " LIMIT {7} OFFSET {8}",
              Shown(R"({"id": 1, "name": "a", "rate": 2})"));
    EXPECT_EQ(R"( WHERE ("size" IS {2} OR "size" IS {3}) AND "id" IS {1} LIMIT {7} OFFSET {8})",
              Shown(R"({"$and": [{"id": 1}, {"$or": [{"size": 2}, {"size": 3}]}]})"));
    EXPECT_EQ(R"( WHERE ("name" COLLATE BINARY >= {'ab'} AND "name" COLLATE BINARY < {'ac'}))"
              " LIMIT {7} OFFSET {8}",
              Shown(R"({"name": {"$prefix": "ab"}})"));
    EXPECT_EQ(R"( WHERE ("name" COLLATE BINARY >= {''} AND "name" COLLATE BINARY < {blob ''}))"
              " LIMIT {7} OFFSET {8}",
              Shown(R"({"name": {"$prefix": ""}})"));
    EXPECT_EQ(R"( WHERE "map" COLLATE BINARY IS {'{"a":1,"b":[]}'} LIMIT {7} OFFSET {8})",
              Shown(R"({"map": {"b": [], "a": 1}})"));
}

// Without values in the text, lists are what they are when they are bound.
TEST_F(ConditionSql, ListsGoAsJsonTextWhereThatIsExact) {
    FindingList vecFindings;
    const Members Of("doc", Parse(kDocs), vecFindings);
    vornjsondb::JsonCodec Codec;
    std::forward_list<std::string> listTexts;
    vornjsondb::OperandReader Reader(Of, Codec, listTexts);
    const auto Read = [&](const char* szMember, const Json::Value& jList,
                          vornjsondb::ValueKind eKind) {
        vornjsondb::ListOperand List;
        vornjsondb::Problem Why;
        EXPECT_TRUE(vornjsondb::ReadList({Of.Find(szMember), ""}, jList, false, Reader, List, Why));
        const auto& Kind = List.Kinds[static_cast<size_t>(eKind)];
        std::string strText = Kind.strJson + (Kind.blBare ? " bare" : "");
        for (const vornjsondb::BoundValue& Value : Kind.vecValues) {
            strText += " " + Text(Value);
        }
        return strText;
    };
    using vornjsondb::ValueKind;
    EXPECT_EQ(
        "[1,-9223372036854775808,9223372036854775807]",
        Read("size", Parse("[1, -9223372036854775808, 9223372036854775807]"), ValueKind::kNumber));
    EXPECT_EQ("[1,9007199254740992,0] real 0.5 real 18014398509481984.0",
              Read("rate", Parse("[1.0, 9007199254740992, -0.0, 0.5, 18014398509481984]"),
                   ValueKind::kNumber));
    EXPECT_EQ(" bare", Read("rate", Parse("[null]"), ValueKind::kNull));
    Json::Value jTexts(Json::arrayValue);
    const std::string strNul("a\0b", 3);
    for (const std::string& strText :
         {std::string("a\"\\\n\x1f\x7f"), std::string("\xc3\xa9"), strNul, std::string("\xff"),
          std::string("\xc0\x80"), std::string("\xed\xa0\x80"), std::string("\xf4\x90\x80\x80"),
          std::string("\xf4\x8f\xbf\xbf"), std::string("\xe0\x9f\xbf"), std::string("\xc3")}) {
        jTexts.append(strText);
    }
    EXPECT_EQ("[\"a\\\"\\\\\\u000a\\u001f\x7f\",\"\xc3\xa9\",\"\xf4\x8f\xbf\xbf\"] '" + strNul +
                  "' '\xff' '\xc0\x80' '\xed\xa0\x80' '\xf4\x90\x80\x80' '\xe0\x9f\xbf' '\xc3'",
              Read("name", jTexts, ValueKind::kText));
}

TEST_F(ConditionSql, GroupsWithinGroups) {
    EXPECT_EQ(R"(("id" IS ? OR "id" IS ?))", Where(R"({"$or": [{"id": 1}, {"id": 2}]})"));
    EXPECT_EQ(R"("id" IS ? AND "size" IS ?)", Where(R"({"$and": [{"id": 1}, {"size": 2}]})"));
    EXPECT_EQ(R"("id" IS ?)", Where(R"({"$and": [{"$or": [{"$and": [{"id": 1}]}]}]})"));
    EXPECT_EQ(R"("id" IS ? AND "size" IS ? AND "rate" IS ? AND "small" IS ?)",
              Where(R"({"$and": [{"$and": [{"id": 1}, {"size": 2}]}, {"rate": 1}], "small": 3})"));
    EXPECT_EQ(R"(("id" IS ? AND "size" IS ?) IS NOT TRUE)",
              Where(R"({"$not": {"id": 1, "size": 2}})"));
    EXPECT_EQ(R"((("id" IS ?) IS NOT TRUE) IS NOT TRUE)",
              Where(R"({"$not": {"$not": {"id": 1}}})"));
    EXPECT_EQ(R"((("id" IS ? AND "size" IS ?) OR "id" IS ?) AND "rate" IS ?)",
              Where(R"({"rate": 1, "$or": [{"id": 3}, {"id": 1, "size": 2}]})"));
    EXPECT_EQ(R"((("id" > ? AND "id" < '') AND "id" < ?) IS NOT TRUE)",
              Where(R"({"id": {"$not": {"$gt": 1, "$lt": 5}}})"));
}

TEST_F(ConditionSql, ConditionsOfAnObjectStandInTheOrderOfItsKeys) {
    EXPECT_EQ(R"(("id" > ? AND "id" < '') AND "id" IS NOT ? AND "name" COLLATE BINARY IS ?)",
              Where(R"({"name": "a", "id": {"$ne": 3, "$gt": 1}})"));
}

// 999 links in one chain are more than SQLite takes.
TEST_F(ConditionSql, LongChainsAreTreesOfChains) {
    std::vector<Condition> vecParts = Leaves("id", Op::kEqual, 1, 9);
    const std::string strIs = "\"id\" IS ?";
    EXPECT_EQ(" WHERE ((" + strIs + " OR " + strIs + " OR " + strIs + " OR " + strIs + ") OR (" +
                  strIs + " OR " + strIs + " OR " + strIs + " OR " + strIs + " OR " + strIs + "))",
              Sql(Query().Where(Condition::Any(vecParts))));
    std::int64_t nRecords = 0;
    for (const bool blAll : {true, false}) {
        const Condition Many = AllOrAny(blAll, Leaves("id", Op::kEqual, 1, 1000));
        EXPECT_EQ("ok", Text(m_Table.Count(Query().Where(Many), nRecords)));
    }
    EXPECT_EQ(
        "refused: cannot count records of table \"doc\": the query has more than 1000 "
        "conditions [too-many-conditions /where]",
        Text(m_Table.Count(Query().Where(Condition::Any(Leaves("id", Op::kEqual, 1, 1001))),
                           nRecords)));
}

TEST_F(ConditionSql, DeepGroupsOfManyConditionsAreHidden) {
    const auto Nested = [](size_t nLeaves) {
        std::vector<Condition> vecParts = Leaves("id", Op::kEqual, 1, nLeaves - 3);
        vecParts.push_back(Condition::All(
            {Condition("size", 1), Condition::Any({Condition("rate", 1), Condition("small", 1)})}));
        return Sql(Query().Where("done", true).Where(Condition::Any(vecParts)));
    };
    const std::string strInner = R"(("rate" IS ? OR "small" IS ?))";
    EXPECT_EQ(0U, Nested(15).find(" WHERE ((" + strInner + R"( AND "size" IS ?) OR ()"));
    EXPECT_EQ(0U, Nested(16).find(" WHERE ((" + strInner + R"( AND "size" IS ?) IS TRUE OR ()"));
    const auto Deeper = [](size_t nLeaves) {
        std::vector<Condition> vecParts = Leaves("id", Op::kEqual, 1, nLeaves - 2);
        return Sql(Query().Where("done", true).Where(Condition::Any(vecParts)).Where("size", 1));
    };
    EXPECT_EQ(std::string::npos, Deeper(100).find("IS TRUE"));
    const std::string strTail = R"( IS TRUE AND ("done" IS ? AND "size" IS ?))";
    EXPECT_EQ(strTail, Deeper(101).substr(Deeper(101).size() - strTail.size()));
}

TEST_F(ConditionSql, OfManyThatMustHoldTheFirstSixtyAreOpen) {
    const auto All = [](size_t n) {
        return Sql(Query().Where(Condition::All(Leaves("id", Op::kEqual, 1, n))));
    };
    const auto CountOf = [](const std::string& strText, const std::string& strPart) {
        return (strText.size() - Replaced(strText, strPart, "").size()) / strPart.size();
    };
    EXPECT_EQ(0U, CountOf(All(60), "IS TRUE"));
    const std::string strIs = "\"id\" IS ?";
    const std::string strFive =
        "(" + strIs + " AND " + strIs + " AND " + strIs + " AND " + strIs + " AND " + strIs + ")";
    const std::string strHidden = " AND (" + strFive + " AND " + strFive + ") IS TRUE";
    const std::string strSql = All(70);
    EXPECT_EQ(strHidden, strSql.substr(strSql.size() - strHidden.size()));
    EXPECT_EQ(1U, CountOf(strSql, "IS TRUE"));
    EXPECT_EQ(70U, CountOf(strSql, "?"));
    std::vector<Condition> vecParts = Leaves("id", Op::kEqual, 1, 69);
    vecParts.push_back(Condition::Any({Condition("size", 1), Condition("rate", 1)}));
    const std::string strGrouped = Sql(Query().Where(Condition::All(vecParts)));
    EXPECT_EQ(strGrouped.substr(strGrouped.size() - strHidden.size()), strHidden);
}

// A condition of these shapes took SQLite half a minute and gigabytes before groups were hidden.
TEST_F(ConditionSql, NoShapeOfManyConditionsMakesSqliteMultiply) {
    Run("CREATE INDEX i1 ON doc (size); CREATE INDEX i2 ON doc (size, name);"
        "CREATE INDEX i3 ON doc (name)");
    struct Case {
        const char* szMember;
        Op eOp;
        Json::Value jOperand;
    };
    const Case kCases[] = {{"size", Op::kGreater, 1},
                           {"size", Op::kEqual, 1},
                           {"size", Op::kBetween, Pair(1, 5)},
                           {"name", Op::kGreater, "a"},
                           {"name", Op::kPrefix, "a"}};
    for (const Case& Each : kCases) {
        for (const size_t nFan : {2, 3, 4, 20}) {
            for (const bool blAll : {true, false}) {
                const std::vector<Condition> vecLeaves =
                    Leaves(Each.szMember, Each.eOp, Each.jOperand, 256);
                EXPECT_GT(512, Kilobytes(Tree(vecLeaves, nFan, blAll))) << Each.szMember << nFan;
            }
        }
        EXPECT_GT(512, Kilobytes(Comb(80, Condition(Each.szMember, Each.eOp, Each.jOperand))));
        for (const bool blAll : {true, false}) {
            const std::vector<Condition> vecLeaves =
                Leaves(Each.szMember, Each.eOp, Each.jOperand, 500);
            EXPECT_GT(1536, Kilobytes(AllOrAny(blAll, vecLeaves)));
        }
    }
}

// The naive order stops Debian 12's SQLite at 30 levels.
TEST_F(ConditionSql, EightyLevelsRunAndTooManyAreAFinding) {
    const Condition Plain("size", 2);
    std::int64_t nRecords = 0;
    EXPECT_EQ("ok", Text(m_Table.Count(Query().Where(Comb(80, Plain)), nRecords)));
    const Status Deep = m_Table.Count(Query().Where(Comb(997, Plain)), nRecords);
    if (sqlite3_libversion_number() < 3046000) {
        EXPECT_EQ(
            "refused: cannot count records of table \"doc\": parser stack overflow "
            "[nested-too-deep /where]",
            Text(Deep));
    }
    Condition Nots("id", 1);
    for (int i = 0; i < 80; ++i) {
        Nots = Condition::Not(Nots);
    }
    EXPECT_EQ("ok", Text(m_Table.Count(Query().Where(Nots), nRecords)));
    for (int i = 0; i < 100000; ++i) {
        Nots = Condition::Not(Nots);
    }
    EXPECT_EQ("nested-too-deep /where: the conditions are nested too deep",
              Sql(Query().Where(Nots)));
}

TEST_F(ConditionSql, AsManyValuesAsSqliteBinds) {
    sqlite3_limit(m_pDb, SQLITE_LIMIT_VARIABLE_NUMBER, 100);
    Json::Value jReals(Json::arrayValue);
    for (int i = 0; i < 101; ++i) {
        jReals.append(i + 0.5);
    }
    EXPECT_EQ(
        "refused: cannot list records of table \"doc\": too many SQL variables "
        "[too-many-values /where]",
        Ids(Query().Where("rate", Op::kIn, jReals)));
    Json::Value jWhole(Json::arrayValue);
    for (int i = 0; i < 100000; ++i) {
        jWhole.append(i);
    }
    EXPECT_EQ("", Ids(Query().Where("id", Op::kIn, jWhole)));
}

TEST_F(ConditionSql, IndexesServeWhatTheyCan) {
    Run("CREATE INDEX by_name ON doc (name); CREATE INDEX by_size ON doc (size);"
        "CREATE INDEX by_city ON doc (CASE WHEN json_valid(map) THEN json_extract(map, "
        "'$.\"city\"') END)");
    struct Case {
        const char* szQuery;
        const char* szSteps;
    };
    const Case kCases[] = {
        {R"({"where": {"name": "a"}})", "SEARCH doc USING INDEX by_name (name=?)"},
        {R"({"where": {"name": null}})", "SEARCH doc USING INDEX by_name (name=?)"},
        {R"({"where": {"id": 1}})", "SEARCH doc USING INTEGER PRIMARY KEY (rowid=?)"},
        {R"({"where": {"size": {"$gt": 1}}})",
         "SEARCH doc USING INDEX by_size (size>? AND size<?)"},
        {R"({"where": {"name": {"$lt": "a"}}})",
         "SEARCH doc USING INDEX by_name (name>? AND name<?)"},
        {R"({"where": {"size": {"$between": [1, 2]}}})",
         "SEARCH doc USING INDEX by_size (size>? AND size<?)"},
        {R"({"where": {"name": {"$prefix": "a"}}})",
         "SEARCH doc USING INDEX by_name (name>? AND name<?)"},
        {R"({"where": {"size": {"$in": [1, 2]}}})",
         "SEARCH doc USING INDEX by_size (size=?); LIST SUBQUERY 1; "
         "SCAN json_each VIRTUAL TABLE INDEX 1:"},
        {R"({"where": {"map.city": "a"}})", "SEARCH doc USING INDEX by_city (<expr>=?)"},
        {R"({"where": {"map.city": 0.5}})", "SEARCH doc USING INDEX by_city (<expr>=?)"},
        {R"({"where": {"map.city": {"$gt": "a"}}})", "SEARCH doc USING INDEX by_city (<expr>>?)"},
        {R"({"where": {"done": true, "$or": [{"name": "a", "small": 1}, {"size": 2}]}})",
         "MULTI-INDEX OR; INDEX 1; SEARCH doc USING INDEX by_name (name=?); INDEX 2; "
         "SEARCH doc USING INDEX by_size (size=?)"},
        {R"({"sort": ["name"]})", "SCAN doc USING INDEX by_name"},
        {R"({"sort": ["-name"], "limit": 5})",
         "SCAN doc USING INDEX by_name; USE TEMP B-TREE FOR LAST TERM OF ORDER BY"},
        {R"({"sort": ["map.city"]})", "SCAN doc USING INDEX by_city"},
    };
    for (const Case& Each : kCases) {
        // SQLite 3.40 has other words for the last term.
        const std::string strSteps =
            std::regex_replace(Steps(Each.szQuery), std::regex("RIGHT PART OF"), "LAST TERM OF");
        EXPECT_EQ(Each.szSteps, strSteps) << Each.szQuery;
    }
}

TEST_F(ConditionSql, ShapesAreAlikeWhereOnlyValuesDiffer) {
    const auto Shape = [](const char* szQuery) {
        FindingList vecFindings;
        const Members Of("doc", Parse(kDocs), vecFindings);
        vornjsondb::JsonCodec Codec;
        QueryPlan Plan(Of, Codec);
        const Query Which(Parse(szQuery));
        Plan.Resolve(Which, QueryUse::kRead, vecFindings);
        EXPECT_EQ("", Text(vecFindings));
        return Plan.Shape();
    };
    EXPECT_EQ(Shape(R"({"where": {"name": "a"}})"), Shape(R"({"where": {"name": null}})"));
    EXPECT_EQ(Shape(R"({"where": {"any": "a"}})"), Shape(R"({"where": {"any": 1}})"));
    EXPECT_EQ(Shape(R"({"where": {"id": {"$in": [1]}}})"),
              Shape(R"({"where": {"id": {"$in": [1, 2, 3]}}})"));
    EXPECT_EQ(Shape(R"({"limit": 1})"), Shape(R"({"offset": 3})"));
    EXPECT_EQ(Shape(R"({"where": {"id": 1}, "limit": 1})"),
              Shape(R"({"where": {"id": 2}, "offset": 3})"));
    EXPECT_EQ(Shape(R"({"where": {"name": {"$prefix": ""}}})"),
              Shape(R"({"where": {"name": {"$prefix": "a"}}})"));
    const char* const kDifferent[] = {"{}",
                                      R"({"members": ["id"]})",
                                      R"({"members": ["id", "name"]})",
                                      R"({"sort": ["id"]})",
                                      R"({"sort": ["-id"]})",
                                      R"({"limit": 1})",
                                      R"({"where": {"id": 1}})",
                                      R"({"where": {"size": 1}})",
                                      R"({"where": {"id": {"$ne": 1}}})",
                                      R"({"where": {"id": {"$null": true}}})",
                                      R"({"where": {"id": 1}, "members": ["id"]})",
                                      R"({"where": {"id": 1}, "sort": ["id"]})",
                                      R"({"where": {"id": 1}, "limit": 1})",
                                      R"({"where": {"id": 1, "size": 1}})",
                                      R"({"where": {"$not": {"id": 1}}})",
                                      R"({"where": {"any": 1}})",
                                      R"({"where": {"map.a": 1}})",
                                      R"({"where": {"map.a": 0.5}})",
                                      R"({"where": {"map.b": 1}})",
                                      R"({"where": {"map[1]": 1}})"};
    std::vector<std::string> vecShapes;
    for (const char* szQuery : kDifferent) {
        EXPECT_EQ(0, std::count(vecShapes.begin(), vecShapes.end(), Shape(szQuery))) << szQuery;
        vecShapes.push_back(Shape(szQuery));
    }
}

TEST_F(ConditionSql, SortingEndsWithTheKeyAndPagingIsBound) {
    EXPECT_EQ("", Sql(Query()));
    EXPECT_EQ(R"( ORDER BY "name" COLLATE BINARY, "size" DESC, "id")",
              Sql(Query().Sort("name").Sort("-size")));
    EXPECT_EQ(R"( ORDER BY "id" DESC, "name" COLLATE BINARY)",
              Sql(Query().Sort("-id").Sort("name")));
    EXPECT_EQ(R"( ORDER BY "id" LIMIT ? OFFSET ?)", Sql(Query().Limit(5)));
    EXPECT_EQ(R"( ORDER BY "id" LIMIT ? OFFSET ?)", Sql(Query().Offset(5)));
    EXPECT_EQ(" LIMIT ? OFFSET ?", Sql(Query().Sort("name").Limit(5), QueryUse::kCount));
    EXPECT_EQ(
        R"( ORDER BY CASE WHEN json_valid("map") THEN json_extract("map", '$."a"') END DESC, )"
        R"("any" COLLATE BINARY, "done", "id")",
        Sql(Query().Sort("-map.a").Sort("any").Sort("done")));
    EXPECT_EQ(R"( WHERE "id" IS ? ORDER BY "id" LIMIT ? OFFSET ?)",
              Sql(Query().Where("id", 1).Limit(5)));
    EXPECT_EQ(R"( WHERE "id" IS ? LIMIT ? OFFSET ?)",
              Sql(Query().Where("id", 1).Limit(5), QueryUse::kCount));
    EXPECT_EQ(R"( WHERE "id" IS {1} ORDER BY "id" LIMIT {-1} OFFSET {3})",
              Sql(Query().Where("id", 1).Offset(3), QueryUse::kRead, WriteShown));
}

// With a bare parameter SQLite prepares the statement again for each pattern.
TEST_F(ConditionSql, PatternsDoNotPrepareTheStatementAgain) {
    const std::string strSql =
        "SELECT * FROM doc WHERE " + Where(R"({"name": {"$like": "a"}, "size": {"$gt": 1}})");
    sqlite3_stmt* pStatement = nullptr;
    ASSERT_EQ(SQLITE_OK, sqlite3_prepare_v2(m_pDb, strSql.c_str(), -1, &pStatement, nullptr));
    for (const char* szPattern : {"a%", "b%", "%", "c"}) {
        sqlite3_bind_text(pStatement, 1, szPattern, -1, SQLITE_STATIC);
        EXPECT_EQ(SQLITE_DONE, sqlite3_step(pStatement));
        sqlite3_reset(pStatement);
    }
    EXPECT_EQ(0, sqlite3_stmt_status(pStatement, SQLITE_STMTSTATUS_REPREPARE, 0));
    sqlite3_finalize(pStatement);
}

}  // namespace VORN_JSON_DB
