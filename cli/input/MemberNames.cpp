#include "MemberNames.h"

namespace VORN_JSON_DB::Cli {

size_t MemberNames::Look(std::string_view strName) {
    auto itFound = m_mapNumbers.find(strName);
    if (itFound == m_mapNumbers.end()) {
        if (m_vecNames.size() == kMost) {
            return kTooMany;
        }
        itFound = m_mapNumbers.emplace(strName, m_vecNames.size()).first;
        m_vecNames.push_back(&itFound->first);
        m_vecLastRecord.push_back(0);
        m_To.NewMember(strName);
    }
    return itFound->second;
}

}  // namespace VORN_JSON_DB::Cli
