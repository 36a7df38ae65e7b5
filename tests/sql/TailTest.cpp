// SqlFilterConditionFromJson: order, limit and offset of a SELECT.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

class Tail : public FreshTableTest {
  protected:
    std::string Written(const Json::Value& jGiven) {
        VornJsonDbApi& api = Open("name:string");
        std::string strSql;
        Json::Value jFilter = jGiven;
        EXPECT_EQ(0, api.SqlFilterConditionFromJson(jFilter, strSql));
        EXPECT_EQ(jGiven, jFilter);
        EXPECT_EQ(Lines{}, TakeLog());
        EXPECT_EQ(Lines{}, TakeSql());
        return strSql;
    }

    std::string Written(const char* szFilter) { return Written(ParseJson(szFilter)); }

    void ExpectRefused(const Json::Value& jGiven, const std::string& strCondition) {
        VornJsonDbApi& api = Open("name:string");
        std::string strSql = "x";
        Json::Value jFilter = jGiven;
        EXPECT_EQ(-1, api.SqlFilterConditionFromJson(jFilter, strSql));
        EXPECT_EQ("x", strSql);
        EXPECT_EQ(jGiven, jFilter);
        EXPECT_EQ(Lines{Check(strCondition)}, TakeLog());
    }
};

}  // namespace

TEST_F(Tail, NullOrAnObjectWithoutTheseKeysWritesNothing) {
    EXPECT_EQ("", Written("null"));
    EXPECT_EQ("", Written("{}"));
    EXPECT_EQ("", Written(R"({"name":"x","Limit":1,"vornSqlWhereFilter":5})"));
}

TEST_F(Tail, FilterOfAWrongKindIsRefused) {
    for (const char* szFilter : {"[]", "[{\"limit\":1}]", "\"limit\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szFilter);
        ExpectRefused(ParseJson(szFilter),
                      "jFilter.type() != Json::objectValue && jFilter.type() != Json::nullValue");
    }
}

TEST_F(Tail, AllFourPiecesFollowEachOtherDirectly) {
    EXPECT_EQ(" order by 'name' DESC LIMIT 10 OFFSET 20",
              Written(R"({"sort_by":"name","sort_direction":"desc","limit":10,"offset":20})"));
}

TEST_F(Tail, AppendsToTheTextItIsGiven) {
    VornJsonDbApi& api = Open("name:string");
    std::string strSql = "x";
    Json::Value jFilter = ParseJson(R"({"limit":1})");
    EXPECT_EQ(0, api.SqlFilterConditionFromJson(jFilter, strSql));
    EXPECT_EQ("x LIMIT 1", strSql);
}

TEST_F(Tail, EveryDirectionButExactlyDescIsAscending) {
    for (const char* szDirection : {"\"DESC\"", "\"Desc\"", "\"desc \"", "\" desc\"", "\"asc\"",
                                    "\"\"", "\"descending\"", "null", "1", "true", "1.5"}) {
        SCOPED_TRACE(szDirection);
        EXPECT_EQ(
            " order by 'name' ASC",
            Written((std::string(R"({"sort_by":"name","sort_direction":)") + szDirection + "}")
                        .c_str()));
    }
}

TEST_F(Tail, SortWithoutDirectionHasNoDirectionWord) {
    EXPECT_EQ(" order by 'name'", Written(R"({"sort_by":"name"})"));
    EXPECT_EQ(" order by 'name' LIMIT 3", Written(R"({"sort_by":"name","limit":3})"));
}

TEST_F(Tail, DirectionWithoutSortIsIgnored) {
    EXPECT_EQ("", Written(R"({"sort_direction":"desc"})"));
    EXPECT_EQ(" LIMIT 3", Written(R"({"sort_direction":"desc","limit":3})"));
}

TEST_F(Tail, OffsetWithoutLimitIsIgnored) {
    EXPECT_EQ("", Written(R"({"offset":5})"));
    EXPECT_EQ(" order by 'name'", Written(R"({"sort_by":"name","offset":5})"));
}

TEST_F(Tail, LimitGivenAsTextKeepsItsDoubleQuotes) {
    EXPECT_EQ(R"( LIMIT "10")", Written(R"({"limit":"10"})"));
    EXPECT_EQ(R"( LIMIT "10" OFFSET "5")", Written(R"({"limit":"10","offset":"5"})"));
}

TEST_F(Tail, LimitAndOffsetAreTheJsonTextOfAnyKind) {
    for (const char* szValue : {"0", "-1", "18446744073709551615", "null", "true", "1.5", "[1,2]",
                                "{\"a\":1}", "\"it's\""}) {
        SCOPED_TRACE(szValue);
        const std::string strFilter =
            std::string(R"({"limit":)") + szValue + R"(,"offset":)" + szValue + "}";
        EXPECT_EQ(std::string(" LIMIT ") + szValue + " OFFSET " + szValue,
                  Written(strFilter.c_str()));
    }
}

TEST_F(Tail, QuoteInTheSortColumnIsDoubled) {
    EXPECT_EQ(" order by 'it''s'", Written(R"({"sort_by":"it's"})"));
}

TEST_F(Tail, SortColumnMayBeAnyText) {
    EXPECT_EQ(" order by ''", Written(R"({"sort_by":""})"));
    EXPECT_EQ(u8" order by 'größe'", Written(u8R"({"sort_by":"größe"})"));
    EXPECT_EQ(" order by '100% %s %%'", Written(R"({"sort_by":"100% %s %%"})"));
}

TEST_F(Tail, SortColumnEndsAtAnEmbeddedNul) {
    Json::Value jFilter(Json::objectValue);
    jFilter["sort_by"] = Json::Value(std::string("ab\0cd", 5));
    EXPECT_EQ(" order by 'ab'", Written(jFilter));
}

TEST_F(Tail, SortColumnOfAMillionBytes) {
    Json::Value jFilter(Json::objectValue);
    jFilter["sort_by"] = LongText();
    EXPECT_TRUE(" order by '" + LongText() + "'" == Written(jFilter));
}

TEST_F(Tail, SortColumnThatIsNoTextIsRefused) {
    for (const char* szValue : {"null", "1", "true", "1.5", "[\"name\"]", "{}"}) {
        SCOPED_TRACE(szValue);
        ExpectRefused(ParseJson(std::string(R"({"sort_by":)") + szValue + R"(,"limit":1})"),
                      "!szSql");
    }
}

TEST_F(Tail, FormatterWithoutMemoryIsReported) {
    Json::Value jFilter(Json::objectValue);
    jFilter["sort_by"] = LongText();
    jFilter["limit"] = 1;
    ScarceMemory scarce;
    ExpectRefused(jFilter, "!szSql");
}

}  // namespace testhost
