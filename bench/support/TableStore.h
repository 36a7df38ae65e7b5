// The table of eight as a VORN_JSON_DB::Table, and the same work by hand.

#ifndef VORN_BENCH_SUPPORT_TABLE_STORE_H
#define VORN_BENCH_SUPPORT_TABLE_STORE_H

#include <VornJsonDbTable.h>

#include <array>
#include <string>

#include <json/json.h>
#include <sqlite3.h>

#include "Bench.h"
#include "Capi.h"
#include "JsonText.h"
#include "TypedList.h"

namespace bench {

// Ends the program with the status's message when it is a failure.
void RequireOk(const VORN_JSON_DB::Status& Outcome);

// A database with the table of eight, inside one transaction.
struct TableStore {
    explicit TableStore(int nRows);

    Database Db;
    VORN_JSON_DB::Table Own;
};

// A record as a streaming parser has it: no JSON value, but the list's text.
struct Part {
    bool blActive;
    int nAmount;
    std::string strCity;
    int nId;
    int nLevel;
    std::string strName;
    std::string strNote;
    std::string strTags;
};
Part EightMemberPart(int nId);

// Writes a part through a loader, each member by its setter.
void Load(VORN_JSON_DB::Loader& Into, const Part& One);

// The statements that a Table runs for this work, prepared once and kept, with each value bound and
// each column read by a line of its own: the least that the same work can cost.
class ByHand {
  public:
    // On a database that has the table.
    explicit ByHand(const Database& Db);

    void Create(const Json::Value& jRecord, Json::Value& jStored);
    void Get(int nId, Json::Value& jFound) const;
    void List(Json::Value& jAll) const;
    void Load(const Part& One) const;
    void Load(const Json::Value& jRecord);

  private:
    std::array<KeptStatement, 4> m_aCreate;  // a savepoint, INSERT, SELECT of the row, its release
    KeptStatement m_pGet;
    KeptStatement m_pList;
    TypedList m_Reader;
    JsonText m_Text;
};

}  // namespace bench

#endif  // VORN_BENCH_SUPPORT_TABLE_STORE_H
