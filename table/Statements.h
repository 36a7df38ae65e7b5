// The prepared statements that a Table keeps.

#ifndef VORN_TABLE_STATEMENTS_H
#define VORN_TABLE_STATEMENTS_H

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include <sqlite3.h>

#include "Callable.h"

namespace vornjsondb {

struct FinalizeStatement {
    void operator()(sqlite3_stmt* pStatement) const { sqlite3_finalize(pStatement); }
};
using OwnStatement = std::unique_ptr<sqlite3_stmt, FinalizeStatement>;

// Prepares a statement that is used once. Returns SQLite's result.
int Prepare(sqlite3* pDb, const char* szSql, OwnStatement& Out);
inline int Prepare(sqlite3* pDb, const std::string& strSql, OwnStatement& Out) {
    return Prepare(pDb, strSql.c_str(), Out);
}

// The same with the first parameter bound to the text, which the caller keeps.
int PrepareFor(sqlite3* pDb, const std::string& strSql, const std::string& strText,
               OwnStatement& Out);

// NULL is the empty text.
std::string TextColumn(const OwnStatement& pStatement, int nColumn);

class Statements;

// A statement on loan. Given back at the end of its life: reset, so that it locks nothing, and with
// its bindings cleared, so that it points to nothing of the caller's.
class Statement {
  public:
    Statement() = default;
    Statement(const Statement&) = delete;
    Statement& operator=(const Statement&) = delete;
    Statement(Statement&& From) noexcept;
    Statement& operator=(Statement&& From) noexcept;
    ~Statement();

    sqlite3_stmt* Get() const { return m_pLent ? m_pLent->pStatement.get() : nullptr; }
    int Step() const { return sqlite3_step(Get()); }

    // Steps to the end, counting rows, and resets; the result of whichever failed first, or
    // SQLITE_OK. A statement has done its work only then: a commit may fail as late as in the
    // reset.
    int Finish(int* pnRows = nullptr) const;

    // Whether its shape is a letter and the text.
    bool IsFor(std::string_view strRest) const {
        return m_pLent && std::string_view(m_pLent->strShape).substr(1) == strRest;
    }

  private:
    friend class Statements;

    struct Kept {
        std::string strShape;
        OwnStatement pStatement;
    };

    Statements* m_pHome = nullptr;
    std::unique_ptr<Kept> m_pLent;
};

// Keeps the statements that were used last, each under a text that tells its shape. One that is on
// loan is not here, so a callback may ask for the same one and gets another.
class Statements {
  public:
    Statements(sqlite3* pDb, size_t nMost);
    Statements(const Statements&) = delete;
    Statements& operator=(const Statements&) = delete;
    ~Statements() = default;

    // Lends the statement of that shape, prepared from what fnSql returns when it is not here.
    // Returns SQLite's result.
    int Take(std::string_view strShape, Callable<std::string()> fnSql, Statement& Lent);

    // A BEGIN IMMEDIATE that stays, whatever else is used, and is prepared by the first KeepBegin.
    // Which returns SQLite's result.
    int KeepBegin();
    sqlite3_stmt* Begin() const { return m_pBegin.get(); }

  private:
    friend class Statement;

    bool TakeKept(std::string_view strShape, Statement& Lent);
    void GiveBack(Statement& Lent);

    sqlite3* m_pDb;
    size_t m_nMost;
    std::vector<std::unique_ptr<Statement::Kept>> m_vecKept;  // the one used last at the end
    OwnStatement m_pBegin;
};

}  // namespace vornjsondb

#endif  // VORN_TABLE_STATEMENTS_H
