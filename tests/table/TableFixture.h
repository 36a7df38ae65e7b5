// A table in memory, and what tests ask of it.

#ifndef VORN_TESTS_TABLE_TABLE_FIXTURE_H
#define VORN_TESTS_TABLE_TABLE_FIXTURE_H

#include <VornJsonDbTable.h>

#include <memory>
#include <string>
#include <utility>

#include <gtest/gtest.h>
#include <json/json.h>
#include <sqlite3.h>

namespace VORN_JSON_DB {

inline Json::Value Parse(const std::string& strJson) {
    Json::Value jValue;
    Json::CharReaderBuilder Builder;
    std::string strErrors;
    const std::unique_ptr<Json::CharReader> pReader(Builder.newCharReader());
    EXPECT_TRUE(
        pReader->parse(strJson.data(), strJson.data() + strJson.size(), &jValue, &strErrors))
        << strErrors << strJson;
    return jValue;
}

inline std::string Text(const Json::Value& jValue) {
    Json::StreamWriterBuilder Builder;
    Builder["indentation"] = "";
    Builder["emitUTF8"] = true;
    return Json::writeString(Builder, jValue);
}

// "ok", or code and message; then each finding's code and path.
inline std::string Text(const Status& Outcome) {
    std::string strText = Outcome.CodeName();
    if (!Outcome.Ok()) {
        strText += ": " + Outcome.Message();
    }
    for (const Finding& Found : Outcome.Findings()) {
        strText += std::string(" [") + Found.szCode + " " + Found.strPath + "]";
    }
    return strText;
}

// An empty list in lists, nLevels of them in all; or jInner in one fewer.
inline Json::Value Nested(int nLevels, Json::Value jInner = Json::arrayValue) {
    for (int i = 1; i < nLevels; ++i) {
        Json::Value jOuter(Json::arrayValue);
        jOuter.append(std::move(jInner));
        jInner = std::move(jOuter);
    }
    return jInner;
}

constexpr char kTasks[] = R"({"task": {"key": "id", "member": {
    "id": {"cpptype": "int"}, "name": {"cpptype": "string"}, "size": {"cpptype": "long long"},
    "done": {"cpptype": "bool", "cppDefaultValue": false}, "tags": {"cpptype": "Json::arrayValue"}}}})";

class TableTest : public testing::Test {
  protected:
    TableTest() { EXPECT_EQ(SQLITE_OK, sqlite3_open(":memory:", &m_pDb)); }
    ~TableTest() override {
        m_Table = Table();
        EXPECT_EQ(SQLITE_OK, sqlite3_close(m_pDb));
    }
    TableTest(const TableTest&) = delete;
    TableTest& operator=(const TableTest&) = delete;

    void Open(const std::string& strDefinition = kTasks, Options How = Options()) {
        How.blCreateTable = How.strSqlCreate.empty();
        const Json::Value jDefinition = Parse(strDefinition);
        EXPECT_EQ("ok",
                  Text(m_Table.Open(m_pDb, jDefinition.getMemberNames()[0], jDefinition, How)));
    }

    void Run(const std::string& strSql) {
        char* szError = nullptr;
        EXPECT_EQ(SQLITE_OK, sqlite3_exec(m_pDb, strSql.c_str(), nullptr, nullptr, &szError))
            << strSql << ": " << szError;
        sqlite3_free(szError);
    }

    // All rows, as quoted columns: "1|'a'|NULL;2|..."
    std::string Rows(const std::string& strSql) {
        sqlite3_stmt* pStatement = nullptr;
        EXPECT_EQ(SQLITE_OK, sqlite3_prepare_v2(m_pDb, strSql.c_str(), -1, &pStatement, nullptr))
            << sqlite3_errmsg(m_pDb);
        std::string strRows;
        while (sqlite3_step(pStatement) == SQLITE_ROW) {
            strRows += strRows.empty() ? "" : ";";
            for (int i = 0; i < sqlite3_column_count(pStatement); ++i) {
                const auto* pText = sqlite3_column_text(pStatement, i);
                strRows += i == 0 ? "" : "|";
                strRows += pText == nullptr ? "NULL" : reinterpret_cast<const char*>(pText);
            }
        }
        sqlite3_finalize(pStatement);
        return strRows;
    }

    std::string Create(const std::string& strRecord) {
        Json::Value jStored;
        const Status Outcome = m_Table.Create(Parse(strRecord), &jStored);
        return Outcome.Ok() ? Text(jStored) : Text(Outcome);
    }

    std::string Save(const std::string& strRecord, OnDuplicate eOnDuplicate) {
        static const char* const kWritten[] = {"inserted", "skipped", "replaced", "updated"};
        Json::Value jStored;
        Written eWritten = Written::kInserted;
        const Status Outcome = m_Table.Save(Parse(strRecord), eOnDuplicate, &jStored, &eWritten);
        return Outcome.Ok() ? kWritten[static_cast<size_t>(eWritten)] + (" " + Text(jStored))
                            : Text(Outcome);
    }

    std::string Get(const std::string& strKey) {
        Json::Value jRecord;
        const Status Outcome = m_Table.Get(Parse(strKey), jRecord);
        return Outcome.Ok() ? Text(jRecord) : Text(Outcome);
    }

    sqlite3* m_pDb = nullptr;
    Table m_Table;
};

}  // namespace VORN_JSON_DB

#endif  // VORN_TESTS_TABLE_TABLE_FIXTURE_H
