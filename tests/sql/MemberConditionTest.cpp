// SqlMakeByMatchField and SqlMakeByListField: one member of a query object as SQL text.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

class MemberCondition : public TableTest {
  protected:
    std::string Match(const std::string& strName, const Json::Value& jGiven) {
        std::string strField = strName;
        std::string strSql = "WHERE ";
        Json::Value jValue = jGiven;
        EXPECT_EQ(m_pHandle->SqlMakeByMatchField(strField, jValue, strSql), 0);
        ExpectUntouched(strName == strField && jGiven == jValue);
        EXPECT_EQ(TakeLog(), Lines());
        return Behind(strSql);
    }

    std::string List(const char* szName, const Json::Value& jGiven) {
        std::string strSql = "WHERE ";
        Json::Value jList = jGiven;
        EXPECT_EQ(m_pHandle->SqlMakeByListField(szName, jList, strSql), 0);
        ExpectUntouched(jGiven == jList);
        EXPECT_EQ(TakeLog(), Lines());
        return Behind(strSql);
    }

    void ExpectMatchRefused(const std::string& strName, const Json::Value& jGiven,
                            const std::string& strCondition) {
        std::string strField = strName;
        std::string strSql = "WHERE ";
        Json::Value jValue = jGiven;
        EXPECT_EQ(m_pHandle->SqlMakeByMatchField(strField, jValue, strSql), -1);
        ExpectUntouched(strSql == "WHERE " && jGiven == jValue);
        EXPECT_EQ(TakeLog(), Lines{Check(strCondition)});
    }

    void ExpectListRefused(const char* szName, const Json::Value& jGiven,
                           const std::string& strCondition) {
        std::string strSql = "WHERE ";
        Json::Value jList = jGiven;
        EXPECT_EQ(m_pHandle->SqlMakeByListField(szName, jList, strSql), -1);
        ExpectUntouched(strSql == "WHERE " && jGiven == jList);
        EXPECT_EQ(TakeLog(), Lines{Check(strCondition)});
    }

  private:
    void ExpectUntouched(bool blSame) {
        EXPECT_TRUE(blSame);
        EXPECT_EQ(TakeSql(), Lines());
    }

    std::string Behind(const std::string& strSql) {
        EXPECT_EQ(strSql.find("WHERE "), 0U);
        return strSql.substr(6);
    }
};

const char kQuoteJson[] = R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.toString().c_str())))";
const char kQuoteBool[] = R"(NULL == (szSql = sqlite3_mprintf("%d", jParam.asInt())))";
const char kQuoteListJson[] =
    R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].toString().c_str())))";

const char* const kBareTypes[] = {
    "int",   "unsigned int",  "long long", "unsigned long long",
    "long",  "unsigned long", "unsigned",  "double",
    "float", "uid_t",         "time_t",    "String",
    "",      "nonsense",
};
const char* const kJsonTypes[] = {"Json::Value", "Json::arrayValue", "Json::objectValue"};

const char* const kConditionValues[] = {
    "null",       "true", "false",      "7",    "-7",        "18446744073709551615",
    "3000000000", "1.5",  "\"O'Neil\"", "\"\"", "[1,\"a\"]", "{\"k\":\"it's\"}",
};
const std::size_t kCount = sizeof(kConditionValues) / sizeof(kConditionValues[0]);
// asString of each, escaped; null where it has no string form.
const char* const kAsString[kCount] = {
    "",           "true", "false",   "7", "-7",    "18446744073709551615",
    "3000000000", "1.5",  "O''Neil", "",  nullptr, nullptr,
};
// The JSON text of each, escaped.
const char* const kAsJson[kCount] = {
    "null",       "true", "false",       "7",    "-7",        "18446744073709551615",
    "3000000000", "1.5",  "\"O''Neil\"", "\"\"", "[1,\"a\"]", "{\"k\":\"it''s\"}",
};
// asInt of each; null where it is out of range or no number.
const char* const kAsInt[kCount] = {
    "0", "1", "0", "7", "-7", nullptr, nullptr, "1", nullptr, nullptr, nullptr, nullptr,
};

Json::Value ListOf(const Json::Value& jElement) {
    Json::Value jList(Json::arrayValue);
    jList.append(jElement);
    return jList;
}

}  // namespace

// ---- equality ----------------------------------------------------------------------------------

TEST_F(MemberCondition, StringTypeQuotesTheStringFormOfEveryKind) {
    Open("m:string");
    for (std::size_t i = 0; i < kCount; ++i) {
        SCOPED_TRACE(kConditionValues[i]);
        if (kAsString[i] == nullptr) {
            ExpectMatchRefused("m", ParseJson(kConditionValues[i]), kQuoteText);
        } else {
            EXPECT_EQ(Match("m", ParseJson(kConditionValues[i])),
                      "m='" + std::string(kAsString[i]) + "'");
        }
    }
}

TEST_F(MemberCondition, JsonTypesQuoteTheJsonTextOfEveryKind) {
    for (const char* szType : kJsonTypes) {
        Open(std::string("m:") + szType);
        for (std::size_t i = 0; i < kCount; ++i) {
            SCOPED_TRACE(std::string(szType) + " " + kConditionValues[i]);
            EXPECT_EQ(Match("m", ParseJson(kConditionValues[i])),
                      "m='" + std::string(kAsJson[i]) + "'");
        }
    }
}

TEST_F(MemberCondition, BoolTypeWritesTheIntegerOfEveryKind) {
    Open("m:bool");
    for (std::size_t i = 0; i < kCount; ++i) {
        SCOPED_TRACE(kConditionValues[i]);
        if (kAsInt[i] == nullptr) {
            ExpectMatchRefused("m", ParseJson(kConditionValues[i]), kQuoteBool);
        } else {
            EXPECT_EQ(Match("m", ParseJson(kConditionValues[i])), "m=" + std::string(kAsInt[i]));
        }
    }
}

TEST_F(MemberCondition, EveryOtherTypeNameWritesTheStringFormBare) {
    for (const char* szType : kBareTypes) {
        Open(std::string("m:") + szType);
        for (std::size_t i = 0; i < kCount; ++i) {
            SCOPED_TRACE(std::string(szType) + " " + kConditionValues[i]);
            if (kAsString[i] == nullptr) {
                ExpectMatchRefused("m", ParseJson(kConditionValues[i]), kQuoteText);
            } else {
                EXPECT_EQ(Match("m", ParseJson(kConditionValues[i])),
                          "m=" + std::string(kAsString[i]));
            }
        }
    }
}

TEST_F(MemberCondition, ApostropheInAStringMemberIsDoubled) {
    Open("name:string");
    EXPECT_EQ(Match("name", "O'Neil"), "name='O''Neil'");
}

TEST_F(MemberCondition, NumberGivenAsTextIsABareLiteral) {
    Open("id:int");
    EXPECT_EQ(Match("id", 5), "id=5");
    EXPECT_EQ(Match("id", "5"), "id=5");
    EXPECT_EQ(Match("id", "5 or 1=1"), "id=5 or 1=1");
}

TEST_F(MemberCondition, TrueIsOneInAnEqualityAndAWordInAList) {
    Open("name:bool");
    EXPECT_EQ(Match("name", true), "name=1");
    EXPECT_EQ(List("name", ListOf(true)), "name in (true )");
}

TEST_F(MemberCondition, JsonMemberHoldingAnObjectIsQuotedJsonText) {
    Open("j:Json::Value");
    EXPECT_EQ(Match("j", ParseJson(R"({"a":[1,"it's"]})")), R"(j='{"a":[1,"it''s"]}')");
}

TEST_F(MemberCondition, NullForAStringMemberIsTheEmptyText) {
    Open("name:string");
    EXPECT_EQ(Match("name", Json::Value()), "name=''");
}

TEST_F(MemberCondition, MemberUnknownToTheTableIsRefused) {
    Open("id:int");
    ExpectMatchRefused("Id", 1, "!jType.isMember(strField)");
    ExpectMatchRefused("", 1, "!jType.isMember(strField)");
    ExpectMatchRefused("x", ParseJson("{}"), "!jType.isMember(strField)");
}

TEST_F(MemberCondition, PercentSignsAreNoConversions) {
    Open("m:string");
    EXPECT_EQ(Match("m", "100% %s %% %n"), "m='100% %s %% %n'");
    Open("m:Json::Value");
    EXPECT_EQ(Match("m", ParseJson(R"(["%d"])")), "m='[\"%d\"]'");
    Open("m:string");
    EXPECT_EQ(List("m", ListOf("%s%%")), "m in ('%s%%' )");
}

TEST_F(MemberCondition, TextEndsAtAnEmbeddedNul) {
    const Json::Value jText(std::string("ab\0cd", 5));
    Open("m:string");
    EXPECT_EQ(Match("m", jText), "m='ab'");
    Open("m:int");
    EXPECT_EQ(Match("m", jText), "m=ab");
    Open("m:string");
    EXPECT_EQ(List("m", ListOf(jText)), "m in ('ab' )");
}

TEST_F(MemberCondition, ForeignLettersAndNamesStayAsTheyAre) {
    Open(u8"größe:string");
    EXPECT_EQ(Match(u8"größe", u8"Grün ☂"), u8"größe='Grün ☂'");
    Open("\"a b\":int");
    EXPECT_EQ(Match("\"a b\"", 1), "\"a b\"=1");
}

TEST_F(MemberCondition, TextOfAMillionBytesIsWrittenWhole) {
    Open("m:string");
    EXPECT_TRUE("m='" + LongText() + "'" == Match("m", LongText()));
    EXPECT_TRUE("m in ('" + LongText() + "' )" == List("m", ListOf(LongText())));
}

TEST_F(MemberCondition, FormatterWithoutMemoryIsNamedInAnEquality) {
    ScarceMemory scarce;
    Open("m:string");
    ExpectMatchRefused("m", LongText(), kQuoteText);
    Open("m:int");
    ExpectMatchRefused("m", LongText(), kQuoteText);
    Open("m:Json::Value");
    ExpectMatchRefused("m", LongText(), kQuoteJson);
}

// ---- membership --------------------------------------------------------------------------------

TEST_F(MemberCondition, StringListQuotesTheStringFormOfEveryKind) {
    Open("m:string");
    for (std::size_t i = 0; i < kCount; ++i) {
        SCOPED_TRACE(kConditionValues[i]);
        if (kAsString[i] == nullptr) {
            ExpectListRefused("m", ListOf(ParseJson(kConditionValues[i])), kQuoteListText);
        } else {
            EXPECT_EQ(List("m", ListOf(ParseJson(kConditionValues[i]))),
                      "m in ('" + std::string(kAsString[i]) + "' )");
        }
    }
}

TEST_F(MemberCondition, JsonListQuotesTheJsonTextOfEveryKind) {
    for (const char* szType : kJsonTypes) {
        Open(std::string("m:") + szType);
        for (std::size_t i = 0; i < kCount; ++i) {
            SCOPED_TRACE(std::string(szType) + " " + kConditionValues[i]);
            EXPECT_EQ(List("m", ListOf(ParseJson(kConditionValues[i]))),
                      "m in ('" + std::string(kAsJson[i]) + "' )");
        }
    }
}

TEST_F(MemberCondition, ListOfAnyOtherTypeBoolIncludedIsBare) {
    std::vector<std::string> vecTypes(std::begin(kBareTypes), std::end(kBareTypes));
    vecTypes.push_back("bool");
    for (const std::string& strType : vecTypes) {
        Open(std::string("m:") + strType.c_str());
        for (std::size_t i = 0; i < kCount; ++i) {
            SCOPED_TRACE(strType + " " + kConditionValues[i]);
            if (kAsString[i] == nullptr) {
                ExpectListRefused("m", ListOf(ParseJson(kConditionValues[i])), kQuoteListText);
            } else {
                EXPECT_EQ(List("m", ListOf(ParseJson(kConditionValues[i]))),
                          "m in (" + std::string(kAsString[i]) + " )");
            }
        }
    }
}

TEST_F(MemberCondition, EmptyListWritesNothingAtAll) {
    Open("m:string");
    EXPECT_EQ(List("m", ParseJson("[]")), "");
}

TEST_F(MemberCondition, ElementsFollowEachOtherWithoutSeparator) {
    Open("name:string");
    EXPECT_EQ(List("name", ParseJson(R"(["a","b"])")), "name in ('a''b' )");
    Open("name:int");
    EXPECT_EQ(List("name", ParseJson("[1,2]")), "name in (12 )");
    Open("name:Json::Value");
    EXPECT_EQ(List("name", ParseJson("[{},[],1]")), "name in ('{}''[]''1' )");
}

// An array need not store all of its elements; one that it does not is a null.
TEST_F(MemberCondition, ElementThatTheListDoesNotStoreIsANull) {
    const std::pair<const char*, const char*> aTexts[] = {
        {"string", "m in ('''''7' )"},
        {"Json::Value", "m in ('null''null''7' )"},
        {"Json::objectValue", "m in ('null''null''7' )"},
        {"Json::arrayValue", "m in ('null''null''7' )"},
        {"int", "m in (7 )"},
        {"bool", "m in (7 )"},
        {"nonsense", "m in (7 )"},
    };
    for (const auto& [szType, szText] : aTexts) {
        Json::Value jList(Json::arrayValue);
        jList[2] = 7;
        Open(std::string("m:") + szType);
        EXPECT_EQ(List("m", jList), szText) << szType;
    }
}

TEST_F(MemberCondition, ElementsMissingAtTheEndAreNulls) {
    Json::Value jList = ListOf("x");
    jList.resize(3);
    Open("m:string");
    EXPECT_EQ(List("m", jList), "m in ('x''''' )");
    Open("m:Json::Value");
    EXPECT_EQ(List("m", jList), R"(m in ('"x"''null''null' ))");
    Json::Value jNone(Json::arrayValue);
    jNone.resize(2);
    Open("m:string");
    EXPECT_EQ(List("m", jNone), "m in ('''' )");
    Open("m:int");
    EXPECT_EQ(List("m", jNone), "m in ( )");
}

TEST_F(MemberCondition, ReadingPastTheEndMakesElements) {
    Json::Value jList = ListOf("x");
    EXPECT_TRUE(jList[3].isNull());
    Open("m:string");
    EXPECT_EQ(List("m", jList), "m in ('x''''''' )");
}

TEST_F(MemberCondition, ElementMissingInsideAnElementIsWrittenAsNull) {
    Json::Value jList(Json::arrayValue);
    jList[1][1] = "x";
    Open("m:Json::Value");
    EXPECT_EQ(List("m", jList), R"(m in ('null''[null,"x"]' ))");
    Open("m:string");
    ExpectListRefused("m", jList, kQuoteListText);
}

TEST_F(MemberCondition, LaterElementOfAWrongKindDropsTheWholeList) {
    Open("m:string");
    ExpectListRefused("m", ParseJson(R"(["a","b",[]])"), kQuoteListText);
    Open("m:int");
    ExpectListRefused("m", ParseJson("[1,{}]"), kQuoteListText);
}

TEST_F(MemberCondition, ListWithoutAFieldNameIsRefused) {
    Open("m:string");
    ExpectListRefused(nullptr, ParseJson("[1]"), "!szField || !szField[0]");
    ExpectListRefused("", ParseJson("[1]"), "!szField || !szField[0]");
    ExpectListRefused(nullptr, ParseJson("5"), "!szField || !szField[0]");
}

TEST_F(MemberCondition, ListOfAMemberUnknownToTheTableIsRefusedBeforeItsKindIsSeen) {
    Open("m:string");
    ExpectListRefused("x", ParseJson("[1]"), "!jType.isMember(szField)");
    ExpectListRefused("x", ParseJson("5"), "!jType.isMember(szField)");
}

TEST_F(MemberCondition, ListThatIsNoArrayIsRefused) {
    Open("m:string");
    for (const char* szValue : {"null", "{}", "{\"0\":1}", "\"a\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szValue);
        ExpectListRefused("m", ParseJson(szValue), "jList.type() != Json::arrayValue");
    }
}

TEST_F(MemberCondition, FormatterWithoutMemoryIsNamedInAList) {
    ScarceMemory scarce;
    Json::Value jList = ListOf("a");
    jList.append(LongText());
    Open("m:string");
    ExpectListRefused("m", jList, kQuoteListText);
    Open("m:bool");
    ExpectListRefused("m", jList, kQuoteListText);
    Open("m:Json::objectValue");
    ExpectListRefused("m", jList, kQuoteListJson);
}

TEST_F(MemberCondition, HandleWorksOnAfterEveryRefusal) {
    Open("m:string");
    ExpectMatchRefused("m", ParseJson("[]"), kQuoteText);
    EXPECT_EQ(Match("m", "x"), "m='x'");
    ExpectListRefused("m", ParseJson("[[]]"), kQuoteListText);
    EXPECT_EQ(List("m", ListOf("x")), "m in ('x' )");
}
