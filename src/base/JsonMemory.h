#ifndef VORN_BASE_JSON_MEMORY_H
#define VORN_BASE_JSON_MEMORY_H

#include <json/json.h>

namespace vornjsondb {

[[noreturn]] void ThrowBadAlloc();

}  // namespace vornjsondb

// Ends a public function whose body is a try block:
//
//    int F(Json::Value& jOut) try {
//        ...
//    }
//    VORN_JSON_MEMORY_TO_BAD_ALLOC
//
// for functions that copy texts into JSON values. JsonCpp reports that malloc gave nothing by a
// Json::RuntimeError, the only one that such a copy throws; callers are promised std::bad_alloc.
#define VORN_JSON_MEMORY_TO_BAD_ALLOC   \
    catch (const Json::RuntimeError&) { \
        vornjsondb::ThrowBadAlloc();    \
    }

#endif  // VORN_BASE_JSON_MEMORY_H
