#include "ErrorFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "../Command.h"
#include "ByteSource.h"
#include "JsonText.h"
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

}  // namespace

ErrorFile::ErrorFile(const std::string& strPath, const std::vector<std::string>& vecNeeded)
    : m_strPath(strPath) {
    if (strPath == "-") {
        Fail(kExitUsage, "--errors: - is no file; name one, such as /dev/stdout");
    }
    CheckNotNeeded(strPath, vecNeeded);
    m_nFile = open(strPath.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (m_nFile < 0) {
        Fail(kExitIo, strPath + ": " + std::strerror(errno) + "; name another file for --errors");
    }
}

ErrorFile::~ErrorFile() {
    if (m_nFile >= 0) {
        WriteWaiting();
        close(m_nFile);
    }
}

void ErrorFile::Add(const std::string& strInput, const Place& Where, const std::string& strReason) {
    m_strWaiting += "{\"file\":";
    AppendQuoted(strInput, m_strWaiting);
    m_strWaiting += ",\"line\":" + std::to_string(Where.nLine) +
                    ",\"record\":" + std::to_string(Where.nRecord) + ",\"reason\":";
    AppendQuoted(strReason, m_strWaiting);
    m_strWaiting += ",\"text\":";
    AppendQuoted(WithoutBadBytes(Where.strText), m_strWaiting);
    m_strWaiting += "}\n";
    if (m_strWaiting.size() > ByteSource::kBlock) {
        Write();
    }
}

bool ErrorFile::WriteWaiting() {
    const bool blWritten = WriteAll(m_nFile, m_strWaiting.data(), m_strWaiting.size());
    const int nError = errno;
    m_nWritten += blWritten ? static_cast<off_t>(m_strWaiting.size()) : 0;
    // A device has no end that could be moved.
    [[maybe_unused]] const int nCut = blWritten ? 0 : ftruncate(m_nFile, m_nWritten);
    errno = nError;
    m_strWaiting.clear();
    return blWritten;
}

void ErrorFile::Write() {
    if (!WriteWaiting()) {
        Fail(kExitIo, m_strPath + ": cannot write: " + std::strerror(errno) +
                          "; free some space, or name another file for --errors");
    }
}

}  // namespace VORN_JSON_DB::Cli
