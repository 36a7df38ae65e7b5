#ifndef VORN_BASE_JSON_MEMORY_H
#define VORN_BASE_JSON_MEMORY_H

#include <new>

#include <json/json.h>

namespace vornjsondb {

[[noreturn]] void ThrowBadAlloc();

// Makes the value that fnMake returns in place of null, which holds nothing to be released: to make
// it elsewhere and to swap takes twice as long, and a row is made of such values. When fnMake
// throws, null is left.
template <typename Function>
void MakeInPlace(Json::Value& jNull, Function&& fnMake) {
    try {
        // mutate(doubled): what is not released is only lost.
        new (&jNull) Json::Value(fnMake());
    } catch (...) {
        // mutate(dropped, doubled): in a row it is only destroyed, and what was there may be
        // nothing. Pinned by MakeInPlaceTest.ValueThatCannotBeMadeLeavesNull.
        new (&jNull) Json::Value();
        throw;
    }
}

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
