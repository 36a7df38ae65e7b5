#include "InputHost.h"

#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <exception>
#include <memory>

#include "../cli/input/Inference.h"
#include "../cli/input/Utf8.h"
#include "FuzzHost.h"

namespace fuzzhost {

namespace {

using namespace VORN_JSON_DB::Cli;

// One file for all inputs: making one takes longer than reading it.
class MemoryFile {
  public:
    void Hold(size_t nBefore, const std::string& strText) {
        const std::string strBytes = std::string(nBefore, '\n') + strText;
        Require(ftruncate(m_nFile, 0) == 0, "the file is emptied");
        Require(pwrite(m_nFile, strBytes.data(), strBytes.size(), 0) ==
                    static_cast<ssize_t>(strBytes.size()),
                "the file is written");
    }
    std::string Path() const { return "/proc/self/fd/" + std::to_string(m_nFile); }

  private:
    int m_nFile = memfd_create("input", MFD_CLOEXEC);
};

// Collects records, and tells inference of them, too.
class Collector : public Sink {
  public:
    explicit Collector(bool blCells) { m_Seen.BeginInput(blCells); }

    void NewMember(std::string_view strName) override {
        Require(FindNoUtf8(strName) == std::string_view::npos, "names are UTF-8");
        m_vecNames.emplace_back(strName);
        m_Seen.NewMember(strName);
    }

    void Take(size_t nMember, const Value& Given) override {
        Require(nMember < m_vecNames.size(), "a member is made known before its values");
        ReadCell Cell{m_vecNames[nMember], Given.eKind, std::string(Given.strText), {}};
        switch (Given.eKind) {
            case Value::Kind::kNull:
                break;
            case Value::Kind::kBoolean:
                Require(Given.nInteger == 0 || Given.nInteger == 1, "a boolean is 0 or 1");
                Cell.jValue = Given.nInteger == 1;
                break;
            case Value::Kind::kInteger:
                Cell.jValue = Json::Int64{Given.nInteger};
                break;
            case Value::Kind::kReal:
                Cell.jValue = Given.dReal;
                break;
            case Value::Kind::kJson:
                Require(!Cell.strText.empty() && (Cell.strText[0] == '{' || Cell.strText[0] == '['),
                        "JSON is an object or a list");
                break;
            default:
                Cell.jValue = Cell.strText;
        }
        m_Now.vecCells.push_back(std::move(Cell));
        m_Seen.Take(nMember, Given);
    }

    bool EndRecord(const Place& Where) override {
        for (const ReadCell& Cell : m_Now.vecCells) {
            Require(FindNoUtf8(Cell.strText) == std::string::npos, "good texts are UTF-8");
        }
        m_Seen.EndRecord(Where);
        return Add(Where);
    }

    bool BadRecord(const Place& Where, const std::string& strReason) override {
        Require(!strReason.empty(), "a bad record has a reason");
        Require(FindNoUtf8(strReason) == std::string::npos, "a reason is UTF-8");
        m_Now.blBad = true;
        m_Now.strReason = strReason;
        m_Now.vecCells.clear();
        m_Seen.BadRecord(Where, strReason);
        return Add(Where);
    }

    std::vector<ReadRecord> Records() {
        const Json::Value jMembers = m_Seen.Members();
        for (const ReadRecord& Found : m_vecRecords) {
            for (const ReadCell& Cell : Found.vecCells) {
                Require(jMembers[Cell.strName]["cpptype"].isString(), "every member has a type");
            }
        }
        m_Seen.Notes();
        return std::move(m_vecRecords);
    }

  private:
    bool Add(const Place& Where) {
        Require(Where.nRecord == static_cast<std::int64_t>(m_vecRecords.size()) + 1,
                "records are counted");
        m_Now.nLine = Where.nLine;
        m_Now.strText = Where.strText;
        m_vecRecords.push_back(std::move(m_Now));
        m_Now = ReadRecord();
        return true;
    }

    std::vector<std::string> m_vecNames;
    std::vector<ReadRecord> m_vecRecords;
    ReadRecord m_Now;
    Inference m_Seen;
};

// Of an end of two bytes across blocks the second comes when the row is told already.
std::string_view WithoutEnd(std::string_view strText) {
    return strText.substr(0, strText.find_last_not_of("\r\n") + 1);
}

void RequireSame(const ReadInput& One, const ReadInput& Other, std::int64_t nLines) {
    Require(One.Outcome.eEnd == Other.Outcome.eEnd, "it ends the same way across blocks");
    Require(One.Outcome.strReason == Other.Outcome.strReason, "for the same reason");
    Require(One.Outcome.strListName == Other.Outcome.strListName, "with the same list");
    const bool blFailed = One.Outcome.eEnd == ReadOutcome::End::kFailed;
    Require(!blFailed || One.Outcome.nLine + nLines == Other.Outcome.nLine, "in the same line");
    Require(One.vecRecords.size() == Other.vecRecords.size(), "there are as many records");
    for (size_t i = 0; i < One.vecRecords.size(); ++i) {
        const ReadRecord& Left = One.vecRecords[i];
        const ReadRecord& Right = Other.vecRecords[i];
        Require(Left.blBad == Right.blBad && Left.strReason == Right.strReason,
                "a record is as good across blocks");
        Require(Left.nLine + nLines == Right.nLine, "a record is in the same line");
        Require(WithoutEnd(Left.strText) == WithoutEnd(Right.strText),
                "a record has the same text");
        Require(Left.vecCells.size() == Right.vecCells.size(), "a record has as many values");
        for (size_t n = 0; n < Left.vecCells.size(); ++n) {
            const ReadCell& LeftCell = Left.vecCells[n];
            const ReadCell& RightCell = Right.vecCells[n];
            Require(LeftCell.strName == RightCell.strName && LeftCell.eKind == RightCell.eKind &&
                        LeftCell.strText == RightCell.strText &&
                        LeftCell.jValue == RightCell.jValue,
                    "a value is the same");
        }
    }
}

}  // namespace

ReadInput Read(const std::string& strText, size_t nBefore, const ReadOptions& How) {
    static MemoryFile File;
    File.Hold(nBefore, strText);
    ByteSource From;
    Require(From.Open(File.Path()), "the file is opened");
    Collector Into(How.eFormat == Format::kSeparated);
    ReadInput Found;
    Found.Outcome = ReadRecords(From, How, Into);
    Found.vecRecords = Into.Records();
    const bool blFailed = Found.Outcome.eEnd == ReadOutcome::End::kFailed;
    Require(blFailed != Found.Outcome.strReason.empty(),
            "a failure, and nothing else, has a reason");
    Require(FindNoUtf8(Found.Outcome.strReason) == std::string::npos, "the reason is UTF-8");
    const std::int64_t nLines = 1 +
                                std::count_if(strText.begin(), strText.end(),
                                              [](char c) { return c == '\n' || c == '\r'; }) +
                                static_cast<std::int64_t>(nBefore);
    std::int64_t nLine = 1;
    for (const ReadRecord& Each : Found.vecRecords) {
        Require(Each.nLine >= nLine && Each.nLine <= nLines, "lines go up, and are there");
        nLine = Each.nLine;
    }
    return Found;
}

ReadInput ReadTwice(const std::string& strText, unsigned nShift, const ReadOptions& How) {
    ReadInput Found = Read(strText, 0, How);
    // A mark in the input's begin is none behind line feeds, nor do zeros tell an encoding there,
    // or a first line the delimiter.
    const bool blMark =
        !strText.empty() && (static_cast<unsigned char>(strText[0]) >= 0x80 ||
                             strText.find('\0') < 4 || strText.compare(0, 4, "sep=") == 0);
    // One object is refused where it is large.
    const bool blOneObject = How.eFormat == Format::kJson && Found.vecRecords.size() == 1;
    if (nShift > 0 && nShift <= strText.size() && !blMark && !blOneObject) {
        const size_t nBefore = ByteSource::kBlock - nShift;
        RequireSame(Found, Read(strText, nBefore, How), static_cast<std::int64_t>(nBefore));
    }
    return Found;
}

bool ParseStrictly(const std::string& strText, Json::Value& jOut) {
    static const std::unique_ptr<Json::CharReader> pReader = [] {
        Json::CharReaderBuilder Builder;
        Json::CharReaderBuilder::strictMode(&Builder.settings_);
        Builder["strictRoot"] = false;
        Builder["rejectDupKeys"] = false;
        Builder["stackLimit"] = 2 * kMostLevels;
        return std::unique_ptr<Json::CharReader>(Builder.newCharReader());
    }();
    return pReader->parse(strText.data(), strText.data() + strText.size(), &jOut, nullptr);
}

bool IsRecord(const ReadRecord& Found, const Json::Value& jExpected) {
    if (!jExpected.isObject() || jExpected.size() != Found.vecCells.size()) {
        return false;
    }
    return std::all_of(Found.vecCells.begin(), Found.vecCells.end(), [&](const ReadCell& Cell) {
        const Json::Value& jMember = jExpected[Cell.strName];
        if (Cell.eKind == Value::Kind::kWide) {
            return jMember.isNumeric();
        }
        Json::Value jNested;
        if (Cell.eKind == Value::Kind::kJson) {
            return ParseStrictly(Cell.strText, jNested) && jNested == jMember;
        }
        return Cell.jValue == jMember || (Cell.eKind == Value::Kind::kReal && jMember.isNumeric() &&
                                          Cell.jValue.asDouble() == jMember.asDouble());
    });
}

}  // namespace fuzzhost
