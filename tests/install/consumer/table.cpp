// A program that knows the installed static library only: saves a record and gets it back.
#include <VornJsonDbTable.h>

#include <cstdio>

static VORN_JSON_DB::Status SaveAndGet(sqlite3* pDb) {
    Json::Value jDefinition;
    jDefinition["tool"]["key"] = "id";
    jDefinition["tool"]["member"]["id"]["cpptype"] = "int";
    jDefinition["tool"]["member"]["name"]["cpptype"] = "string";
    VORN_JSON_DB::Options How;
    How.blCreateTable = true;
    VORN_JSON_DB::Table Tools;
    VORN_JSON_DB::Status Outcome = Tools.Open(pDb, "tool", jDefinition, How);
    Json::Value jRecord;
    jRecord["id"] = 7;
    jRecord["name"] = "Jack's plane";
    if (Outcome.Ok()) {
        Outcome = Tools.Create(jRecord);
    }
    Json::Value jFound;
    if (Outcome.Ok()) {
        Outcome = Tools.Get(7, jFound);
    }
    std::printf("consumer: %s\n", jFound["name"].asCString());
    return Outcome;
}

int main() {
    sqlite3* pDb = nullptr;
    bool blGood = false;
    if (sqlite3_open(":memory:", &pDb) == SQLITE_OK) {
        const VORN_JSON_DB::Status Outcome = SaveAndGet(pDb);
        blGood = Outcome.Ok();
        std::printf("%s", Outcome.Message().c_str());
    }
    return sqlite3_close(pDb) == SQLITE_OK && blGood ? 0 : 1;
}
