// Random definitions, records and queries, hostile ones among them: what a Table selects, what an
// old handle selects by ToOldQuery, and what the model selects must be the same.
//
// VORNJSONDB_QUERY_ROUNDS=100000 runs more, from VORNJSONDB_QUERY_SEED on. A round is its seed's.

#include <VornJsonDbApi.h>

#include <cmath>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <random>

#include "QueryFixture.h"
#include "QueryModel.h"

namespace VORN_JSON_DB {

namespace {

unsigned long FromEnvironment(const char* szName, unsigned long nUsual) {
    const char* szValue = std::getenv(szName);
    return szValue != nullptr ? std::strtoul(szValue, nullptr, 10) : nUsual;
}

// All names and values of a round.
class Maker {
  public:
    explicit Maker(unsigned long nSeed) : m_Random(nSeed) {}

    size_t Below(size_t nEnd) { return static_cast<size_t>(m_Random() % nEnd); }
    bool OneIn(size_t nTimes) { return Below(nTimes) == 0; }

    template <typename Value>
    const Value& Pick(const std::vector<Value>& vecFrom) {
        return vecFrom[Below(vecFrom.size())];
    }

    std::string String() {
        static const std::vector<std::string> s_vecTexts{"",
                                                         "a",
                                                         "A",
                                                         "ab",
                                                         "aB",
                                                         "b",
                                                         "%",
                                                         "_",
                                                         "\\",
                                                         "a%b",
                                                         "a_b",
                                                         "100%",
                                                         "'",
                                                         "\"",
                                                         "''",
                                                         "it's",
                                                         "x' OR 1=1 --",
                                                         "/*",
                                                         "NULL",
                                                         "null",
                                                         "1",
                                                         "01",
                                                         "1e3",
                                                         "1.0",
                                                         " 1 ",
                                                         "true",
                                                         "{}",
                                                         "[]",
                                                         "[1]",
                                                         "{\"a\":1}",
                                                         "$.a",
                                                         "?",
                                                         "?1",
                                                         ":a",
                                                         "%d%n",
                                                         "\x01",
                                                         "\x1f",
                                                         "\x7f",
                                                         std::string("\0", 1),
                                                         std::string("a\0", 2),
                                                         std::string("\0a", 2),
                                                         std::string("a\0b", 3),
                                                         "\xff",
                                                         "a\xff",
                                                         "\xff\xff",
                                                         "a\xc3",
                                                         "\xc0\x80",
                                                         "\xed\xa0\x80",
                                                         "\xe2\x82",
                                                         "\xc3\xa9",
                                                         "e\xcc\x81",
                                                         "\xf0\x9f\x98\x80",
                                                         "\xef\xbf\xbf",
                                                         "\xef\xbb\xbf",
                                                         "\xe2\x80\xae",
                                                         "\n",
                                                         "\r\n",
                                                         "\t",
                                                         ";",
                                                         "--"};
        std::string strText = Pick(s_vecTexts);
        if (OneIn(4)) {
            strText += Pick(s_vecTexts);
        }
        return strText;
    }

    Json::Int64 Integer(Json::Int64 nLeast, Json::Int64 nMost) {
        const std::vector<Json::Int64> vecEnds{nLeast, nMost, nLeast + 1, nMost - 1, 0, 1, 2, 3};
        return OneIn(3) ? Pick(vecEnds) : static_cast<Json::Int64>(Below(6));
    }

    double Real() {
        static const std::vector<double> s_vecReals{0.0,
                                                    -0.0,
                                                    0.1,
                                                    0.2,
                                                    0.5,
                                                    1.0,
                                                    1.5,
                                                    -1.5,
                                                    2.0,
                                                    1.0 / 3,
                                                    1e-300,
                                                    5e-324,
                                                    1e300,
                                                    1.7976931348623157e308,
                                                    9007199254740992.0,
                                                    9007199254740993.0,
                                                    9223372036854775808.0,
                                                    -9223372036854775808.0,
                                                    123456.789,
                                                    0.30000000000000004};
        if (OneIn(4)) {
            std::uint64_t nBits = m_Random();
            double dValue = 0;
            std::memcpy(&dValue, &nBits, sizeof(dValue));
            return std::isfinite(dValue) ? dValue : 4.25;
        }
        return Pick(s_vecReals);
    }

    // Without a NUL byte, where SQLite ends a text in JSON and finds it by what stands before.
    std::string TextInJson() {
        const std::string strText = String();
        return strText.substr(0, strText.find('\0'));
    }

    Json::Value JsonValue(int nLevels) {
        static const std::vector<std::string> s_vecKeys{"a", "b", "c d", "x'y", "\xc3\xa9", "a]"};
        switch (Below(nLevels > 0 ? 9 : 6)) {
            case 0:
                return Json::Value();
            case 1:
                return OneIn(2);
            case 2:
                return Integer(INT64_MIN, INT64_MAX);
            case 3:
                return Real();
            case 4:
            case 5:
                return TextInJson();
            case 6: {
                Json::Value jList(Json::arrayValue);
                for (size_t n = Below(4); n > 0; --n) {
                    jList.append(JsonValue(nLevels - 1));
                }
                return jList;
            }
            default: {
                Json::Value jObject(Json::objectValue);
                for (size_t n = Below(4); n > 0; --n) {
                    jObject[Pick(s_vecKeys)] = JsonValue(nLevels - 1);
                }
                return jObject;
            }
        }
    }

    // A value of the type, not null.
    Json::Value ValueOf(const std::string& strType) {
        if (strType == "string") {
            return String();
        }
        if (strType == "bool") {
            return OneIn(2);
        }
        if (strType == "int" || strType == "unsigned int") {
            return Integer(strType == "int" ? INT32_MIN : 0, INT32_MAX);
        }
        if (strType == "long long") {
            return Integer(INT64_MIN, INT64_MAX);
        }
        if (strType == "double") {
            return Real();
        }
        if (strType == "any") {
            return OneIn(2)   ? Json::Value(String())
                   : OneIn(2) ? Json::Value(Real())
                              : Json::Value(Integer(-5, 5));
        }
        Json::Value jValue = JsonValue(3);
        while (jValue.isNull() || (strType == "Json::objectValue" && !jValue.isObject()) ||
               (strType == "Json::arrayValue" && !jValue.isArray())) {
            jValue = JsonValue(3);
        }
        return jValue;
    }

  private:
    std::mt19937_64 m_Random;
};

const std::vector<std::string> kOldTypes{"string",
                                         "string",
                                         "int",
                                         "long long",
                                         "bool",
                                         "unsigned int",
                                         "Json::objectValue",
                                         "Json::arrayValue",
                                         "Json::Value"};

class Round {
  public:
    explicit Round(unsigned long nSeed) : m_nSeed(nSeed), m_Make(nSeed) {
        EXPECT_EQ(SQLITE_OK, sqlite3_open(":memory:", &m_pDb));
    }
    ~Round() {
        m_Table = Table();
        EXPECT_EQ(SQLITE_OK, sqlite3_close(m_pDb));
    }
    Round(const Round&) = delete;
    Round& operator=(const Round&) = delete;

    void Run() {
        m_blOld = m_Make.OneIn(2);
        m_strTable =
            m_blOld ? "t" + std::to_string(m_nSeed) : "order \"by\" '" + std::to_string(m_nSeed);
        MakeDefinition();
        Options How;
        How.blCreateTable = true;
        How.blCompatible = false;
        ASSERT_EQ("ok", Text(m_Table.Open(m_pDb, m_strTable, m_jDefinition, How)));
        MakeRecords();
        std::unique_ptr<VornJsonDbApi> pOld;
        if (m_blOld) {
            std::string strCreate = "SELECT 1";
            pOld = std::make_unique<VornJsonDbApi>(m_pDb, m_strTable, m_jDefinition, strCreate);
        }
        for (int i = 0; i < 8; ++i) {
            const Json::Value jQuery = MakeQuery();
            SCOPED_TRACE("seed " + std::to_string(m_nSeed) + ": " + Text(jQuery).substr(0, 3000));
            CompareReads(jQuery);
            if (pOld) {
                CompareOld(jQuery, *pOld);
            }
        }
    }

    static size_t s_nCompared, s_nRows;

  private:
    void MakeDefinition() {
        std::vector<std::string> vecNames{"name", "size", "data", "list", "flag", "more"};
        if (!m_blOld) {
            vecNames = {"order", "a b",   "a\"b", "it's", "x.y",  "\xc3\xbc",
                        "limit", "rowid", "%d",   "?1",   "a[0]", "--"};
        }
        std::vector<std::string> vecTypes = kOldTypes;
        if (!m_blOld) {
            vecTypes.insert(vecTypes.end(), {"double", "double", "any", "any"});
        }
        Json::Value& jMembers = m_jDefinition[m_strTable]["member"];
        jMembers["id"]["cpptype"] = "int";
        m_jDefinition[m_strTable]["key"] = "id";
        m_Model.mapTypes["id"] = "int";
        for (size_t n = 2 + m_Make.Below(5); n > 0; --n) {
            const std::string strName = m_Make.Pick(vecNames);
            m_Model.mapTypes[strName] = m_Make.Pick(vecTypes);
            jMembers[strName]["cpptype"] = m_Model.mapTypes[strName];
        }
        for (const auto& Each : m_Model.mapTypes) {
            m_vecMembers.push_back(Each.first);
        }
    }

    void MakeRecords() {
        const size_t nRecords = 5 + m_Make.Below(20);
        for (size_t i = 0; i < nRecords; ++i) {
            Json::Value jRecord;
            for (const auto& Each : m_Model.mapTypes) {
                jRecord[Each.first] = m_Make.OneIn(5) ? Json::Value() : m_Make.ValueOf(Each.second);
            }
            jRecord["id"] = static_cast<int>(i * 7 % 31);
            ASSERT_EQ("ok", Text(m_Table.Create(jRecord))) << Text(jRecord);
            m_Model.vecRecords.push_back(jRecord);
        }
    }

    // A value that the member has somewhere, or another one of its type.
    Json::Value Operand(const std::string& strMember) {
        const std::string& strType = m_Model.mapTypes[strMember];
        const Json::Value& jStored = m_Make.Pick(m_Model.vecRecords)[strMember];
        return m_Make.OneIn(3) || jStored.isNull() ? m_Make.ValueOf(strType) : jStored;
    }

    std::string Path(const std::string& strMember) {
        static const std::vector<std::string> s_vecSteps{".a",  ".b",  ".c d", ".x'y",
                                                         "[0]", "[1]", ".a]"};
        std::string strPath = strMember;
        Json::Value jNow = m_Make.Pick(m_Model.vecRecords)[strMember];
        for (size_t n = 1 + m_Make.Below(2); n > 0; --n) {
            strPath += m_Make.Pick(s_vecSteps);
        }
        return strPath;
    }

    Json::Value Ordered(const std::string& strType) {
        Json::Value jValue;
        do {
            jValue = strType.empty() ? m_Make.JsonValue(0) : m_Make.ValueOf(strType);
        } while (!jValue.isString() && !jValue.isNumeric());
        return jValue;
    }

    static bool IsLess(const Json::Value& jLeft, const Json::Value& jRight) {
        if (jLeft.isString() || (jLeft.isInt64() && jRight.isInt64())) {
            return jLeft < jRight;
        }
        return jLeft.asDouble() < jRight.asDouble();
    }

    Json::Value Pattern() {
        std::string strPattern = m_Make.OneIn(2) ? "%" : "";
        std::string strText = m_Make.String();
        strText = strText.substr(0, strText.find('\0'));
        strPattern += m_Make.OneIn(3) && strText.find('\\') == std::string::npos
                          ? strText
                          : EscapeLike(strText);
        strPattern += m_Make.OneIn(2) ? "%" : (m_Make.OneIn(3) ? "_" : "");
        return strPattern;
    }

    Json::Value Operators(const std::string& strMember, bool blPath) {
        const std::string strType = blPath ? "" : m_Model.mapTypes[strMember];
        const auto Any = [&] {
            return m_Make.OneIn(8) ? Json::Value()
                                   : (blPath ? m_Make.JsonValue(1) : Operand(strMember));
        };
        const bool blText = blPath || strType == "string" || strType == "any";
        const bool blJson = strType.compare(0, 6, "Json::") == 0;
        const bool blOrdered = blText || (!blJson && strType != "bool");
        const bool blList = blPath || strType == "Json::arrayValue" || strType == "Json::Value";
        Json::Value jOperators(Json::objectValue);
        while (jOperators.empty() || m_Make.OneIn(4)) {
            static const std::vector<std::string> s_vecOrdered{"$lt", "$lte", "$gt", "$gte"};
            switch (m_Make.Below(9)) {
                case 0:
                case 1:
                    jOperators[m_Make.OneIn(2) ? "$eq" : "$ne"] = Any();
                    break;
                case 2:
                case 3: {
                    Json::Value& jList = jOperators[m_Make.OneIn(2) ? "$in" : "$nin"];
                    jList = Json::Value(Json::arrayValue);
                    for (size_t n = m_Make.Below(6); n > 0; --n) {
                        jList.append(Any());
                    }
                    break;
                }
                case 4:
                    if (blOrdered) {
                        jOperators[m_Make.Pick(s_vecOrdered)] = Ordered(strType);
                    }
                    break;
                case 5:
                    if (blOrdered) {
                        Json::Value jLeft = Ordered(strType), jRight = Ordered(strType);
                        if (jLeft.isString() == jRight.isString()) {
                            if (IsLess(jRight, jLeft)) {
                                jLeft.swap(jRight);
                            }
                            jOperators["$between"] = Json::Value(Json::arrayValue);
                            jOperators["$between"].append(jLeft);
                            jOperators["$between"].append(jRight);
                        }
                    }
                    break;
                case 6:
                    if (blText) {
                        const bool blPrefix = m_Make.OneIn(2);
                        jOperators[blPrefix ? "$prefix" : "$like"] =
                            blPrefix ? (blPath ? m_Make.TextInJson() : m_Make.String()) : Pattern();
                    }
                    break;
                case 7:
                    if (blList) {
                        jOperators["$contains"] = m_Make.JsonValue(1);
                    }
                    break;
                default:
                    jOperators["$null"] = m_Make.OneIn(2);
            }
        }
        if (m_Make.OneIn(6)) {
            Json::Value jNot;
            jNot["$not"] = jOperators;
            return jNot;
        }
        return jOperators;
    }

    Json::Value Where(int nLevels) {
        Json::Value jWhere(Json::objectValue);
        for (size_t n = 1 + m_Make.Below(2); n > 0; --n) {
            if (nLevels > 0 && m_Make.OneIn(2)) {
                static const std::vector<std::string> s_vecGroups{"$and", "$or"};
                if (m_Make.OneIn(4)) {
                    jWhere["$not"] = Where(nLevels - 1);
                    continue;
                }
                Json::Value& jGroup = jWhere[m_Make.Pick(s_vecGroups)];
                for (size_t nParts = 1 + m_Make.Below(nLevels == 1 && m_Make.OneIn(9) ? 70 : 4);
                     nParts > 0; --nParts) {
                    jGroup.append(Where(nLevels - 1));
                }
                continue;
            }
            const std::string& strMember = m_Make.Pick(m_vecMembers);
            const bool blJson = m_Model.mapTypes[strMember].compare(0, 6, "Json::") == 0;
            const bool blPath = blJson && m_Make.OneIn(2);
            const std::string strName = blPath ? Path(strMember) : strMember;
            if (m_Make.OneIn(4) && !blPath) {
                jWhere[strName] = m_Make.OneIn(6) ? Json::Value() : Operand(strMember);
            } else {
                jWhere[strName] = Operators(strMember, blPath);
            }
        }
        return jWhere;
    }

    Json::Value MakeQuery() {
        Json::Value jQuery(Json::objectValue);
        if (!m_Make.OneIn(10)) {
            jQuery["where"] = Where(static_cast<int>(m_Make.Below(5)));
        }
        for (size_t n = m_Make.Below(3); n > 0; --n) {
            const std::string& strMember = m_Make.Pick(m_vecMembers);
            const bool blJson = m_Model.mapTypes[strMember].compare(0, 6, "Json::") == 0;
            jQuery["sort"].append((m_Make.OneIn(2) ? "-" : "") +
                                  (blJson && m_Make.OneIn(2) ? Path(strMember) : strMember));
        }
        if (jQuery["sort"].isNull()) {
            jQuery["sort"].append("id");
        }
        if (m_Make.OneIn(3)) {
            jQuery["limit"] = static_cast<int>(m_Make.Below(8));
        }
        if (m_Make.OneIn(4)) {
            jQuery["offset"] = static_cast<int>(m_Make.Below(5));
        }
        return jQuery;
    }

    static std::vector<int> IdsOf(const Json::Value& jRecords) {
        std::vector<int> vecIds;
        for (const Json::Value& jRecord : jRecords) {
            vecIds.push_back(jRecord["id"].asInt());
        }
        return vecIds;
    }

    void Run(const char* szSql) {
        EXPECT_EQ(SQLITE_OK, sqlite3_exec(m_pDb, szSql, nullptr, nullptr, nullptr));
    }

    std::vector<int> Rest() {
        Json::Value jRest;
        EXPECT_EQ("ok", Text(m_Table.List(Query().Sort("id"), jRest)));
        return IdsOf(jRest);
    }

    // The ids that the conditions leave.
    std::vector<int> Left(const Json::Value& jQuery) {
        Json::Value jLeft;
        jLeft["where"]["$not"] = jQuery["where"];
        return m_Model.Select(jLeft);
    }

    void CompareReads(const Json::Value& jQuery) {
        const std::vector<int> vecWanted = m_Model.Select(jQuery);
        Json::Value jRecords;
        ASSERT_EQ("ok", Text(m_Table.List(jQuery, jRecords)));
        EXPECT_EQ(vecWanted, IdsOf(jRecords));
        std::int64_t nCount = -1;
        bool blExists = false;
        EXPECT_EQ("ok", Text(m_Table.Count(jQuery, nCount)));
        EXPECT_EQ("ok", Text(m_Table.Exists(jQuery, blExists)));
        EXPECT_EQ(static_cast<std::int64_t>(vecWanted.size()), nCount);
        EXPECT_EQ(!vecWanted.empty(), blExists);
        ++s_nCompared;
        s_nRows += vecWanted.size();
        if (!jQuery["where"].isNull()) {
            Json::Value jChange;
            jChange["where"] = jQuery["where"];
            Run("SAVEPOINT s");
            const Status Removed = m_Table.Remove(jChange, &nCount);
            EXPECT_TRUE(Removed.Ok()) << Text(Removed);
            EXPECT_EQ(Left(jQuery), Rest());
            Run("ROLLBACK TO s; RELEASE s");
        }
    }

    void CompareOld(const Json::Value& jQuery, VornJsonDbApi& Old) {
        Json::Value jOld, jRecords(Json::arrayValue);
        ASSERT_EQ("ok", Text(m_Table.ToOldQuery(jQuery, OldCall::kRead, jOld)));
        EXPECT_EQ(0, Old.recList(jOld, jRecords)) << Text(jOld);
        const std::vector<int> vecWanted = m_Model.Select(jQuery);
        EXPECT_EQ(vecWanted, IdsOf(jRecords)) << Text(jOld);
        Json::Value jOne;
        EXPECT_EQ(vecWanted.empty() ? 0 : 1, Old.recGetOne(jOld, jOne));
        EXPECT_EQ(vecWanted.empty() ? -1 : vecWanted[0], jOne.get("id", -1).asInt());
        if (jQuery["where"].isNull()) {
            return;
        }
        Json::Value jChange;
        jChange["where"] = jQuery["where"];
        const Status Written = m_Table.ToOldQuery(jChange, OldCall::kChange, jOld);
        ASSERT_TRUE(Written.Ok()) << Text(Written);
        Run("SAVEPOINT s");
        const std::vector<int> vecLeft = Left(jQuery);
        EXPECT_EQ(static_cast<int>(m_Model.vecRecords.size() - vecLeft.size()), Old.recDelete(jOld))
            << Text(jOld);
        EXPECT_EQ(vecLeft, Rest());
        Run("ROLLBACK TO s");
        Json::Value jNew;
        jNew["id"] = 1000;  // the key, so that it goes well for one record at most
        const size_t nReached = m_Model.vecRecords.size() - vecLeft.size();
        EXPECT_EQ(nReached > 1 ? -1 : 0, Old.recUpdateByFilter(jOld, jNew));
        if (nReached == 1) {
            std::vector<int> vecChanged = vecLeft;
            vecChanged.push_back(1000);
            EXPECT_EQ(vecChanged, Rest());
        }
        Run("ROLLBACK TO s; RELEASE s");
    }

    unsigned long m_nSeed;
    Maker m_Make;
    sqlite3* m_pDb = nullptr;
    bool m_blOld = false;
    std::string m_strTable;
    Json::Value m_jDefinition;
    QueryModel m_Model;
    std::vector<std::string> m_vecMembers;
    Table m_Table;
};
size_t Round::s_nCompared = 0;
size_t Round::s_nRows = 0;

}  // namespace

TEST(QueryProperty, RandomQueriesSelectWhatTheModelSelects) {
    const unsigned long nFirst = FromEnvironment("VORNJSONDB_QUERY_SEED", 1);
    const unsigned long nRounds = FromEnvironment("VORNJSONDB_QUERY_ROUNDS", 150);
    for (unsigned long nSeed = nFirst; nSeed < nFirst + nRounds && !testing::Test::HasFailure();
         ++nSeed) {
        Round(nSeed).Run();
    }
    std::printf("%zu queries, %zu rows\n", Round::s_nCompared, Round::s_nRows);
}

}  // namespace VORN_JSON_DB
