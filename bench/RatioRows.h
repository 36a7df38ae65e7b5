// The rows of the table of goals; each measures one ratio.

#ifndef VORN_BENCH_RATIO_ROWS_H
#define VORN_BENCH_RATIO_ROWS_H

#include <string>

namespace bench {

struct Settings {
    bool blShort = false;
    std::string strPeakProgram;  // see peak.cpp
    std::string strLoadProgram;  // see load.cpp
    std::string strLibrary;      // the shared library under test
};

struct Figure {
    const char* szUnit;
    double dOurs;
    double dOther;
    double dFigure;  // what is compared with the goal; mostly ours / other
};

// RatiosRecords.cpp: whole calls on the table of eight members
Figure CreateRatio(const Settings& Now);
Figure GetRatio(const Settings& Now);
Figure ListRatio(const Settings& Now);
Figure UpdateRatio(const Settings& Now);
Figure DeleteRatio(const Settings& Now);

// RatiosText.cpp: SQL texts and long values
Figure ValueListRatio(const Settings& Now);
Figure NamesListRatio(const Settings& Now);
Figure OneLongTextRatio(const Settings& Now);
Figure EightLongTextsRatio(const Settings& Now);

// RatiosTable.cpp: the second handle
Figure TableCreateRatio(const Settings& Now);
Figure TableToOldRatio(const Settings& Now);
Figure TableGetRatio(const Settings& Now);
Figure TableListRatio(const Settings& Now);
Figure LoadBySettersRatio(const Settings& Now);
Figure LoadFromJsonRatio(const Settings& Now);
Figure LoadSameJsonRatio(const Settings& Now);
Figure QueryShare(const Settings& Now);
Figure LongInRatio(const Settings& Now);

// RatiosProcess.cpp: memory, start and size
Figure PeakMemoryRatio(const Settings& Now);
Figure HandleRatio(const Settings& Now);
Figure LoadTimeRatio(const Settings& Now);
Figure RelocationRatio(const Settings& Now);
Figure StrippedSize(const Settings& Now);

}  // namespace bench

#endif  // VORN_BENCH_RATIO_ROWS_H
