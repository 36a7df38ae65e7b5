#include "ByteSource.h"

#include <fcntl.h>
#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <memory>

#include "Interrupt.h"

namespace VORN_JSON_DB::Cli {

namespace {

// A file that is gone as soon as it is closed, however the program ends.
int OpenNameless() {
    const char* const szFolder = std::getenv("TMPDIR");
    std::string strPath = szFolder != nullptr && *szFolder != '\0' ? szFolder : "/tmp";
    strPath += "/vornjsondb-XXXXXX";
    const int nFile = mkostemp(strPath.data(), O_CLOEXEC);
    if (nFile >= 0) {
        unlink(strPath.c_str());
    }
    return nFile;
}

}  // namespace

bool WriteAll(int nFile, const char* pBytes, size_t nBytes) {
    while (nBytes > 0) {
        const ssize_t nWritten = write(nFile, pBytes, nBytes);
        if (nWritten < 0) {
            return false;
        }
        pBytes += nWritten;
        nBytes -= static_cast<size_t>(nWritten);
    }
    return true;
}

ByteSource::~ByteSource() {
    if (m_blOwn) {
        close(m_nFile);
    }
}

bool ByteSource::Fail() {
    m_nError = errno;
    return false;
}

bool ByteSource::Open(const std::string& strPath) {
    m_blOwn = strPath != "-";
    m_strName = m_blOwn ? strPath : "standard input";
    m_nFile = m_blOwn ? open(strPath.c_str(), O_RDONLY | O_CLOEXEC) : STDIN_FILENO;
    struct stat Found = {};
    if (m_nFile < 0 || fstat(m_nFile, &Found) != 0) {
        m_blOwn = m_blOwn && m_nFile >= 0;
        return Fail();
    }
    if (S_ISDIR(Found.st_mode)) {
        errno = EISDIR;
        return Fail();
    }
    if (S_ISREG(Found.st_mode)) {
        m_nBegin = lseek(m_nFile, 0, SEEK_CUR);
        m_nSize = std::max<std::int64_t>(0, Found.st_size - m_nBegin);
    }
    return true;
}

// Until there is something to read, or an interrupt: then it is EINTR, however early it came.
bool ByteSource::Wait() {
    pollfd aFiles[] = {{m_nFile, POLLIN, 0}, {Interrupt::File(), POLLIN, 0}};
    if (poll(aFiles, 2, -1) < 0) {
        return false;
    }
    errno = EINTR;
    return aFiles[1].revents == 0;
}

size_t ByteSource::ReadFile(char* pInto, size_t nMost) {
    if (m_nError != 0) {
        return 0;
    }
    const bool blReady = m_nSize >= 0 || Wait();
    const ssize_t nRead = blReady ? read(m_nFile, pInto, nMost) : -1;
    if (nRead < 0) {
        // An interrupt, too, ends the input: whoever wants to go on has handlers that restart.
        m_nError = errno;
        return 0;
    }
    return static_cast<size_t>(nRead);
}

std::string_view ByteSource::Look() {
    const size_t nEnough = m_nSize < 0 ? 1 : kBlock;
    const auto pBlock = std::make_unique<char[]>(kBlock);
    while (m_strLooked.size() < kBlock &&
           (m_strLooked.size() < nEnough || m_strLooked.find('\n') == std::string::npos)) {
        const size_t nRead = ReadFile(pBlock.get(), kBlock - m_strLooked.size());
        if (nRead == 0) {
            break;
        }
        m_strLooked.append(pBlock.get(), nRead);
    }
    return m_strLooked;
}

size_t ByteSource::Read(char* pInto, size_t nMost) {
    size_t nRead = std::min(nMost, m_strLooked.size() - m_nLookedTaken);
    if (nRead > 0) {
        std::memcpy(pInto, m_strLooked.data() + m_nLookedTaken, nRead);
        m_nLookedTaken += nRead;
    } else {
        nRead = ReadFile(pInto, nMost);
    }
    m_nTaken += static_cast<std::int64_t>(nRead);
    return nRead;
}

bool ByteSource::Spool() {
    if (m_nSize >= 0) {
        return true;
    }
    const int nCopy = OpenNameless();
    if (nCopy < 0) {
        return Fail();
    }
    const auto pBlock = std::make_unique<char[]>(kBlock);
    std::int64_t nAll = 0;
    while (const size_t nRead = Read(pBlock.get(), kBlock)) {
        if (!WriteAll(nCopy, pBlock.get(), nRead)) {
            Fail();
            break;
        }
        nAll += static_cast<std::int64_t>(nRead);
    }
    if (m_blOwn) {
        close(m_nFile);
    }
    m_nFile = nCopy;
    m_blOwn = true;
    m_nSize = nAll;
    m_nBegin = 0;
    return m_nError == 0 && Rewind();
}

bool ByteSource::Rewind() {
    m_strLooked.clear();
    m_nLookedTaken = 0;
    m_nTaken = 0;
    return lseek(m_nFile, m_nBegin, SEEK_SET) == m_nBegin || Fail();
}

}  // namespace VORN_JSON_DB::Cli
