// What the fuzz targets of VORN_JSON_DB::Table share: a table that stays open from input to input,
// and the promises that each of its calls must keep.

#ifndef VORNJSONDB_FUZZ_TABLEHOST_H
#define VORNJSONDB_FUZZ_TABLEHOST_H

#include <VornJsonDbTable.h>

#include <functional>
#include <string>

#include "FuzzHost.h"

namespace fuzzhost {

// A table "t" in a database of its own. Its statements stay prepared, which is half of the speed;
// rows that an input has changed are put back before the next one.
class TableHost {
  public:
    // Members as "name:type,name:type". szValues are the rows as SQL has them, or nothing.
    TableHost(const char* szMembers, const char* szKey, const char* szValues,
              const VORN_JSON_DB::Options& How);

    // Begins an input.
    VORN_JSON_DB::Table& Begin();

    enum class Use {
        kRead,   // at most one statement, which changes nothing
        kChange  // statements that change the table, and savepoints
    };

    // Runs a call that may do no more than that, and answers as documented.
    VORN_JSON_DB::Status Call(Use eUse, const std::function<VORN_JSON_DB::Status()>& fn);

    // One value of the table, by a statement of the host's own.
    std::string Ask(const std::string& strSql) { return m_Db.Run(strSql); }

    Database& Db() { return m_Db; }

  private:
    static int Authorize(void* pSelf, int nAction, const char* szFirst, const char* szSecond,
                         const char* szDatabase, const char* szTrigger);
    static int Trace(unsigned nKind, void* pSelf, void* pStatement, void* pText);

    Database m_Db;
    VORN_JSON_DB::Table m_Table;
    std::string m_strFill;
    int m_nFilled = 0;  // SQLite's count of changes when the rows were in order
    Use m_eUse = Use::kChange;
    bool m_blFenced = false;
    int m_nStatements = 0;
};

}  // namespace fuzzhost

#endif  // VORNJSONDB_FUZZ_TABLEHOST_H
