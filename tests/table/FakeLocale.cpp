#include "FakeLocale.h"

#include <langinfo.h>
#include <locale.h>

#include <sqlite3.h>

namespace {

bool g_blComma = false;

void ReadWhole(sqlite3_context* pContext, int, sqlite3_value**) {
    sqlite3_result_double(pContext, 1);
}

int Misread(sqlite3* pDb) {
    return sqlite3_create_function(pDb, "json_extract", -1, SQLITE_UTF8, nullptr, ReadWhole,
                                   nullptr, nullptr);
}

}  // namespace

FakeLocale::FakeLocale(bool blMisread) {
    g_blComma = true;
    if (blMisread) {
        sqlite3_auto_extension(reinterpret_cast<void (*)()>(Misread));
    }
}

FakeLocale::~FakeLocale() {
    g_blComma = false;
    sqlite3_reset_auto_extension();
}

// Found before the C library's own.
extern "C" char* nl_langinfo(nl_item nItem) noexcept {
    static char s_szComma[] = ",";
    static locale_t s_Plain = newlocale(LC_ALL_MASK, "C", nullptr);
    return g_blComma && nItem == RADIXCHAR ? s_szComma : nl_langinfo_l(nItem, s_Plain);
}
