#include "RowTemplate.h"

#include <algorithm>
#include <cstring>

#include "KnownTables.h"

namespace vornjsondb {

bool RowTemplate::AreNamed(int nColumns, char** szNames) {
    return std::find(szNames, szNames + nColumns, nullptr) == szNames + nColumns;
}

RowTemplate::RowTemplate(const TableTypes& Types, int nColumns, char** szNames)
    : m_jEmpty(Json::objectValue) {
    for (int i = 0; i < nColumns; ++i) {
        m_vecNames.push_back(KnownTables::OfProcess().KeptName(szNames[i]));
    }
    m_blUsable = Prepare(Types);
}

bool RowTemplate::Prepare(const TableTypes& Types) {
    for (size_t i = 0; i < m_vecNames.size(); ++i) {
        const TypedMember* pMember = Types.Find(NameOf(m_vecNames[i]));
        if (pMember == nullptr || pMember->pType->pfnRead == nullptr ||
            m_jEmpty.isMember(m_vecNames[i])) {
            return false;
        }
        m_jEmpty[Json::StaticString(m_vecNames[i])] = static_cast<Json::UInt64>(i);
    }
    for (Json::Value::iterator it = m_jEmpty.begin(); it != m_jEmpty.end(); ++it) {
        const TypedMember* pMember = Types.Find(NameOf(it));
        m_vecColumns.push_back(Column{pMember->pType, static_cast<size_t>((*it).asUInt64())});
        *it = Json::Value();
    }
    return true;
}

bool RowTemplate::Matches(int nColumns, char** szNames) const {
    if (m_vecNames.size() != static_cast<size_t>(nColumns)) {
        return false;
    }
    for (size_t i = 0; i < m_vecNames.size(); ++i) {
        if (szNames[i] == nullptr || std::strcmp(m_vecNames[i], szNames[i]) != 0) {
            return false;
        }
    }
    return true;
}

void RowTemplate::Fill(char** szTexts, Json::Value& jRec) const {
    Json::Value jFilled = m_jEmpty;
    Json::Value::iterator itMember = jFilled.begin();
    bool blAllPresent = true;
    for (const Column& Each : m_vecColumns) {
        const char* szText = szTexts[Each.nIndex];
        if (szText == nullptr) {
            blAllPresent = false;
        } else {
            Each.pType->pfnRead(szText, *itMember);
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
}

}  // namespace vornjsondb
