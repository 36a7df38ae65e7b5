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

    void BeginRecord() {
        ++m_nRecord;
        m_nNext = 0;
    }

    // The member's number. blTwice: the record has it already.
    size_t Find(std::string_view strName, bool& blTwice);

    const std::string& Name(size_t nMember) const { return *m_vecNames[nMember]; }
    size_t Size() const { return m_vecNames.size(); }

  private:
    Sink& m_To;
    std::map<std::string, size_t, std::less<>> m_mapNumbers;
    std::vector<const std::string*> m_vecNames;  // keys of the map
    std::vector<std::int64_t> m_vecLastRecord;   // that had the member
    std::int64_t m_nRecord = 0;
    size_t m_nNext = 0;  // records mostly have the same order: the one to look at first
};

}  // namespace VORN_JSON_DB::Cli

#endif  // VORNJSONDB_CLI_INPUT_MEMBER_NAMES_H
