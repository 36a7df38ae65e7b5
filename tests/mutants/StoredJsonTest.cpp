// JSON columns that are almost well-formed: whatever shortcut reads the usual text, the result is
// that of JsonCpp's reader.
#include <memory>

#include "../support/TableFixture.h"

using namespace testhost;

namespace {

class StoredJson : public DbTest {
  protected:
    // What recList makes of the text under the type "Json::arrayValue".
    Json::Value Read(const std::string& strText) {
        const std::string strTable = UniqueTable();
        const auto pHandle = NewHandle(m_pDb, strTable, Definition(strTable, "a:Json::arrayValue"),
                                       "CREATE TABLE " + strTable + " (a)");
        std::string strQuoted;
        for (const char c : strText) {
            strQuoted += c == '\'' ? "''" : std::string(1, c);
        }
        Sql("INSERT INTO " + strTable + " VALUES ('" + strQuoted + "')");
        Json::Value jNoQuery;
        Json::Value jRows;
        EXPECT_EQ(pHandle->recList(jNoQuery, jRows), 0);
        EXPECT_EQ(jRows.size(), 1U);
        return jRows[0]["a"];
    }

    void ExpectAsTheReader(std::initializer_list<const char*> listTexts) {
        for (const char* szText : listTexts) {
            const Json::Value jExpected = ReadLeniently(szText);
            const Json::Value jRead = Read(szText);
            EXPECT_EQ(Compact(jRead), Compact(jExpected)) << szText;
            EXPECT_EQ(jRead.type(), jExpected.type()) << szText;
        }
    }
};

TEST_F(StoredJson, WrongSeparatorIsNoSeparator) {
    ExpectAsTheReader({"[1x2]", "[1 2]", "[1;2]", "{\"a\"x1}", "{\"a\":1x\"b\":2}", "[1,2x",
                       "{\"a\":1x", "{\"a\"1}", "[1[2],]", "[1x"});
}

TEST_F(StoredJson, MissingPartIsNotMadeUp) {
    ExpectAsTheReader(
        {"[,]", "[1,]", "[-]", "-", "", "{,}", "{\"a\":}", "{\"a\":,\"b\":1}", "{\"a\"}"});
}

TEST_F(StoredJson, MemberNameNeedsItsQuotes) {
    ExpectAsTheReader({"{xa\":1}", "{a:1}", "{'a':1}", "{\"a:1}", "{1:1}"});
}

TEST_F(StoredJson, WordsAreTakenWholeOnly) {
    ExpectAsTheReader(
        {"[tsue]", "[trud]", "[tru]", "[falsf]", "[nulm]", "[xrue]", "[truex]", "true", "[nul"});
}

TEST_F(StoredJson, NumbersKeepValueAndKind) {
    ExpectAsTheReader({"[0]",
                       "[-0]",
                       "[00]",
                       "[01]",
                       "[-01]",
                       "[7]",
                       "[-7]",
                       "[10]",
                       "[1.5]",
                       "[1e2]",
                       "[1-]",
                       "[999999999999999999]",
                       "[1000000000000000000]",
                       "[-999999999999999999]",
                       "[9223372036854775807]",
                       "[9223372036854775808]",
                       "[18446744073709551616]",
                       "[-9223372036854775808]",
                       "[-9223372036854775809]",
                       "[2147483648]",
                       "[4294967296]"});
}

TEST_F(StoredJson, TextsKeepEscapesAndControlCharacters) {
    ExpectAsTheReader({"[\"a\\n\\u00e9\\\"b\"]", "[\"a\tb\"]", "[\"a\x1f\"]", "[\"\x7f\"]",
                       "[\"it's\"]", "[\"", "[\"\\", "{\"a\\u0062\":1}", "{\"\":1}",
                       "{\"a\":1,\"a\":2}", "[\"\xc3\xa9\"]"});
}

TEST_F(StoredJson, NestingIsReadOnEitherSideOfTheShortcut) {
    ExpectAsTheReader({"[[[[[[[1]]]]]]]", "[[[[[[[[1]]]]]]]]", "[[[[[[[[[1]]]]]]]]]",
                       "[[[[[[[[[[1]]]]]]]]]]",
                       "{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":{\"a\":1}}}}}}}}}",
                       "[[],{},[[]],{\"a\":[]}]", "[[1}]", "{\"a\":[1}"});
}

TEST_F(StoredJson, WrittenTextIsThatOfTheWriterWhateverNeedsEscaping) {
    const std::string strTable = UniqueTable();
    const auto pHandle = NewHandle(m_pDb, strTable, Definition(strTable, "a:Json::objectValue"),
                                   "CREATE TABLE " + strTable + " (a)");
    for (const char* szText :
         {R"({"k":1})", R"({"k\"q":1,"l":2})", R"({"k":{"n\\":[1,"x"]},"l":2})", R"({"k":"a\nb"})",
          R"({"k":["a\tb",{"":null}],"l":[]})",
          R"({"k":[[],{},true,false,-1,18446744073709551615]})"}) {
        Json::Value jRecord;
        jRecord["a"] = ParseJson(szText);
        EXPECT_EQ(pHandle->recSave(jRecord, true), 0);
        EXPECT_EQ(Rows("SELECT a FROM " + strTable), Compact(ParseJson(szText))) << szText;
        Sql("DELETE FROM " + strTable);
    }
}

}  // namespace
