// What is said of queries that make no sense, and of those that are too deep or too large.

#include <limits>

#include "../../table/ConditionNode.h"
#include "QueryFixture.h"

namespace VORN_JSON_DB {

namespace {

class QueryFindings : public QueryTest {
  protected:
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

// ---- what is wrong ------------------------------------------------------------------------------

TEST_F(QueryFindings, NamesAreLookedAtWhateverTheCallDoesWithThem) {
    const Query Which(Parse(R"({"where": {"id": 1}, "sort": ["nmae"], "members": ["*"]})"));
    const std::string strMembers =
        "refused: cannot # table \"doc\": table \"doc\" has no member \"*\" "
        "[unknown-member /members/0]";
    const std::string strBoth = strMembers + " [unknown-member /sort/0]";
    std::int64_t nRows = 7;
    bool blExists = true;
    EXPECT_EQ(Text(m_Table.Count(Which, nRows)), Replaced(strBoth, "#", "count records of"));
    EXPECT_EQ(Text(m_Table.Exists(Which, blExists)), Replaced(strBoth, "#", "look for records of"));
    const Query Change = Query().Where("id", 1).Members({"*"});
    EXPECT_EQ(Text(m_Table.Update(Change, Parse(R"({"size": 1})"), &nRows)),
              Replaced(strMembers, "#", "update records of"));
    EXPECT_EQ(Text(m_Table.Remove(Change, &nRows)),
              Replaced(strMembers, "#", "remove records from"));
    EXPECT_EQ(nRows, 7);
}

TEST_F(QueryFindings, CountHasNeitherMembersNorOrder) {
    const Query Which = Query().Where("id", 1).Members({"name"}).Sort("-size").Limit(1);
    std::int64_t nRows = 7;
    bool blExists = true;
    EXPECT_EQ(Text(m_Table.Count(Which, nRows)), "ok");
    EXPECT_EQ(Text(m_Table.Exists(Which, blExists)), "ok");
    EXPECT_EQ(nRows, 0);
    EXPECT_FALSE(blExists);
    EXPECT_EQ(Text(m_Table.Remove(Query().Where("id", 1).Members({"name"}), &nRows)), "ok");
}

TEST_F(QueryFindings, NumberOfNoOperatorIsNone) {
    Json::Value jFound;
    for (const int nOp : {-1, 13, 99}) {
        EXPECT_EQ(Text(m_Table.List(Query().Where("id", static_cast<Op>(nOp), 1), jFound)),
                  "refused: cannot list records of table \"doc\": there is no operator of this "
                  "number [unknown-operator /where/id]");
    }
    EXPECT_EQ(Text(m_Table.List(Query().Where("nmae", static_cast<Op>(13), 1), jFound)),
              "refused: cannot list records of table \"doc\": there is no operator of this number "
              "[unknown-operator /where/nmae]");
}

TEST_F(QueryFindings, FindingsOfTheNotation) {
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

TEST_F(QueryFindings, FindingsOfNamesAndOperands) {
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

TEST_F(QueryFindings, FindingsOfValuesThatJsonTextCannotHold) {
    const double dNaN = std::numeric_limits<double>::quiet_NaN();
    EXPECT_EQ("not-a-number /where/rate: member \"rate\": NaN is no number",
              Sql(Query().Where("rate", dNaN)));
    EXPECT_EQ(0U, Sql(Query().Where("json.a", dNaN)).find("not-a-number /where/json.a: "));
    EXPECT_EQ("not-a-number /where/tags/$contains: JSON: NaN is no number",
              Sql(Query().Where("tags", Op::kContains, dNaN)));
    const std::string strLong = "\\x" + std::string(50000, 'a');
    EXPECT_EQ("bad-pattern /where/name/$like: pattern \"\\x" + std::string(58, 'a') +
                  "\"... is longer than SQLite takes",
              Sql(Query().Where("name", Op::kLike, strLong)));
    EXPECT_EQ("bad-pattern /where/name/$like: pattern \"a" + std::string(1, '\0') +
                  "\" holds a NUL byte, where SQLite ends it",
              Sql(Query().Where("name", Op::kLike, std::string("a\0", 2))));
    EXPECT_EQ(Sql(Query().Where("name", Op::kLike, std::string("a\\\0", 3))),
              "bad-pattern /where/name/$like: pattern \"a\\" + std::string(1, '\0') +
                  "\" has a \\ before something else than %, _ and \\");
    EXPECT_EQ(std::string("bad-path /where/map.") + std::string(1, '\x01') + ": path \"map." +
                  std::string(1, '\x01') + "\": no path leads to \"" + std::string(1, '\x01') +
                  "\"",
              Sql(Query().Where("map.\x01", 1)));
    EXPECT_EQ(
        0U, Sql(Query().Where("map" + std::string(2000, '.'), 1)).find("bad-path /where/map...."));
}

TEST_F(QueryFindings, FindingsOfSortingPagingAndMembers) {
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

TEST_F(QueryFindings, ChangesNeedAConditionAndNothingElse) {
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

TEST_F(QueryFindings, NothingRunsThatIsRefused) {
    Fill("size", {"1"});
    Json::Value jRecords = "as it was";
    EXPECT_EQ(
        "refused: cannot list records of table \"doc\": table \"doc\" has no member \"sise\" "
        "(did you mean \"size\"?) [unknown-member /where/sise]",
        Text(m_Table.List(Parse(R"({"where": {"sise": 1}})"), jRecords)));
    EXPECT_EQ("\"as it was\"", Text(jRecords));
}

// ---- depth and number ---------------------------------------------------------------------------

TEST_F(QueryFindings, HundredThousandNestedListsAreAFinding) {
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

TEST_F(QueryFindings, NestedListInTheCppFormIsAFinding) {
    DeepList Deep(1001);
    EXPECT_EQ("nested-too-deep /where: the conditions are nested too deep",
              Sql(Query().Where("json", Deep.jList)));
}

TEST_F(QueryFindings, HundredThousandNestedGroupsAreAFinding) {
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

TEST_F(QueryFindings, EmptyGroupInOneOfItsKindIsNotDropped) {
    const char* szEmpty = "empty-group /where: a group holds no condition";
    const Condition One("id", 1);
    EXPECT_EQ(Sql(Query().Where(Condition::All({Condition::All({}), One}))), szEmpty);
    EXPECT_EQ(Sql(Query().Where(Condition::Any({One, Condition::Any({})}))), szEmpty);
    EXPECT_EQ(Sql(Query().Where(Condition::All({})).Where(One)), szEmpty);
}

TEST_F(QueryFindings, AThousandConditionsAndNoMore) {
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

TEST_F(QueryFindings, FindingsEndAtAHundred) {
    Json::Value jQuery;
    for (int i = 0; i < 1000; ++i) {
        jQuery["where"]["$or"].append(Json::Value(i));
    }
    EXPECT_EQ(100U, Query(jQuery).vecFindings.size());
}

TEST_F(QueryFindings, AllThatIsWrongIsToldInOneOrder) {
    Query Paged = Query().Limit(-2).Offset(-1).Sort("id");
    EXPECT_EQ(Sql(Paged, QueryUse::kChange),
              "bad-count /limit: the limit is less than 0; bad-count /offset: the offset is less "
              "than 0; paged-change : a change reaches all records that the conditions select, in "
              "no order; no-condition /where: the query has no condition and would reach every "
              "record");
    EXPECT_EQ(Wrong(R"({"members": ["xyz"], "sort": ["uvw"]})"),
              "unknown-member /members/0: table \"doc\" has no member \"xyz\"; unknown-member "
              "/sort/0: table \"doc\" has no member \"uvw\"");
}

TEST_F(QueryFindings, OfTwoEndsTheFirstIsLookedAtFirst) {
    EXPECT_EQ(WrongWhere(R"({"size": {"$between": [null, true]}})"),
              "null-operand /where/size/$between: \"$between\": nothing is less or greater than "
              "null");
    for (const char* szEnds : {R"(["a", 5])", R"([5, "a"])"}) {
        EXPECT_EQ(WrongWhere(R"({"any": {"$between": )" + std::string(szEnds) + "}}"),
                  "wrong-operand /where/any/$between: \"$between\" takes a list of two texts or of "
                  "two numbers, not a list of 2");
    }
}

// What a query says that could not be read is not looked at any further.
TEST_F(QueryFindings, QueryThatCannotBeReadTellsNoMore) {
    const Query Which(Parse(R"({"limit": "x", "sort": ["none"]})"));
    EXPECT_EQ(Sql(Which, QueryUse::kChange),
              "bad-count /limit: a whole number from 0 belongs here, not \"x\"");
    EXPECT_EQ(Sql(Which), "bad-count /limit: a whole number from 0 belongs here, not \"x\"");
}

TEST_F(QueryFindings, MembersAreOnlyForWhatIsRead) {
    EXPECT_EQ(Sql(Query().Where("id", 1).Members({"name"}), QueryUse::kCount),
              " WHERE \"id\" IS ?");
}

TEST_F(QueryFindings, WhatIsTooDeepOrTooMuchIsToldBeforeWhatIsWrongInIt) {
    Json::Value jWhere = 5;
    for (int i = 0; i <= 1000; ++i) {
        Json::Value jOuter;
        jOuter["$not"].swapPayload(jWhere);
        jWhere.swapPayload(jOuter);
    }
    Json::Value jQuery;
    jQuery["where"].swapPayload(jWhere);
    const Query Deep(jQuery);
    EXPECT_EQ(Deep.vecFindings.size(), 1U);
    EXPECT_EQ(Deep.vecFindings[0].strMessage, "the conditions are nested too deep");
    EXPECT_EQ(WrongWhere(R"({"$and": {}})"),
              "not-conditions /where/$and: this group is a list of conditions, not an object of 0");
    DeepList Lists(1001);
    Json::Value jMany;
    for (int i = 0; i < 1000; ++i) {
        jMany["where"]["$or"].append(Parse(R"({"id": 1})"));
    }
    jMany["where"]["$or"][1000]["map"].swapPayload(Lists.jList);
    EXPECT_EQ(Text(Query(jMany).vecFindings),
              "too-many-conditions /where/$or/1000/map: the query has more than 1000 conditions");
}

TEST_F(QueryFindings, ValueMayHaveAThousandLevels) {
    DeepList Thousand(1000), More(1001);
    EXPECT_FALSE(vornjsondb::IsTooDeep(Thousand.jList));
    EXPECT_TRUE(vornjsondb::IsTooDeep(More.jList));
}

}  // namespace VORN_JSON_DB
