// Records from a reader into a table.

#ifndef VORNJSONDB_CLI_INPUT_LOADER_SINK_H
#define VORNJSONDB_CLI_INPUT_LOADER_SINK_H

#include <VornJsonDbTable.h>

#include <functional>
#include <string>
#include <vector>

#include "../../src/schema/MemberType.h"
#include "ErrorFile.h"
#include "Inference.h"
#include "Sink.h"

namespace VORN_JSON_DB::Cli {

class LoaderSink : public Sink {
  public:
    // The first bad record is an Error, unless pErrors takes it. pSeen is told of all records.
    // fnBefore is called before a record is stored, fnAfter after each, and says whether to go on.
    // blMode: the call says what to do with a key that is there.
    LoaderSink(const Table& Of, Loader& Into, ErrorFile* pErrors, Inference* pSeen, bool blMode,
               std::function<void()> fnBefore, std::function<bool()> fnAfter);

    void BeginInput(const std::string& strName, bool blCells);

    void NewMember(std::string_view strName) override;
    void Take(size_t nMember, const Value& Given) override;
    bool EndRecord(const Place& Where) override;
    bool BadRecord(const Place& Where, const std::string& strReason) override;

    // By member of the table: whether a null came.
    const std::vector<bool>& NullsGiven() const { return m_vecNulls; }

  private:
    struct Column {
        std::string strName;
        int nLoader;  // -1: the table lacks it
        vornjsondb::BoundKind eKind;
        bool blNumbers;  // it turns texts into numbers
    };

    void Set(const Column& Into, const Value& Given);
    void SetText(const Column& Into, std::string_view strText);
    void SetCell(const Column& Into, std::string_view strCell);
    void SetAsJson(const Column& Into, const Value& Given);
    bool Decode(const Column& Into, std::string_view strBegin, std::string_view strJson);
    void SetObject(const Column& Into, std::string_view strJson);
    void SetWide(const Column& Into, std::string_view strNumber);
    void NotStored(const Place& Where, const std::string& strReason);

    const Table& m_Of;
    Loader& m_Into;
    ErrorFile* const m_pErrors;
    Inference* const m_pSeen;
    const bool m_blMode;
    const std::function<void()> m_fnBefore;
    const std::function<bool()> m_fnAfter;
    std::string m_strInput;
    std::string m_strBytes;  // of a value that came encoded
    bool m_blCells = false;
    std::vector<Column> m_vecColumns;  // of the input
    const std::vector<std::string> m_vecNumberColumns;
    std::vector<bool> m_vecNulls;
    std::string m_strUnknown;  // a member that the table lacks
    bool m_blUnknown = false;
    std::string m_strJson;
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_LOADER_SINK_H
