// What the samples of docs/table.md go on from: the table of the page's first program, open, with
// its three records, and the two helpers that the page names. Each sample gets a new database.

#include <VornJsonDbApi.h>

#include <VornJsonDbTable.h>

#include <cmath>
#include <cstdlib>
#include <fstream>
#include <iostream>
#include <sstream>

using namespace VORN_JSON_DB;

static const char kDefinition[] = R"({"device": {"key": "id", "member": {
    "id":    {"cpptype": "int"},
    "name":  {"cpptype": "string", "notNull": true},
    "place": {"cpptype": "Json::objectValue"},
    "room":  {"cpptype": "string"},
    "tags":  {"cpptype": "Json::arrayValue"},
    "watts": {"cpptype": "int", "cppDefaultValue": 0}}}})";

static const char kDevices[] = R"([
    {"id": 1, "name": "Heater", "room": "hall", "watts": 1500, "tags": ["warm", "loud"]},
    {"id": 2, "name": "lamp 50%", "room": "attic", "watts": 8, "place": {"floor": 2}},
    {"id": 3, "name": "Lamp", "watts": 60, "tags": ["warm"], "place": {"floor": 0}}])";

static Json::Value Parse(const std::string& strText) {
    Json::Value jValue;
    std::istringstream(strText) >> jValue;
    return jValue;
}

static std::string Text(const Json::Value& jValue) {
    Json::StreamWriterBuilder Compact;
    Compact["indentation"] = "";
    return Json::writeString(Compact, jValue);
}

static void Check(const Status& Outcome) {
    if (!Outcome.Ok()) {
        std::cout << Outcome.Message() << std::endl;
        std::exit(1);
    }
}

static void RunSample(int nLine, void (*fnSample)(sqlite3*, Table&)) {
    std::cout << "== line " << nLine << std::endl;
    sqlite3* pDb = nullptr;
    if (sqlite3_open(":memory:", &pDb) != SQLITE_OK) {
        std::exit(1);
    }
    {
        Table Devices;
        Options How;
        How.blCreateTable = true;
        Check(Devices.Open(pDb, "device", Parse(kDefinition), How));
        for (const Json::Value& jDevice : Parse(kDevices)) {
            Check(Devices.Create(jDevice));
        }
        fnSample(pDb, Devices);
    }
    if (sqlite3_close(pDb) != SQLITE_OK) {
        std::exit(1);
    }
}
