#include "MemberNames.h"

namespace VORN_JSON_DB::Cli {

size_t MemberNames::Find(std::string_view strName, bool& blTwice) {
    size_t nMember = m_nNext;
    if (nMember >= m_vecNames.size() || *m_vecNames[nMember] != strName) {
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
        nMember = itFound->second;
    }
    blTwice = m_vecLastRecord[nMember] == m_nRecord;
    m_vecLastRecord[nMember] = m_nRecord;
    m_nNext = nMember + 1;
    return nMember;
}

}  // namespace VORN_JSON_DB::Cli
