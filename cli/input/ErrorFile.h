// The file of bad records, --errors.

#ifndef VORNJSONDB_CLI_INPUT_ERROR_FILE_H
#define VORNJSONDB_CLI_INPUT_ERROR_FILE_H

#include <cstdio>
#include <memory>
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
    void Add(const std::string& strInput, const Place& Where, const std::string& strReason);
    void Close();

  private:
    struct CloseFile {
        void operator()(std::FILE* pFile) const { static_cast<void>(std::fclose(pFile)); }
    };
    std::string m_strPath;
    std::unique_ptr<std::FILE, CloseFile> m_pFile;
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_ERROR_FILE_H
