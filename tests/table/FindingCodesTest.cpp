// Every code of the one table: that a call produces it, and that the page has it.

#include <cmath>
#include <fstream>
#include <set>
#include <sstream>

#include "../../table/FindingCodes.h"
#include "../../table/LintCodes.h"
#include "FakeLocale.h"
#include "QueryFixture.h"

namespace VORN_JSON_DB {

namespace {

using vornjsondb::FindingCode;
using vornjsondb::LintCode;

enum class Call {
    kDefinition,  // a definition of table t
    kReal,        // the same beside the table that szSql makes
    kRecord,      // Create of a record of table d
    kSave,        // Save of one
    kQuery,       // List of table d
    kForm,        // the same with values only
    kChange,      // Remove
    kExplain,     // Explain
    kSql,         // ExplainSql
    kOldRecord,   // LintOldRecord for table d
    kOldQuery     // LintOldQuery
};

struct CodeCase {
    const char* szCode;
    Call eCall;
    const char* szText;
    const char* szSql = "";
};

constexpr char kD[] = R"({"d": {"key": "id", "member": {
    "id": {"cpptype": "int"}, "i": {"cpptype": "unsigned int"}, "r": {"cpptype": "double"},
    "j": {"cpptype": "Json::Value"}, "l": {"cpptype": "Json::arrayValue"},
    "s": {"cpptype": "string"}, "g": {"cpptype": "int"}, "offset": {"cpptype": "int"},
    "z": {"cpptype": "string"}}}})";

constexpr char kDSql[] =
    "CREATE TABLE d (id INTEGER PRIMARY KEY, i INTEGER, r REAL, j TEXT, l TEXT, s TEXT,"
    " g INTEGER GENERATED ALWAYS AS (i + 1), offset INTEGER, z TEXT)";

const CodeCase kCodeCases[] = {
    {"no-definition", Call::kDefinition, "{}"},
    {"unknown-type", Call::kDefinition, R"({"member": {"a": {"cpptype": "text"}}})"},
    {"bad-name", Call::kDefinition, R"({"member": {"$a": {"cpptype": "int"}}})"},
    {"same-column", Call::kDefinition,
     R"({"member": {"a": {"cpptype": "int"}, "A": {"cpptype": "int"}}})"},
    {"unknown-key", Call::kDefinition, R"({"key": "b", "member": {"a": {"cpptype": "int"}}})"},
    {"named-twice", Call::kDefinition,
     R"({"key": ["a", "a"], "member": {"a": {"cpptype": "int"}}})"},
    {"bad-default", Call::kDefinition,
     R"({"member": {"a": {"cpptype": "int", "cppDefaultValue": "x"}}})"},
    {"misspelt-key", Call::kDefinition, R"({"keys": "a", "member": {"a": {"cpptype": "int"}}})"},
    {"bad-flag", Call::kDefinition, R"({"member": {"a": {"cpptype": "int", "unique": 1}}})"},
    {"hides-query-key", Call::kDefinition, R"({"member": {"offset": {"cpptype": "int"}}})"},
    {"old-name", Call::kDefinition, R"({"member": {"order": {"cpptype": "int"}}})"},
    {"rowid-name", Call::kDefinition, R"({"member": {"rowid": {"cpptype": "int"}}})"},
    {"old-type", Call::kDefinition, R"({"member": {"a": {"cpptype": "double"}}})"},
    {"no-last-default", Call::kDefinition, R"({"member": {"a": {"cpptype": "int"}}})"},
    {"null-default", Call::kDefinition,
     R"({"member": {"a": {"cpptype": "int", "cppDefaultValue": null}}})"},

    {"missing-column", Call::kReal, R"({"member": {"a": {"cpptype": "int"}}})",
     "CREATE TABLE t (b)"},
    {"missing-key-column", Call::kReal, R"({"key": "a", "member": {"a": {"cpptype": "int"}}})",
     "CREATE TABLE t (b)"},
    {"extra-column", Call::kReal, R"({"member": {"a": {"cpptype": "int"}}})",
     "CREATE TABLE t (a, b)"},
    {"other-case", Call::kReal, R"({"member": {"a": {"cpptype": "int"}}})", "CREATE TABLE t (A)"},
    {"other-affinity", Call::kReal, R"({"member": {"a": {"cpptype": "int"}}})",
     "CREATE TABLE t (a TEXT)"},
    {"nullable-column", Call::kReal, R"({"member": {"a": {"cpptype": "int", "notNull": true}}})",
     "CREATE TABLE t (a)"},
    {"other-default", Call::kReal, R"({"member": {"a": {"cpptype": "int", "cppDefaultValue": 1}}})",
     "CREATE TABLE t (a DEFAULT 2)"},
    {"view", Call::kReal, R"({"member": {"a": {"cpptype": "int"}}})",
     "CREATE VIEW t AS SELECT 1 AS a"},
    {"without-rowid", Call::kReal, R"({"member": {"a": {"cpptype": "int"}}})",
     "CREATE TABLE t (a INTEGER PRIMARY KEY) WITHOUT ROWID"},
    {"key-not-unique", Call::kReal, R"({"key": "a", "member": {"a": {"cpptype": "int"}}})",
     "CREATE TABLE t (a)"},
    {"missing-unique", Call::kReal, R"({"member": {"a": {"cpptype": "int", "unique": true}}})",
     "CREATE TABLE t (a)"},

    {"full-scan", Call::kExplain, R"({"where": {"s": "a"}})"},
    {"not-one-statement", Call::kSql, "SELECT 1; SELECT 2"},

    {"not-a-record", Call::kRecord, "[]"},
    {"unknown-member", Call::kRecord, R"({"x": 1})"},
    {"generated", Call::kRecord, R"({"g": 1})"},
    {"wrong-kind", Call::kRecord, R"({"s": 1})"},
    {"out-of-range", Call::kRecord, R"({"id": 3000000000})"},
    {"old-cannot-read", Call::kRecord, R"({"r": 0.5})"},
    {"missing-key", Call::kSave, R"({"s": "a"})"},

    {"not-a-query", Call::kQuery, "5"},
    {"unknown-query-key", Call::kQuery, R"({"wheer": {}})"},
    {"not-conditions", Call::kQuery, R"({"where": null})"},
    {"empty-group", Call::kQuery, R"({"where": {"$or": []}})"},
    {"unknown-operator", Call::kQuery, R"({"where": {"$adn": []}})"},
    {"misplaced-operator", Call::kQuery, R"({"where": {"$gt": 5}})"},
    {"mixed-keys", Call::kQuery, R"({"where": {"j": {"$eq": 1, "a": 2}}})"},
    {"operator-refused", Call::kForm, R"({"where": {"s": {"$ne": ""}}})"},
    {"wrong-operator", Call::kQuery, R"({"where": {"id": {"$contains": 1}}})"},
    {"wrong-operand", Call::kQuery, R"({"where": {"id": {"$in": 5}}})"},
    {"null-operand", Call::kQuery, R"({"where": {"id": {"$gt": null}}})"},
    {"swapped-ends", Call::kQuery, R"({"where": {"id": {"$between": [2, 1]}}})"},
    {"list-member", Call::kQuery, R"({"where": {"l": "a"}})"},
    {"no-json-member", Call::kQuery, R"({"where": {"s.x": 1}})"},
    {"bad-path", Call::kQuery, R"({"where": {"j.": 1}})"},
    {"number-in-path", Call::kQuery, R"({"where": {"j.0": 1}})"},
    {"nul-in-json", Call::kQuery, R"({"where": {"l": {"$contains": "a\u0000b"}}})"},
    {"bad-pattern", Call::kQuery, R"({"where": {"s": {"$like": "\\"}}})"},
    {"bad-sort", Call::kQuery, R"({"sort": "s"})"},
    {"bad-members", Call::kQuery, R"({"members": []})"},
    {"bad-count", Call::kQuery, R"({"limit": -1})"},
    {"no-condition", Call::kChange, "{}"},
    {"paged-change", Call::kChange, R"({"where": {"id": 1}, "limit": 1})"},
    {"empty-nin", Call::kChange, R"({"where": {"id": {"$nin": []}}})"},

    {"old-drops-member", Call::kOldRecord, R"({"x": 1, "z": ""})"},
    {"old-cannot-write", Call::kOldRecord, R"({"r": 0.5, "z": ""})"},
    {"missing-last-member", Call::kOldRecord, R"({"s": "a"})"},
    {"percent-halved", Call::kOldRecord, R"({"s": "%%", "z": ""})"},
    {"percent-refused", Call::kOldRecord, R"({"s": "%", "z": ""})"},
    {"nul-cut", Call::kOldRecord, R"({"z": "a\u0000b"})"},
    {"old-reads-other", Call::kOldRecord, R"({"id": 3000000000, "z": ""})"},

    {"old-ignores-member", Call::kOldQuery, R"({"x": 1})"},
    {"old-ignores-key", Call::kOldQuery, R"({"id": 1, "sort_direction": "desc"})"},
    {"old-selects-all", Call::kOldQuery, "{}"},
    {"old-reading-only", Call::kOldQuery, R"({"id": 1, "limit": 1})"},
    {"raw-sql", Call::kOldQuery, R"({"vornSqlWhereFilter": "1"})"},
    {"old-refuses", Call::kOldQuery, R"({"id": {}})"},
    {"bare-text", Call::kOldQuery, R"({"id": "5 or 1=1"})"},
    {"old-null", Call::kOldQuery, R"({"s": null})"},
    {"old-other-kind", Call::kOldQuery, R"({"s": 5})"},
    {"empty-list", Call::kOldQuery, R"({"id": []})"},
    {"run-together", Call::kOldQuery, R"({"id": [1, 2]})"},
    {"old-membership", Call::kOldQuery, R"({"l": [1]})"},
    {"sorts-nothing", Call::kOldQuery, R"({"sort_by": "s"})"},
};

class FindingCodesTest : public TableTest {
  protected:
    FindingCodesTest() {
        Options How;
        How.strSqlCreate = kDSql;
        Open(kD, How);
    }

    FindingList Make(const CodeCase& Case) {
        Json::Value jOut;
        const Json::Value jText = Case.eCall == Call::kSql ? Json::Value() : Parse(Case.szText);
        std::int64_t nRows = 0;
        switch (Case.eCall) {
            case Call::kDefinition:
                return LintDefinition("t", OfT(jText));
            case Call::kReal:
                return BesideReal(OfT(jText), Case.szSql);
            case Call::kRecord:
                return m_Table.Create(jText).Findings();
            case Call::kSave:
                return m_Table.Save(jText, OnDuplicate::kUpsert).Findings();
            case Call::kQuery:
                return m_Table.List(Query(jText), jOut).Findings();
            case Call::kForm:
                return m_Table.List(Query::ValuesOnly(jText), jOut).Findings();
            case Call::kChange:
                return m_Table.Remove(Query(jText), &nRows).Findings();
            case Call::kOldRecord:
                return LintOldRecord("d", Parse(kD), jText);
            case Call::kOldQuery:
                return LintOldQuery("d", Parse(kD), jText);
            default:
                return Explained(Case, jText);
        }
    }

    // What no JSON text says.
    std::vector<FindingList> MakeBuilt() {
        Json::Value jNaN, jDeep, jOut;
        jNaN["j"].append(std::nan(""));
        jNaN["z"] = "";
        jDeep["j"] = Nested(1100);
        Json::Value jOldNaN;
        jOldNaN["l"].append(std::nan(""));
        jOldNaN["z"] = "";
        Json::Value jMany(Json::arrayValue);
        for (int i = 0; i <= 100000; ++i) {
            jMany.append(i);
        }
        std::vector<Condition> vecParts(1001, Condition("id", 1));
        Condition Deep("id", 1);
        for (int i = 0; i < 1001; ++i) {
            Deep = i % 2 == 0 ? Condition::All({Deep, Condition("id", 2)})
                              : Condition::Any({Deep, Condition("id", 2)});
        }
        const std::string strNoKey = R"({"n": {"member": {"a": {"cpptype": "int"}}}})";
        Table NoKey;
        Options How;
        How.blCreateTable = true;
        EXPECT_EQ(Text(NoKey.Open(m_pDb, "n", Parse(strNoKey), How)), "ok");
        FindingList vecInComma;
        {
            const FakeLocale Comma;
            vecInComma = m_Table.List(Query().Sort("j.x"), jOut).Findings();
        }
        Loader Into;
        EXPECT_EQ(Text(Into.Start(m_Table)), "ok");
        Into.Reject("line 11 ends in a quote");
        return {m_Table.Create(jNaN).Findings(),
                m_Table.Create(jDeep).Findings(),
                LintOldRecord("d", Parse(kD), jOldNaN),
                m_Table.List(Query().Where("id", Op::kIn, jMany), jOut).Findings(),
                m_Table.List(Query().Where(Condition::Any(vecParts)), jOut).Findings(),
                m_Table.List(Query().Where(Deep), jOut).Findings(),
                vecInComma,
                NoKey.Save(Parse(R"({"a": 1})"), OnDuplicate::kUpsert).Findings(),
                Into.EndRecord().Findings()};
    }

  private:
    static Json::Value OfT(const Json::Value& jEntry) {
        Json::Value jDefinition;
        jDefinition["t"] = jEntry;
        return jDefinition;
    }

    FindingList BesideReal(const Json::Value& jDefinition, const char* szSql) {
        Run(szSql);
        Table Of;
        FindingList vecFindings;
        EXPECT_EQ(Text(Of.Open(m_pDb, "t", jDefinition)), "ok");
        EXPECT_EQ(Text(Of.Lint(vecFindings)), "ok");
        Of = Table();
        const bool blView = std::string(szSql).compare(0, 11, "CREATE VIEW") == 0;
        Run(blView ? "DROP VIEW t" : "DROP TABLE t");
        return vecFindings;
    }

    FindingList Explained(const CodeCase& Case, const Json::Value& jText) {
        Plan Found;
        const Status Outcome = Case.eCall == Call::kSql ? m_Table.ExplainSql(Case.szText, Found)
                                                        : m_Table.Explain(Query(jText), Found);
        return Outcome.Ok() ? Found.vecFindings : Outcome.Findings();
    }
};

const char* Word(Severity eSeverity) {
    static constexpr const char* kWords[] = {"note", "warning", "error"};
    return kWords[static_cast<size_t>(eSeverity)];
}

constexpr size_t kFindings = static_cast<size_t>(FindingCode::kCount);
constexpr size_t kRows = kFindings + static_cast<size_t>(LintCode::kCount);

// Those of operations, then those of Lint.
std::vector<Finding> AllRows() {
    std::vector<Finding> vecRows;
    for (size_t i = 0; i < kRows; ++i) {
        vecRows.push_back(i < kFindings ? RowOf(static_cast<FindingCode>(i))
                                        : RowOf(static_cast<LintCode>(i - kFindings)));
    }
    return vecRows;
}

// "code|severity|remedy" of each line of the page's tables, which have the reader's order.
std::multiset<std::string> PageLines(std::istream& Page) {
    std::multiset<std::string> setLines;
    std::string strLine;
    while (std::getline(Page, strLine)) {
        std::vector<std::string> vecCells;
        std::istringstream Cells(strLine);
        for (std::string strCell; std::getline(Cells, strCell, '|');) {
            vecCells.push_back(strCell);
        }
        if (vecCells.size() == 5 && vecCells[1].compare(0, 2, " `") == 0) {
            EXPECT_GT(vecCells[3].size(), 10U) << strLine;
            setLines.insert(vecCells[1] + "|" + vecCells[2] + "|" + vecCells[4]);
        }
    }
    return setLines;
}

}  // namespace

TEST_F(FindingCodesTest, EachIsProducedWithItsSeverityMessageAndRemedy) {
    std::set<std::string> setProduced;
    const auto Take = [&setProduced](const FindingList& vecFindings) {
        std::set<std::string> setCodes;
        for (const Finding& Found : vecFindings) {
            EXPECT_NE(Found.strMessage, "") << Found.szCode;
            EXPECT_NE(Found.strRemedy, "") << Found.szCode;
            setCodes.insert(Found.szCode);
        }
        setProduced.insert(setCodes.begin(), setCodes.end());
        return setCodes;
    };
    for (const CodeCase& Case : kCodeCases) {
        EXPECT_EQ(Take(Make(Case)).count(Case.szCode), 1U) << Case.szCode;
    }
    for (const FindingList& vecFindings : MakeBuilt()) {
        Take(vecFindings);
    }
    std::set<std::string> setAll;
    for (const Finding& Row : AllRows()) {
        setAll.insert(Row.szCode);
    }
    EXPECT_EQ(setProduced, setAll);
    EXPECT_EQ(setAll.size(), kRows) << "a code comes twice";
}

TEST_F(FindingCodesTest, PageHasALineForEach) {
    std::multiset<std::string> setExpected;
    for (const Finding& Row : AllRows()) {
        setExpected.insert(std::string(" `") + Row.szCode + "` | " + Word(Row.eSeverity) + " | " +
                           Replaced(Row.strRemedy, "<", "\\<") + " ");
    }
    std::ifstream Page(VORN_FINDINGS_PAGE);
    ASSERT_TRUE(Page.is_open());
    EXPECT_EQ(PageLines(Page), setExpected);
}

}  // namespace VORN_JSON_DB
