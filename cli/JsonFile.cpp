#include "JsonFile.h"

#include <cstring>
#include <memory>
#include <sstream>

#include "Command.h"
#include "input/ByteSource.h"
#include "input/Numbers.h"
#include "input/Utf8.h"

namespace VORN_JSON_DB::Cli {

namespace {

// The reader knows infinite numbers by their name only.
std::string WithInfinity(const std::string& strText) {
    constexpr char kTooGreat[] = "1e999";
    std::string strOut;
    bool blInText = false;
    for (std::size_t nAt = 0; nAt < strText.size(); ++nAt) {
        const char c = strText[nAt];
        const bool blAlone = nAt == 0 || std::strchr(" \t\n\r:,[-", strText[nAt - 1]) != nullptr;
        if (!blInText && blAlone && strText.compare(nAt, 5, kTooGreat) == 0) {
            strOut += "Infinity";
            nAt += 4;
            continue;
        }
        strOut += c;
        blInText = blInText != (c == '"');
        if (blInText && c == '\\' && nAt + 1 < strText.size()) {
            strOut += strText[++nAt];
        }
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
    const std::string strRead = WithInfinity(strText);
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
