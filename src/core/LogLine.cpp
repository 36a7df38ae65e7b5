#include "LogLine.h"

namespace vornjsondb {

LineFormat::LineFormat(const char* szMessage) : m_blStdout(blLogToStdout) {
    const char* szBefore = "(%u) %s:%d ";
    if (!m_blStdout) {
        szBefore = errno != 0 ? "%s:%d (%u)(%m)" : "%s:%d (%u)";
    }
    static_cast<void>(std::snprintf(m_szText, sizeof(m_szText), "%s%s%s", szBefore, szMessage,
                                    m_blStdout ? "\n" : ""));
}

void LogFailedCondition(const char* szFile, int nLine, const char* szCondition) {
    VORN_LOG_LOCATED_AT(szFile, nLine, "Failed [%s], err=%m", szCondition);
}

}  // namespace vornjsondb
