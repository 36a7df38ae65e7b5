// SqlMakeByMatchField and SqlMakeByListField: one member of a query object as SQL text.
#include "../schema/FreshTable.h"

namespace testhost {

namespace {

class MemberCondition : public FreshTableTest {
  protected:
    std::string Match(VornJsonDbApi& api, const std::string& strName, const Json::Value& jGiven) {
        std::string strField = strName;
        std::string strSql = "WHERE ";
        Json::Value jValue = jGiven;
        EXPECT_EQ(0, api.SqlMakeByMatchField(strField, jValue, strSql));
        ExpectUntouched(strName == strField && jGiven == jValue);
        EXPECT_EQ(Lines{}, TakeLog());
        return Behind(strSql);
    }

    std::string List(VornJsonDbApi& api, const char* szName, const Json::Value& jGiven) {
        std::string strSql = "WHERE ";
        Json::Value jList = jGiven;
        EXPECT_EQ(0, api.SqlMakeByListField(szName, jList, strSql));
        ExpectUntouched(jGiven == jList);
        EXPECT_EQ(Lines{}, TakeLog());
        return Behind(strSql);
    }

    void ExpectMatchRefused(VornJsonDbApi& api, const std::string& strName,
                            const Json::Value& jGiven, const std::string& strCondition) {
        std::string strField = strName;
        std::string strSql = "WHERE ";
        Json::Value jValue = jGiven;
        EXPECT_EQ(-1, api.SqlMakeByMatchField(strField, jValue, strSql));
        ExpectUntouched(strSql == "WHERE " && jGiven == jValue);
        EXPECT_EQ(Lines{Check(strCondition)}, TakeLog());
    }

    void ExpectListRefused(VornJsonDbApi& api, const char* szName, const Json::Value& jGiven,
                           const std::string& strCondition) {
        std::string strSql = "WHERE ";
        Json::Value jList = jGiven;
        EXPECT_EQ(-1, api.SqlMakeByListField(szName, jList, strSql));
        ExpectUntouched(strSql == "WHERE " && jGiven == jList);
        EXPECT_EQ(Lines{Check(strCondition)}, TakeLog());
    }

  private:
    void ExpectUntouched(bool blSame) {
        EXPECT_TRUE(blSame);
        EXPECT_EQ(Lines{}, TakeSql());
    }

    std::string Behind(const std::string& strSql) {
        EXPECT_EQ(0U, strSql.find("WHERE "));
        return strSql.substr(6);
    }
};

const char kMatchText[] = R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.asString().c_str())))";
const char kMatchJson[] = R"(NULL == (szSql = sqlite3_mprintf("%q", jParam.toString().c_str())))";
const char kMatchBool[] = R"(NULL == (szSql = sqlite3_mprintf("%d", jParam.asInt())))";
const char kListText[] = R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].asString().c_str())))";
const char kListJson[] = R"(NULL == (szSql = sqlite3_mprintf("%q", jList[i].toString().c_str())))";

const char* const kBareTypes[] = {
    "int",   "unsigned int",  "long long", "unsigned long long",
    "long",  "unsigned long", "unsigned",  "double",
    "float", "uid_t",         "time_t",    "String",
    "",      "nonsense",
};
const char* const kJsonTypes[] = {"Json::Value", "Json::arrayValue", "Json::objectValue"};

const char* const kValues[] = {
    "null",       "true", "false",      "7",    "-7",        "18446744073709551615",
    "3000000000", "1.5",  "\"O'Neil\"", "\"\"", "[1,\"a\"]", "{\"k\":\"it's\"}",
};
const std::size_t kCount = sizeof(kValues) / sizeof(kValues[0]);
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
    VornJsonDbApi& api = Open("m:string");
    for (std::size_t i = 0; i < kCount; ++i) {
        SCOPED_TRACE(kValues[i]);
        if (kAsString[i] == nullptr) {
            ExpectMatchRefused(api, "m", ParseJson(kValues[i]), kMatchText);
        } else {
            EXPECT_EQ("m='" + std::string(kAsString[i]) + "'",
                      Match(api, "m", ParseJson(kValues[i])));
        }
    }
}

TEST_F(MemberCondition, JsonTypesQuoteTheJsonTextOfEveryKind) {
    for (const char* szType : kJsonTypes) {
        VornJsonDbApi& api = Open(std::string("m:") + szType);
        for (std::size_t i = 0; i < kCount; ++i) {
            SCOPED_TRACE(std::string(szType) + " " + kValues[i]);
            EXPECT_EQ("m='" + std::string(kAsJson[i]) + "'",
                      Match(api, "m", ParseJson(kValues[i])));
        }
    }
}

TEST_F(MemberCondition, BoolTypeWritesTheIntegerOfEveryKind) {
    VornJsonDbApi& api = Open("m:bool");
    for (std::size_t i = 0; i < kCount; ++i) {
        SCOPED_TRACE(kValues[i]);
        if (kAsInt[i] == nullptr) {
            ExpectMatchRefused(api, "m", ParseJson(kValues[i]), kMatchBool);
        } else {
            EXPECT_EQ("m=" + std::string(kAsInt[i]), Match(api, "m", ParseJson(kValues[i])));
        }
    }
}

TEST_F(MemberCondition, EveryOtherTypeNameWritesTheStringFormBare) {
    for (const char* szType : kBareTypes) {
        VornJsonDbApi& api = Open(std::string("m:") + szType);
        for (std::size_t i = 0; i < kCount; ++i) {
            SCOPED_TRACE(std::string(szType) + " " + kValues[i]);
            if (kAsString[i] == nullptr) {
                ExpectMatchRefused(api, "m", ParseJson(kValues[i]), kMatchText);
            } else {
                EXPECT_EQ("m=" + std::string(kAsString[i]), Match(api, "m", ParseJson(kValues[i])));
            }
        }
    }
}

TEST_F(MemberCondition, ApostropheInAStringMemberIsDoubled) {
    EXPECT_EQ("name='O''Neil'", Match(Open("name:string"), "name", "O'Neil"));
}

TEST_F(MemberCondition, NumberGivenAsTextIsABareLiteral) {
    VornJsonDbApi& api = Open("id:int");
    EXPECT_EQ("id=5", Match(api, "id", 5));
    EXPECT_EQ("id=5", Match(api, "id", "5"));
    EXPECT_EQ("id=5 or 1=1", Match(api, "id", "5 or 1=1"));
}

TEST_F(MemberCondition, TrueIsOneInAnEqualityAndAWordInAList) {
    VornJsonDbApi& api = Open("name:bool");
    EXPECT_EQ("name=1", Match(api, "name", true));
    EXPECT_EQ("name in (true )", List(api, "name", ListOf(true)));
}

TEST_F(MemberCondition, JsonMemberHoldingAnObjectIsQuotedJsonText) {
    EXPECT_EQ(R"(j='{"a":[1,"it''s"]}')",
              Match(Open("j:Json::Value"), "j", ParseJson(R"({"a":[1,"it's"]})")));
}

TEST_F(MemberCondition, NullForAStringMemberIsTheEmptyText) {
    EXPECT_EQ("name=''", Match(Open("name:string"), "name", Json::Value()));
}

TEST_F(MemberCondition, MemberUnknownToTheTableIsRefused) {
    VornJsonDbApi& api = Open("id:int");
    ExpectMatchRefused(api, "Id", 1, "!jType.isMember(strField)");
    ExpectMatchRefused(api, "", 1, "!jType.isMember(strField)");
    ExpectMatchRefused(api, "x", ParseJson("{}"), "!jType.isMember(strField)");
}

TEST_F(MemberCondition, PercentSignsAreNoConversions) {
    EXPECT_EQ("m='100% %s %% %n'", Match(Open("m:string"), "m", "100% %s %% %n"));
    EXPECT_EQ("m='[\"%d\"]'", Match(Open("m:Json::Value"), "m", ParseJson(R"(["%d"])")));
    EXPECT_EQ("m in ('%s%%' )", List(Open("m:string"), "m", ListOf("%s%%")));
}

TEST_F(MemberCondition, TextEndsAtAnEmbeddedNul) {
    const Json::Value jText(std::string("ab\0cd", 5));
    EXPECT_EQ("m='ab'", Match(Open("m:string"), "m", jText));
    EXPECT_EQ("m=ab", Match(Open("m:int"), "m", jText));
    EXPECT_EQ("m in ('ab' )", List(Open("m:string"), "m", ListOf(jText)));
}

TEST_F(MemberCondition, ForeignLettersAndNamesStayAsTheyAre) {
    EXPECT_EQ(u8"größe='Grün ☂'", Match(Open(u8"größe:string"), u8"größe", u8"Grün ☂"));
    EXPECT_EQ("\"a b\"=1", Match(Open("\"a b\":int"), "\"a b\"", 1));
}

TEST_F(MemberCondition, TextOfAMillionBytesIsWrittenWhole) {
    VornJsonDbApi& api = Open("m:string");
    EXPECT_TRUE("m='" + LongText() + "'" == Match(api, "m", LongText()));
    EXPECT_TRUE("m in ('" + LongText() + "' )" == List(api, "m", ListOf(LongText())));
}

TEST_F(MemberCondition, FormatterWithoutMemoryIsNamedInAnEquality) {
    ScarceMemory scarce;
    ExpectMatchRefused(Open("m:string"), "m", LongText(), kMatchText);
    ExpectMatchRefused(Open("m:int"), "m", LongText(), kMatchText);
    ExpectMatchRefused(Open("m:Json::Value"), "m", LongText(), kMatchJson);
}

// ---- membership --------------------------------------------------------------------------------

TEST_F(MemberCondition, StringListQuotesTheStringFormOfEveryKind) {
    VornJsonDbApi& api = Open("m:string");
    for (std::size_t i = 0; i < kCount; ++i) {
        SCOPED_TRACE(kValues[i]);
        if (kAsString[i] == nullptr) {
            ExpectListRefused(api, "m", ListOf(ParseJson(kValues[i])), kListText);
        } else {
            EXPECT_EQ("m in ('" + std::string(kAsString[i]) + "' )",
                      List(api, "m", ListOf(ParseJson(kValues[i]))));
        }
    }
}

TEST_F(MemberCondition, JsonListQuotesTheJsonTextOfEveryKind) {
    for (const char* szType : kJsonTypes) {
        VornJsonDbApi& api = Open(std::string("m:") + szType);
        for (std::size_t i = 0; i < kCount; ++i) {
            SCOPED_TRACE(std::string(szType) + " " + kValues[i]);
            EXPECT_EQ("m in ('" + std::string(kAsJson[i]) + "' )",
                      List(api, "m", ListOf(ParseJson(kValues[i]))));
        }
    }
}

TEST_F(MemberCondition, ListOfAnyOtherTypeBoolIncludedIsBare) {
    std::vector<std::string> vecTypes(std::begin(kBareTypes), std::end(kBareTypes));
    vecTypes.push_back("bool");
    for (const std::string& strType : vecTypes) {
        VornJsonDbApi& api = Open(std::string("m:") + strType.c_str());
        for (std::size_t i = 0; i < kCount; ++i) {
            SCOPED_TRACE(strType + " " + kValues[i]);
            if (kAsString[i] == nullptr) {
                ExpectListRefused(api, "m", ListOf(ParseJson(kValues[i])), kListText);
            } else {
                EXPECT_EQ("m in (" + std::string(kAsString[i]) + " )",
                          List(api, "m", ListOf(ParseJson(kValues[i]))));
            }
        }
    }
}

TEST_F(MemberCondition, EmptyListWritesNothingAtAll) {
    VornJsonDbApi& api = Open("m:string");
    EXPECT_EQ("", List(api, "m", ParseJson("[]")));
}

TEST_F(MemberCondition, ElementsFollowEachOtherWithoutSeparator) {
    EXPECT_EQ("name in ('a''b' )", List(Open("name:string"), "name", ParseJson(R"(["a","b"])")));
    EXPECT_EQ("name in (12 )", List(Open("name:int"), "name", ParseJson("[1,2]")));
    EXPECT_EQ("name in ('{}''[]''1' )",
              List(Open("name:Json::Value"), "name", ParseJson("[{},[],1]")));
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
        EXPECT_EQ(szText, List(Open(std::string("m:") + szType), "m", jList)) << szType;
    }
}

TEST_F(MemberCondition, ElementsMissingAtTheEndAreNulls) {
    Json::Value jList = ListOf("x");
    jList.resize(3);
    EXPECT_EQ("m in ('x''''' )", List(Open("m:string"), "m", jList));
    EXPECT_EQ(R"(m in ('"x"''null''null' ))", List(Open("m:Json::Value"), "m", jList));
    Json::Value jNone(Json::arrayValue);
    jNone.resize(2);
    EXPECT_EQ("m in ('''' )", List(Open("m:string"), "m", jNone));
    EXPECT_EQ("m in ( )", List(Open("m:int"), "m", jNone));
}

TEST_F(MemberCondition, ReadingPastTheEndMakesElements) {
    Json::Value jList = ListOf("x");
    EXPECT_TRUE(jList[3].isNull());
    EXPECT_EQ("m in ('x''''''' )", List(Open("m:string"), "m", jList));
}

TEST_F(MemberCondition, ElementMissingInsideAnElementIsWrittenAsNull) {
    Json::Value jList(Json::arrayValue);
    jList[1][1] = "x";
    EXPECT_EQ(R"(m in ('null''[null,"x"]' ))", List(Open("m:Json::Value"), "m", jList));
    ExpectListRefused(Open("m:string"), "m", jList, kListText);
}

TEST_F(MemberCondition, LaterElementOfAWrongKindDropsTheWholeList) {
    ExpectListRefused(Open("m:string"), "m", ParseJson(R"(["a","b",[]])"), kListText);
    ExpectListRefused(Open("m:int"), "m", ParseJson("[1,{}]"), kListText);
}

TEST_F(MemberCondition, ListWithoutAFieldNameIsRefused) {
    VornJsonDbApi& api = Open("m:string");
    ExpectListRefused(api, nullptr, ParseJson("[1]"), "!szField || !szField[0]");
    ExpectListRefused(api, "", ParseJson("[1]"), "!szField || !szField[0]");
    ExpectListRefused(api, nullptr, ParseJson("5"), "!szField || !szField[0]");
}

TEST_F(MemberCondition, ListOfAMemberUnknownToTheTableIsRefusedBeforeItsKindIsSeen) {
    VornJsonDbApi& api = Open("m:string");
    ExpectListRefused(api, "x", ParseJson("[1]"), "!jType.isMember(szField)");
    ExpectListRefused(api, "x", ParseJson("5"), "!jType.isMember(szField)");
}

TEST_F(MemberCondition, ListThatIsNoArrayIsRefused) {
    VornJsonDbApi& api = Open("m:string");
    for (const char* szValue : {"null", "{}", "{\"0\":1}", "\"a\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szValue);
        ExpectListRefused(api, "m", ParseJson(szValue), "jList.type() != Json::arrayValue");
    }
}

TEST_F(MemberCondition, FormatterWithoutMemoryIsNamedInAList) {
    ScarceMemory scarce;
    Json::Value jList = ListOf("a");
    jList.append(LongText());
    ExpectListRefused(Open("m:string"), "m", jList, kListText);
    ExpectListRefused(Open("m:bool"), "m", jList, kListText);
    ExpectListRefused(Open("m:Json::objectValue"), "m", jList, kListJson);
}

TEST_F(MemberCondition, HandleWorksOnAfterEveryRefusal) {
    VornJsonDbApi& api = Open("m:string");
    ExpectMatchRefused(api, "m", ParseJson("[]"), kMatchText);
    EXPECT_EQ("m='x'", Match(api, "m", "x"));
    ExpectListRefused(api, "m", ParseJson("[[]]"), kListText);
    EXPECT_EQ("m in ('x' )", List(api, "m", ListOf("x")));
}

}  // namespace testhost
