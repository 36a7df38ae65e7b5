// The names of members, by number in the order in which they were first seen.

#ifndef VORNJSONDB_CLI_INPUT_MEMBER_NAMES_H
#define VORNJSONDB_CLI_INPUT_MEMBER_NAMES_H

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <string_view>
#include <vector>

#include "Sink.h"

namespace VORN_JSON_DB::Cli {

class MemberNames {
  public:
    explicit MemberNames(Sink& To) : m_To(To) {}

    // More names than any table has columns are no records, and would fill the memory.
    static constexpr size_t kMost = 32767;
    static constexpr size_t kTooMany = static_cast<size_t>(-1);
    static std::string TooMany() {
        return "the records have more different members than the " + std::to_string(kMost) +
               " that a table can have columns";
    }

    void BeginRecord() {
        ++m_nRecord;
        m_nNext = 0;
    }

    // The member's number. blTwice: the record has it already.
    size_t Find(std::string_view strName, bool& blTwice) {
        // Records mostly have the same order.
        const bool blNext = m_nNext < m_vecNames.size() && *m_vecNames[m_nNext] == strName;
        const size_t nMember = blNext ? m_nNext : Look(strName);
        if (nMember != kTooMany) {
            blTwice = m_vecLastRecord[nMember] == m_nRecord;
            m_vecLastRecord[nMember] = m_nRecord;
            m_nNext = nMember + 1;
        }
        return nMember;
    }

    const std::string& Name(size_t nMember) const { return *m_vecNames[nMember]; }

  private:
    size_t Look(std::string_view strName);

    Sink& m_To;
    std::map<std::string, size_t, std::less<>> m_mapNumbers;
    std::vector<const std::string*> m_vecNames;  // keys of the map
    std::vector<std::int64_t> m_vecLastRecord;   // that had the member
    std::int64_t m_nRecord = 0;
    size_t m_nNext = 0;  // the one to compare with first
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_MEMBER_NAMES_H
