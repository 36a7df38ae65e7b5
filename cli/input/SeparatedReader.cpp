// CSV and TSV.

#include <csv.h>

#include <cstring>
#include <exception>
#include <map>
#include <memory>
#include <utility>
#include <vector>

#include "MemberNames.h"
#include "Readers.h"
#include "Utf8.h"

namespace VORN_JSON_DB::Cli {

namespace {

// Blanks around a cell belong to it.
int IsNoBlank(unsigned char) {
    return 0;
}

std::string LowerCase(std::string strName) {
    for (char& c : strName) {
        c = c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
    }
    return strName;
}

// The quote when there is to be none: no text has this byte.
constexpr unsigned char kNoQuote = 0xFF;

class SeparatedReader {
  public:
    SeparatedReader(ByteSource& From, const ReadOptions& How, Sink& To)
        : m_From(From), m_How(How), m_To(To) {
        csv_init(&m_Parser, CSV_STRICT | CSV_STRICT_FINI | CSV_EMPTY_IS_NULL);
        csv_set_space_func(&m_Parser, IsNoBlank);
        csv_set_delim(&m_Parser, static_cast<unsigned char>(How.cDelimiter));
        csv_set_quote(&m_Parser, How.blQuotes ? CSV_QUOTE : kNoQuote);
        csv_set_blk_size(&m_Parser, ByteSource::kBlock);
    }
    ~SeparatedReader() { csv_free(&m_Parser); }
    SeparatedReader(const SeparatedReader&) = delete;
    SeparatedReader& operator=(const SeparatedReader&) = delete;

    ReadOutcome Run();

  private:
    static void OnCell(void* pCell, size_t nCell, void* pThis);
    static void OnRow(int nEnd, void* pThis);

    // The callbacks run below C code, through which no exception may pass.
    template <typename Call>
    void Guard(Call&& fnCall);

    bool Feed(const char* pBytes, size_t nBytes);
    bool FeedLine(const char* pLine, size_t nLine);
    bool FeedBlock(const char* pBlock, size_t nBlock);
    bool IsOver() const { return m_pThrown || m_Result.eEnd != ReadOutcome::End::kDone; }
    void Fail(std::int64_t nLine, std::string strReason);
    void Cell(const char* pCell, size_t nCell);
    void Row();
    void Header();
    void Name(const std::string& strName);
    void Blame(std::string strReason);

    ByteSource& m_From;
    const ReadOptions& m_How;
    Sink& m_To;
    csv_parser m_Parser = {};
    ReadOutcome m_Result;
    std::exception_ptr m_pThrown;
    std::vector<std::string> m_vecNames;
    bool m_blHeaderRead = false;
    size_t m_nCell = 0;  // of the row
    std::int64_t m_nRecord = 0;
    std::int64_t m_nLine = 1;     // that is being fed
    std::int64_t m_nRowLine = 1;  // where the row began
    std::string m_strReason;      // what is wrong with the row
    std::string m_strText;        // of the row
};

template <typename Call>
void SeparatedReader::Guard(Call&& fnCall) {
    if (IsOver()) {
        return;
    }
    try {
        fnCall();
    } catch (...) {
        m_pThrown = std::current_exception();
    }
}

void SeparatedReader::OnCell(void* pCell, size_t nCell, void* pThis) {
    auto& This = *static_cast<SeparatedReader*>(pThis);
    This.Guard([&] { This.Cell(static_cast<const char*>(pCell), nCell); });
}

void SeparatedReader::OnRow(int, void* pThis) {
    auto& This = *static_cast<SeparatedReader*>(pThis);
    This.Guard([&] { This.Row(); });
}

void SeparatedReader::Fail(std::int64_t nLine, std::string strReason) {
    m_Result.eEnd = ReadOutcome::End::kFailed;
    m_Result.nLine = nLine;
    m_Result.strReason = std::move(strReason);
}

void SeparatedReader::Blame(std::string strReason) {
    if (m_strReason.empty()) {
        m_strReason = std::move(strReason);
    }
}

void SeparatedReader::Name(const std::string& strName) {
    m_vecNames.push_back(strName);
    m_To.NewMember(strName);
}

// A null pointer is a cell without anything in it, not even quotes.
void SeparatedReader::Cell(const char* pCell, size_t nCell) {
    const std::string_view strCell(pCell == nullptr ? "" : pCell, nCell);
    const size_t nColumn = m_nCell++;
    const size_t nWrong = FindNoUtf8(strCell);
    if (!m_blHeaderRead && nColumn == MemberNames::kMost) {
        return Fail(m_nRowLine, MemberNames::TooMany());
    }
    if (!m_blHeaderRead && m_How.blHeader) {
        if (nWrong != std::string_view::npos) {
            Fail(m_nRowLine, "the name of column " + std::to_string(m_nCell) + ": " +
                                 NoUtf8Text(strCell, nWrong));
        }
        m_vecNames.emplace_back(strCell);
        return;
    }
    if (!m_blHeaderRead) {
        Name("c" + std::to_string(m_nCell));
    }
    if (nColumn >= m_vecNames.size()) {
        return;  // Row reports it
    }
    if (nWrong != std::string_view::npos) {
        Blame("member \"" + m_vecNames[nColumn] + "\": " + NoUtf8Text(strCell, nWrong));
    }
    Value Given;
    if (pCell != nullptr || m_How.blEmptyIsText) {
        Given.eKind = Value::Kind::kText;
        Given.strText = strCell;
    }
    m_To.Take(nColumn, Given);
}

void SeparatedReader::Header() {
    std::vector<std::string> vecNames;
    vecNames.swap(m_vecNames);
    std::map<std::string, size_t> mapLower;
    for (size_t i = 0; i < vecNames.size(); ++i) {
        const size_t nFirst = mapLower.emplace(LowerCase(vecNames[i]), i).first->second;
        if (vecNames[i].empty()) {
            Fail(m_nRowLine, "column " + std::to_string(i + 1) +
                                 " has no name; --no-header is for input without names");
            return;
        }
        if (nFirst < i) {
            Fail(m_nRowLine, "columns " + std::to_string(nFirst + 1) + " and " +
                                 std::to_string(i + 1) + " have the same name \"" + vecNames[i] +
                                 "\"; letter case makes no difference");
            return;
        }
    }
    for (const std::string& strName : vecNames) {
        Name(strName);
    }
}

void SeparatedReader::Row() {
    const size_t nCells = std::exchange(m_nCell, 0);
    const bool blHeader = !m_blHeaderRead && m_How.blHeader;
    m_blHeaderRead = true;
    if (blHeader) {
        Header();
        return;
    }
    if (nCells != m_vecNames.size()) {
        Blame("the row has " + std::to_string(nCells) + (nCells == 1 ? " cell" : " cells") +
              (m_vecNames.size() == 1
                   ? ", but there is 1 column"
                   : ", but there are " + std::to_string(m_vecNames.size()) + " columns"));
    }
    const Place Where{++m_nRecord, m_nRowLine, m_strText};
    const bool blGoOn =
        m_strReason.empty() ? m_To.EndRecord(Where) : m_To.BadRecord(Where, m_strReason);
    m_strReason.clear();
    if (!blGoOn) {
        m_Result.eEnd = ReadOutcome::End::kStopped;
    }
}

bool SeparatedReader::Feed(const char* pBytes, size_t nBytes) {
    const size_t nTaken = csv_parse(&m_Parser, pBytes, nBytes, OnCell, OnRow, this);
    if (IsOver()) {
        return false;
    }
    if (nTaken != nBytes) {
        Fail(m_nLine,
             csv_error(&m_Parser) == CSV_EPARSE
                 ? "a quote stands inside of a cell that is not in quotes, or a cell goes on after "
                   "its end quote; double the quotes, or use --quote none"
                 : csv_strerror(csv_error(&m_Parser)));
        return false;
    }
    if (csv_get_buffer_size(&m_Parser) > kMostRecordBytes) {
        Fail(m_nRowLine, "a cell is longer than " + std::to_string(kMostRecordBytes) +
                             " bytes; do its quotes end?");
        return false;
    }
    return true;
}

// A piece that ends in a line's end, if it is whole. Between rows the parser is where it began.
bool SeparatedReader::FeedLine(const char* pLine, size_t nLine) {
    if (m_Parser.pstate == 0) {
        m_nRowLine = m_nLine;
        m_strText.clear();
    }
    if (m_How.blKeepText) {
        m_strText.append(pLine, nLine);
    }
    if (!Feed(pLine, nLine)) {
        return false;
    }
    const char cLast = pLine[nLine - 1];
    m_nLine += cLast == '\n' || cLast == '\r' ? 1 : 0;
    return true;
}

bool SeparatedReader::FeedBlock(const char* pBlock, size_t nBlock) {
    const char* const pEnd = pBlock + nBlock;
    while (pBlock < pEnd) {
        const auto* pLineEnd =
            static_cast<const char*>(std::memchr(pBlock, '\n', static_cast<size_t>(pEnd - pBlock)));
        pLineEnd = pLineEnd == nullptr ? pEnd : pLineEnd + 1;
        const auto* const pReturn = static_cast<const char*>(
            std::memchr(pBlock, '\r', static_cast<size_t>(pLineEnd - pBlock)));
        // A carriage return alone ends a line, too.
        if (pReturn != nullptr && (pReturn + 1 == pEnd || pReturn[1] != '\n')) {
            pLineEnd = pReturn + 1;
        }
        if (!FeedLine(pBlock, static_cast<size_t>(pLineEnd - pBlock))) {
            return false;
        }
        pBlock = pLineEnd;
    }
    return true;
}

ReadOutcome SeparatedReader::Run() {
    char szDelimiterLine[kDelimiterLine];
    if (HasDelimiterLine(m_From.Look())) {
        m_From.Read(szDelimiterLine, kDelimiterLine);  // and an empty line is left, which is none
    }
    // A carriage return waits for the line feed that may come with the next block.
    size_t nWaiting = 0;
    const auto pBlock = std::make_unique<char[]>(1 + ByteSource::kBlock);
    bool blMore = true;
    bool blGoOn = true;
    while (blMore && blGoOn) {
        const size_t nRead = m_From.Read(pBlock.get() + nWaiting, ByteSource::kBlock);
        const size_t nBlock = nWaiting + nRead;
        blMore = nRead > 0;
        nWaiting = blMore && pBlock[nBlock - 1] == '\r' ? 1 : 0;
        blGoOn = FeedBlock(pBlock.get(), nBlock - nWaiting);
        pBlock[0] = '\r';
    }
    if (blGoOn && csv_fini(&m_Parser, OnCell, OnRow, this) != 0) {
        Fail(m_nRowLine, "the quotes that begin in this row never end");
    }
    if (m_pThrown) {
        std::rethrow_exception(m_pThrown);
    }
    return m_Result;
}

}  // namespace

ReadOutcome ReadSeparated(ByteSource& From, const ReadOptions& How, Sink& To) {
    return SeparatedReader(From, How, To).Run();
}

}  // namespace VORN_JSON_DB::Cli
