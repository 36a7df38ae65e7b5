// What the fuzz targets do with JSON values, with readers and writers of their own.

#ifndef VORNJSONDB_FUZZ_JSONVALUES_H
#define VORNJSONDB_FUZZ_JSONVALUES_H

#include <cstddef>
#include <cstdint>
#include <string>

#include <json/json.h>

namespace fuzzhost {

// Whether these bytes are a hostile value: JSON text does not begin with a NUL.
bool IsHostile(const uint8_t* pData, size_t nSize);

// The value that an input stands for: a hostile one, or what its strict JSON says. False when it
// is neither.
bool TakeValue(const uint8_t* pData, size_t nSize, Json::Value& jOut);

// What JsonCpp's reader makes of a text, in its usual mode. Where it gives up, what it had read.
Json::Value ReadLeniently(const char* szText);

// One line of JSON, without comments.
std::string Compact(const Json::Value& jValue);

// The same value with a null in each hole, which is what a hole means.
Json::Value WithoutHoles(const Json::Value& jValue);

// Whether both are the same in all that a host can see: kinds, holes, comments, the bits of
// numbers. Unlike "==", a value that is no number is the same as itself.
bool Same(const Json::Value& jLeft, const Json::Value& jRight);

// {"<table>":{"member":{"<name>":{"cpptype":"<type>"},...}}} from "name:type,name:type".
Json::Value Definition(const std::string& strTable, const std::string& strMembers);

}  // namespace fuzzhost

#endif  // VORNJSONDB_FUZZ_JSONVALUES_H
