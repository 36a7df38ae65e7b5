// Names that a VornJsonDbApi can use.

#ifndef VORN_TABLE_BARE_NAMES_H
#define VORN_TABLE_BARE_NAMES_H

#include <memory>
#include <string>

#include <sqlite3.h>

namespace vornjsondb {

// It writes names into SQL as they stand. Which words SQLite then takes for something else depends
// on its release, so SQLite is asked, on a database of its own.
class BareNames {
  public:
    BareNames();

    // Whether SQL reads the name without quotes as that name.
    bool Has(const std::string& strName) const;

  private:
    struct Close {
        void operator()(sqlite3* pDb) const { sqlite3_close(pDb); }
    };
    std::unique_ptr<sqlite3, Close> m_pDb;
};

}  // namespace vornjsondb

#endif  // VORN_TABLE_BARE_NAMES_H
