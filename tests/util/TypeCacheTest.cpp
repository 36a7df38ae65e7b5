// What recType returns is a reference into the cache, and a host may write into it. What a change
// means for later calls is not promised; that memory stays safe is. Most of these tests find
// something only under AddressSanitizer.
#include "../support/TableTest.h"

using namespace testhost;

namespace {

class TypeCache : public TableTest {
  protected:
    // A handle on a new table, for one change.
    void OpenItem() {
        OpenMembers(R"({"id":{"cpptype":"int"},
                        "list":{"cpptype":"Json::arrayValue","cppDefaultValue":["a long default"]},
                        "name":{"cpptype":"string","cppDefaultValue":"one that is not short"}})",
                    "id integer primary key,list text,name text");
    }

    static Json::Value& Cached() {
        std::string strTable = "t";
        Json::Value jNone;
        return VORN_JSON_DB::recType(jNone, strTable);
    }

    // Every operation that asks for types, with rows to read.
    void RunEveryOperation() {
        Json::Value jRec = ParseJson(R"({"id":1,"nosuch":2})");
        Json::Value jFull = ParseJson(R"({"id":2,"list":[1],"name":"it's"})");
        Json::Value jQuery = ParseJson(R"({"list":[[1],null],"name":"it's","nosuch":[2]})");
        Json::Value jNoQuery;
        Json::Value jOut;
        Json::Value jRows;
        std::string strText = "id = 1";
        std::string strName = "name";
        std::vector<std::string> vecValues{"x", "y"};
        m_pHandle->recCreate(jRec, jOut);
        m_pHandle->recSave(jFull, false);
        m_pHandle->recList(jNoQuery, jRows);
        m_pHandle->recGetOne(jQuery, jFull);
        m_pHandle->checkJsonType(jFull);
        m_pHandle->fillDefaultValue(jOut, false);
        m_pHandle->fillDefaultValue(jOut, true);
        m_pHandle->recUpdateByWhere(jRec, strText);
        m_pHandle->recUpdateByFilter(jQuery, jFull);
        m_pHandle->SqlExpandMemberName(strText);
        m_pHandle->SqlExpandMemberSymbol(strText, jFull);
        m_pHandle->SqlMakeByMatchField(strName, jFull, strText);
        m_pHandle->SqlMakeByListField("list", jRows, strText);
        m_pHandle->SqlExpandMemberList(jQuery, strText, VORN_SQL_WHERE_TYPE_OR);
        m_pHandle->recDelete(jQuery);
        m_pHandle->recDeleteByArray(vecValues, "name");
        m_pHandle->recDeleteByName(strName, "name");
        m_pHandle->recDeleteAll();
        TakeLog();
    }
};

struct Change {
    const char* szWhat;
    void (*pfnChange)(Json::Value& jTypes);
};

const Change kChanges[] = {
    {"a missing member is read", [](Json::Value& jTypes) { EXPECT_TRUE(jTypes["x"].isNull()); }},
    {"missing members are read among all that there are",
     [](Json::Value& jTypes) {
         for (const char* szName : {"", "a", "idx", "lis", "nam", "names", "z"}) {
             EXPECT_TRUE(jTypes[szName].isNull());
         }
     }},
    {"an entry is assigned",
     [](Json::Value& jTypes) {
         jTypes["name"] = ParseJson(R"({"cpptype":"Json::Value","cppDefaultValue":{"k":[1]}})");
     }},
    {"a type is assigned",
     [](Json::Value& jTypes) { jTypes["name"]["cpptype"] = "unknown to all and not short"; }},
    {"a type becomes a number", [](Json::Value& jTypes) { jTypes["name"]["cpptype"] = 7; }},
    {"a default is removed",
     [](Json::Value& jTypes) { jTypes["name"].removeMember("cppDefaultValue"); }},
    {"an entry becomes null", [](Json::Value& jTypes) { jTypes["name"] = Json::Value(); }},
    {"an entry is removed", [](Json::Value& jTypes) { jTypes.removeMember("name"); }},
    {"an entry is exchanged for another",
     [](Json::Value& jTypes) {
         jTypes.removeMember("name");
         jTypes["other"]["cpptype"] = "int";
     }},
    {"the whole is assigned",
     [](Json::Value& jTypes) { jTypes = ParseJson(R"({"other":{"cpptype":"string"}})"); }},
    {"the whole becomes a number", [](Json::Value& jTypes) { jTypes = 7; }},
    {"the whole is cleared", [](Json::Value& jTypes) { jTypes.clear(); }},
    {"the whole is swapped away",
     [](Json::Value& jTypes) {
         Json::Value jOther(Json::objectValue);
         jTypes.swap(jOther);
     }},
    {"the whole is copied into itself", [](Json::Value& jTypes) { jTypes["name"] = jTypes; }},
};

struct Inside {
    Json::Value* pjTypes;
    void (*pfnChange)(Json::Value& jTypes);
};

// An SQL function of the host that changes the types while a statement of the library runs.
void ChangeInside(sqlite3_context* pContext, int, sqlite3_value**) {
    const Inside& inside = *static_cast<Inside*>(sqlite3_user_data(pContext));
    inside.pfnChange(*inside.pjTypes);
    sqlite3_result_int(pContext, 1);
}

}  // namespace

TEST_F(TypeCache, EveryOperationIsSafeAfterAnyChange) {
    for (const Change& change : kChanges) {
        SCOPED_TRACE(change.szWhat);
        OpenItem();
        RunEveryOperation();
        change.pfnChange(Cached());
        RunEveryOperation();
        change.pfnChange(Cached());
        RunEveryOperation();
    }
}

TEST_F(TypeCache, ChangeBeforeTheFirstOperationIsSafe) {
    for (const Change& change : kChanges) {
        SCOPED_TRACE(change.szWhat);
        OpenItem();
        Json::Value jRec(Json::objectValue);
        m_pHandle->checkJsonType(jRec);
        change.pfnChange(Cached());
        RunEveryOperation();
    }
}

TEST_F(TypeCache, ChangeWhileAStatementRunsIsSafe) {
    for (const Change& change : kChanges) {
        SCOPED_TRACE(change.szWhat);
        OpenItem();
        Json::Value jRec = ParseJson(R"({"id":1})");
        EXPECT_EQ(m_pHandle->recCreate(jRec, jRec), 0);
        Sql("insert into t (id,list,name) values (2,'[2]','b'),(3,'[3]','c');");
        Inside inside{&Cached(), change.pfnChange};
        ASSERT_EQ(sqlite3_create_function(m_pDb, "change", 0, SQLITE_UTF8, &inside, ChangeInside,
                                          nullptr, nullptr),
                  SQLITE_OK);
        Json::Value jQuery = ParseJson(R"({"vornSqlWhereFilter":"change() = 1"})");
        Json::Value jRows;
        m_pHandle->recList(jQuery, jRows);
        m_pHandle->recGetOne(jQuery, jRec);
        m_pHandle->recUpdateByFilter(jQuery, jRec);
        m_pHandle->recDelete(jQuery);
        RunEveryOperation();
    }
}

TEST_F(TypeCache, RecordsOutliveAChange) {
    for (const Change& change : kChanges) {
        SCOPED_TRACE(change.szWhat);
        OpenItem();
        Json::Value jRec = ParseJson(R"({"id":1})");
        EXPECT_EQ(m_pHandle->recCreate(jRec, jRec), 0);
        Json::Value jNoQuery;
        Json::Value jRows;
        EXPECT_EQ(m_pHandle->recList(jNoQuery, jRows), 0);
        change.pfnChange(Cached());
        RunEveryOperation();
        const char* const szExpected =
            R"({"id":1,"list":["a long default"],"name":"one that is not short"})";
        EXPECT_EQ(Compact(jRec), szExpected);
        EXPECT_EQ(Compact(jRows[0]), szExpected);
    }
}
