#include "IndexSql.h"

#include <algorithm>

#include "LeafSql.h"

namespace vornjsondb {

namespace {

bool HasOwnCollation(sqlite3* pDb, const Members& Of, const Member& Indexed) {
    return !IsBinary(CollationOf(pDb, Of.Table(), Indexed.strName));
}

// As conditions have it, so that SQLite finds the index: the same text for a place in JSON, and
// texts in the order of their bytes. What is unique is told by the column, as a key is found by it.
std::string TermSql(sqlite3* pDb, const Members& Of, const Place& Where, bool blUnique) {
    const Member& Indexed = Of.At(Where.nMember);
    if (!Where.strPath.empty()) {
        return ValueAt(Indexed.strQuoted, Where.strPath);
    }
    if (!IsOrderedAsText(Indexed) || (blUnique && HasOwnCollation(pDb, Of, Indexed))) {
        return Indexed.strQuoted;
    }
    return Indexed.strQuoted + " COLLATE BINARY";
}

// SQLite keeps names that begin with "sqlite_" to itself.
std::string BaseName(const std::string& strTable) {
    if (sqlite3_stricmp(strTable.c_str(), "sqlite") == 0) {
        return "index_" + strTable;
    }
    return strTable;
}

// An index of a table in the main database or a temporary one goes there by itself.
std::string DatabasePrefix(const std::string& strDatabase) {
    if (strDatabase == "main" || strDatabase == "temp") {
        return {};
    }
    return Quoted(strDatabase) + ".";
}

bool EndsWith(const std::string& strText, const std::string& strEnd) {
    return strText.size() >= strEnd.size() &&
           strText.compare(strText.size() - strEnd.size(), strEnd.size(), strEnd) == 0;
}

int FindFreeName(sqlite3* pDb, const std::string& strBase,
                 const std::vector<std::string>& vecPlanned, std::string& strName) {
    bool blTaken = false;
    int nResult = IsNameTaken(pDb, strBase, blTaken);
    strName = strBase;
    for (int i = 2; blTaken || std::count(vecPlanned.begin(), vecPlanned.end(), strName) > 0; ++i) {
        strName = strBase + "_" + std::to_string(i);
        nResult = IsNameTaken(pDb, strName, blTaken);
    }
    return nResult;
}

}  // namespace

int PlanIndex(sqlite3* pDb, const Members& Of, const RealIndexes& There,
              const std::vector<IndexTerm>& vecTerms, bool blUnique,
              std::vector<std::string>& vecPlanned, IndexPlan& Out) {
    const std::string strHead = blUnique ? "CREATE UNIQUE INDEX " : "CREATE INDEX ";
    // mutate(exchanged): in any order.
    std::string strBase = BaseName(Of.Table());
    std::string strTail = " ON " + Of.QuotedTable();
    const char* szBefore = " (";
    for (const IndexTerm& Term : vecTerms) {
        // mutate(exchanged): in any order.
        strBase += "_" + Term.strName;
        strTail += szBefore + TermSql(pDb, Of, Term.Where, blUnique);
        szBefore = ", ";
    }
    strTail += ')';
    const std::string strCreate = strHead + DatabasePrefix(There.strDatabase);
    for (const RealIndex& Index : There.vecAll) {
        // mutate(exchanged, hoisted): both only look, and what follows gives another plan.
        if (Index.strSql.compare(0, strHead.size(), strHead) == 0 &&
            EndsWith(Index.strSql, strTail)) {
            Out = IndexPlan{strCreate + Index.strSql.substr(strHead.size()), true};
            return SQLITE_OK;
        }
    }
    std::string strName;
    const int nResult = FindFreeName(pDb, strBase, vecPlanned, strName);
    // mutate(doubled): it is only asked whether it is there.
    vecPlanned.push_back(strName);
    Out = IndexPlan{strCreate + Quoted(strName) + strTail, false};
    return nResult;
}

}  // namespace vornjsondb
