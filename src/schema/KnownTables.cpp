#include "KnownTables.h"

#include <VornJsonDbApi.h>

#include <utility>

namespace vornjsondb {

namespace {

// More shapes than the library's own statements give a table; columns without end are read one by
// one.
constexpr size_t kMaxTemplates = 16;

}  // namespace

const TableTypes& KnownTable::Types() {
    static const TableTypes& s_None = *new TableTypes(Json::Value());
    if (!jTypes.isObject()) {
        return s_None;
    }
    if (!m_pTypes || m_pTypes->Members().size() != jTypes.size()) {
        m_vecTemplates.clear();
        m_pTypes = std::make_unique<const TableTypes>(jTypes);
    }
    return *m_pTypes;
}

const RowTemplate* KnownTable::TemplateFor(int nColumns, char** szNames) {
    const TableTypes& AllTypes = Types();
    for (std::unique_ptr<const RowTemplate>& pTemplate : m_vecTemplates) {
        if (pTemplate->Matches(nColumns, szNames)) {
            // To the front: the next row is of the same statement.
            pTemplate.swap(m_vecTemplates.front());
            return m_vecTemplates.front()->IsUsable() ? m_vecTemplates.front().get() : nullptr;
        }
    }
    if (m_vecTemplates.size() == kMaxTemplates || !RowTemplate::AreNamed(nColumns, szNames)) {
        return nullptr;
    }
    m_vecTemplates.push_back(std::make_unique<const RowTemplate>(AllTypes, nColumns, szNames));
    return m_vecTemplates.back()->IsUsable() ? m_vecTemplates.back().get() : nullptr;
}

// Never freed: a host's own statics may use the library when this one's would be gone.
KnownTables& KnownTables::OfProcess() {
    static KnownTables& s_Tables = *new KnownTables;
    return s_Tables;
}

KnownTable* KnownTables::Find(const std::string& strName) {
    if (m_itLast == m_mapTables.end() || m_itLast->first != strName) {
        m_itLast = m_mapTables.find(strName);
    }
    return m_itLast == m_mapTables.end() ? nullptr : &m_itLast->second;
}

KnownTable& KnownTables::FindOrAdd(const std::string& strName) {
    KnownTable* pKnown = Find(strName);
    return pKnown != nullptr ? *pKnown : m_mapTables[strName];
}

Json::Value KnownTables::AllTypes() const {
    Json::Value jAll;
    for (const auto& Each : m_mapTables) {
        jAll[Each.first] = Each.second.jTypes;
    }
    return jAll;
}

void KnownTables::Forget() {
    m_mapTables.clear();
    m_itLast = m_mapTables.end();
}

const char* KnownTables::KeptName(const char* szName) {
    return m_setNames.emplace(szName).first->c_str();
}

KnownTable& LookUpTable(Json::Value& jTableDef, std::string& strName) {
    static_cast<void>(VORN_JSON_DB::recType(jTableDef, strName));
    return *KnownTables::OfProcess().Find(strName);
}

}  // namespace vornjsondb
