// The file of bad records, --errors.

#ifndef VORNJSONDB_CLI_INPUT_ERROR_FILE_H
#define VORNJSONDB_CLI_INPUT_ERROR_FILE_H

#include <sys/types.h>

#include <string>
#include <vector>

#include "Sink.h"

namespace VORN_JSON_DB::Cli {

// JSON Lines with file, line, record, reason and text.
class ErrorFile {
  public:
    // Begins with an empty file, whatever was in it: an Error, if it cannot be written, or is one
    // of those that the call needs.
    ErrorFile(const std::string& strPath, const std::vector<std::string>& vecNeeded);
    ~ErrorFile();
    ErrorFile(const ErrorFile&) = delete;
    ErrorFile& operator=(const ErrorFile&) = delete;

    void Add(const std::string& strInput, const Place& Where, const std::string& strReason);

    // Comes before each commit: what the file cannot take is an Error, and the file ends with a
    // whole line.
    void Write();

  private:
    bool WriteWaiting();

    const std::string m_strPath;
    int m_nFile = -1;
    off_t m_nWritten = 0;
    std::string m_strWaiting;
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_ERROR_FILE_H
