// What a Loader holds.

#ifndef VORN_TABLE_LOADER_PARTS_H
#define VORN_TABLE_LOADER_PARTS_H

#include <map>
#include <memory>
#include <string>
#include <vector>

#include "RecordWriter.h"

struct VORN_JSON_DB::Loader::Parts {
    Parts(Table::Parts& To, const LoadOptions& HowToLoad);

    // Whether a record can be written now; if not, State tells why: the failure that ended the
    // load, or a callback that reads from the table.
    bool IsReady() const { return Ended.Ok() && Into.nReading == 0; }
    Status State() const;

    // Writes what Values hold, if nothing is wrong with them, and starts the next record.
    Status EndRecord(FindingList& vecFindings);
    Status Commit();

    Table::Parts& Into;
    const LoadOptions How;
    vornjsondb::RecordValues Values;
    std::vector<std::string> vecBytes;   // texts and blobs that Values point to
    std::map<size_t, Finding> mapWrong;  // by member; those that are none of a member's come last
    std::unique_ptr<Json::CharReader> pReader;  // for SetJson, which makes it
    LoadCounts Now;

  private:
    Status BeginIfNone(const vornjsondb::Doing& What);
    Status Write(FindingList& vecFindings);
    Status Fail(const Status& Outcome);
    Status End(const Status& Outcome);

    LoadCounts Kept;  // when it was committed last
    Status Ended;
    Transaction All;
    bool blCallers = false;  // whether it is inside of one of the caller's
    vornjsondb::RecordWriter Writer;
};

#endif  // VORN_TABLE_LOADER_PARTS_H
