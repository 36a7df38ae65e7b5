// JSON Lines: each line is read where it lies in memory, and a bad one harms no other.

#include "CheckedText.h"
#include "JsonHandler.h"
#include "LineBuffer.h"
#include "Utf8.h"

namespace VORN_JSON_DB::Cli {

namespace {

class LinePosition : public JsonPosition {
  public:
    LinePosition(LineBuffer& Lines, bool blKeepText) : m_Lines(Lines), m_blKeepText(blKeepText) {}

    // Before the line is read, which overwrites it.
    void BeginLine() {
        if (m_blKeepText) {
            m_strText.assign(m_Lines.Begin(), m_Lines.Size());
        }
    }

    void BeginRecord(std::string_view) override {}
    std::int64_t RecordLine() override { return m_Lines.Number(); }
    std::string_view RecordText() override { return m_strText; }

  private:
    LineBuffer& m_Lines;
    const bool m_blKeepText;
    std::string m_strText;
};

class LinesReader {
  public:
    LinesReader(ByteSource& From, const ReadOptions& How, Sink& To)
        : m_Lines(From, kMostRecordBytes),
          m_At(m_Lines, How.blKeepText),
          m_Handler(To, m_At, false) {}

    // False: the sink wants no more.
    bool Run() {
        while (m_Lines.Next()) {
            m_At.BeginLine();
            if (!ReadLine()) {
                return false;
            }
        }
        return true;
    }

  private:
    bool ReadLine() {
        char* const pBegin = m_Lines.Begin();
        if (m_Lines.IsTooLong()) {
            return m_Handler.Broken("the line is longer than " + std::to_string(kMostRecordBytes) +
                                    " bytes");
        }
        // RapidJSON is several times as fast where it checks no text; one check of the line does
        // it. What it would complain about, it is given to find.
        constexpr unsigned kFlags = kJsonFlags | rapidjson::kParseInsituFlag;
        constexpr unsigned kCheckedFlags =
            kFlags & ~unsigned{rapidjson::kParseValidateEncodingFlag};
        const std::string_view strLine(pBegin, m_Lines.Size());
        const bool blChecked = IsUtf8WithoutControls(strLine);
        if (!blChecked && strLine.find('\0') != std::string_view::npos) {
            return m_Handler.Broken("there is a NUL byte");
        }
        m_Handler.MayHaveEscapes(strLine.find('\\') != std::string_view::npos);
        rapidjson::InsituStringStream Stream(blChecked ? pBegin : Copy(strLine));
        rapidjson::SkipWhitespace(Stream);
        while (Stream.Peek() != '\0') {
            const rapidjson::ParseResult Parsed =
                blChecked ? m_Reader.Parse<kCheckedFlags>(Stream, m_Handler)
                          : m_Reader.Parse<kFlags>(Stream, m_Handler);
            if (m_Handler.WasStopped()) {
                return false;
            }
            if (Parsed.IsError()) {
                return m_Handler.Broken(Problem(Parsed));
            }
            rapidjson::SkipWhitespace(Stream);
        }
        return true;
    }

    // The line by itself. A sequence of UTF-8 that its end cuts short is read with the bytes behind
    // it, and written where the text goes, which need not be the same place.
    char* Copy(std::string_view strLine) {
        constexpr size_t kLongestSequence = 4;
        m_strCopy.assign(strLine).append(kLongestSequence, '\0');
        return m_strCopy.data();
    }

    std::string Problem(const rapidjson::ParseResult& Parsed) const {
        if (Parsed.Code() == rapidjson::kParseErrorTermination) {
            return m_Handler.Reason();
        }
        return Parsed.Offset() >= m_Lines.Size() ? "the line ends inside of the record"
                                                 : JsonErrorText(Parsed.Code());
    }

    LineBuffer m_Lines;
    LinePosition m_At;
    JsonHandler m_Handler;
    rapidjson::GenericReader<CheckedText, rapidjson::UTF8<>> m_Reader;
    std::string m_strCopy;
};

}  // namespace

ReadOutcome ReadJsonLines(ByteSource& From, const ReadOptions& How, Sink& To) {
    ReadOutcome Result;
    if (!LinesReader(From, How, To).Run()) {
        Result.eEnd = ReadOutcome::End::kStopped;
    }
    return Result;
}

}  // namespace VORN_JSON_DB::Cli
