// CSV and TSV.

#include <gtest/gtest.h>

#include "PrintedRecords.h"

namespace VORN_JSON_DB::Cli {

namespace {

using namespace std::string_literals;

ReadOptions Separated(char cDelimiter = ',') {
    ReadOptions How;
    How.eFormat = Format::kSeparated;
    How.cDelimiter = cDelimiter;
    return How;
}

std::string Csv(const std::string& strText) {
    return ReadAll(strText, Separated());
}

TEST(SeparatedReader, CellsAreTextsAndABareEmptyOneIsNull) {
    EXPECT_EQ(Csv("a,b,c\n1, x ,\n\"\",\"y\"\"z\",007\n"),
              "1@2: a='1' b=' x ' c=null\n2@3: a='' b='y\"z' c='007'\n");
    ReadOptions How = Separated();
    How.blEmptyIsText = true;
    EXPECT_EQ(ReadAll("a,b\n,1\n", How), "1@2: a='' b='1'\n");
    EXPECT_EQ(Csv("a\nx\0y\n"s), "1@2: a='x\0y'\n"s);
    EXPECT_EQ(Csv(""), "");
    EXPECT_EQ(Csv("a,b\n"), "");
}

TEST(SeparatedReader, LinesAreCountedThroughQuotesAndBlankLines) {
    EXPECT_EQ(Csv("a,b\r\n1,\"x\r\ny\"\r\n\r\n2,\"\n\n\"\r\n3,z"),
              "1@2: a='1' b='x\r\ny'\n2@5: a='2' b='\n\n'\n3@8: a='3' b='z'\n");
    EXPECT_EQ(Csv("a\r1\r2\r"), "1@2: a='1'\n2@3: a='2'\n");
}

TEST(SeparatedReader, ALineThatTellsTheDelimiterIsNoHeader) {
    EXPECT_EQ(ReadAll("\xEF\xBB\xBFsep=;\r\na;b\r\n1;2\r\n", Separated(';')), "1@3: a='1' b='2'\n");
    const std::string strNoName =
        ": column 2 has no name; --no-header is for input without names\n";
    EXPECT_EQ(Csv("\nsep=,\na,b\n"), "failed in line 2" + strNoName);
    EXPECT_EQ(Csv("sep=,\nsep=,\na,b\n"), "failed in line 2" + strNoName);
    EXPECT_EQ(Csv("seq=,\na,b\n"), "failed in line 1" + strNoName);
    EXPECT_EQ(Csv("sep=,b\n1,2\n"), "1@2: sep=='1' b='2'\n");
    EXPECT_EQ(Csv("sep=\n1\n"), "1@2: sep=='1'\n");
    ReadOptions How = Separated(';');
    How.blHeader = false;
    EXPECT_EQ(ReadAll("sep=;\n1;2\n", How), "1@2: c1='1' c2='2'\n");
}

TEST(SeparatedReader, TheMarkIsTakenOff) {
    EXPECT_EQ(Csv("\xEF\xBB\xBF\"a\",b\n1,2\n"), "1@2: a='1' b='2'\n");
    EXPECT_EQ(Csv("\xFE\xFF\0a"s),
              "failed in line 1: the input is UTF-16; convert it with iconv -f UTF-16 -t UTF-8\n");
}

TEST(SeparatedReader, RowsThatAreTooShortOrTooLongAreBad) {
    EXPECT_EQ(Csv("a,b\n1\n1,2\n1,2,3\n\"x\ny\"\n4,5\n"),
              "1@2: bad: the row has 1 cell, but there are 2 columns\n"
              "2@3: a='1' b='2'\n"
              "3@4: bad: the row has 3 cells, but there are 2 columns\n"
              "4@5: bad: the row has 1 cell, but there are 2 columns\n"
              "5@7: a='4' b='5'\n");
}

TEST(SeparatedReader, HeadersThatNameNoColumnsAreRefused) {
    EXPECT_EQ(Csv("a,,b\n1,2,3\n"),
              "failed in line 1: column 2 has no name; --no-header is for input "
              "without names\n");
    EXPECT_EQ(Csv("a,b,A\n1,2,3\n"),
              "failed in line 1: columns 1 and 3 have the same name \"A\"; letter case makes no "
              "difference\n");
    EXPECT_EQ(Csv("a,b\xE9\n1,2\n"),
              "failed in line 1: the name of column 2: byte 0xE9 is no UTF-8; convert the input "
              "with iconv\n");
}

TEST(SeparatedReader, BytesThatAreNoTextAreBad) {
    EXPECT_EQ(Csv("a,b\n1,caf\xE9\n2,caf\xC3\xA9\n3,\xED\xA0\x80\n4,\xC0\xAF\n5,\xF4\x90\x80\x80\n"
                  "6,\xF0\x9F\x98\n7,abcdefgh\xF0\x9F\x98\x80\n"),
              "1@2: bad: member \"b\": byte 0xE9 is no UTF-8; convert the input with iconv\n"
              "2@3: a='2' b='caf\xC3\xA9'\n"
              "3@4: bad: member \"b\": byte 0xED is no UTF-8; convert the input with iconv\n"
              "4@5: bad: member \"b\": byte 0xC0 is no UTF-8; convert the input with iconv\n"
              "5@6: bad: member \"b\": byte 0xF4 is no UTF-8; convert the input with iconv\n"
              "6@7: bad: member \"b\": byte 0xF0 is no UTF-8; convert the input with iconv\n"
              "7@8: a='7' b='abcdefgh\xF0\x9F\x98\x80'\n");
}

TEST(SeparatedReader, QuotesThatDoNotCloseAreRefused) {
    const std::string strInside =
        "a quote stands inside of a cell that is not in quotes, or a cell goes on after its end "
        "quote; double the quotes, or use --quote none\n";
    EXPECT_EQ(Csv("a,b\n1,\"x\"y\n2,z\n"), "failed in line 2: " + strInside);
    EXPECT_EQ(Csv("a,b\n1,x\n2,x\"y\"z\n"), "1@2: a='1' b='x'\nfailed in line 3: " + strInside);
    EXPECT_EQ(Csv("a,b\n1,x\n2,\"y\n3,z\n"),
              "1@2: a='1' b='x'\nfailed in line 3: the quotes that begin in this row never end\n");
    ReadOptions How = Separated('\t');
    How.blQuotes = false;
    EXPECT_EQ(ReadAll("a\tb\n1\tx\"y\"z\n\"\t\"\"\n", How),
              "1@2: a='1' b='x\"y\"z'\n2@3: a='\"' b='\"\"'\n");
}

TEST(SeparatedReader, ACellWithoutEndIsRefusedBeforeItFillsTheMemory) {
    EXPECT_EQ(Csv("a\n1\n\"" + std::string(kMostRecordBytes + 200000, 'x')),
              "1@2: a='1'\nfailed in line 3: a cell is longer than 16777216 bytes; do its quotes "
              "end?\n");
}

TEST(SeparatedReader, ColumnsWithoutAHeaderAreNumbered) {
    ReadOptions How = Separated(';');
    How.blHeader = false;
    EXPECT_EQ(ReadAll("x;\ny;2\nz\n", How),
              "1@1: c1='x' c2=null\n2@2: c1='y' c2='2'\n"
              "3@3: bad: the row has 1 cell, but there are 2 columns\n");
}

TEST(SeparatedReader, TheTextOfARowIsKept) {
    ReadOptions How = Separated();
    How.blKeepText = true;
    EXPECT_EQ(ReadAll("a,b\n1,\"x\ny\"\n2\n", How),
              "1@2: a='1' b='x\ny' <1,\"x\ny\"\n>\n"
              "2@4: bad: the row has 1 cell, but there are 2 columns <2\n>\n");
}

TEST(SeparatedReader, RowsAcrossBlocksAreWhole) {
    std::string strText = "n,s\r\n";
    std::string strRead;
    for (int i = 1; i <= 5000; ++i) {
        const std::string strValue(static_cast<size_t>(i % 131), 'v');
        strText += std::to_string(i) + ",\"" + strValue + "\r\n\"\r\n";
        strRead += std::to_string(i) + "@" + std::to_string(2 * i) + ": n='" + std::to_string(i) +
                   "' s='" + strValue + "\r\n'\n";
    }
    EXPECT_EQ(Csv(strText), strRead);
}

// The carriage return is the last byte of a block; the line feed, if there is one, is the next
// one's first.
TEST(SeparatedReader, ALinesEndAcrossBlocksIsWhole) {
    ReadOptions How = Separated();
    How.blKeepText = true;
    constexpr size_t kBlock = ByteSource::kBlock;
    for (const std::string strEnd : {"\r\n", "\r"}) {
        const std::string strHeader = "a\r\n";
        const std::string strFirst(kBlock - 1 - strHeader.size(), 'x');
        const std::string strSecond(kBlock - strEnd.size(), 'y');
        EXPECT_EQ(ReadAll(strHeader + strFirst + strEnd + strSecond + strEnd + "1,2\r", How),
                  "1@2: a='" + strFirst + "' <" + strFirst + strEnd + ">\n" +  //
                      "2@3: a='" + strSecond + "' <" + strSecond + strEnd + ">\n" +
                      "3@4: bad: the row has 2 cells, but there is 1 column <1,2\r>\n");
    }
}

TEST(SeparatedReader, TheSinkEndsIt) {
    PrintedRecords To;
    To.nStopAfter = 1;
    EXPECT_EQ(ReadAll("a\n1\n2\n\"x", Separated(), To), "1@2: a='1'\nstopped\n");
}

TEST(GuessFormat, TheFirstBytesTell) {
    struct Case {
        const char* szText;
        const char* szFormat;
    };
    const Case aCases[] = {
        {"", "JSON Lines"},
        {" \n ", "JSON Lines"},
        {"[{", "JSON"},
        {"\xEF\xBB\xBF \n [", "JSON"},
        {"{\"a\":1}", "JSON"},
        {"{\"a\":1}\n", "JSON"},
        {"{\"a\":1}\n{\"a\":2}", "JSON Lines"},
        {"{\"a\":\"}\"}\n{\"a\":2}", "JSON Lines"},
        {"{\"a\":\"\\\"{\"}\n{\"a\":2}", "JSON Lines"},
        {"{\n\"a\":1}\n{\"a\":2}", "JSON"},
        {"{\"x\": [{\n", "JSON"},
        {"a,b\n1,2\n", "CSV"},
        {"a\tb\n1\t2\n", "TSV"},
        {"a;b\n1,5;2\n2,5;3\n", "CSV with ;"},
        {"a|b,c|d\n1|2|3\n", "CSV with |"},
        {"a,b\n\"x;y;z\",2\n\"x;y\",2\n", "CSV"},
        {"a;b;c\n\"1;\n2\";3;4\n", "CSV with ;"},
        {"one\n1\n2\n", "CSV"},
        {"a;b;c\n1;2\n", "CSV with ;"},
        {"sep=;\r\na;b,c;d\n1;2,5;3\n", "CSV with ;"},
        {"sep=|\na,b\n1,2\n", "CSV with |"},
        {"sep=;a\n1,5;2\n", "CSV with ;"},
        {"sep=,;\n1;2\n", "CSV with ;"},
        {"sep=;", "CSV with ;"},
    };
    for (const Case& Each : aCases) {
        EXPECT_EQ(FormatText(GuessFormat(Each.szText)), Each.szFormat) << Each.szText;
    }
}

}  // namespace

}  // namespace VORN_JSON_DB::Cli
