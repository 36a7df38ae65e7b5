// What a Loader holds.

#ifndef VORN_TABLE_LOADER_PARTS_H
#define VORN_TABLE_LOADER_PARTS_H

#include <memory>
#include <vector>

#include "RecordWriter.h"

struct VORN_JSON_DB::Loader::Parts {
    Parts(std::shared_ptr<Table::Parts> pTo, const LoadOptions& HowToLoad);

    // Whether a record can be written now; if not, State tells why: the failure that ended the
    // load, a callback that reads from the table, or a call that has not returned.
    bool IsReady() const { return Ended.Ok() && Into.nReading == 0 && Into.pRunning == nullptr; }

    // Whether a call of this loader is running, which uses the values.
    bool IsRunning() const { return Into.pRunning == this; }
    Status State() const;

    // What is wrong with the next record: with a member's last value, or at the two places behind
    // the members' with no member.
    size_t UnknownPlace() const { return Into.Of.Size(); }
    size_t WholePlace() const { return Into.Of.Size() + 1; }
    void SetWrong(size_t nPlace, FindingList& vecFindings);
    void SetRight(size_t nPlace);
    void TakeWrong(FindingList& vecFindings);

    // Writes what Values hold, if nothing is wrong with them, and starts the next record.
    Status EndRecord(FindingList& vecFindings);
    Status Commit();

    const std::shared_ptr<Table::Parts> pOwn;  // which may be no Table's any more
    Table::Parts& Into;
    const LoadOptions How;
    vornjsondb::RecordValues Values;
    size_t nWrong = 0;                          // places with a finding
    std::unique_ptr<Json::CharReader> pReader;  // for SetJson, which makes it
    LoadCounts Now;

  private:
    Status Begin(const vornjsondb::Doing& What);
    Status Write(FindingList& vecFindings);
    Status Fail(const Status& Outcome);
    Status End(const Status& Outcome);

    FindingList vecWrong;  // by place; without a code where nothing is wrong
    LoadCounts Kept;       // when it was committed last
    Status Ended;
    Transaction All;
    bool blCallers = false;  // whether it is inside of one of the caller's
    vornjsondb::RecordWriter Writer;
};

#endif  // VORN_TABLE_LOADER_PARTS_H
