#include "JsonFile.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <sstream>

#include "Command.h"
#include "input/ByteSource.h"
#include "input/Numbers.h"
#include "input/Utf8.h"

namespace VORN_JSON_DB::Cli {

namespace {

[[noreturn]] void FailTooWide(const std::string& strNumber, const std::string& strWhere,
                              int nExit) {
    Fail(nExit, strWhere + ": the number " + strNumber +
                    " has more than 64 bits; write it as a text, in quotes, or as a real number, "
                    "with .0 at its end");
}

// The reader knows infinite numbers by their name only, and rounds whole ones of more than 64 bits.
std::string Readable(const std::string& strText, const std::string& strWhere, int nExit) {
    std::string strOut;
    bool blInText = false;
    for (std::size_t nAt = 0; nAt < strText.size();) {
        const char c = strText[nAt];
        const std::size_t nFound =
            blInText ? nAt : strText.find_first_not_of("+-.0123456789eE", nAt);
        const std::size_t nEnd = std::min(nFound, strText.size());
        if (nEnd > nAt) {
            const std::string strNumber = strText.substr(nAt, nEnd - nAt);
            if (IsTooWide(strNumber)) {
                FailTooWide(strNumber, strWhere, nExit);
            }
            strOut += strNumber == "1e999"    ? "Infinity"
                      : strNumber == "-1e999" ? "-Infinity"
                                              : strNumber;
            nAt = nEnd;
            continue;
        }
        const std::size_t nBytes = blInText && c == '\\' ? 2 : 1;
        strOut += strText.substr(nAt, nBytes);
        nAt += nBytes;
        blInText = blInText != (c == '"');
    }
    return strOut;
}

}  // namespace

std::string ReadFile(const std::string& strFile) {
    ByteSource From;
    std::string strText;
    char szBlock[16384];
    From.Open(strFile);
    while (const std::size_t nRead = From.Read(szBlock, sizeof szBlock)) {
        strText.append(szBlock, nRead);
    }
    if (From.Error() != 0) {
        Fail(kExitIo, strFile + ": " + std::strerror(From.Error()) + "; check the name");
    }
    return strText;
}

Json::Value ParseJson(const std::string& strText, const std::string& strWhere, int nExit) {
    const std::size_t nWrong = FindNoUtf8(strText);
    if (nWrong != std::string::npos) {
        Fail(nExit, strWhere + ": " + NoUtf8Text(strText, nWrong));
    }
    Json::CharReaderBuilder Builder;
    Json::CharReaderBuilder::strictMode(&Builder.settings_);
    Builder["strictRoot"] = false;
    const std::string strRead = Readable(strText, strWhere, nExit);
    Builder["allowSpecialFloats"] = strRead.size() != strText.size();
    Json::Value jValue;
    std::string strErrors;
    bool blParsed = false;
    try {
        const std::unique_ptr<Json::CharReader> pReader(Builder.newCharReader());
        blParsed =
            pReader->parse(strRead.data(), strRead.data() + strRead.size(), &jValue, &strErrors);
    } catch (const Json::Exception& Failed) {
        strErrors = Failed.what();
    }
    if (!blParsed) {
        // "* Line 1, Column 2\n  Missing ...\n"
        std::istringstream Lines(strErrors.substr(strErrors.compare(0, 2, "* ") == 0 ? 2 : 0));
        std::string strPlace;
        std::string strReason;
        std::getline(Lines, strPlace);
        std::getline(Lines, strReason);
        strReason.erase(0, strReason.find_first_not_of(' '));
        Fail(nExit, strWhere + ": " + strPlace + (strReason.empty() ? "" : ": " + strReason) +
                        "; it must be JSON");
    }
    return jValue;
}

}  // namespace VORN_JSON_DB::Cli
