#include "PlanSteps.h"

#include <algorithm>
#include <utility>

#include "Statements.h"

namespace vornjsondb {

namespace {

// Whether the step is of that kind and of one of the tables. Releases before 3.36 write "SCAN TABLE
// task".
bool IsOf(const std::string& strStep, const std::string& strKind,
          const std::vector<std::string>& vecTables) {
    const std::string strFound = strStep.substr(strStep.find_first_not_of(' ')) + " ";
    const auto fnBegins = [&strFound](const std::string& strBegin) {
        return sqlite3_strnicmp(strFound.c_str(), strBegin.c_str(),
                                static_cast<int>(strBegin.size())) == 0;
    };
    return std::any_of(vecTables.begin(), vecTables.end(), [&](const std::string& strTable) {
        return fnBegins(strKind + " " + strTable + " ") ||
               fnBegins(strKind + " TABLE " + strTable + " ");
    });
}

}  // namespace

int ReadPlanSteps(sqlite3* pDb, const std::string& strSql, std::vector<std::string>& vecSteps) {
    OwnStatement pStatement;
    int nResult = Prepare(pDb, "EXPLAIN QUERY PLAN " + strSql, pStatement);
    if (nResult != SQLITE_OK) {
        return nResult;
    }
    std::vector<std::pair<int, std::string>> vecOpen(1);  // steps by number, with indents
    while ((nResult = sqlite3_step(pStatement.get())) == SQLITE_ROW) {
        const int nParent = sqlite3_column_int(pStatement.get(), 1);
        while (vecOpen.size() > 1 && vecOpen.back().first != nParent) {
            vecOpen.pop_back();
        }
        const std::string strIndent = vecOpen.back().second;
        vecSteps.push_back(strIndent + TextColumn(pStatement, 3));
        // mutate(doubled): the last one of a number counts.
        vecOpen.emplace_back(sqlite3_column_int(pStatement.get(), 0), strIndent + "  ");
    }
    return nResult == SQLITE_DONE ? SQLITE_OK : nResult;
}

bool HasScan(const std::vector<std::string>& vecSteps, const std::vector<std::string>& vecTables) {
    return std::any_of(vecSteps.begin(), vecSteps.end(), [&](const std::string& strStep) {
        return IsOf(strStep, "SCAN", vecTables) && strStep.find(" USING ") == std::string::npos;
    });
}

bool HasOwnIndex(const std::vector<std::string>& vecSteps,
                 const std::vector<std::string>& vecTables) {
    return std::any_of(vecSteps.begin(), vecSteps.end(), [&](const std::string& strStep) {
        return IsOf(strStep, "SEARCH", vecTables) &&
               strStep.find(" USING AUTOMATIC ") != std::string::npos;
    });
}

}  // namespace vornjsondb
