#include "KnownTables.h"

#include <algorithm>

namespace vornjsondb {

const TableTypes& KnownTable::Types() {
    if (!m_pTypes || m_pTypes->Members().size() != CountMembers(jTypes)) {
        for (std::unique_ptr<const RowTemplate>& pTemplate : m_Templates) {
            pTemplate.reset();
        }
        m_pTypes = std::make_unique<const TableTypes>(jTypes);
    }
    return *m_pTypes;
}

const RowTemplate* KnownTable::TemplateFor(int nColumns, char** szNames) {
    const TableTypes& AllTypes = Types();
    for (std::unique_ptr<const RowTemplate>& pTemplate : m_Templates) {
        if (!pTemplate && RowTemplate::AreNamed(nColumns, szNames)) {
            pTemplate = std::make_unique<const RowTemplate>(AllTypes, nColumns, szNames);
        } else if (!pTemplate) {
            return nullptr;
        } else if (!pTemplate->Matches(nColumns, szNames)) {
            continue;
        }
        // To the front: the next row is of the same statement.
        pTemplate.swap(m_Templates.front());
        return m_Templates.front()->IsUsable() ? m_Templates.front().get() : nullptr;
    }
    return nullptr;
}

// Never freed: a host's own statics may use the library when this one's would be gone.
KnownTables& KnownTables::OfProcess() {
    static KnownTables& s_Tables = *new KnownTables;
    return s_Tables;
}

KnownTables::Place KnownTables::PlaceOf(const std::string& strName) {
    return std::lower_bound(
        m_vecTables.begin(), m_vecTables.end(), strName,
        [](const std::unique_ptr<KnownTable>& pEach, const std::string& strWanted) {
            return pEach->m_strName < strWanted;  // mutate(< to >): any order will do.
        });
}

KnownTable* KnownTables::Find(const std::string& strName) {
    // mutate(true): the search finds the last one, too.
    if (m_pLast == nullptr || m_pLast->m_strName != strName) {
        const Place itFound = PlaceOf(strName);
        const bool blKnown = itFound != m_vecTables.end() && (*itFound)->m_strName == strName;
        m_pLast = blKnown ? itFound->get() : nullptr;
    }
    return m_pLast;
}

KnownTable& KnownTables::FindOrAdd(const std::string& strName) {
    if (KnownTable* pKnown = Find(strName)) {
        return *pKnown;
    }
    return **m_vecTables.insert(PlaceOf(strName), std::make_unique<KnownTable>(strName));
}

Json::Value KnownTables::AllTypes() const {
    Json::Value jAll;
    for (const std::unique_ptr<KnownTable>& pEach : m_vecTables) {
        MakeMember(jAll, NameOf(pEach->m_strName)) = pEach->jTypes;
    }
    return jAll;
}

void KnownTables::Forget() {
    m_vecTables.clear();
    m_pLast = nullptr;
}

const char* KnownTables::KeptName(const char* szName) {
    Json::Value& jKept = m_jNames[szName];
    if (!jKept.isString()) {
        jKept = szName;
    }
    return jKept.asCString();
}

}  // namespace vornjsondb
