#include "LogLine.h"

namespace vornjsondb {

void LogFailedCondition(const char* szFile, int nLine, const char* szCondition) {
    VORN_LOG_LOCATED_AT(szFile, nLine, "Failed [%s], err=%m", szCondition);
}

}  // namespace vornjsondb
