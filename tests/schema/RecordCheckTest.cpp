// checkJsonType: which values fit which type name, and what is said when one does not.
#include "FreshTable.h"

namespace testhost {

namespace {

class RecordCheck : public FreshTableTest {};

bool IsIntegral(const Json::Value& jValue) {
    return jValue.isIntegral();
}
bool IsBool(const Json::Value& jValue) {
    return jValue.isBool();
}
bool IsString(const Json::Value& jValue) {
    return jValue.isString();
}
bool IsArray(const Json::Value& jValue) {
    return jValue.isArray();
}
bool IsObject(const Json::Value& jValue) {
    return jValue.isObject();
}

const char* const kValues[] = {
    "null",      "true", "false", "0",     "3",        "-3", "3000000000", "18446744073709551615",
    "1.5",       "3.0",  "\"\"",  "\"3\"", "\"text\"", "[]", "[1,null]",   "{}",
    "{\"a\":1}",
};

struct Treatment {
    const char* szType;
    bool (*pfnFits)(const Json::Value&);
};

const Treatment kKnown[] = {
    {"int", IsIntegral},
    {"long long", IsIntegral},
    {"uid_t", IsIntegral},
    {"time_t", IsIntegral},
    {"bool", IsBool},
    {"string", IsString},
    {"Json::arrayValue", IsArray},
    {"Json::objectValue", IsObject},
};

const char* const kNotFound[] = {
    "unsigned int",  "unsigned long long",
    "Json::Value",   "long",
    "unsigned long", "unsigned",
    "double",        "float",
    "Int",           "int ",
    " int",          "",
    "text",          "Json::arrayvalue",
};

Json::Value RecordOf(const char* szJson) {
    Json::Value jRec(Json::objectValue);
    jRec["m"] = ParseJson(szJson);
    return jRec;
}

}  // namespace

TEST_F(RecordCheck, EveryKnownTypeTakesExactlyItsOwnKinds) {
    for (const Treatment& treatment : kKnown) {
        VornJsonDbApi& api = Open(std::string("m:") + treatment.szType);
        for (const char* szValue : kValues) {
            SCOPED_TRACE(std::string(treatment.szType) + " " + szValue);
            Json::Value jRec = RecordOf(szValue);
            const Json::Value jBefore = jRec;
            const bool blFits = treatment.pfnFits(jRec["m"]);
            Lines vecExpected;
            if (!blFits) {
                vecExpected = {Located("type failed, strKey=m, jRecParam=" + Compact(jRec))};
            }
            EXPECT_EQ(blFits ? 0 : -1, api.checkJsonType(jRec));
            EXPECT_EQ(vecExpected, TakeLog());
            EXPECT_EQ(jBefore, jRec);
        }
    }
    EXPECT_EQ(Lines{}, TakeSql());
}

TEST_F(RecordCheck, TypeNameOutsideItsTableIsNotFoundWhateverTheValue) {
    for (const char* szType : kNotFound) {
        VornJsonDbApi& api = Open(std::string("m:") + szType);
        for (const char* szValue : kValues) {
            SCOPED_TRACE(std::string(szType) + " " + szValue);
            Json::Value jRec = RecordOf(szValue);
            EXPECT_EQ(-1, api.checkJsonType(jRec));
            EXPECT_EQ((Lines{Located("type not found!!, key=m")}), TakeLog());
        }
    }
}

TEST_F(RecordCheck, EmptyObjectPasses) {
    VornJsonDbApi& api = Open("id:int");
    Json::Value jRec(Json::objectValue);
    EXPECT_EQ(0, api.checkJsonType(jRec));
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(RecordCheck, ArgumentThatIsNoObjectIsRefused) {
    VornJsonDbApi& api = Open("id:int");
    for (const char* szValue : {"null", "[]", "[{\"id\":1}]", "\"id\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szValue);
        Json::Value jRec = ParseJson(szValue);
        const Json::Value jBefore = jRec;
        EXPECT_EQ(-1, api.checkJsonType(jRec));
        EXPECT_EQ((Lines{Check("!jRecParam.isObject()")}), TakeLog());
        EXPECT_EQ(jBefore, jRec);
    }
}

TEST_F(RecordCheck, MembersUnknownToTheTablePassSilently) {
    VornJsonDbApi& api = Open("id:int");
    Json::Value jRec = ParseJson(R"({"a":null,"vornSqlWhereFilter":1,"zz":{"id":"x"}})");
    EXPECT_EQ(0, api.checkJsonType(jRec));
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(RecordCheck, IntTakesThreeButNeitherTextNorNull) {
    VornJsonDbApi& api = Open("id:int");
    Json::Value jGood = ParseJson(R"({"id":3})");
    Json::Value jText = ParseJson(R"({"id":"3"})");
    Json::Value jNull = ParseJson(R"({"id":null})");
    EXPECT_EQ(0, api.checkJsonType(jGood));
    EXPECT_EQ(-1, api.checkJsonType(jText));
    EXPECT_EQ(-1, api.checkJsonType(jNull));
    EXPECT_EQ((Lines{Located(R"(type failed, strKey=id, jRecParam={"id":"3"})"),
                     Located(R"(type failed, strKey=id, jRecParam={"id":null})")}),
              TakeLog());
}

TEST_F(RecordCheck, NumberIsNoBoolean) {
    VornJsonDbApi& api = Open("flag:bool");
    Json::Value jRec = ParseJson(R"({"flag":1})");
    EXPECT_EQ(-1, api.checkJsonType(jRec));
    EXPECT_EQ((Lines{Located(R"(type failed, strKey=flag, jRecParam={"flag":1})")}), TakeLog());
}

TEST_F(RecordCheck, DoubleIsNotFound) {
    VornJsonDbApi& api = Open("d:double");
    Json::Value jRec = ParseJson(R"({"d":1.5})");
    EXPECT_EQ(-1, api.checkJsonType(jRec));
    EXPECT_EQ((Lines{Located("type not found!!, key=d")}), TakeLog());
}

TEST_F(RecordCheck, IntegersHaveNoRangeAndNoSign) {
    VornJsonDbApi& api = Open("i:int,t:time_t,u:uid_t");
    Json::Value jRec = ParseJson(R"({"i":18446744073709551615,"t":-1,"u":-9223372036854775808})");
    EXPECT_EQ(0, api.checkJsonType(jRec));
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(RecordCheck, OnlyTheFirstMisfitInKeyOrderIsReported) {
    VornJsonDbApi& api = Open("a:int,b:string,c:bool");
    Json::Value jRec = ParseJson(R"({"c":"no","b":2,"a":1})");
    EXPECT_EQ(-1, api.checkJsonType(jRec));
    EXPECT_EQ((Lines{Located(R"(type failed, strKey=b, jRecParam={"a":1,"b":2,"c":"no"})")}),
              TakeLog());
}

TEST_F(RecordCheck, UnknownTypeEndsTheWalkBeforeALaterMisfit) {
    VornJsonDbApi& api = Open("a:float,b:string");
    Json::Value jRec = ParseJson(R"({"a":1.5,"b":2})");
    EXPECT_EQ(-1, api.checkJsonType(jRec));
    EXPECT_EQ((Lines{Located("type not found!!, key=a")}), TakeLog());
}

TEST_F(RecordCheck, MemberOfUnknownTypeThatTheRecordLacksDoesNotMatter) {
    VornJsonDbApi& api = Open("a:float,b:string");
    Json::Value jRec = ParseJson(R"({"b":"x"})");
    EXPECT_EQ(0, api.checkJsonType(jRec));
    EXPECT_EQ(Lines{}, TakeLog());
}

TEST_F(RecordCheck, FailureLeavesTheErrorMessageAlone) {
    VornJsonDbApi& api = Open("id:int");
    api.setErrMsg("kept");
    Json::Value jRec = ParseJson(R"({"id":"3"})");
    EXPECT_EQ(-1, api.checkJsonType(jRec));
    EXPECT_EQ("kept", api.getErrMsg());
    TakeLog();
}

TEST_F(RecordCheck, TextsAreLoggedAsTheyStand) {
    VornJsonDbApi& api = Open("n:int");
    Json::Value jRec = ParseJson(u8R"({"n":"100% %s Grün ☂ 'q'"})");
    EXPECT_EQ(-1, api.checkJsonType(jRec));
    EXPECT_EQ((Lines{Located(u8R"(type failed, strKey=n, jRecParam={"n":"100% %s Grün ☂ 'q'"})")}),
              TakeLog());
}

TEST_F(RecordCheck, TableWithoutTypesKnowsNoMemberAndPassesEverything) {
    VornJsonDbApi& api = OpenAs(UniqueTable(), ParseJson(R"({"other":{"member":{}}})"), "id");
    Json::Value jRec = ParseJson(R"({"id":{"any":"thing"}})");
    EXPECT_EQ(0, api.checkJsonType(jRec));
    const Lines vecLines = TakeLog();
    ASSERT_EQ(4U, vecLines.size());
    EXPECT_EQ(UtilCheck("!jTableDef.isMember(strJsonName)"), vecLines[0]);
    EXPECT_EQ(UtilPlain("strJsonName=" + m_strTable), vecLines[1]);
    EXPECT_EQ(UtilPlain(R"(jTableDef={"other":{"member":{}}})"), vecLines[2]);
    EXPECT_EQ(0U, vecLines[3].find(UtilPlain("jType=")));
}

}  // namespace testhost
