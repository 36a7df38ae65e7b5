// What a Table holds, for all files that are part of it.

#ifndef VORN_TABLE_TABLE_PARTS_H
#define VORN_TABLE_TABLE_PARTS_H

#include <VornJsonDbTable.h>

#include <string>
#include <vector>

#include <sqlite3.h>

#include "../src/base/JsonText.h"
#include "Callable.h"
#include "Members.h"
#include "RecordValues.h"
#include "RowReader.h"
#include "Statements.h"

namespace vornjsondb {
struct RealTable;
}

struct VORN_JSON_DB::Table::Parts {
    Parts(sqlite3* pDbOpen, const std::string& strTable, const Json::Value& jDefinition,
          const Options& HowToOpen, FindingList& vecFindings);

    // Creates the table where Options ask for it, and learns what only the database knows.
    Status Meet();

    vornjsondb::Doing Do(const char* szDo) const { return {szDo, &Of.Table()}; }

    void Learn(const vornjsondb::RealTable& Real);

    // Whether the record leaves it to SQLite to hand out its rowid, of which the member does not
    // hold every value.
    bool HandsOut(const vornjsondb::RecordValues& Record) const {
        return nHandedOut != vornjsondb::Members::kNone &&
               (!Record.Has(nHandedOut) ||
                Record.At(nHandedOut).eKind == vornjsondb::BoundValue::Kind::kNull);
    }

    sqlite3* pDb;
    Options How;
    vornjsondb::Members Of;
    std::vector<std::string> vecKeyNames;
    size_t nHandedOut =
        vornjsondb::Members::kNone;  // the member that is the rowid, if it is narrower
    std::string strRowid;  // a name of the rowid that no column has; empty: rows have none
    bool blFails = false;  // a failed statement may leave a part of what it did
    bool blView = false;   // whose triggers do the work, of which SQLite counts nothing
    vornjsondb::Statements Kept;
    vornjsondb::JsonCodec Codec;
    vornjsondb::RowReader WholeRow;
    vornjsondb::RecordValues Values;  // of the record that is being written
    vornjsondb::RecordValues Wanted;  // the key that is being looked for
    int nReading = 0;                 // callbacks that are running
    const void* pRunning = nullptr;   // these parts or a Loader's, of whom a call is running
};

namespace vornjsondb {

using VORN_JSON_DB::OnDuplicate;
using VORN_JSON_DB::Written;
using Table = VORN_JSON_DB::Table;

// A failure when this SQLite, which may be another than the one compiled for, is too old.
Status CheckVersion(int nVersion, const char* szVersion, const Doing& What);

// A call that is running. In it SQLite may call the program, by an SQL function or a hook, and what
// calls the same Table from there must find it busy: values and statements are in use.
class Running {
  public:
    Running(Table::Parts& Of, const void* pWho) : m_Of(Of) { m_Of.pRunning = pWho; }
    Running(const Running&) = delete;
    Running& operator=(const Running&) = delete;
    ~Running() { m_Of.pRunning = nullptr; }

  private:
    Table::Parts& m_Of;
};

// A failure when the Table is not open, when a call of it is running, or when it is to be changed
// by a callback that reads from it.
Status CheckState(const Table::Parts* pParts, const char* szDo, bool blChange);

// What each public call begins with: fnCall, with the parts and what they are about to do, where
// the state allows it.
Status Guarded(Table::Parts* pParts, const char* szDo, bool blChange,
               Callable<Status(Table::Parts&, const Doing&)> fnCall);

}  // namespace vornjsondb

#endif  // VORN_TABLE_TABLE_PARTS_H
