#include "RowTemplate.h"

#include <cstring>
#include <memory>
#include <utility>

#include "../util/JsonMember.h"

namespace vornjsondb {

namespace {

// More statement shapes than a process has; tables without end are read column by column.
constexpr size_t kMaxTemplates = 256;

}  // namespace

const RowTemplate* RowTemplate::Find(const Json::Value& jType, int nColumns, char** szNames) {
    // Never freed: records may outlive every static of this library, and they use the names.
    static std::vector<const RowTemplate*>& s_vecTemplates = *new std::vector<const RowTemplate*>;
    for (const RowTemplate*& pTemplate : s_vecTemplates) {
        if (pTemplate->Matches(jType, nColumns, szNames)) {
            // To the front: the next row is of the same statement.
            std::swap(pTemplate, s_vecTemplates.front());
            return s_vecTemplates.front();
        }
    }
    if (s_vecTemplates.size() == kMaxTemplates) {
        return nullptr;
    }
    std::unique_ptr<RowTemplate> pMade(new RowTemplate(jType, nColumns, szNames));
    if (!pMade->Prepare()) {
        return nullptr;
    }
    s_vecTemplates.push_back(pMade.get());
    return pMade.release();
}

RowTemplate::RowTemplate(const Json::Value& jType, int nColumns, char** szNames)
    : m_pjType(&jType), m_jEmpty(Json::objectValue) {
    for (int i = 0; i < nColumns; ++i) {
        m_vecNames.emplace_back(szNames[i] == nullptr ? "" : szNames[i]);
    }
}

bool RowTemplate::Prepare() {
    for (size_t i = 0; i < m_vecNames.size(); ++i) {
        const Json::Value* pjDefinition = FindMember(*m_pjType, m_vecNames[i]);
        if (pjDefinition == nullptr || TypeOfMember(*pjDefinition).pfnRead == nullptr ||
            m_jEmpty.isMember(m_vecNames[i])) {
            return false;
        }
        m_jEmpty[Json::StaticString(m_vecNames[i].c_str())] = static_cast<Json::UInt64>(i);
    }
    for (Json::Value::iterator it = m_jEmpty.begin(); it != m_jEmpty.end(); ++it) {
        const Json::Value* pjDefinition = FindMember(*m_pjType, NameOf(it));
        m_vecColumns.push_back(
            Column{&TypeOfMember(*pjDefinition), static_cast<size_t>((*it).asUInt64())});
        *it = Json::Value();
    }
    return true;
}

bool RowTemplate::Matches(const Json::Value& jType, int nColumns, char** szNames) const {
    if (m_pjType != &jType || m_vecNames.size() != static_cast<size_t>(nColumns)) {
        return false;
    }
    for (size_t i = 0; i < m_vecNames.size(); ++i) {
        if (szNames[i] == nullptr || std::strcmp(m_vecNames[i].c_str(), szNames[i]) != 0) {
            return false;
        }
    }
    return true;
}

bool RowTemplate::Fill(char** szTexts, Json::Value& jRec) const {
    Json::Value jFilled = m_jEmpty;
    Json::Value::iterator itMember = jFilled.begin();
    bool blAllPresent = true;
    for (const Column& Each : m_vecColumns) {
        const char* szText = szTexts[Each.nIndex];
        if (szText == nullptr) {
            blAllPresent = false;
        } else if (!ReadColumn(*Each.pType, szText, *itMember)) {
            return false;
        }
        ++itMember;
    }
    if (!blAllPresent) {
        for (size_t i = 0; i < m_vecNames.size(); ++i) {
            if (szTexts[i] == nullptr) {
                jFilled.removeMember(m_vecNames[i]);
            }
        }
    }
    jRec.swapPayload(jFilled);
    return true;
}

}  // namespace vornjsondb
