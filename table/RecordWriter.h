// One record into the table, as told for a key that is there already.

#ifndef VORN_TABLE_RECORD_WRITER_H
#define VORN_TABLE_RECORD_WRITER_H

#include <string>
#include <string_view>

#include "RecordValues.h"
#include "TableParts.h"

namespace vornjsondb {

// For one record after the other: while their members are the same, so are the statements.
class RecordWriter {
  public:
    // Writes what Values hold. All modes but kStop need a key, and values for it.
    RecordWriter(Table::Parts& Into, RecordValues& Values) : m_Into(Into), m_Values(Values) {}
    RecordWriter(const RecordWriter&) = delete;
    RecordWriter& operator=(const RecordWriter&) = delete;
    ~RecordWriter() = default;

    // Fills defaults where the record is new. Changes the table by one statement, which is whole or
    // nothing by itself; what another may change between it and the look before, only a transaction
    // tells.
    Status Write(OnDuplicate eOnDuplicate, const Doing& What, Written& eWritten);

    // Whether a failure has stored the record all the same, which only its transaction can undo.
    bool HasStored() const { return m_blStored; }

  private:
    enum class Verb { kInsert, kInsertNew, kReplace, kUpdate, kFind };
    static std::string_view LetterOf(Verb eVerb) {
        return {&"INRUF"[static_cast<size_t>(eVerb)], 1};
    }

    int Run(Verb eVerb, int& nRows);
    int Take(Verb eVerb, Statement& Held);
    std::string Sql(Verb eVerb) const;
    Status WithValues(const Status& Failed) const;
    Status CheckRowid(const Doing& What);

    Table::Parts& m_Into;
    RecordValues& m_Values;
    bool m_blStored = false;
    Statement m_aHeld[5];                 // the last one of each verb
    const Statement* m_pBound = nullptr;  // the one of them that has the values before bound
};

// Reports a record of which nothing is left once its unknown members are left out.
void CheckEmpty(const RecordValues& Values, FindingList& vecFindings);

// A failure for a number that is none of its values.
Status CheckMode(OnDuplicate eOnDuplicate, const Doing& What);

// A failure where no row was changed because the table has become a view since it was opened:
// SQLite counts nothing of what is done to one.
Status CheckTable(const Table::Parts& Of, const Doing& What);

// " WHERE "task"."id" = ?": parameters in the key's order.
std::string WhereKey(const Members& Of);

}  // namespace vornjsondb

#endif  // VORN_TABLE_RECORD_WRITER_H
