#include <cmath>
#include <limits>

#include "../../table/Fit.h"
#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

// What becomes of a value in a member of a type: "typeof|column|read back", or the finding's code.
class TypesTest : public TableTest {
  protected:
    std::string Store(const std::string& strType, const Json::Value& jValue,
                      bool blCompatible = false) {
        Options How;
        How.blCompatible = blCompatible;
        How.blCreateTable = true;
        const std::string strTable = "t" + std::to_string(m_nTables++);
        Json::Value jDefinition;
        jDefinition[strTable]["member"]["m"]["cpptype"] = strType;
        EXPECT_EQ("ok", Text(m_Table.Open(m_pDb, strTable, jDefinition, How)));
        Json::Value jRecord;
        jRecord["m"] = jValue;
        Json::Value jStored;
        const Status Outcome = m_Table.Create(jRecord, &jStored);
        if (!Outcome.Ok()) {
            EXPECT_EQ("", Rows("SELECT * FROM " + strTable));
            return Outcome.Findings().empty() ? Outcome.Message() : Outcome.Findings()[0].szCode;
        }
        return Rows("SELECT typeof(m), m FROM " + strTable) + "|" + Text(jStored["m"]);
    }

    std::string Store(const std::string& strType, const std::string& strValue,
                      bool blCompatible = false) {
        return Store(strType, Parse(strValue), blCompatible);
    }

  private:
    int m_nTables = 0;
};

struct Case {
    const char* szType;
    const char* szValue;
    const char* szExpected;
};

TEST_F(TypesTest, ValuesAreStoredByTypeAndRange) {
    const Case kCases[] = {
        {"string", R"("a")", "text|a|\"a\""},
        {"string", R"("12")", "text|12|\"12\""},
        {"string", R"("")", "text||\"\""},
        {"string", "12", "wrong-kind"},
        {"bool", "true", "integer|1|true"},
        {"bool", "false", "integer|0|false"},
        {"bool", "1", "wrong-kind"},
        {"int", "2147483647", "integer|2147483647|2147483647"},
        {"int", "-2147483648", "integer|-2147483648|-2147483648"},
        {"int", "2147483648", "out-of-range"},
        {"int", "-2147483649", "out-of-range"},
        {"int", "3.0", "integer|3|3"},
        {"int", "3.5", "wrong-kind"},
        {"int", R"("3")", "wrong-kind"},
        {"int", "true", "wrong-kind"},
        {"int", "1e300", "out-of-range"},
        {"unsigned int", "4294967295", "integer|4294967295|4294967295"},
        {"unsigned int", "4294967296", "out-of-range"},
        {"unsigned int", "-1", "out-of-range"},
        {"unsigned", "4294967295", "integer|4294967295|4294967295"},
        {"uid_t", "4294967295", "integer|4294967295|4294967295"},
        {"uid_t", "-1", "out-of-range"},
        {"long", "-9223372036854775808", "integer|-9223372036854775808|-9223372036854775808"},
        {"long long", "9223372036854775807", "integer|9223372036854775807|9223372036854775807"},
        {"long long", "9223372036854775808", "out-of-range"},
        {"time_t", "1700000000000", "integer|1700000000000|1700000000000"},
        {"unsigned long", "-1", "out-of-range"},
        {"unsigned long long", "9223372036854775807",
         "integer|9223372036854775807|9223372036854775807"},
        {"unsigned long long", "18446744073709551615", "out-of-range"},
        {"double", "0.5", "real|0.5|0.5"},
        {"double", "3", "real|3.0|3.0"},
        {"double", "9007199254740993", "out-of-range"},
        {"double", "9223372036854775808", "real|9.22337203685478e+18|9.2233720368547758e+18"},
        {"double", "9223372036854775809", "out-of-range"},
        {"double", "18446744073709551615", "out-of-range"},
        {"double", R"("0.5")", "wrong-kind"},
        {"float", "1e30", "real|1.0e+30|1e+30"},
        {"float", "1e300", "out-of-range"},
        {"Json::objectValue", R"({"b": 1, "a": "x"})", R"(text|{"a":"x","b":1}|{"a":"x","b":1})"},
        {"Json::objectValue", "[]", "wrong-kind"},
        {"Json::arrayValue", "[1, [2]]", "text|[1,[2]]|[1,[2]]"},
        {"Json::arrayValue", "{}", "wrong-kind"},
        {"Json::Value", "5", "text|5|5"},
        {"Json::Value", R"("5")", R"(text|"5"|"5")"},
        {"Json::Value", "true", "text|true|true"},
        {"any", "5", "integer|5|5"},
        {"any", R"("5")", R"(text|5|"5")"},
        {"any", "5.5", "real|5.5|5.5"},
        {"any", "true", "wrong-kind"},
        {"any", "[]", "wrong-kind"},
        {"any", "18446744073709551615", "out-of-range"},
        {"string", "5.5", "wrong-kind"},
        {"double", "9223372036854775807", "out-of-range"},
        {"long long", "-1e19", "out-of-range"},
    };
    for (const Case& Each : kCases) {
        EXPECT_EQ(Each.szExpected, Store(Each.szType, std::string(Each.szValue)))
            << Each.szType << " " << Each.szValue;
    }
}

TEST_F(TypesTest, MessagesTellWhatATypeTakes) {
    const struct {
        const char* szType;
        const char* szExpected;
    } kCases[] = {
        {"string", "a text"},
        {"bool", "true or false"},
        {"unsigned int", "a whole number from 0 to 4294967295"},
        {"double", "a number"},
        {"Json::objectValue", "an object"},
        {"Json::arrayValue", "a list"},
        {"Json::Value", "any JSON"},
        {"any", "a text or a number"},
    };
    for (const auto& Each : kCases) {
        const std::string strType = Each.szType;
        EXPECT_EQ(Each.szExpected, vornjsondb::Expected(vornjsondb::FindMemberType(
                                       strType.data(), strType.data() + strType.size())));
    }
}

TEST_F(TypesTest, MisfitsAreTold) {
    Options How;
    How.blCompatible = true;
    Open(R"({"t": {"member": {"d": {"cpptype": "double"}, "i": {"cpptype": "unsigned int"},
             "l": {"cpptype": "Json::arrayValue"}}}})",
         How);
    Json::Value jRecord = Parse(R"({"d": 0.5, "i": -1})");
    jRecord["l"].append(std::nan(""));
    const Status Outcome = m_Table.Create(jRecord);
    std::string strText;
    for (const Finding& Found : Outcome.Findings()) {
        strText += Found.strMessage + "\n";
    }
    EXPECT_EQ(
        "member \"d\": 0.5 could not be read back by a VornJsonDbApi, although it is a number\n"
        "member \"i\": -1 is out of range: expected is a whole number from 0 to 4294967295\n"
        "member \"l\": a list of 1 is or holds NaN: expected is a list\n",
        strText);
    jRecord = Parse("{}");
    jRecord["l"] = Nested(10000);
    EXPECT_EQ(
        "refused: cannot save a record in table \"t\": member \"l\": a list of 1 is nested too "
        "deeply to be read back: expected is a list [too-deep /l]",
        Text(m_Table.Create(jRecord)));
}

// Its text in JSON, 1e+9999, is no number to JsonCpp's reader: neither handle would read it back.
TEST_F(TypesTest, InfinityIsStoredAsAColumnAndRefusedInsideOfJson) {
    Options How;
    How.blCompatible = false;
    Open(R"({"t": {"key": "i", "member": {"d": {"cpptype": "double"}, "i": {"cpptype": "int"},
             "j": {"cpptype": "Json::Value"}, "l": {"cpptype": "Json::arrayValue"}}}})",
         How);
    const double dInfinity = std::numeric_limits<double>::infinity();
    Json::Value jRecord = Parse(R"({"i": 1})");
    jRecord["d"] = dInfinity;
    EXPECT_EQ("ok", Text(m_Table.Create(jRecord)));
    EXPECT_EQ("ok", Text(m_Table.Get(1, jRecord)));
    EXPECT_EQ(dInfinity, jRecord["d"].asDouble());
    jRecord = Parse(R"({"i": 2, "l": [1, [2]]})");
    jRecord["l"][1].append(-dInfinity);
    EXPECT_EQ(
        "refused: cannot save a record in table \"t\": member \"l\": a list of 2 is or holds an "
        "infinity: expected is a list [not-a-number /l]",
        Text(m_Table.Create(jRecord)));
    jRecord = Parse(R"({"i": 2})");
    jRecord["j"] = dInfinity;
    EXPECT_EQ(
        "refused: cannot save a record in table \"t\": member \"j\": Inf is or holds an "
        "infinity: expected is any JSON [not-a-number /j]",
        Text(m_Table.Create(jRecord)));
    Query Which;
    Which.Where("l", Op::kContains, dInfinity);
    EXPECT_EQ(
        "refused: cannot list records of table \"t\": JSON: Inf is or holds an infinity, "
        "which JSON cannot [not-a-number /where/l/$contains]",
        Text(m_Table.List(Which, jRecord)));
}

TEST_F(TypesTest, InfinityMayBeADefault) {
    for (const double dDefault : {HUGE_VAL, -HUGE_VAL}) {
        Json::Value jDefinition = Parse(R"({"t": {"key": "i", "member": {
            "d": {"cpptype": "double"}, "i": {"cpptype": "int"}}}})");
        jDefinition["t"]["member"]["d"]["cppDefaultValue"] = dDefault;
        Options How;
        How.blCreateTable = true;
        Run("DROP TABLE IF EXISTS t");
        EXPECT_EQ("ok", Text(m_Table.Open(m_pDb, "t", jDefinition, How)));
        Run("INSERT INTO t (i) VALUES (1)");
        EXPECT_EQ(dDefault < 0 ? "real|-Inf" : "real|Inf", Rows("SELECT typeof(d), d FROM t"));
        m_Table = Table();
    }
}

TEST_F(TypesTest, CompatibleRefusesWhatAnOldHandleCannotReadBack) {
    const Case kCases[] = {
        {"string", R"("a")", "text|a|\"a\""},
        {"string", R"("a\u0000b")", "old-cannot-read"},
        {"unsigned int", "2147483647", "integer|2147483647|2147483647"},
        {"unsigned int", "2147483648", "old-cannot-read"},
        {"unsigned long long", "9223372036854775807",
         "integer|9223372036854775807|9223372036854775807"},
        {"unsigned", "1", "old-cannot-read"},
        {"long", "1", "old-cannot-read"},
        {"unsigned long", "1", "old-cannot-read"},
        {"uid_t", "1", "old-cannot-read"},
        {"time_t", "1", "old-cannot-read"},
        {"double", "0.5", "old-cannot-read"},
        {"double", "1", "old-cannot-read"},
        {"float", "0.5", "old-cannot-read"},
        {"any", "1", "old-cannot-read"},
        {"any", R"("a")", "old-cannot-read"},
        {"any", "0.5", "old-cannot-read"},
        {"Json::Value", "5", "text|5|5"},
        {"Json::Value", R"({"a": "\u0000"})", R"(text|{"a":"\u0000"}|{"a":"\u0000"})"},
    };
    for (const Case& Each : kCases) {
        EXPECT_EQ(Each.szExpected, Store(Each.szType, std::string(Each.szValue), true))
            << Each.szType << " " << Each.szValue;
    }
}

TEST_F(TypesTest, NullIsStoredForEveryTypeAndLeftOut) {
    for (const char* szType : {"string", "int", "double", "Json::Value", "any"}) {
        EXPECT_EQ("null|NULL|null", Store(szType, Json::Value(), true)) << szType;
    }
}

TEST_F(TypesTest, RealsThatAreNoNumbersAreRefused) {
    EXPECT_EQ("not-a-number", Store("double", Json::Value(std::nan(""))));
    EXPECT_EQ("not-a-number", Store("any", Json::Value(std::nan(""))));
    Json::Value jList(Json::arrayValue);
    jList.append(std::nan(""));
    EXPECT_EQ("not-a-number", Store("Json::arrayValue", jList));
    EXPECT_EQ("real|Inf|1e+9999",
              Store("double", Json::Value(std::numeric_limits<double>::infinity())));
    EXPECT_EQ("real|Inf|1e+9999",
              Store("float", Json::Value(std::numeric_limits<double>::infinity())));
}

TEST_F(TypesTest, TextsComeBackByteByByte) {
    for (const std::string& strText :
         {std::string("100% %n %s"), std::string("it's \"so\""), std::string("a\0b", 3),
          std::string("\0", 1), std::string("\xff\xfe\xc3"), std::string("\xed\xa0\x80"),
          std::string(1 << 20, 'x'), std::string("'; DROP TABLE t; --")}) {
        Json::Value jDefinition = Parse(kTasks);
        Options How;
        How.blCreateTable = true;
        How.blCompatible = false;
        EXPECT_EQ("ok", Text(m_Table.Open(m_pDb, "task", jDefinition, How)));
        Json::Value jRecord;
        jRecord["name"] = strText;
        Json::Value jStored;
        EXPECT_EQ("ok", Text(m_Table.Create(jRecord, &jStored)));
        EXPECT_TRUE(jStored["name"].asString() == strText) << strText;
    }
    EXPECT_EQ("8", Rows("SELECT count(*) FROM task"));
}

TEST_F(TypesTest, JsonIsStoredAsDeepAsItsReaderGoes) {
    Json::CharReaderBuilder Builder;
    const int nMost = Builder["stackLimit"].asInt();
    const auto nLevels = static_cast<size_t>(nMost);
    const std::string strText = std::string(nLevels, '[') + std::string(nLevels, ']');
    EXPECT_EQ("text|" + strText + "|" + strText, Store("Json::arrayValue", Nested(nMost)));
    EXPECT_EQ("too-deep", Store("Json::arrayValue", Nested(nMost + 1)));
    EXPECT_EQ("too-deep", Store("Json::Value", Nested(10000)));
    // A value inside is one level more.
    EXPECT_EQ(Store("Json::arrayValue", Nested(nMost + 1, 0.5)), "too-deep");
    EXPECT_EQ(Store("Json::arrayValue", Nested(nMost, 0.5)).substr(0, 6), "text|[");
}

TEST_F(TypesTest, StoredValuesOfAnotherKindAreReadAsWhatTheyAre) {
    Options How;
    How.strSqlCreate = "CREATE TABLE f (b BOOL, d REAL, i INT, j TEXT, k INTEGER PRIMARY KEY, s)";
    Open(R"({"f": {"member": {"b": {"cpptype": "bool"}, "d": {"cpptype": "double"},
             "i": {"cpptype": "int"}, "j": {"cpptype": "Json::objectValue"},
             "k": {"cpptype": "int"}, "s": {"cpptype": "string"}}}})",
         How);
    Run("INSERT INTO f VALUES (2, 'x', 'y', '{\"a\"', 1, 5)");
    EXPECT_EQ(R"({"b":2,"d":"x","i":"y","j":"{\"a\"","k":1,"s":"5"})", Get("1"));
    Run("INSERT INTO f VALUES ('true', 7, 1.5, 6, 2, x'6162')");
    EXPECT_EQ(R"({"b":"true","d":7.0,"i":1.5,"j":6,"k":2,"s":"ab"})", Get("2"));
    Run("INSERT INTO f VALUES (0, NULL, 5000000000, '', 3, '')");
    EXPECT_EQ(R"({"b":false,"i":5000000000,"j":"","k":3,"s":""})", Get("3"));
}

TEST_F(TypesTest, NullColumnsAreReadAsTold) {
    constexpr char kDefinition[] = R"({"n": {"key": "k", "member": {"k": {"cpptype": "int"},
        "a": {"cpptype": "int"}, "b": {"cpptype": "int", "nullSeen": true}}}})";
    Options How;
    Open(kDefinition, How);
    EXPECT_EQ(R"({"b":null,"k":1})", Create(R"({"k": 1})"));
    How.eNulls = Nulls::kLeaveOut;
    Open(kDefinition, How);
    EXPECT_EQ(R"({"k":1})", Get("1"));
    How.eNulls = Nulls::kKeep;
    Open(kDefinition, How);
    EXPECT_EQ(R"({"a":null,"b":null,"k":1})", Get("1"));
}

}  // namespace

}  // namespace VORN_JSON_DB
