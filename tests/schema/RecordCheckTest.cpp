// checkJsonType: which values fit which type name, and what is said when one does not.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

using RecordCheck = TableTest;

const char* const kEveryKind[] = {
    "null",      "true", "false", "0",     "3",        "-3", "3000000000", "18446744073709551615",
    "1.5",       "3.0",  "\"\"",  "\"3\"", "\"text\"", "[]", "[1,null]",   "{}",
    "{\"a\":1}",
};

struct Treatment {
    const char* szType;
    bool (Json::Value::*pfnFits)() const;
};

const Treatment kKnown[] = {
    {"int", &Json::Value::isIntegral},
    {"long long", &Json::Value::isIntegral},
    {"uid_t", &Json::Value::isIntegral},
    {"time_t", &Json::Value::isIntegral},
    {"bool", &Json::Value::isBool},
    {"string", &Json::Value::isString},
    {"Json::arrayValue", &Json::Value::isArray},
    {"Json::objectValue", &Json::Value::isObject},
};

// Those of other treatments, and beginnings and other spellings of known ones.
const char* const kNotFound[] = {"unsigned int",
                                 "unsigned long long",
                                 "Json::Value",
                                 "long",
                                 "unsigned long",
                                 "unsigned",
                                 "double",
                                 "float",
                                 "Int",
                                 "int ",
                                 " int",
                                 "",
                                 "text",
                                 "Json::arrayvalue",
                                 "in",
                                 "lon",
                                 "long lon",
                                 "Json::",
                                 "Json::Valu",
                                 "bo",
                                 "unsigned lon"};

}  // namespace

TEST_F(RecordCheck, EveryKnownTypeTakesExactlyItsOwnKinds) {
    for (const Treatment& treatment : kKnown) {
        Open(std::string("m:") + treatment.szType);
        for (const char* szValue : kEveryKind) {
            SCOPED_TRACE(std::string(treatment.szType) + " " + szValue);
            Json::Value jRec = RecordOf(szValue);
            const Json::Value jBefore = jRec;
            const bool blFits = (jRec["m"].*treatment.pfnFits)();
            Lines vecExpected;
            if (!blFits) {
                vecExpected = {Located("type failed, strKey=m, jRecParam=" + Compact(jRec))};
            }
            EXPECT_EQ(m_pHandle->checkJsonType(jRec), blFits ? 0 : -1);
            EXPECT_EQ(TakeLog(), vecExpected);
            EXPECT_EQ(jRec, jBefore);
        }
    }
    EXPECT_EQ(TakeSql(), Lines());
}

TEST_F(RecordCheck, TypeNameOutsideItsTableIsNotFoundWhateverTheValue) {
    for (const char* szType : kNotFound) {
        Open(std::string("m:") + szType);
        for (const char* szValue : kEveryKind) {
            SCOPED_TRACE(std::string(szType) + " " + szValue);
            Json::Value jRec = RecordOf(szValue);
            EXPECT_EQ(m_pHandle->checkJsonType(jRec), -1);
            EXPECT_EQ(TakeLog(), (Lines{Located("type not found!!, key=m")}));
        }
    }
}

TEST_F(RecordCheck, KnownNameFollowedByNulBytesIsUnknown) {
    for (size_t nNuls = 1; nNuls <= 64; ++nNuls) {
        Json::Value jMembers(Json::objectValue);
        jMembers["m"]["cpptype"] = "int" + std::string(nNuls, '\0');
        OpenMembers(jMembers, "m");
        Json::Value jRec = RecordOf("1");
        EXPECT_EQ(m_pHandle->checkJsonType(jRec), -1) << nNuls;
        EXPECT_EQ(TakeLog(), Lines{Located("type not found!!, key=m")}) << nNuls;
    }
}

TEST_F(RecordCheck, EmptyObjectPasses) {
    Open("id:int");
    Json::Value jRec(Json::objectValue);
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), 0);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecordCheck, ArgumentThatIsNoObjectIsRefused) {
    Open("id:int");
    for (const char* szValue : {"null", "[]", "[{\"id\":1}]", "\"id\"", "3", "1.5", "true"}) {
        SCOPED_TRACE(szValue);
        Json::Value jRec = ParseJson(szValue);
        const Json::Value jBefore = jRec;
        EXPECT_EQ(m_pHandle->checkJsonType(jRec), -1);
        EXPECT_EQ(TakeLog(), (Lines{Check("!jRecParam.isObject()")}));
        EXPECT_EQ(jRec, jBefore);
    }
}

TEST_F(RecordCheck, MembersUnknownToTheTablePassSilently) {
    Open("id:int");
    Json::Value jRec = ParseJson(R"({"a":null,"vornSqlWhereFilter":1,"zz":{"id":"x"}})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), 0);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecordCheck, IntTakesThreeButNeitherTextNorNull) {
    Open("id:int");
    Json::Value jGood = ParseJson(R"({"id":3})");
    Json::Value jText = ParseJson(R"({"id":"3"})");
    Json::Value jNull = ParseJson(R"({"id":null})");
    EXPECT_EQ(m_pHandle->checkJsonType(jGood), 0);
    EXPECT_EQ(m_pHandle->checkJsonType(jText), -1);
    EXPECT_EQ(m_pHandle->checkJsonType(jNull), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located(R"(type failed, strKey=id, jRecParam={"id":"3"})"),
                                Located(R"(type failed, strKey=id, jRecParam={"id":null})")}));
}

TEST_F(RecordCheck, NumberIsNoBoolean) {
    Open("flag:bool");
    Json::Value jRec = ParseJson(R"({"flag":1})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located(R"(type failed, strKey=flag, jRecParam={"flag":1})")}));
}

TEST_F(RecordCheck, DoubleIsNotFound) {
    Open("d:double");
    Json::Value jRec = ParseJson(R"({"d":1.5})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("type not found!!, key=d")}));
}

TEST_F(RecordCheck, IntegersHaveNoRangeAndNoSign) {
    Open("i:int,t:time_t,u:uid_t");
    Json::Value jRec = ParseJson(R"({"i":18446744073709551615,"t":-1,"u":-9223372036854775808})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), 0);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecordCheck, OnlyTheFirstMisfitInKeyOrderIsReported) {
    Open("a:int,b:string,c:bool");
    Json::Value jRec = ParseJson(R"({"c":"no","b":2,"a":1})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), -1);
    EXPECT_EQ(TakeLog(),
              (Lines{Located(R"(type failed, strKey=b, jRecParam={"a":1,"b":2,"c":"no"})")}));
}

TEST_F(RecordCheck, UnknownTypeEndsTheWalkBeforeALaterMisfit) {
    Open("a:float,b:string");
    Json::Value jRec = ParseJson(R"({"a":1.5,"b":2})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), -1);
    EXPECT_EQ(TakeLog(), (Lines{Located("type not found!!, key=a")}));
}

TEST_F(RecordCheck, MemberOfUnknownTypeThatTheRecordLacksDoesNotMatter) {
    Open("a:float,b:string");
    Json::Value jRec = ParseJson(R"({"b":"x"})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), 0);
    EXPECT_EQ(TakeLog(), Lines());
}

TEST_F(RecordCheck, FailureLeavesTheErrorMessageAlone) {
    Open("id:int");
    m_pHandle->setErrMsg("kept");
    Json::Value jRec = ParseJson(R"({"id":"3"})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), -1);
    EXPECT_EQ(m_pHandle->getErrMsg(), "kept");
    TakeLog();
}

TEST_F(RecordCheck, TextsAreLoggedAsTheyStand) {
    Open("n:int");
    Json::Value jRec = ParseJson(u8R"({"n":"100% %s Grün ☂ 'q'"})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), -1);
    EXPECT_EQ(TakeLog(),
              (Lines{Located(u8R"(type failed, strKey=n, jRecParam={"n":"100% %s Grün ☂ 'q'"})")}));
}

TEST_F(RecordCheck, TableWithoutTypesKnowsNoMemberAndPassesEverything) {
    OpenDefinition(ParseJson(R"({"other":{"member":{}}})"), "CREATE TABLE t (id)");
    Json::Value jRec = ParseJson(R"({"id":{"any":"thing"}})");
    EXPECT_EQ(m_pHandle->checkJsonType(jRec), 0);
    const Lines vecLines = TakeLog();
    ASSERT_EQ(vecLines.size(), 4U);
    EXPECT_EQ(vecLines[0], UtilCheck("!jTableDef.isMember(strJsonName)"));
    EXPECT_EQ(vecLines[1], UtilPlain("strJsonName=t"));
    EXPECT_EQ(vecLines[2], UtilPlain(R"(jTableDef={"other":{"member":{}}})"));
    EXPECT_EQ(vecLines[3].find(UtilPlain("jType=")), 0U);
}
