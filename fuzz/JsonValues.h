// What the fuzz targets do with JSON values beyond what all tests share.

#ifndef VORNJSONDB_FUZZ_JSONVALUES_H
#define VORNJSONDB_FUZZ_JSONVALUES_H

#include <cstddef>
#include <cstdint>

#include <json/json.h>

#include "../tests/support/JsonHelpers.h"

namespace fuzzhost {

using jsonhelpers::Compact;
using jsonhelpers::Definition;
using jsonhelpers::ReadLeniently;

// Whether these bytes are a hostile value: JSON text does not begin with a NUL.
bool IsHostile(const uint8_t* pData, size_t nSize);

// The value that an input stands for: a hostile one, or what its strict JSON says. False when it
// is neither.
bool TakeValue(const uint8_t* pData, size_t nSize, Json::Value& jOut);

// The same value with a null in each hole, which is what a hole means.
Json::Value WithoutHoles(const Json::Value& jValue);

// Whether both are the same in all that a host can see: kinds, holes, comments, the bits of
// numbers. Unlike "==", a value that is no number is the same as itself.
bool Same(const Json::Value& jLeft, const Json::Value& jRight);

}  // namespace fuzzhost

#endif  // VORNJSONDB_FUZZ_JSONVALUES_H
