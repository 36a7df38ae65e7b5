// What queries mean.

#include <utility>

#include "../../table/Operand.h"
#include "QueryFixture.h"

namespace VORN_JSON_DB {

namespace {

class Queries : public QueryTest {};

}  // namespace

// ---- meaning ------------------------------------------------------------------------------------

TEST_F(Queries, NullIsAValueForEqualAndNeverLessOrGreater) {
    Fill("size", {"1", "null", "3"});
    EXPECT_EQ("2", IdsWhere(R"({"size": null})"));
    EXPECT_EQ("1,3", IdsWhere(R"({"size": {"$ne": null}})"));
    EXPECT_EQ("2,3", IdsWhere(R"({"size": {"$ne": 1}})"));
    EXPECT_EQ("2,3", IdsWhere(R"({"size": {"$nin": [1]}})"));
    EXPECT_EQ("1,2", IdsWhere(R"({"size": {"$in": [1, null]}})"));
    EXPECT_EQ("3", IdsWhere(R"({"size": {"$nin": [1, null]}})"));
    EXPECT_EQ("2", IdsWhere(R"({"size": {"$null": true}})"));
    EXPECT_EQ("1,3", IdsWhere(R"({"size": {"$null": false}})"));
    EXPECT_EQ("1", IdsWhere(R"({"size": {"$lt": 3}})"));
    EXPECT_EQ("2,3", IdsWhere(R"({"size": {"$not": {"$lt": 3}}})"));
    EXPECT_EQ("2,3", IdsWhere(R"({"$not": {"size": {"$lt": 3}}})"));
    EXPECT_EQ("1", IdsWhere(R"({"$not": {"$not": {"size": {"$lt": 3}}}})"));
    EXPECT_EQ("2", IdsWhere(R"({"size": {"$not": {"$between": [1, 3]}}})"));
}

TEST_F(Queries, EmptyListsSelectNothingOrAll) {
    Fill("size", {"1", "null"});
    EXPECT_EQ("", IdsWhere(R"({"size": {"$in": []}})"));
    EXPECT_EQ("1,2", IdsWhere(R"({"size": {"$nin": []}})"));
    EXPECT_EQ("", IdsWhere(R"({"size": {"$in": []}, "id": 1})"));
    EXPECT_EQ("", IdsWhere(R"({"json.a": {"$in": []}})"));
}

TEST_F(Queries, RangesStayWithinTheKindOfTheOperand) {
    Fill("any", {"5", "\"5\"", "\"abc\"", "-1", "2.5", "null"});
    Run("INSERT INTO doc (id, \"any\") VALUES (7, x'00'), (8, x'')");
    EXPECT_EQ("1,5", IdsWhere(R"({"any": {"$gt": 2}})"));
    EXPECT_EQ("4,5", IdsWhere(R"({"any": {"$lt": 5}})"));
    EXPECT_EQ("2,3", IdsWhere(R"({"any": {"$gte": ""}})"));
    EXPECT_EQ("2", IdsWhere(R"({"any": {"$lt": "a"}})"));
    EXPECT_EQ("2,3", IdsWhere(R"({"any": {"$prefix": ""}})"));
    EXPECT_EQ("1", IdsWhere(R"({"any": 5})"));
    EXPECT_EQ("2", IdsWhere(R"({"any": "5"})"));
    EXPECT_EQ("1,2,5", IdsWhere(R"({"any": {"$in": [5, "5", 2.5]}})"));
}

// The table's own collation is for its indexes and its other users.
TEST_F(TableTest, TextsAreComparedByTheirBytesWhateverTheTableSays) {
    Options How;
    How.strSqlCreate = "CREATE TABLE who (id INTEGER PRIMARY KEY, name TEXT COLLATE NOCASE)";
    Open(R"({"who": {"member": {"id": {"cpptype": "int"}, "name": {"cpptype": "string"}}}})", How);
    Run("INSERT INTO who VALUES (1, 'b'), (2, 'B'), (3, 'a'), (4, 'A')");
    const auto Ids = [this](const char* szQuery) {
        Json::Value jRecords;
        EXPECT_EQ("ok", Text(m_Table.List(Parse(szQuery), jRecords)));
        std::string strIds;
        for (const Json::Value& jRecord : jRecords) {
            strIds += Text(jRecord["id"]);
        }
        return strIds;
    };
    EXPECT_EQ("1", Ids(R"({"where": {"name": "b"}})"));
    EXPECT_EQ("234", Ids(R"({"where": {"name": {"$ne": "b"}}, "sort": ["id"]})"));
    EXPECT_EQ("24", Ids(R"({"where": {"name": {"$lt": "a"}}, "sort": ["id"]})"));
    EXPECT_EQ("1", Ids(R"({"where": {"name": {"$prefix": "b"}}})"));
    EXPECT_EQ("2", Ids(R"({"where": {"name": {"$in": ["B"]}}})"));
    EXPECT_EQ("4231", Ids(R"({"sort": ["name"]})"));
    EXPECT_EQ("12", Ids(R"({"where": {"name": {"$like": "b"}}, "sort": ["id"]})"));
}

TEST_F(Queries, TextsAreData) {
    const std::string strNul("a\0b", 3);
    const std::vector<std::string> vecTexts{"",
                                            "'",
                                            "\"",
                                            "' OR 1=1 --",
                                            "%",
                                            "_",
                                            "\\",
                                            strNul,
                                            "a",
                                            std::string("a\0", 2),
                                            "\xff",
                                            "\xc3\xa9",
                                            "\xed\xa0\x80",
                                            "{\"$ne\": \"\"}",
                                            "?1",
                                            std::string(1 << 20, 'x')};
    for (size_t i = 0; i < vecTexts.size(); ++i) {
        Json::Value jRecord;
        jRecord["id"] = static_cast<int>(i);
        jRecord["name"] = vecTexts[i];
        ASSERT_EQ("ok", Text(m_Table.Create(jRecord)));
    }
    for (size_t i = 0; i < vecTexts.size(); ++i) {
        const std::string strId = std::to_string(i);
        Json::Value jList(Json::arrayValue);
        jList.append(vecTexts[i]);
        EXPECT_EQ(strId, Ids(Query().Where("name", vecTexts[i])));
        EXPECT_EQ(strId, Ids(Query().Where("name", Op::kIn, jList)));
        EXPECT_EQ(strId, Ids(Query()
                                 .Where("name", Op::kPrefix, vecTexts[i])
                                 .Where("name", Op::kLessOrEqual, vecTexts[i])));
        jList.append("no such text");
        std::int64_t nOthers = 0;
        EXPECT_EQ("ok", Text(m_Table.Count(Query().Where("name", Op::kNotIn, jList), nOthers)));
        EXPECT_EQ(static_cast<std::int64_t>(vecTexts.size()) - 1, nOthers);
    }
}

TEST_F(Queries, PatternsMatchByPercentUnderscoreAndBackslash) {
    Fill("name", {"\"100%\"", "\"100 \"", "\"a_b\"", "\"aXb\"", "\"A\\\\B\"", "null", "\"\""});
    EXPECT_EQ("1,2", IdsWhere(R"({"name": {"$like": "100_"}})"));
    EXPECT_EQ("1", IdsWhere(R"({"name": {"$like": "100\\%"}})"));
    EXPECT_EQ("3,4,5", IdsWhere(R"({"name": {"$like": "a_b"}})"));
    EXPECT_EQ("3", IdsWhere(R"({"name": {"$like": "a\\_b"}})"));
    EXPECT_EQ("5", IdsWhere(R"({"name": {"$like": "a\\\\b"}})"));
    EXPECT_EQ("1,2,3,4,5,7", IdsWhere(R"({"name": {"$like": "%"}})"));
    EXPECT_EQ("7", IdsWhere(R"({"name": {"$like": ""}})"));
    EXPECT_EQ("1", Ids(Query().Where("name", Op::kLike, EscapeLike("100%"))));
    EXPECT_EQ("\\%\\_\\\\a", EscapeLike("%_\\a"));
}

TEST_F(Queries, PrefixesAreBytes) {
    const std::string strEnd = "a\xff\xff";
    for (const std::string& strName : {std::string("a"), std::string("ab"), strEnd, strEnd + "b",
                                       std::string("b"), std::string("\xff\xff")}) {
        Json::Value jRecord;
        jRecord["name"] = strName;
        ASSERT_EQ("ok", Text(m_Table.Create(jRecord)));
    }
    EXPECT_EQ("1,2,3,4", Ids(Query().Where("name", Op::kPrefix, "a").Sort("id")));
    EXPECT_EQ("3,4", Ids(Query().Where("name", Op::kPrefix, strEnd).Sort("id")));
    EXPECT_EQ("6", Ids(Query().Where("name", Op::kPrefix, "\xff").Sort("id")));
    EXPECT_EQ("1,2,3,4,5,6", Ids(Query().Where("name", Op::kPrefix, "").Sort("id")));
}

TEST_F(Queries, PathsTellKindsApart) {
    Fill("json", {R"({"a": 1})", R"({"a": true})", R"({"a": "1"})", R"({"a": null})", R"({"b": 1})",
                  R"({"a": 1.0})", R"({"a": [1]})", R"({"a": "[1]"})", R"({"a": {"b": 1}})", "5",
                  R"([{"a": 1}])"});
    Run("INSERT INTO doc (id, json) VALUES (12, '{\"a\": 1'), (13, NULL), (14, x'ff')");
    EXPECT_EQ("1,6", IdsWhere(R"({"json.a": 1})"));
    EXPECT_EQ("2", IdsWhere(R"({"json.a": true})"));
    EXPECT_EQ("3", IdsWhere(R"({"json.a": "1"})"));
    EXPECT_EQ("7", IdsWhere(R"({"json.a": [1]})"));
    EXPECT_EQ("8", IdsWhere(R"({"json.a": "[1]"})"));
    EXPECT_EQ("9", IdsWhere(R"({"json.a": {"b": 1}})"));
    EXPECT_EQ("9", IdsWhere(R"({"json.a.b": 1})"));
    EXPECT_EQ("7", IdsWhere(R"({"json.a[0]": 1})"));
    EXPECT_EQ("11", IdsWhere(R"({"json[0].a": 1})"));
    EXPECT_EQ("4,5,10,11,12,13,14", IdsWhere(R"({"json.a": null})"));
    EXPECT_EQ("4,5,10,11,12,13,14", IdsWhere(R"({"json.a": {"$null": true}})"));
    EXPECT_EQ("1,2,3,6,7,8,9", IdsWhere(R"({"json.a": {"$ne": null}})"));
    EXPECT_EQ("2,3,4,5,7,8,9,10,11,12,13,14", IdsWhere(R"({"json.a": {"$ne": 1}})"));
    EXPECT_EQ("1,6", IdsWhere(R"({"json.a": {"$gt": 0}})"));
    EXPECT_EQ("3,8", IdsWhere(R"({"json.a": {"$gt": ""}})"));
    EXPECT_EQ("1,2,3,6", IdsWhere(R"({"json.a": {"$in": [1, true, "1"]}})"));
    EXPECT_EQ("3", IdsWhere(R"({"json.a": {"$like": "1"}})"));
    EXPECT_EQ("3", IdsWhere(R"({"json.a": {"$prefix": "1"}})"));
    EXPECT_EQ("10", IdsWhere(R"({"json": 5})"));
}

TEST_F(Queries, WholeJsonMembersAreComparedAsTheyAreStored) {
    Fill("map", {R"({"b": 1, "a": 2})", R"({"a": 2})", "{}"});
    EXPECT_EQ("1", IdsWhere(R"({"map": {"a": 2, "b": 1}})"));
    EXPECT_EQ("3", IdsWhere(R"({"map": {}})"));
    EXPECT_EQ("1,2", IdsWhere(R"({"map": {"$in": [{"a": 2}, {"a": 2, "b": 1}]}})"));
    EXPECT_EQ("2", IdsWhere(R"({"map": {"$eq": {"a": 2}}})"));
}

TEST_F(Queries, ContainsLooksIntoListsAlone) {
    Fill("json", {R"(["a", 1, 2.5])", R"([true, null, [1], {"x": 1}])", R"("a")", R"({"k": "a"})",
                  R"({"k": ["a"]})", "[]", R"(["1"])"});
    Run("INSERT INTO doc (id, json) VALUES (8, '[\"a\"'), (9, NULL)");
    EXPECT_EQ("1", IdsWhere(R"({"json": {"$contains": "a"}})"));
    EXPECT_EQ("1", IdsWhere(R"({"json": {"$contains": 1}})"));
    EXPECT_EQ("1", IdsWhere(R"({"json": {"$contains": 2.5}})"));
    EXPECT_EQ("2", IdsWhere(R"({"json": {"$contains": true}})"));
    EXPECT_EQ("2", IdsWhere(R"({"json": {"$contains": null}})"));
    EXPECT_EQ("2", IdsWhere(R"({"json": {"$contains": [1]}})"));
    EXPECT_EQ("2", IdsWhere(R"({"json": {"$contains": {"x": 1}}})"));
    EXPECT_EQ("5", IdsWhere(R"({"json.k": {"$contains": "a"}})"));
    EXPECT_EQ("2,3,4,5,6,7,8,9", IdsWhere(R"({"json": {"$not": {"$contains": "a"}}})"));
}

// Tables may be called as the functions and elements of the statement.
TEST_F(TableTest, TableNamesDoNotMeetNamesInTheStatement) {
    for (const char* szName : {"value", "e", "x[]", "order", "a\"b"}) {
        Json::Value jDefinition;
        for (const char* szMember : {"json", "value", "type", "key"}) {
            jDefinition[szName]["member"][szMember]["cpptype"] = "Json::Value";
        }
        Options How;
        How.blCreateTable = true;
        Table Named;
        ASSERT_EQ("ok", Text(Named.Open(m_pDb, szName, jDefinition, How)));
        ASSERT_EQ("ok", Text(Named.Create(Parse(R"({"json": ["a"], "value": ["b"], "type": 5})"))));
        std::int64_t nCount = 0;
        EXPECT_EQ("ok", Text(Named.Count(Parse(R"({"where": {"json": {"$contains": "a"},
            "value": {"$contains": "b"}, "type": {"$in": [5]}, "key": null}})"),
                                         nCount)));
        EXPECT_EQ(1, nCount) << szName;
    }
}

TEST_F(Queries, ListsOfAnyLength) {
    Fill("name", {"\"a\"", "\"b\"", "\"c\""});
    Json::Value jIds(Json::arrayValue), jNames(Json::arrayValue);
    for (int i = 0; i < 100000; ++i) {
        jIds.append(i * 2);
        jNames.append("b" + std::to_string(i));
    }
    EXPECT_EQ("2", Ids(Query().Where("id", Op::kIn, jIds)));
    EXPECT_EQ("1,3", Ids(Query().Where("id", Op::kNotIn, jIds).Sort("id")));
    jNames[99999] = "c";
    EXPECT_EQ("3", Ids(Query().Where("name", Op::kIn, jNames)));
    jIds.append(1);
    EXPECT_EQ("too-many-values /where/id/$in: a list may have 100000 values, not 100001",
              Sql(Query().Where("id", Op::kIn, jIds)));
    jIds[0] = "no number";
    EXPECT_EQ(Sql(Query().Where("id", Op::kIn, jIds)),
              "too-many-values /where/id/$in: a list may have 100000 values, not 100001");
}

// SQLite would read the bytes behind an unfinished character as a part of it.
TEST_F(Queries, TextsGoIntoJsonOnlyWhereTheyAreUtf8) {
    EXPECT_TRUE(vornjsondb::IsPlainText("a\xc3\xa9"));
    EXPECT_FALSE(vornjsondb::IsPlainText("\xc3x"));
    EXPECT_FALSE(vornjsondb::IsPlainText("\xe2\x82x"));
}

TEST_F(Queries, BigNumbersAreComparedExactly) {
    Fill("size",
         {"9007199254740992", "9007199254740993", "9223372036854775807", "-9223372036854775808"});
    EXPECT_EQ("2", IdsWhere(R"({"size": 9007199254740993})"));
    EXPECT_EQ("2,3", IdsWhere(R"({"size": {"$gt": 9007199254740992}})"));
    EXPECT_EQ("4", IdsWhere(R"({"size": {"$lt": -9223372036854775807}})"));
    EXPECT_EQ("1,3", IdsWhere(R"({"size": {"$in": [9007199254740992, 9223372036854775807]}})"));
    EXPECT_EQ("1", IdsWhere(R"({"size": 9007199254740992.0})"));
}

TEST_F(Queries, NullsComeFirstAndTheKeyLast) {
    Fill("size", {"2", "null", "1", "2"});
    EXPECT_EQ("2,3,1,4", Ids(R"({"sort": ["size"]})"));
    EXPECT_EQ("1,4,3,2", Ids(R"({"sort": ["-size"]})"));
    EXPECT_EQ("1,4", Ids(R"({"sort": ["-size"], "limit": 2})"));
    EXPECT_EQ("3,2", Ids(R"({"sort": ["-size"], "offset": 2})"));
    EXPECT_EQ("4,3", Ids(R"({"sort": ["-size"], "limit": 2, "offset": 1})"));
    EXPECT_EQ("", Ids(R"({"limit": 0})"));
    EXPECT_EQ("1,2,3,4", Ids(R"({"offset": 0})"));
}

TEST_F(Queries, MembersAreThoseThatAreNamed) {
    Fill("size", {"2"});
    Json::Value jRecords;
    EXPECT_EQ("ok", Text(m_Table.List(Parse(R"({"members": ["size", "id", "size"]})"), jRecords)));
    EXPECT_EQ(R"([{"id":1,"size":2}])", Text(jRecords));
    EXPECT_EQ("ok", Text(m_Table.List(Query().Members({"name"}), jRecords)));
    EXPECT_EQ("[{}]", Text(jRecords));
}

TEST_F(Queries, TheCppFormIsTheSame) {
    Json::Value jPair(Json::arrayValue);
    jPair.append(1);
    jPair.append(2);
    const Query Made = Query()
                           .Where("name", "a")
                           .Where("size", Op::kBetween, jPair)
                           .Where(Condition::Any(
                               {Condition("id", 1), Condition::Not(Condition("id", Op::kLess, 5))}))
                           .Sort("-size")
                           .Limit(3)
                           .Offset(1)
                           .Members({"id"});
    const Query Read(Parse(R"({"where": {"name": "a", "size": {"$between": [1, 2]},
        "$or": [{"id": 1}, {"$not": {"id": {"$lt": 5}}}]},
        "sort": ["-size"], "limit": 3, "offset": 1, "members": ["id"]})"));
    EXPECT_EQ(Sql(Read, QueryUse::kRead, WriteShown), Sql(Made, QueryUse::kRead, WriteShown));
    EXPECT_EQ(Read.vecMembers, Made.vecMembers);
}

// Values given in C++ are values, whatever they look like.
TEST_F(Queries, ObjectsInTheCppFormAreNoOperators) {
    Json::Value jObject;
    jObject["$ne"] = "";
    EXPECT_EQ("wrong-kind /where/name: member \"name\" is a text, not an object of 1",
              Sql(Query().Where("name", jObject)));
    EXPECT_EQ(R"( WHERE "map" COLLATE BINARY IS {'{"$ne":""}'})",
              Sql(Query().Where("map", jObject), QueryUse::kRead, WriteShown));
}

TEST_F(Queries, ValuesOnlyRefusesEveryOperator) {
    const auto Wrong = [](const char* szQuery) {
        return Text(Query::ValuesOnly(Parse(szQuery)).vecFindings);
    };
    EXPECT_EQ("",
              Wrong(R"({"where": {"name": "$ne", "map": {"a": {"$ne": 1}}}, "sort": ["-id"]})"));
    EXPECT_EQ("operator-refused /where/name: the value of \"name\" holds operators",
              Wrong(R"({"where": {"name": {"$ne": ""}}})"));
    EXPECT_EQ("operator-refused /where/name: the value of \"name\" holds operators",
              Wrong(R"({"where": {"name": {"$no": "", "a": 1}}})"));
    EXPECT_EQ(
        "operator-refused /where/$or: \"$or\" is an operator, and this query takes plain values",
        Wrong(R"({"where": {"$or": [{"name": "a"}]}})"));
    EXPECT_EQ(
        "refused: cannot count records of table \"doc\": the value of \"name\" holds operators "
        "[operator-refused /where/name]",
        [this] {
            std::int64_t nCount = 0;
            return Text(m_Table.Count(
                Query::ValuesOnly(Parse(R"({"where": {"name": {"$ne": ""}}})")), nCount));
        }());
}

// Whatever the bytes are, the record that holds them is found by them, alone and in a list.
TEST_F(Queries, BytesThatAreNoUtf8AreFoundInLists) {
    const char* const kTexts[] = {"\xe0\x9f\x80",
                                  "\xe0\xa0\x80",
                                  "\xed\x9f\xbf",
                                  "\xed\xa0\x80",
                                  "\xf0\x8f\x80\x80",
                                  "\xf0\x90\x80\x80",
                                  "\xf4\x8f\xbf\xbf",
                                  "\xf4\x90\x80\x80",
                                  "\xf5\x80\x80\x80",
                                  "\xc3",
                                  "\x80"};
    Json::Value jAll(Json::arrayValue);
    int nId = 0;
    for (const char* szText : kTexts) {
        Json::Value jRecord;
        jRecord["id"] = ++nId;
        jRecord["name"] = szText;
        EXPECT_EQ("ok", Text(m_Table.Create(jRecord)));
        Json::Value jOne(Json::arrayValue);
        jOne.append(szText);
        EXPECT_EQ(std::to_string(nId), Ids(Query().Where("name", Op::kIn, jOne)));
        jAll.append(szText);
    }
    EXPECT_EQ("1,2,3,4,5,6,7,8,9,10,11", Ids(Query().Where("name", Op::kIn, jAll).Sort("id")));
}

TEST_F(Queries, FractionsInsideOfJsonAreFoundInLists) {
    Fill("map", {R"({"a": 0.1})", R"({"a": 2})", R"({"a": "0.1"})"});
    EXPECT_EQ("1", IdsWhere(R"({"map.a": {"$in": [0.1, 1.5]}})"));
    EXPECT_EQ("1,2", IdsWhere(R"({"map.a": {"$in": [0.1, 2]}})"));
}

TEST_F(Queries, OffsetAloneIsCountedBehind) {
    Fill("size", {"1", "2", "3"});
    std::int64_t nRecords = 0;
    EXPECT_EQ("ok", Text(m_Table.Count(Query().Offset(1), nRecords)));
    EXPECT_EQ(2, nRecords);
}

TEST_F(Queries, SignsMayBeginANameInAPath) {
    Fill("map", {R"({"+": 1})", R"({"-1": 2})"});
    EXPECT_EQ("1", IdsWhere(R"({"map.+": 1})"));
    EXPECT_EQ("2", IdsWhere(R"({"map.-1": 2})"));
}

TEST_F(Queries, AssignedOnesAreTheirOwn) {
    Fill("size", {"1", "2", "3"});
    Query Large = Query().Where("size", Op::kGreater, 1).Sort("-id");
    Query Few;
    Few = Large;
    Few.Limit(1);
    EXPECT_EQ("3", Ids(Few));
    EXPECT_EQ("3,2", Ids(Large));
    Large = std::move(Few);
    EXPECT_EQ("3", Ids(Large));
}

}  // namespace VORN_JSON_DB
