#include "DecimalPoint.h"

#include <langinfo.h>

#include "FindingCodes.h"
#include "Statements.h"

namespace vornjsondb {

namespace {

// A connection of its own: what the answer depends on is SQLite and the locale, which the program
// may change at any time. Without memory nothing is read, which counts as misread.
bool ReadsFractions() {
    sqlite3* pDb = nullptr;
    sqlite3_open(":memory:", &pDb);
    bool blRead = false;
    {
        OwnStatement pStatement;
        Prepare(pDb, R"(SELECT json_extract('{"a":1.5}', '$.a') = 1.5)", pStatement);
        sqlite3_step(pStatement.get());
        blRead = sqlite3_column_int(pStatement.get(), 0) != 0;
    }
    sqlite3_close(pDb);
    return blRead;
}

}  // namespace

bool MisreadsFractions() {
    // NOLINTNEXTLINE(concurrency-mt-unsafe): only setlocale at the same time harms it, as all else
    return *nl_langinfo(RADIXCHAR) != '.' && !ReadsFractions();
}

void CheckFractions(std::string_view strPath, FindingList& vecFindings) {
    if (MisreadsFractions()) {
        Report(vecFindings, FindingCode::kDecimalPoint, strPath,
               "this SQLite misreads fractions inside of JSON, for the program's locale has "
               "another decimal point");
    }
}

}  // namespace vornjsondb
