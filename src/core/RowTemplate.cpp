#include "RowTemplate.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <utility>

#include "../base/JsonMember.h"

namespace vornjsondb {

namespace {

// More statement shapes than a process has; tables without end are read column by column.
constexpr size_t kMaxTemplates = 256;

// Never freed: records may outlive every static of this library, and they use the names.
std::vector<const RowTemplate*>& Templates() {
    static std::vector<const RowTemplate*>& s_vecTemplates = *new std::vector<const RowTemplate*>;
    return s_vecTemplates;
}

}  // namespace

const RowTemplate* RowTemplate::Find(const std::string& strTable, int nColumns, char** szNames) {
    std::vector<const RowTemplate*>& vecTemplates = Templates();
    for (const RowTemplate*& pTemplate : vecTemplates) {
        if (pTemplate->Matches(strTable, nColumns, szNames)) {
            // To the front: the next row is of the same statement.
            std::swap(pTemplate, vecTemplates.front());
            return vecTemplates.front();
        }
    }
    return nullptr;
}

const RowTemplate* RowTemplate::Make(const std::string& strTable, const Json::Value& jType,
                                     int nColumns, char** szNames) {
    const bool blUnnamed = std::find(szNames, szNames + nColumns, nullptr) != szNames + nColumns;
    if (blUnnamed || !jType.isObject() || Templates().size() == kMaxTemplates) {
        return nullptr;
    }
    std::unique_ptr<RowTemplate> pMade(new RowTemplate(strTable, jType, nColumns, szNames));
    pMade->m_blUsable = pMade->Prepare();
    Templates().push_back(pMade.get());
    return pMade.release();
}

RowTemplate::RowTemplate(std::string strTable, const Json::Value& jType, int nColumns,
                         char** szNames)
    : m_strTable(std::move(strTable)), m_pjType(&jType), m_jEmpty(Json::objectValue) {
    for (int i = 0; i < nColumns; ++i) {
        m_vecNames.emplace_back(szNames[i]);
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
        const MemberType& Type = TypeOfMember(*FindMember(*m_pjType, NameOf(it)));
        m_vecColumns.push_back(Column{&Type, static_cast<size_t>((*it).asUInt64())});
        *it = Json::Value();
    }
    return true;
}

bool RowTemplate::Matches(const std::string& strTable, int nColumns, char** szNames) const {
    if (m_vecNames.size() != static_cast<size_t>(nColumns) || m_strTable != strTable) {
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
    if (!m_blUsable) {
        return false;
    }
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
