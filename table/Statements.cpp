#include "Statements.h"

#include <algorithm>
#include <utility>

namespace vornjsondb {

namespace {

// They are looked through one by one, and each takes some KiB.
constexpr size_t kMostStatements = 1000;

}  // namespace

int Prepare(sqlite3* pDb, const char* szSql, OwnStatement& Out) {
    sqlite3_stmt* pStatement = nullptr;
    const int nResult =
        sqlite3_prepare_v3(pDb, szSql, -1, SQLITE_PREPARE_PERSISTENT, &pStatement, nullptr);
    Out.reset(pStatement);
    return nResult;
}

int PrepareFor(sqlite3* pDb, const std::string& strSql, const std::string& strText,
               OwnStatement& Out) {
    const int nResult = Prepare(pDb, strSql, Out);
    return nResult == SQLITE_OK ? sqlite3_bind_text(Out.get(), 1, strText.data(),
                                                    static_cast<int>(strText.size()), SQLITE_STATIC)
                                : nResult;
}

std::string TextColumn(const OwnStatement& pStatement, int nColumn) {
    std::string strText;
    if (const auto* pText = sqlite3_column_text(pStatement.get(), nColumn)) {
        strText += reinterpret_cast<const char*>(pText);
    }
    return strText;
}

Statement::Statement(Statement&& From) noexcept
    : m_pHome(From.m_pHome), m_pLent(std::move(From.m_pLent)) {}

Statement& Statement::operator=(Statement&& From) noexcept {
    std::swap(m_pHome, From.m_pHome);
    std::swap(m_pLent, From.m_pLent);
    return *this;
}

Statement::~Statement() {
    if (m_pLent) {
        m_pHome->GiveBack(*this);
    }
}

int Statement::Finish(int* pnRows) const {
    int nResult = Step();
    for (; nResult == SQLITE_ROW; nResult = Step()) {
        if (pnRows != nullptr) {
            ++*pnRows;
        }
    }
    const int nReset = sqlite3_reset(Get());
    return nResult == SQLITE_DONE ? nReset : nResult;
}

Statements::Statements(sqlite3* pDb, size_t nMost)
    : m_pDb(pDb), m_nMost(std::min(nMost, kMostStatements)) {
    // Giving a statement back must not need memory.
    m_vecKept.reserve(m_nMost);
}

bool Statements::TakeKept(std::string_view strShape, Statement& Lent) {
    for (auto itKept = m_vecKept.end(); itKept != m_vecKept.begin();) {
        --itKept;
        if ((*itKept)->strShape == strShape) {
            Lent.m_pHome = this;
            Lent.m_pLent = std::move(*itKept);
            m_vecKept.erase(itKept);
            return true;
        }
    }
    return false;
}

int Statements::Take(std::string_view strShape, Callable<std::string()> fnSql, Statement& Lent) {
    if (TakeKept(strShape, Lent)) {
        return SQLITE_OK;
    }
    auto pMade = std::make_unique<Statement::Kept>();
    const int nResult = Prepare(m_pDb, fnSql(), pMade->pStatement);
    // mutate(hoisted, sunk): without a statement nobody asks for its shape and home.
    if (nResult == SQLITE_OK) {
        pMade->strShape = strShape;
        Lent.m_pLent = std::move(pMade);
        Lent.m_pHome = this;
    }
    return nResult;
}

int Statements::KeepBegin() {
    if (m_pBegin) {
        return SQLITE_OK;
    }
    return Prepare(m_pDb, "BEGIN IMMEDIATE", m_pBegin);
}

void Statements::GiveBack(Statement& Lent) {
    sqlite3_reset(Lent.Get());
    sqlite3_clear_bindings(Lent.Get());
    if (m_nMost == 0) {
        return;
    }
    if (m_vecKept.size() == m_nMost) {
        m_vecKept.erase(m_vecKept.begin());
    }
    m_vecKept.push_back(std::move(Lent.m_pLent));
}

}  // namespace vornjsondb
