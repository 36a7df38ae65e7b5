#include "RowTemplate.h"

#include <algorithm>
#include <cstring>

#include "KnownTables.h"

namespace vornjsondb {

bool RowTemplate::AreNamed(int nColumns, char** szNames) {
    return std::find(szNames, szNames + nColumns, nullptr) == szNames + nColumns;
}

RowTemplate::RowTemplate(const TableTypes& Types, int nColumns, char** szNames)
    : m_vecNames(szNames, szNames + nColumns),
      m_vecColumns(m_vecNames.size()),
      m_jEmpty(Json::objectValue) {
    for (const char*& szName : m_vecNames) {
        szName = KnownTables::OfProcess().KeptName(szName);
    }
    m_blUsable = Prepare(Types);
}

bool RowTemplate::Prepare(const TableTypes& Types) {
    int nIndex = 0;
    for (const char* szName : m_vecNames) {
        const TypedMember* pMember = Types.Find(NameOf(szName));
        if (pMember == nullptr || pMember->pType->pfnRead == nullptr ||
            FindMember(m_jEmpty, szName) != nullptr) {
            return false;
        }
        m_jEmpty[Json::StaticString(szName)] = nIndex++;
    }
    Json::Value::iterator it = m_jEmpty.begin();
    for (Column& Each : m_vecColumns) {
        Each = Column{Types.Find(NameOf(it))->pType, (*it).asInt()};
        *it = Json::Value();
        ++it;
    }
    return true;
}

bool RowTemplate::Matches(int nColumns, char** szNames) const {
    return std::equal(m_vecNames.begin(), m_vecNames.end(), szNames, szNames + nColumns,
                      [](const char* szOwn, const char* szOther) {
                          return szOther != nullptr && std::strcmp(szOwn, szOther) == 0;
                      });
}

Json::Value RowTemplate::Record(char** szTexts) const {
    Json::Value jFilled = m_jEmpty;
    Json::Value::iterator itMember = jFilled.begin();
    for (const Column& Each : m_vecColumns) {
        Json::Value& jMember = *itMember;
        ++itMember;  // now: the member may be about to go
        if (const char* szText = szTexts[Each.nIndex]) {
            Each.pType->pfnRead(szText, jMember);
        } else {
            jFilled.removeMember(m_vecNames[static_cast<size_t>(Each.nIndex)]);
        }
    }
    return jFilled;
}

}  // namespace vornjsondb
