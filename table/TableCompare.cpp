#include "TableCompare.h"

#include <algorithm>

#include "Affinity.h"
#include "CreateStatement.h"
#include "IndexSql.h"
#include "LintCodes.h"
#include "RealTable.h"

namespace vornjsondb {

namespace {

class TableCompare {
  public:
    TableCompare(sqlite3* pDb, const Members& Of, std::vector<std::string>* pvecStatements,
                 FindingList& vecFindings)
        : m_pDb(pDb),
          m_Of(Of),
          m_strPath(Below(Below("", Of.Table()), "member")),
          m_pvecStatements(pvecStatements),
          m_vecFindings(vecFindings) {}

    int Run(bool& blFound) {
        int nResult = ReadRealTable(m_pDb, m_Of.Table(), m_Real);
        blFound = !m_Real.vecColumns.empty();
        // mutate(exchanged): in any order.
        if (nResult == SQLITE_OK && blFound) {
            nResult = ReadRealIndexes(m_pDb, m_Of.Table(), m_Indexes);
        }
        // mutate(exchanged): in any order.
        if (nResult == SQLITE_OK && blFound) {
            nResult = IsStrict(m_pDb, m_Of.Table(), m_blStrict);
        }
        // mutate(exchanged, false, || to &&): what was found is told only where all went well.
        if (nResult != SQLITE_OK || !blFound) {
            return nResult;
        }
        if (m_Real.blView) {
            m_pvecStatements = nullptr;  // nothing can be added to a view
        }
        for (size_t i = 0; nResult == SQLITE_OK && i < m_Of.Size(); ++i) {
            nResult = CompareMember(i);
        }
        CompareColumns();
        if (m_Real.blView) {
            return nResult;
        }
        for (size_t i = 0; nResult == SQLITE_OK && i < m_Of.Size(); ++i) {
            if (m_Of.At(i).blUnique) {
                nResult = CompareUnique({i}, false);
            }
        }
        return nResult == SQLITE_OK ? CompareUnique(m_Of.Key(), true) : nResult;
    }

  private:
    std::string PathOf(const Member& Of) const { return Below(m_strPath, Of.strName); }

    void Add(LintCode eCode, const Member& Of, const std::string& strMessage) {
        Report(m_vecFindings, eCode, PathOf(Of), "member " + Of.strQuoted + strMessage);
    }

    const RealColumn* ColumnOf(const Member& Of) const {
        const auto itFound = std::find_if(
            m_Real.vecColumns.begin(), m_Real.vecColumns.end(),
            [&Of](const RealColumn& Column) { return IsSameColumn(Column.strName, Of.strName); });
        return itFound == m_Real.vecColumns.end() ? nullptr : &*itFound;
    }

    int CompareMember(size_t nMember) {
        const Member& Of = m_Of.At(nMember);
        const RealColumn* pColumn = ColumnOf(Of);
        if (pColumn == nullptr) {
            CompareMissing(Of);
            return SQLITE_OK;
        }
        // mutate(exchanged): what is learned in between is not told.
        if (pColumn->strName != Of.strName) {
            Add(LintCode::kOtherCase, Of,
                " is the column " + Quoted(pColumn->strName) +
                    ", which a VornJsonDbApi does not know by this name");
        }
        const Affinity eAffinity = AffinityOf(pColumn->strType);
        if (!Keeps(eAffinity, Of.Kind())) {
            Add(LintCode::kOtherAffinity, Of,
                " of type " + Quoted(Of.pType->szName) + ": its column, declared as " +
                    Quoted(pColumn->strType) + ", has " + NameOf(eAffinity) +
                    " affinity and changes what is stored");
        }
        // mutate(exchanged): both only look.
        if (Of.blNotNull && !pColumn->blNotNull && !IsRowid(m_Real, *pColumn) && !m_Real.blView) {
            Add(LintCode::kNullableColumn, Of, " is \"notNull\", and its column takes NULL");
        }
        return CompareDefault(Of, *pColumn);
    }

    // Where only one of them has a default it is the one that counts.
    int CompareDefault(const Member& Of, const RealColumn& Column) {
        static constexpr std::string_view kBefore = " DEFAULT ";
        const std::string strClause = DefaultClause(Of);
        if (strClause.empty() || Column.strDefault.empty()) {
            return SQLITE_OK;
        }
        const std::string strDefault = strClause.substr(kBefore.size());
        bool blSame = false;  // mutate(false to true): it is set in any case.
        const int nResult = HaveOneValue(m_pDb, strDefault, Column.strDefault, Of.IsJson(), blSame);
        if (nResult == SQLITE_OK && !blSame) {
            Add(LintCode::kOtherDefault, Of,
                " has the default " + strDefault + ", and its column " + Column.strDefault);
        }
        return nResult;
    }

    // SQLite adds NOT NULL only beside a default, which the rows that are there get.
    void CompareMissing(const Member& Of) {
        if (Of.blKey) {
            Add(LintCode::kMissingKeyColumn, Of,
                " of the key has no column, and the rows that are there would get no key");
        } else if (m_pvecStatements == nullptr) {
            Add(LintCode::kMissingColumn, Of, " has no column");
        } else {
            const std::string strDefault = DefaultClause(Of);
            const bool blNotNull = Of.blNotNull && !strDefault.empty();
            // mutate(exchanged): statements and findings are told apart.
            m_pvecStatements->push_back("ALTER TABLE " + m_Of.QuotedTable() + " ADD COLUMN " +
                                        ColumnClause(Of, blNotNull, m_blStrict));
            if (Of.blNotNull && !blNotNull) {
                Add(LintCode::kNullableColumn, Of,
                    " is \"notNull\" without a default, so that its new column takes NULL");
            }
        }
    }

    void CompareColumns() {
        for (const RealColumn& Column : m_Real.vecColumns) {
            if (m_Of.FindColumn(Column.strName) == Members::kNone) {
                const bool blNeeded = Column.blNotNull && Column.strDefault.empty();
                Report(m_vecFindings, LintCode::kExtraColumn, m_strPath,
                       "column " + Quoted(Column.strName) + " is no member: a VornJsonDbApi " +
                           "cannot read back what it creates" +
                           (blNeeded ? ", and no record can be created without its value" : ""));
            }
        }
        if (m_Real.blView) {
            Report(m_vecFindings, LintCode::kView, Below("", m_Of.Table()),
                   m_Of.QuotedTable() + " is a view");
        } else if (m_Real.strRowid.empty()) {
            Report(m_vecFindings, LintCode::kWithoutRowid, Below("", m_Of.Table()),
                   "the table has no rowid: a VornJsonDbApi cannot read back what it creates");
        }
    }

    int CompareUnique(const std::vector<size_t>& vecMembers, bool blKey) {
        std::vector<std::string> vecNames;
        std::vector<IndexTerm> vecTerms;
        for (const size_t nMember : vecMembers) {
            const Member& Of = m_Of.At(nMember);
            if (blKey && ColumnOf(Of) == nullptr) {
                return SQLITE_OK;  // told already
            }
            vecNames.push_back(Of.strName);
            vecTerms.push_back(IndexTerm{Of.strName, Place{nMember, ""}});
        }
        if (vecNames.empty() || IsUnique(vecNames, blKey)) {
            return SQLITE_OK;
        }
        if (m_pvecStatements == nullptr) {
            ReportNotUnique(vecMembers[0], blKey);
            return SQLITE_OK;
        }
        IndexPlan Plan;
        const int nResult = PlanIndex(m_pDb, m_Of, m_Indexes, vecTerms, true, m_vecPlanned, Plan);
        // mutate(doubled): it is only asked whether it is there.
        m_vecUniqueByPlan.push_back(vecNames);
        m_pvecStatements->push_back(Plan.strSql);
        return nResult;
    }

    void ReportNotUnique(size_t nMember, bool blKey) {
        if (blKey) {
            Report(m_vecFindings, LintCode::kKeyNotUnique, Below(Below("", m_Of.Table()), "key"),
                   "the table can hold several rows with one key");
        } else {
            Add(LintCode::kMissingUnique, m_Of.At(nMember),
                " is \"unique\", and several rows can have one value");
        }
    }

    bool IsUnique(const std::vector<std::string>& vecNames, bool blKey) const {
        const auto fnSame = [&vecNames](const std::vector<std::string>& vecOther) {
            return AreSameColumns(vecNames, vecOther);
        };
        const auto fnIndex = [&](bool blFiner) {
            return std::any_of(
                m_Indexes.vecAll.begin(), m_Indexes.vecAll.end(), [&](const RealIndex& Index) {
                    return Index.blUnique && Index.blFiner == blFiner && fnSame(Index.vecColumns);
                });
        };
        // A key is found as its index compares texts. How a primary key does only its index tells.
        return fnIndex(false) || (fnIndex(true) ? blKey : fnSame(m_Real.vecKey)) ||
               std::any_of(m_vecUniqueByPlan.begin(), m_vecUniqueByPlan.end(), fnSame);
    }

    sqlite3* m_pDb;
    const Members& m_Of;
    std::string m_strPath;
    std::vector<std::string>* m_pvecStatements;
    FindingList& m_vecFindings;
    RealTable m_Real;
    bool m_blStrict = false;
    RealIndexes m_Indexes;
    std::vector<std::string> m_vecPlanned;                    // names of indexes
    std::vector<std::vector<std::string>> m_vecUniqueByPlan;  // their columns
};

}  // namespace

int CompareTable(sqlite3* pDb, const Members& Of, bool& blFound,
                 std::vector<std::string>* pvecStatements, FindingList& vecFindings) {
    return TableCompare(pDb, Of, pvecStatements, vecFindings).Run(blFound);
}

}  // namespace vornjsondb
