#include "Replacements.h"

#include <algorithm>

namespace VORN_JSON_DB::Cli {

Replacements::Replacements(sqlite3* pDb, const std::string& strTable) {
    const bool blReplaces =
        !Texts(pDb,
               "SELECT 1 FROM sqlite_master WHERE type = 'table' AND name = ?1 COLLATE NOCASE AND "
               "sql LIKE '%CONFLICT%REPLACE%'",
               strTable)
             .empty();
    if (blReplaces) {
        m_pCount = Prepare(pDb, "SELECT count(*) FROM " + Quoted(strTable));
        m_nBefore = Count();
    }
}

std::int64_t Replacements::Count() const {
    sqlite3_reset(m_pCount.get());
    Step(m_pCount.get());
    const std::int64_t nCount = sqlite3_column_int64(m_pCount.get(), 0);
    sqlite3_reset(m_pCount.get());
    return nCount;
}

std::int64_t Replacements::Gone(std::int64_t nInserted) const {
    return m_pCount ? std::max<std::int64_t>(0, m_nBefore + nInserted - Count()) : 0;
}

std::string GoneText(std::int64_t nGone) {
    return nGone == 0 ? ""
                      : "; " + std::to_string(nGone) +
                            (nGone == 1 ? " other record is" : " other records are") +
                            " gone, by the table's own ON CONFLICT REPLACE";
}

}  // namespace VORN_JSON_DB::Cli
