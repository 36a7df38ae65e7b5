// What queries mean, and what is said of those that make no sense.

#include <limits>

#include "QueryFixture.h"

namespace VORN_JSON_DB {

namespace {

class Queries : public QueryTest {
  protected:
    // Records 1, 2, ... of which each has one member more.
    void Fill(const std::string& strMember, const std::vector<std::string>& vecValues) {
        int nId = 0;
        for (const std::string& strValue : vecValues) {
            Json::Value jRecord;
            jRecord["id"] = ++nId;
            jRecord[strMember] = Parse(strValue);
            EXPECT_EQ("ok", Text(m_Table.Create(jRecord)));
        }
    }

    // What is wrong with a query as it is read, and as it is run.
    static std::string Wrong(const std::string& strQuery) {
        const Query Which(Parse(strQuery));
        return Which.vecFindings.empty() ? Sql(Which) : Text(Which.vecFindings);
    }
    static std::string WrongWhere(const std::string& strWhere) {
        return Wrong("{\"where\": " + strWhere + "}");
    }
};

// Lists in lists, made and freed without recursion.
class DeepList {
  public:
    explicit DeepList(int nLevels) {
        for (int i = 0; i < nLevels; ++i) {
            Json::Value jOuter(Json::arrayValue);
            jOuter.append(Json::Value()).swapPayload(jList);
            jList.swapPayload(jOuter);
        }
    }
    ~DeepList() {
        while ((jList.isArray() || jList.isObject()) && !jList.empty()) {
            Json::Value jInner;
            (jList.isArray() ? jList[0] : *jList.begin()).swapPayload(jInner);
            jList.swapPayload(jInner);
        }
    }
    DeepList(const DeepList&) = delete;
    DeepList& operator=(const DeepList&) = delete;

    Json::Value jList;
};

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

// ---- what is wrong ------------------------------------------------------------------------------

TEST_F(Queries, FindingsOfTheNotation) {
    struct Case {
        const char* szQuery;
        const char* szFinding;
    };
    const Case kCases[] = {
        {"5", "not-a-query : a query is an object, not 5"},
        {"null", "not-a-query : a query is an object, not null"},
        {"[]", "not-a-query : a query is an object, not a list of 0"},
        {R"({"wheer": {}})",
         "unknown-query-key /wheer: a query has no key \"wheer\" (did you mean \"where\"?)"},
        {R"({"a/b~c": {}})", "unknown-query-key /a~1b~0c: a query has no key \"a/b~c\""},
        {R"({"where": null})", "not-conditions /where: conditions are an object, not null"},
        {R"({"where": [{"id": 1}]})",
         "not-conditions /where: conditions are an object, not a list of 1"},
        {R"({"where": {"$or": {"id": 1}}})",
         "not-conditions /where/$or: this group is a list of conditions, not an object of 1"},
        {R"({"where": {"$or": []}})", "empty-group /where/$or: the group holds no condition"},
        {R"({"where": {"$and": []}})", "empty-group /where/$and: the group holds no condition"},
        {R"({"where": {"$or": [{"id": 1}, {}]}})",
         "empty-group /where/$or/1: the group holds no condition"},
        {R"({"where": {"$not": {}}})", "empty-group /where/$not: the group holds no condition"},
        {R"({"where": {"$and": [5]}})",
         "not-conditions /where/$and/0: conditions are an object, not 5"},
        {R"({"where": {"$gt": 5}})", "misplaced-operator /where/$gt: \"$gt\" cannot stand here"},
        {R"({"where": {"id": {"$or": []}}})",
         "misplaced-operator /where/id/$or: \"$or\" cannot stand here"},
        {R"({"where": {"$adn": []}})",
         "unknown-operator /where/$adn: there is no operator \"$adn\" (did you mean \"$and\"?)"},
        {R"({"where": {"id": {"$gtr": 5}}})",
         "unknown-operator /where/id/$gtr: there is no operator \"$gtr\" (did you mean \"$gt\"?)"},
        {R"({"where": {"name": {"$regex": "a"}}})",
         "unknown-operator /where/name/$regex: there is no operator \"$regex\" (did you mean "
         "\"$like\" or \"$prefix\"?)"},
        {R"({"where": {"map": {"$eq": 1, "a": 2}}})",
         "mixed-keys /where/map: operators and members stand side by side"},
        {R"({"where": {"id": {"$not": 5}}})",
         "wrong-operand /where/id/$not: \"$not\" takes an object of operators, not 5"},
        {R"({"where": {"id": {"$not": {"a": 5}}}})",
         "wrong-operand /where/id/$not: \"$not\" takes an object of operators, not an object of 1"},
        {R"({"sort": "name"})", "bad-sort /sort: a list of names belongs here, not \"name\""},
        {R"({"sort": ["name", 5]})", "bad-sort /sort/1: a name belongs here, not 5"},
        {R"({"members": []})", "bad-members /members: the list names no member"},
        {R"({"members": {"id": 1}})",
         "bad-members /members: a list of names belongs here, not an object of 1"},
        {R"({"limit": -1})", "bad-count /limit: a whole number from 0 belongs here, not -1"},
        {R"({"limit": "5"})", "bad-count /limit: a whole number from 0 belongs here, not \"5\""},
        {R"({"offset": 1.5})", "bad-count /offset: a whole number from 0 belongs here, not 1.5"},
        {R"({"offset": 9223372036854775808})",
         "bad-count /offset: a whole number from 0 belongs here, not 9223372036854775808"},
        {R"({"where": {"$or": [{"$x": 1}]}, "limit": null})",
         "bad-count /limit: a whole number from 0 belongs here, not null; "
         "unknown-operator /where/$or/0/$x: there is no operator \"$x\""},
    };
    for (const Case& Each : kCases) {
        EXPECT_EQ(Each.szFinding, Wrong(Each.szQuery)) << Each.szQuery;
    }
}

TEST_F(Queries, FindingsOfNamesAndOperands) {
    struct Case {
        const char* szWhere;
        const char* szFinding;
    };
    const Case kCases[] = {
        {R"({"nmae": 1})",
         "unknown-member /where/nmae: table \"doc\" has no member \"nmae\" (did you mean "
         "\"name\"?)"},
        {R"({"$or": [{"id": 1}, {"nmae.x": 1}]})",
         "unknown-member /where/$or/1/nmae.x: table \"doc\" has no member \"nmae\" (did you mean "
         "\"name\"?)"},
        {R"({"": 1})", "unknown-member /where/: table \"doc\" has no member \"\""},
        {R"({"name.x": 1})",
         "no-json-member /where/name.x: member \"name\" of type \"string\" has nothing inside"},
        {R"({"map.": 1})", "bad-path /where/map.: path \"map.\": a name is missing in it"},
        {R"({"map..a": 1})", "bad-path /where/map..a: path \"map..a\": a name is missing in it"},
        {R"({"map.a\"b": 1})",
         "bad-path /where/map.a\"b: path \"map.a\"\"b\": no path leads to \"a\"\"b\""},
        {R"({"map.a\\b": 1})",
         "bad-path /where/map.a\\b: path \"map.a\\b\": no path leads to \"a\\b\""},
        {R"({"map.0": 1})",
         "number-in-path /where/map.0: path \"map.0\": \"0\" would be a name, not an index"},
        {R"({"map[a]": 1})",
         "bad-path /where/map[a]: path \"map[a]\": an index is a whole number in brackets"},
        {R"({"map[12": 1})",
         "bad-path /where/map[12: path \"map[12\": an index is a whole number in brackets"},
        {R"({"map[1": 1})",
         "bad-path /where/map[1: path \"map[1\": an index is a whole number in brackets"},
        {R"({"map[]": 1})",
         "bad-path /where/map[]: path \"map[]\": an index is a whole number in brackets"},
        {R"({"map[1234567890]": 1})",
         "bad-path /where/map[1234567890]: path \"map[1234567890]\": an index is a whole number in "
         "brackets"},
        {R"({"map[1]a": 1})",
         "bad-path /where/map[1]a: path \"map[1]a\": a point or a bracket is missing in it"},
        {R"({"id": "5"})",
         "wrong-kind /where/id: member \"id\" is a whole number from -2147483648 to 2147483647, "
         "not "
         "\"5\""},
        {R"({"id": {"$gt": 2.5}})",
         "wrong-kind /where/id/$gt: member \"id\" is a whole number from -2147483648 to "
         "2147483647, "
         "not 2.5"},
        {R"({"id": 2147483648})",
         "out-of-range /where/id: member \"id\": 2147483648 is beyond its range"},
        {R"({"small": {"$in": [1, -1]}})",
         "out-of-range /where/small/$in/1: member \"small\": -1 is beyond its range"},
        {R"({"name": 5})", "wrong-kind /where/name: member \"name\" is a text, not 5"},
        {R"({"name": ["a"]})",
         "wrong-kind /where/name: member \"name\" is a text, not a list of 1"},
        {R"({"name": {"a": 1}})",
         "wrong-kind /where/name: member \"name\" is a text, not an object of 1"},
        {R"({"done": 1})", "wrong-kind /where/done: member \"done\" is true or false, not 1"},
        {R"({"tags": "a"})",
         "list-member /where/tags: member \"tags\" is a list, and \"a\" is none"},
        {R"({"map": [1]})", "wrong-kind /where/map: member \"map\" is an object, not a list of 1"},
        {R"({"done": {"$lt": true}})",
         "wrong-operator /where/done/$lt: \"$lt\" is not for member \"done\" of type \"bool\""},
        {R"({"map": {"$gt": "a"}})",
         "wrong-operator /where/map/$gt: \"$gt\" is not for member \"map\" of type "
         "\"Json::objectValue\""},
        {R"({"size": {"$like": "a"}})",
         "wrong-operator /where/size/$like: \"$like\" is not for member \"size\" of type \"long "
         "long\""},
        {R"({"name": {"$contains": "a"}})",
         "wrong-operator /where/name/$contains: \"$contains\" is not for member \"name\" of type "
         "\"string\""},
        {R"({"size": {"$gt": null}})",
         "null-operand /where/size/$gt: \"$gt\": nothing is less or greater than null"},
        {R"({"size": {"$between": [1, null]}})",
         "null-operand /where/size/$between: \"$between\": nothing is less or greater than null"},
        {R"({"size": {"$gt": true}})",
         "wrong-operand /where/size/$gt: \"$gt\" takes a text or a number, not true"},
        {R"({"map.a": {"$gt": [1]}})",
         "wrong-operand /where/map.a/$gt: \"$gt\" takes a text or a number, not a list of 1"},
        {R"({"size": {"$between": 1}})",
         "wrong-operand /where/size/$between: \"$between\" takes a list of two texts or of two "
         "numbers, not 1"},
        {R"({"size": {"$between": [null, 1]}})",
         "null-operand /where/size/$between: \"$between\": nothing is less or greater than null"},
        {R"({"size": {"$between": [1]}})",
         "wrong-operand /where/size/$between: \"$between\" takes a list of two texts or of two "
         "numbers, not a list of 1"},
        {R"({"any": {"$between": [1, "a"]}})",
         "wrong-operand /where/any/$between: \"$between\" takes a list of two texts or of two "
         "numbers, not a list of 2"},
        {R"({"size": {"$between": [2, 1]}})",
         "swapped-ends /where/size/$between: nothing lies between 2 and 1"},
        {R"({"name": {"$between": ["b", "a"]}})",
         "swapped-ends /where/name/$between: nothing lies between \"b\" and \"a\""},
        {R"({"rate": {"$between": [1.5, 1]}})",
         "swapped-ends /where/rate/$between: nothing lies between 1.5 and 1"},
        {R"({"size": {"$in": 5}})",
         "wrong-operand /where/size/$in: \"$in\" takes a list of values, not 5"},
        {R"({"size": {"$null": 1}})",
         "wrong-operand /where/size/$null: \"$null\" takes true or false, not 1"},
        {R"({"name": {"$prefix": 1}})",
         "wrong-operand /where/name/$prefix: \"$prefix\" takes a text, not 1"},
        {R"({"name": {"$like": "a\\"}})",
         "bad-pattern /where/name/$like: pattern \"a\\\" has a \\ before something else than %, _ "
         "and \\"},
        {R"({"name": {"$like": "C:\\temp"}})",
         "bad-pattern /where/name/$like: pattern \"C:\\temp\" has a \\ before something else than "
         "%, "
         "_ and \\"},
        {R"({"size": {"$not": {"$in": ["a"]}}})",
         "wrong-kind /where/size/$not/$in/0: member \"size\" is a whole number from "
         "-9223372036854775808 to 9223372036854775807, not \"a\""},
        {R"({"id": "a", "size": "b"})",
         "wrong-kind /where/id: member \"id\" is a whole number from -2147483648 to 2147483647, "
         "not "
         "\"a\"; wrong-kind /where/size: member \"size\" is a whole number from "
         "-9223372036854775808 "
         "to 9223372036854775807, not \"b\""},
    };
    for (const Case& Each : kCases) {
        EXPECT_EQ(Each.szFinding, WrongWhere(Each.szWhere)) << Each.szWhere;
    }
}

TEST_F(Queries, FindingsOfValuesThatJsonTextCannotHold) {
    const double dNaN = std::numeric_limits<double>::quiet_NaN();
    EXPECT_EQ("not-a-number /where/rate: member \"rate\": NaN is no number",
              Sql(Query().Where("rate", dNaN)));
    EXPECT_EQ(0U, Sql(Query().Where("json.a", dNaN)).find("not-a-number /where/json.a: "));
    EXPECT_EQ("not-a-number /where/tags/$contains: JSON: NaN is no number",
              Sql(Query().Where("tags", Op::kContains, dNaN)));
    const std::string strLong = "%" + std::string(50000, 'a');
    EXPECT_EQ("bad-pattern /where/name/$like: pattern \"%" + std::string(59, 'a') +
                  "\"... is longer than SQLite takes",
              Sql(Query().Where("name", Op::kLike, strLong)));
    EXPECT_EQ("bad-pattern /where/name/$like: pattern \"a" + std::string(1, '\0') +
                  "\" holds a NUL byte, where SQLite ends it",
              Sql(Query().Where("name", Op::kLike, std::string("a\0", 2))));
    EXPECT_EQ(std::string("bad-path /where/map.") + std::string(1, '\x01') + ": path \"map." +
                  std::string(1, '\x01') + "\": no path leads to \"" + std::string(1, '\x01') +
                  "\"",
              Sql(Query().Where("map.\x01", 1)));
    EXPECT_EQ(
        0U, Sql(Query().Where("map" + std::string(2000, '.'), 1)).find("bad-path /where/map...."));
}

TEST_F(Queries, FindingsOfSortingPagingAndMembers) {
    EXPECT_EQ(
        "unknown-member /sort/1: table \"doc\" has no member \"sise\" (did you mean \"size\"?)",
        Sql(Query().Sort("id").Sort("-sise")));
    EXPECT_EQ("no-json-member /sort/0: member \"name\" of type \"string\" has nothing inside",
              Sql(Query().Sort("name.a")));
    EXPECT_EQ("unknown-member /sort/0: table \"doc\" has no member \"\"", Sql(Query().Sort("-")));
    EXPECT_EQ(
        "unknown-member /members/0: table \"doc\" has no member \"nam\" (did you mean \"name\"?)",
        Sql(Query().Members({"nam"})));
    EXPECT_EQ("bad-members /members/1: \"map.a\" is a path", Sql(Query().Members({"id", "map.a"})));
    EXPECT_EQ(
        "bad-count /limit: the limit is less than 0; bad-count /offset: the offset is less than 0",
        Sql(Query().Limit(-2).Offset(-1)));
    EXPECT_EQ("empty-group /where: a group holds no condition",
              Sql(Query().Where(Condition::Any({}))));
}

TEST_F(Queries, ChangesNeedAConditionAndNothingElse) {
    Fill("size", {"1", "2"});
    const auto Change = [this](const char* szQuery) {
        const Status Removed = m_Table.Remove(Parse(szQuery));
        EXPECT_EQ(Replaced(Text(Removed), "remove records from", "update records of"),
                  Text(m_Table.Update(Parse(szQuery), Parse(R"({"size": 3})"))));
        return Text(Removed);
    };
    EXPECT_EQ(
        "refused: cannot remove records from table \"doc\": the query has no condition and "
        "would reach every record [no-condition /where]",
        Change("{}"));
    EXPECT_EQ(
        "refused: cannot remove records from table \"doc\": the query has no condition and "
        "would reach every record [no-condition /where]",
        Change(R"({"where": {}})"));
    EXPECT_EQ(
        "refused: cannot remove records from table \"doc\": a change reaches all records that "
        "the conditions select, in no order [paged-change ]",
        Change(R"({"where": {"id": 1}, "limit": 1})"));
    EXPECT_EQ(
        "refused: cannot remove records from table \"doc\": a change reaches all records that "
        "the conditions select, in no order [paged-change ]",
        Change(R"({"where": {"id": 1}, "sort": ["id"]})"));
    EXPECT_EQ("1,2", Ids(Query().Sort("id")));
    EXPECT_EQ(
        "refused: cannot remove records from table \"doc\": a group holds no condition "
        "[empty-group /where]",
        Text(m_Table.Remove(Query().Where(Condition::All({})))));
    EXPECT_EQ("ok", Text(m_Table.Update(Parse(R"({"where": {"id": {"$nin": [1, 2]}}})"),
                                        Parse(R"({"size": 3})"))));
    EXPECT_EQ("ok [empty-nin /where/id/$nin]",
              Text(m_Table.Remove(Parse(R"({"where": {"id": {"$nin": []}, "size": 1}})"))));
    EXPECT_EQ("2", Ids(Query()));
}

TEST_F(Queries, NothingRunsThatIsRefused) {
    Fill("size", {"1"});
    Json::Value jRecords = "as it was";
    EXPECT_EQ(
        "refused: cannot list records of table \"doc\": table \"doc\" has no member \"sise\" "
        "(did you mean \"size\"?) [unknown-member /where/sise]",
        Text(m_Table.List(Parse(R"({"where": {"sise": 1}})"), jRecords)));
    EXPECT_EQ("\"as it was\"", Text(jRecords));
}

// ---- depth and number ---------------------------------------------------------------------------

TEST_F(Queries, HundredThousandNestedListsAreAFinding) {
    DeepList Deep(100000);
    Json::Value jQuery;
    Json::Value& jHole = jQuery["where"];
    jHole.swapPayload(Deep.jList);
    EXPECT_EQ("not-conditions /where: conditions are an object, not a list of 1",
              Text(Query(jQuery).vecFindings));
    jHole.swapPayload(Deep.jList);
    Json::Value& jMember = jQuery["where"]["map"]["$in"];
    jMember.swapPayload(Deep.jList);
    EXPECT_EQ("nested-too-deep /where/map/$in: the value is nested too deep",
              Text(Query(jQuery).vecFindings));
    jMember.swapPayload(Deep.jList);
    jQuery = Json::Value(Json::objectValue);
    Json::Value& jSort = jQuery["sort"];
    jSort.swapPayload(Deep.jList);
    EXPECT_EQ("bad-sort /sort/0: a name belongs here, not a list of 1",
              Text(Query(jQuery).vecFindings));
    jSort.swapPayload(Deep.jList);
}

TEST_F(Queries, NestedListInTheCppFormIsAFinding) {
    DeepList Deep(1001);
    EXPECT_EQ("nested-too-deep /where: the conditions are nested too deep",
              Sql(Query().Where("json", Deep.jList)));
}

TEST_F(Queries, HundredThousandNestedGroupsAreAFinding) {
    for (const bool blBelowMember : {false, true}) {
        DeepList Deep(0);
        Deep.jList = Parse(blBelowMember ? R"({"$gt": 1})" : R"({"id": 1})");
        for (int i = 0; i < 100000; ++i) {
            Json::Value jOuter;
            jOuter["$not"].swapPayload(Deep.jList);
            Deep.jList.swapPayload(jOuter);
        }
        Json::Value jQuery;
        Json::Value& jHole = blBelowMember ? jQuery["where"]["id"] : jQuery["where"];
        jHole.swapPayload(Deep.jList);
        const Query Which(jQuery);
        ASSERT_EQ(1U, Which.vecFindings.size());
        EXPECT_STREQ("nested-too-deep", Which.vecFindings[0].szCode);
        jHole.swapPayload(Deep.jList);
    }
}

TEST_F(Queries, AThousandConditionsAndNoMore) {
    Json::Value jQuery;
    for (int i = 0; i < 1001; ++i) {
        jQuery["where"]["$or"].append(Parse(R"({"id": 1})"));
    }
    EXPECT_EQ("too-many-conditions /where/$or/1000/id: the query has more than 1000 conditions",
              Text(Query(jQuery).vecFindings));
    jQuery["where"]["$or"].append(Parse(R"({"id": 1})"));
    EXPECT_EQ(1U, Query(jQuery).vecFindings.size());
    jQuery["where"]["$or"].resize(1000);
    EXPECT_EQ("", Text(Query(jQuery).vecFindings));
}

TEST_F(Queries, FindingsEndAtAHundred) {
    Json::Value jQuery;
    for (int i = 0; i < 1000; ++i) {
        jQuery["where"]["$or"].append(Json::Value(i));
    }
    EXPECT_EQ(100U, Query(jQuery).vecFindings.size());
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

}  // namespace VORN_JSON_DB
