// JSON and handles for everybody who tries the library out: tests, campaigns, fuzz targets and
// benchmarks. Needs nothing but the library, JsonCpp and SQLite.
#ifndef VORNJSONDB_TESTS_SUPPORT_JSONHELPERS_H
#define VORNJSONDB_TESTS_SUPPORT_JSONHELPERS_H

#include <VornJsonDbApi.h>

#include <memory>
#include <string>

#include <json/json.h>
#include <sqlite3.h>

namespace jsonhelpers {

// Strict JSON, in which only a key may come twice; false when the text is none.
bool Parse(const std::string& strText, Json::Value& jOut);

// What JsonCpp's reader makes of a text in its usual mode. Where it gives up, what it had read.
Json::Value ReadLeniently(const std::string& strText);

// One line, UTF-8, without comments, by JsonCpp's writer.
std::string Compact(const Json::Value& jValue);

// The kinds of a value and of all that is in it: equality takes 1 and 1u for the same.
std::string KindsOf(const Json::Value& jValue);

// {"<table>":{"member":{"<name>":{"cpptype":"<type>"},...}}} from "name:type,name:type".
Json::Value Definition(const std::string& strTable, const std::string& strMembers);

// The constructor takes its arguments by reference; this one takes them as they come.
std::unique_ptr<VornJsonDbApi> NewHandle(sqlite3* pDb, std::string strName, Json::Value jTableDef,
                                         std::string strSqlCreate);

}  // namespace jsonhelpers

#endif  // VORNJSONDB_TESTS_SUPPORT_JSONHELPERS_H
