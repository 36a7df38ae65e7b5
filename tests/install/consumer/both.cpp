// A program that links both libraries, which hold some of the same sources: each handle reads what
// the other one stored in one table, and neither takes the other's code.
#include <VornJsonDbApi.h>

#include <VornJsonDbTable.h>

#include <cstdio>
#include <string>

using VORN_JSON_DB::Table;

static Json::Value Tool(int nId, const char* szName) {
    Json::Value jRecord;
    jRecord["id"] = nId;
    jRecord["name"] = szName;
    return jRecord;
}

static bool StoreByEachAndReadByTheOther(sqlite3* pDb) {
    Json::Value jDefinition;
    jDefinition["tool"]["member"]["id"]["cpptype"] = "int";
    jDefinition["tool"]["member"]["name"]["cpptype"] = "string";
    std::string strName = "tool";
    std::string strCreate = "CREATE TABLE tool (id INTEGER PRIMARY KEY, name TEXT);";
    VornJsonDbApi Old(pDb, strName, jDefinition, strCreate);
    Table New;
    Json::Value jByOld = Tool(1, "plane");
    Json::Value jByNew = Tool(2, "100 %d");
    Json::Value jStored;
    if (!New.Open(pDb, strName, jDefinition).Ok() || Old.recCreate(jByOld, jStored) != 0 ||
        !New.Create(jByNew).Ok()) {
        return false;
    }
    Json::Value jReadByNew;
    Json::Value jReadByOld;
    Json::Value jQuery;
    jQuery["id"] = 2;
    if (!New.Get(1, jReadByNew).Ok() || Old.recGetOne(jQuery, jReadByOld) != 1) {
        return false;
    }
    std::printf("new reads %s, old reads %s\n", jReadByNew["name"].asCString(),
                jReadByOld["name"].asCString());
    return jReadByNew == jByOld && jReadByOld == jByNew;
}

int main() {
    blLogToStdout = true;
    sqlite3* pDb = nullptr;
    const bool blGood =
        sqlite3_open(":memory:", &pDb) == SQLITE_OK && StoreByEachAndReadByTheOther(pDb);
    return sqlite3_close(pDb) == SQLITE_OK && blGood ? 0 : 1;
}
