#include "CanonicalLine.h"

#include <unistd.h>

#include <cstring>

namespace testhost {
namespace {

constexpr int kLogErr = 3;
constexpr int kHighestErrno = 200;
constexpr const char* kDigits = "0123456789";
constexpr const char* kLetters = "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz";

std::string Malformed(const std::string& strRaw) {
    return "MALFORMED: " + strRaw;
}

bool StartsWith(const std::string& str, const std::string& strPrefix) {
    return str.compare(0, strPrefix.size(), strPrefix) == 0;
}

bool EndsWith(const std::string& str, const std::string& strSuffix) {
    return str.size() >= strSuffix.size() &&
           str.compare(str.size() - strSuffix.size(), strSuffix.size(), strSuffix) == 0;
}

// Reads a text from left to right; every step tells whether it found what it looked for.
class Reader {
  public:
    explicit Reader(const std::string& strText, size_t nAt = 0) : m_strText(strText), m_nAt(nAt) {}

    bool Skip(const std::string& strExpected) {
        const bool blFound = m_strText.compare(m_nAt, strExpected.size(), strExpected) == 0;
        m_nAt += blFound ? strExpected.size() : 0;
        return blFound;
    }

    bool Take(const char* szCharacters, std::string& strTaken) {
        const size_t nEnd = m_strText.find_first_not_of(szCharacters, m_nAt);
        strTaken = m_strText.substr(m_nAt, nEnd == std::string::npos ? nEnd : nEnd - m_nAt);
        m_nAt += strTaken.size();
        return !strTaken.empty();
    }

    // "File.cpp:12"
    bool TakePlace(std::string& strPlace) {
        std::string strName;
        std::string strLine;
        if (!Take(kLetters, strName) || !Skip(".cpp:") || !Take(kDigits, strLine) ||
            strLine[0] == '0') {
            return false;
        }
        strPlace = strName + ".cpp:" + strLine;
        return true;
    }

    std::string Rest() const { return m_strText.substr(m_nAt); }

  private:
    const std::string& m_strText;
    size_t m_nAt;
};

// "class", "util", or empty for a file that the library does not have.
std::string SourceOf(const std::string& strPlace) {
    if (StartsWith(strPlace, "util.cpp:")) {
        return "util";
    }
    return StartsWith(strPlace, "VornJsonDbApi") ? "class" : "";
}

// strErrno is what %m looks like in the message.
std::string Canonical(const std::string& strPlace, const std::string& strMessage,
                      const std::string& strErrno, const std::string& strRaw) {
    const std::string strSource = SourceOf(strPlace);
    if (strSource.empty()) {
        return Malformed(strRaw);
    }
    const std::string strTwice = "(" + strPlace + ")(" + strErrno + ")";
    if (!StartsWith(strMessage, strTwice)) {
        return strSource + " plain: " + strMessage;
    }
    if (!EndsWith(strMessage, "\n")) {
        return Malformed(strRaw);
    }
    std::string strText = strMessage.substr(strTwice.size());
    strText.pop_back();
    if (StartsWith(strText, "Failed [") && EndsWith(strText, "], err=" + strErrno)) {
        strText.replace(strText.size() - strErrno.size(), strErrno.size(), "%m");
    }
    return strSource + " located: " + strText;
}

// The error text with which a printed located line begins; "%m" when there is none.
std::string PrintedErrno(const std::string& strMessage) {
    Reader reader(strMessage);
    std::string strPlace;
    if (!reader.Skip("(") || !reader.TakePlace(strPlace) || !reader.Skip(")(")) {
        return "%m";
    }
    const std::string strRest = reader.Rest();
    for (int nErrno = 0; nErrno < kHighestErrno; ++nErrno) {
        std::string strErrno = std::strerror(nErrno);
        if (StartsWith(strRest, strErrno + ")")) {
            return strErrno;
        }
    }
    return "%m";
}

// "(12) File.cpp:34 "
bool IsPrintedHead(const std::string& strText, size_t nAt) {
    Reader reader(strText, nAt);
    std::string strPid;
    std::string strPlace;
    return reader.Skip("(") && reader.Take(kDigits, strPid) && reader.Skip(") ") &&
           reader.TakePlace(strPlace) && reader.Skip(" ");
}

}  // namespace

std::string CanonicalSyslog(const SyslogCall& call) {
    Reader reader(call.strRendered);
    std::string strPlace;
    if (call.nPriority != kLogErr || !reader.TakePlace(strPlace) ||
        !reader.Skip(" (" + std::to_string(::getpid()) + ")") ||
        reader.Skip("(%m)") != (call.nErrno != 0)) {
        return Malformed(call.strRendered);
    }
    return Canonical(strPlace, reader.Rest(), "%m", call.strRendered);
}

std::string CanonicalPrinted(const std::string& strRaw) {
    Reader reader(strRaw);
    std::string strPlace;
    if (!reader.Skip("(" + std::to_string(::getpid()) + ") ") || !reader.TakePlace(strPlace) ||
        !reader.Skip(" ") || !EndsWith(strRaw, "\n")) {
        return Malformed(strRaw);
    }
    std::string strMessage = reader.Rest();
    strMessage.pop_back();
    return Canonical(strPlace, strMessage, PrintedErrno(strMessage), strRaw);
}

std::vector<std::string> SplitPrinted(const std::string& strText) {
    std::vector<std::string> vecLines;
    size_t nBegin = 0;
    for (size_t nNewline = strText.find('\n'); nNewline != std::string::npos;
         nNewline = strText.find('\n', nNewline + 1)) {
        if (IsPrintedHead(strText, nNewline + 1)) {
            vecLines.push_back(strText.substr(nBegin, nNewline + 1 - nBegin));
            nBegin = nNewline + 1;
        }
    }
    if (nBegin < strText.size()) {
        vecLines.push_back(strText.substr(nBegin));
    }
    return vecLines;
}

}  // namespace testhost
