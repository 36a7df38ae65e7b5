#include "PlanSteps.h"

#include <algorithm>
#include <string_view>
#include <utility>

#include "Concat.h"
#include "Statements.h"

namespace vornjsondb {

namespace {

// Whether the step is of that kind and of one of the tables. Releases before 3.36 write "SCAN TABLE
// task".
bool IsOf(std::string_view strStep, std::string_view strKind,
          const std::vector<std::string>& vecTables) {
    const std::string strFound = Concat({strStep.substr(strStep.find_first_not_of(' ')), " "});
    bool blIs = false;
    for (const std::string& strTable : vecTables) {
        for (const char* szBefore : {" ", " TABLE "}) {
            const std::string strBegin = Concat({strKind, szBefore, strTable, " "});
            const int nSize = static_cast<int>(strBegin.size());
            blIs |= sqlite3_strnicmp(strFound.c_str(), strBegin.c_str(), nSize) == 0;
        }
    }
    return blIs;
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
