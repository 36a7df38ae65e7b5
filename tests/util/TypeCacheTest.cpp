// What recType returns is a reference into the cache, and a host may write into it. What a change
// means for later calls is not promised; that memory stays safe is. Most of these tests find
// something only under AddressSanitizer.
#include "../schema/FreshTable.h"

using namespace testhost;

namespace {

class TypeCache : public FreshTableTest {
  protected:
    // A handle on a fresh table, for one change.
    void OpenItem() {
        m_pApi = &OpenMembers(ParseJson(R"({"id":{"cpptype":"int"},
                          "list":{"cpptype":"Json::arrayValue","cppDefaultValue":["a long default"]},
                          "name":{"cpptype":"string","cppDefaultValue":"a default that is not short"}})"),
                              "id integer primary key,list text,name text");
    }

    Json::Value& Types() {
        Json::Value jNone;
        return VORN_JSON_DB::recType(jNone, m_strTable);
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
        m_pApi->recCreate(jRec, jOut);
        m_pApi->recSave(jFull, false);
        m_pApi->recList(jNoQuery, jRows);
        m_pApi->recGetOne(jQuery, jFull);
        m_pApi->checkJsonType(jFull);
        m_pApi->fillDefaultValue(jOut, false);
        m_pApi->fillDefaultValue(jOut, true);
        m_pApi->recUpdateByWhere(jRec, strText);
        m_pApi->recUpdateByFilter(jQuery, jFull);
        m_pApi->SqlExpandMemberName(strText);
        m_pApi->SqlExpandMemberSymbol(strText, jFull);
        m_pApi->SqlMakeByMatchField(strName, jFull, strText);
        m_pApi->SqlMakeByListField("list", jRows, strText);
        m_pApi->SqlExpandMemberList(jQuery, strText, VORN_SQL_WHERE_TYPE_OR);
        m_pApi->recDelete(jQuery);
        m_pApi->recDeleteByArray(vecValues, "name");
        m_pApi->recDeleteByName(strName, "name");
        m_pApi->recDeleteAll();
        TakeLog();
    }

    VornJsonDbApi* m_pApi = nullptr;
};

void ReadAMissingMember(Json::Value& jTypes) {
    EXPECT_TRUE(jTypes["nosuch"].isNull());
}
void ReadMissingMembersAmongAll(Json::Value& jTypes) {
    for (const char* szName : {"", "a", "idx", "lis", "nam", "names", "z"}) {
        EXPECT_TRUE(jTypes[szName].isNull());
    }
}
void AssignAnEntry(Json::Value& jTypes) {
    jTypes["name"] = ParseJson(R"({"cpptype":"Json::Value","cppDefaultValue":{"k":[1]}})");
}
void AssignAType(Json::Value& jTypes) {
    jTypes["name"]["cpptype"] = "a type that nobody knows and that is not short";
}
void AssignATypeThatIsNoText(Json::Value& jTypes) {
    jTypes["name"]["cpptype"] = 7;
}
void TakeADefaultAway(Json::Value& jTypes) {
    jTypes["name"].removeMember("cppDefaultValue");
}
void ReplaceAnEntryByNull(Json::Value& jTypes) {
    jTypes["name"] = Json::Value();
}
void RemoveAnEntry(Json::Value& jTypes) {
    jTypes.removeMember("name");
}
void ExchangeOneEntryForAnother(Json::Value& jTypes) {
    jTypes.removeMember("name");
    jTypes["other"]["cpptype"] = "int";
}
void AssignTheWhole(Json::Value& jTypes) {
    jTypes = ParseJson(R"({"other":{"cpptype":"string"}})");
}
void AssignANumber(Json::Value& jTypes) {
    jTypes = 7;
}
void ClearIt(Json::Value& jTypes) {
    jTypes.clear();
}
void SwapItAway(Json::Value& jTypes) {
    Json::Value jOther(Json::objectValue);
    jTypes.swap(jOther);
}
void CopyItIntoItself(Json::Value& jTypes) {
    jTypes["name"] = jTypes;
}

struct Change {
    const char* szWhat;
    void (*pfnChange)(Json::Value& jTypes);
};

const Change kChanges[] = {
    {"a missing member is read", ReadAMissingMember},
    {"missing members are read", ReadMissingMembersAmongAll},
    {"an entry is assigned", AssignAnEntry},
    {"a type is assigned", AssignAType},
    {"a type becomes a number", AssignATypeThatIsNoText},
    {"a default is removed", TakeADefaultAway},
    {"an entry becomes null", ReplaceAnEntryByNull},
    {"an entry is removed", RemoveAnEntry},
    {"an entry is exchanged", ExchangeOneEntryForAnother},
    {"the whole is assigned", AssignTheWhole},
    {"the whole becomes a number", AssignANumber},
    {"the whole is cleared", ClearIt},
    {"the whole is swapped", SwapItAway},
    {"the whole is copied into itself", CopyItIntoItself},
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
        change.pfnChange(Types());
        RunEveryOperation();
        change.pfnChange(Types());
        RunEveryOperation();
        CloseAll();
    }
}

TEST_F(TypeCache, ChangeBeforeTheFirstOperationIsSafe) {
    for (const Change& change : kChanges) {
        SCOPED_TRACE(change.szWhat);
        OpenItem();
        Json::Value jRec(Json::objectValue);
        m_pApi->checkJsonType(jRec);
        change.pfnChange(Types());
        RunEveryOperation();
        CloseAll();
    }
}

TEST_F(TypeCache, ChangeWhileAStatementRunsIsSafe) {
    for (const Change& change : kChanges) {
        SCOPED_TRACE(change.szWhat);
        OpenItem();
        Json::Value jRec = ParseJson(R"({"id":1})");
        EXPECT_EQ(m_pApi->recCreate(jRec, jRec), 0);
        Sql("insert into " + m_strTable + " (id,list,name) values (2,'[2]','b'),(3,'[3]','c');");
        Inside inside{&Types(), change.pfnChange};
        ASSERT_EQ(sqlite3_create_function(m_pDb, "change", 0, SQLITE_UTF8, &inside, ChangeInside,
                                          nullptr, nullptr),
                  SQLITE_OK);
        Json::Value jQuery = ParseJson(R"({"vornSqlWhereFilter":"change() = 1"})");
        Json::Value jRows;
        m_pApi->recList(jQuery, jRows);
        m_pApi->recGetOne(jQuery, jRec);
        m_pApi->recUpdateByFilter(jQuery, jRec);
        m_pApi->recDelete(jQuery);
        RunEveryOperation();
        CloseAll();
    }
}

TEST_F(TypeCache, RecordsOutliveAChange) {
    for (const Change& change : kChanges) {
        SCOPED_TRACE(change.szWhat);
        OpenItem();
        Json::Value jRec = ParseJson(R"({"id":1})");
        EXPECT_EQ(m_pApi->recCreate(jRec, jRec), 0);
        Json::Value jNoQuery;
        Json::Value jRows;
        EXPECT_EQ(m_pApi->recList(jNoQuery, jRows), 0);
        change.pfnChange(Types());
        RunEveryOperation();
        CloseAll();
        const char* const szExpected =
            R"({"id":1,"list":["a long default"],"name":"a default that is not short"})";
        EXPECT_EQ(Compact(jRec), szExpected);
        EXPECT_EQ(Compact(jRows[0]), szExpected);
    }
}
