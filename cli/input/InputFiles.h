// The inputs of one call, which may be read twice.

#ifndef VORNJSONDB_CLI_INPUT_INPUT_FILES_H
#define VORNJSONDB_CLI_INPUT_INPUT_FILES_H

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "../Command.h"
#include "ByteSource.h"
#include "Readers.h"

namespace VORN_JSON_DB::Cli {

// Ends the call for what the system says of a file, or for the interrupt that ended its reading.
[[noreturn]] void FailToRead(const ByteSource& Of);

// Ends the call for what is wrong in an input: "FILE:LINE: reason; remedy". Some reasons have a
// remedy of their own.
[[noreturn]] void FailAt(const std::string& strInput, std::int64_t nLine,
                         const std::string& strReason, const char* szRemedy);
constexpr char kLeaveOut[] = "; correct it, or leave it out by --errors FILE";

class InputFiles {
  public:
    // Opens all of them, and finds out their formats; an Error, if one cannot be opened.
    explicit InputFiles(const Context& Call);

    // Reads one after the other; fnBegin comes before each. Returns false where the sink wanted no
    // more; what else ends it early is an Error. blAgain: they will be read once more.
    using Begin = std::function<void(const std::string& strName, bool blCells)>;
    bool Read(Sink& To, const Begin& fnBegin, bool blAgain);

    std::int64_t AllBytes() const;   // -1: unknown
    std::int64_t BytesRead() const;  // of this reading
    std::string Formats() const;     // "a.json is JSON, b.csv is CSV"

  private:
    struct Input {
        ByteSource From;
        ReadOptions How;
        std::string strListName;
    };

    bool ReadOne(Input& Now, Sink& To);

    std::vector<std::unique_ptr<Input>> m_vecInputs;
    bool m_blReadBefore = false;
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_INPUT_FILES_H
