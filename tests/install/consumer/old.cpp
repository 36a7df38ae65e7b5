// A program that knows the installed library only: stores a record and fetches it back.
#include <VornJsonDbApi.h>

#include <cstdio>
#include <string>

static int StoreAndFetch(sqlite3* pDb) {
    Json::Value jDefinition;
    jDefinition["tool"]["member"]["id"]["cpptype"] = "int";
    jDefinition["tool"]["member"]["name"]["cpptype"] = "string";
    std::string strName = "tool";
    std::string strCreate = "CREATE TABLE tool (id INTEGER PRIMARY KEY, name TEXT);";
    VornJsonDbApi tool(pDb, strName, jDefinition, strCreate);

    Json::Value jRecord;
    jRecord["id"] = 7;
    jRecord["name"] = "Jack's plane";
    Json::Value jStored;
    if (tool.recCreate(jRecord, jStored) != 0) {
        return 1;
    }
    Json::Value jQuery;
    jQuery["id"] = 7;
    Json::Value jFound;
    if (tool.recGetOne(jQuery, jFound) != 1 || jFound != jRecord || jStored != jRecord) {
        return 1;
    }
    std::printf("consumer: %s\n", jFound["name"].asCString());
    return 0;
}

int main() {
    blLogToStdout = true;
    sqlite3* pDb = NULL;
    int nResult = 1;
    if (sqlite3_open(":memory:", &pDb) == SQLITE_OK) {
        nResult = StoreAndFetch(pDb);
    }
    return sqlite3_close(pDb) == SQLITE_OK ? nResult : 1;
}
