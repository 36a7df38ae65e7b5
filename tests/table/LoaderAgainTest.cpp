// A loader binds anew only what the record before has not bound already: whatever comes after
// whatever, each record is stored as it was given.

#include <iterator>
#include <map>
#include <random>
#include <vector>

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

constexpr char kThings[] = R"({"thing": {"key": "id", "member": {
    "id": {"cpptype": "int"}, "list": {"cpptype": "Json::arrayValue"},
    "map": {"cpptype": "Json::objectValue"}, "on": {"cpptype": "bool"},
    "share": {"cpptype": "double"}, "size": {"cpptype": "long long"}, "text": {"cpptype": "string"}}}})";

constexpr char kSelect[] = "SELECT id, list, map, \"on\", share, size, text FROM thing ORDER BY id";

using Record = std::map<std::string, Json::Value>;  // without its key

class LoaderAgainTest : public TableTest {
  protected:
    LoaderAgainTest() {
        Options How;
        How.blCompatible = false;  // which takes numbers with fractions, too
        Open(kThings, How);
        // Few values, many of them alike, of one length or of none.
        m_Choices["list"] = Parse(R"([[1], [2], ["a"], ["b"], [0.5], [], null])");
        m_Choices["map"] = Parse(R"([{"a": 1}, {"b": 2}, {"b": 0.5}, {}, null])");
        m_Choices["on"] = Parse("[true, false, null]");
        m_Choices["share"] = Parse("[0.5, 0.25, null]");
        m_Choices["size"] = Parse("[0, 1, -1, null]");
        m_Choices["text"] = Parse(R"(["ab", "cd", "e", "", null])");
        for (const char c : {'x', 'y'}) {
            m_Choices["text"].append(std::string(64, c));
            m_Choices["text"].append(std::string(65, c));
        }
    }

    size_t Draw(size_t nMany) { return m_Random() % nMany; }

    Record AnyRecord() {
        Record Made;
        for (const auto& [strName, jValues] : m_Choices) {
            if (Draw(8) > 0) {
                Made[strName] = jValues[static_cast<Json::ArrayIndex>(Draw(jValues.size()))];
            }
        }
        return Made;
    }

    // One of three: as a value, by its setter, as JSON.
    static void Set(Loader& Into, const std::string& strName, const Json::Value& jValue,
                    bool blJson) {
        const int nMember = Into.MemberIndex(strName);
        if (blJson || jValue.isArray() || jValue.isObject()) {
            Into.SetJson(nMember, Text(jValue));
        } else if (jValue.isNull()) {
            Into.SetNull(nMember);
        } else if (jValue.isString()) {
            Into.SetText(nMember, jValue.asString());
        } else if (jValue.isBool()) {
            Into.SetBoolean(nMember, jValue.asBool());
        } else if (jValue.isInt64()) {
            Into.SetInteger(nMember, jValue.asInt64());
        } else {
            Into.SetReal(nMember, jValue.asDouble());
        }
    }

    std::string Load(Loader& Into, int nId, const Record& Given) {
        if (Draw(3) == 0) {
            Json::Value jRecord;
            jRecord["id"] = nId;
            for (const auto& [strName, jValue] : Given) {
                jRecord[strName] = jValue;
            }
            return Text(Into.Add(jRecord));
        }
        Into.SetInteger(Into.MemberIndex("id"), nId);
        for (const auto& [strName, jValue] : Given) {
            Set(Into, strName, jValue, Draw(3) == 0);
        }
        return Text(Into.EndRecord());
    }

    static std::string Column(const Json::Value& jValue) {
        if (jValue.isBool()) {
            return jValue.asBool() ? "1" : "0";
        }
        return jValue.isNull() ? "NULL" : jValue.isString() ? jValue.asString() : Text(jValue);
    }

    // As Rows shows them.
    std::string Expected(const std::map<int, Record>& Stored) {
        std::string strRows;
        for (const auto& [nId, Given] : Stored) {
            strRows += (strRows.empty() ? "" : ";") + std::to_string(nId);
            for (const auto& Each : m_Choices) {
                const auto itValue = Given.find(Each.first);
                strRows += "|" + (itValue == Given.end() ? "NULL" : Column(itValue->second));
            }
        }
        return strRows;
    }

    std::map<std::string, Json::Value> m_Choices;
    std::mt19937 m_Random;  // seeded with its own default: the same records each time
};

TEST_F(LoaderAgainTest, RecordsAreStoredAsTheyWereGiven) {
    Loader Into;
    EXPECT_EQ(Text(Into.Start(m_Table)), "ok");
    std::map<int, Record> Stored;
    for (int nId = 1; nId <= 3000; ++nId) {
        Stored[nId] = AnyRecord();
        ASSERT_EQ(Load(Into, nId, Stored[nId]), "ok");
    }
    EXPECT_EQ(Text(Into.Commit()), "ok");
    EXPECT_EQ(Rows(kSelect), Expected(Stored));
}

// Two statements in turn, which have other values bound each.
TEST_F(LoaderAgainTest, RecordsAreChangedAsTheyWereGiven) {
    LoadOptions How;
    How.eOnDuplicate = OnDuplicate::kUpsert;
    Loader Into;
    EXPECT_EQ(Text(Into.Start(m_Table, How)), "ok");
    std::map<int, Record> Stored;
    for (int i = 1; i <= 3000; ++i) {
        const int nId = static_cast<int>(Draw(1500));
        const Record Given = AnyRecord();
        for (const auto& [strName, jValue] : Given) {
            Stored[nId][strName] = jValue;
        }
        Stored[nId];
        ASSERT_EQ(Load(Into, nId, Given), "ok");
    }
    EXPECT_EQ(Text(Into.Commit()), "ok");
    EXPECT_EQ(Rows(kSelect), Expected(Stored));
}

// What was bound for a record that the table did not take is bound for the next one.
TEST_F(LoaderAgainTest, RecordAfterOneThatWasNotTakenIsStored) {
    LoadOptions How;
    How.blGoOnAfterBad = true;
    Loader Into;
    EXPECT_EQ(Text(Into.Start(m_Table, How)), "ok");
    for (const char* szRecord : {R"({"id": 1, "text": "ab"})", R"({"id": 1, "text": "cd"})",
                                 R"({"id": 2, "text": "ef"})", R"({"id": 3, "text": "gh"})"}) {
        const bool blTaken = Into.Add(Parse(szRecord)).Ok();
        EXPECT_EQ(blTaken, std::string(szRecord).find("cd") == std::string::npos);
    }
    EXPECT_EQ(Text(Into.Commit()), "ok");
    EXPECT_EQ(Rows("SELECT id, text FROM thing"), "1|ab;2|ef;3|gh");
}

// SQLite does not bind a text that is too long for it, and what comes behind is not bound, either.
TEST_F(LoaderAgainTest, RecordAfterOneThatWasNotBoundIsStored) {
    LoadOptions How;
    How.blGoOnAfterBad = true;
    Loader Into;
    EXPECT_EQ(Text(Into.Start(m_Table, How)), "ok");
    EXPECT_EQ(Text(Into.Add(Parse(R"({"id": 1, "on": true})"))), "ok");
    const std::string strLong(1000, 'x');
    const int nLength = sqlite3_limit(m_pDb, SQLITE_LIMIT_LENGTH, 500);
    const Status Outcome =
        Into.Add(Parse(R"({"id": 2, "list": [")" + strLong + R"("], "on": true})"));
    sqlite3_limit(m_pDb, SQLITE_LIMIT_LENGTH, nLength);
    EXPECT_EQ(Text(Outcome),
              "refused: cannot load record 2 into table \"thing\": string or blob too big");
    EXPECT_EQ(Text(Into.Add(Parse(R"({"id": 2, "list": ["y"], "on": true})"))), "ok");
    EXPECT_EQ(Text(Into.Commit()), "ok");
    EXPECT_EQ(Rows(kSelect), "1|NULL|NULL|1|NULL|NULL|NULL;2|[\"y\"]|NULL|1|NULL|NULL|NULL");
}

}  // namespace

}  // namespace VORN_JSON_DB
