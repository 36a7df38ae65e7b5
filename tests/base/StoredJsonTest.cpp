// Texts in a JSON column: whatever shortcut reads the usual ones, the result is that of JsonCpp's
// reader, for texts that are well-formed, almost so, and not at all.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

class StoredJson : public TableTest {
  protected:
    void SetUp() override {
        TableTest::SetUp();
        Open("a:Json::arrayValue");
    }

    void ExpectAsTheReader(std::initializer_list<const char*> listTexts) {
        for (const char* szText : listTexts) {
            SCOPED_TRACE(szText);
            char* szSql = sqlite3_mprintf("DELETE FROM t; INSERT INTO t VALUES (%Q)", szText);
            Sql(szSql);
            sqlite3_free(szSql);
            const Json::Value jRead = Listed()[0]["a"];
            const Json::Value jExpected = ReadLeniently(szText);
            EXPECT_EQ(Compact(jRead), Compact(jExpected));
            EXPECT_EQ(KindsOf(jRead), KindsOf(jExpected));
        }
    }
};

// clang-format off
TEST_F(StoredJson, WrongSeparatorIsNoSeparator) {
    ExpectAsTheReader({
        "[1x2]", "[1 2]", "[1;2]", "{\"a\"x1}", "{\"a\":1x\"b\":2}", "[1,2x", "{\"a\":1x",
        "{\"a\"1}", "[1[2],]", "[1x"});
}

TEST_F(StoredJson, BlanksAreNoPartOfTheValue) {
    ExpectAsTheReader({
        " {\"a\":1}", "{\"a\":1}\n", "\t[1]\r\n", "[ ]", "{ }", "[1 ,2]", "{\"a\" : 1}",
        " {\n \"a\" :\t[ 1 , 2 ] } \n"});
}

TEST_F(StoredJson, MissingPartIsNotMadeUp) {
    ExpectAsTheReader({
        "[,]", "[1,]", "[-]", "-", "", "{,}", "{\"a\":}", "{\"a\":,\"b\":1}", "{\"a\"}"});
}

TEST_F(StoredJson, MemberNameNeedsItsQuotes) {
    ExpectAsTheReader({"{xa\":1}", "{a:1}", "{'a':1}", "{\"a:1}", "{1:1}"});
}

TEST_F(StoredJson, WordsAreTakenWholeOnly) {
    ExpectAsTheReader({
        "[tsue]", "[trud]", "[tru]", "[falsf]", "[nulm]", "[xrue]", "[truex]", "[nul", "true",
        "false", "null", "[null,true,false,\"x\",-1,1.5]", "{\"t\":true,\"f\":false,\"n\":null}"});
}

TEST_F(StoredJson, NumbersKeepValueAndKind) {
    ExpectAsTheReader({
        "0", "-0", "7", "-7", "[0]", "[-0]", "[00]", "[01]", "[-01]", "[10]", "[1-]", "1.0", "-1.5",
        "1e3", "1E-3", "0.1", "-0.0", "[1.5]", "[1e2]", "123456789012345678", "1234567890123456789",
        "-123456789012345678", "-1234567890123456789", "[2147483648]", "[4294967296]",
        "[999999999999999999]", "[1000000000000000000]", "[-999999999999999999]",
        "9223372036854775807", "9223372036854775808", "-9223372036854775808",
        "-9223372036854775809", "18446744073709551615", "18446744073709551616"});
}

TEST_F(StoredJson, TextsKeepEscapesAndControlCharacters) {
    ExpectAsTheReader({
        "\"\"", "\"a\"", "\"\\u0041\"", "\"\\u00e9\\ud83d\\ude00\"", "\"\xC3\xA9\"", "\"\\\\\"",
        "\"\\\"\"", "\"tr\\/ue\"", "[\"a\\n\\u00e9\\\"b\"]", "[\"a\tb\"]", "[\"a\x1f\"]", "[\"\x7f\"]",
        "[\"it's\"]", "[\"", "[\"\\", "{\"a\\u0062\":1}", "{\"\":1}", "{\"\xC3\xBC\":\"\xE2\x82\xAC\"}"});
}

TEST_F(StoredJson, OfTwinKeysTheLastWins) {
    ExpectAsTheReader({
        "{\"a\":1,\"a\":2}", "{\"a\":{\"b\":1},\"a\":{\"c\":2}}", "{\"a\":[1],\"a\":3}"});
}

TEST_F(StoredJson, NestingIsReadOnEitherSideOfTheShortcut) {
    ExpectAsTheReader({
        "[]", "{}", "[[],{}]", "[[[[[[[1]]]]]]]", "[[[[[[[[1]]]]]]]]", "[[[[[[[[[1]]]]]]]]]",
        "[[[[[[[[[[1]]]]]]]]]]", "[[[[[[[[[[[[]]]]]]]]]]]]",
        "{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":1}}}}}}}}}",
        "[[],{},[[]],{\"a\":[]}]", "{\"b\":1,\"a\":[{\"c\":\"d\"}]}", "[[1}]", "{\"a\":[1}"});
}
// clang-format on

}  // namespace
