// Whether an index could find what a query selects.

#ifndef VORN_TABLE_INDEX_ADVICE_H
#define VORN_TABLE_INDEX_ADVICE_H

#include <VornJsonDbTable.h>

#include <string>
#include <vector>

#include "../src/base/JsonText.h"
#include "Members.h"

namespace vornjsondb {

// Members, or paths, of which an index each would spare going through all records; none: nothing
// would.
std::vector<std::string> IndexAdvice(const VORN_JSON_DB::Query& Which, const Members& Of,
                                     JsonCodec& Codec);

}  // namespace vornjsondb

#endif  // VORN_TABLE_INDEX_ADVICE_H
