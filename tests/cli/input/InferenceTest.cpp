// Types that fit all records.

#include <gtest/gtest.h>

#include "../../../cli/input/Inference.h"
#include "PrintedRecords.h"

namespace VORN_JSON_DB::Cli {

namespace {

std::string Text(const Inference& Seen) {
    Json::StreamWriterBuilder Builder;
    Builder["indentation"] = "";
    std::string strAll;
    const Json::Value jMembers = Seen.Members();
    for (const std::string& strName : jMembers.getMemberNames()) {
        strAll += (strAll.empty() ? "" : ", ") + strName + " " +
                  jMembers[strName]["cpptype"].asString() +
                  (jMembers[strName].isMember("nullSeen") ? " null" : "");
    }
    for (const std::string& strNote : Seen.Notes()) {
        strAll += "\n" + strNote;
    }
    return strAll;
}

void Learn(Inference& Seen, const std::string& strText) {
    const InputFile File(strText);
    ByteSource From;
    ASSERT_TRUE(From.Open(File.Path()));
    const ReadOptions How = GuessFormat(From.Look());
    Seen.BeginInput(How.eFormat == Format::kSeparated);
    ReadRecords(From, How, Seen);
}

std::string Types(const std::string& strText) {
    Inference Seen;
    Learn(Seen, strText);
    return Text(Seen);
}

// A column of these cells.
std::string Cells(const std::string& strCells) {
    return Types("a,b\n" + strCells);
}

TEST(Inference, EachKindHasItsType) {
    EXPECT_EQ(Types(R"([{"a": 1, "b": 1.5, "c": "x", "d": true, "e": {}, "f": [], "g": null}])"),
              "a long long, b double, c string, d bool, e Json::objectValue, f Json::arrayValue, "
              "g string null");
}

TEST(Inference, MixturesKeepWhatTheyAre) {
    EXPECT_EQ(Types(R"([{"a": 1}, {"a": 1.5}])"), "a double");
    EXPECT_EQ(Types(R"([{"a": 9007199254740992}, {"a": 1.5}])"), "a double");
    EXPECT_EQ(Types(R"([{"a": 9007199254740993}, {"a": 1.5}])"),
              "a any\nmember \"a\": values of several kinds");
    EXPECT_EQ(Types(R"([{"a": -9007199254740993}, {"a": 1.5}])"),
              "a any\nmember \"a\": values of several kinds");
    EXPECT_EQ(Types(R"([{"a": 9007199254740993}, {"a": 1}])"), "a long long");
    EXPECT_EQ(Types(R"([{"a": 5}, {"a": "5"}])"), "a any\nmember \"a\": values of several kinds");
    EXPECT_EQ(Types(R"([{"a": 5}, {"a": true}])"),
              "a Json::Value\nmember \"a\": values of several kinds");
    EXPECT_EQ(Types(R"([{"a": {}}, {"a": []}])"),
              "a Json::Value\nmember \"a\": values of several kinds");
    EXPECT_EQ(Types(R"([{"a": []}, {"a": "x"}])"),
              "a Json::Value\nmember \"a\": values of several kinds");
}

TEST(Inference, WideNumbersAreTexts) {
    EXPECT_EQ(Types(R"([{"a": 9223372036854775808}])"),
              "a string\nmember \"a\": numbers beyond 64 bits are kept as texts");
    EXPECT_EQ(Types(R"([{"a": 9223372036854775808}, {"a": 1}])"),
              "a any\nmember \"a\": numbers beyond 64 bits are kept as texts\n"
              "member \"a\": values of several kinds");
}

TEST(Inference, NullIsNotMissing) {
    EXPECT_EQ(Types(R"([{"a": 1, "b": 1}, {"a": null}])"), "a long long null, b long long");
    EXPECT_EQ(Types(R"([{"a": 1}, {"a": null}, {}])"),
              "a long long null\nmember \"a\": null in some records and missing in others; all "
              "come back as null");
}

TEST(Inference, CellsAreNumbersOnlyIfAllOfTheColumnAre) {
    EXPECT_EQ(Cells("1,1\n-2,2.50\n"), "a long long, b double");
    EXPECT_EQ(Cells("1,1\n007,2\n"), "a string, b long long");
    EXPECT_EQ(Cells("1,x\n+5,2\n"), "a string, b string");
    EXPECT_EQ(Cells("1, 1\n-0,2\n"), "a string, b string");
    EXPECT_EQ(Cells("405E10,1.0e3\n1,2\n"), "a string, b double");
    EXPECT_EQ(Cells("1.,1.e5\n2,2\n"), "a string, b string");
    EXPECT_EQ(Cells("00.5,1.5e\n2,2\n"), "a string, b string");
    EXPECT_EQ(Cells("nan,inf\n"), "a string, b string");
    EXPECT_EQ(Cells("0x10,1_0\n"), "a string, b string");
    EXPECT_EQ(Cells("true,false\n"), "a string, b string");
    EXPECT_EQ(Cells("9223372036854775807,9223372036854775808\n"),
              "a long long, b string\nmember \"b\": numbers beyond 64 bits are kept as texts");
    EXPECT_EQ(Cells("9007199254740993,1\n1.5,1.0e400\n"), "a string, b string");
    EXPECT_EQ(Cells("1,\n2,\n"), "a long long, b string null");
    EXPECT_EQ(Cells("1,\"\"\n,2\n"), "a long long null, b string");
}

TEST(Inference, BadRecordsDoNotCount) {
    EXPECT_EQ(Types("{\"a\":1}\n{\"a\":\"x\",\"a\":1}\n{\"b\":\"x\"\n{\"a\":2}\n"), "a long long");
    EXPECT_EQ(Cells("1,2\nx,y,z\n3,4\n"), "a long long, b long long");
}

TEST(Inference, SeveralInputsAreOne) {
    Inference Seen;
    Learn(Seen, "[{\"a\":1}]");
    Learn(Seen, "[{\"b\":1,\"a\":1.5}]");
    EXPECT_EQ(Text(Seen), "a double, b long long");
    EXPECT_EQ(Seen.Records(), 2);
    Learn(Seen, "a\nx\n");
    EXPECT_EQ(Text(Seen), "a any, b long long\nmember \"a\": values of several kinds");
}

}  // namespace

}  // namespace VORN_JSON_DB::Cli
