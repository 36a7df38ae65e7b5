#include "JsonMemory.h"

#include <new>

namespace vornjsondb {

// Out of line: what throws is long, and stands in many functions.
void ThrowBadAlloc() {
    throw std::bad_alloc();
}

}  // namespace vornjsondb
