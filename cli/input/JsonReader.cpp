// JSON as one text: a list, a list inside of an object, or objects one after another.

#include <array>
#include <cstring>

#include "JsonHandler.h"

namespace VORN_JSON_DB::Cli {

namespace {

// The input as RapidJSON takes it: byte by byte, a block in memory. A NUL byte means the end to it,
// so a real one is told apart by IsAtEnd.
class BlockStream : public JsonPosition {
  public:
    using Ch = char;

    BlockStream(ByteSource& From, bool blKeepText) : m_From(From), m_blKeepText(blKeepText) {
        Refill();
    }

    Ch Peek() const { return *m_pNext; }
    Ch Take() {
        const Ch cTaken = *m_pNext;
        if (m_pNext != m_pEnd && ++m_pNext == m_pEnd) {
            Refill();
        }
        return cTaken;
    }
    size_t Tell() const { return m_nBefore + static_cast<size_t>(m_pNext - m_acBlock.data()); }

    // For writing in place, which is not asked of this stream.
    Ch* PutBegin() { return nullptr; }
    void Put(Ch) {}
    size_t PutEnd(Ch*) { return 0; }

    bool IsAtEnd() const { return m_pNext == m_pEnd; }
    bool IsTooLong() const { return m_blTooLong; }
    std::int64_t Line();
    void BetweenRecords() { m_nRecordBegin = Tell(); }

    void BeginRecord(std::string_view strTaken) override;
    std::int64_t RecordLine() override { return m_nRecordLine; }
    std::string_view RecordText() override;

  private:
    void Refill();
    void Keep();

    ByteSource& m_From;
    const bool m_blKeepText;
    std::array<char, ByteSource::kBlock + 1> m_acBlock;
    const char* m_pNext = m_acBlock.data();
    const char* m_pEnd = m_acBlock.data();
    const char* m_pCounted = m_acBlock.data();  // up to here lines are counted
    size_t m_nBefore = 0;                       // bytes of earlier blocks
    size_t m_nRecordBegin = 0;
    std::int64_t m_nLine = 1;
    std::int64_t m_nRecordLine = 1;
    bool m_blTooLong = false;
    std::string m_strKept;  // of the record, from earlier blocks
};

std::int64_t BlockStream::Line() {
    while (const void* pFound =
               std::memchr(m_pCounted, '\n', static_cast<size_t>(m_pNext - m_pCounted))) {
        ++m_nLine;
        m_pCounted = static_cast<const char*>(pFound) + 1;
    }
    m_pCounted = m_pNext;
    return m_nLine;
}

void BlockStream::BeginRecord(std::string_view strTaken) {
    m_nRecordLine = Line();
    m_nRecordBegin = Tell();
    if (m_blKeepText) {
        m_strKept = strTaken;
    }
}

// The part of the record that is in this block.
void BlockStream::Keep() {
    const size_t nBegin = m_nRecordBegin > m_nBefore ? m_nRecordBegin - m_nBefore : 0;
    const char* const pBegin = m_acBlock.data() + nBegin;
    if (m_blKeepText && pBegin < m_pNext) {
        m_strKept.append(pBegin, m_pNext);
    }
}

std::string_view BlockStream::RecordText() {
    if (!m_blKeepText) {
        return {};
    }
    Keep();
    return m_strKept;
}

void BlockStream::Refill() {
    Line();
    Keep();
    m_nBefore += static_cast<size_t>(m_pEnd - m_acBlock.data());
    m_blTooLong = m_nBefore - m_nRecordBegin > kMostRecordBytes;
    const size_t nRead = m_blTooLong ? 0 : m_From.Read(m_acBlock.data(), ByteSource::kBlock);
    m_pNext = m_pCounted = m_acBlock.data();
    m_pEnd = m_pNext + nRead;
    m_acBlock[nRead] = '\0';
}

// They may be more than a record may have.
void SkipBlanks(BlockStream& Stream) {
    Stream.BetweenRecords();
    while (std::string_view(" \t\r\n").find(Stream.Peek()) != std::string_view::npos) {
        Stream.Take();
        Stream.BetweenRecords();
    }
}

std::string Problem(const rapidjson::ParseResult& Parsed, const BlockStream& Stream,
                    const JsonHandler& Handler) {
    const std::string strRecord = "record " + std::to_string(Handler.Records());
    if (Parsed.Code() == rapidjson::kParseErrorTermination) {
        return Handler.Reason();
    }
    if (Stream.IsTooLong()) {
        return strRecord + " is longer than " + std::to_string(kMostRecordBytes) + " bytes";
    }
    if (Stream.Peek() == '\0') {
        if (!Stream.IsAtEnd()) {
            return "there is a NUL byte";
        }
        return Handler.IsInRecord() ? "the input ends inside of " + strRecord
                                    : "the input ends inside of the list, after " + strRecord;
    }
    return JsonErrorText(Parsed.Code());
}

}  // namespace

ReadOutcome ReadJson(ByteSource& From, const ReadOptions& How, Sink& To) {
    BlockStream Stream(From, How.blKeepText);
    JsonHandler Handler(To, Stream, true);
    rapidjson::Reader Reader;
    ReadOutcome Result;
    const auto fnFail = [&](const std::string& strReason) {
        Result.eEnd = ReadOutcome::End::kFailed;
        Result.nLine = Stream.Line();
        Result.strReason = strReason;
    };
    SkipBlanks(Stream);
    while (!Stream.IsAtEnd() && Result.eEnd == ReadOutcome::End::kDone) {
        if (Handler.IsListDone()) {
            fnFail(Stream.Peek() == '\0' ? "there is a NUL byte" : "something follows the list");
            break;
        }
        const rapidjson::ParseResult Parsed = Reader.Parse<kJsonFlags>(Stream, Handler);
        if (Handler.WasStopped()) {
            Result.eEnd = ReadOutcome::End::kStopped;
        } else if (Parsed.IsError()) {
            fnFail(Problem(Parsed, Stream, Handler));
        }
        SkipBlanks(Stream);
    }
    const bool blOneObject = Handler.Records() == 1 && !Handler.IsListDone();
    if (Result.eEnd == ReadOutcome::End::kDone && blOneObject &&
        Stream.Tell() > ByteSource::kBlock) {
        fnFail(
            "the input is one large object, and no list of records; take the list out of it, or "
            "put it on one line and use --format jsonl");
        Result.nLine = 1;
    }
    Result.strListName = Handler.ListName();
    return Result;
}

}  // namespace VORN_JSON_DB::Cli
