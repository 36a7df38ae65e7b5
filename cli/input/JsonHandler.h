// From what RapidJSON reports to records.

#ifndef VORNJSONDB_CLI_INPUT_JSON_HANDLER_H
#define VORNJSONDB_CLI_INPUT_JSON_HANDLER_H

#include <rapidjson/reader.h>

#include <cstdint>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "MemberNames.h"
#include "Readers.h"
#include "Sink.h"

namespace VORN_JSON_DB::Cli {

// Where the reader is. Asked for when a record begins and when it ends.
class JsonPosition {
  public:
    JsonPosition() = default;
    virtual ~JsonPosition() = default;
    JsonPosition(const JsonPosition&) = delete;
    JsonPosition& operator=(const JsonPosition&) = delete;

    virtual void BeginRecord(std::string_view strTaken) = 0;  // what was read of it just now
    virtual std::int64_t RecordLine() = 0;
    virtual std::string_view RecordText() = 0;  // up to here
};

class JsonHandler : public rapidjson::BaseReaderHandler<rapidjson::UTF8<>, JsonHandler> {
  public:
    // blLists: the first value may be a list of records, or an object with such a list.
    JsonHandler(Sink& To, JsonPosition& At, bool blLists);

    bool Null();
    bool Bool(bool blValue);
    bool RawNumber(const char* pText, rapidjson::SizeType nText, bool blCopy);
    bool String(const char* pText, rapidjson::SizeType nText, bool blCopy);
    bool Key(const char* pText, rapidjson::SizeType nText, bool blCopy);
    bool StartObject() { return Open('{'); }
    bool EndObject(rapidjson::SizeType) { return Close('}'); }
    bool StartArray() { return Open('['); }
    bool EndArray(rapidjson::SizeType) { return Close(']'); }

    // Whether there may be escapes in what follows.
    void MayHaveEscapes(bool blMay) { m_blEscapes = blMay; }

    // A value that could not be read to its end. Returns whether to go on after it.
    bool Broken(const std::string& strReason);

    bool WasStopped() const { return m_blStopped; }
    bool IsInRecord() const { return m_blInRecord; }
    bool IsListDone() const { return m_nRecordLevel > 0 && m_nLevel == 0; }
    std::int64_t Records() const { return m_nRecord; }
    const std::string& Reason() const { return m_strReason; }  // why a callback ended it
    std::string ListName() const { return m_nRecordLevel == 2 ? m_strListName : ""; }

  private:
    enum class List { kNone, kMayBe, kNamed, kBegun };  // how much of {"name": [{ was seen

    bool OfMember() const { return m_nLevel == m_nRecordLevel + 1; }
    bool IsNested() const { return m_nLevel > m_nRecordLevel + 1; }
    bool Scalar(const Value& Given, const char* szKind) {
        if (m_nLevel == m_nRecordLevel) {
            return NoRecord(Given, szKind);
        }
        if (m_strReason.empty()) {
            m_To.Take(m_nMember, Given);
        }
        return true;
    }
    bool Open(char cBracket);
    bool Close(char cBracket);
    bool IsWrappedList(char cBracket);
    bool NoRecord(const Value& Given, const char* szKind);
    void BeginRecord(std::string_view strTaken);
    bool EndRecord();
    void Blame(std::string strReason);
    bool CheckText(std::string_view strText) { return !m_blEscapes || CheckEscapes(strText); }
    bool CheckEscapes(std::string_view strText);
    void NestedKey(std::string_view strName);
    bool KeyBesideList(std::string_view strName);
    bool KeyTwice(std::string_view strName);
    void SeparateInJson();
    void AppendToJson(std::string_view strText);
    void AppendTextToJson(std::string_view strText);

    Sink& m_To;
    JsonPosition& m_At;
    MemberNames m_Names;
    List m_eList;
    int m_nLevel = 0;        // how many brackets are open
    int m_nRecordLevel = 0;  // of them, around each record
    bool m_blInRecord = false;
    bool m_blEscapes = true;
    bool m_blStopped = false;
    std::int64_t m_nRecord = 0;
    size_t m_nMember = 0;
    std::string m_strJson;  // of the member's value, where it is an object or a list
    std::vector<std::set<std::string, std::less<>>> m_vecNested;  // names of its open objects
    std::string m_strReason;                                      // what is wrong with the record
    std::string m_strListName;
};

// The reader's own limits and checks.
constexpr unsigned kJsonFlags = rapidjson::kParseValidateEncodingFlag |
                                rapidjson::kParseNumbersAsStringsFlag |
                                rapidjson::kParseStopWhenDoneFlag;

// What RapidJSON found wrong.
const char* JsonErrorText(rapidjson::ParseErrorCode eCode);

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_JSON_HANDLER_H
