// A definition, resolved: what the operations need of each member, looked up once.

#ifndef VORN_TABLE_MEMBERS_H
#define VORN_TABLE_MEMBERS_H

#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include <json/json.h>

#include "../src/schema/MemberType.h"
#include "Affinity.h"
#include "Failure.h"

namespace vornjsondb {

struct Member {
    std::string strName;
    std::string strQuoted;  // "name", where SQL takes a bare column
    std::string strColumn;  // "task"."name": in an expression an unqualified name that is unknown
                            // would become a text
    const MemberType* pType;
    const Json::Value* pjDefault;  // nullptr: none
    bool blKey;
    bool blNotNull;
    bool blUnique;
    bool blNullSeen;
    bool blGenerated;        // computed by the real table: can be read, not written
    bool blRowid;            // the row's number, which the real table hands out
    std::string strCollate;  // " COLLATE ...", as the key's index compares texts; empty: none does
    Affinity eAffinity = Affinity::kNone;  // of the real column

    BoundKind Kind() const { return pType->Bound.eKind; }
    bool IsJson() const;
    bool IsNumber() const;  // integer or real
};

class Members {
  public:
    // Of the table's entry in a definition, {"<table>": {"member": ...}}. What is wrong goes to
    // vecFindings; members with errors are left out.
    Members(const std::string& strTable, const Json::Value& jDefinition, FindingList& vecFindings);
    Members(const Members&) = delete;
    Members& operator=(const Members&) = delete;
    ~Members() = default;

    // In byte order of their names.
    const std::vector<Member>& All() const { return m_vecAll; }
    const Member& At(size_t nMember) const { return m_vecAll[nMember]; }
    size_t Size() const { return m_vecAll.size(); }
    const std::vector<std::string>& Names() const { return m_vecNames; }

    // The member's place, or kNone.
    static constexpr size_t kNone = static_cast<size_t>(-1);
    size_t Find(std::string_view strName) const;

    // The same by the name of a column, in any letter case.
    size_t FindColumn(const std::string& strColumn) const;

    // The places of the key's members, in the key's order; none when there is no key.
    const std::vector<size_t>& Key() const { return m_vecKey; }

    // A key of one whole number is the rowid itself: SQLite hands out values, and finds rows
    // fastest.
    bool HasRowidKey() const;

    // What only the real table tells. A key of which not all columns are members is none.
    void SetKey(const std::vector<std::string>& vecColumns);
    void SetGenerated(size_t nMember) { m_vecAll[nMember].blGenerated = true; }
    void SetRowid(size_t nMember) { m_vecAll[nMember].blRowid = true; }
    void SetCollate(size_t nMember, std::string strCollate) {
        m_vecAll[nMember].strCollate = std::move(strCollate);
    }
    bool HasCollates() const;  // all members of the key
    void ForgetCollates();
    void SetAffinity(size_t nMember, Affinity eOf) { m_vecAll[nMember].eAffinity = eOf; }

    const Json::Value& Definition() const { return m_jDefinition; }
    const std::string& Table() const { return m_strTable; }
    const std::string& QuotedTable() const { return m_strQuotedTable; }

  private:
    std::vector<size_t>::const_iterator PlaceOfColumn(const std::string& strColumn) const;
    void AddAll(const Json::Value& jMembers, FindingList& vecFindings);
    void TakeKey(const Json::Value& jKey, FindingList& vecFindings);

    std::string m_strTable;
    std::string m_strQuotedTable;
    Json::Value m_jDefinition;  // this table's entry alone; defaults point into it
    std::vector<Member> m_vecAll;
    std::vector<std::string> m_vecNames;
    std::vector<size_t> m_vecByColumn;  // places, in the order of columns
    std::vector<size_t> m_vecKey;
};

// By their names, in any letter case: so SQLite takes them.
bool IsSameColumn(const std::string& strLeft, const std::string& strRight);

}  // namespace vornjsondb

#endif  // VORN_TABLE_MEMBERS_H
