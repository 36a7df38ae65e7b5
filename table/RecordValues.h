// The members of one record, as they will be stored.

#ifndef VORN_TABLE_RECORD_VALUES_H
#define VORN_TABLE_RECORD_VALUES_H

#include <string>
#include <vector>

#include <json/json.h>

#include "../src/base/JsonText.h"
#include "Fit.h"
#include "Members.h"

namespace vornjsondb {

constexpr char kNoKeyText[] = "the table has no key that tells records apart";

// Used for one record after the other, so that its memory is made once.
class RecordValues {
  public:
    RecordValues(const Members& Of, JsonCodec& Codec, bool blCompatible, bool blIgnoreUnknown);

    void Clear();

    // Takes a whole record, or new values for some members. Texts are not copied. Returns whether
    // all of it can be stored; if not, vecFindings tells why.
    bool Take(const Json::Value& jRecord, FindingList& vecFindings);

    // One member: for a Fit... function to fill, and from JSON.
    BoundValue& Give(size_t nMember) {
        m_strGiven[nMember] = '1';
        m_blEmpty = false;
        return m_vecValues[nMember];
    }
    void SetJson(size_t nMember, const Json::Value& jValue, FindingList& vecFindings);

    // Gives members that the record lacks the definition's defaults, which must fit like any value.
    bool FillDefaults(FindingList& vecFindings);

    // Whether every member of the key has a value; those without are reported.
    bool HasKey(FindingList& vecFindings) const;

    bool IsEmpty() const { return m_blEmpty; }
    bool Has(size_t nMember) const { return m_strGiven[nMember] == '1'; }
    const BoundValue& At(size_t nMember) const { return m_vecValues[nMember]; }

    // One '1' or '0' a member: the shape of the statements that write the record.
    const std::string& Given() const { return m_strGiven; }

    // Binds the members that the record has, from nNext on, which is moved past them; the key's
    // among them or not.
    int BindGiven(sqlite3_stmt* pStatement, int& nNext, bool blKeyToo) const;

    // Binds the key, from nNext on.
    int BindKey(sqlite3_stmt* pStatement, int& nNext) const;

  private:
    // Apart, so that records that fit pass by them.
    void Refuse(const Member& Into, Misfit eMisfit, const Json::Value& jValue,
                FindingList& vecFindings) const;
    void RefuseUnknown(const std::string& strName, FindingList& vecFindings) const;

    const Members& m_Of;
    JsonCodec& m_Codec;
    bool m_blCompatible;
    bool m_blIgnoreUnknown;
    std::vector<size_t> m_vecDefaults;  // members that have one
    std::vector<BoundValue> m_vecValues;
    std::vector<std::string> m_vecJson;  // texts of JSON members
    std::string m_strGiven;
    bool m_blEmpty = true;
};

// What a misfit means to the caller; kNone: the table computes the member.
void ReportMisfit(Misfit eMisfit, const Member& Into, const std::string& strShown,
                  std::string strPath, FindingList& vecFindings);

}  // namespace vornjsondb

#endif  // VORN_TABLE_RECORD_VALUES_H
