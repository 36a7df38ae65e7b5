// What a reader tells of an input, as text.

#ifndef VORN_TESTS_CLI_INPUT_PRINTED_RECORDS_H
#define VORN_TESTS_CLI_INPUT_PRINTED_RECORDS_H

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <string>
#include <string_view>
#include <vector>

#include "../../../cli/input/Readers.h"

namespace VORN_JSON_DB::Cli {

// A file of the given bytes, for the life of the object.
class InputFile {
  public:
    explicit InputFile(std::string_view strBytes) {
        std::FILE* const pFile = std::fopen(m_strPath.c_str(), "wb");
        std::fwrite(strBytes.data(), 1, strBytes.size(), pFile);
        std::fclose(pFile);
    }
    ~InputFile() { std::remove(m_strPath.c_str()); }
    InputFile(const InputFile&) = delete;
    InputFile& operator=(const InputFile&) = delete;

    const std::string& Path() const { return m_strPath; }

  private:
    static std::string Unused() {
        char szPath[] = "/tmp/vornjsondb-input-XXXXXX";
        const int nFile = mkstemp(szPath);
        if (nFile >= 0) {
            std::fclose(fdopen(nFile, "w"));
        }
        return szPath;
    }

    std::string m_strPath = Unused();
};

// A line for each record: "1@2: id=1 name='a'" is the first one, in line 2.
class PrintedRecords : public Sink {
  public:
    void NewMember(std::string_view strName) override { m_vecNames.emplace_back(strName); }

    void Take(size_t nMember, const Value& Given) override {
        m_strRecord += " " + m_vecNames.at(nMember) + "=" + Shown(Given);
    }

    bool EndRecord(const Place& Where) override {
        Print(Where, m_strRecord);
        return ++m_nEnded != nStopAfter;
    }

    bool BadRecord(const Place& Where, const std::string& strReason) override {
        Print(Where, " bad: " + strReason);
        return blGoOnAfterBad;
    }

    std::string strAll;
    int nStopAfter = -1;
    bool blGoOnAfterBad = true;

  private:
    static std::string Shown(const Value& Given) {
        char szReal[40];
        switch (Given.eKind) {
            case Value::Kind::kNull:
                return "null";
            case Value::Kind::kBoolean:
                return Given.nInteger != 0 ? "true" : "false";
            case Value::Kind::kInteger:
                return std::to_string(Given.nInteger);
            case Value::Kind::kReal:
                std::snprintf(szReal, sizeof szReal, "%.17g", Given.dReal);
                return std::string("real ") + szReal;
            case Value::Kind::kWide:
                return "wide " + std::string(Given.strText);
            case Value::Kind::kText:
                return "'" + std::string(Given.strText) + "'";
            default:
                return std::string(Given.strText);
        }
    }

    void Print(const Place& Where, const std::string& strWhat) {
        strAll += std::to_string(Where.nRecord) + "@" + std::to_string(Where.nLine) + ":" + strWhat;
        if (!Where.strText.empty()) {
            strAll += " <" + std::string(Where.strText) + ">";
        }
        strAll += "\n";
        m_strRecord.clear();
    }

    std::vector<std::string> m_vecNames;
    std::string m_strRecord;
    int m_nEnded = 0;
};

// The records; then "failed in line 3: why", "stopped", or nothing.
inline std::string ReadAll(std::string_view strBytes, const ReadOptions& How, PrintedRecords& To) {
    const InputFile File(strBytes);
    ByteSource From;
    if (!From.Open(File.Path())) {
        return "cannot open";
    }
    const ReadOutcome Result = ReadRecords(From, How, To);
    std::string strEnd;
    if (Result.eEnd == ReadOutcome::End::kFailed) {
        strEnd = "failed in line " + std::to_string(Result.nLine) + ": " + Result.strReason + "\n";
    } else if (Result.eEnd == ReadOutcome::End::kStopped) {
        strEnd = "stopped\n";
    }
    return To.strAll + (Result.strListName.empty() ? "" : "[" + Result.strListName + "]\n") +
           strEnd;
}

inline std::string ReadAll(std::string_view strBytes, const ReadOptions& How) {
    PrintedRecords To;
    return ReadAll(strBytes, How, To);
}

}  // namespace VORN_JSON_DB::Cli

#endif  // VORN_TESTS_CLI_INPUT_PRINTED_RECORDS_H
