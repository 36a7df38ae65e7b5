#include "Members.h"

#include <algorithm>
#include <utility>

#include "../src/base/JsonMember.h"
#include "../src/base/JsonMemory.h"
#include "../src/schema/TableDefinition.h"
#include "Concat.h"
#include "FindingCodes.h"
#include "Nearest.h"

namespace vornjsondb {

namespace {

bool IsSet(const Json::Value& jEntry, const char* szFlag) {
    const Json::Value* pjFlag = FindMember(jEntry, szFlag);
    return pjFlag != nullptr && pjFlag->isBool() && pjFlag->asBool();
}

bool IsUsableName(const std::string& strName) {
    return std::string_view(strName).find('\0') == std::string_view::npos && strName[0] != '$';
}

void Refuse(FindingCode eCode, const std::string& strPath, const std::string& strName,
            const char* szWhy, FindingList& vecFindings) {
    Report(vecFindings, eCode, Below(strPath, strName), Concat({ShownText(strName), szWhy}));
}

}  // namespace

bool Member::IsJson() const {
    return Kind() == BoundKind::kObject || Kind() == BoundKind::kList || Kind() == BoundKind::kJson;
}

bool Member::IsNumber() const {
    return Kind() == BoundKind::kInteger || Kind() == BoundKind::kReal;
}

Members::Members(const std::string& strTable, const Json::Value& jDefinition,
                 FindingList& vecFindings) try
    : m_strTable(strTable), m_strQuotedTable(Quoted(strTable)) {
    if (strTable.find('\0') != std::string::npos) {
        Refuse(FindingCode::kBadName, "", strTable, " cannot be a table: it holds a NUL byte",
               vecFindings);
    }
    const Json::Value& jMembers = DeclaredMembers(jDefinition, strTable);
    if (!jMembers.isObject() || jMembers.empty()) {
        ReportNoDefinition(strTable, vecFindings);
        return;
    }
    m_jDefinition[strTable] = *FindMember(jDefinition, strTable);
    AddAll(DeclaredMembers(m_jDefinition, strTable), vecFindings);
    if (const Json::Value* pjKey = FindMember(m_jDefinition[strTable], "key")) {
        TakeKey(*pjKey, vecFindings);
    }
}
VORN_JSON_MEMORY_TO_BAD_ALLOC

void Members::AddAll(const Json::Value& jMembers, FindingList& vecFindings) {
    const std::string strPath = Below(Below("", m_strTable), "member");
    const Json::Value::const_iterator itEnd = jMembers.end();
    for (Json::Value::const_iterator it = jMembers.begin(); it != itEnd; ++it) {
        const std::string strName(NameOf(it).View());
        const MemberType& Type = TypeOfMember(*it);
        if (!IsUsableName(strName)) {
            Refuse(FindingCode::kBadName, strPath, strName,
                   " cannot be a member: it begins with $ or holds a NUL byte", vecFindings);
        } else if (FindColumn(strName) != kNone) {
            Refuse(FindingCode::kSameColumn, strPath, strName,
                   " is another member's column: letter case makes no difference", vecFindings);
        } else if (Type.Bound.eKind == BoundKind::kNone) {
            Report(vecFindings, FindingCode::kUnknownType,
                   Below(Below(strPath, strName), "cpptype"),
                   Concat({"member ", Quoted(strName), " has the unknown type ",
                           ShownText(TypeName(*it))}));
        } else {
            const std::string strQuoted = Quoted(strName);
            m_vecAll.push_back(
                Member{strName, strQuoted, Concat({m_strQuotedTable, ".", strQuoted}), &Type,
                       FindMember(*it, "cppDefaultValue"), false, IsSet(*it, "notNull"),
                       IsSet(*it, "unique"), IsSet(*it, "nullSeen"), false, false, ""});
            m_vecByColumn.insert(PlaceOfColumn(strName), m_vecNames.size());
            AddText(m_vecNames, strName);
        }
    }
}

// One name, or a list of them.
void Members::TakeKey(const Json::Value& jKey, FindingList& vecFindings) {
    const std::string strPath = Below(Below("", m_strTable), "key");
    std::vector<std::string> vecNames;
    const Json::ArrayIndex nNames = jKey.isArray() ? jKey.size() : 1;
    for (Json::ArrayIndex i = 0; i < nNames; ++i) {
        const Json::Value& jName = jKey.isArray() ? jKey[i] : jKey;
        const std::string strName = jName.isString() ? jName.asString() : std::string();
        // mutate(exchanged): in any order.
        if (Find(strName) == kNone) {
            Report(vecFindings, FindingCode::kUnknownKey, strPath,
                   Concat({Shown(jName), " is no member that can be a key",
                           Suggestion(strName, m_vecNames)}));
        } else if (std::count(vecNames.begin(), vecNames.end(), strName) > 0) {
            Report(vecFindings, FindingCode::kNamedTwice, strPath,
                   Concat({ShownText(strName), " is named twice"}));
        }
        AddText(vecNames, strName);
    }
    // mutate(doubled): the same key once more.
    SetKey(vecNames);
}

size_t Members::Find(std::string_view strName) const {
    const int cFirst = strName.empty() ? 0 : static_cast<unsigned char>(strName[0]);
    size_t nFrom = 0;
    size_t nTo = m_vecNames.size();
    while (nFrom < nTo) {
        const size_t nMiddle = nFrom + (nTo - nFrom) / 2;
        // Most names differ in what they begin with, which needs no call.
        int nOrder = cFirst - static_cast<unsigned char>(m_vecNames[nMiddle][0]);
        // mutate(true, hoisted, sunk): the longer way gives the same.
        if (nOrder == 0) {
            nOrder = strName.compare(m_vecNames[nMiddle]);
        }
        if (nOrder == 0) {
            return nMiddle;
        }
        if (nOrder < 0) {
            nTo = nMiddle;
        } else {
            nFrom = nMiddle + 1;
        }
    }
    return kNone;
}

bool IsSameColumn(const std::string& strLeft, const std::string& strRight) {
    return sqlite3_stricmp(strLeft.c_str(), strRight.c_str()) == 0;
}

// Its place in m_vecByColumn, or where it would stand.
std::vector<size_t>::const_iterator Members::PlaceOfColumn(const std::string& strColumn) const {
    return std::lower_bound(m_vecByColumn.begin(), m_vecByColumn.end(), strColumn,
                            [this](size_t nMember, const std::string& strWanted) {
                                return sqlite3_stricmp(m_vecNames[nMember].c_str(),
                                                       strWanted.c_str()) < 0;
                            });
}

size_t Members::FindColumn(const std::string& strColumn) const {
    const auto itPlace = PlaceOfColumn(strColumn);
    const bool blFound =
        itPlace != m_vecByColumn.end() && IsSameColumn(m_vecNames[*itPlace], strColumn);
    return blFound ? *itPlace : kNone;
}

bool Members::HasRowidKey() const {
    return m_vecKey.size() == 1 && At(m_vecKey[0]).Kind() == BoundKind::kInteger;
}

bool Members::HasCollates() const {
    bool blAll = true;
    for (const size_t nMember : m_vecKey) {
        blAll = blAll && !At(nMember).strCollate.empty();
    }
    return blAll;
}

void Members::ForgetCollates() {
    for (Member& Each : m_vecAll) {
        Each.strCollate.clear();
    }
}

void Members::SetKey(const std::vector<std::string>& vecColumns) {
    std::vector<size_t> vecKey;
    for (const std::string& strColumn : vecColumns) {
        const size_t nMember = FindColumn(strColumn);
        if (nMember == kNone) {
            return;
        }
        vecKey.push_back(nMember);
    }
    m_vecKey = std::move(vecKey);
    for (const size_t nMember : m_vecKey) {
        m_vecAll[nMember].blKey = true;
    }
}

}  // namespace vornjsondb
