// SqlFilterConditionFromJson: order, limit and offset of a SELECT.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

class Tail : public TableTest {
  protected:
    std::string Written(const Json::Value& jGiven) {
        std::string strSql;
        Json::Value jFilter = jGiven;
        EXPECT_EQ(m_pHandle->SqlFilterConditionFromJson(jFilter, strSql), 0);
        EXPECT_EQ(jFilter, jGiven);
        EXPECT_EQ(TakeLog(), Lines());
        EXPECT_EQ(TakeSql(), Lines());
        return strSql;
    }

    std::string Written(const char* szFilter) { return Written(ParseJson(szFilter)); }

    void ExpectRefused(const Json::Value& jGiven, const std::string& strCondition) {
        std::string strSql = "x";
        Json::Value jFilter = jGiven;
        EXPECT_EQ(m_pHandle->SqlFilterConditionFromJson(jFilter, strSql), -1);
        EXPECT_EQ(strSql, "x");
        EXPECT_EQ(jFilter, jGiven);
        EXPECT_EQ(TakeLog(), Lines{Check(strCondition)});
    }
};

}  // namespace

TEST_F(Tail, NullOrAnObjectWithoutTheseKeysWritesNothing) {
    EXPECT_EQ(Written("null"), "");
    EXPECT_EQ(Written("{}"), "");
    EXPECT_EQ(Written(R"({"name":"x","Limit":1,"vornSqlWhereFilter":5})"), "");
}

TEST_F(Tail, FilterOfAWrongKindIsRefused) {
    for (const char* szFilter : {"[]", "[{\"limit\":1}]", "\"limit\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szFilter);
        ExpectRefused(ParseJson(szFilter),
                      "jFilter.type() != Json::objectValue && jFilter.type() != Json::nullValue");
    }
}

TEST_F(Tail, AllFourPiecesFollowEachOtherDirectly) {
    EXPECT_EQ(Written(R"({"sort_by":"name","sort_direction":"desc","limit":10,"offset":20})"),
              " order by 'name' DESC LIMIT 10 OFFSET 20");
}

TEST_F(Tail, AppendsToTheTextItIsGiven) {
    std::string strSql = "x";
    Json::Value jFilter = ParseJson(R"({"limit":1})");
    EXPECT_EQ(m_pHandle->SqlFilterConditionFromJson(jFilter, strSql), 0);
    EXPECT_EQ(strSql, "x LIMIT 1");
}

TEST_F(Tail, EveryDirectionButExactlyDescIsAscending) {
    for (const char* szDirection : {"\"DESC\"", "\"Desc\"", "\"desc \"", "\" desc\"", "\"asc\"",
                                    "\"\"", "\"descending\"", "null", "1", "true", "1.5"}) {
        SCOPED_TRACE(szDirection);
        EXPECT_EQ(
            Written((std::string(R"({"sort_by":"name","sort_direction":)") + szDirection + "}")
                        .c_str()),
            " order by 'name' ASC");
    }
}

TEST_F(Tail, SortWithoutDirectionHasNoDirectionWord) {
    EXPECT_EQ(Written(R"({"sort_by":"name"})"), " order by 'name'");
    EXPECT_EQ(Written(R"({"sort_by":"name","limit":3})"), " order by 'name' LIMIT 3");
}

TEST_F(Tail, DirectionWithoutSortIsIgnored) {
    EXPECT_EQ(Written(R"({"sort_direction":"desc"})"), "");
    EXPECT_EQ(Written(R"({"sort_direction":"desc","limit":3})"), " LIMIT 3");
}

TEST_F(Tail, OffsetWithoutLimitIsIgnored) {
    EXPECT_EQ(Written(R"({"offset":5})"), "");
    EXPECT_EQ(Written(R"({"sort_by":"name","offset":5})"), " order by 'name'");
}

TEST_F(Tail, LimitGivenAsTextKeepsItsDoubleQuotes) {
    EXPECT_EQ(Written(R"({"limit":"10"})"), R"( LIMIT "10")");
    EXPECT_EQ(Written(R"({"limit":"10","offset":"5"})"), R"( LIMIT "10" OFFSET "5")");
}

TEST_F(Tail, LimitAndOffsetAreTheJsonTextOfAnyKind) {
    for (const char* szValue : {"0", "-1", "18446744073709551615", "null", "true", "1.5", "[1,2]",
                                "{\"a\":1}", "\"it's\""}) {
        SCOPED_TRACE(szValue);
        const std::string strFilter =
            std::string(R"({"limit":)") + szValue + R"(,"offset":)" + szValue + "}";
        EXPECT_EQ(Written(strFilter.c_str()),
                  std::string(" LIMIT ") + szValue + " OFFSET " + szValue);
    }
}

TEST_F(Tail, QuoteInTheSortColumnIsDoubled) {
    EXPECT_EQ(Written(R"({"sort_by":"it's"})"), " order by 'it''s'");
}

TEST_F(Tail, SortColumnMayBeAnyText) {
    EXPECT_EQ(Written(R"({"sort_by":""})"), " order by ''");
    EXPECT_EQ(Written(u8R"({"sort_by":"größe"})"), u8" order by 'größe'");
    EXPECT_EQ(Written(R"({"sort_by":"100% %s %%"})"), " order by '100% %s %%'");
}

TEST_F(Tail, SortColumnEndsAtAnEmbeddedNul) {
    Json::Value jFilter(Json::objectValue);
    jFilter["sort_by"] = Json::Value(std::string("ab\0cd", 5));
    EXPECT_EQ(Written(jFilter), " order by 'ab'");
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
