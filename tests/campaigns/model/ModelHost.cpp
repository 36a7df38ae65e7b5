#include "ModelHost.h"

#include "Model.h"

namespace campaign {

namespace {

std::string Filled(const char* szText, std::initializer_list<Shown> listShown) {
    std::string strOut;
    const Shown* pNext = listShown.begin();
    for (const char* sz = szText; *sz != '\0'; ++sz) {
        if (*sz == '%') {
            strOut += (pNext++)->Text();
            ++sz;
        } else {
            strOut += *sz;
        }
    }
    return strOut;
}

}  // namespace

Shown::Shown(const Json::Value& jValue) : m_strText(Compact(jValue).c_str()) {}

ModelHost& Host() {
    static ModelHost s_host;
    return s_host;
}

void ModelHost::Begin(const Plan& plan) {
    m_plan = plan;
    m_flags = plan.flags;
    nErrno = plan.nErrno;
    m_seen = Seen();
    m_nFaultsUsed = 0;
}

// ---- log lines ----------------------------------------------------------------------------------

void ModelHost::Write(const std::string& strText, bool blOwnWords) {
    m_seen.vecLines.push_back({strText, m_flags.blLogToStdout, nErrno != 0, blOwnWords});
    if (m_plan.blFlagsAfterLine && !m_flags.blLogToStdout) {
        m_plan.blFlagsAfterLine = false;
        m_flags = m_plan.flagsAfterLine;
    }
}

bool ModelHost::Fails(bool blFailed, const char* szCondition) {
    if (blFailed) {
        Write(testhost::Check(szCondition));
    }
    return blFailed;
}

bool ModelHost::UtilFails(bool blFailed, const char* szCondition) {
    if (blFailed) {
        Write(testhost::UtilCheck(szCondition));
    }
    return blFailed;
}

void ModelHost::FailsInOwnWords() {
    Write(testhost::Check("*"), true);
}

void ModelHost::ShortCheck(bool blFailed, const char* szCondition) {
    if (blFailed) {
        Write(testhost::ShortCheck(szCondition));
    }
}

void ModelHost::Plain(const char* szText, std::initializer_list<Shown> listShown) {
    Write(testhost::Plain(Filled(szText, listShown)));
}

void ModelHost::Located(const char* szText, std::initializer_list<Shown> listShown) {
    Write(testhost::Located(Filled(szText, listShown)));
}

void ModelHost::Debug(const char* szText, std::initializer_list<Shown> listShown) {
    if (m_flags.blDebugOutput) {
        Plain(szText, listShown);
    }
}

void ModelHost::UtilPlain(const char* szText, std::initializer_list<Shown> listShown) {
    Write(testhost::UtilPlain(Filled(szText, listShown)));
}

void ModelHost::UtilLocated(const char* szText, std::initializer_list<Shown> listShown) {
    Write(testhost::UtilLocated(Filled(szText, listShown)));
}

// ---- statements and pauses ----------------------------------------------------------------------

bool ModelHost::Statement(const std::string& strSql, testhost::ExecFault& fault) {
    if (static_cast<int>(m_seen.vecStatements.size()) == m_plan.nFlagsAtStatement) {
        m_flags = m_plan.flagsAtStatement;
    }
    m_seen.vecStatements.emplace_back(strSql.c_str());
    if (m_plan.vecFaults.empty()) {
        return false;
    }
    fault = m_plan.vecFaults.front();
    m_plan.vecFaults.erase(m_plan.vecFaults.begin());
    nErrno = fault.nErrno;
    ++m_nFaultsUsed;
    return true;
}

int ModelHost::Changes(sqlite3* pDb) {
    if (m_plan.vecChanges.empty()) {
        return sqlite3_changes(pDb);
    }
    const int nChanges = m_plan.vecChanges.front();
    m_plan.vecChanges.erase(m_plan.vecChanges.begin());
    ++m_nFaultsUsed;
    return nChanges;
}

void ModelHost::Pause(unsigned nMicroseconds) {
    if (static_cast<int>(m_seen.vecPauses.size()) == m_plan.nFlagsAtPause) {
        m_flags = m_plan.flagsAtPause;
    }
    m_seen.vecPauses.push_back(nMicroseconds);
}

void ModelHost::Freed() {
    nErrno = m_plan.nErrnoOfFree != 0 ? m_plan.nErrnoOfFree : nErrno;
}

}  // namespace campaign
