// Records that a table's own ON CONFLICT clause removes.

#ifndef VORNJSONDB_CLI_REPLACEMENTS_H
#define VORNJSONDB_CLI_REPLACEMENTS_H

#include <cstdint>
#include <string>

#include "Sql.h"

namespace VORN_JSON_DB::Cli {

// Of a table that by its own ON CONFLICT REPLACE removes records to make room for others, which
// SQLite counts nowhere. Made within the transaction that changes it.
class Replacements {
  public:
    Replacements(sqlite3* pDb, const std::string& strTable);
    // How many went away, where so many came.
    std::int64_t Gone(std::int64_t nInserted) const;

  private:
    std::int64_t Count() const;

    Statement m_pCount;  // null for all other tables
    std::int64_t m_nBefore = 0;
};
// "; 1 other record is gone, ..."; nothing for none.
std::string GoneText(std::int64_t nGone);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_REPLACEMENTS_H
