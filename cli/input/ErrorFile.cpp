#include "ErrorFile.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "../Command.h"
#include "JsonQuote.h"
#include "Utf8.h"

namespace VORN_JSON_DB::Cli {

namespace {

// What a name leads to; standard input's "-", too.
bool LooksAt(const std::string& strPath, struct stat& Found) {
    return (strPath == "-" ? fstat(STDIN_FILENO, &Found) : stat(strPath.c_str(), &Found)) == 0;
}

void CheckNotNeeded(const std::string& strPath, const std::vector<std::string>& vecNeeded) {
    struct stat Errors {};
    if (stat(strPath.c_str(), &Errors) != 0 || !S_ISREG(Errors.st_mode)) {
        return;
    }
    for (const std::string& strNeeded : vecNeeded) {
        struct stat Needed {};
        if (LooksAt(strNeeded, Needed) && Needed.st_dev == Errors.st_dev &&
            Needed.st_ino == Errors.st_ino) {
            Fail(kExitUsage, "--errors: " + strPath +
                                 " is read or written by this call itself; name another file");
        }
    }
}

// JSON holds nothing but UTF-8.
std::string WithoutBadBytes(std::string_view strBytes) {
    std::string strText(strBytes);
    for (size_t i = FindNoUtf8(strText); i != std::string::npos; i = FindNoUtf8(strText)) {
        strText.replace(i, 1, "\xEF\xBF\xBD");
    }
    return strText;
}

}  // namespace

ErrorFile::ErrorFile(const std::string& strPath, const std::vector<std::string>& vecNeeded)
    : m_strPath(strPath) {
    CheckNotNeeded(strPath, vecNeeded);
    m_pFile.reset(std::fopen(strPath.c_str(), "we"));
    if (m_pFile == nullptr) {
        Fail(kExitIo, strPath + ": " + std::strerror(errno) + "; name another file for --errors");
    }
}

void ErrorFile::Add(const std::string& strInput, const Place& Where, const std::string& strReason) {
    std::string strLine = "{\"file\":";
    AppendQuoted(strInput, strLine);
    strLine += ",\"line\":" + std::to_string(Where.nLine) +
               ",\"record\":" + std::to_string(Where.nRecord) + ",\"reason\":";
    AppendQuoted(strReason, strLine);
    strLine += ",\"text\":";
    AppendQuoted(WithoutBadBytes(Where.strText), strLine);
    strLine += "}\n";
    // Close looks at what became of it.
    static_cast<void>(std::fwrite(strLine.data(), 1, strLine.size(), m_pFile.get()));
}

void ErrorFile::Close() {
    const bool blWritten = std::ferror(m_pFile.get()) == 0;
    if (std::fclose(m_pFile.release()) != 0 || !blWritten) {
        Fail(kExitIo, m_strPath + ": cannot write: " + std::strerror(errno));
    }
}

}  // namespace VORN_JSON_DB::Cli
