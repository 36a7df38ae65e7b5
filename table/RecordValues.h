// The members of one record, as they will be stored.

#ifndef VORN_TABLE_RECORD_VALUES_H
#define VORN_TABLE_RECORD_VALUES_H

#include <cstdint>
#include <string>
#include <string_view>
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

    RecordValues(const RecordValues&) = delete;
    RecordValues& operator=(const RecordValues&) = delete;
    ~RecordValues() = default;

    void Clear() {
        // mutate(true, hoisted, sunk): what is empty stays so.
        if (!m_blEmpty) {
            ForgetAll();
        }
    }

    // Takes a whole record, or new values for some members. Texts are not copied. Returns whether
    // all of it can be stored; if not, vecFindings tells why.
    bool Take(const Json::Value& jRecord, FindingList& vecFindings);

    // What is kept of one member, from record to record.
    struct Slot {
        BoundValue Value;
        std::string strBytes;  // of a text that is kept here
        const Member* pMember = nullptr;
        char* pGiven = nullptr;              // the member's place in Given
        bool blBound = false;                // mutate(false to true): the first call binds all.
        BoundKind eKind = BoundKind::kNone;  // of values that are taken without a look
        bool blComputed = false;             // by the table, so that a value is refused
        std::int64_t nLeast = 0;             // of whole numbers that are taken without a look
        std::int64_t nMost = 0;
    };
    Slot& SlotOf(size_t nMember) { return m_vecSlots[nMember]; }

    // One member: null, for a Fit... function to fill, and from JSON.
    BoundValue& Give(Slot& Of) {
        Mark(Of);
        // mutate(exchanged): in any order.
        Of.blBound = false;
        Of.Value.eKind = BoundValue::Kind::kNull;
        return Of.Value;
    }
    void SetJson(Slot& Of, const Json::Value& jValue, FindingList& vecFindings);

    // A copy for a text that would not live as long as the value, followed by a NUL. There is one
    // for each member, whose memory never becomes less.
    static std::string_view Copied(Slot& Of, std::string_view strBytes) {
        // mutate(hoisted, sunk): how much memory is kept shows nowhere.
        if (Of.strBytes.size() < strBytes.size()) {
            Grow(Of.strBytes, strBytes.size());
        }
        char* const pOwn = Of.strBytes.data();
        strBytes.copy(pOwn, strBytes.size());
        pOwn[strBytes.size()] = '\0';
        return {pOwn, strBytes.size()};
    }

    // Most values are of their member's own kind and fit. These find that out in a few steps; what
    // they return false for is looked at by a Fit... function.
    bool FitsText(const Slot& Of, std::string_view strText) const {
        return Of.eKind == BoundKind::kText &&
               (!m_blCompatible || strText.find('\0') == std::string_view::npos);
    }
    bool TakeInteger(Slot& Of, std::int64_t nValue) {
        const bool blFits =
            Of.eKind == BoundKind::kInteger && nValue >= Of.nLeast && nValue <= Of.nMost;
        if (blFits) {
            GiveInteger(Of, nValue);
        }
        return blFits;
    }
    bool TakeBoolean(Slot& Of, bool blValue) {
        const bool blFits = Of.eKind == BoundKind::kBoolean;
        if (blFits) {
            GiveInteger(Of, blValue ? 1 : 0);
        }
        return blFits;
    }
    // JSON text as it will be stored.
    bool TakeWritten(Slot& Of, std::string_view strJson) {
        const bool blFits = Of.eKind == (strJson[0] == '[' ? BoundKind::kList : BoundKind::kObject);
        if (blFits) {
            GiveText(Of, strJson);
        }
        return blFits;
    }

    // Gives a value that fits. What a statement has bound already is not bound again: it knows
    // where a text is and how long, and what stands there may be another one by now.
    void GiveInteger(Slot& Of, std::int64_t nValue) {
        Mark(Of);
        // mutate(true, hoisted, sunk): what is bound may be bound again.
        if (!Of.Value.IsInteger(nValue)) {
            // mutate(exchanged): in any order.
            Of.blBound = false;
            Of.Value.SetInteger(nValue);
        }
    }
    void GiveText(Slot& Of, std::string_view strText) {
        Mark(Of);
        // mutate(true, hoisted, sunk): what is bound may be bound again.
        if (!Of.Value.IsTextAt(strText)) {
            // mutate(exchanged): in any order.
            Of.blBound = false;
            Of.Value.SetText(strText);
        }
    }

    // From now on every value of the member is refused: the table computes it.
    void RefuseAlways(size_t nMember) {
        m_vecSlots[nMember].eKind = BoundKind::kNone;
        m_vecSlots[nMember].blComputed = true;
    }

    // Gives members that the record lacks the definition's defaults, if it has any, which must fit
    // like any value.
    bool HasDefaults() const { return !m_vecDefaults.empty(); }
    bool FillDefaults(FindingList& vecFindings);

    // Whether every member of the key has a value; those without are reported.
    bool HasKey(FindingList& vecFindings) const;

    size_t Size() const { return m_strGiven.size(); }
    bool IsEmpty() const { return m_blEmpty; }
    bool Has(size_t nMember) const { return m_strGiven[nMember] == '1'; }
    const BoundValue& At(size_t nMember) const { return m_vecSlots[nMember].Value; }

    // One '1' or '0' a member: the shape of the statements that write the record.
    const std::string& Given() const { return m_strGiven; }

    // Binds the members that the record has, from nNext on, which is moved past them; the key's
    // among them or not. blAgain: the statement is that of the call before, for the same members,
    // and needs only what is new.
    int BindGiven(sqlite3_stmt* pStatement, int& nNext, bool blKeyToo, bool blAgain = false);

    // Binds the key, from nNext on.
    int BindKey(sqlite3_stmt* pStatement, int& nNext) const;

  private:
    void Prepare(size_t nMember);
    void Mark(Slot& Of) {
        *Of.pGiven = '1';
        m_blEmpty = false;
    }
    void ForgetAll();
    static void Grow(std::string& strOwn, size_t nBytes);

    // Apart, so that records that fit pass by them.
    void Refuse(const Member& Into, Misfit eMisfit, const Json::Value& jValue,
                FindingList& vecFindings) const;
    void RefuseUnknown(std::string_view strUnknown, FindingList& vecFindings) const;

    const Members& m_Of;
    JsonCodec& m_Codec;
    bool m_blCompatible;
    bool m_blIgnoreUnknown;
    std::vector<size_t> m_vecDefaults;  // members that have one
    std::vector<Slot> m_vecSlots;
    std::string m_strGiven;
    bool m_blEmpty = true;
};

// What a misfit means to the caller; kNone: the table computes the member.
void ReportMisfit(Misfit eMisfit, const Member& Into, const std::string& strShown,
                  std::string_view strPath, FindingList& vecFindings);

}  // namespace vornjsondb

#endif  // VORN_TABLE_RECORD_VALUES_H
