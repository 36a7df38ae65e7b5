#include "RealTable.h"

#include <algorithm>
#include <cstring>
#include <utility>

#include "Concat.h"
#include "FindingCodes.h"
#include "Members.h"
#include "Statements.h"

namespace vornjsondb {

namespace {

constexpr char kColumnsSql[] =
    "SELECT name, type, dflt_value, pk, \"notnull\", hidden FROM pragma_table_xinfo(?1)";

// A name finds a temporary table first, then one of the main database, then of the others in turn.
// The inner LIMIT has SQLite look no further: a view that it cannot read may stand there.
constexpr char kDatabaseSql[] =
    "SELECT Db.name FROM (SELECT name FROM pragma_database_list"
    " ORDER BY name <> 'temp', seq LIMIT 99) AS Db"
    " WHERE EXISTS (SELECT 1 FROM pragma_table_xinfo(?1, Db.name)) LIMIT 1";

// In any database: a statement that names one of them looks for clashes in others, too.
constexpr char kNameSql[] =
    "SELECT 1 FROM pragma_table_xinfo(?1) UNION ALL SELECT 1 FROM pragma_index_xinfo(?1)";

// A row for each column of each index.
std::string IndexesSql(std::string_view strWhat, const std::string& strDatabase,
                       std::string_view strWhere) {
    static constexpr char kParts[] = ") AS Listed, pragma_index_xinfo(Listed.name, ";
    const std::string strText = Enclosed(strDatabase, '\'');
    return Concat({"SELECT ", strWhat, " FROM pragma_index_list(?1, ", strText, kParts, strText,
                   ") AS Part WHERE Part.key AND ", strWhere});
}

// Calls fnRow for each row of a statement about the name.
int ForEachRow(sqlite3* pDb, const std::string& strSql, const std::string& strName,
               Callable<void(const OwnStatement&)> fnRow) {
    OwnStatement pStatement;
    int nResult = PrepareFor(pDb, strSql, strName, pStatement);
    if (nResult == SQLITE_OK) {
        while ((nResult = sqlite3_step(pStatement.get())) == SQLITE_ROW) {
            fnRow(pStatement);
        }
    }
    return nResult == SQLITE_DONE ? SQLITE_OK : nResult;
}

int NumberColumn(const OwnStatement& pStatement, int nColumn) {
    return sqlite3_column_int(pStatement.get(), nColumn);
}

// The rowid has three names; a WITHOUT ROWID table knows none of them.
std::string NameOfRowid(sqlite3* pDb, const std::string& strTable, const RealTable& Real) {
    for (const char* szName : {"rowid", "_rowid_", "oid"}) {
        const std::string strName = szName;
        bool blColumn = false;
        for (const RealColumn& Column : Real.vecColumns) {
            blColumn |= IsSameColumn(Column.strName, strName);
        }
        OwnStatement pStatement;
        const std::string strSql = Concat({"SELECT ", szName, " FROM ", Quoted(strTable)});
        // mutate(exchanged): a statement that nobody runs leaves nothing.
        if (!blColumn && Prepare(pDb, strSql, pStatement) == SQLITE_OK) {
            return szName;
        }
    }
    return {};
}

}  // namespace

int FindDatabase(sqlite3* pDb, const std::string& strTable, std::string& strDatabase) {
    return ForEachRow(pDb, kDatabaseSql, strTable,
                      [&](const OwnStatement& pRow) { strDatabase = TextColumn(pRow, 0); });
}

// Releases before 3.37 have no such pragma, and no such tables.
int IsStrict(sqlite3* pDb, const std::string& strTable, bool& blStrict) {
    const std::string strSql = Concat(
        {"SELECT 1 FROM pragma_table_list(?1) WHERE strict AND schema = (", kDatabaseSql, ")"});
    const int nResult =
        ForEachRow(pDb, strSql, strTable, [&](const OwnStatement&) { blStrict = true; });
    return nResult == SQLITE_ERROR ? SQLITE_OK : nResult;
}

// SQLite finds the table as in statements, in whatever database it is, and gives no metadata of a
// view.
int IsView(sqlite3* pDb, const std::string& strTable, bool& blView) {
    const int nResult = sqlite3_table_column_metadata(pDb, nullptr, strTable.c_str(), nullptr,
                                                      nullptr, nullptr, nullptr, nullptr, nullptr);
    blView = nResult == SQLITE_ERROR;
    return blView ? SQLITE_OK : nResult;
}

int ReadRealTable(sqlite3* pDb, const std::string& strTable, RealTable& Out) {
    // Hidden columns of virtual tables are no part of a row; generated ones are, of either kind.
    constexpr int kHidden = 1;
    int nResult = ForEachRow(pDb, kColumnsSql, strTable, [&](const OwnStatement& pRow) {
        if (NumberColumn(pRow, 5) == kHidden) {
            return;
        }
        // mutate(exchanged, > to >=): in any order, and what is hidden does not come here.
        Out.vecColumns.push_back(RealColumn{TextColumn(pRow, 0), TextColumn(pRow, 1),
                                            TextColumn(pRow, 2), NumberColumn(pRow, 4) != 0,
                                            NumberColumn(pRow, 5) > kHidden});
        // From 1; 0: outside of the key.
        const auto nPlaceInKey = static_cast<size_t>(NumberColumn(pRow, 3));
        while (Out.vecKey.size() < nPlaceInKey) {
            AddText(Out.vecKey, "");
        }
        if (nPlaceInKey > 0) {
            Out.vecKey[nPlaceInKey - 1] = Out.vecColumns.back().strName;
        }
    });
    if (nResult == SQLITE_OK && !Out.vecColumns.empty()) {
        nResult = IsView(pDb, strTable, Out.blView);
        // Some builds of SQLite give views a rowid, which is NULL.
        if (!Out.blView) {
            Out.strRowid = NameOfRowid(pDb, strTable, Out);
        }
    }
    // There it keeps all as it is; anywhere else it is one more word for a number.
    const std::string strAny = "ANY";
    bool blAsked = false;
    bool blStrict = false;
    for (RealColumn& Column : Out.vecColumns) {
        if (nResult == SQLITE_OK && IsSameColumn(Column.strType, strAny)) {
            // mutate(hoisted, sunk): asked again it says the same.
            if (!std::exchange(blAsked, true)) {
                nResult = IsStrict(pDb, strTable, blStrict);
            }
            if (blStrict) {
                Column.strType.clear();
            }
        }
    }
    return nResult;
}

int IsInSchema(sqlite3* pDb, const std::string& strTable, const char* szWhat, bool& blThere) {
    std::string strDatabase = "main";
    const int nResult = FindDatabase(pDb, strTable, strDatabase);
    if (nResult != SQLITE_OK) {
        return nResult;
    }
    // A temporary trigger may be one of any table.
    static constexpr char kOrTemporary[] =
        ".sqlite_schema UNION ALL SELECT * FROM sqlite_temp_schema) SELECT 1 FROM Here WHERE ";
    const std::string strSql = Concat(
        {"WITH Here AS (SELECT * FROM ", Quoted(strDatabase), kOrTemporary, szWhat, " LIMIT 1"});
    return ForEachRow(pDb, strSql, strTable, [&](const OwnStatement&) { blThere = true; });
}

int ReadRealIndexes(sqlite3* pDb, const std::string& strTable, RealIndexes& Out) {
    const int nResult = FindDatabase(pDb, strTable, Out.strDatabase);
    if (nResult != SQLITE_OK) {
        return nResult;
    }
    const std::string strWhat = Concat(
        {"Listed.seq, Listed.\"unique\" AND NOT Listed.partial, Part.name, Part.coll,"
         " (SELECT sql FROM ",
         Quoted(Out.strDatabase), ".sqlite_schema WHERE type = 'index' AND name = Listed.name)"});
    const std::string strSql =
        IndexesSql(strWhat, Out.strDatabase, "1 ORDER BY Listed.seq, Part.seqno");
    int nLast = -1;
    return ForEachRow(pDb, strSql, strTable, [&](const OwnStatement& pRow) {
        if (std::exchange(nLast, NumberColumn(pRow, 0)) != NumberColumn(pRow, 0)) {
            // mutate(doubled): both have one SQL text, and nobody looks for one without columns.
            Out.vecAll.push_back(
                RealIndex{TextColumn(pRow, 4), NumberColumn(pRow, 1) != 0, false, {}});
        }
        RealIndex& Index = Out.vecAll.back();
        const std::string strColumn = TextColumn(pRow, 2);
        const std::string strOfColumn = CollationOf(pDb, strTable, strColumn);
        const std::string strOfIndex = TextColumn(pRow, 3);
        // Collations have names like columns.
        Index.blFiner |= !IsSameColumn(strOfColumn, strOfIndex) && !IsBinary(strOfColumn);
        AddText(Index.vecColumns, strColumn);
    });
}

int LearnCollations(sqlite3* pDb, Members& Of) {
    static constexpr char kUnique[] =
        "Listed.\"unique\" AND NOT Listed.partial ORDER BY Listed.seq, Part.seqno DESC";
    std::string strDatabase = "main";
    int nResult = FindDatabase(pDb, Of.Table(), strDatabase);
    const std::string strSql = IndexesSql("Part.seqno, Part.name, Part.coll", strDatabase, kUnique);
    bool blFound = false;
    // First among those alone that compare as the columns do.
    for (int nTry = 0; nResult == SQLITE_OK && !blFound && nTry < 2; ++nTry) {
        size_t nColumns = 0;
        nResult = ForEachRow(pDb, strSql, Of.Table(), [&](const OwnStatement& pRow) {
            if (blFound) {
                return;
            }
            const std::string strColumn = TextColumn(pRow, 1);
            const std::string strCollation = TextColumn(pRow, 2);
            const std::string strOfColumn = CollationOf(pDb, Of.Table(), strColumn);
            const size_t nMember = Of.FindColumn(strColumn);
            // Collations have names like columns.
            if (nMember != Members::kNone &&
                (nTry > 0 || IsSameColumn(strOfColumn, strCollation))) {
                // mutate(doubled): the same once more.
                Of.SetCollate(nMember, Concat({" COLLATE ", Quoted(strCollation)}));
            }
            ++nColumns;
            if (NumberColumn(pRow, 0) == 0) {
                blFound = Of.HasCollates() && nColumns == Of.Key().size();
                nColumns = 0;
                if (!blFound) {
                    Of.ForgetCollates();
                }
            }
        });
    }
    return nResult;
}

bool IsRowid(const RealTable& Real, const RealColumn& Column) {
    return Real.vecKey.size() == 1 && Real.vecKey[0] == Column.strName &&
           sqlite3_stricmp(Column.strType.c_str(), "INTEGER") == 0;
}

std::string CollationOf(sqlite3* pDb, const std::string& strTable, const std::string& strColumn) {
    const char* szCollation = nullptr;
    sqlite3_table_column_metadata(pDb, nullptr, strTable.c_str(), strColumn.c_str(), nullptr,
                                  &szCollation, nullptr, nullptr, nullptr);
    return szCollation == nullptr ? "BINARY" : szCollation;
}

bool IsBinary(const std::string& strCollation) {
    return sqlite3_stricmp(strCollation.c_str(), "BINARY") == 0;
}

bool AreSameColumns(const std::vector<std::string>& vecLeft,
                    const std::vector<std::string>& vecRight) {
    return vecLeft.size() == vecRight.size() &&
           std::is_permutation(vecLeft.begin(), vecLeft.end(), vecRight.begin(), IsSameColumn);
}

int IsNameTaken(sqlite3* pDb, const std::string& strName, bool& blTaken) {
    blTaken = false;
    return ForEachRow(pDb, kNameSql, strName, [&](const OwnStatement&) { blTaken = true; });
}

namespace {

// Whether the text calls no function. What a file's schema may not call, a statement may: so whose
// default has a bracket or a comment outside of a literal is not asked for its value.
bool CallsNothing(const std::string& strSql) {
    char cQuote = '\0';
    for (const char c : strSql) {
        if (cQuote != '\0') {
            cQuote = c == cQuote ? '\0' : cQuote;
        } else if (c == '\'') {
            cQuote = c;
        } else if (std::strchr("(\"`[/", c) != nullptr) {
            return false;
        }
    }
    return strSql.find("--") == std::string::npos;
}

}  // namespace

int HaveOneValue(sqlite3* pDb, const std::string& strLeft, const std::string& strRight, bool blJson,
                 bool& blSame) {
    // mutate(hoisted): what follows gives its own.
    if (!CallsNothing(strRight)) {
        blSame = true;
        return SQLITE_OK;
    }
    std::string strSql = "SELECT CASE WHEN ";
    if (blJson) {
        // mutate(doubled): the same condition once more.
        Append(strSql, {"json_valid(", strRight, ") THEN json(", strLeft, ") IS json(", strRight,
                        ") WHEN "});
    }
    Append(strSql, {"1 THEN (", strLeft, ") IS (", strRight, ") END"});
    OwnStatement pStatement;
    int nResult = Prepare(pDb, strSql, pStatement);
    if (nResult == SQLITE_OK) {
        nResult = sqlite3_step(pStatement.get());
    }
    // mutate(exchanged): without a row its column is 0.
    blSame = nResult != SQLITE_ROW || NumberColumn(pStatement, 0) != 0;
    return nResult == SQLITE_ROW || nResult == SQLITE_ERROR ? SQLITE_OK : nResult;
}

}  // namespace vornjsondb
