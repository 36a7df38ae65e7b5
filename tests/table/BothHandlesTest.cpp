// The same records through both handles: the same columns, and either reads what the other wrote.

#include <VornJsonDbApi.h>

#include <limits>
#include <random>

#include "HostileTexts.h"
#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

// What recCreate stores exactly: these types, and texts without a NUL byte and a percent sign. The
// last member has a default, because recCreate needs it in every record.
constexpr char kMembers[] = R"({"a": {"cpptype": "string"}, "b": {"cpptype": "int"},
    "c": {"cpptype": "long long"}, "d": {"cpptype": "bool"}, "e": {"cpptype": "Json::objectValue"},
    "f": {"cpptype": "Json::arrayValue", "cppDefaultValue": [1, "two"]},
    "g": {"cpptype": "int", "cppDefaultValue": -7}, "h": {"cpptype": "bool", "cppDefaultValue": true},
    "i": {"cpptype": "Json::objectValue", "cppDefaultValue": {"x": {"y": "it's"}}},
    "id": {"cpptype": "int"}, "z": {"cpptype": "string", "cppDefaultValue": "it's"}})";
constexpr char kTyped[] =
    "(a TEXT, b INT, c INTEGER, d BOOLEAN, e TEXT, f TEXT, g INT DEFAULT 3, h BOOL, i TEXT, id "
    "INTEGER "
    "PRIMARY KEY, z TEXT)";
// Without an affinity a column keeps each value as it was given.
constexpr char kBare[] = "(a, b, c, d, e, f, g, h, i, id INTEGER PRIMARY KEY, z)";
constexpr char kColumns[] =
    "quote(a), typeof(a), quote(b), typeof(b), quote(c), typeof(c), quote(d), typeof(d), quote(e), "
    "typeof(e), quote(f), typeof(f), quote(g), typeof(g), quote(h), typeof(h), quote(i), "
    "typeof(i), "
    "quote(id), typeof(id), quote(z), typeof(z)";

class RecordMaker {
  public:
    RecordMaker() {
        for (std::string& strText : HostileTexts()) {
            if (strText.find('\0') == std::string::npos && strText.find('%') == std::string::npos &&
                strText.size() < 5000) {
                m_vecTexts.push_back(std::move(strText));
            }
        }
    }

    Json::Value Make(int nId) {
        Json::Value jRecord;
        jRecord["id"] = nId;
        Give(jRecord, "a", OneText());
        Give(jRecord, "b", static_cast<Json::Int>(m_Random()));
        Give(jRecord, "c", Number());
        Give(jRecord, "d", OneIn(2));
        Give(jRecord, "e", Object());
        Give(jRecord, "f", List());
        Give(jRecord, "g", std::numeric_limits<Json::Int>::min());
        Give(jRecord, "h", false);
        Give(jRecord, "i", Object());
        Give(jRecord, "z", OneText());
        return jRecord;
    }

  private:
    bool OneIn(unsigned n) { return m_Random() % n == 0; }
    const std::string& OneText() { return m_vecTexts[m_Random() % m_vecTexts.size()]; }

    void Give(Json::Value& jRecord, const char* szMember, const Json::Value& jValue) {
        if (!OneIn(6)) {
            jRecord[szMember] = jValue;
        }
    }

    Json::Value Number() {
        switch (m_Random() % 5) {
            case 0:
                return std::numeric_limits<Json::Int64>::min();
            case 1:
                return std::numeric_limits<Json::Int64>::max();
            case 2:
                return 3e9;  // whole, and kept as a real
            case 3:
                return static_cast<Json::UInt>(m_Random());
            default:
                return static_cast<Json::Int64>(m_Random()) << (m_Random() % 31);
        }
    }

    Json::Value Any() {
        switch (m_Random() % 8) {
            case 0:
                return Json::Value();
            case 1:
                return 0.1;
            case 2:
                return 1e300;
            case 3:
                return std::numeric_limits<Json::UInt64>::max();
            case 4:
                return OneIn(2);
            case 5:
                return List();
            case 6:
                return Object();
            default:
                return OneText();
        }
    }

    Json::Value List() {
        Json::Value jList(Json::arrayValue);
        while (OneIn(2)) {
            jList.append(Any());
        }
        return jList;
    }

    Json::Value Object() {
        Json::Value jObject(Json::objectValue);
        while (OneIn(2)) {
            jObject[OneText()] = Any();
        }
        return jObject;
    }

    std::mt19937 m_Random;  // seeded with its own default: the same records each time
    std::vector<std::string> m_vecTexts;
};

class BothHandles : public TableTest {
  protected:
    static constexpr int kRecords = 600;

    std::unique_ptr<VornJsonDbApi> Old(std::string strTable) {
        Json::Value jDefinition = Definition(strTable);
        std::string strCreate = "SELECT 1";
        return std::make_unique<VornJsonDbApi>(m_pDb, strTable, jDefinition, strCreate);
    }

    static Json::Value Definition(const std::string& strTable) {
        Json::Value jDefinition;
        jDefinition[strTable]["key"] = "id";
        jDefinition[strTable]["member"] = Parse(kMembers);
        return jDefinition;
    }

    Table New(const std::string& strTable) {
        Table Made;
        EXPECT_EQ("ok", Text(Made.Open(m_pDb, strTable, Definition(strTable))));
        return Made;
    }

    // Both write and read the same records, each in a table of its own.
    void Compare(const std::string& strOld, const std::string& strNew, const char* szColumns) {
        Run("CREATE TABLE " + strOld + szColumns + "; CREATE TABLE " + strNew + szColumns);
        const auto pOld = Old(strOld);
        Table Into = New(strNew);
        RecordMaker Maker;
        for (int nId = 1; nId <= kRecords; ++nId) {
            Json::Value jRecord = Maker.Make(nId);
            Json::Value jOldStored, jNewStored;
            EXPECT_EQ("ok", Text(Into.Create(jRecord, &jNewStored)));
            EXPECT_EQ(0, pOld->recCreate(jRecord, jOldStored)) << Text(jRecord);
            EXPECT_EQ(Text(jNewStored), Text(jOldStored));
        }
        for (int nId = 1; nId <= kRecords; ++nId) {
            const std::string strWhere = " WHERE id = " + std::to_string(nId);
            const std::string strWritten =
                Rows(std::string("SELECT ") + kColumns + " FROM " + strNew + strWhere);
            EXPECT_NE("", strWritten);
            EXPECT_EQ(strWritten,
                      Rows(std::string("SELECT ") + kColumns + " FROM " + strOld + strWhere));
        }
        ReadCrosswise(strOld, strNew);
    }

    void ReadCrosswise(const std::string& strOld, const std::string& strNew) {
        Json::Value jQuery(Json::objectValue);
        Json::Value jOldOfNew(Json::arrayValue), jOldOfOld(Json::arrayValue);
        EXPECT_EQ(0, Old(strNew)->recList(jQuery, jOldOfNew));
        EXPECT_EQ(0, Old(strOld)->recList(jQuery, jOldOfOld));
        Json::Value jNewOfOld, jNewOfNew;
        EXPECT_EQ("ok", Text(New(strOld).List(jQuery, jNewOfOld)));
        EXPECT_EQ("ok", Text(New(strNew).List(jQuery, jNewOfNew)));
        EXPECT_EQ(kRecords, static_cast<int>(jNewOfNew.size()));
        EXPECT_EQ(kRecords, static_cast<int>(jOldOfOld.size()));
        for (Json::ArrayIndex i = 0; i < kRecords; ++i) {
            EXPECT_EQ(Text(jOldOfNew[i]), Text(jNewOfNew[i]));
            EXPECT_EQ(Text(jNewOfOld[i]), Text(jNewOfNew[i]));
            EXPECT_EQ(Text(jOldOfOld[i]), Text(jNewOfNew[i]));
        }
    }
};

TEST_F(BothHandles, StoreTheSameInTypedColumns) {
    Compare("both_typed_old", "both_typed_new", kTyped);
}

TEST_F(BothHandles, StoreTheSameInColumnsWithoutAType) {
    Compare("both_bare_old", "both_bare_new", kBare);
}

}  // namespace

}  // namespace VORN_JSON_DB
