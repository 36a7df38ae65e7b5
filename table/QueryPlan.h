// A query against one table: names resolved, operands checked, written as SQL.

#ifndef VORN_TABLE_QUERY_PLAN_H
#define VORN_TABLE_QUERY_PLAN_H

#include <string>
#include <vector>

#include <sqlite3.h>

#include "../src/base/JsonText.h"
#include "LeafSql.h"

namespace vornjsondb {

// What a statement does with the rows that it finds.
enum class QueryUse {
    kRead,   // hands them out: conditions, sorting, paging, members
    kCount,  // counts them: conditions and paging
    kChange  // changes or removes them: at least one condition, no sorting, no paging
};

class QueryPlan {
  public:
    // Both must outlive the plan, and so must the query. With pfnLiteral the SQL holds its values
    // instead of binding them.
    QueryPlan(const Members& Of, JsonCodec& Codec, BoundSql::WriteLiteral pfnLiteral = nullptr)
        : m_Of(Of), m_Codec(Codec) {
        m_Sql.pfnLiteral = pfnLiteral;
    }
    QueryPlan(const QueryPlan&) = delete;
    QueryPlan& operator=(const QueryPlan&) = delete;
    ~QueryPlan() = default;

    // Comes first, and once. What is wrong with the query, its own findings included, goes to
    // vecFindings, empty before; after an error nothing else may be called.
    void Resolve(const VORN_JSON_DB::Query& Which, QueryUse eUse, FindingList& vecFindings);

    // Alike only for queries that give the same SQL, whatever their values: a key for the
    // statement. Any bytes.
    const std::string& Shape() const { return m_nPlain > 0 ? m_strShape : m_Sql.strSql; }

    // The same with a letter for what the statement does, at the end, which spares a copy. Asked
    // for once.
    const std::string& ShapeFor(char cUse) {
        return (m_nPlain > 0 ? m_strShape : m_Sql.strSql) += cUse;
    }

    // The members to read, in the order of the result's columns: vecAll where the query names none.
    const std::vector<size_t>& Columns(const std::vector<size_t>& vecAll) const {
        return m_vecColumns.empty() ? vecAll : m_vecColumns;
    }

    // "<condition>", the same behind " WHERE ", and " ORDER BY ... LIMIT ? OFFSET ?"; or nothing.
    std::string_view Condition();
    void AppendWhere(std::string& strSql);
    void AppendTail(std::string& strSql);

    // Binds all values of both, from parameter nFirst on. Texts are not copied: query and plan
    // must live until the statement is reset. Returns SQLite's result.
    int Bind(sqlite3_stmt* pStatement, int nFirst) const;

  private:
    static bool IsPaged(const VORN_JSON_DB::Query& Which) {
        return Which.nLimit != -1 || Which.nOffset != 0;
    }
    static void CheckPage(const VORN_JSON_DB::Query& Which, QueryUse eUse,
                          FindingList& vecFindings);
    bool ResolvePlain(const VORN_JSON_DB::Query& Which);
    void Write(const VORN_JSON_DB::Query& Which, QueryUse eUse, FindingList& vecFindings);
    void WritePlain();
    void ResolveMembers(const VORN_JSON_DB::Query& Which, FindingList& vecFindings);
    void ResolveSort(const VORN_JSON_DB::Query& Which, bool blPaged, FindingList& vecFindings);
    void AppendSort(size_t nMember, const std::string& strPath, bool blDescending);
    void AppendPage(const VORN_JSON_DB::Query& Which);

    const Members& m_Of;
    JsonCodec& m_Codec;
    BoundSql m_Sql;  // conditions, sorting and paging, and the columns' numbers
    size_t m_nConditionEnd = 0;
    size_t m_nTailEnd = 0;
    std::vector<size_t> m_vecColumns;

    // Of a plain query, whose SQL is written when it is asked for.
    const VORN_JSON_DB::Query* m_pWhich = nullptr;
    QueryUse m_eUse = QueryUse::kRead;
    std::string m_strShape;
    BoundValue m_aPlain[3];  // mutate(3 to 4): one more is not used.
    size_t m_nPlain = 0;     // 0: it is none
};

}  // namespace vornjsondb

#endif  // VORN_TABLE_QUERY_PLAN_H
