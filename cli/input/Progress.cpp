#include "Progress.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <utility>

#include "../Terminal.h"

namespace VORN_JSON_DB::Cli {

namespace {

using Seconds = std::chrono::duration<double>;

constexpr Seconds kSilent(1.0);
constexpr Seconds kPause(0.1);
constexpr double kNewWeight = 0.3;  // of the latest rate in the smoothed one
constexpr int kBarWidth = 20;

// 1234567 as 1,234,567
std::string Grouped(double dNumber) {
    std::string strDigits = std::to_string(static_cast<std::int64_t>(dNumber));
    for (size_t i = strDigits.size(); i > 3; i -= 3) {
        strDigits.insert(i - 3, 1, ',');
    }
    return strDigits;
}

std::string Remaining(double dSeconds) {
    const auto nSeconds = static_cast<std::int64_t>(std::ceil(dSeconds));
    char szText[48];
    static_cast<void>(std::snprintf(szText, sizeof szText, "%lld:%02lld left",
                                    static_cast<long long>(nSeconds / 60),
                                    static_cast<long long>(nSeconds % 60)));
    return szText;
}

std::string Bar(double dPart) {
    const int nFull = static_cast<int>(dPart * kBarWidth);
    return "[" + std::string(static_cast<size_t>(nFull), '#') +
           std::string(static_cast<size_t>(kBarWidth - nFull), '.') + "] " +
           std::to_string(static_cast<int>(dPart * 100)) + " %";
}

void Write(const std::string& strText) {
    static_cast<void>(std::fwrite(strText.data(), 1, strText.size(), stderr));
    static_cast<void>(std::fflush(stderr));
}

}  // namespace

Progress::Progress(std::string strWhat, std::int64_t nAllBytes, bool blQuiet)
    : m_strWhat(std::move(strWhat)),
      m_nAllBytes(nAllBytes),
      m_blShown(!blQuiet && IsAnimated(stderr)) {}

std::string Progress::Line(const std::string& strWhat, std::int64_t nRecords, std::int64_t nBytes,
                           std::int64_t nAllBytes, double dRecordsPerSecond,
                           double dBytesPerSecond) {
    std::string strLine = strWhat + " ";
    if (nAllBytes > 0) {
        // A file may grow while it is read.
        strLine += Bar(std::min(1.0, static_cast<double>(nBytes) / static_cast<double>(nAllBytes)));
    } else {
        strLine += Grouped(static_cast<double>(nBytes) / 1e6) + " MB";
    }
    strLine += "  " + Grouped(static_cast<double>(nRecords)) + " records  " +
               Grouped(dRecordsPerSecond) + "/s";
    if (nAllBytes > 0 && dBytesPerSecond > 0) {
        const std::int64_t nLeft = std::max<std::int64_t>(0, nAllBytes - nBytes);
        strLine += "  " + Remaining(static_cast<double>(nLeft) / dBytesPerSecond);
    }
    return strLine;
}

void Progress::Look(std::int64_t nRecords, std::int64_t nBytes) {
    const Clock::time_point Now = Clock::now();
    const Seconds Since = Now - m_Last;
    if (Now - m_Begin < kSilent || Since < kPause) {
        return;
    }
    const double dWeight = m_blDrawn ? kNewWeight : 1.0;
    const auto fnSmooth = [&](double& dRate, std::int64_t nNew) {
        dRate += dWeight * (static_cast<double>(nNew) / Since.count() - dRate);
    };
    fnSmooth(m_dRecords, nRecords - m_nLastRecords);
    fnSmooth(m_dBytes, nBytes - m_nLastBytes);
    m_Last = Now;
    m_nLastRecords = nRecords;
    m_nLastBytes = nBytes;
    m_blDrawn = true;
    // A line that wraps would stay.
    const std::string strLine =
        Line(m_strWhat, nRecords, nBytes, m_nAllBytes, m_dRecords, m_dBytes);
    const auto nWidth = static_cast<size_t>(TerminalWidth(stderr));
    Write("\r" + strLine.substr(0, nWidth - 1) + "\x1b[K");
}

void Progress::Clear() {
    if (m_blDrawn) {
        Write("\r\x1b[K");
        m_blDrawn = false;
    }
}

}  // namespace VORN_JSON_DB::Cli
