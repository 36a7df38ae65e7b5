// JSON and JSON Lines: what is read, and what hostile input is told.

#include <gtest/gtest.h>

#include "PrintedRecords.h"

namespace VORN_JSON_DB::Cli {

namespace {

using namespace std::string_literals;

std::string Json(const std::string& strText) {
    return ReadAll(strText, ReadOptions());
}

std::string Lines(const std::string& strText) {
    ReadOptions How;
    How.eFormat = Format::kJsonLines;
    return ReadAll(strText, How);
}

struct ReaderCase {
    std::string strText;
    std::string strRead;
};

TEST(JsonReader, ValuesOfEachKind) {
    EXPECT_EQ(
        Json("[{\"a\": 1, \"b\": -2.5, \"c\": true, \"d\": false, \"e\": null, \"f\": \"x\"}]"),
        "1@1: a=1 b=real -2.5 c=true d=false e=null f='x'\n");
    EXPECT_EQ(Json("[{\"a\": {\"b\": [1, \"c\\\"\\u0001\", {}], \"d\": null, \"e\": true}, "
                   "\"f\": [], \"g\": [[1.50, -0], [false]]}]"),
              "1@1: a={\"b\":[1,\"c\\\"\\u0001\",{}],\"d\":null,\"e\":true} f=[] "
              "g=[[1.50,-0],[false]]\n");
    EXPECT_EQ(Json("[{\"\": \"\", \"caf\\u00e9\": \"\\ud83d\\ude00\\n\\/\"}]"),
              "1@1: ='' café='\U0001F600\n/'\n");
    EXPECT_EQ(Json("[{\"a\": \"x\\u0000y\"}]"), "1@1: a='x\0y'\n"s);
}

TEST(JsonReader, NumbersAreExact) {
    EXPECT_EQ(Json("[{\"a\": 9223372036854775807, \"b\": -9223372036854775808, "
                   "\"c\": 9223372036854775808, \"d\": -0, \"e\": 0.1, \"f\": 5e-324, "
                   "\"g\": 1E2, \"h\": 1e-400, \"i\": 123456789012345678901234567890}]"),
              "1@1: a=9223372036854775807 b=-9223372036854775808 c=wide 9223372036854775808 "
              "d=real -0 e=real 0.10000000000000001 f=real 4.9406564584124654e-324 g=real 100 "
              "h=wide 1e-400 i=wide 123456789012345678901234567890\n");
}

TEST(JsonReader, ListsObjectsOneAfterAnotherAndAListInAnObject) {
    EXPECT_EQ(Json("[{\"a\":1},\n\n{\"b\":2,\"a\":3}\n]\n"), "1@1: a=1\n2@3: b=2 a=3\n");
    EXPECT_EQ(Json("{\"a\":1}\n{\n\"a\":2\n} {\"a\":3}"), "1@1: a=1\n2@2: a=2\n3@4: a=3\n");
    EXPECT_EQ(Json("{\"x\": [\n{\"a\":1},\n{\"a\":[{}]}\n]}"), "1@2: a=1\n2@3: a=[{}]\n[x]\n");
    EXPECT_EQ(Json("{\"x\": [1, {\"a\": 2}]}"), "1@1: x=[1,{\"a\":2}]\n");
    EXPECT_EQ(Json("{\"x\": []}"), "1@1: x=[]\n");
    EXPECT_EQ(Json("{\"id\": 1, \"x\": [{\"a\": 2}]}"), "1@1: id=1 x=[{\"a\":2}]\n");
    EXPECT_EQ(Json("{\"x\": {\"y\": [{\"a\": 2}]}}"), "1@1: x={\"y\":[{\"a\":2}]}\n");
    EXPECT_EQ(Json("{\"x\": [[{\"a\": 2}]]}"), "1@1: x=[[{\"a\":2}]]\n");
    EXPECT_EQ(Json("[]"), "");
    EXPECT_EQ(Json(" \n"), "");
    EXPECT_EQ(Json("[{}]"), "1@1:\n");
    EXPECT_EQ(Json("\xEF\xBB\xBF[{\"a\":1}]"), "1@1: a=1\n");
}

TEST(JsonReader, WhatIsWrongWithOneRecordHarmsNoOther) {
    EXPECT_EQ(Json("[1,\n{\"a\":1},\n[2,{\"b\":[]}],\nnull,\n\"x\",\ntrue,\n{\"a\":2,\"a\":3},"
                   "\n{\"a\":4}]"),
              "1@1: bad: the record is a number, not an object\n"
              "2@2: a=1\n"
              "3@3: bad: the record is a list, not an object\n"
              "4@4: bad: the record is null, not an object\n"
              "5@5: bad: the record is a text, not an object\n"
              "6@6: bad: the record is true, not an object\n"
              "7@7: bad: the member \"a\" is there twice\n"
              "8@8: a=4\n");
    EXPECT_EQ(Json("1 {\"x\": [{\"a\": 2}]}"),
              "1@1: bad: the record is a number, not an object\n"
              "2@1: x=[{\"a\":2}]\n");
    EXPECT_EQ(
        Json("[{\"a\":\"\\udc00\"},{\"\\udfff\":1},{\"a\":[\"\\udc00\"]},{\"a\":\"\\ud7ff\"}]"),
        "1@1: bad: \\u gives half of a surrogate pair\n"
        "2@1: bad: \\u gives half of a surrogate pair\n"
        "3@1: bad: \\u gives half of a surrogate pair\n"
        "4@1: a='\xED\x9F\xBF'\n");
}

TEST(JsonReader, AfterBrokenJsonThereIsNoWayOn) {
    const std::string strDeep(100000, '[');
    const std::string strUtf8 = "a text is no UTF-8; convert the input with iconv";
    const ReaderCase aCases[] = {
        {"[{\"a\":1},\n{\"a\" 2}]",
         "1@1: a=1\nfailed in line 2: a colon is missing after a member's name\n"},
        {"[{\"a\":1}\n{\"a\":2}]",
         "1@1: a=1\nfailed in line 2: a comma or ] is missing after an element\n"},
        {"[{\"a\":1 \"b\":2}]", "failed in line 1: a comma or } is missing after a member\n"},
        {"[{\"a\":1},]", "1@1: a=1\nfailed in line 1: no value can begin like this\n"},
        {"[{\"a\":1,}]", "failed in line 1: a member's name in quotes is missing\n"},
        {"[{a:1}]", "failed in line 1: a member's name in quotes is missing\n"},
        {"[{1:1}]", "failed in line 1: a member's name in quotes is missing\n"},
        {"[{\"a\":01}]", "failed in line 1: a comma or } is missing after a member\n"},
        {"[{\"a\":-}]", "failed in line 1: no value can begin like this\n"},
        {"[{\"a\":+1}]", "failed in line 1: no value can begin like this\n"},
        {"[{\"a\":.5}]", "failed in line 1: no value can begin like this\n"},
        {"[{\"a\":1.}]", "failed in line 1: a number has no digit after the point\n"},
        {"[{\"a\":1e}]", "failed in line 1: a number has no digit in the exponent\n"},
        {"[{\"a\":1e400}]", "failed in line 1: a number is greater than any double\n"},
        {"[{\"a\":" + std::string(400, '1') + "}]",
         "failed in line 1: a number is greater than any double\n"},
        {"[{\"a\":NaN}]", "failed in line 1: no value can begin like this\n"},
        {"[{\"a\":'x'}]", "failed in line 1: no value can begin like this\n"},
        {"[{\"a\":\"\\x\"}]",
         "failed in line 1: a text has an escape that JSON has not, or a "
         "control character that must be escaped\n"},
        {"[{\"a\":\"\\u12G4\"}]", "failed in line 1: \\u needs four hexadecimal digits\n"},
        {"[{\"a\":\"\\ud800\"}]", "failed in line 1: \\u gives half of a surrogate pair\n"},
        {"[{\"a\":\"\xC0\xAF\"}]", "failed in line 1: " + strUtf8 + "\n"},
        {"[{\"a\":\"\xED\xA0\x80\"}]", "failed in line 1: " + strUtf8 + "\n"},
        {"[{\"a\":\"\xF4\x90\x80\x80\"}]", "failed in line 1: " + strUtf8 + "\n"},
        {"[{\"a\":\"\xE9\"}]", "failed in line 1: " + strUtf8 + "\n"},
        {"[{\"a\":1}]\n[{\"a\":2}]", "1@1: a=1\nfailed in line 2: something follows the list\n"},
        {"[{\"a\":1}]\n\0"s, "1@1: a=1\nfailed in line 2: there is a NUL byte\n"},
        {"[{\"a\":1},\0{\"a\":2}]"s, "1@1: a=1\nfailed in line 1: there is a NUL byte\n"},
        {"{\"x\":[{\"a\":1}],\n\"b\":2}",
         "1@1: a=1\n[x]\nfailed in line 2: the object has the member \"b\" beside the "
         "list \"x\"; take the list out of it, or use --format jsonl\n"},
        {"\xFF\xFE[\0"s,
         "failed in line 1: the input is UTF-16; convert it with iconv -f UTF-16 -t UTF-8\n"},
        {strDeep, "failed in line 1: lists and objects are nested more than 1000 levels deep\n"},
        {"[{\"a\":" + strDeep,
         "failed in line 1: lists and objects are nested more than 1000 levels deep\n"},
    };
    for (const ReaderCase& Each : aCases) {
        EXPECT_EQ(Json(Each.strText), Each.strRead) << Each.strText.substr(0, 100);
    }
}

TEST(JsonReader, ACutInputSaysWhere) {
    const std::string strAll = "[{\"a\":1},\n{\"a\":\"x\xC3\xA9\",\"b\":[true]}]";
    for (size_t nCut = 1; nCut < strAll.size(); ++nCut) {
        const std::string strFirst = nCut >= 8 ? "1@1: a=1\n" : "";
        const std::string strSecond =
            nCut > strAll.size() - 2 ? "2@2: a='x\xC3\xA9' b=[true]\n" : "";
        std::string strWhere = nCut < 10 ? "line 1: " : "line 2: ";
        if (nCut < 2 || nCut == 8 || nCut == 9 || nCut == 10 || nCut == strAll.size() - 1) {
            strWhere += "the input ends inside of the list, after record " +
                        std::to_string(nCut < 2    ? 0
                                       : nCut < 12 ? 1
                                                   : 2);
        } else {
            strWhere += std::string("the input ends inside of record ") + (nCut < 8 ? "1" : "2");
        }
        EXPECT_EQ(Json(strAll.substr(0, nCut)),
                  strFirst + strSecond + "failed in " + strWhere + "\n")
            << strAll.substr(0, nCut);
    }
}

TEST(JsonReader, RecordsAcrossBlocksAreWhole) {
    std::string strText = "[";
    std::string strRead;
    for (int i = 1; i <= 3000; ++i) {
        const std::string strValue(static_cast<size_t>(i % 131), 'v');
        strText +=
            (i > 1 ? ",\n" : "") + ("{\"n\":" + std::to_string(i)) + ",\"s\":\"" + strValue + "\"}";
        strRead += std::to_string(i) + "@" + std::to_string(i) + ": n=" + std::to_string(i) +
                   " s='" + strValue + "' <{\"n\":" + std::to_string(i) + ",\"s\":\"" + strValue +
                   "\"}>\n";
    }
    ReadOptions How;
    How.blKeepText = true;
    EXPECT_EQ(ReadAll(strText + "]", How), strRead);
}

TEST(JsonReader, TooLongRecordsAreRefused) {
    const std::string strLong(kMostRecordBytes + 70000, 'x');
    EXPECT_EQ(Json("[{\"a\":1},{\"a\":\"" + strLong + "\"}]"),
              "1@1: a=1\nfailed in line 1: record 2 is longer than 16777216 bytes\n");
    EXPECT_EQ(Lines("{\"a\":1}\n{\"a\":\"" + strLong + "\"}\n{\"a\":3}"),
              "1@1: a=1\n2@2: bad: the line is longer than 16777216 bytes\n3@3: a=3\n");
}

TEST(JsonReader, OneLargeObjectIsNoList) {
    const std::string strLarge = "{\"data\": {\"x\": \"" + std::string(70000, 'x') + "\"}}";
    const std::string strRead = Json(strLarge);
    EXPECT_EQ(strRead.substr(strRead.rfind("failed")),
              "failed in line 1: the input is one large object, and no list of records; take the "
              "list out of it, or put it on one line and use --format jsonl\n");
    EXPECT_EQ(Json(strLarge + "{\"data\":1}").find("failed"), std::string::npos);
}

TEST(JsonReader, TheSinkEndsIt) {
    PrintedRecords To;
    To.nStopAfter = 1;
    EXPECT_EQ(ReadAll("[{\"a\":1},{\"a\":2},", ReadOptions(), To), "1@1: a=1\nstopped\n");
    PrintedRecords Strict;
    Strict.blGoOnAfterBad = false;
    EXPECT_EQ(ReadAll("[5,{\"a\":2}]", ReadOptions(), Strict),
              "1@1: bad: the record is a number, not an object\nstopped\n");
}

TEST(JsonLinesReader, BadLinesHarmNoOther) {
    EXPECT_EQ(Lines("{\"a\":1}\n\n  \r\n{\"a\":\n{\"a\":2}\r\n{\"a\":3} {\"a\":4}\n[5]\n6\n"
                    "{\"a\":7}x\n{\"b\":\"\xE9\"}\n{\"a\":8,\"a\":8}\n{\"a\":1e400}\n{\"c\":"
                    "\"\\n\\u00e9\"}"),
              "1@1: a=1\n"
              "2@4: bad: the line ends inside of the record\n"
              "3@5: a=2\n"
              "4@6: a=3\n"
              "5@6: a=4\n"
              "6@7: bad: the record is a list, not an object\n"
              "7@8: bad: the record is a number, not an object\n"
              "8@9: a=7\n"
              "9@9: bad: no value can begin like this\n"
              "10@10: bad: a text is no UTF-8; convert the input with iconv\n"
              "11@11: bad: the member \"a\" is there twice\n"
              "12@12: bad: a number is greater than any double\n"
              "13@13: c='\n\xC3\xA9'\n");
    EXPECT_EQ(Lines("{\"a\":1}\0{\"a\":2}\n{\"a\":3}"s),
              "1@1: bad: there is a NUL byte\n2@2: a=3\n");
    EXPECT_EQ(Lines("{\"a\":" + std::string(100000, '[') + "\n{\"a\":3}"),
              "1@1: bad: lists and objects are nested more than 1000 levels deep\n2@2: a=3\n");
}

// The bytes that a sequence of UTF-8 lacks are not taken from the next line.
TEST(JsonLinesReader, ASequenceCutByTheLinesEndHarmsNoOtherLine) {
    for (const char* szCut : {"\xC3", "\xE6\xBC", "\xF2", "\xF2\x80", "\xF2\x80\x80"}) {
        EXPECT_EQ(Lines("{\"a\":\"\\\\" + std::string(szCut) + "\n{\"b\":1}"),
                  "1@1: bad: a text is no UTF-8; convert the input with iconv\n2@2: b=1\n");
    }
}

// Texts are read in steps of several bytes: what is wrong is found at each place of a step.
TEST(JsonLinesReader, ABadByteIsFoundAtEachPlaceOfAText) {
    const std::string strControl =
        "a text has an escape that JSON has not, or a control character that must be escaped";
    const std::string strUtf8 = "a text is no UTF-8; convert the input with iconv";
    for (size_t nPlace = 0; nPlace < 40; ++nPlace) {
        // One input for all bytes: each run of the reader has buffers of its own to fill.
        std::string strInput;
        std::string strExpected;
        int nLine = 0;
        for (int nByte = 1; nByte < 256; ++nByte) {
            if (nByte == '\n' || nByte == '"' || nByte == '\\') {
                continue;
            }
            const std::string strText =
                std::string(nPlace, 'x') + static_cast<char>(nByte) + std::string(20, 'y');
            const std::string strWrong = nByte < ' ' ? strControl : strUtf8;
            const bool blWrong = nByte < ' ' || nByte >= 0x80;
            const std::string strLine = std::to_string(++nLine);
            strInput += "{\"a\":\"" + strText + "\"}\n";
            strExpected += strLine + "@" + strLine;
            strExpected += blWrong ? ": bad: " + strWrong + "\n" : ": a='" + strText + "'\n";
        }
        ASSERT_EQ(Lines(strInput), strExpected) << nPlace;
    }
}

TEST(JsonLinesReader, EscapesAndCharactersOfSeveralBytesAtEachPlaceOfAText) {
    for (size_t nPlace = 0; nPlace < 40; ++nPlace) {
        const std::string strBefore(nPlace, 'x');
        const auto fnRead = [&](const std::string& strInside) {
            return Lines("{\"a\":\"" + strBefore + strInside + "y\"}\n{\"b\":1}");
        };
        const std::string strRead = "1@1: a='" + strBefore;
        const std::string strAfter = "0123456789 caf\xC3\xA9 0123456789 ";
        EXPECT_EQ(fnRead("\\u0041\\n\\\""), strRead + "A\n\"y'\n2@2: b=1\n");
        EXPECT_EQ(fnRead("\xC3\xA9\xE2\x82\xAC"), strRead + "\xC3\xA9\xE2\x82\xACy'\n2@2: b=1\n");
        EXPECT_EQ(fnRead("\\t" + strAfter + "\\/" + strAfter),
                  strRead + "\t" + strAfter + "/" + strAfter + "y'\n2@2: b=1\n");
        EXPECT_EQ(fnRead("\\ud83d\\ude00"), strRead + "\xF0\x9F\x98\x80y'\n2@2: b=1\n");
        EXPECT_EQ(fnRead("\\udc00"), "1@1: bad: \\u gives half of a surrogate pair\n2@2: b=1\n");
    }
}

// With an escape in the line, and without.
TEST(JsonLinesReader, TextsInListsAndObjects) {
    EXPECT_EQ(Lines("{\"a\":[\"x\", \"it's / caf\xC3\xA9\x7F\", \"\"], \"b\":{\"c\": \"d\"}}\n"
                    "{\"a\":[\"x\", \"\\\"\\\\\\u0001\\/\"], \"b\":{\"\\u0063\": \"d\"}}"),
              "1@1: a=[\"x\",\"it's / caf\xC3\xA9\x7F\",\"\"] b={\"c\":\"d\"}\n"
              "2@2: a=[\"x\",\"\\\"\\\\\\u0001/\"] b={\"c\":\"d\"}\n");
}

TEST(JsonLinesReader, CutLinesSayThatTheyEnd) {
    const std::string strLine = "{\"a\":\"x\xF0\x9F\x98\x80\",\"b\":[true]}";
    for (size_t nCut = 1; nCut < strLine.size(); ++nCut) {
        const bool blInCharacter = nCut > 7 && nCut < 11;
        EXPECT_EQ(Lines(strLine.substr(0, nCut) + "\n{\"c\":1}"),
                  std::string("1@1: bad: ") +
                      (blInCharacter ? "a text is no UTF-8; convert the input with iconv"
                                     : "the line ends inside of the record") +
                      "\n2@2: c=1\n")
            << strLine.substr(0, nCut);
    }
}

TEST(JsonLinesReader, TheTextOfALineIsKept) {
    ReadOptions How;
    How.eFormat = Format::kJsonLines;
    How.blKeepText = true;
    EXPECT_EQ(ReadAll("{\"a\":\"\\u0041\"}\n{x}\n", How),
              "1@1: a='A' <{\"a\":\"\\u0041\"}>\n"
              "2@2: bad: a member's name in quotes is missing <{x}>\n");
}

TEST(JsonLinesReader, LinesAcrossBlocksAreWhole) {
    std::string strText;
    std::string strRead;
    for (int i = 1; i <= 3000; ++i) {
        const std::string strValue(static_cast<size_t>(i % 257), 'v');
        strText += "{\"n\":" + std::to_string(i) + ",\"s\":\"" + strValue + "\"}\n";
        strRead += std::to_string(i) + "@" + std::to_string(i) + ": n=" + std::to_string(i) +
                   " s='" + strValue + "'\n";
    }
    EXPECT_EQ(Lines(strText), strRead);
}

}  // namespace

}  // namespace VORN_JSON_DB::Cli
