// The process around the model: the log flags, errno, the system log, standard output, statements,
// pauses, and what goes wrong on purpose. What the library does to the real ones, the model does
// here.
#ifndef VORNJSONDB_TESTS_CAMPAIGNS_MODEL_MODELHOST_H
#define VORNJSONDB_TESTS_CAMPAIGNS_MODEL_MODELHOST_H

#include <deque>
#include <initializer_list>
#include <string>
#include <vector>

#include <json/json.h>

#include "../../support/HostExits.h"

namespace campaign {

struct Flags {
    bool blLogToStdout = false;
    bool blDebugOutput = false;
};

// What the host does during one step. A number of a statement or of a pause counts from 0; -1 is
// none.
struct Plan {
    Flags flags;
    int nErrno = 0;
    int nFlagsAtStatement = -1;
    Flags flagsAtStatement;
    int nFlagsAtPause = -1;
    Flags flagsAtPause;
    bool blFlagsAfterLine = false;  // after the first line in the system log
    Flags flagsAfterLine;
    int nErrnoOfFree = 0;  // what releasing memory leaves in errno, from the first statement on
    std::vector<testhost::ExecFault> vecFaults;  // the first statements answer with these
    std::vector<int> vecChanges;                 // the first counts of changed rows
};

// A log line in canonical form.
struct Line {
    std::string strText;
    bool blPrinted;
    bool blErrno;             // errno was set; only known of a line in the system log
    bool blOwnWords = false;  // a condition check whose condition is the library's own wording
};

// What the process saw of one step.
struct Seen {
    std::vector<Line> vecLines;
    std::vector<std::string> vecStatements;
    std::vector<unsigned> vecPauses;
};

// An argument of a log line, as the C library shows it.
class Shown {
  public:
    Shown(int n) : m_strText(std::to_string(n)) {}
    Shown(const char* sz) : m_strText(sz == nullptr ? "(null)" : sz) {}
    Shown(const std::string& str) : m_strText(str.c_str()) {}  // up to its first NUL byte
    Shown(const Json::Value& jValue);

    const std::string& Text() const { return m_strText; }

  private:
    std::string m_strText;
};

class ModelHost {
  public:
    void Begin(const Plan& plan);
    const Seen& Result() const { return m_seen; }
    int FaultsUsed() const { return m_nFaultsUsed; }

    // ---- log lines of the class, and of the functions of the namespace ----
    // In a text each %s and %d stands for the next argument. Fails writes the long condition check
    // when blFailed, and returns it.
    bool Fails(bool blFailed, const char* szCondition);
    bool UtilFails(bool blFailed, const char* szCondition);
    void FailsInOwnWords();
    void ShortCheck(bool blFailed, const char* szCondition);
    void Plain(const char* szText, std::initializer_list<Shown> listShown);
    void Located(const char* szText, std::initializer_list<Shown> listShown);
    void Debug(const char* szText, std::initializer_list<Shown> listShown);
    void UtilPlain(const char* szText, std::initializer_list<Shown> listShown);
    void UtilLocated(const char* szText, std::initializer_list<Shown> listShown);

    // ---- statements and pauses ----
    // True: the statement is answered by a planned fault, and not run.
    bool Statement(const std::string& strSql, testhost::ExecFault& fault);
    int Changes(sqlite3* pDb);
    void Pause(unsigned nMicroseconds);
    void Freed();

    int nErrno = 0;

  private:
    void Write(const std::string& strText, bool blOwnWords = false);

    Plan m_plan;
    Flags m_flags;
    Seen m_seen;
    int m_nFaultsUsed = 0;
};

// There is one, as there is one process.
ModelHost& Host();

}  // namespace campaign

#endif  // VORNJSONDB_TESTS_CAMPAIGNS_MODEL_MODELHOST_H
