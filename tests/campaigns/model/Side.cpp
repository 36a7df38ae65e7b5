#include "Side.h"

#include <cerrno>
#include <memory>

#include "../../support/CanonicalLine.h"

// What differs is told by the campaign.
bool testhost::IsCapturedTextShown() {
    return false;
}

namespace campaign {

namespace {

void SetFlags(const Flags& flags) {
    blLogToStdout = flags.blLogToStdout;
    blDebugOutput = flags.blDebugOutput;
}

bool PrintsAnything(const Plan& plan) {
    return plan.flags.blLogToStdout || plan.flagsAtStatement.blLogToStdout ||
           plan.flagsAtPause.blLogToStdout || plan.flagsAfterLine.blLogToStdout;
}

bool IsLine(const std::string& strLine, const Line& wanted) {
    if (!wanted.blOwnWords) {
        return strLine == wanted.strText;
    }
    const std::size_t nStar = wanted.strText.find('*');
    const std::size_t nAfter = wanted.strText.size() - nStar - 1;
    return strLine.size() > wanted.strText.size() &&
           strLine.compare(0, nStar, wanted.strText, 0, nStar) == 0 &&
           strLine.compare(strLine.size() - nAfter, nAfter, wanted.strText, nStar + 1, nAfter) == 0;
}

std::string At(const std::vector<std::string>& vecTexts, std::size_t i) {
    return i < vecTexts.size() ? vecTexts[i] : "(nothing)";
}

Difference DifferentLine(const Side& library, const std::vector<Line>& vecWanted) {
    std::size_t nSyslog = 0;
    for (std::size_t i = 0; i < vecWanted.size(); ++i) {
        const Line& wanted = vecWanted[i];
        const std::string strWhat = "log line " + std::to_string(i);
        if (i >= library.vecLines.size() || !IsLine(library.vecLines[i], wanted)) {
            return {strWhat, At(library.vecLines, i), wanted.strText};
        }
        if (wanted.blPrinted) {
            continue;
        }
        if (nSyslog == library.vecSyslog.size()) {
            return {strWhat + ", where it goes", "stdout", "syslog, " + wanted.strText};
        }
        const testhost::SyslogCall& call = library.vecSyslog[nSyslog++];
        if (!IsLine(testhost::CanonicalSyslog(call), wanted)) {
            return {strWhat + ", in syslog", testhost::CanonicalSyslog(call), wanted.strText};
        }
        if ((call.nErrno != 0) != wanted.blErrno) {
            return {strWhat + ", errno", std::to_string(call.nErrno),
                    (wanted.blErrno ? "set, " : "clear, ") + wanted.strText};
        }
    }
    if (library.vecLines.size() > vecWanted.size()) {
        return {"a log line too many", library.vecLines[vecWanted.size()], "(nothing)"};
    }
    if (library.vecSyslog.size() > nSyslog) {
        return {"where a line goes", "syslog, " + library.vecSyslog[nSyslog].strRendered, "stdout"};
    }
    return {};
}

}  // namespace

int OnModel(const Plan& plan, const std::function<int()>& fn) {
    testhost::ResetExits();
    Host().Begin(plan);
    return fn();
}

void OnLibrary(const Plan& plan, const std::function<int()>& fn, Side& side) {
    std::unique_ptr<testhost::StdoutCapture> pCapture;
    if (PrintsAnything(plan)) {
        pCapture = std::make_unique<testhost::StdoutCapture>();
    }
    testhost::FailNextExec(plan.vecFaults);
    for (const int nChanges : plan.vecChanges) {
        testhost::FakeNextChanges(nChanges);
    }
    testhost::OnExec([&plan](int nStatement) {
        if (nStatement == plan.nFlagsAtStatement) {
            SetFlags(plan.flagsAtStatement);
        }
        if (nStatement == 0 && plan.nErrnoOfFree != 0) {
            testhost::OnFree([&plan] { errno = plan.nErrnoOfFree; });
        }
    });
    testhost::OnPause([&plan](int nPause) {
        if (nPause == plan.nFlagsAtPause) {
            SetFlags(plan.flagsAtPause);
        }
    });
    if (plan.blFlagsAfterLine) {
        testhost::OnNextLine([&plan] { SetFlags(plan.flagsAfterLine); });
    }
    SetFlags(plan.flags);
    try {
        errno = plan.nErrno;
        side.nResult = fn();
    } catch (const std::exception& e) {
        side.strThrown = e.what();
    }
    side.vecLines = testhost::TakeLog();
    side.vecSyslog = testhost::TakeSyslogCalls();
    side.vecStatements = testhost::TakeSql();
    side.vecPauses = testhost::TakePauses();
    pCapture.reset();
    testhost::ResetExits();
}

Difference Compared(const char* szWhat, const std::string& strLibrary,
                    const std::string& strModel) {
    return strLibrary == strModel ? Difference() : Difference{szWhat, strLibrary, strModel};
}

Difference FirstDifference(const Side& library, const Seen& wanted) {
    if (library.vecStatements != wanted.vecStatements) {
        std::size_t i = 0;
        while (At(library.vecStatements, i) == At(wanted.vecStatements, i)) {
            ++i;
        }
        return {"statement " + std::to_string(i), At(library.vecStatements, i),
                At(wanted.vecStatements, i)};
    }
    if (library.vecPauses != wanted.vecPauses) {
        return {"pauses", std::to_string(library.vecPauses.size()),
                std::to_string(wanted.vecPauses.size())};
    }
    return DifferentLine(library, wanted.vecLines);
}

std::string TextOf(const Plan& plan) {
    const auto TextOfFlags = [](const Flags& flags) {
        return std::string(flags.blLogToStdout ? " stdout" : "") +
               (flags.blDebugOutput ? " debug" : "");
    };
    std::string strText = "errno " + std::to_string(plan.nErrno) + TextOfFlags(plan.flags) +
                          "; from statement " + std::to_string(plan.nFlagsAtStatement) +
                          TextOfFlags(plan.flagsAtStatement) + "; from pause " +
                          std::to_string(plan.nFlagsAtPause) + TextOfFlags(plan.flagsAtPause);
    if (plan.blFlagsAfterLine) {
        strText += "; after a line" + TextOfFlags(plan.flagsAfterLine);
    }
    strText += "; a free leaves " + std::to_string(plan.nErrnoOfFree) + "; " +
               std::to_string(plan.vecFaults.size()) + " faults:";
    for (std::size_t i = 0; i < plan.vecFaults.size() && i < 5; ++i) {
        const testhost::ExecFault& fault = plan.vecFaults[i];
        strText += " {" + std::to_string(fault.nResult) + " " +
                   (fault.szError == nullptr ? "null" : fault.szError) + " " +
                   std::to_string(fault.nErrno) + "}";
    }
    for (const int nChanges : plan.vecChanges) {
        strText += "; changes " + std::to_string(nChanges);
    }
    return strText;
}

}  // namespace campaign
