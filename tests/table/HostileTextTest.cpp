// Hostile texts as values of every member type, and as names: they are data, or they are refused,
// and the statements that run are those of a harmless text.

#include <algorithm>
#include <cstdio>
#include <map>
#include <set>

#include "HostileTexts.h"
#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

// Texts that are not UTF-8 take another way into a list.
constexpr char kHarmless[] = "harmless";
constexpr char kHarmlessBytes[] = "harmless\xff";

// Three records stand by, in the same table and in another one, and must stay what they are.
class HostileText : public TableTest {
  protected:
    HostileText() : m_vecTexts(HostileTexts()) {
        Run("CREATE TABLE victim (secret TEXT); INSERT INTO victim VALUES ('one'), ('two')");
        Rows("SELECT 1 FROM json_each('[]')");  // whose first use looks at the schema
        sqlite3_trace_v2(m_pDb, SQLITE_TRACE_STMT, NoteStatement, this);
        sqlite3_set_authorizer(m_pDb, NoteAccess, this);
    }
    ~HostileText() override {
        sqlite3_set_authorizer(m_pDb, nullptr, nullptr);
        sqlite3_trace_v2(m_pDb, 0, nullptr, nullptr);
        EXPECT_EQ("one;two", Rows("SELECT secret FROM victim"));
        std::printf("%zu texts, %d calls\n", m_vecTexts.size(), m_nCalls);
    }

    void OpenWith(const std::string& strType) {
        m_strType = strType;
        Json::Value jDefinition;
        jDefinition["t"]["key"] = "id";
        jDefinition["t"]["member"]["id"]["cpptype"] = "int";
        jDefinition["t"]["member"]["m"]["cpptype"] = strType;
        jDefinition["t"]["member"]["n"]["cpptype"] = "int";
        Options How;
        How.blCompatible = false;
        m_Table = Table();
        Run("DROP TABLE IF EXISTS t; CREATE TABLE t (id INTEGER PRIMARY KEY, m, n INTEGER)");
        EXPECT_EQ("ok", Text(m_Table.Open(m_pDb, "t", jDefinition, How)));
        Run("INSERT INTO t VALUES (1, NULL, 10), (2, NULL, 20), (3, NULL, 30)");
        m_mapHarmless.clear();
    }

    // Runs a call and looks at what SQLite was asked for: the statements, and the rows changed.
    template <typename CallOn>
    std::string Call(const char* szName, int nChanged, CallOn&& fnCall) {
        m_strRan.clear();
        m_strForeign.clear();
        const int nBefore = sqlite3_total_changes(m_pDb);
        m_blWatched = true;
        const Status Outcome = fnCall();
        m_blWatched = false;
        ++m_nCalls;
        EXPECT_EQ("", m_strForeign) << szName << Shown();
        EXPECT_EQ(nChanged, sqlite3_total_changes(m_pDb) - nBefore) << szName << Shown();
        ExpectKnownStatements(szName);
        return Outcome.CodeName();
    }

    // What the harmless texts run, which come first, is what all may run. A call with "!" is
    // refused.
    void ExpectKnownStatements(const char* szName) {
        if (szName[0] == '!') {
            EXPECT_EQ("", m_strRan) << szName << Shown();
            return;
        }
        std::set<std::string>& aHarmless = m_mapHarmless[szName];
        if (m_strText == kHarmless || m_strText == kHarmlessBytes) {
            aHarmless.insert(m_strRan);
        }
        EXPECT_EQ(1U, aHarmless.count(m_strRan))
            << szName << Shown() << ": " << m_strRan.substr(0, 500);
    }

    // "ok", or the code and what was found.
    static std::string Found(const std::string& strCode, const Json::Value& jRecords, int nId) {
        return strCode == "ok" && jRecords.size() == 1 && jRecords[0]["id"] == nId
                   ? "found"
                   : strCode + ", " + std::to_string(jRecords.size()) + " records";
    }

    std::string List(const char* szName, const char* szOperator, const Json::Value& jOperand,
                     int nId) {
        Json::Value jQuery, jRecords;
        jQuery["where"]["m"][szOperator] = jOperand;
        jQuery["where"]["id"]["$gt"] = 3;
        const std::string strCode = Call(szName, 0, [&] { return m_Table.List(jQuery, jRecords); });
        return Found(strCode, jRecords, nId);
    }

    std::string Shown() const { return " with " + m_strText.substr(0, 60) + " as " + m_strType; }

    void ExpectBystanders() {
        EXPECT_EQ("1|NULL|10;2|NULL|20;3|NULL|30", Rows("SELECT * FROM t")) << Shown();
    }

    // The texts, the harmless ones first.
    std::vector<std::string> AllTexts() const {
        std::vector<std::string> vecAll = {kHarmless, kHarmlessBytes};
        vecAll.insert(vecAll.end(), m_vecTexts.begin(), m_vecTexts.end());
        return vecAll;
    }

    std::string m_strType;
    std::string m_strText;

  private:
    static int NoteStatement(unsigned, void* pSelf, void*, void* pText) {
        auto& Self = *static_cast<HostileText*>(pSelf);
        Self.m_strRan += std::string(static_cast<const char*>(pText)) + ";";
        return 0;
    }

    // Names of tables outside of "t", and actions that no call needs.
    static int NoteAccess(void* pSelf, int nAction, const char* szFirst, const char*, const char*,
                          const char*) {
        auto& Self = *static_cast<HostileText*>(pSelf);
        static const std::set<int> s_aOnTable = {SQLITE_READ, SQLITE_INSERT, SQLITE_UPDATE,
                                                 SQLITE_DELETE};
        static const std::set<int> s_aOther = {SQLITE_SELECT, SQLITE_FUNCTION, SQLITE_TRANSACTION,
                                               SQLITE_SAVEPOINT};
        const std::string strTable = szFirst == nullptr ? "" : szFirst;
        const bool blOwn = s_aOnTable.count(nAction) > 0 &&
                           (strTable == "t" || strTable == "json_each" || strTable.empty());
        if (Self.m_blWatched && !blOwn && s_aOther.count(nAction) == 0) {
            Self.m_strForeign += std::to_string(nAction) + " " + strTable + ";";
        }
        return SQLITE_OK;
    }

    std::vector<std::string> m_vecTexts;
    std::map<std::string, std::set<std::string>> m_mapHarmless;  // what each call runs
    std::string m_strRan;
    std::string m_strForeign;
    bool m_blWatched = false;
    int m_nCalls = 0;
};

// How a text stands in a member of that type.
Json::Value ValueOf(const std::string& strType, const std::string& strText) {
    Json::Value jValue;
    if (strType == "Json::objectValue") {
        jValue[strText] = strText;
    } else if (strType == "Json::arrayValue") {
        jValue.append(strText);
    } else {
        jValue = strText;
    }
    return jValue;
}

std::string LikeOf(const std::string& strText) {
    return "%" + EscapeLike(strText);
}

// A text with a NUL, or beyond SQLite's limit, is no pattern.
bool IsPattern(const std::string& strText) {
    return strText.find('\0') == std::string::npos && LikeOf(strText).size() <= 50000;
}

Json::Value ListOf(const Json::Value& jFirst, const Json::Value& jSecond) {
    Json::Value jList(Json::arrayValue);
    jList.append(jFirst);
    jList.append(jSecond);
    return jList;
}

class HostileValue : public HostileText {
  protected:
    void FindByConditions(const std::string& strText) {
        // Within JSON some versions of SQLite end a text at a NUL.
        if (m_strType == "Json::arrayValue" && strText.find('\0') == std::string::npos) {
            EXPECT_EQ("found", List("$contains", "$contains", strText, 4)) << Shown();
        }
        if (m_strType == "string" || m_strType == "any") {
            const Json::Value jIn = ListOf(kHarmless, strText);
            EXPECT_EQ("found", List("$eq", "$eq", strText, 4)) << Shown();
            EXPECT_EQ("found", List("$in", "$in", jIn, 4)) << Shown();
            EXPECT_EQ("found", List("$between", "$between", ListOf(strText, strText), 4))
                << Shown();
            EXPECT_EQ("ok, 0 records", List("$nin", "$nin", jIn, 4)) << Shown();
            EXPECT_EQ("ok, 0 records", List("$ne", "$ne", strText, 4)) << Shown();
        }
        if (m_strType == "string") {
            EXPECT_EQ("found", List("$prefix", "$prefix", strText, 4)) << Shown();
            const bool blPattern = IsPattern(strText);
            EXPECT_EQ(blPattern ? "found" : "refused, 0 records",
                      List(blPattern ? "$like" : "!$like", "$like", LikeOf(strText), 4))
                << Shown();
        }
    }

    void ExpectStored(const char* szColumns, const Json::Value& jRecord) {
        Json::Value jRead;
        EXPECT_EQ("ok", Call("get", 0, [&] { return m_Table.Get(4, jRead); }));
        EXPECT_TRUE(jRead == jRecord) << szColumns << Shown();
    }

    void Change(const Json::Value& jValue) {
        Json::Value jWhere, jSet;
        jWhere["where"]["id"] = 4;
        jSet["m"] = jValue;
        Run("UPDATE t SET m = NULL WHERE id = 4");
        EXPECT_EQ("ok", Call("update", 1, [&] { return m_Table.Update(jWhere, jSet); }));
        Json::Value jRecord = jSet;
        jRecord["id"] = 4;
        jRecord["n"] = 40;
        ExpectStored("update", jRecord);
        jSet["id"] = 4;
        Run("UPDATE t SET m = NULL WHERE id = 4");
        EXPECT_EQ("ok",
                  Call("upsert", 1, [&] { return m_Table.Save(jSet, OnDuplicate::kUpsert); }));
        ExpectStored("upsert", jRecord);
        jRecord["n"] = 41;
        EXPECT_EQ("ok",
                  Call("replace", 1, [&] { return m_Table.Save(jRecord, OnDuplicate::kReplace); }));
        ExpectStored("replace", jRecord);
    }

    void RemoveAndLoad(const std::string& strText, const Json::Value& jRecord) {
        Json::Value jWhere;
        jWhere["where"]["id"] = 4;
        if (m_strType == "string") {
            jWhere["where"]["m"] = strText;
        }
        EXPECT_EQ("ok", Call("remove", 1, [&] { return m_Table.Remove(jWhere); })) << Shown();
        EXPECT_EQ("ok", Call("load", 1, [&] { return Load(strText, jRecord); })) << Shown();
        ExpectStored("load", jRecord);
        Run("DELETE FROM t WHERE id = 4");
    }

    // By value, or member by member.
    Status Load(const std::string& strText, const Json::Value& jRecord) {
        Loader Into;
        EXPECT_EQ("ok", Text(Into.Start(m_Table)));
        if (m_strType != "string") {
            Into.Add(jRecord).Ignore();
            return Into.Commit();
        }
        Into.SetInteger(Into.MemberIndex("id"), 4);
        Into.SetText(Into.MemberIndex("m"), strText);
        Into.SetInteger(Into.MemberIndex("n"), 40);
        Into.EndRecord().Ignore();
        return Into.Commit();
    }
};

TEST_F(HostileValue, IsStoredFoundChangedAndRemovedAsData) {
    for (const char* szType :
         {"string", "any", "Json::Value", "Json::objectValue", "Json::arrayValue"}) {
        OpenWith(szType);
        for (const std::string& strText : AllTexts()) {
            m_strText = strText;
            Json::Value jRecord, jStored;
            jRecord["id"] = 4;
            jRecord["m"] = ValueOf(m_strType, strText);
            jRecord["n"] = 40;
            EXPECT_EQ("ok", Call("create", 1, [&] { return m_Table.Create(jRecord, &jStored); }));
            EXPECT_TRUE(jStored == jRecord) << Shown();
            ExpectStored("create", jRecord);
            FindByConditions(strText);
            Change(jRecord["m"]);
            RemoveAndLoad(strText, jRecord);
            ExpectBystanders();
        }
    }
}

TEST_F(HostileValue, IsRefusedByMembersThatHoldNoText) {
    for (const char* szType :
         {"bool", "int", "unsigned int", "unsigned", "uid_t", "long", "long long", "time_t",
          "unsigned long", "unsigned long long", "double", "float"}) {
        OpenWith(szType);
        Loader Into;
        LoadOptions How;
        How.blGoOnAfterBad = true;
        EXPECT_EQ("ok", Text(Into.Start(m_Table, How)));
        for (const std::string& strText : AllTexts()) {
            m_strText = strText;
            Json::Value jRecord, jSet, jWhere;
            jSet["m"] = strText;
            jRecord = jSet;
            jRecord["id"] = 1;
            jWhere["where"]["id"] = 1;
            EXPECT_EQ("refused", Call("!create", 0, [&] { return m_Table.Create(jRecord); }));
            for (const OnDuplicate eMode :
                 {OnDuplicate::kSkip, OnDuplicate::kReplace, OnDuplicate::kUpsert}) {
                EXPECT_EQ("refused",
                          Call("!save", 0, [&] { return m_Table.Save(jRecord, eMode); }));
            }
            EXPECT_EQ("refused", Call("!update", 0, [&] { return m_Table.Update(jWhere, jSet); }));
            EXPECT_EQ("refused", Call("!add", 0, [&] { return Into.Add(jRecord); }));
            for (const char* szOperator :
                 {"$eq", "$ne", "$lt", "$lte", "$gt", "$gte", "$in", "$nin", "$between", "$like",
                  "$prefix", "$contains", "$null"}) {
                const bool blList = szOperator == std::string("$in") ||
                                    szOperator == std::string("$nin") ||
                                    szOperator == std::string("$between");
                EXPECT_EQ("refused, 0 records",
                          List("!list", szOperator,
                               blList ? ListOf(strText, strText) : Json::Value(strText), 4))
                    << szOperator << Shown();
            }
        }
        ExpectBystanders();
    }
}

// Wherever a query or a record has names; also texts that are names of other tables and columns.
TEST_F(HostileText, IsNoName) {
    OpenWith("string");
    for (const std::string& strText : AllTexts()) {
        m_strText = strText;
        Json::Value jRecord, jKey, jRecords;
        jRecord[strText] = strText;
        jKey["where"]["id"] = 1;
        EXPECT_EQ("refused", Call("!create", 0, [&] { return m_Table.Create(jRecord); }));
        EXPECT_EQ("refused", Call("!update", 0, [&] { return m_Table.Update(jKey, jRecord); }));
        EXPECT_EQ("refused", Call("!get", 0, [&] { return m_Table.Get(jRecord, jRecords); }));
        Json::Value jMember, jOperator, jSort, jMembers, jKeyOfQuery;
        jMember["where"][strText] = 1;
        jOperator["where"]["m"][strText] = 1;
        jSort["sort"].append(strText);
        jMembers["members"].append(strText);
        jKeyOfQuery[strText] = 1;
        for (const Json::Value* pjQuery : {&jMember, &jOperator, &jSort, &jMembers}) {
            EXPECT_EQ("refused", Call("!list", 0, [&] { return m_Table.List(*pjQuery, jRecords); }))
                << Shown();
            EXPECT_EQ("refused", Call("!remove", 0, [&] { return m_Table.Remove(*pjQuery); }))
                << Shown();
        }
    }
    ExpectBystanders();
}

}  // namespace

}  // namespace VORN_JSON_DB
