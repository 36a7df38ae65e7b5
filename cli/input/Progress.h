// How far a long work is, on a terminal's standard error.

#ifndef VORNJSONDB_CLI_INPUT_PROGRESS_H
#define VORNJSONDB_CLI_INPUT_PROGRESS_H

#include <chrono>
#include <cstdint>
#include <string>

namespace VORN_JSON_DB::Cli {

class Progress {
  public:
    // Shows nothing in the first second, on what is no terminal, and if blQuiet.
    Progress(std::string strWhat, std::int64_t nAllBytes, bool blQuiet);
    ~Progress() { Clear(); }
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    // nBytes: how much of the input is read.
    void Tick(std::int64_t nRecords, std::int64_t nBytes) {
        if (m_blShown) {
            Look(nRecords, nBytes);
        }
    }

    void Clear();  // before anything else is written

    // One line of it: nAllBytes below 0 is unknown.
    static std::string Line(const std::string& strWhat, std::int64_t nRecords, std::int64_t nBytes,
                            std::int64_t nAllBytes, double dRecordsPerSecond,
                            double dBytesPerSecond);

  private:
    using Clock = std::chrono::steady_clock;
    void Look(std::int64_t nRecords, std::int64_t nBytes);

    const std::string m_strWhat;
    const std::int64_t m_nAllBytes;
    const bool m_blShown;
    bool m_blDrawn = false;
    const Clock::time_point m_Begin = Clock::now();
    Clock::time_point m_Last = m_Begin;
    std::int64_t m_nLastRecords = 0;
    std::int64_t m_nLastBytes = 0;
    double m_dRecords = 0;  // a second, smoothed
    double m_dBytes = 0;
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_PROGRESS_H
