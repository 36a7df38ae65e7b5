// JSON values that no parser makes but a host's code can.

#ifndef VORNJSONDB_FUZZ_HOSTILEVALUE_H
#define VORNJSONDB_FUZZ_HOSTILEVALUE_H

#include <cstddef>
#include <cstdint>

#include <json/json.h>

namespace fuzzhost {

// Bytes into a value: the same bytes always give the same one, and any bytes give some. There are
// arrays with holes, comments, reals that are whole, huge or no number at all, unsigned numbers
// beyond the signed ones, names and texts with NUL and with broken UTF-8, texts that are not
// copied, and deep nesting. HostileValue.cpp says what each byte means.
Json::Value HostileValue(const uint8_t* pData, size_t nSize);

}  // namespace fuzzhost

#endif  // VORNJSONDB_FUZZ_HOSTILEVALUE_H
