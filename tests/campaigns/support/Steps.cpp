#include "Steps.h"

#include <tuple>

namespace campaign {

bool State::operator==(const State& other) const {
    return std::tie(rows, nCounted, nSideColumns, nSideIndexes) ==
           std::tie(other.rows, other.nCounted, other.nSideColumns, other.nSideIndexes);
}

std::string State::Text() const {
    return std::to_string(rows.size()) + " rows, counted to " + std::to_string(nCounted) +
           ", a side table of " + std::to_string(nSideColumns) + " columns and " +
           std::to_string(nSideIndexes) + " indexes";
}

bool Stream::IsPossible(When eWhen, int nKey) const {
    switch (eWhen) {
        case When::kPresent:
            return m_now.rows.count(nKey) > 0;
        case When::kAbsent:
            return m_now.rows.count(nKey) == 0;
        case When::kSideUsed:
            return m_now.nSideColumns != kPlainColumns || m_now.nSideIndexes != 0;
        case When::kSideShort:
            return m_now.nSideColumns == kPlainColumns;
        case When::kSideUnindexed:
            return m_now.nSideColumns > 0 &&
                   m_now.nSideIndexes == (m_now.nSideColumns == kSyncedColumns ? 1 : 0);
        case When::kOpen:
            return m_blOpen;
        case When::kClosed:
            return !m_blOpen;
        default:
            return true;
    }
}

Step Stream::Make(const ActRow& row, int nNumber) {
    const std::string strText = std::to_string(m_random.Next()) +
                                std::string(static_cast<std::size_t>(m_random.Below(3000)), 'x');
    return {&row, m_owner.nOwner, 1 + m_owner.nOwner + m_owner.nOwners * nNumber, m_owner.nOwners,
            strText};
}

Step Stream::Choose() {
    const int nNumber = m_random.Below(m_owner.nKeys);
    Step step = Make(kActs[0], nNumber);
    std::vector<const ActRow*> vecPossible;
    for (const ActRow& row : kActs) {
        if (IsPossible(row.eWhen, step.nKey)) {
            vecPossible.push_back(&row);
        }
    }
    step.pRow =
        vecPossible[static_cast<std::size_t>(m_random.Below(static_cast<int>(vecPossible.size())))];
    return step;
}

void Stream::ApplyToRows(const Step& step) {
    const int nLast = step.nKey + (kKeysOfStep - 1) * step.nStride;
    switch (step.pRow->eAct) {
        case Act::kCreate:
        case Act::kReplace:
        case Act::kUpsert:
        case Act::kUpdate:
            m_now.rows[step.nKey] = step.strText;
            break;
        case Act::kRemove:
            m_now.rows.erase(step.nKey);
            break;
        case Act::kRemoveRange:
            m_now.rows.erase(m_now.rows.lower_bound(step.nKey), m_now.rows.upper_bound(nLast));
            break;
        case Act::kLoadSkip:
        case Act::kLoadReplace:
        case Act::kLoadUpsert:
            for (int nKey = step.nKey; nKey <= nLast; nKey += step.nStride) {
                const bool blNew = m_now.rows.emplace(nKey, step.strText).second;
                if (!blNew && step.pRow->eAct != Act::kLoadSkip) {
                    m_now.rows[nKey] = step.strText;
                }
            }
            break;
        case Act::kSeveral:
            m_now.rows[step.nKey] = step.strText;
            m_now.rows.erase(step.nKey + step.nStride);
            break;
        default:
            break;
    }
}

void Stream::Apply(const Step& step) {
    ApplyToRows(step);
    switch (step.pRow->eAct) {
        case Act::kCountUp:
            ++m_now.nCounted;
            break;
        case Act::kNewSide:
            m_now.nSideColumns = kPlainColumns;
            m_now.nSideIndexes = 0;
            break;
        case Act::kSync:
            m_now.nSideColumns = kSyncedColumns;
            ++m_now.nSideIndexes;
            break;
        case Act::kIndex:
            ++m_now.nSideIndexes;
            break;
        case Act::kBegin:
            m_blOpen = true;
            break;
        case Act::kRollback:
            m_now = m_committed;
            m_blOpen = false;
            break;
        case Act::kCommit:
            m_blOpen = false;
            break;
        default:
            break;
    }
    if (!m_blOpen) {
        m_committed = m_now;
    }
}

}  // namespace campaign
