#include "LogLine.h"

namespace vornjsondb {

LineFormat::LineFormat(const char* szBefore, const char* szMessage, const char* szAfter) {
    static_cast<void>(
        std::snprintf(m_szText, sizeof(m_szText), "%s%s%s", szBefore, szMessage, szAfter));
}

void LogFailedCondition(const char* szFile, int nLine, const char* szCondition) {
    VORN_LOG_LOCATED_AT(szFile, nLine, "Failed [%s], err=%m", szCondition);
}

}  // namespace vornjsondb
