// Memory, start and size: figures of whole processes and of the library's file.

#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

#include <json/json.h>

#include "RatioRows.h"
#include "support/Bench.h"
#include "support/Interleave.h"
#include "support/Records.h"

namespace bench {

namespace {

// Runs a program of this project that prints one JSON value, and returns it.
Json::Value Ask(const std::string& strCommand) {
    FILE* pPipe = popen(strCommand.c_str(), "r");
    Require(pPipe != nullptr, strCommand.c_str());
    std::string strText;
    char szPart[4096];
    size_t nRead = 0;
    while ((nRead = fread(szPart, 1, sizeof(szPart), pPipe)) > 0) {
        strText.append(szPart, nRead);
    }
    Require(pclose(pPipe) == 0, strCommand.c_str());
    Json::Value jAnswer;
    Require(Json::Reader().parse(strText, jAnswer), strCommand.c_str());
    return jAnswer;
}

Json::Value AskLoader(const Settings& Now) {
    return Ask(Now.strLoadProgram + " " + Now.strLibrary);
}

double StrippedBytes(const std::string& strFile) {
    char szCopy[] = "/tmp/vornjsondb-stripped-XXXXXX";
    const int nFile = mkstemp(szCopy);
    Require(nFile >= 0, "temporary file");
    close(nFile);
    const std::string strCommand = "strip -s -o " + std::string(szCopy) + " " + strFile;
    Require(std::system(strCommand.c_str()) == 0, strCommand.c_str());
    const auto nBytes = static_cast<double>(std::filesystem::file_size(szCopy));
    std::filesystem::remove(szCopy);
    return nBytes;
}

}  // namespace

Figure PeakMemoryRatio(const Settings& Now) {
    const Json::Value jAnswer = Ask(Now.strPeakProgram + (Now.blShort ? " 20000" : " 200000"));
    constexpr double kMiB = 1 << 20;
    return {"MiB", jAnswer["peak"].asDouble() / kMiB, jAnswer["array"].asDouble() / kMiB,
            jAnswer["peak"].asDouble() / jAnswer["array"].asDouble()};
}

Figure HandleRatio(const Settings& Now) {
    const Table Eight = EightMembers();
    const Database Db;
    const auto pFirst = Eight.Open(Db.Get());
    std::string strName = Eight.strName;
    std::string strCreate = Eight.strSqlCreate;
    Json::Value jDefinition = Eight.jDefinition;
    const Timing Found = Interleave(
        {Now.blShort ? 10 : 30, 300},
        [&](int) { VornJsonDbApi Handle(Db.Get(), strName, jDefinition, strCreate); },
        [&](int) { Db.Exec(strCreate); });
    return {"ns", Found.dOurs, Found.dOther, Found.dRatio};
}

Figure LoadTimeRatio(const Settings& Now) {
    std::vector<double> vecOurs;
    std::vector<double> vecSqlite;
    for (int i = 0; i < (Now.blShort ? 10 : 30); ++i) {
        const Json::Value jAnswer = AskLoader(Now);
        vecOurs.push_back(jAnswer["library"]["microseconds"].asDouble());
        vecSqlite.push_back(jAnswer["sqlite"]["microseconds"].asDouble());
    }
    return {"us", Median(vecOurs), Median(vecSqlite), Median(vecOurs) / Median(vecSqlite)};
}

Figure RelocationRatio(const Settings& Now) {
    const Json::Value jAnswer = AskLoader(Now);
    const double dOurs = jAnswer["library"]["relocations"].asDouble();
    const double dSqlite = jAnswer["sqlite"]["relocations"].asDouble();
    return {"count", dOurs, dSqlite, dOurs / dSqlite};
}

Figure StrippedSize(const Settings& Now) {
    constexpr double kKiB = 1 << 10;
    const double dOurs = StrippedBytes(Now.strLibrary) / kKiB;
    const double dSqlite = StrippedBytes(AskLoader(Now)["sqlite"]["file"].asString()) / kKiB;
    return {"KiB", dOurs, dSqlite, dOurs};
}

}  // namespace bench
