// Runs one call inside the planned host, and compares what the process saw.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_MODEL_SIDE_H
#define VORNJSONDB_TESTS_CAMPAIGNS_MODEL_SIDE_H

#include <functional>
#include <string>
#include <vector>

#include "ModelHost.h"

namespace campaign {

// What the library did.
struct Side {
    int nResult = 0;
    std::string strThrown;
    std::string Result() const {
        return strThrown.empty() ? std::to_string(nResult) : "threw " + strThrown;
    }

    std::vector<std::string> vecLines;
    std::vector<testhost::SyslogCall> vecSyslog;
    std::vector<std::string> vecStatements;
    std::vector<unsigned> vecPauses;
};

int OnModel(const Plan& plan, const std::function<int()>& fn);
void OnLibrary(const Plan& plan, const std::function<int()>& fn, Side& side);

struct Difference {
    std::string strWhat;
    std::string strLibrary;
    std::string strModel;
    bool IsNone() const { return strWhat.empty(); }
};
Difference Compared(const char* szWhat, const std::string& strLibrary, const std::string& strModel);
Difference FirstDifference(const Side& library, const Seen& wanted);

std::string TextOf(const Plan& plan);

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_MODEL_SIDE_H
